// The sky texture and the one document sun of the process that skies share,
// within one document and from one whole conversion to the next.
#include <cstdio>

#include <gtest/gtest.h>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "module/OrvMatFile.h"
#include "support/Golden.h"
#include "support/LightFixtures.h"
#include "textures/SkyTexture.h"

using namespace OrvaneLumoCore;
using namespace lighttest;

namespace {

const char kDocId[] = "{D3BE9766-E4AA-418b-81A9-23414A2BA98D}";

// Puts the document sun back as it was after each test: version 3 sky records
// change it for the whole process, and the tests share one process.
class SkyTest : public ::testing::Test {
    const std::vector<std::uint8_t> documentSun_ = savedBytes(*documentSun());
    void TearDown() override { loads(*documentSun(), RecordBytes{documentSun_}); }
};

// The settings of a sky record (version 2 and 3): up_vector, eight reals
// (shadowBias to ozone), three ints, shadows; then skyFlag and skyId.
RecordBytes& settings(RecordBytes& b, const std::string& skyId) {
    return b.floats({0, 0, 1, 0.5f, 6, 2, 1, 1, 50, 150, 0.35f}).ints({500, 1000, 8}).u8(1).u8(1).wstr(skyId);
}

// SkyTexture 1: own sun flag, the sun's record if set.
RecordBytes skyV1(const std::string& ownSunId = "") {
    return ownSunId.empty() ? RecordBytes().version(1).u8(0) : RecordBytes().version(1).u8(1).append(sunV4(ownSunId));
}

// SkyTexture 3: own sun, settings, skyFlag, skyId, AnimatedTransform, the
// document sun's record (a version 4 sun with `docId`), and whether the
// sky's sun is the document sun.
RecordBytes skyV3(const std::string& ownSunId, const std::string& docId, bool sunIsDocument) {
    RecordBytes b = RecordBytes().version(3).u8(1).append(sunV4(ownSunId));
    return settings(b, "sky-3").animated({{0.0, countingTransform(1)}}).append(sunV4(docId)).u8(sunIsDocument);
}

// The whole Asset of a sky under /M whose sun reference is `reference`.
std::string skyAsset(const std::string& reference) {
    std::string text = readGolden("textures/golden/sky.xml");
    return text.replace(text.find("SUN"), 3, reference);
}

}  // namespace

// The sun reference in its three cases: the document sun, a sun written
// earlier by the same writer, and any other sun.
TEST_F(SkyTest, SunReference) {
    const std::pair<RecordBytes, const char*> cases[] = {
        {skyV1(), "/Rhino Document Sun"}, {skyV1(kDocId), "/Rhino Document Sun"},
        {skyV1("{d3be9766-e4aa-418b-81a9-23414a2ba98d}"), "/Rhino Document Sun"},
        {skyV1("sun-7"), "/sun-7"}, {skyV1("a&b"), "/a&amp;b"}};
    for (const auto& c : cases) EXPECT_EQ(skyAsset(c.second), xmlOf(*loaded<SkyTexture>(c.first), u"/M"));

    // A sun that the writer has written already is referred to by its url.
    std::u16string out;
    AssetXmlWriter w(out);
    loaded<SunLight>(sunV4("sun-7"))->writeXml(w, u"/Env/sun");
    out.clear();
    loaded<SkyTexture>(skyV1("sun-7"))->writeXml(w, u"/M");
    EXPECT_EQ(skyAsset("/Env/sun"), wideToUtf8(out));
}

// Old records, read over a sky that held a version 3 record, save as version 3
// with the document sun as it stands, which they leave alone; the golden list
// holds the records saved. A version 1 record holds no skyId, so the sky is
// given one before it saves.
TEST_F(SkyTest, OldVersionsSaveAsTheNewest) {
    // SkyTexture 2: own sun, a plain transform (set at time 0), settings,
    // skyFlag, skyId.
    RecordBytes v2 = RecordBytes().version(2).u8(1).append(sunV4("own")).transform(countingTransform(3));
    const std::pair<const char*, RecordBytes> cases[] = {
        {"SkyTexture 1, the document sun", skyV1()}, {"SkyTexture 1, own sun", skyV1("own")},
        {"SkyTexture 2", settings(v2, "SKY-2")}};
    const boost::shared_ptr<SkyTexture> sky = loaded<SkyTexture>(skyV3("own", "doc-z", false));
    std::string out;
    for (const auto& c : cases) {
        const bool v1 = c.second.data[2] == 1;
        out += savedFromOld(c.first, sky, c.second, [] { return createTexture(12); },
                            [&] { if (v1) sky->skyId = u"SKY-1"; });
        EXPECT_EQ(documentSun()->id, u"doc-z") << c.first;
    }
    expectGolden("textures/golden/sky_old_versions.txt", out);
    // Without a sun of its own, the sky's sun is the document sun, and so it is when saved and read back.
    const boost::shared_ptr<SkyTexture> back = loaded<SkyTexture>(RecordBytes{savedBytes(*loaded<SkyTexture>(skyV1()))});
    EXPECT_EQ(back->sun.get(), documentSun().get());
}

