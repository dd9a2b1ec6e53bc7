#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "lights/LightFixtures.h"
#include "lights/SunIesDome.h"
#include "textures/SkyTexture.h"

using namespace OrvaneLumoCore;
using lighttest::RecordBytes;
using lighttest::savedBytes;

namespace {

const char kDocId[] = "{D3BE9766-E4AA-418b-81A9-23414A2BA98D}";

// Puts the document sun back as it was: version 3 sky records change it for
// the whole process, and the tests share one process.
class DocumentSunGuard {
public:
    DocumentSunGuard() : bytes_(savedBytes(*documentSun())) {}
    ~DocumentSunGuard() {
        QuickArchive ar(bytes_.data(), bytes_.size());
        documentSun()->load(ar);
    }

private:
    std::vector<std::uint8_t> bytes_;
};

// The settings block of a sky record (version 2 and 3): up_vector, eight
// reals (shadowBias to ozone), three ints, shadows, then skyFlag and skyId.
RecordBytes& skySettings(RecordBytes& b, const std::string& skyId) {
    b.vec(0, 0, 1).f32(0.5f).f32(6).f32(2).f32(1).f32(1).f32(50).f32(150).f32(0.35f);
    b.i32(500).i32(1000).i32(8).u8(1);
    b.u8(1);
    return lighttest::wstr(b, skyId);
}

// Version 1: own sun flag, the sun's record if set.
RecordBytes skyV1(const std::string& ownSunId = "") {
    RecordBytes b;
    b.u32(0x10000).u8(ownSunId.empty() ? 0 : 1);
    if (!ownSunId.empty()) b.append(lighttest::sunV4(ownSunId).bytes());
    return b;
}

// Version 3: own sun, settings, skyFlag, skyId, transform, the document
// sun's record (a version 4 sun with `docId`), and the flag that says the
// sky's sun is the document sun.
RecordBytes skyV3(const std::string& ownSunId, const std::string& docId, bool sunIsDocument) {
    RecordBytes b;
    b.u32(0x30000).u8(1);
    b.append(lighttest::sunV4(ownSunId).bytes());
    skySettings(b, "sky-3");
    lighttest::animatedTransform(b, {{0.0, lighttest::countingTransform(1)}});
    b.append(lighttest::sunV4(docId).bytes());
    return b.u8(sunIsDocument ? 1 : 0);
}

boost::shared_ptr<SkyTexture> loadedSky(const RecordBytes& b, bool expectOk = true) {
    boost::shared_ptr<SkyTexture> sky(new SkyTexture);
    QuickArchive ar = b.archive();
    EXPECT_EQ(sky->load(ar), expectOk);
    if (expectOk) {
        EXPECT_EQ(ar.getReadPosition(), b.size());
    }
    return sky;
}

// The whole Asset of a sky under /M whose sun reference is `reference`.
std::string skyAsset(const std::string& reference) {
    return "  <Asset layout=\"\" renderer=\"lumo\" type=\"texture\" url=\"/M/TexSky\" >\n"
           "    <plugin>\n"
           "      <lumoplugin name=\"TexSky\" type=\"texture\">\n"
           "        <parameters>\n"
           "          <parameter type=\"plugin\" name=\"sun\" handler=\"default\" listType=\"none\" "
           "label=\"sun\">\n"
           "            <value>" + reference + "</value>\n"
           "          </parameter>\n"
           "        </parameters>\n"
           "      </lumoplugin>\n"
           "    </plugin>\n"
           "  </Asset>\n";
}

// What the sky adds to the writer's text.
std::string xmlOf(SkyTexture& sky, AssetXmlWriter& w, std::u16string& out) {
    out.clear();
    sky.writeXml(w, u"/M");
    return wideToUtf8(out);
}

std::string xmlOf(SkyTexture& sky) {
    std::u16string out;
    AssetXmlWriter w(out);
    return xmlOf(sky, w, out);
}

}  // namespace

TEST(SkyTexture, DefaultsShareTheDocumentSun) {
    TexturePtr t = createTexture(12);
    ASSERT_TRUE(t);
    SkyTexture& sky = static_cast<SkyTexture&>(*t);
    EXPECT_EQ(sky.sun.get(), documentSun().get());
    EXPECT_EQ(sky.getPluginName(), u"TexSky");
    EXPECT_EQ(sky.skyId.size(), 36u);
    EXPECT_FALSE(sky.skyFlag);
    EXPECT_TRUE(sunSettingsEqual(sky, SunSettings()));
    const std::u16string id = sky.skyId;
    sky.sun = createLight(5);
    sky.reset();
    EXPECT_EQ(sky.sun.get(), documentSun().get());
    EXPECT_NE(sky.skyId, id);
}

