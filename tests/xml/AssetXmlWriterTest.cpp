#include <gtest/gtest.h>

#include <string>

#include "animation/TransformComponents.h"
#include "textures/BaseTexture.h"
#include "lights/BaseLight.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

namespace {

std::string narrow(const std::u16string& s) {
    std::string out;
    for (char16_t c : s) out.push_back(c < 0x80 ? static_cast<char>(c) : '?');
    return out;
}

// Writes one parameter at the level a parameter has inside an Asset (6).
template <class F>
std::string param(F f) {
    std::u16string out;
    AssetXmlWriter w(out);
    for (int i = 0; i < 6; ++i) w.increaseIndent();
    f(w);
    return narrow(out);
}

const std::string I6(12, ' '), I7(14, ' '), I8(16, ' '), I9(18, ' ');

TEST(AssetXmlWriter, InlineForms) {
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writeFloat("color_tex_mult", 0.5f); }),
              I6 + "<parameter type=\"float\" name=\"color_tex_mult\" handler=\"default\" "
                   "listType=\"none\" label=\"color_tex_mult\">\n" +
                  I7 + "<value>0.5</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writeInteger("n", -3, "Count", true); }),
              I6 + "<parameter type=\"integer\" name=\"n\" handler=\"default\" listType=\"none\" "
                   "isUserData=\"1\" label=\"Count\">\n" +
                  I7 + "<value>-3</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writeBool("b", true); }),
              I6 + "<parameter type=\"bool\" name=\"b\" handler=\"default\" listType=\"none\" "
                   "label=\"b\">\n" +
                  I7 + "<value>1</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writeString("s", "a<b"); }),
              I6 + "<parameter type=\"string\" name=\"s\" handler=\"default\" listType=\"none\" "
                   "label=\"s\">\n" +
                  I7 + "<value>a<b</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writeFileName("file", u"a<b&amp;c"); }),
              I6 + "<parameter type=\"string\" name=\"file\" handler=\"FileBrowserHandler\" "
                   "listType=\"none\" label=\"file\">\n" +
                  I7 + "<value>a&lt;b&amp;c</value>\n" + I6 + "</parameter>\n");
}

TEST(AssetXmlWriter, BlockForms) {
    const std::string head = "handler=\"default\" listType=\"none\" label=\"v\">\n";
    const std::string vec123 = I8 + "<vector>\n" + I9 + "<x>1</x>\n" + I9 + "<y>2</y>\n" + I9 +
                               "<z>3</z>\n" + I8 + "</vector>\n";
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writeVector("v", Vector(1, 2, 3)); }),
              I6 + "<parameter type=\"vector\" name=\"v\" " + head + I7 + "<value>\n" + vec123 +
                  I7 + "</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writeAColor("v", AColor(1, 0.5f, 0, 1e6f)); }),
              I6 + "<parameter type=\"acolor\" name=\"v\" " + head + I7 + "<value>\n" + I8 +
                  "<r>1</r>\n" + I8 + "<g>0.5</g>\n" + I8 + "<b>0</b>\n" + I8 + "<a>1e+006</a>\n" +
                  I7 + "</value>\n" + I6 + "</parameter>\n");
    const std::string m = param([](AssetXmlWriter& w) {
        w.writeMatrix("v", Matrix(Vector(1, 2, 3), Vector(1, 2, 3), Vector(1, 2, 3)));
    });
    std::string vec9shifted;
    for (std::size_t p = 0, q; p < vec123.size(); p = q + 1) {
        q = vec123.find('\n', p);
        vec9shifted += "  " + vec123.substr(p, q - p + 1);
    }
    EXPECT_EQ(m, I6 + "<parameter type=\"matrix\" name=\"v\" " + head + I7 + "<value>\n\n" + I8 +
                     "<matrix>\n" + vec9shifted + vec9shifted + vec9shifted + I8 + "</matrix>\n" +
                     I7 + "</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) {
                  w.writeTransform("v", Transform(Matrix(Vector(1, 2, 3), Vector(1, 2, 3),
                                                         Vector(1, 2, 3)),
                                                  Vector(1, 2, 3)));
              }),
              I6 + "<parameter type=\"transform\" name=\"v\" " + head + I7 + "<value>\n" + vec123 +
                  vec123 + vec123 + vec123 + I7 + "</value>\n" + I6 + "</parameter>\n");
}

