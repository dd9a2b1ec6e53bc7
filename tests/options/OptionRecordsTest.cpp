// The option records: params, frame data, stamp info and the whole document.
// The settings they hold are checked through the document (OptionsDocumentTest).
#include <gtest/gtest.h>

#include <algorithm>

#include "OptionBytes.h"
#include "textures/BasicTextures.h"

using namespace opttest;
typedef LumoUtils::LumoParams P;

namespace {

// Rows of the params that reach no XML, so that only the record shows them.
const std::pair<int, std::int32_t P::*> kKeptIntRows[] = {
    {12, &P::kept12}, {15, &P::kept15}, {26, &P::kept26}, {27, &P::kept27}, {30, &P::kept30}, {31, &P::kept31},
    {32, &P::kept32}, {37, &P::kept37}, {72, &P::kept72}, {163, &P::kept163}, {172, &P::kept172}, {173, &P::kept173}};
const std::pair<int, float P::*> kKeptFloatRows[] = {{16, &P::kept16}, {29, &P::kept29}, {33, &P::kept33}};
const std::pair<int, std::string P::*> kKeptPathRows[] = {
    {69, &P::imKeptPath1}, {73, &P::imKeptPath2}, {89, &P::pmKeptPath1}, {94, &P::pmKeptPath2},
    {104, &P::lcKeptPath1}, {107, &P::lcKeptPath2}, {122, &P::causticsKeptPath1}, {123, &P::causticsKeptPath2}};

}  // namespace

TEST(OrvaneParams, EveryVersionReadsItsRowsAndSavesVersion5) {
    for (int version = 1; version <= 5; ++version) {
        OrvaneParams p, q;
        SCOPED_TRACE(version);
        ASSERT_TRUE(loadsWhole(p, paramsRecord(version)));
        for (const auto& r : kKeptIntRows) EXPECT_EQ(intAt(kParams, r.first), p.*r.second) << "row " << r.first;
        for (const auto& r : kKeptFloatRows) EXPECT_EQ(floatAt(kParams, r.first), p.*r.second) << "row " << r.first;
        for (const auto& r : kKeptPathRows) EXPECT_EQ(textAt(kParams, r.first), p.*r.second) << "row " << r.first;
        // Save writes version 5, rows 133 and 135 as constants, and reads back the same.
        const std::vector<std::uint8_t> bytes = savedBytes(p);
        EXPECT_TRUE(version < 5 || paramsRecord(5, true).bytes() == bytes);
        ASSERT_TRUE(loadsWhole(q, RecordBytes().append(bytes)));
        EXPECT_EQ(bytes, savedBytes(q));
    }
    // Narrow paths are UTF-8, stored as wide strings; an empty stored string leaves reset's text.
    OrvaneParams p, q;
    p.imKeptPath1 = "C:\\maps\\caf\xc3\xa9.vrmap";
    ASSERT_TRUE(loadsWhole(q, RecordBytes().append(savedBytes(p))));
    EXPECT_EQ(p.imKeptPath1, q.imKeptPath1);
    EXPECT_EQ("", q.imKeptPath2);
}

TEST(OrvaneFrameData, RecordOwnXmlAndNarrowedOffsets) {
    // The rows show in FrameData's own XML, an Asset without an Assets
    // element; kept rows 34 and 35 only in the record.
    OrvaneFrameData f, g, h;
    const RecordBytes b = rowsRecord(kFrame, kFrameRowTypes);
    ASSERT_TRUE(loadsWhole(f, b));
    EXPECT_EQ(b.bytes(), savedBytes(f));
    EXPECT_TRUE(f.keptFrame34 == intAt(kFrame, 34) && f.keptFrame35 == intAt(kFrame, 35));
    f.worldToCam.offs[0] = 3;
    std::u16string out;
    AssetXmlWriter writer(out);
    f.writeXml(writer, u"/doc");
    expectGolden("options/golden/frame_data.xml", wideToUtf8(out));
    // Offsets are f64 in memory and f32 in the record; f64 rows stay whole.
    g.camToWorld.offs[1] = 0.1;
    g.frameStart = 0.1;
    ASSERT_TRUE(loadsWhole(h, RecordBytes().append(savedBytes(g))));
    EXPECT_EQ(static_cast<double>(0.1f), h.camToWorld.offs[1]);
    EXPECT_EQ(0.1, h.frameStart);
}

TEST(OrvaneLFBStampInfo, FontBytesOfBothVersionsAndTheSave) {
    // Version 1: stampFlag, stampValue1, stampValue2, text, 60 font bytes.
    // Version 2: the same with a byte count before the font bytes: the first
    // 60 are kept, the rest skipped; missing ones stay 0. Save writes version 2.
    struct Case { int version; std::uint32_t count; std::size_t kept; const char* text; };
    const Case kCases[] = {{1, 60, 60, "Frame %frame"}, {2, 60, 60, ""}, {2, 64, 60, "x"}, {2, 10, 10, "y"}};
    for (const Case& c : kCases) {
        const auto laid = [&](int version, std::uint32_t count, std::size_t kept) {
            RecordBytes b;
            b.u32(tag(version)).i32(3).i32(-4).i32(5).wstr(c.text);
            if (version == 2) b.u32(count);
            for (std::size_t k = 0; k < count; ++k) b.u8(k < kept ? k + 1 : 0);
            return b;
        };
        OrvaneLFBStampInfo s;
        ASSERT_TRUE(loadsWhole(s, laid(c.version, c.count, c.count))) << c.count;
        // An empty stored text is empty text, not the default.
        EXPECT_TRUE(s.stampFlag == 3 && s.stampValue1 == -4 && s.stampValue2 == 5 && s.text == c.text) << c.count;
        EXPECT_EQ(laid(2, 60, c.kept).bytes(), savedBytes(s)) << c.count;
    }
}

