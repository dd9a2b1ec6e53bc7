// The lights: records of every version, their XML against golden documents,
// the sun's registry per writer, copies and comparisons.
#include <gtest/gtest.h>

#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"
#include "support/Golden.h"
#include "support/LightFixtures.h"

using namespace OrvaneLumoCore;
using namespace lighttest;

namespace {

struct Newest {
    std::int32_t tag;
    RecordBytes bytes;
    const char* golden;
};

const std::vector<Newest>& newest() {
    static const std::vector<Newest> rows = {
        {0, directV4(), "direct.xml"},       {2, omniV4(), "omni.xml"}, {3, rectangleV4(), "rectangle.xml"},
        {4, spotV4(), "spot.xml"},           {6, iesV3(), "ies.xml"},   {5, sunV4(), "sun.xml"},
    };
    return rows;
}

// `bytes` without their last `drop` bytes, under `version`.
RecordBytes cut(RecordBytes bytes, std::size_t drop, int version) {
    bytes.data.resize(bytes.data.size() - drop);
    return bytes.with(0, std::uint32_t(version) << 16);
}

}  // namespace

TEST(LightXml, GoldenAssets) {
    for (const Newest& n : newest()) {
        SCOPED_TRACE(n.golden);
        LightPtr light = loadedInto(createLight(n.tag), n.bytes);
        // A sun under an empty url stands at "/" and its id.
        expectGolden("lights/golden/" + std::string(n.golden), xmlOf(*light, n.tag == 5 ? u"" : u"/Scene", true));
    }
}

TEST(LightXml, SphereAndDomeWriteNothing) {
    for (LightPtr light : {createLight(7), LightPtr(new DomeLight)}) {
        EXPECT_TRUE(xmlOf(*light, u"/Scene").empty());
        EXPECT_TRUE(light->getPluginName().empty());
    }
}

