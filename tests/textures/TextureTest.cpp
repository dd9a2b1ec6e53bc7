// Records of every texture, UVW generator and bitmap class, against golden
// documents; the XML of textures built in code; the composed matrices.
#include <cmath>
#include <functional>
#include <tuple>

#include <gtest/gtest.h>

#include "support/Golden.h"
#include "support/TextureRecords.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "textures/TextureFrame.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;
using namespace testsupport;

namespace {

TexturePtr acolor(float r, float g, float b, float a) { return TexturePtr(new AColorTexture(AColor(r, g, b, a))); }

// Rotation, scale, offset, then the mirror flags.
TransformComponents components(RecordBytes::Floats nine, int mx = 0, int my = 0, int mz = 0) {
    TransformComponents c;
    loads(c, RecordBytes().components(nine, mx, my, mz));
    return c;
}

// A node of another family written through the same frame: its own url, one texture slot.
class LayerLike : public OrvaneXMLSerializable {
public:
    void writeXml(AssetXmlWriter& w, std::u16string url) override {
        TextureFrame frame(w, *this, url + u"/Layer 1", UrlIs::Own);
        const SlotRef color = frame.slot(colorTex, u"color_texture");
        frame.open();
        frame.writeRef("color_tex", color);
        frame.close();
    }
    std::u16string getPluginName() const override { return u"BRDFDiffuse"; }
    std::u16string getAssetType() const override { return u"BRDF"; }
    TexturePtr colorTex = acolor(1, 1, 1, 1);
};

}  // namespace

TEST(TextureRecords, NewestVersionsRoundTripAndMatchTheirGoldens) {
    for (const TextureRow& r : textureRows()) {
        SCOPED_TRACE(r.golden);
        TexturePtr t = createTexture(r.tag);
        ASSERT_TRUE(loads(*t, r.bytes, true));
        bool ok = false;
        ASSERT_EQ(savedBytes(*t, &ok), r.bytes.data);  // so that deepChange finds what it changes
        EXPECT_TRUE(ok);
        TexturePtr copy = t->clone();
        EXPECT_TRUE(t->isEqual(copy));
        if (r.deepChange) r.deepChange(*copy);
        EXPECT_EQ(!r.deepChange, t->isEqual(copy));
        EXPECT_FALSE(t->isEqual(createTexture(r.tag)) || t->isEqual(TexturePtr()));
        const std::string xml = xmlOf(*t, u"/M");
        expectGolden("textures/golden/" + std::string(r.golden), xml);
        EXPECT_EQ(xml, xmlOf(*t, u"/M"));
    }
}

// An old record, read over an object that held the newest one, saves as the
// newest version with the defaults of the fields it lacks; the golden list
// holds the records saved.
TEST(TextureRecords, OldVersionsSaveAsTheNewest) {
    const RecordBytes fresnel = RecordBytes().floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 1.3f, 1.7f});
    const RecordBytes cloth = RecordBytes().floats({0, 0, 0, 1, 0, 0, 0, 1, 0, 0, 0, 1, 0.2f, 0.3f});
    const RecordBytes scaled = RecordBytes().floats({2, 0, 0, 0, 2, 0, 0, 0, 2, 4, 5, 6}).transform(Transform());
    const RecordBytes checker = RecordBytes().i32(1).placement().i32(3).append(textureRows()[13].bytes).acolor(0, 0, 1, 1).flags({1, 0});
    const struct { int tag; const char* what; RecordBytes old; } cases[] = {
        // FresnelTexture 1: whiteInverse, blackInverse, fresnel_ior, refract_ior.
        {1, "FresnelTexture 1", RecordBytes().version(1).append(fresnel)},
        // BlendTexture 1: color_a, color_b (no multipliers), blend_amount; saved, an absent child has none.
        {10, "BlendTexture 1", RecordBytes().version(1).u8(0).u8(1).acolor(0, 1, 0, 1).f32(0.75f)},
        // GenChannelUVW 1: uvwTransform, texTransform, tex x and y rotation, tex x
        // and y mirror, wrap_u, wrap_v, uvw_channel.
        {2, "GenChannelUVW 1", RecordBytes().version(1).i32(4).version(1).append(scaled).floats({30, 45}).ints({1, 0, 1, 2, 3})},
        // GenEnvironmentUVW 1: uvw_matrix, mapping_type, z rotation, x rotation,
        // z mirror, x mirror.
        {2, "GenEnvironmentUVW 1", RecordBytes().version(1).i32(3).version(1).floats({1, 0, 0, 0, 1, 0, 0, 0, 1}).i32(3)
                                       .floats({10, 20}).ints({1, 0})},
        // GridTexture 1: uvw, line_color, fill_color, u_width, v_width.
        {6, "GridTexture 1", RecordBytes().version(1).planar().acolor(1, 0, 0, 1).acolor(0, 1, 0, 1).floats({0.3f, 0.4f})},
        // ClothTexture 1: as 2 without tile.
        {7, "ClothTexture 1", RecordBytes().version(1).planar().append(cloth)},
        // CheckerTexture 1: uvw, white_color, black_color, tile_u, tile_v; here an
        // object generator and a noise texture.
        {4, "CheckerTexture 1", RecordBytes().version(1).append(checker)},
    };
    std::string out;
    for (const auto& c : cases) {
        TexturePtr t = createTexture(c.tag);
        for (const TextureRow& r : textureRows())
            if (r.tag == c.tag) loads(*t, r.bytes);
        out += savedFromOld(c.what, t, c.old, [&c] { return createTexture(c.tag); });
    }
    expectGolden("textures/golden/old_versions.txt", out);
}

