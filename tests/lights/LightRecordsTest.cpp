#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "LightFixtures.h"
#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"

using namespace OrvaneLumoCore;
using namespace lighttest;

namespace {

template <class T>
boost::shared_ptr<T> loaded(RecordBytes bytes, bool expectOk = true) {
    boost::shared_ptr<T> light = boost::make_shared<T>();
    QuickArchive ar = bytes.archive();
    EXPECT_EQ(light->load(ar), expectOk);
    return light;
}

struct NewestRecord {
    std::int32_t tag;
    std::function<RecordBytes()> bytes;
};

const NewestRecord kNewest[] = {
    {0, directV4}, {2, omniV4}, {3, rectangleV4}, {4, spotV4}, {5, [] { return sunV4(); }},
    {6, iesV3},
};

}  // namespace

TEST(LightFactory, MakesTheClassesOfTheFamily) {
    struct Case {
        std::int32_t tag;
        bool made;
    };
    const Case cases[] = {{-1, false}, {0, true},  {1, false}, {2, true}, {3, true}, {4, true},
                          {5, true},   {6, true},  {7, true},  {8, false}, {9, false}};
    for (const Case& c : cases) {
        LightPtr light = createLight(c.tag);
        ASSERT_EQ(static_cast<bool>(light), c.made) << "tag " << c.tag;
        if (light) {
            EXPECT_EQ(light->getType(), static_cast<std::uint32_t>(c.tag));
            EXPECT_EQ(light->getAssetType(), u"light");
        }
    }
    EXPECT_EQ(DomeLight().getType(), 8u);
}

TEST(LightRecords, NewestVersionsGoBackByteForByte) {
    for (const NewestRecord& r : kNewest) {
        SCOPED_TRACE(r.tag);
        const RecordBytes bytes = r.bytes();
        LightPtr light = createLight(r.tag);
        QuickArchive ar = bytes.archive();
        ASSERT_TRUE(light->load(ar));
        EXPECT_EQ(ar.getReadPosition(), bytes.size());
        EXPECT_EQ(savedBytes(*light), bytes.bytes());

        // A second load of the saved record is equal; a default object isn't.
        LightPtr again = createLight(r.tag);
        QuickArchive ar2(savedBytes(*light).data(), bytes.size());
        ASSERT_TRUE(again->load(ar2));
        EXPECT_TRUE(light->isEqual(again));
        EXPECT_FALSE(light->isEqual(createLight(r.tag)));
        EXPECT_FALSE(light->isEqual(LightPtr()));
    }
}

TEST(LightRecords, DefaultObjectsRoundTrip) {
    for (std::int32_t tag : {0, 2, 3, 4, 5, 6, 7}) {
        SCOPED_TRACE(tag);
        LightPtr light = createLight(tag);
        const std::vector<std::uint8_t> bytes = savedBytes(*light);
        LightPtr back = createLight(tag);
        QuickArchive ar(bytes.data(), bytes.size());
        ASSERT_TRUE(back->load(ar));
        EXPECT_TRUE(light->isEqual(back));
    }
}

TEST(LightRecords, RefusedVersionTags) {
    struct Case {
        std::int32_t tag;
        std::uint32_t beyondNewest;
    };
    const Case cases[] = {{0, 0x50000}, {2, 0x50000}, {3, 0x50000}, {4, 0x50000},
                          {5, 0x50000}, {6, 0x40000}, {7, 0x30000}};
    for (const Case& c : cases) {
        for (std::uint32_t versionTag : {0x20001u, 0x00000u, c.beyondNewest}) {
            SCOPED_TRACE(c.tag);
            SCOPED_TRACE(versionTag);
            RecordBytes b;
            b.u32(versionTag);
            for (int i = 0; i < 64; ++i) b.u32(0);
            QuickArchive ar = b.archive();
            EXPECT_FALSE(createLight(c.tag)->load(ar));
        }
        // Nothing at all: the tag never arrives.
        QuickArchive empty(nullptr, 0);
        EXPECT_FALSE(createLight(c.tag)->load(empty));
    }
    QuickArchive empty(nullptr, 0);
    EXPECT_FALSE(DomeLight().load(empty));
}

