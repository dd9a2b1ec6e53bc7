#include <gtest/gtest.h>

#include <string>

#include "animation/TransformComponents.h"
#include "textures/BaseTexture.h"
#include "lights/BaseLight.h"
#include "support/Golden.h"
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

// Every form of parameter, with values that show the number layout, the
// escaping and the indentation of each level.
TEST(AssetXmlWriter, EveryFormOfParameter) {
    const Vector v(1, 2, 3);
    TransformComponents c;
    c.rotation = Vector(90, 0, 0.25f);
    c.mirror[2] = 1;
    const std::string forms = param([&](AssetXmlWriter& w) {
        w.writeFloat("color_tex_mult", 0.5f);
        w.writeInteger("n", -3, "Count", true);
        w.writeBool("b", true);
        w.writeString("s", "a<b");
        w.writeFileName("file", u"a<b&amp;c");
        w.writeVector("v", v);
        w.writeAColor("v", AColor(1, 0.5f, 0, 1e6f));
        w.writeMatrix("v", Matrix(v, v, v));
        w.writeTransform("v", Transform(Matrix(v, v, v), v));
        w.writeComponentMatrix("m", c);
        w.writeComponentTransform("m", c);
        w.openList("brdfs", "plugin", "");
        w.writeListEntry(u"/a&b/BRDFDiffuse");
        w.writeStringEntry("x<y");
        w.closeList();
        w.openList("l", "", "");
        w.closeList();
        // A plugin reference: a texture's url with its plugin name, none, the
        // document sun's url alone, another light's with its plugin name.
        w.writePluginRef("tex", TexturePtr(new FakeTexture).get(), u"/M&N/x");
        w.writePluginRef("tex", nullptr, u"/M");
        w.writePluginRef("tex", LightPtr(new FakeLight(5)).get(), u"/Sun");
        w.writePluginRef("tex", LightPtr(new FakeLight(2)).get(), u"/L");
    });
    testsupport::expectGolden("xml/golden/forms.xml", forms);
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
                          w.writePluginRef("tex", child.get(), prefix + u"color_texture");
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
    testsupport::expectGolden("xml/golden/document_frame.xml", narrow(out));
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