TEST(AssetXmlWriter, ComponentForms) {
    TransformComponents c;
    c.rotation = Vector(90, 0, 0.25f);
    c.mirror[2] = 1;
    const std::string text = param([&](AssetXmlWriter& w) { w.writeComponentMatrix("m", c); });
    EXPECT_EQ(text, I6 + "<parameter type=\"componentMatrix\" name=\"m\" handler=\"default\" "
                         "listType=\"none\" label=\"m\">\n" +
                        I7 + "<value>\n" + I8 + "<x_rotation>90</x_rotation>\n" + I8 +
                        "<y_rotation>0</y_rotation>\n" + I8 + "<z_rotation>0.25</z_rotation>\n" +
                        I8 + "<x_scale>1</x_scale>\n" + I8 + "<y_scale>1</y_scale>\n" + I8 +
                        "<z_scale>1</z_scale>\n" + I8 + "<x_offset>0</x_offset>\n" + I8 +
                        "<y_offset>0</y_offset>\n" + I8 + "<z_offset>0</z_offset>\n" + I8 +
                        "<x_mirror>0</x_mirror>\n" + I8 + "<y_mirror>0</y_mirror>\n" + I8 +
                        "<z_mirror>1</z_mirror>\n" + I7 + "</value>\n" + I6 + "</parameter>\n");
    const std::string t = param([&](AssetXmlWriter& w) { w.writeComponentTransform("m", c); });
    EXPECT_EQ(t.substr(0, 53), I6 + "<parameter type=\"componentTransform\" name");
    EXPECT_EQ(t.size(), text.size() + 3);
}

TEST(AssetXmlWriter, Lists) {
    EXPECT_EQ(param([](AssetXmlWriter& w) {
                  w.openList("brdfs", "plugin", "");
                  w.writeListEntry(u"/a&b/BRDFDiffuse");
                  w.writeStringEntry("x<y");
                  w.closeList();
              }),
              I6 + "<parameter type=\"list\" name=\"brdfs\" handler=\"default\" listType=\"plugin\" "
                   "label=\"brdfs\">\n" +
                  I7 + "<value>\n" + I7 + "<list>\n" + I8 + "<entry>/a&amp;b/BRDFDiffuse</entry>\n" +
                  I8 + "<string>\"x<y\"</string>\n" + I7 + "</list>\n" + I7 + "</value>\n" + I6 +
                  "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) {
                  w.openList("l", "", "");
                  w.closeList();
              }),
              I6 + "<parameter type=\"list\" name=\"l\" handler=\"default\" listType=\"\" "
                   "label=\"l\">\n" +
                  I7 + "<value>\n" + I7 + "<list>\n" + I7 + "</list>\n" + I7 + "</value>\n" + I6 +
                  "</parameter>\n");
}

struct FakeTexture : BaseTexture {
    bool save(QuickArchive&) const override { return true; }
    bool load(QuickArchive&) override { return true; }
    void reset() override {}
    std::uint32_t getType() const override { return 0; }
    TexturePtr clone() const override { return TexturePtr(); }
    bool isEqual(const TexturePtr&) const override { return false; }
    void writeXml(AssetXmlWriter&, std::u16string) override {}
    std::u16string getPluginName() const override { return u"TexBitmap"; }
};

struct FakeLight : BaseLight {
    explicit FakeLight(std::uint32_t t) : type(t) {}
    bool save(QuickArchive&) const override { return true; }
    bool load(QuickArchive&) override { return true; }
    std::uint32_t getType() const override { return type; }
    LightPtr clone() const override { return LightPtr(); }
    bool isEqual(const LightPtr&) const override { return false; }
    void reset() override {}
    std::u16string getPluginName() const override { return u"LightOmni"; }
    std::uint32_t type;
};

TEST(AssetXmlWriter, PluginReferences) {
    const std::string head = I6 + "<parameter type=\"plugin\" name=\"tex\" handler=\"default\" "
                                  "listType=\"none\" label=\"tex\">\n";
    EXPECT_EQ(param([](AssetXmlWriter& w) {
                  w.writePluginRef("tex", boost::any(TexturePtr(new FakeTexture)), u"/M&N/x");
              }),
              head + I7 + "<value>/M&amp;N/x/TexBitmap</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) { w.writePluginRef("tex", boost::any(TexturePtr()), u"/M"); }),
              head + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) {
                  w.writePluginRef("tex", boost::any(LightPtr(new FakeLight(5))), u"/Sun");
              }),
              head + I7 + "<value>/Sun</value>\n" + I6 + "</parameter>\n");
    EXPECT_EQ(param([](AssetXmlWriter& w) {
                  w.writePluginRef("tex", boost::any(LightPtr(new FakeLight(2))), u"/L");
              }),
              head + I7 + "<value>/L/LightOmni</value>\n" + I6 + "</parameter>\n");
}

// A texture slot reference gives the text of a plugin reference whose url is
// the prefix and the slot word joined, escaping included.
TEST(AssetXmlWriter, TextureSlotReferenceMatchesPluginReference) {
    const TexturePtr texture(new FakeTexture);
    const std::u16string prefixes[] = {u"/M/", u"/M&N/", u"/M&amp;/", u"/M&l/", u"/<M>&/", u""};
    for (const TexturePtr& child : {texture, TexturePtr()}) {
        for (const std::u16string& prefix : prefixes) {
            SCOPED_TRACE(narrow(prefix));
            EXPECT_EQ(param([&](AssetXmlWriter& w) { w.writeTextureRef("tex", child.get(), prefix, u"color_texture"); }),
                      param([&](AssetXmlWriter& w) {
                          w.writePluginRef("tex", boost::any(child), prefix + u"color_texture");
                      }));
        }
    }
}

