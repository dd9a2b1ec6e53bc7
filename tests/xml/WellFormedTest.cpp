// The writer's well-formed mode: each text escaped for the place it stands in,
// characters XML 1.0 doesn't allow as U+FFFD, and everything around the texts
// as the long-standing document has it.
#include <gtest/gtest.h>

#include <cstdio>
#include <functional>
#include <string>
#include <vector>

#include "materials/LayeredMaterials.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

namespace {

// The writer's text for `f`, in well-formed mode or not.
std::u16string writtenIn(bool wellFormed, const std::function<void(AssetXmlWriter&)>& f) {
    std::u16string out;
    XmlOptions options;
    options.wellFormed = wellFormed;
    AssetXmlWriter w(out, options);
    for (int i = 0; i < 6; ++i) w.increaseIndent();
    f(w);
    return out;
}

std::u16string withReplaced(std::u16string text, const std::u16string& what, const std::u16string& with) {
    for (std::size_t at = text.find(what); at != std::u16string::npos; at = text.find(what, at + with.size()))
        text.replace(at, what.size(), with);
    return text;
}

std::string shown(const std::u16string& s) {
    std::string out;
    for (char16_t c : s) {
        if ((c >= 0x20 && c < 0x7F) || c == u'\n') {
            out += static_cast<char>(c);
        } else {
            char hex[12];
            std::snprintf(hex, sizeof hex, "\\u%04X", static_cast<unsigned>(c));
            out += hex;
        }
    }
    return out;
}

// A text and what well-formed mode makes of it between tags and in an
// attribute value.
struct Awkward {
    std::u16string text, content, attribute;
};

std::vector<Awkward> awkwardTexts() {
    std::vector<Awkward> rows = {
        {u"a&b", u"a&amp;b", u"a&amp;b"},
        // Text that looks escaped already is escaped once more: its "&" is text.
        {u"&amp;&lt;&gt;&quot;&#38;", u"&amp;amp;&amp;lt;&amp;gt;&amp;quot;&amp;#38;",
         u"&amp;amp;&amp;lt;&amp;gt;&amp;quot;&amp;#38;"},
        {u"<x>", u"&lt;x&gt;", u"&lt;x&gt;"},
        {u"say \"hi\" it's", u"say \"hi\" it's", u"say &quot;hi&quot; it's"},
        // A parser keeps a CR only as a reference, and a tab or LF in an
        // attribute value only as one.
        {u"a\tb\nc\rd\r\n", u"a\tb\nc&#13;d&#13;\n", u"a&#9;b&#10;c&#13;d&#13;&#10;"},
        {std::u16string(u"\0\x01\x08\x0b\x0c\x1f|\x7f\x80", 9), u"\uFFFD\uFFFD\uFFFD\uFFFD\uFFFD\uFFFD|\x7f\x80",
         u"\uFFFD\uFFFD\uFFFD\uFFFD\uFFFD\uFFFD|\x7f\x80"},
        {u"\uFFFE\uFFFF\uFFFD\uFFFC\uE000", u"\uFFFD\uFFFD\uFFFD\uFFFC\uE000", u"\uFFFD\uFFFD\uFFFD\uFFFC\uE000"},
        {u"caf\u00e9 \u6750 \U0001F600", u"caf\u00e9 \u6750 \U0001F600", u"caf\u00e9 \u6750 \U0001F600"},
    };
    // Surrogates without their other half: a high one before a plain unit,
    // before another high one, at the end; a low one alone.
    const char16_t high = 0xD83D, low = 0xDE00;
    rows.push_back({{high, u'x', low, high, high, low, high}, u"\uFFFDx\uFFFD\uFFFD\U0001F600\uFFFD",
                    u"\uFFFDx\uFFFD\uFFFD\U0001F600\uFFFD"});
    // Longer than the writer's buffer, so the escaped text crosses its end.
    Awkward longRow;
    for (std::size_t i = 0; i < AssetXmlWriter::kBufferUnits; ++i) {
        longRow.text += u"a&\x01\"";
        longRow.content += u"a&amp;\uFFFD\"";
        longRow.attribute += u"a&amp;\uFFFD&quot;";
    }
    rows.push_back(longRow);
    return rows;
}

// One operation of the writer with its texts: those that stand in attribute
// values come from `attr`, those between tags from `content`.
struct Operation {
    const char* what;
    std::function<void(AssetXmlWriter&, const std::u16string& attr, const std::u16string& content)> write;
};

const Operation kOperations[] = {
    {"openAsset", [](AssetXmlWriter& w, const std::u16string& a, const std::u16string&) { w.openAsset(a, a, a); }},
    {"openPlugin", [](AssetXmlWriter& w, const std::u16string& a, const std::u16string&) { w.openPlugin(a, a); }},
    {"openParameter",
     [](AssetXmlWriter& w, const std::u16string& a, const std::u16string&) { w.openParameter(a, a, a, a, true, a); }},
    {"openParameter, label from the name",
     [](AssetXmlWriter& w, const std::u16string& a, const std::u16string&) { w.openParameter(a, a, u"", a, false, a); }},
    {"writeFloat", [](AssetXmlWriter& w, const std::u16string& a, const std::u16string&) { w.writeFloat(a, 1.5f, a); }},
    {"writeColor", [](AssetXmlWriter& w, const std::u16string& a, const std::u16string&) { w.writeColor(a, Color(), a); }},
    {"writeString",
     [](AssetXmlWriter& w, const std::u16string& a, const std::u16string& c) { w.writeString(a, c, a, true); }},
    {"writeFileName", [](AssetXmlWriter& w, const std::u16string& a, const std::u16string& c) { w.writeFileName(a, c, a); }},
    {"writePlugin", [](AssetXmlWriter& w, const std::u16string& a, const std::u16string& c) { w.writePlugin(a, c, a); }},
    {"writePluginRef to a material",
     [](AssetXmlWriter& w, const std::u16string& a, const std::u16string& c) {
         boost::shared_ptr<MaterialLayeredBRDF> material(new MaterialLayeredBRDF);
         material->name = c;
         w.writePluginRef(a, material.get(), u"/" + c, a);
     }},
    {"list entries",
     [](AssetXmlWriter& w, const std::u16string& a, const std::u16string& c) {
         w.openList(a, a, a);
         w.writeListEntry(c);
         w.writeStringEntry(c);
         w.closeList();
     }},
};

const std::u16string kAttr = u"@ATTR@", kContent = u"@CONTENT@";

// Each operation in well-formed mode gives the long-standing text of the same
// operation with each of its texts escaped for its place, and nothing else
// changed.
TEST(WellFormedWriter, EachTextIsEscapedForItsPlace) {
    for (const Operation& op : kOperations) {
        SCOPED_TRACE(op.what);
        const std::u16string frame =
            writtenIn(false, [&](AssetXmlWriter& w) { op.write(w, kAttr, kContent); });
        for (const Awkward& row : awkwardTexts()) {
            SCOPED_TRACE(shown(row.text.substr(0, 40)));
            const std::u16string expected = withReplaced(withReplaced(frame, kAttr, row.attribute), kContent, row.content);
            const std::u16string got = writtenIn(true, [&](AssetXmlWriter& w) { op.write(w, row.text, row.text); });
            EXPECT_EQ(shown(got), shown(expected));
        }
    }
}

// Plain text, "'" included, and the fixed words come out the same in both
// modes; the long-standing mode keeps its own rules for the same texts.
TEST(WellFormedWriter, PlainTextIsTheSameInBothModes) {
    const std::u16string plain = u"/Wood's grain/C:\\maps\\oak 2.png \u00e9\U0001F600";
    for (const Operation& op : kOperations) {
        SCOPED_TRACE(op.what);
        const auto write = [&](AssetXmlWriter& w) { op.write(w, plain, plain); };
        EXPECT_EQ(shown(writtenIn(true, write)), shown(writtenIn(false, write)));
    }
    const auto awkward = [](AssetXmlWriter& w) {
        w.openAsset(u"/a&amp;\"b", "material", "");
        w.writeString("s", u"a<b&amp;");
    };
    EXPECT_EQ(shown(writtenIn(false, awkward)),
              "              <Asset layout=\"\" renderer=\"lumo\" type=\"material\" url=\"/a&amp;\"b\" >\n"
              "              <parameter type=\"string\" name=\"s\" handler=\"default\" listType=\"none\" "
              "label=\"s\">\n"
              "                <value>a<b&amp;</value>\n"
              "              </parameter>\n");
}

// Narrow texts (UTF-8) are escaped as their wide form is.
TEST(WellFormedWriter, NarrowTextIsEscapedToo) {
    const auto narrow = [](AssetXmlWriter& w) { w.writeString("n&\"", std::string("\xc3\xa9<\x01\"")); };
    const auto wide = [](AssetXmlWriter& w) { w.writeString(u"n&\"", std::u16string(u"\u00e9<\x01\"")); };
    EXPECT_EQ(shown(writtenIn(true, narrow)), shown(writtenIn(true, wide)));
    EXPECT_NE(writtenIn(true, wide).find(u"name=\"n&amp;&quot;\""), std::u16string::npos);
    EXPECT_NE(writtenIn(true, wide).find(u"<value>\u00e9&lt;\uFFFD\"</value>"), std::u16string::npos);
    // Short ASCII words and long texts take different roads to the same escapes.
    for (std::size_t size : {std::size_t(7), std::size_t(127), std::size_t(128), std::size_t(129), std::size_t(400)}) {
        std::string text(size, 'a');
        text[0] = '&';
        text[size - 1] = '"';
        const std::u16string expected = u"&amp;" + std::u16string(size - 2, u'a') + u"&quot;";
        const std::u16string got = writtenIn(true, [&](AssetXmlWriter& w) { w.openPlugin(text, "x"); });
        EXPECT_NE(got.find(u"name=\"" + expected + u"\""), std::u16string::npos) << size;
    }
}

// The buffered road through a sink gives the string road's text.
TEST(WellFormedWriter, SinkAndStringGiveTheSameText) {
    struct Collect final : XmlSink {
        std::u16string all;
        void flush(const char16_t* text, std::size_t size) override { all.append(text, size); }
    } sink;
    XmlOptions options;
    options.wellFormed = true;
    std::u16string direct;
    {
        AssetXmlWriter buffered(sink, options);
        AssetXmlWriter through(direct, options);
        for (AssetXmlWriter* w : {&buffered, &through}) {
            w->openRoot(u"orvmat");
            w->openAssets();
            for (const Awkward& row : awkwardTexts()) {
                w->openAsset(row.text, "material", "");
                w->writeString("s", row.text);
                w->closeAsset();
            }
            w->closeAssets();
            w->closeRoot();
        }
    }
    EXPECT_TRUE(sink.all == direct);
    EXPECT_GT(direct.size(), 4 * AssetXmlWriter::kBufferUnits);
}

}  // namespace