TEST(LightRecords, LoadStartsFromTheDefaults) {
    // A light that held other values reads a version 1 record like a new one.
    boost::shared_ptr<SpotLight> spot = loaded<SpotLight>(spotV4());
    RecordBytes v1;
    // SpotLight version 1: color, shadowBias, decay, intensity, storedFactor,
    // photonSubdivs, causticSubdivs, storedMode, enabled.
    v1.u32(0x10000);
    color(v1, 1, 1, 1);
    v1.f32(0).f32(0).f32(50).f32(1).i32(500).i32(1000).i32(3).u8(1);
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(spot->load(ar));
    EXPECT_TRUE(spot->isEqual(createLight(4)));
}

// ---- old versions ----------------------------------------------------------------

TEST(SpotLightRecords, Version1KeepsTheDefaultsOfLaterFields) {
    // Version 1: color, shadowBias, decay, intensity, storedFactor,
    // photonSubdivs, causticSubdivs, storedMode, enabled.
    RecordBytes b;
    b.u32(0x10000);
    color(b, 0.5f, 0.5f, 0.25f);
    b.f32(0.1f).f32(2.0f).f32(7.0f).f32(0.5f).i32(11).i32(12).i32(1).u8(0);
    boost::shared_ptr<SpotLight> s = loaded<SpotLight>(b);
    EXPECT_EQ(s->color, Color(0.5f, 0.5f, 0.25f));
    EXPECT_EQ(s->shadowBias, 0.1f);
    EXPECT_EQ(s->decay, 2.0f);
    EXPECT_EQ(s->intensity, 7.0f);
    EXPECT_EQ(s->storedFactor, 0.5f);
    EXPECT_EQ(s->photonSubdivs, 11);
    EXPECT_EQ(s->causticSubdivs, 12);
    EXPECT_EQ(s->storedMode, 1);
    EXPECT_FALSE(s->enabled);
    EXPECT_EQ(s->transform, Transform());
    EXPECT_EQ(s->coneAngle, 1.0f);
    EXPECT_EQ(s->barnDoorLeft, 20.0f);
    EXPECT_EQ(s->barnDoorRight, 20.0f);
    EXPECT_EQ(s->barnDoorTop, 20.0f);
    EXPECT_EQ(s->barnDoorBottom, 20.0f);
    EXPECT_TRUE(s->shadows);
    EXPECT_EQ(s->cutoffThreshold, 0.005f);
}

TEST(SpotLightRecords, Version2AddsShadowsTransformAndCone) {
    // Version 2: version 1, then shadows, shadowSubdivs, shadowRadius,
    // transform, coneAngle, penumbraAngle.
    RecordBytes b;
    b.u32(0x20000);
    color(b, 1, 1, 1);
    b.f32(0).f32(0).f32(50).f32(1).i32(500).i32(1000).i32(3).u8(1);
    b.u8(0).i32(4).f32(0.25f).transform(countingTransform(3)).f32(0.5f).f32(0.1f);
    boost::shared_ptr<SpotLight> s = loaded<SpotLight>(b);
    EXPECT_FALSE(s->shadows);
    EXPECT_EQ(s->shadowSubdivs, 4);
    EXPECT_EQ(s->shadowRadius, 0.25f);
    EXPECT_EQ(s->transform, countingTransform(3));
    EXPECT_EQ(s->coneAngle, 0.5f);
    EXPECT_EQ(s->penumbraAngle, 0.1f);
    EXPECT_FALSE(s->barnDoor);
    EXPECT_EQ(s->units, 0);
}