// Pieces of every length from 0 to 40 units, wide and narrow, with and
// without a character beyond ASCII at each place, come out unit for unit,
// also where they cross the end of the writer's buffer.
TEST(AssetXmlWriter, PiecesOfEveryLength) {
    for (std::size_t fill : {std::size_t(0), AssetXmlWriter::kBufferUnits - 13}) {
        for (std::size_t n = 0; n <= 40; ++n) {
            for (std::size_t wideAt = 0; wideAt <= n; ++wideAt) {
                std::string utf8;
                std::u16string expected(fill, u'.');
                for (std::size_t i = 0; i < n; ++i) {
                    if (i == wideAt) {
                        utf8 += "\xc3\xa9";
                        expected += u'\u00e9';
                    } else {
                        utf8 += static_cast<char>('a' + i % 26);
                        expected += static_cast<char16_t>(u'a' + i % 26);
                    }
                }
                const std::u16string wide = expected.substr(fill);
                std::u16string viaNarrow, viaWide;
                {
                    StringSink sink(viaNarrow);
                    AssetXmlWriter w(sink);
                    w.writeRaw(std::u16string(fill, u'.'));
                    w.writeRaw(utf8);
                    w.flush();
                }
                {
                    StringSink sink(viaWide);
                    AssetXmlWriter w(sink);
                    w.writeRaw(std::u16string(fill, u'.'));
                    w.writeRaw(wide);
                    w.flush();
                }
                ASSERT_EQ(viaNarrow, expected) << "fill " << fill << ", " << n << " units, wide at " << wideAt;
                ASSERT_EQ(viaWide, expected) << "fill " << fill << ", " << n << " units";
            }
        }
    }
}

TEST(AssetXmlWriter, DocumentFrame) {
    std::u16string out;
    AssetXmlWriter w(out);
    w.openRoot("orvmat");
    w.openAssets();
    w.openAsset(u"/Wood \"1\"/BRDFDiffuse", "BRDF", "");
    w.openPlugin("BRDFDiffuse", "BRDF");
    w.openParameters();
    w.writeColor("color", Color(1, 1, 1));
    w.closeParameters();
    w.closePlugin();
    w.closeAsset();
    w.closeAssets();
    w.closeRoot();
    EXPECT_EQ(narrow(out),
              "<orvmat>\n"
              "  <Assets>\n"
              "    <Asset layout=\"\" renderer=\"lumo\" type=\"BRDF\" url=\"/Wood \"1\"/BRDFDiffuse\" >\n"
              "      <plugin>\n"
              "        <lumoplugin name=\"BRDFDiffuse\" type=\"BRDF\">\n"
              "          <parameters>\n"
              "            <parameter type=\"color\" name=\"color\" handler=\"default\" listType=\"none\" label=\"color\">\n"
              "              <value>\n"
              "                <r>1</r>\n"
              "                <g>1</g>\n"
              "                <b>1</b>\n"
              "              </value>\n"
              "            </parameter>\n"
              "          </parameters>\n"
              "        </lumoplugin>\n"
              "      </plugin>\n"
              "    </Asset>\n"
              "  </Assets>\n"
              "</orvmat>\n");
    std::u16string empty;
    AssetXmlWriter e(empty);
    e.openRoot(u"orvopt");
    e.closeRoot();
    EXPECT_EQ(narrow(empty), "<orvopt>\n</orvopt>\n");
}

TEST(EscapeXml, EscapesOnceAndOnlyThreeCharacters) {
    const struct {
        const char16_t* in;
        const char16_t* out;
    } cases[] = {
        {u"a&b", u"a&amp;b"},       {u"a&amp;b", u"a&amp;b"},   {u"<x>", u"&lt;x&gt;"},
        {u"&lt;x&gt;", u"&lt;x&gt;"}, {u"\"q'", u"\"q'"},         {u"&amp;lt;", u"&amp;lt;"},
        {u"&&", u"&amp;&amp;"},     {u"plain", u"plain"},
    };
    for (const auto& c : cases) EXPECT_EQ(escapeXml(c.in), std::u16string(c.out));
    EXPECT_EQ(escapeXml(u"&amp;", false), u"&amp;amp;");
}

TEST(AssetXmlWriter, NarrowTextGoesThroughTheSystemConversion) {
    std::u16string out;
    AssetXmlWriter w(out);
    w.writeRaw("caf\xC3\xA9 caf\xE9");  // invalid UTF-8 as a whole: ANSI code page
    EXPECT_EQ(out, u"caf\u00C3\u00A9 caf\u00E9");
    out.clear();
    w.writeRaw("caf\xC3\xA9");
    EXPECT_EQ(out, u"caf\u00E9");
}

}  // namespace
