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

// Rows that reach no XML, so that only the record shows them. The rows of
// settings are checked through the document (OptionsDocumentTest).
const std::pair<int, std::int32_t P::*> kKeptIntRows[] = {
    {12, &P::kept12}, {15, &P::kept15}, {26, &P::kept26}, {27, &P::kept27}, {30, &P::kept30},
    {31, &P::kept31}, {32, &P::kept32}, {37, &P::kept37}, {72, &P::kept72}, {163, &P::kept163},
    {172, &P::kept172}, {173, &P::kept173}};
const std::pair<int, float P::*> kKeptFloatRows[] = {
    {16, &P::kept16}, {29, &P::kept29}, {33, &P::kept33}};
const std::pair<int, std::string P::*> kKeptPathRows[] = {
    {69, &P::imKeptPath1}, {73, &P::imKeptPath2}, {89, &P::pmKeptPath1}, {94, &P::pmKeptPath2},
    {104, &P::lcKeptPath1}, {107, &P::lcKeptPath2}, {122, &P::causticsKeptPath1},
    {123, &P::causticsKeptPath2}};

void expectKeptRows(const OrvaneParams& p, int version) {
    for (const auto& r : kKeptIntRows)
        EXPECT_EQ(intAt(kParams, r.first), p.*r.second) << "row " << r.first << ", version " << version;
    for (const auto& r : kKeptFloatRows)
        EXPECT_EQ(floatAt(kParams, r.first), p.*r.second) << "row " << r.first << ", version " << version;
    for (const auto& r : kKeptPathRows)
        EXPECT_EQ(textAt(kParams, r.first), p.*r.second) << "row " << r.first << ", version " << version;
}

}  // namespace

TEST(OrvaneParams, EveryVersionReadsItsRowsInPlace) {
    for (int version = 1; version <= 5; ++version) {
        OrvaneParams p;
        ASSERT_TRUE(loadFrom(p, paramsRecord(version))) << version;
        expectKeptRows(p, version);
        if (version >= 5) {
            EXPECT_EQ(flagAt(kParams, 74), p.irradianceMap_detail_enhancement);
            EXPECT_EQ(floatAt(kParams, 76), p.irradianceMap_detail_subdivs_mult);
            EXPECT_EQ(floatAt(kParams, 75), p.irradianceMap_detail_radius);
            EXPECT_EQ(intAt(kParams, 77), p.irradianceMap_detail_scale);
        } else {
            // The single f32 of old versions is dropped; the four keep their defaults.
            EXPECT_EQ(60.0f, p.irradianceMap_detail_radius);
            EXPECT_EQ(0.3f, p.irradianceMap_detail_subdivs_mult);
        }
        EXPECT_EQ(version >= 4 ? floatAt(kParams, 145) : 1.0f, p.colorMapping_gamma) << version;
        EXPECT_EQ(2, p.dmcSampler_path_sampler_type) << "row 140 reads as 2 in every version";
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
        expectKeptRows(q, version);
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

    const RecordBytes b = frameRecord();
    ASSERT_TRUE(loadFrom(f, b));
    EXPECT_EQ(floatAt(kFrame, 1), f.t);
    EXPECT_EQ(floatAt(kFrame, 3), f.frameEnd);
    EXPECT_EQ(intAt(kFrame, 4), f.currentFrame);
    EXPECT_EQ(Matrix(), f.camToWorld.m);
    EXPECT_EQ(floatAt(kFrame, 9), f.farRange);
    EXPECT_EQ(intAt(kFrame, 18), f.infiniteProj);
    EXPECT_EQ(intAt(kFrame, 23), f.orthoAdjustToScene);
    EXPECT_EQ(floatAt(kFrame, 29) + 2, f.lumoRefractBackground.b);
    EXPECT_EQ(intAt(kFrame, 34), f.keptFrame34);
    EXPECT_EQ(intAt(kFrame, 35), f.keptFrame35);
    EXPECT_EQ(floatAt(kFrame, 42), f.devAspect);
    EXPECT_EQ(intAt(kFrame, 45), f.firstField);

    // Saved again it is byte for byte the same record.
    EXPECT_EQ(b.bytes(), savedBytes(f));
}

TEST(OrvaneFrameData, OffsetsNarrowOnSavingAndDoublesDont) {
    OrvaneFrameData f;
    f.camToWorld.offs[1] = 0.1;  // no f32 holds 0.1 exactly
    f.frameStart = 0.1;          // an f64 of the record
    RecordBytes again;
    again.append(savedBytes(f));
    OrvaneFrameData g;
    ASSERT_TRUE(loadFrom(g, again));
    EXPECT_EQ(static_cast<double>(0.1f), g.camToWorld.offs[1]);
    EXPECT_EQ(0.1, g.frameStart);
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
