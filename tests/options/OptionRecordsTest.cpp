// The three option groups: params, frame data and stamp info.
#include <cmath>
#include <cstring>

#include <gtest/gtest.h>

#include "OptionBytes.h"
#include "options/OptionRecords.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;
using namespace opttest;
typedef LumoUtils::LumoParams P;

namespace {

// Integer and bool rows by number, spread over every group of the record.
struct IntRow {
    int row;
    std::int32_t P::*field;
};
const IntRow kIntRows[] = {
    {1, &P::imageFilter_on},
    {2, &P::imageSampler_type},
    {12, &P::kept12},
    {13, &P::imageSampler_subdivision_normals},
    {17, &P::camera_type},
    {28, &P::motionBlur_subdivs},
    {37, &P::kept37},
    {47, &P::gi_secondary_engine},
    {49, &P::dmcGI_subdivs},
    {51, &P::gi_save_maps_per_frame},
    {52, &P::irradianceMap_min_rate},
    {68, &P::irradianceMap_auto_save},
    {70, &P::irradianceMap_lookup_mode},
    {72, &P::kept72},
    {78, &P::photonMap_bounces},
    {85, &P::photonMap_auto_search_distance},
    {91, &P::photonMap_retrace_bounces},
    {95, &P::lightCache_subdivs},
    {105, &P::lightCache_dont_delete},
    {113, &P::lightCache_adaptive_sampling},
    {114, &P::caustics_on},
    {121, &P::caustics_auto_save},
    {124, &P::raycaster_maxLevels},
    {132, &P::regionsGenerator_reverse},
    {134, &P::dmcSampler_time_dependent},
    {138, &P::dmcSampler_adaptive_min_samples},
    {141, &P::colorMapping_type},
    {143, &P::colorMapping_clamp_output},
    {146, &P::options_geom_displacement},
    {153, &P::options_mtl_limitDepth},
    {163, &P::kept163},
    {164, &P::options_misc_lowThreadPriority},
    {165, &P::defaultDisplacement_override_on},
    {171, &P::defaultDisplacement_relative},
    {172, &P::kept172},
    {173, &P::kept173},
};

struct FloatRow {
    int row;
    float P::*field;
};
const FloatRow kFloatRows[] = {
    {6, &P::imageSampler_dmc_threshold},
    {16, &P::kept16},
    {38, &P::motionBlur_bias},
    {59, &P::irradianceMap_distance_threshold},
    {79, &P::photonMap_search_distance},
    {93, &P::photonMap_max_density},
    {115, &P::caustics_search_distance},
    {126, &P::raycaster_faceLevelCoef},
    {136, &P::dmcSampler_adaptive_amount},
    {139, &P::dmcSampler_subdivs_mult},
    {158, &P::options_mtl_transpCutoff},
    {170, &P::defaultDisplacement_amount},
};

void expectRowsRead(const OrvaneParams& p, int version) {
    for (const IntRow& r : kIntRows)
        EXPECT_EQ(rowInt(r.row), p.*r.field) << "row " << r.row << ", version " << version;
    for (const FloatRow& r : kFloatRows)
        EXPECT_EQ(rowFloat(r.row), p.*r.field) << "row " << r.row << ", version " << version;
    EXPECT_EQ(rowText(69), p.imKeptPath1);
    EXPECT_EQ(rowText(73), p.imKeptPath2);
    EXPECT_EQ(rowText(94), p.pmKeptPath2);
    EXPECT_EQ(rowText(123), p.causticsKeptPath2);
    EXPECT_EQ(2, p.dmcSampler_path_sampler_type) << "row 140 is always 2";
}

}  // namespace

TEST(OrvaneParams, EveryVersionReadsItsRowsInPlace) {
    for (int version = 1; version <= 5; ++version) {
        OrvaneParams p;
        ASSERT_TRUE(loadFrom(p, paramsRecord(version))) << version;
        expectRowsRead(p, version);
        if (version >= 5) {
            EXPECT_EQ(rowInt(74), p.irradianceMap_detail_enhancement);
            EXPECT_EQ(rowFloat(75), p.irradianceMap_detail_radius);
            EXPECT_EQ(rowFloat(76), p.irradianceMap_detail_subdivs_mult);
            EXPECT_EQ(rowInt(77), p.irradianceMap_detail_scale);
        } else {
            // The single f32 of old versions is dropped; the four keep their defaults.
            EXPECT_EQ(0, p.irradianceMap_detail_enhancement);
            EXPECT_EQ(60.0f, p.irradianceMap_detail_radius);
            EXPECT_EQ(0.3f, p.irradianceMap_detail_subdivs_mult);
            EXPECT_EQ(0, p.irradianceMap_detail_scale);
        }
        EXPECT_EQ(version >= 3 ? rowInt(144) : 0, p.colorMapping_subpixel_mapping) << version;
        EXPECT_EQ(version >= 4 ? rowFloat(145) : 1.0f, p.colorMapping_gamma) << version;
    }
}

