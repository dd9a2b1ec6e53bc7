// UVW generators and the UVW texture: records of every version, the composed
// transforms, and the XML.
#include <cmath>

#include <gtest/gtest.h>

#include "textures/UVWGenerators.h"
#include "TextureTestUtil.h"

using namespace OrvaneLumoCore;
using textest::Bytes;
using textest::savedBytes;
using textest::xmlOf;

namespace {

TransformComponents components(Vector rotation, Vector scale, Vector offset, int mx, int my,
                               int mz) {
    TransformComponents c;
    c.rotation = rotation;
    c.scale = scale;
    c.offset = offset;
    c.mirror[0] = mx;
    c.mirror[1] = my;
    c.mirror[2] = mz;
    return c;
}

float radians(float degrees) { return degrees * 0.017453292f; }

// The product A B C written out by rows, in double, to check the composition
// independently of its column-wise evaluation.
Matrix closedForm(const TransformComponents& c) {
    const double x = radians(c.rotation.x), y = radians(c.rotation.y), z = radians(c.rotation.z);
    const double fx = c.mirror[0] ? -c.scale.x : c.scale.x;
    const double fy = c.mirror[1] ? -c.scale.y : c.scale.y;
    const double fz = c.mirror[2] ? -c.scale.z : c.scale.z;
    const double cx = std::cos(x), sx = std::sin(x), cy = std::cos(y), sy = std::sin(y);
    const double cz = std::cos(z), sz = std::sin(z);
    // Rows of A, B and C.
    const double A[3][3] = {{fx, 0, 0}, {0, cx, -sx}, {0, sx, cx}};
    const double B[3][3] = {{cy, 0, sy}, {0, fy, 0}, {-sy, 0, cy}};
    const double C[3][3] = {{cz, -sz, 0}, {sz, cz, 0}, {0, 0, fz}};
    double AB[3][3] = {}, P[3][3] = {};
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j)
            for (int k = 0; k < 3; ++k) AB[i][j] += A[i][k] * B[k][j];
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j)
            for (int k = 0; k < 3; ++k) P[i][j] += AB[i][k] * C[k][j];
    Matrix m;
    for (int col = 0; col < 3; ++col)
        m.m[col] = Vector(float(P[0][col]), float(P[1][col]), float(P[2][col]));
    return m;
}

void expectNear(const Matrix& expected, const Matrix& actual, const char* what) {
    for (int col = 0; col < 3; ++col)
        for (int row = 0; row < 3; ++row)
            EXPECT_NEAR(expected.m[col][row], actual.m[col][row], 2e-6)
                << what << ": column " << col << ", row " << row;
}

}  // namespace

// ---- composition -------------------------------------------------------------------------

TEST(UVWCompose, ScaleAndMirrorStandOnTheDiagonal) {
    const Matrix m = composeMatrix(components({0, 0, 0}, {2, 3, 4}, {0, 0, 0}, 0, 1, 0));
    EXPECT_EQ(Matrix(Vector(2, 0, 0), Vector(0, -3, 0), Vector(0, 0, 4)), m);
}

TEST(UVWCompose, DefaultsGiveTheIdentity) {
    EXPECT_EQ(Matrix(), composeMatrix(TransformComponents()));
    // No entry is a negative zero.
    const Matrix m = composeMatrix(TransformComponents());
    for (int col = 0; col < 3; ++col)
        for (int row = 0; row < 3; ++row) EXPECT_FALSE(std::signbit(m.m[col][row]));
}

TEST(UVWCompose, SingleRotationsUseTheF32DegreeFactor) {
    // 90 degrees in f32 radians: cos is not quite 0.
    const float r = 90.0f * 0.017453292f;
    const float c = std::cos(r), s = std::sin(r);
    EXPECT_NE(0.0f, c);
    const Matrix z = composeMatrix(components({0, 0, 90}, {1, 1, 1}, {0, 0, 0}, 0, 0, 0));
    EXPECT_EQ(Matrix(Vector(c, s, 0), Vector(-s, c, 0), Vector(0, 0, 1)), z);
    const Matrix x = composeMatrix(components({90, 0, 0}, {1, 1, 1}, {0, 0, 0}, 0, 0, 0));
    EXPECT_EQ(Matrix(Vector(1, 0, 0), Vector(0, c, s), Vector(0, -s, c)), x);
    const Matrix y = composeMatrix(components({0, 90, 0}, {1, 1, 1}, {0, 0, 0}, 0, 0, 0));
    EXPECT_EQ(Matrix(Vector(c, 0, -s), Vector(0, 1, 0), Vector(s, 0, c)), y);
}