TEST(RectangleLightRecords, Version2HasNoUnitsOrCutoff) {
    // Version 2: color, shadowBias, intensity, storedFactor, subdivs,
    // causticSubdivs, photonSubdivs, storedMode, doubleSided, invisible,
    // lightPortal, noDecay, enabled, storeWithIrradianceMap,
    // ignoreLightNormals, shadows, transform, u_size, v_size.
    RecordBytes b;
    b.u32(0x20000);
    color(b, 0.5f, 0.5f, 0.5f);
    b.f32(0.01f).f32(40).f32(1).i32(6).i32(1000).i32(500).i32(3);
    b.u8(1).u8(0).u8(1).u8(0).u8(1).u8(1).u8(0).u8(0);
    b.transform(countingTransform(1)).f32(4).f32(5);
    boost::shared_ptr<RectangleLight> r = loaded<RectangleLight>(b);
    EXPECT_EQ(r->units, 0);
    EXPECT_EQ(r->cutoffThreshold, 0.005f);
    EXPECT_EQ(r->shadowColor, Color(0, 0, 0));
    EXPECT_EQ(r->subdivs, 6);
    EXPECT_TRUE(r->doubleSided);
    EXPECT_TRUE(r->lightPortal);
    EXPECT_TRUE(r->storeWithIrradianceMap);
    EXPECT_FALSE(r->ignoreLightNormals);
    EXPECT_FALSE(r->shadows);
    EXPECT_EQ(r->transform, countingTransform(1));
    EXPECT_EQ(r->u_size, 4.0f);
    EXPECT_EQ(r->v_size, 5.0f);
    EXPECT_TRUE(r->affectReflections);
}

TEST(RectangleLightRecords, Version1EndsWithTheFlags) {
    // Version 1: as version 2 up to ignoreLightNormals.
    RecordBytes b;
    b.u32(0x10000);
    color(b, 0.5f, 0.5f, 0.5f);
    b.f32(0.01f).f32(40).f32(1).i32(6).i32(1000).i32(500).i32(3);
    b.u8(0).u8(1).u8(0).u8(1).u8(0).u8(0).u8(1);
    boost::shared_ptr<RectangleLight> r = loaded<RectangleLight>(b);
    EXPECT_TRUE(r->invisible);
    EXPECT_TRUE(r->noDecay);
    EXPECT_FALSE(r->enabled);
    EXPECT_TRUE(r->shadows);
    EXPECT_EQ(r->u_size, 1.0f);
}

TEST(OmniLightRecords, Version3LacksOnlyTheAffectFlags) {
    // Version 3: color, shadowColor, cutoffThreshold, shadowBias, decay,
    // intensity, storedFactor, units, photonSubdivs, causticSubdivs,
    // storedMode, enabled, shadows, shadowSubdivs, shadowRadius, transform.
    RecordBytes b;
    b.u32(0x30000);
    color(b, 0.1f, 0.2f, 0.3f);
    color(b, 0.3f, 0.2f, 0.1f);
    b.f32(0.5f).f32(0.01f).f32(2).f32(10).f32(1).i32(1).i32(5).i32(6).i32(3);
    b.u8(1).u8(0).i32(3).f32(1.5f).transform(countingTransform(7));
    boost::shared_ptr<OmniLight> o = loaded<OmniLight>(b);
    EXPECT_EQ(o->shadowColor, Color(0.3f, 0.2f, 0.1f));
    EXPECT_EQ(o->cutoffThreshold, 0.5f);
    EXPECT_EQ(o->units, 1);
    EXPECT_EQ(o->shadowRadius, 1.5f);
    EXPECT_EQ(o->transform, countingTransform(7));
    EXPECT_TRUE(o->affectDiffuse);
    EXPECT_TRUE(o->affectSpecular);
}

namespace {
// MayaDirectLight version 1: color, shadowBias, intensity, storedFactor,
// causticSubdivs, photonSubdivs, storedMode, enabled.
RecordBytes directHead(std::uint32_t versionTag) {
    RecordBytes b;
    b.u32(versionTag);
    color(b, 0.5f, 0.25f, 1.0f);
    b.f32(0.1f).f32(4).f32(2).i32(30).i32(40).i32(1).u8(1);
    return b;
}
}  // namespace

