#include <gtest/gtest.h>

#include <functional>
#include <string>

#include "LightFixtures.h"
#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"

using namespace OrvaneLumoCore;
using namespace lighttest;

namespace {

LightPtr loadedLight(std::int32_t tag, const RecordBytes& bytes) {
    LightPtr light = createLight(tag);
    QuickArchive ar = bytes.archive();
    EXPECT_TRUE(light->load(ar));
    return light;
}

}  // namespace

// One light of each class with XML, from a hand-laid record, against the
// whole text of its Asset.
TEST(LightXml, GoldenAssets) {
    struct Case {
        std::int32_t tag;
        std::function<RecordBytes()> bytes;
        const char* url;
        const char* golden;
    };
    const Case cases[] = {
        {0, directV4, "/Scene", "lights/golden/direct.xml"},
        {2, omniV4, "/Scene", "lights/golden/omni.xml"},
        {3, rectangleV4, "/Scene", "lights/golden/rectangle.xml"},
        {4, spotV4, "/Scene", "lights/golden/spot.xml"},
        {6, iesV3, "/Scene", "lights/golden/ies.xml"},
        // A sun under an empty url stands at "/" and its id.
        {5, [] { return sunV4(); }, "", "lights/golden/sun.xml"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.golden);
        LightPtr light = loadedLight(c.tag, c.bytes());
        const std::string golden = readGolden(c.golden);
        ASSERT_FALSE(golden.empty());
        EXPECT_EQ(xmlOf([&](AssetXmlWriter& w) { light->writeXml(w, utf8ToWide(c.url)); }), golden);
    }
}

TEST(LightXml, SphereAndDomeWriteNothing) {
    for (LightPtr light : {createLight(7), LightPtr(new DomeLight)}) {
        std::u16string out;
        AssetXmlWriter w(out);
        light->writeXml(w, u"/Scene");
        EXPECT_TRUE(out.empty());
        EXPECT_TRUE(light->getPluginName().empty());
        EXPECT_EQ(w.getIndent(), 0);
    }
}

TEST(SunXml, WrittenOncePerWriter) {
    LightPtr sun = loadedLight(5, sunV4());
    std::u16string out;
    AssetXmlWriter w(out);
    sun->writeXml(w, u"/Env/sky");
    const std::u16string once = out;
    sun->writeXml(w, u"/Other");
    sun->writeXml(w, u"");
    EXPECT_EQ(out, once);
    ASSERT_EQ(w.sunRegistry.size(), 1u);
    // A url that isn't empty is used as it is, with nothing appended.
    EXPECT_EQ(w.sunRegistry.at(u"sun-1"), u"/Env/sky");
    EXPECT_NE(out.find(u"url=\"/Env/sky\" >"), std::u16string::npos);

    // A new writer has its own registry.
    std::u16string second;
    AssetXmlWriter w2(second);
    sun->writeXml(w2, u"");
    EXPECT_EQ(w2.sunRegistry.at(u"sun-1"), u"/sun-1");
}

TEST(SunXml, DocumentSunUnderAnEmptyUrlWritesNothing) {
    // Whatever the case of its letters.
    for (const char* id : {"{D3BE9766-E4AA-418b-81A9-23414A2BA98D}",
                           "{d3be9766-e4aa-418b-81a9-23414a2ba98d}"}) {
        LightPtr sun = loadedLight(5, sunV4(id));
        std::u16string out;
        AssetXmlWriter w(out);
        sun->writeXml(w, u"");
        EXPECT_TRUE(out.empty()) << id;
        EXPECT_TRUE(w.sunRegistry.empty()) << id;

        // Under a url of its own it is written like any sun.
        sun->writeXml(w, u"/Doc");
        EXPECT_EQ(w.sunRegistry.size(), 1u);
        EXPECT_NE(out.find(u"<lumoplugin name=\"SunLight\" type=\"light\">"), std::u16string::npos);
    }
}

TEST(SunXml, TransformIsTheValueAtTimeZero) {
    boost::shared_ptr<SunLight> sun(new SunLight(u"s", u"x"));
    sun->transform.track.clear();
    sun->transform.setValue(countingTransform(10), 1.0);
    sun->transform.setValue(countingTransform(20), 3.0);
    const std::string xml = xmlOf([&](AssetXmlWriter& w) { sun->writeXml(w, u""); });
    // Before the first key the first key's value stands.
    EXPECT_NE(xml.find("<x>10</x>"), std::string::npos);
    EXPECT_EQ(xml.find("<x>20</x>"), std::string::npos);
}
