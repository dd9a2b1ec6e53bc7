// The XML of textures built in code, the frame that all of them share, and
// the matrices composed from transform components.
#include <cmath>

#include <gtest/gtest.h>

#include "TextureTestUtil.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "textures/TextureFrame.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;
using namespace textest;

namespace {

TexturePtr acolor(float r, float g, float b, float a) { return TexturePtr(new AColorTexture(AColor(r, g, b, a))); }

// Rotation, scale, offset, then the mirror flags.
TransformComponents components(std::initializer_list<float> nine, int mx, int my, int mz) {
    TransformComponents c;
    loads(c, Bytes().components(nine, mx, my, mz));
    return c;
}

// A node of another family written through the same frame, with its own url
// given as it is and one texture slot.
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

TEST(TextureXml, Goldens) {
    const std::vector<std::pair<const char*, std::function<std::string()>>> cases = {
        {"fresnel_defaults.xml", [] { FresnelTexture t; return xmlOf(t, u"/M"); }},
        // The first slot feeds black_color_tex, the second white_color_tex;
        // the colours shown are the complements, clamped at 0.
        {"fresnel_crossover.xml", [] {
             FresnelTexture t;
             t.whiteInverse = Color(1.5f, 0.25f, -1.0f);
             t.reflection_tex = acolor(1, 0, 0, 1);
             t.refraction_tex = acolor(0, 1, 0, 1);
             return xmlOf(t, u"/M"); }},
        // The multipliers don't reach the XML; the url is escaped.
        {"blend_one_child.xml", [] {
             BlendTexture t;
             t.color_b = acolor(0.5f, 1, 1e6f, 0.0001f);
             t.colorBMult = 4;
             t.blend_amount = 0.25f;
             return xmlOf(t, u"/A&B"); }},
        // A child held in two slots is written under each.
        {"blend_shared_child.xml", [] {
             BlendTexture t;
             t.color_a = t.color_b = acolor(1, 1, 1, 1);
             return xmlOf(t, u"/M"); }},
        // The slot of the child is base_texture, its parameter texture.
        {"invert.xml", [] {
             InvertTexture t;
             t.texture = acolor(1, 1, 1, 1);
             t.invert_alpha = true;
             return xmlOf(t, u"/M"); }},
        {"bitmap_from_path.xml", [] {
             TexturePtr t = makeBitmapTextureFromPath(u"C:\\tex\\a<b>&amp;c.png");
             auto& bt = dynamic_cast<BitmapTexture&>(*t);
             EXPECT_TRUE(bt.tile);
             bt.tile = false;
             auto& ch = dynamic_cast<GenChannelUVW&>(*bt.uvw);
             ch.uvw_channel = 2;
             ch.texComponents.scale = Vector(2, 1, 1);
             ch.texComponents.offset = Vector(1, 2, 3.5f);
             auto& buffer = dynamic_cast<BitmapBuffer&>(*bt.bitmap);
             EXPECT_EQ(buffer.gamma, 1.0f);
             buffer.gamma = 2.2f;
             return xmlOf(*t, u"/Wood"); }},
        {"uvw_environment_mirror_ball.xml", [] {
             UVWTexture t;
             auto env = boost::make_shared<GenEnvironmentUVW>();
             env->uvwComponents = components({0, 0, 45.5f, 1, 1, 2, 0, 0, 0}, 0, 0, 1);
             env->mapping_type = 3;
             t.uvw = env;
             const std::string xml = xmlOf(t, u"/M");
             // The matrix was recomputed from the components on the way.
             EXPECT_EQ(composeMatrix(env->uvwComponents), env->uvw_matrix);
             return xml; }},
        // An url of its own is taken as it is.
        {"frame_own_url.xml", [] { LayerLike layer; return xmlOf(layer, u"/Wood"); }},
        // The three default children of a new checker; a new grid refers to nothing.
        {"checker_fresh.xml", [] { CheckerTexture t; return xmlOf(t, u"/M"); }},
        {"grid_fresh.xml", [] { GridTexture t; return xmlOf(t, u"/M"); }},
    };
    for (const auto& c : cases) EXPECT_EQ(golden(std::string("textures/golden/") + c.first), c.second()) << c.first;
}

TEST(TextureXml, OddValues) {
    EXPECT_FALSE(makeBitmapTextureFromPath(u""));
    // An empty file name, and mapping types outside the table.
    BitmapBuffer buffer;
    ASSERT_TRUE(loads(buffer, Bytes().version(1).i32(0).f32(0).f32(1).wstr("")));
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

TEST(UVWCompose, DefaultsGiveTheIdentityWithoutNegativeZeros) {
    const Matrix m = composeMatrix(TransformComponents());
    EXPECT_EQ(Matrix(), m);
    for (int i = 0; i < 9; ++i) EXPECT_FALSE(std::signbit(m.m[i / 3][i % 3])) << i;
}

TEST(UVWCompose, RotationsUseTheF32DegreeFactor) {
    // 90 degrees in f32 radians: cos is not quite 0.
    const float r = 90.0f * 0.017453292f, c = std::cos(r), s = std::sin(r);
    EXPECT_NE(0.0f, c);
    auto rotated = [](float x, float y, float z) { return composeMatrix(components({x, y, z, 1, 1, 1, 0, 0, 0}, 0, 0, 0)); };
    EXPECT_EQ(Matrix(Vector(c, s, 0), Vector(-s, c, 0), Vector(0, 0, 1)), rotated(0, 0, 90));
    EXPECT_EQ(Matrix(Vector(1, 0, 0), Vector(0, c, s), Vector(0, -s, c)), rotated(90, 0, 0));
    EXPECT_EQ(Matrix(Vector(c, 0, -s), Vector(0, 1, 0), Vector(s, 0, c)), rotated(0, 90, 0));
}

TEST(UVWCompose, SyncTransformsOverwritesWhatWasStored) {
    GenObjectUVW obj;
    obj.uvwComponents = components({0, 0, 0, 2, 3, 1, 0, 0, 7}, 0, 1, 1);
    obj.syncTransforms();
    EXPECT_EQ(Transform(Matrix(Vector(2, 0, 0), Vector(0, -3, 0), Vector(0, 0, -1)), Vector(0, 0, 7)), obj.uvwTransform);
}