TEST_F(SkyTest, Version3ReplacesTheDocumentSunInPlace) {
    SunLight* const docSun = documentSun().get();
    for (bool sunIsDocument : {false, true}) {
        const std::string own = sunIsDocument ? "doc-z" : "own";
        const RecordBytes b = skyV3(own, "doc-z", sunIsDocument);
        boost::shared_ptr<SkyTexture> sky = loaded<SkyTexture>(b);
        EXPECT_EQ(documentSun().get(), docSun);  // the same object, new contents
        EXPECT_EQ(documentSun()->id, u"doc-z");
        EXPECT_EQ(savedBytes(*sky), b.data);
        // When the flag says so, the sky shares the document sun object.
        EXPECT_EQ(sky->sun.get() == docSun, sunIsDocument);
        EXPECT_EQ(skyAsset("/" + own), xmlOf(*sky, u"/M"));
    }
}

TEST_F(SkyTest, CloneAndCompare) {
    boost::shared_ptr<SkyTexture> sky = loaded<SkyTexture>(skyV3("own", "doc", false));
    TexturePtr copy = sky->clone();
    SkyTexture& c = static_cast<SkyTexture&>(*copy);
    EXPECT_NE(c.sun.get(), sky->sun.get());
    EXPECT_FALSE(sky->isEqual(copy));  // a new skyId, a sun with a new id
    // skyId compares without regard to case.
    c.skyId = u"SKY-3";
    static_cast<SunLight&>(*c.sun).id = u"own";
    EXPECT_TRUE(sky->isEqual(copy));
    c.ozone = 0.5f;
    EXPECT_FALSE(sky->isEqual(copy));
}

// A sky that saves a version 1 record without a sun of its own, and so uses
// whatever the document sun is.
class SkyV1 : public SkyTexture {
    bool save(QuickArchive& ar) const override {
        ar.writeUInt(0x10000);
        ar.writeByte(false);
        return true;
    }
};

TEST_F(SkyTest, DocumentSunCarriesToTheNextConversion) {
    // A library of one material whose diffuse layer shows `sky`, in a file.
    auto save = [](const char* name, const TexturePtr& sky) {
        auto layer = boost::make_shared<Diffuse_BRDF>();
        layer->color_tex = sky;
        OrvMatFile file;
        file.materials.push_back(boost::make_shared<MaterialLayeredBRDF>());
        static_cast<MaterialLayeredBRDF&>(*file.materials[0]).brdfs.push_back(layer);
        EXPECT_TRUE(file.save(utf8ToWide(::testing::TempDir() + name)));
        return ::testing::TempDir() + name;
    };
    // The sun reference of the sky in the library's conversion; no sun's Asset is written.
    auto sunReference = [](const std::string& path) {
        const std::string xml = wideToUtf8(OrvMatFile().getXml(utf8ToWide(path)));
        const std::size_t at = xml.find("<value>", xml.find("name=\"sun\"")) + 7;
        EXPECT_EQ(xml.find("SunLight"), std::string::npos);
        return xml.substr(at, xml.find("</value>", at) - at);
    };
    const std::string plain = save("sky_plain.orvmat", TexturePtr(new SkyV1));
    // A sky saved while the document sun had another id: reading its record
    // replaces the document sun, and the sky's sun is that document sun.
    const std::string otherId = "{4B0D3F85-6EC0-4F94-8C3B-5A7EBD9F468A}";
    documentSun()->id = utf8ToWide(otherId);
    const std::string carrier = save("sky_carrier.orvmat", TexturePtr(new SkyTexture));
    documentSun()->id = utf8ToWide(kDocId);

    // Alone, the plain library refers to the document sun by its fixed url;
    // converted after the carrier, to the carrier's document sun.
    EXPECT_EQ(sunReference(plain), "/Rhino Document Sun");
    EXPECT_EQ(sunReference(carrier), "/" + otherId);
    EXPECT_EQ(sunReference(plain), "/" + otherId);
    std::remove(plain.c_str());
    std::remove(carrier.c_str());
}