// The sun reference in its three cases: the document sun, a sun written
// earlier by the same writer, and any other sun.
TEST(SkyTexture, SunReference) {
    DocumentSunGuard guard;
    struct Case {
        const char* name;
        RecordBytes bytes;
        const char* reference;
    };
    const Case cases[] = {
        {"no own sun", skyV1(), "/Rhino Document Sun"},
        {"own sun", skyV1("sun-7"), "/sun-7"},
        {"own sun with the document sun's id", skyV1(kDocId), "/Rhino Document Sun"},
        {"the document sun's id in lower case",
         skyV1("{d3be9766-e4aa-418b-81a9-23414a2ba98d}"), "/Rhino Document Sun"},
        {"an id with markup", skyV1("a&b"), "/a&amp;b"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        boost::shared_ptr<SkyTexture> sky = loadedSky(c.bytes);
        std::u16string out;
        AssetXmlWriter w(out);
        EXPECT_EQ(xmlOf(*sky, w, out), skyAsset(c.reference));
        EXPECT_TRUE(w.sunRegistry.empty());
    }

    // A sun that the writer has written already is referred to by its url.
    boost::shared_ptr<SkyTexture> sky = loadedSky(skyV1("sun-7"));
    std::u16string out;
    AssetXmlWriter w(out);
    LightPtr same = createLight(5);
    RecordBytes sunBytes = lighttest::sunV4("sun-7");
    QuickArchive ar = sunBytes.archive();
    ASSERT_TRUE(same->load(ar));
    same->writeXml(w, u"/Env/sun");
    EXPECT_EQ(xmlOf(*sky, w, out), skyAsset("/Env/sun"));
}

TEST(SkyTexture, OldVersions) {
    DocumentSunGuard guard;
    // Version 1 without own sun keeps every default.
    boost::shared_ptr<SkyTexture> v1 = loadedSky(skyV1());
    EXPECT_EQ(v1->sun.get(), documentSun().get());
    EXPECT_EQ(v1->skyId.size(), 36u);

    // Version 2: own sun, transform (a plain one, set at time 0), settings,
    // skyFlag, skyId.
    RecordBytes b;
    b.u32(0x20000).u8(1).append(lighttest::sunV4("own").bytes());
    b.transform(lighttest::countingTransform(3));
    skySettings(b, "SKY-2");
    boost::shared_ptr<SkyTexture> v2 = loadedSky(b);
    ASSERT_TRUE(v2->sunLight());
    EXPECT_EQ(v2->sunLight()->id, u"own");
    EXPECT_NE(v2->sun.get(), documentSun().get());
    EXPECT_EQ(v2->transform.getKeyCount(), 1u);
    EXPECT_EQ(v2->transform.getValue(0), lighttest::countingTransform(3));
    EXPECT_EQ(v2->shadowBias, 0.5f);
    EXPECT_EQ(v2->turbidity, 6.0f);
    EXPECT_TRUE(v2->skyFlag);
    EXPECT_EQ(v2->skyId, u"SKY-2");
    // Version 2 leaves the document sun alone.
    EXPECT_EQ(documentSun()->id, utf8ToWide(kDocId));
}

TEST(SkyTexture, Version3ReplacesTheDocumentSunInPlace) {
    DocumentSunGuard guard;
    SunLight* const docSun = documentSun().get();
    boost::shared_ptr<SkyTexture> sky = loadedSky(skyV3("own", "doc-x", false));
    EXPECT_EQ(documentSun().get(), docSun);  // the same object, new contents
    EXPECT_EQ(documentSun()->id, u"doc-x");
    EXPECT_EQ(documentSun()->name, u"Noon");
    EXPECT_EQ(documentSun()->turbidity, 4.0f);
    EXPECT_EQ(sky->sunLight()->id, u"own");
    EXPECT_EQ(sky->transform.getValue(0), lighttest::countingTransform(1));

    // When the flag says so, the sky shares the document sun object.
    boost::shared_ptr<SkyTexture> shared = loadedSky(skyV3("doc-y", "doc-y", true));
    EXPECT_EQ(shared->sun.get(), docSun);
    EXPECT_EQ(xmlOf(*shared), skyAsset("/doc-y"));
}

TEST(SkyTexture, DocumentSunCarriesFromOneConversionToTheNext) {
    DocumentSunGuard guard;
    // First conversion: a version 3 sky whose document sun has another id.
    {
        boost::shared_ptr<SkyTexture> first = loadedSky(skyV3("own", "{0000-AAAA}", false));
        EXPECT_EQ(xmlOf(*first), skyAsset("/own"));
    }
    // Second conversion, with a writer of its own: a sky without own sun
    // and a new sky both refer to the document sun, which has the new id.
    boost::shared_ptr<SkyTexture> second = loadedSky(skyV1());
    EXPECT_EQ(second->sunLight()->id, u"{0000-AAAA}");
    EXPECT_EQ(xmlOf(*second), skyAsset("/{0000-AAAA}"));
    SkyTexture fresh;
    EXPECT_EQ(xmlOf(fresh), skyAsset("/{0000-AAAA}"));

    // A third one that brings the document sun's own id back.
    loadedSky(skyV3("own", kDocId, false));
    EXPECT_EQ(xmlOf(fresh), skyAsset("/Rhino Document Sun"));
}

TEST(SkyTexture, SavesVersion3) {
    DocumentSunGuard guard;
    for (bool sunIsDocument : {false, true}) {
        SCOPED_TRACE(sunIsDocument);
        const std::string own = sunIsDocument ? "doc-z" : "own";
        const RecordBytes b = skyV3(own, "doc-z", sunIsDocument);
        boost::shared_ptr<SkyTexture> sky = loadedSky(b);
        EXPECT_EQ(savedBytes(*sky), b.bytes());
    }
    // A sky read from an old record saves the document sun and the flag.
    boost::shared_ptr<SkyTexture> old = loadedSky(skyV1());
    const std::vector<std::uint8_t> bytes = savedBytes(*old);
    ASSERT_GT(bytes.size(), 4u);
    EXPECT_EQ(bytes[2], 3);
    EXPECT_EQ(bytes.back(), 1);  // its sun is the document sun
    QuickArchive ar(bytes.data(), bytes.size());
    SkyTexture back;
    ASSERT_TRUE(back.load(ar));
    EXPECT_TRUE(back.isEqual(old));
    EXPECT_EQ(back.sun.get(), documentSun().get());
}

TEST(SkyTexture, RefusedRecords) {
    DocumentSunGuard guard;
    struct Case {
        const char* name;
        RecordBytes bytes;
    };
    std::vector<std::uint8_t> badDocSun = skyV3("own", "doc", false).bytes();
    // The document sun's record starts behind its AnimatedTransform; make
    // its own transform record (the last 12 + 2 * 56 + 1 bytes) refuse.
    badDocSun[badDocSun.size() - 1 - (12 + 2 * 56) + 2] = 9;
    std::vector<std::uint8_t> badSkyTransform = skyV3("own", "doc", false).bytes();
    const std::size_t sunRecord = lighttest::sunV4("own").size();
    const std::size_t transformAt = 5 + sunRecord + 12 + 32 + 12 + 1 + 1 + 4 + 5;
    badSkyTransform[transformAt + 2] = 2;
    RecordBytes v4;
    v4.u32(0x40000).u8(0);
    RecordBytes lowHalf;
    lowHalf.u32(0x10001).u8(0);
    RecordBytes badOwnSun;
    badOwnSun.u32(0x10000).u8(1).u32(0x50000);
    RecordBytes docSunRecord, skyTransform;
    docSunRecord.append(badDocSun);
    skyTransform.append(badSkyTransform);
    const Case cases[] = {
        {"version 4", v4},
        {"low half set", lowHalf},
        {"own sun refused", badOwnSun},
        {"document sun refused", docSunRecord},
        {"sky transform refused", skyTransform},
        {"nothing", RecordBytes()},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        loadedSky(c.bytes, false);
    }
}

TEST(SkyTexture, CloneAndCompare) {
    DocumentSunGuard guard;
    boost::shared_ptr<SkyTexture> sky = loadedSky(skyV3("own", "doc", false));
    TexturePtr copy = sky->clone();
    SkyTexture& c = static_cast<SkyTexture&>(*copy);
    EXPECT_NE(c.skyId, sky->skyId);
    ASSERT_TRUE(c.sunLight());
    EXPECT_NE(c.sun.get(), sky->sun.get());
    EXPECT_NE(c.sunLight()->id, sky->sunLight()->id);
    EXPECT_FALSE(sky->isEqual(copy));

    // skyId compares without regard to case; the sun's id exactly.
    c.skyId = u"SKY-3";
    EXPECT_FALSE(sky->isEqual(copy));
    static_cast<SunLight&>(*c.sun).id = u"own";
    EXPECT_TRUE(sky->isEqual(copy));
    static_cast<SunLight&>(*c.sun).id = u"OWN";
    EXPECT_FALSE(sky->isEqual(copy));
    static_cast<SunLight&>(*c.sun).id = u"own";
    c.ozone = 0.5f;
    EXPECT_FALSE(sky->isEqual(copy));
    EXPECT_FALSE(sky->isEqual(TexturePtr()));
}

TEST(SkyTexture, DamagedRecordsFailQuietly) {
    DocumentSunGuard guard;
    for (const RecordBytes& whole : {skyV1("own"), skyV3("own", "doc", true)}) {
        for (std::size_t len = 0; len < whole.size(); ++len) {
            QuickArchive ar(whole.bytes().data(), len);
            SkyTexture sky;
            sky.load(ar);
            EXPECT_TRUE(sky.sun);  // never null, whatever the record did
        }
    }
}