TEST(MayaDirectLightRecords, OldVersions) {
    RecordBytes v1 = directHead(0x10000);
    boost::shared_ptr<MayaDirectLight> d1 = loaded<MayaDirectLight>(v1);
    EXPECT_EQ(d1->causticSubdivs, 30);
    EXPECT_EQ(d1->photonSubdivs, 40);
    EXPECT_EQ(d1->shadowSubdivs, 8);
    EXPECT_EQ(d1->transform, AnimatedTransform());

    // Version 2: version 1, then shadows, shadowSubdivs, shadowRadius and a
    // plain transform, which becomes the key at time 0.
    RecordBytes v2 = directHead(0x20000);
    v2.u8(0).i32(3).f32(0.5f).transform(countingTransform(4));
    boost::shared_ptr<MayaDirectLight> d2 = loaded<MayaDirectLight>(v2);
    EXPECT_FALSE(d2->shadows);
    EXPECT_EQ(d2->shadowSubdivs, 3);
    EXPECT_EQ(d2->shadowRadius, 0.5f);
    EXPECT_EQ(d2->transform.getKeyCount(), 1u);
    EXPECT_EQ(d2->transform.getValue(0), countingTransform(4));
    EXPECT_EQ(d2->shadowColor, Color(0, 0, 0));

    // Version 3: as version 2, with the AnimatedTransform record.
    RecordBytes v3 = directHead(0x30000);
    v3.u8(1).i32(3).f32(0.5f);
    animatedTransform(v3, {{1.0, countingTransform(4)}, {2.0, countingTransform(8)}});
    boost::shared_ptr<MayaDirectLight> d3 = loaded<MayaDirectLight>(v3);
    EXPECT_EQ(d3->transform.getKeyCount(), 2u);
    EXPECT_EQ(d3->transform.getValue(2.0), countingTransform(8));

    // A transform record that doesn't load fails the light.
    RecordBytes bad = directHead(0x30000);
    bad.u8(1).i32(3).f32(0.5f).u32(0x20000);
    loaded<MayaDirectLight>(bad, false);
}

TEST(SunLightRecords, OldVersions) {
    // Version 1: transform, up_vector, the eight reals, three ints, shadows.
    RecordBytes v1;
    v1.u32(0x10000).transform(countingTransform(5)).vec(1, 0, 0);
    v1.f32(0.5f).f32(5).f32(3).f32(2).f32(1.5f).f32(10).f32(20).f32(0.25f);
    v1.i32(1).i32(2).i32(3).u8(0);
    boost::shared_ptr<SunLight> s1 = loaded<SunLight>(v1);
    EXPECT_EQ(s1->transform.getValue(0), countingTransform(5));
    EXPECT_EQ(s1->transform.getKeyCount(), 1u);
    EXPECT_EQ(s1->up_vector, Vector(1, 0, 0));
    EXPECT_EQ(s1->turbidity, 5.0f);
    EXPECT_EQ(s1->ozone, 0.25f);
    EXPECT_EQ(s1->shadow_subdivs, 3);
    EXPECT_FALSE(s1->shadows);
    EXPECT_TRUE(s1->enabled);
    EXPECT_FALSE(s1->invisible);
    EXPECT_EQ(s1->id.size(), 36u);  // the fresh UUID of reset
    EXPECT_TRUE(s1->name.empty());

    // Version 2: version 1, then id and name.
    RecordBytes v2;
    v2.u32(0x20000).transform(countingTransform(5)).vec(1, 0, 0);
    v2.f32(0.5f).f32(5).f32(3).f32(2).f32(1.5f).f32(10).f32(20).f32(0.25f);
    v2.i32(1).i32(2).i32(3).u8(1);
    wstr(v2, "abc");
    wstr(v2, "Evening");
    boost::shared_ptr<SunLight> s2 = loaded<SunLight>(v2);
    EXPECT_EQ(s2->id, u"abc");
    EXPECT_EQ(s2->name, u"Evening");
    EXPECT_TRUE(s2->enabled);

    // Version 3: version 2, then enabled and invisible.
    RecordBytes v3;
    v3.u32(0x30000).transform(countingTransform(5)).vec(1, 0, 0);
    v3.f32(0.5f).f32(5).f32(3).f32(2).f32(1.5f).f32(10).f32(20).f32(0.25f);
    v3.i32(1).i32(2).i32(3).u8(1);
    wstr(v3, "abc");
    wstr(v3, "Evening");
    v3.u8(0).u8(1);
    boost::shared_ptr<SunLight> s3 = loaded<SunLight>(v3);
    EXPECT_FALSE(s3->enabled);
    EXPECT_TRUE(s3->invisible);
    EXPECT_EQ(s3->transform.getValue(0), countingTransform(5));

    // Version 4 whose AnimatedTransform record (tag, count, width, two keys
    // of 8 + 48 bytes) carries the tag of a version 2: refused.
    std::vector<std::uint8_t> bytes = sunV4().bytes();
    bytes[bytes.size() - (12 + 2 * 56) + 2] = 2;
    RecordBytes refused;
    refused.append(bytes);
    loaded<SunLight>(refused, false);
}