TEST(OrvaneParams, RefusesOtherTags) {
    for (std::uint32_t bad : {0u, 0x00060000u, 0x00050001u, 0x00000001u}) {
        RecordBytes b;
        b.u32(bad);
        OrvaneParams p;
        EXPECT_FALSE(loadFrom(p, b)) << std::hex << bad;
    }
    OrvaneParams p;
    EXPECT_FALSE(loadFrom(p, RecordBytes())) << "a tag behind the end of the data";
}

TEST(OrvaneParams, SaveWritesTheNewestVersionWithConstantRows) {
    // Whatever version was read, save writes version 5, with rows 133 and
    // 135 as constants; a re-read keeps every other row.
    for (int version = 1; version <= 5; ++version) {
        OrvaneParams p;
        ASSERT_TRUE(loadFrom(p, paramsRecord(version)));
        const std::vector<std::uint8_t> bytes = savedBytes(p);
        if (version == 5) {
            EXPECT_EQ(paramsRecord(5, true).bytes(), bytes);
        }

        RecordBytes again;
        again.append(bytes);
        OrvaneParams q;
        ASSERT_TRUE(loadFrom(q, again));
        expectRowsRead(q, version);
        EXPECT_EQ(p.irradianceMap_detail_radius, q.irradianceMap_detail_radius);
        EXPECT_EQ(p.colorMapping_gamma, q.colorMapping_gamma);
    }
}

TEST(OrvaneParams, NarrowPathsGoThroughWideStrings) {
    OrvaneParams p;
    p.imKeptPath1 = "C:\\maps\\caf\xc3\xa9.vrmap";  // UTF-8 narrow text
    RecordBytes again;
    again.append(savedBytes(p));
    OrvaneParams q;
    ASSERT_TRUE(loadFrom(q, again));
    EXPECT_EQ(p.imKeptPath1, q.imKeptPath1);
    EXPECT_EQ("", q.imKeptPath2) << "an empty stored string leaves the text as reset left it";
}

TEST(OrvaneParams, ResetGivesTheBareValuesAndTheFixedSettings) {
    OrvaneParams p;
    EXPECT_EQ(0, p.imageFilter_on);
    EXPECT_EQ(0, p.imageSampler_type);
    EXPECT_EQ(0, p.options_mtl_limitDepth);
    EXPECT_EQ(1e18f, p.caustics_search_distance);
    EXPECT_EQ(2, p.irradianceMap_interp_frames);
    EXPECT_EQ(16, p.lightCache_min_paths_per_sample);
    EXPECT_EQ(1.0f, p.colorMapping_clamp_level);
    EXPECT_EQ(1, p.options_geom_doHidden);
    EXPECT_EQ(1, p.options_mtl_filterMapsForSecondaryRays);
    EXPECT_EQ(2, p.dmcSampler_path_sampler_type);
    EXPECT_EQ(-3, p.irradianceMap_min_rate);
    EXPECT_EQ(16, p.kept173);
    EXPECT_EQ(6, p.kept27);

    // Loading can't change the settings that no record holds.
    p.lightCache_min_paths_per_sample = 99;
    ASSERT_TRUE(loadFrom(p, paramsRecord(5)));
    EXPECT_EQ(16, p.lightCache_min_paths_per_sample);
}

// ---- frame data --------------------------------------------------------------------