TEST(TextureRecords, SaveWithoutARequiredChildWritesNothing) {
    std::vector<TexturePtr> cases;
    for (int tag : {0, 2, 3, 6, 7, 8, 9, 11}) cases.push_back(createTexture(tag));  // no children
    auto ramp = boost::make_shared<RampTexture>();   // without colors
    auto grid = boost::make_shared<GridTexture>();   // without fill_color
    auto checker = boost::make_shared<CheckerTexture>();
    auto bitmapOnly = boost::make_shared<BitmapTexture>(), uvwOnly = boost::make_shared<BitmapTexture>();
    ramp->uvw = grid->uvw = createUVW(0);
    grid->line_color = createTexture(5);
    checker->black_color.reset();
    bitmapOnly->bitmap = createBitmap(0);
    uvwOnly->uvw = createUVW(4);
    cases.insert(cases.end(), {ramp, grid, checker, bitmapOnly, uvwOnly});
    for (const TexturePtr& t : cases) {
        bool ok = true;
        EXPECT_TRUE(savedBytes(*t, &ok).empty()) << t->getType();
        EXPECT_FALSE(ok) << t->getType();
    }
}

TEST(TextureFactory, TagsAndComparisons) {
    for (int tag = 0; tag <= 12; ++tag) EXPECT_EQ(createTexture(tag)->getType(), std::uint32_t(tag));
    for (int tag : {-1, 13, 1 << 20}) EXPECT_FALSE(createTexture(tag)) << tag;
    for (int tag : {-1, 2, 5}) EXPECT_FALSE(createUVW(tag)) << tag;
    for (int tag : {-1, 1}) EXPECT_FALSE(createBitmap(tag)) << tag;
    // Same fields, other class; a buffer's file compares without regard to case.
    EXPECT_FALSE(GenPlanarWorldUVW().isEqual(createUVW(1)));
    BitmapBuffer a;
    a.file = u"C:\\Maps\\Wood.PNG";
    auto b = boost::make_shared<BitmapBuffer>(a);
    b->file = u"c:\\maps\\wood.png";
    EXPECT_TRUE(a.isEqual(b));
}