TEST(IESLightRecords, OldVersions) {
    // Version 1: transform, color, shadowColor, filter_color, shadowBias,
    // cutoffThreshold, photonSubdivs, causticSubdivs, shadow_subdivs,
    // enabled, shadows, soft_shadows, ies_file.
    RecordBytes v1;
    v1.u32(0x10000).transform(countingTransform(1));
    color(v1, 1, 0, 0);
    color(v1, 0, 1, 0);
    color(v1, 0, 0, 1);
    v1.f32(0.1f).f32(0.2f).i32(1).i32(2).i32(3).u8(0).u8(0).u8(1);
    wstr(v1, "a.ies");
    boost::shared_ptr<IESLight> l1 = loaded<IESLight>(v1);
    EXPECT_EQ(l1->filter_color, Color(0, 0, 1));
    EXPECT_EQ(l1->shadow_subdivs, 3);
    EXPECT_TRUE(l1->soft_shadows);
    EXPECT_EQ(l1->ies_file, u"a.ies");
    EXPECT_TRUE(l1->affectDiffuse);
    EXPECT_EQ(l1->intensity, 1.0f);

    // Version 2: version 1, then affectDiffuse and affectSpecular.
    RecordBytes v2 = v1;
    std::vector<std::uint8_t> b = v2.bytes();
    b[2] = 2;
    RecordBytes v2b;
    v2b.append(b).u8(0).u8(0);
    boost::shared_ptr<IESLight> l2 = loaded<IESLight>(v2b);
    EXPECT_FALSE(l2->affectDiffuse);
    EXPECT_FALSE(l2->affectSpecular);
    EXPECT_EQ(l2->intensity, 1.0f);
}

TEST(SphereLightRecords, Version1HoldsFiveFlags) {
    // Version 1: transform, color, shadowColor, four reals, four ints, five
    // bool8 flags.
    RecordBytes b;
    b.u32(0x10000).transform(countingTransform(2));
    color(b, 0.5f, 0.5f, 0.5f);
    color(b, 0.1f, 0.1f, 0.1f);
    b.f32(1).f32(2).f32(3).f32(4).i32(5).i32(6).i32(7).i32(8);
    b.u8(0).u8(0).u8(1).u8(1).u8(1);
    boost::shared_ptr<SphereLight> s = loaded<SphereLight>(b);
    const bool flags[8] = {false, false, true, true, true, true, true, true};
    for (int k = 0; k < 8; ++k) EXPECT_EQ(s->flags[k], flags[k]) << k;
    EXPECT_EQ(s->reals[3], 4.0f);
    EXPECT_EQ(s->ints[0], 5);
    EXPECT_EQ(s->transform, countingTransform(2));

    // Version 2 holds all eight, and is what save writes.
    const std::vector<std::uint8_t> saved = savedBytes(*s);
    EXPECT_EQ(saved.size(), b.size() + 3);
    EXPECT_EQ(saved[2], 2);
}

// ---- copies and comparisons ----------------------------------------------------------

TEST(LightCompare, AnyFieldMakesADifference) {
    boost::shared_ptr<SpotLight> a = loaded<SpotLight>(spotV4());
    const std::vector<std::function<void(SpotLight&)>> changes = {
        [](SpotLight& s) { s.storedFactor = 9; },  // in the record, not in XML
        [](SpotLight& s) { s.storedMode = 9; },
        [](SpotLight& s) { s.barnDoorBottom = 1; },
        [](SpotLight& s) { s.transform.offs.z = 1; },
        [](SpotLight& s) { s.affectSpecular = !s.affectSpecular; },
    };
    for (const auto& change : changes) {
        boost::shared_ptr<SpotLight> b = boost::static_pointer_cast<SpotLight>(a->clone());
        EXPECT_TRUE(a->isEqual(b));
        change(*b);
        EXPECT_FALSE(a->isEqual(b));
    }
    EXPECT_FALSE(a->isEqual(createLight(2)));
}

