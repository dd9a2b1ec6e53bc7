// The buffered road of the writer: the same text through a sink as through a
// string, across many buffer boundaries, and escaping in one pass equal to
// the replace passes it stands for.
#include <gtest/gtest.h>

#include <new>
#include <random>
#include <string>
#include <vector>

#include "animation/TransformComponents.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

namespace {

// Keeps each piece the writer hands over.
class RecordingSink : public XmlSink {
public:
    void flush(const char16_t* text, std::size_t size) override {
        pieces.push_back(size);
        all.append(text, size);
    }
    std::vector<std::size_t> pieces;
    std::u16string all;
};

// A sink that fails on its n-th call, as an allocation would.
class FailingSink : public XmlSink {
public:
    explicit FailingSink(int failAt) : left_(failAt) {}
    void flush(const char16_t*, std::size_t size) override {
        if (--left_ == 0) throw std::bad_alloc();
        received += size;
    }
    std::size_t received = 0;

private:
    int left_;
};

// A document that uses every operation, with texts long and short, narrow
// and wide, plain and to be escaped, many times over.
void writeDocument(AssetXmlWriter& w, int rounds) {
    const std::u16string longWide(3000, u'w');
    const std::string longNarrow(5000, 'n');
    const std::u16string huge(AssetXmlWriter::kBufferUnits * 2 + 7, u'&');
    TransformComponents tc;
    w.openRoot("orvmat");
    w.openAssets();
    for (int i = 0; i < rounds; ++i) {
        w.openAsset(u"/M&amp;<" + std::u16string(1, static_cast<char16_t>(u'a' + i % 26)) + u"\U0001F600",
                    "BRDF", "lay");
        w.openPlugin("BRDFDiffuse", u"BRDF");
        w.openParameters();
        w.writeFloat("f", i * 0.37f, "", i % 2 == 0);
        w.writeInteger("i", -i, "label");
        w.writeBool("b", i % 3 == 0);
        w.writeString("s", i % 5 == 0 ? WriterText(longNarrow) : WriterText("caf\xC3\xA9"));
        w.writeFileName("file", i % 7 == 0 ? huge : u"a<b&c>");
        w.writeVector("v", Vector(1e6f, -1e-5f, 0.1f));
        w.writeColor("c", Color(1, 0.5f, 0.25f));
        w.writeAColor("a", AColor(1, 0.5f, 0.25f, 0));
        w.writeMatrix("m", Matrix(Vector(1, 2, 3), Vector(4, 5, 6), Vector(7, 8, 9)));
        w.writeTransform("t", Transform());
        w.writeComponentMatrix("cm", tc);
        w.writeComponentTransform("ct", tc, "CT");
        w.writePlugin("p", i % 11 == 0 ? WriterText(longWide) : WriterText(u"x/y"));
        w.openList("l", "", "");
        w.writeListEntry(u"<e>");
        w.writeStringEntry("s");
        w.closeList();
        w.openParameter("raw", "string", "", "none", true, "default");
        w.openInlineValue();
        w.writeRaw(u"raw");
        w.closeInlineValue();
        w.closeParameter();
        w.closeParameters();
        w.closePlugin();
        w.closeAsset();
    }
    w.closeAssets();
    w.closeRoot();
}

TEST(WriterSink, SameTextAsTheStringRoadInBufferSizedPieces) {
    std::u16string direct;
    {
        AssetXmlWriter w(direct);
        writeDocument(w, 300);
    }
    ASSERT_GT(direct.size(), 40 * AssetXmlWriter::kBufferUnits);

    RecordingSink sink;
    AssetXmlWriter w(sink);
    writeDocument(w, 300);
    EXPECT_TRUE(sink.all == direct);
    // Only a full buffer, a text too long for the buffer or the end goes to
    // the sink: on average the pieces are large.
    EXPECT_LT(sink.pieces.size(), direct.size() / (AssetXmlWriter::kBufferUnits / 4));
    for (std::size_t size : sink.pieces) EXPECT_GT(size, 0u);
}

TEST(WriterSink, NothingReachesTheSinkBeforeItIsFullOrFlushed) {
    RecordingSink sink;
    AssetXmlWriter w(sink);
    w.openRoot("orvopt");
    w.openAssets();
    w.writeFloat("f", 1.5f);
    EXPECT_TRUE(sink.all.empty());
    w.flush();
    EXPECT_EQ(sink.pieces.size(), 1u);
    w.flush();  // an empty buffer gives no call
    EXPECT_EQ(sink.pieces.size(), 1u);
    w.closeAssets();
    w.closeRoot();
    EXPECT_EQ(sink.pieces.size(), 2u);
    EXPECT_EQ(sink.all.substr(sink.all.size() - 10), u"</orvopt>\n");
}

TEST(WriterSink, AFailingSinkStopsTheWriterCleanly) {
    for (int failAt = 1; failAt <= 3; ++failAt) {
        FailingSink sink(failAt);
        AssetXmlWriter w(sink);
        EXPECT_THROW(writeDocument(w, 100), std::bad_alloc) << failAt;
        // The buffer was handed over and dropped: nothing is sent twice.
        const std::size_t before = sink.received;
        w.flush();
        EXPECT_EQ(sink.received, before);
    }
}

// ---- escaping against the replace passes it is defined by.

void replaceAll(std::u16string& s, const std::u16string& from, const std::u16string& to) {
    for (std::size_t pos = s.find(from); pos != std::u16string::npos; pos = s.find(from, pos + to.size()))
        s.replace(pos, from.size(), to);
}

std::u16string escapeByPasses(std::u16string s, bool normalize) {
    if (normalize) {
        replaceAll(s, u"&lt;", u"<");
        replaceAll(s, u"&gt;", u">");
        replaceAll(s, u"&amp;", u"&");
    }
    replaceAll(s, u"&", u"&amp;");
    replaceAll(s, u"<", u"&lt;");
    replaceAll(s, u">", u"&gt;");
    return s;
}

TEST(EscapeXml, OnePassEqualsTheReplacePassesOnRandomText) {
    // Letters of the escapes, so that whole and broken escapes of every
    // kind, nested and adjacent, turn up often.
    const std::u16string alphabet = u"&&&;;ltgampx<>\"\U0001F600";
    std::mt19937 rng(42);
    for (int i = 0; i < 200000; ++i) {
        std::u16string s(rng() % 14, u' ');
        for (char16_t& c : s) c = alphabet[rng() % alphabet.size()];
        for (bool normalize : {true, false}) {
            ASSERT_EQ(escapeXml(s, normalize), escapeByPasses(s, normalize))
                << std::string(s.begin(), s.end()) << " normalize " << normalize;
        }
    }
}

TEST(EscapeXml, WriterEscapesLikeTheFreeFunction) {
    // The url of an Asset, the value of a file name, a list entry and the
    // url of a reference all go through the one escape.
    const std::u16string text = u"a&amp;&lt;b&<c>&gt&x";
    std::u16string out;
    AssetXmlWriter w(out);
    w.writeListEntry(text);
    EXPECT_EQ(out, u"<entry>" + escapeXml(text) + u"</entry>\n");
}

}  // namespace