TEST(OrvaneFrameData, RecordHoldsDoublesAndNarrowedOffsets) {
    OrvaneFrameData f;
    EXPECT_EQ(3, f.fieldMask);
    EXPECT_EQ(200.0f, f.cameraDof_focal_dist);
    EXPECT_EQ(0.0f, f.worldToCam.m[0].x) << "the default transform is all zero";
    EXPECT_EQ(1.0, f.frameEnd);

    // Version 1 as laid by hand: three f64, an i32, two transforms, ...
    RecordBytes b;
    b.u32(tag(1)).f64(0.125).f64(-2.5).f64(1e300).i32(7);
    Transform w2c(Matrix(Vector(1, 2, 3), Vector(4, 5, 6), Vector(7, 8, 9)), Vector(10, 11, 12));
    b.transform(w2c).transform(Transform());
    b.f32(0.5f).f32(1).f32(2);                 // fov, nearRange, farRange
    b.f32(150).f32(0.2f).f32(30);              // focal_dist, aperture, rotation
    b.i32(1).f32(0.1f).f32(1000).i32(2).f32(3).i32(1);  // clipping .. infiniteProj
    b.f32(410).i32(0).f32(2.5f).f32(0.75f).i32(1);      // height, auto_fit, dist, curve, ortho
    for (int k = 0; k < 6; ++k) b.vec(0.1f * k, 0.2f, 0.3f);  // six colours
    b.f32(1).f32(2).f32(3).f32(4);             // rgn
    b.i32(34).i32(35);                         // kept
    for (int k = 0; k < 6; ++k) b.i32(100 + k);  // bmp and r
    b.f32(1.5f).i32(1).i32(2).i32(3);          // devAspect .. firstField
    b.f32(0.8f).f32(1.2f);                     // dark_mult, bright_mult
    ASSERT_TRUE(loadFrom(f, b));
    EXPECT_EQ(0.125, f.t);
    EXPECT_EQ(1e300, f.frameEnd) << "doubles keep their precision";
    EXPECT_EQ(10.0, f.worldToCam.offs[0]);
    EXPECT_EQ(12.0, f.worldToCam.offs[2]);
    EXPECT_EQ(Vector(4, 5, 6), f.worldToCam.m[1]);
    EXPECT_EQ(150.0f, f.cameraDof_focal_dist);
    EXPECT_EQ(410.0f, f.camera_height);
    EXPECT_EQ(0, f.camera_auto_fit);
    EXPECT_EQ(Color(0.5f, 0.2f, 0.3f), f.lumoRefractBackground);
    EXPECT_EQ(4.0f, f.output_rgn_height);
    EXPECT_EQ(35, f.keptFrame35);
    EXPECT_EQ(105, f.output_r_height);
    EXPECT_EQ(3, f.firstField);
    EXPECT_EQ(1.2f, f.colorMapping_bright_mult);

    // Saved again it is byte for byte the same record.
    EXPECT_EQ(b.bytes(), savedBytes(f));
}

TEST(OrvaneFrameData, OffsetsNarrowOnSaving) {
    OrvaneFrameData f;
    f.camToWorld.offs[1] = 0.1;  // no f32 holds 0.1 exactly
    RecordBytes again;
    again.append(savedBytes(f));
    OrvaneFrameData g;
    ASSERT_TRUE(loadFrom(g, again));
    EXPECT_EQ(static_cast<double>(0.1f), g.camToWorld.offs[1]);
}

TEST(OrvaneFrameData, OnlyVersionOne) {
    for (std::uint32_t bad : {0u, 0x00020000u, 0x00010001u}) {
        RecordBytes b;
        b.u32(bad);
        OrvaneFrameData f;
        EXPECT_FALSE(loadFrom(f, b)) << std::hex << bad;
    }
}

TEST(OrvaneFrameData, OwnXmlHoldsTheFieldsThatAreNoSettings) {
    OrvaneFrameData f;
    f.t = 2.5;
    f.worldToCam.offs[0] = 3;
    std::u16string out;
    AssetXmlWriter writer(out);
    f.writeXml(writer, u"/doc");
    EXPECT_EQ(0u, out.find(u"  <Asset layout=\"\" renderer=\"lumo\" type=\"settings\" url=\"/doc/FrameData\" >\n"
                           u"    <plugin>\n"
                           u"      <lumoplugin name=\"FrameData\" type=\"settings\">\n"
                           u"        <parameters>\n"
                           u"          <parameter type=\"float\" name=\"t\" handler=\"default\" listType=\"none\" label=\"t\">\n"
                           u"            <value>2.5</value>\n"));
    const char16_t* const kNames[] = {
        u"t", u"frameStart", u"frameEnd", u"currentFrame", u"worldToCam", u"camToWorld", u"fov",
        u"nearRange", u"farRange", u"clippingPlanes", u"clipNear", u"clipFar", u"projType",
        u"zoomFractor", u"infiniteProj", u"orthoAdjustToScene", u"ambient", u"background",
        u"globalLightLevel", u"lumoGIBackground", u"lumoRRBackground", u"lumoRefractBackground",
        u"devAspect", u"fieldMask", u"fieldOrder", u"firstField"};
    std::size_t at = 0, count = 0;
    for (const char16_t* name : kNames) {
        const std::u16string needle = std::u16string(u"name=\"") + name + u"\"";
        const std::size_t found = out.find(needle, at);
        ASSERT_NE(std::u16string::npos, found) << count;
        at = found + 1;
        ++count;
    }
    std::size_t params = 0;
    for (std::size_t k = out.find(u"<parameter "); k != std::u16string::npos;
         k = out.find(u"<parameter ", k + 1))
        ++params;
    EXPECT_EQ(26u, params);
    EXPECT_NE(std::u16string::npos, out.find(u"type=\"transform\" name=\"worldToCam\""));
    EXPECT_NE(std::u16string::npos, out.find(u"<x>3</x>"));
    EXPECT_EQ(std::u16string::npos, out.find(u"focal_dist"));
    EXPECT_EQ(std::u16string::npos, out.find(u"<Assets>"));
}