TEST(UVWCompose, AllAxesAgainstTheProductByRows) {
    const TransformComponents cases[] = {
        components({30, 45, 60}, {1, 2, 3}, {0, 0, 0}, 0, 0, 0),
        components({-10, 200, 75}, {0.5f, 1, 4}, {0, 0, 0}, 1, 0, 1),
        components({90, 90, 90}, {1, 1, 1}, {0, 0, 0}, 0, 1, 0),
        components({1, -1, 359}, {3, 3, 3}, {0, 0, 0}, 1, 1, 1),
    };
    for (const TransformComponents& c : cases) expectNear(closedForm(c), composeMatrix(c), "case");
}

TEST(UVWCompose, SyncTransformsOverwritesWhatWasStored) {
    GenChannelUVW ch;
    ch.uvwTransform.offs = Vector(9, 9, 9);
    ch.texComponents = components({0, 0, 0}, {2, 2, 2}, {1, 1, 1}, 0, 0, 0);
    ch.syncTransforms();
    EXPECT_EQ(Transform(), ch.uvwTransform);
    EXPECT_EQ(Transform(Matrix(Vector(2, 0, 0), Vector(0, 2, 0), Vector(0, 0, 2)), Vector(1, 1, 1)),
              ch.texTransform);

    GenEnvironmentUVW env;
    env.uvwComponents = components({0, 0, 0}, {1, 1, 1}, {5, 5, 5}, 1, 0, 0);
    env.syncTransforms();
    EXPECT_EQ(Matrix(Vector(-1, 0, 0), Vector(0, 1, 0), Vector(0, 0, 1)), env.uvw_matrix);

    GenObjectUVW obj;
    obj.uvwComponents = components({0, 0, 0}, {1, 3, 1}, {0, 0, 7}, 0, 0, 0);
    obj.syncTransforms();
    EXPECT_EQ(Transform(Matrix(Vector(1, 0, 0), Vector(0, 3, 0), Vector(0, 0, 1)), Vector(0, 0, 7)),
              obj.uvwTransform);
}

// ---- records ---------------------------------------------------------------------------------

TEST(UVWRecord, ChannelVersion1HoldsPartOfTheTextureComponents) {
    // Version 1: uvwTransform, texTransform, tex x and y rotation, tex x and y
    // mirror, wrap_u, wrap_v, uvw_channel.
    const Bytes v1 = Bytes().version(1)
                         .floats({2, 0, 0, 0, 2, 0, 0, 0, 2, 4, 5, 6})
                         .identityTransform()
                         .f32(30).f32(45).i32(1).i32(0)
                         .i32(1).i32(2).i32(3);
    GenChannelUVW ch;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(ch.load(ar));
    EXPECT_EQ(Vector(4, 5, 6), ch.uvwTransform.offs);
    EXPECT_EQ(components({30, 45, 0}, {1, 1, 1}, {0, 0, 0}, 1, 0, 0), ch.texComponents);
    EXPECT_EQ(TransformComponents(), ch.uvwComponents);
    EXPECT_EQ(1, ch.wrap_u);
    EXPECT_EQ(2, ch.wrap_v);
    EXPECT_EQ(3, ch.uvw_channel);

    // The file's uvwTransform doesn't reach the XML: uvw_transform shows the
    // default components.
    const std::string xml = xmlOf(ch, u"/M");
    EXPECT_NE(std::string::npos, xml.find("<x_rotation>0</x_rotation>\n"
                                          "              <y_rotation>0</y_rotation>\n"
                                          "              <z_rotation>0</z_rotation>\n"
                                          "              <x_scale>1</x_scale>\n"));
    EXPECT_EQ(std::string::npos, xml.find("<x>4</x>"));
}