TEST(LightCompare, FilePathsIgnoreCaseSunIdsDoNot) {
    boost::shared_ptr<IESLight> a = loaded<IESLight>(iesV3());
    boost::shared_ptr<IESLight> b = boost::static_pointer_cast<IESLight>(a->clone());
    b->ies_file = u"c:\\LIGHTS\\A&B<1>.IES";
    EXPECT_TRUE(a->isEqual(b));

    boost::shared_ptr<SunLight> s = loaded<SunLight>(sunV4("Sun-A"));
    boost::shared_ptr<SunLight> t = loaded<SunLight>(sunV4("sun-a"));
    EXPECT_FALSE(s->isEqual(t));
    t->id = s->id;
    EXPECT_TRUE(s->isEqual(t));
    t->name = u"noon";
    EXPECT_FALSE(s->isEqual(t));
}

TEST(LightCompare, SunCloneGetsANewId) {
    boost::shared_ptr<SunLight> s = loaded<SunLight>(sunV4());
    boost::shared_ptr<SunLight> c = boost::static_pointer_cast<SunLight>(s->clone());
    EXPECT_NE(c->id, s->id);
    EXPECT_EQ(c->id.size(), 36u);
    EXPECT_FALSE(s->isEqual(c));
    c->id = s->id;
    EXPECT_TRUE(s->isEqual(c));
    EXPECT_EQ(c->transform.getKeyCount(), 2u);
}

TEST(LightCompare, ResetGivesTheSunANewId) {
    SunLight s;
    const std::u16string first = s.id;
    s.turbidity = 9;
    s.reset();
    EXPECT_NE(s.id, first);
    EXPECT_EQ(s.turbidity, 3.0f);
    EXPECT_EQ(s.ozone, 0.35f);
    EXPECT_EQ(s.up_vector, Vector(0, 0, 1));
}

TEST(DomeLightRecords, TagOnly) {
    DomeLight dome;
    EXPECT_EQ(savedBytes(dome), (std::vector<std::uint8_t>{0, 0, 1, 0}));
    RecordBytes b;
    b.u32(0x10000);
    QuickArchive ar = b.archive();
    EXPECT_TRUE(dome.load(ar));
    EXPECT_TRUE(dome.isEqual(dome.clone()));
    EXPECT_FALSE(dome.isEqual(createLight(7)));
}

TEST(DocumentSun, IsTheDefaultNamedSun) {
    const SunLightPtr& sun = documentSun();
    ASSERT_TRUE(sun);
    EXPECT_EQ(sun.get(), documentSun().get());
    EXPECT_EQ(sun->name, u"Default");
    EXPECT_EQ(sun->id, u"{D3BE9766-E4AA-418b-81A9-23414A2BA98D}");
    EXPECT_TRUE(isDocumentSunId(u"{d3be9766-e4aa-418B-81a9-23414a2ba98d}"));
    EXPECT_FALSE(isDocumentSunId(u"D3BE9766-E4AA-418b-81A9-23414A2BA98D"));
    EXPECT_TRUE(sunSettingsEqual(*sun, SunSettings()));
}

TEST(LightRecords, DamagedRecordsFailQuietly) {
    // Every prefix of every record loads without a crash.
    for (const NewestRecord& r : kNewest) {
        const RecordBytes whole = r.bytes();
        for (std::size_t len = 0; len < whole.size(); ++len) {
            QuickArchive ar(whole.bytes().data(), len);
            createLight(r.tag)->load(ar);
        }
    }
    // MayaDirectLight version 4 whose transform record announces more keys
    // than the archive holds.
    RecordBytes v4;
    v4.u32(0x40000);
    color(v4, 1, 1, 1);
    color(v4, 0, 0, 0);
    v4.f32(0).f32(1).f32(1).i32(1000).i32(500).i32(3).u8(1).u8(1).i32(8).f32(0);
    v4.u32(0x10000).u32(0x7FFFFFFF).u32(8);
    loaded<MayaDirectLight>(v4, false);
}