TEST(TextureXml, Goldens) {
    // The first slot feeds black_color_tex, the second white_color_tex; the
    // colours shown are the complements, clamped at 0.
    auto crossover = boost::make_shared<FresnelTexture>();
    crossover->whiteInverse = Color(1.5f, 0.25f, -1.0f);
    crossover->reflection_tex = acolor(1, 0, 0, 1);
    crossover->refraction_tex = acolor(0, 1, 0, 1);
    // The multipliers don't reach the XML; the url is escaped.
    auto oneChild = boost::make_shared<BlendTexture>();
    oneChild->color_b = acolor(0.5f, 1, 1e6f, 0.0001f);
    oneChild->colorBMult = 4;
    oneChild->blend_amount = 0.25f;
    // A child held in two slots is written under each.
    auto sharedChild = boost::make_shared<BlendTexture>();
    sharedChild->color_a = sharedChild->color_b = acolor(1, 1, 1, 1);
    TexturePtr bitmap = makeBitmapTextureFromPath(u"C:\\tex\\a<b>&amp;c.png");
    auto& bt = dynamic_cast<BitmapTexture&>(*bitmap);
    EXPECT_TRUE(bt.tile);
    bt.tile = false;
    auto& ch = dynamic_cast<GenChannelUVW&>(*bt.uvw);
    ch.uvw_channel = 2;
    ch.texComponents.scale = Vector(2, 1, 1);
    ch.texComponents.offset = Vector(1, 2, 3.5f);
    auto& buffer = dynamic_cast<BitmapBuffer&>(*bt.bitmap);
    EXPECT_EQ(buffer.gamma, 1.0f);
    buffer.gamma = 2.2f;
    auto uvw = boost::make_shared<UVWTexture>();
    auto env = boost::make_shared<GenEnvironmentUVW>();
    env->uvwComponents = components({0, 0, 45.5f, 1, 1, 2, 0, 0, 0}, 0, 0, 1);
    env->mapping_type = 3;
    uvw->uvw = env;
    const std::tuple<const char*, TexturePtr, const char16_t*> cases[] = {
        {"fresnel_defaults.xml", createTexture(1), u"/M"}, {"fresnel_crossover.xml", crossover, u"/M"},
        {"blend_one_child.xml", oneChild, u"/A&B"},         {"blend_shared_child.xml", sharedChild, u"/M"},
        {"bitmap_from_path.xml", bitmap, u"/Wood"},         {"uvw_environment_mirror_ball.xml", uvw, u"/M"},
        // The three default children of a new checker; a new grid refers to nothing.
        {"checker_fresh.xml", createTexture(4), u"/M"},     {"grid_fresh.xml", createTexture(6), u"/M"},
    };
    for (const auto& c : cases)
        expectGolden("textures/golden/" + std::string(std::get<0>(c)), xmlOf(*std::get<1>(c), std::get<2>(c)));
    // The matrix was recomputed from the components on the way.
    EXPECT_EQ(composeMatrix(env->uvwComponents), env->uvw_matrix);
    // An url of its own is taken as it is.
    LayerLike layer;
    expectGolden("textures/golden/frame_own_url.xml", xmlOf(layer, u"/Wood"));
}

TEST(TextureXml, OddValues) {
    EXPECT_FALSE(makeBitmapTextureFromPath(u""));
    // An empty file name, and mapping types outside the table.
    BitmapBuffer buffer;
    ASSERT_TRUE(loads(buffer, RecordBytes().version(1).i32(0).f32(0).f32(1).wstr("")));
    EXPECT_NE(xmlOf(buffer, u"/M").find("label=\"file\">\n            <value></value>\n"), std::string::npos);
    GenEnvironmentUVW env;
    for (int type : {-1, 4, 1 << 30}) {
        env.mapping_type = type;
        EXPECT_NE(xmlOf(env, u"/M").find("label=\"mapping_type\">\n            <value></value>\n"), std::string::npos);
    }
    // Each reset of a checker makes new children.
    CheckerTexture checker;
    const UVWPtr before = checker.uvw;
    checker.reset();
    EXPECT_NE(checker.uvw.get(), before.get());
}

TEST(UVWCompose, ExactValues) {
    // The defaults give the identity, without negative zeros.
    const Matrix m = composeMatrix(TransformComponents());
    EXPECT_EQ(Matrix(), m);
    for (int i = 0; i < 9; ++i) EXPECT_FALSE(std::signbit(m.m[i / 3][i % 3])) << i;
    // 90 degrees in f32 radians, with the f32 degree factor: cos is not quite 0.
    const float r = 90.0f * 0.017453292f, c = std::cos(r), s = std::sin(r);
    EXPECT_NE(0.0f, c);
    auto rotated = [](float x, float y, float z) { return composeMatrix(components({x, y, z, 1, 1, 1, 0, 0, 0})); };
    EXPECT_EQ(Matrix(Vector(c, s, 0), Vector(-s, c, 0), Vector(0, 0, 1)), rotated(0, 0, 90));
    EXPECT_EQ(Matrix(Vector(1, 0, 0), Vector(0, c, s), Vector(0, -s, c)), rotated(90, 0, 0));
    EXPECT_EQ(Matrix(Vector(c, 0, -s), Vector(0, 1, 0), Vector(s, 0, c)), rotated(0, 90, 0));
    // Scale and mirror on the diagonal; syncTransforms overwrites what was stored.
    GenObjectUVW uv;
    uv.uvwComponents = components({0, 0, 0, 2, 3, 1, 0, 0, 7}, 0, 1, 1);
    uv.syncTransforms();
    EXPECT_EQ(Transform(Matrix(Vector(2, 0, 0), Vector(0, -3, 0), Vector(0, 0, -1)), Vector(0, 0, 7)), uv.uvwTransform);
}