TEST(SunXml, WrittenOncePerWriter) {
    LightPtr sun = loaded<SunLight>(sunV4());
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
    for (const char* id : {"{D3BE9766-E4AA-418b-81A9-23414A2BA98D}", "{d3be9766-e4aa-418b-81a9-23414a2ba98d}"}) {
        LightPtr sun = loaded<SunLight>(sunV4(id));
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
    SunLight sun(u"s", u"x");
    sun.transform.track.clear();
    sun.transform.setValue(countingTransform(10), 1.0);
    sun.transform.setValue(countingTransform(20), 3.0);
    const std::string xml = xmlOf(sun, u"");
    // Before the first key the first key's value stands.
    EXPECT_NE(xml.find("<x>10</x>"), std::string::npos);
    EXPECT_EQ(xml.find("<x>20</x>"), std::string::npos);
}

TEST(LightFactory, TagsWithoutAClassGiveNull) {
    for (std::int32_t tag : {-1, 1, 8, 9}) EXPECT_FALSE(createLight(tag)) << tag;
    EXPECT_EQ(DomeLight().getType(), 8u);
}

TEST(LightRecords, NewestVersionsGoBackByteForByte) {
    for (const Newest& n : newest()) {
        SCOPED_TRACE(n.tag);
        LightPtr light = loadedInto(createLight(n.tag), n.bytes);
        EXPECT_EQ(savedBytes(*light), n.bytes.data);
        EXPECT_TRUE(light->isEqual(light->clone()) || n.tag == 5);  // a sun's clone has a new id
        EXPECT_FALSE(light->isEqual(createLight(n.tag)) || light->isEqual(LightPtr()));
    }
    for (std::int32_t tag : {0, 2, 3, 4, 5, 6, 7}) {
        LightPtr light = createLight(tag);
        EXPECT_TRUE(light->isEqual(loadedInto(createLight(tag), RecordBytes{savedBytes(*light)}))) << tag;
    }
    DomeLight dome;
    EXPECT_EQ(savedBytes(dome), (std::vector<std::uint8_t>{0, 0, 1, 0}));
    EXPECT_TRUE(loads(dome, RecordBytes().version(1), true));
    EXPECT_TRUE(dome.isEqual(dome.clone()));
    EXPECT_FALSE(dome.isEqual(createLight(7)));
}

// Old records, read over a light that held the newest one, save as the newest
// version with the defaults of the fields they lack; the golden list holds the
// records saved.
TEST(LightRecords, OldVersionsSaveAsTheNewest) {
    const Transform ct1 = countingTransform(1), ct3 = countingTransform(3), ct4 = countingTransform(4);
    const Transform ct5 = countingTransform(5), ct2 = countingTransform(2);
    // SpotLight 1: color, shadowBias, decay, intensity, storedFactor,
    // photonSubdivs, causticSubdivs, storedMode, enabled. 2: then shadows,
    // shadowSubdivs, shadowRadius, transform, coneAngle, penumbraAngle.
    const RecordBytes spot = RecordBytes().floats({0.5f, 0.5f, 0.25f, 0.1f, 2, 7, 0.5f}).ints({11, 12, 1}).u8(0);
    // RectangleLight 2: color, shadowBias, intensity, storedFactor, subdivs,
    // causticSubdivs, photonSubdivs, storedMode, doubleSided, invisible,
    // lightPortal, noDecay, enabled, storeWithIrradianceMap,
    // ignoreLightNormals, shadows, transform, u_size, v_size. 1: up to
    // ignoreLightNormals.
    const RecordBytes rect = RecordBytes().floats({0.5f, 0.5f, 0.5f, 0.01f, 40, 1.5f}).ints({6, 1001, 501, 2});
    // MayaDirectLight 1: color, shadowBias, intensity, storedFactor,
    // causticSubdivs, photonSubdivs, storedMode, enabled. 2: then shadows,
    // shadowSubdivs, shadowRadius and a plain transform, which becomes the key
    // at time 0. 3: the same with the AnimatedTransform record.
    const RecordBytes direct = RecordBytes().floats({0.5f, 0.25f, 1, 0.1f, 4, 2}).ints({30, 40, 1}).u8(1);
    // SunLight 1: transform, up_vector, the eight reals, three ints, shadows.
    // 2: then id and name. 3: then enabled and invisible.
    const RecordBytes sunSet = RecordBytes().floats({1, 0, 0, 0.5f, 5, 3, 2, 1.5f, 10, 20, 0.25f}).ints({1, 2, 3});
    const RecordBytes sun = RecordBytes(sunSet).u8(1).wstr("abc").wstr("Evening");
    // SphereLight 1: transform, color, shadowColor, four reals, four ints,
    // five flags; 2 holds all eight.
    const RecordBytes sphere =
        RecordBytes().transform(ct2).floats({0.5f, 0.5f, 0.5f, 0.1f, 0.1f, 0.1f, 1, 2, 3, 4}).ints({5, 6, 7, 8});
    const struct { std::int32_t tag; const char* what; RecordBytes old; } cases[] = {
        {4, "SpotLight 1", RecordBytes().version(1).append(spot)},
        {4, "SpotLight 2", RecordBytes().version(2).append(spot).u8(0).i32(4).f32(0.25f).transform(ct3).floats({0.5f, 0.1f})},
        {3, "RectangleLight 1", RecordBytes().version(1).append(rect).flags({0, 1, 0, 1, 0, 0, 1})},
        {3, "RectangleLight 2", RecordBytes().version(2).append(rect).flags({1, 0, 1, 0, 1, 1, 0, 0}).transform(ct1).floats({4, 5})},
        // OmniLight 3: version 4 without affectDiffuse and affectSpecular.
        {2, "OmniLight 3", cut(omniV4(), 2, 3)},
        {0, "MayaDirectLight 1", RecordBytes().version(1).append(direct)},
        {0, "MayaDirectLight 2", RecordBytes().version(2).append(direct).u8(0).i32(3).f32(0.5f).transform(ct4)},
        {0, "MayaDirectLight 3",
         RecordBytes().version(3).append(direct).u8(1).i32(3).f32(0.5f).animated({{1, ct4}, {2, countingTransform(8)}})},
        {5, "SunLight 2", RecordBytes().version(2).transform(ct5).append(sun)},
        {5, "SunLight 3", RecordBytes().version(3).transform(ct5).append(sun).flags({0, 1})},
        // IESLight 1: version 3 without affectDiffuse, affectSpecular and
        // intensity; 2: without intensity.
        {6, "IESLight 1", cut(iesV3(), 6, 1)},
        {6, "IESLight 2", cut(iesV3(), 4, 2)},
        {7, "SphereLight 1", RecordBytes().version(1).append(sphere).flags({0, 0, 1, 1, 1})},
    };
    std::string out;
    for (const auto& c : cases) {
        LightPtr light = createLight(c.tag);
        for (const Newest& n : newest())
            if (n.tag == c.tag) loads(*light, n.bytes);
        out += savedFromOld(c.what, light, c.old, [&c] { return createLight(c.tag); });
    }
    expectGolden("lights/golden/old_versions.txt", out);
    // A version 1 sun keeps the fresh id of reset and an empty name.
    boost::shared_ptr<SunLight> s1 = loaded<SunLight>(RecordBytes().version(1).transform(ct5).append(sunSet).u8(0));
    EXPECT_EQ(s1->id.size(), 36u);
    EXPECT_EQ(savedBytes(*s1), RecordBytes().version(4).append(sunSet).u8(0).wstr(wideToUtf8(s1->id)).wstr("").flags({1, 0})
                                   .animated({{0, ct5}}).data);
}

TEST(LightCompare, FilePathsIgnoreCaseSunIdsDoNot) {
    boost::shared_ptr<IESLight> a = loaded<IESLight>(iesV3());
    auto b = boost::make_shared<IESLight>(*a);
    b->ies_file = u"c:\\LIGHTS\\A&B<1>.IES";
    EXPECT_TRUE(a->isEqual(b));
    boost::shared_ptr<SunLight> s = loaded<SunLight>(sunV4("Sun-A")), t = loaded<SunLight>(sunV4("sun-a"));
    EXPECT_FALSE(s->isEqual(t));
    t->id = s->id;
    EXPECT_TRUE(s->isEqual(t));
    t->name = u"noon";
    EXPECT_FALSE(s->isEqual(t));
}

TEST(LightCompare, SunCloneAndResetGiveANewId) {
    boost::shared_ptr<SunLight> s = loaded<SunLight>(sunV4());
    boost::shared_ptr<SunLight> c = boost::static_pointer_cast<SunLight>(s->clone());
    EXPECT_NE(c->id, s->id);
    EXPECT_EQ(c->id.size(), 36u);
    c->id = s->id;
    EXPECT_TRUE(s->isEqual(c));
    const std::u16string first = c->id;
    c->reset();
    EXPECT_NE(c->id, first);
    EXPECT_TRUE(sunSettingsEqual(*c, SunSettings()));
}

TEST(DocumentSun, IsTheDefaultNamedSun) {
    EXPECT_EQ(documentSun()->name, u"Default");
    EXPECT_EQ(documentSun()->id, u"{D3BE9766-E4AA-418b-81A9-23414A2BA98D}");
    // The id compares without regard to case, braces included.
    EXPECT_TRUE(isDocumentSunId(u"{d3be9766-e4aa-418B-81a9-23414a2ba98d}"));
    EXPECT_FALSE(isDocumentSunId(u"D3BE9766-E4AA-418b-81A9-23414A2BA98D"));
}