TEST(UVWRecord, ChannelVersion2RoundTrip) {
    // Version 2: two transforms, wrap_u, wrap_v, uvw_channel, two components records.
    const Bytes v2 = Bytes().version(2)
                         .floats({1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12})
                         .identityTransform()
                         .i32(1).i32(0).i32(2)
                         .components({10, 20, 30, 1, 2, 3, 4, 5, 6}, 1, 0, 1)
                         .defaultComponents();
    GenChannelUVW ch;
    QuickArchive ar = v2.archive();
    ASSERT_TRUE(ch.load(ar));
    EXPECT_EQ(components({10, 20, 30}, {1, 2, 3}, {4, 5, 6}, 1, 0, 1), ch.uvwComponents);
    EXPECT_EQ(Vector(10, 11, 12), ch.uvwTransform.offs);
    EXPECT_EQ(2, ch.uvw_channel);
    EXPECT_EQ(v2.data, savedBytes(ch));
}

TEST(UVWRecord, EnvironmentVersion1ReadsZBeforeX) {
    // Version 1: uvw_matrix, mapping_type, z rotation, x rotation, z mirror, x mirror.
    const Bytes v1 = Bytes().version(1).floats({1, 0, 0, 0, 1, 0, 0, 0, 1})
                         .i32(3).f32(10).f32(20).i32(1).i32(0);
    GenEnvironmentUVW env;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(env.load(ar));
    EXPECT_EQ(3, env.mapping_type);
    EXPECT_EQ(components({20, 0, 10}, {1, 1, 1}, {0, 0, 0}, 0, 0, 1), env.uvwComponents);
}

TEST(UVWRecord, EnvironmentVersion2RoundTrip) {
    // Version 2: uvw_matrix, mapping_type, components record.
    const Bytes v2 = Bytes().version(2).floats({0, 1, 0, 1, 0, 0, 0, 0, -1})
                         .i32(0).components({0, 0, 45, 1, 1, 1, 0, 0, 0}, 0, 1, 0);
    GenEnvironmentUVW env;
    QuickArchive ar = v2.archive();
    ASSERT_TRUE(env.load(ar));
    EXPECT_EQ(0, env.mapping_type);
    EXPECT_EQ(Vector(0, 0, -1), env.uvw_matrix.m[2]);
    EXPECT_EQ(v2.data, savedBytes(env));
}

TEST(UVWRecord, PlanarAndObjectShareOneRecord) {
    // Version 1: uvwTransform, components record.
    const Bytes v1 = Bytes().version(1).floats({1, 0, 0, 0, 1, 0, 0, 0, 1, 7, 8, 9})
                         .components({0, 0, 0, 2, 2, 2, 1, 1, 1}, 0, 0, 0);
    GenPlanarWorldUVW planar;
    GenObjectUVW object;
    QuickArchive a1 = v1.archive(), a2 = v1.archive();
    ASSERT_TRUE(planar.load(a1));
    ASSERT_TRUE(object.load(a2));
    EXPECT_EQ(Vector(7, 8, 9), planar.uvwTransform.offs);
    EXPECT_EQ(Vector(2, 2, 2), object.uvwComponents.scale);
    EXPECT_EQ(v1.data, savedBytes(planar));
    EXPECT_EQ(v1.data, savedBytes(object));
    // Same fields, other class.
    EXPECT_FALSE(planar.isEqual(UVWPtr(new GenObjectUVW(object))));
    EXPECT_TRUE(planar.isEqual(planar.clone()));
}

TEST(UVWRecord, UVWTextureHoldsARequiredGenerator) {
    // Version 1: generator tag, generator record.
    const Bytes v1 = Bytes().version(1).i32(1).version(1).identityTransform().defaultComponents();
    UVWTexture t;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(t.load(ar));
    ASSERT_TRUE(t.uvw);
    EXPECT_EQ(1u, t.uvw->getType());
    EXPECT_EQ(v1.data, savedBytes(t));

    UVWTexture empty;
    bool ok = true;
    EXPECT_TRUE(savedBytes(empty, &ok).empty());
    EXPECT_FALSE(ok);
}