// ---- the whole document --------------------------------------------------------------

TEST(AllOptionsRecord, EveryAcceptedVersionReadsItsWholeRecord) {
    // Here the record's length and the fields that no XML shows.
    for (int version : kDocumentVersions) {
        AllOptions o;
        o.keptFloat1 = -1;
        ASSERT_TRUE(loadsWhole(o, documentRecord(version, {101}))) << "version " << version;
        EXPECT_EQ(version >= 17 ? floatAt(kDocument, 64) : -1.0f, o.keptFloat1) << version;
        EXPECT_EQ(version >= 17 ? floatAt(kDocument, 65) : 0.0f, o.keptFloat2) << version;
        EXPECT_EQ(version >= 19 ? intAt(kDocument, 67) : 1, o.keptInt1) << version;
        EXPECT_EQ(version >= 22 ? intAt(kDocument, 71) : 0, o.keptInt2) << version;
        EXPECT_EQ(version >= 20 ? utf8ToWide(textAt(kDocument, 70)) : u"", o.dr_folder) << version;
        EXPECT_TRUE(o.stampInfo.stampValue2 == 3 && o.stampInfo.fontDescription[59] == 59) << version;
        // A version 1 camera sets its single focal length as the key at time 0.
        EXPECT_EQ(1u, o.physicalCamera.focal_length.getKeyCount()) << version;
    }
}

TEST(AllOptionsRecord, ChannelListRules) {
    struct Case { int version; std::vector<std::uint32_t> stored; std::vector<std::int32_t> expected; };
    const Case kCases[] = {
        // Version 0 stored "Normals" as 8; values outside 100..132 are dropped.
        {0, {8, 99, 133, 4294967295u, 100}, {126, 125, 123, 100}},
        {1, {8, 132}, {126, 125, 132}},
        {20, {}, {126, 125}},
        // From version 21 on the list replaces the defaults.
        {21, {}, {}},
        {23, {101, 101, 131}, {101, 101, 131}},
    };
    for (const Case& c : kCases) {
        AllOptions o;
        ASSERT_TRUE(loadsWhole(o, documentRecord(c.version, c.stored))) << c.version;
        EXPECT_EQ(c.expected, o.renderChannels) << "version " << c.version;
    }
}

TEST(AllOptionsRecord, PathsAreCutTo2047Characters) {
    // A record with a path of 3000 characters, laid by a save that doesn't
    // cut: the same record with the path's field patched.
    AllOptions o, p, q;
    o.output_img_file = u"@@path@@";
    const std::vector<std::uint8_t> bytes = savedBytes(o);
    const std::uint8_t marker[] = {8, 0, 0, 0, '@', '@', 'p', 'a', 't', 'h', '@', '@'};
    const auto at = std::search(bytes.begin(), bytes.end(), std::begin(marker), std::end(marker));
    ASSERT_NE(bytes.end(), at);
    RecordBytes laid;
    laid.append({bytes.begin(), at}).wstr(std::string(3000, 'p')).append({at + sizeof marker, bytes.end()});
    ASSERT_TRUE(loadsWhole(p, laid));
    EXPECT_EQ(std::u16string(2047, u'p'), p.output_img_file);
    // A longer text in memory is saved cut.
    p.output_luimg_file = std::u16string(2100, u'q');
    ASSERT_TRUE(loadsWhole(q, RecordBytes().append(savedBytes(p))));
    EXPECT_EQ(std::u16string(2047, u'p'), q.output_img_file);
    EXPECT_EQ(std::u16string(2047, u'q'), q.output_luimg_file);
    EXPECT_NE(std::u16string::npos, documentXml(q).find(u"<value>" + std::u16string(2047, u'p') + u"</value>"));
}

TEST(AllOptionsRecord, SaveAndLoadGiveEqualOptions) {
    AllOptions o, p;
    ASSERT_TRUE(loadsWhole(o, documentRecord(23, {100, 110, 132})));
    o.bgTexture.reset(new AColorTexture(AColor(0.5f, 0.25f, 1, 1)));
    o.refractTexture.reset(new AColorTexture(AColor(1, 0, 0, 0.5f)));
    o.keptFloat1 = 3.5f; o.stampInfo.fontDescription[7] = 42; o.frameData.worldToCam.offs[2] = 2.5;
    o.physicalCamera.focal_length.setValue(70, 2.0);
    // Version 23 with the fields above, textures included, back as they were.
    const std::vector<std::uint8_t> bytes = savedBytes(o);
    EXPECT_EQ(RecordBytes().u32(documentTag(23)).bytes(), std::vector<std::uint8_t>(bytes.begin(), bytes.begin() + 4));
    ASSERT_TRUE(loadsWhole(p, RecordBytes().append(bytes)));
    EXPECT_EQ(bytes, savedBytes(p));
    EXPECT_EQ(documentXml(o), documentXml(p));
}

TEST(AllOptionsRecord, ResetKeepsTheCarriedFloats) {
    AllOptions o;
    o.keptFloat1 = 4; o.filterKernel = 9; o.caustics_file = u"x"; o.params.imageSampler_type = 7;
    o.renderChannels.push_back(111);
    o.giTexture.reset(new AColorTexture());
    o.reset();
    AllOptions fresh;
    fresh.keptFloat1 = 4;  // everything else as in a new document
    EXPECT_EQ(savedBytes(fresh), savedBytes(o));
    EXPECT_EQ(documentXml(fresh), documentXml(o));
}