// ---- stamp info ----------------------------------------------------------------------

TEST(OrvaneLFBStampInfo, BothVersionsOfTheFontBytes) {
    struct Case {
        const char* what;
        int version;
        std::uint32_t storedCount;  // version 2 only
        std::size_t kept;           // font bytes taken from the record
    };
    const Case kCases[] = {
        {"version 1: 60 bytes without a length", 1, 0, 60},
        {"version 2 with the count 60", 2, 60, 60},
        {"version 2 with the count 64: the last four are skipped", 2, 64, 60},
        {"version 2 with the count 10: the rest stays 0", 2, 10, 10},
    };
    for (const Case& c : kCases) {
        RecordBytes b;
        b.u32(tag(c.version)).i32(3).i32(-4).i32(5);
        wstr(b, "Frame %frame");
        const std::size_t n = c.version == 1 ? 60 : c.storedCount;
        if (c.version == 2) b.u32(c.storedCount);
        for (std::size_t k = 0; k < n; ++k) b.u8(static_cast<std::uint8_t>(k + 1));
        b.i32(0x12345678);  // the next field behind the record

        OrvaneLFBStampInfo s;
        QuickArchive ar = b.archive();
        ASSERT_TRUE(s.load(ar)) << c.what;
        EXPECT_EQ(3, s.stampFlag) << c.what;
        EXPECT_EQ(-4, s.stampValue1) << c.what;
        EXPECT_EQ(5, s.stampValue2) << c.what;
        EXPECT_EQ("Frame %frame", s.text) << c.what;
        for (std::size_t k = 0; k < 60; ++k)
            EXPECT_EQ(k < c.kept ? k + 1 : 0, s.fontDescription[k]) << c.what << " byte " << k;
        std::int32_t next = 0;
        ar.readInt(next);
        EXPECT_EQ(0x12345678, next) << c.what;
    }
}

TEST(OrvaneLFBStampInfo, ResetSaveAndBadTags) {
    OrvaneLFBStampInfo s;
    EXPECT_EQ(std::string(OrvaneLFBStampInfo::kDefaultText), s.text);
    EXPECT_EQ("Lumo Core %lumocore | Render Time %rendertime |", s.text);
    EXPECT_EQ(8, s.fontSize);
    EXPECT_STREQ("Helvetica", s.fontName);

    s.stampFlag = 1;
    s.text.clear();
    s.fontDescription[59] = 0xEE;
    RecordBytes expected;
    expected.u32(tag(2)).i32(1).i32(0).i32(0).u32(0).u32(60);
    for (int k = 0; k < 59; ++k) expected.u8(0);
    expected.u8(0xEE);
    EXPECT_EQ(expected.bytes(), savedBytes(s));

    // An empty stored text gives empty text, not the default.
    OrvaneLFBStampInfo t;
    ASSERT_TRUE(loadFrom(t, expected));
    EXPECT_EQ("", t.text);
    EXPECT_EQ(0xEE, t.fontDescription[59]);

    for (std::uint32_t bad : {0u, 0x00030000u, 0x00020001u}) {
        RecordBytes b;
        b.u32(bad);
        OrvaneLFBStampInfo u;
        u.stampFlag = 9;
        EXPECT_FALSE(loadFrom(u, b)) << std::hex << bad;
        EXPECT_EQ(0, u.stampFlag) << "reset runs before the tag is judged";
    }
}
