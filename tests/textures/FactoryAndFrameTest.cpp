// The factories of the texture family, the label table, and the XML frame
// shared by all textures.
#include <gtest/gtest.h>

#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/TextureFrame.h"
#include "textures/UVWGenerators.h"
#include "TextureTestUtil.h"

using namespace OrvaneLumoCore;
using textest::xmlOf;

TEST(TextureFactory, TagsGiveTheirClasses) {
    struct Case {
        int tag;
        const char16_t* plugin;
    } cases[] = {{0, u"TexBitmap"}, {1, u"TexFresnel"}, {2, u"TexUVW"},
                 {5, u"TexAColor"}, {9, u"TexInvert"},  {10, u"TexBlend"}};
    for (const Case& c : cases) {
        TexturePtr t = createTexture(c.tag);
        ASSERT_TRUE(t) << c.tag;
        EXPECT_EQ(static_cast<std::uint32_t>(c.tag), t->getType());
        EXPECT_TRUE(t->getPluginName() == c.plugin) << c.tag;
        EXPECT_TRUE(t->getAssetType() == u"texture");
        EXPECT_NE(t.get(), createTexture(c.tag).get());  // a new object each time
    }
    for (int tag : {-1, 13, 14, -2, 1 << 20}) EXPECT_FALSE(createTexture(tag)) << tag;
}

TEST(TextureFactory, UVWAndBitmapTags) {
    struct Case {
        int tag;
        const char16_t* plugin;
    } cases[] = {{0, u"UVWGenPlanarWorld"}, {1, u"UVWGenObject"}, {3, u"UVWGenEnvironment"},
                 {4, u"UVWGenChannel"}};
    for (const Case& c : cases) {
        UVWPtr u = createUVW(c.tag);
        ASSERT_TRUE(u) << c.tag;
        EXPECT_EQ(static_cast<std::uint32_t>(c.tag), u->getType());
        EXPECT_TRUE(u->getPluginName() == c.plugin) << c.tag;
        EXPECT_TRUE(u->getAssetType() == u"uvw");
    }
    for (int tag : {2, -1, 5}) EXPECT_FALSE(createUVW(tag)) << tag;
    UVWPtr planar = defaultPlanarUVW();
    ASSERT_TRUE(planar);
    EXPECT_TRUE(planar->isEqual(createUVW(0)));

    BitmapPtr b = createBitmap(0);
    ASSERT_TRUE(b);
    EXPECT_TRUE(b->getPluginName() == u"BitmapBuffer");
    EXPECT_TRUE(b->getAssetType() == u"bitmap");
    for (int tag : {1, -1}) EXPECT_FALSE(createBitmap(tag));
}

TEST(TextureFactory, DefaultsThatOldRecordsRelyOn) {
    auto env = boost::dynamic_pointer_cast<GenEnvironmentUVW>(createUVW(3));
    auto ch = boost::dynamic_pointer_cast<GenChannelUVW>(createUVW(4));
    ASSERT_TRUE(env && ch);
    EXPECT_EQ(2, env->mapping_type);
    EXPECT_EQ(1, ch->uvw_channel);
    EXPECT_EQ(0, ch->wrap_u);
}

namespace {

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

    TexturePtr colorTex;
};

}  // namespace

TEST(TextureFrameUse, OwnUrlIsTakenAsItIs) {
    LayerLike layer;
    layer.colorTex = TexturePtr(new AColorTexture());
    const std::string xml = xmlOf(layer, u"/Wood");
    EXPECT_EQ(0u, xml.find("  <Asset layout=\"\" renderer=\"lumo\" type=\"texture\" "
                           "url=\"/Wood/Layer 1/color_texture/TexAColor\" >\n"));
    const std::string tail =
R"(  <Asset layout="" renderer="lumo" type="BRDF" url="/Wood/Layer 1" >
    <plugin>
      <lumoplugin name="BRDFDiffuse" type="BRDF">
        <parameters>
          <parameter type="plugin" name="color_tex" handler="default" listType="none" label="color_tex">
            <value>/Wood/Layer 1/color_texture/TexAColor</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
)";
    ASSERT_GT(xml.size(), tail.size());
    EXPECT_EQ(tail, xml.substr(xml.size() - tail.size()));
}

TEST(TextureFrameUse, WriterLevelsReturnToWhereTheyStarted) {
    std::u16string out;
    AssetXmlWriter w(out);
    w.openAssets();
    const int level = w.getIndent();
    TexturePtr t = makeBitmapTextureFromPath(u"x.png");
    t->writeXml(w, u"/M");
    EXPECT_EQ(level, w.getIndent());
    // Each Asset of the tree stands on the level below the Assets element.
    const std::string xml = wideToUtf8(out);
    std::size_t count = 0;
    for (std::size_t p = xml.find("<Asset "); p != std::string::npos; p = xml.find("<Asset ", p + 1)) {
        ++count;
        EXPECT_EQ("\n    <Asset ", xml.substr(p - 5, 12));
    }
    EXPECT_EQ(3u, count);
}