TEST(UVWRecord, CopiesAndComparisons) {
    GenChannelUVW a;
    a.texComponents.rotation.z = 12;
    a.wrap_v = 1;
    UVWPtr copy = a.clone();
    EXPECT_TRUE(a.isEqual(copy));
    typedef void (*Change)(GenChannelUVW&);
    const Change changes[] = {
        [](GenChannelUVW& c) { c.uvwTransform.offs.x = 1; },
        [](GenChannelUVW& c) { c.texTransform.m.m[1].z = 1; },
        [](GenChannelUVW& c) { c.uvwComponents.mirror[2] = 1; },
        [](GenChannelUVW& c) { c.texComponents.scale.y = 2; },
        [](GenChannelUVW& c) { c.wrap_u = 1; },
        [](GenChannelUVW& c) { c.wrap_v = 0; },
        [](GenChannelUVW& c) { c.uvw_channel = 5; },
    };
    for (Change change : changes) {
        boost::shared_ptr<GenChannelUVW> other(new GenChannelUVW(a));
        change(*other);
        EXPECT_FALSE(a.isEqual(other));
    }
    UVWTexture t1, t2;
    t1.uvw = a.clone();
    EXPECT_FALSE(t1.isEqual(t2.clone()));
    t2.uvw = a.clone();
    EXPECT_TRUE(t1.isEqual(t2.clone()));
    TexturePtr deep = t1.clone();
    EXPECT_NE(t1.uvw.get(), dynamic_cast<UVWTexture&>(*deep).uvw.get());
}

// ---- XML -----------------------------------------------------------------------------------

TEST(UVWXml, EnvironmentGeneratorInAUVWTexture) {
    UVWTexture t;
    boost::shared_ptr<GenEnvironmentUVW> env(new GenEnvironmentUVW());
    env->uvwComponents = components({0, 0, 45.5f}, {1, 1, 2}, {0, 0, 0}, 0, 0, 1);
    env->mapping_type = 3;
    t.uvw = env;
    const char* expected =
R"(  <Asset layout="" renderer="lumo" type="uvw" url="/M/TexUVW/uvwgen/UVWGenEnvironment" >
    <plugin>
      <lumoplugin name="UVWGenEnvironment" type="uvw">
        <parameters>
          <parameter type="componentMatrix" name="uvw_matrix" handler="default" listType="none" label="uvw_matrix">
            <value>
              <x_rotation>0</x_rotation>
              <y_rotation>0</y_rotation>
              <z_rotation>45.5</z_rotation>
              <x_scale>1</x_scale>
              <y_scale>1</y_scale>
              <z_scale>2</z_scale>
              <x_offset>0</x_offset>
              <y_offset>0</y_offset>
              <z_offset>0</z_offset>
              <x_mirror>0</x_mirror>
              <y_mirror>0</y_mirror>
              <z_mirror>1</z_mirror>
            </value>
          </parameter>
          <parameter type="string" name="mapping_type" handler="default" listType="none" label="mapping_type">
            <value>mirror_ball</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
  <Asset layout="" renderer="lumo" type="texture" url="/M/TexUVW" >
    <plugin>
      <lumoplugin name="TexUVW" type="texture">
        <parameters>
          <parameter type="plugin" name="uvwgen" handler="default" listType="none" label="uvwgen">
            <value>/M/TexUVW/uvwgen/UVWGenEnvironment</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
)";
    EXPECT_EQ(expected, xmlOf(t, u"/M"));
    // The matrix was recomputed from the components on the way.
    EXPECT_EQ(composeMatrix(env->uvwComponents), env->uvw_matrix);
}

TEST(UVWXml, MappingTypeOutsideTheTableGivesAnEmptyValue) {
    GenEnvironmentUVW env;
    for (int type : {-1, 4, 1 << 30}) {
        env.mapping_type = type;
        EXPECT_NE(std::string::npos,
                  xmlOf(env, u"/M").find("label=\"mapping_type\">\n            <value></value>\n"));
    }
    EXPECT_EQ(u"angular", mappingTypeLabel(0));
    EXPECT_EQ(u"cubic", mappingTypeLabel(1));
    EXPECT_EQ(u"spherical", mappingTypeLabel(2));
}

TEST(UVWXml, WritingTwiceGivesTheSameText) {
    GenChannelUVW ch;
    ch.texComponents = components({15, 25, 35}, {1, 2, 3}, {4, 5, 6}, 1, 0, 0);
    ch.texTransform.offs = Vector(100, 100, 100);
    const std::string first = xmlOf(ch, u"/M");
    EXPECT_EQ(first, xmlOf(ch, u"/M"));
    EXPECT_EQ(std::string::npos, first.find("<x>100</x>"));
}
