// The AllOptions record: every accepted version, the channel list, paths,
// textures and damaged data.
#include <algorithm>
#include <chrono>
#include <iterator>
#include <cstdint>
#include <vector>

#include <gtest/gtest.h>

#include "OptionBytes.h"
#include "textures/BasicTextures.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;
using namespace opttest;

namespace {

const int kAcceptedVersions[] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 16, 17, 18, 19, 20, 21, 22, 23};

// Loads and reports whether the whole record, and nothing behind it, was read.
bool loadWhole(AllOptions& o, RecordBytes b) {
    b.u32(0xA5A5A5A5u);
    QuickArchive ar = b.archive();
    if (!o.load(ar)) return false;
    std::uint32_t sentinel = 0;
    ar.readUInt(sentinel);
    return sentinel == 0xA5A5A5A5u;
}

std::u16string documentXml(AllOptions& o) {
    std::u16string out;
    AssetXmlWriter w(out);
    o.writeXml(w, u"");
    return out;
}

}  // namespace

TEST(AllOptionsRecord, EveryAcceptedVersionReadsItsWholeRecord) {
    // The settings are checked through the document (OptionsDocumentTest);
    // here the record's length and the fields that no XML shows.
    for (int version : kAcceptedVersions) {
        AllOptions o;
        o.keptFloat1 = -1;
        ASSERT_TRUE(loadWhole(o, documentRecord(version, {101}))) << "version " << version;
        EXPECT_EQ(version >= 17 ? floatAt(kDocument, 64) : -1.0f, o.keptFloat1) << version;
        EXPECT_EQ(version >= 17 ? floatAt(kDocument, 65) : 0.0f, o.keptFloat2) << version;
        EXPECT_EQ(version >= 19 ? intAt(kDocument, 67) : 1, o.keptInt1) << version;
        EXPECT_EQ(version >= 22 ? intAt(kDocument, 71) : 0, o.keptInt2) << version;
        EXPECT_EQ(version >= 20 ? utf8ToWide(textAt(kDocument, 70)) : u"", o.dr_folder) << version;
        EXPECT_EQ(3, o.stampInfo.stampValue2);
        EXPECT_EQ(59, o.stampInfo.fontDescription[59]);
        // A version 1 camera sets its single focal length as the key at time 0.
        EXPECT_EQ(1u, o.physicalCamera.focal_length.getKeyCount()) << version;
        EXPECT_EQ(version >= 5 ? floatAt(kCamera, 3) : 40.0f,
                  o.physicalCamera.focal_length.getValue(0)) << version;
    }
}

TEST(AllOptionsRecord, RefusedTagsAfterReset) {
    for (std::uint32_t bad : {documentTag(10), documentTag(15), documentTag(24), tag(23), tag(0),
                              tag(5) | 2u}) {
        AllOptions o;
        o.output_img_width = 1;
        RecordBytes b;
        b.u32(bad);
        EXPECT_FALSE(loadWhole(o, b)) << std::hex << bad;
        EXPECT_EQ(800, o.output_img_width) << std::hex << bad;
    }
    AllOptions o;
    QuickArchive empty(static_cast<std::size_t>(0));
    EXPECT_FALSE(o.load(empty)) << "no data at all";
}

TEST(AllOptionsRecord, ChannelListRules) {
    struct Case {
        int version;
        std::vector<std::uint32_t> stored;
        std::vector<std::int32_t> expected;
    };
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
        ASSERT_TRUE(loadWhole(o, documentRecord(c.version, c.stored))) << c.version;
        EXPECT_EQ(c.expected, o.renderChannels) << "version " << c.version;
    }
}

TEST(AllOptionsRecord, HugeCountsFailFast) {
    // A count of four billion read from damaged data fails the load at once
    // instead of filling memory or spinning.
    std::vector<std::vector<std::uint8_t>> damaged;

    // The channel count: records with and without an entry differ first there.
    const RecordBytes full = documentRecord(23, {});
    const RecordBytes withOne = documentRecord(23, {100});
    std::size_t at = 0;
    while (full.bytes()[at] == withOne.bytes()[at]) ++at;
    damaged.push_back(full.bytes());
    std::fill_n(damaged.back().begin() + at, 4, 0xFF);

    // The key count of the camera's focal length: its record's tag, the count
    // of one key and the time width 8.
    damaged.push_back(savedBytes(AllOptions()));
    const std::uint8_t keys[] = {0, 0, 1, 0, 1, 0, 0, 0, 8, 0, 0, 0};
    auto found = std::search(damaged.back().begin(), damaged.back().end(), std::begin(keys),
                             std::end(keys));
    ASSERT_NE(damaged.back().end(), found);
    std::fill_n(found + 4, 4, 0xFF);

    for (const std::vector<std::uint8_t>& bytes : damaged) {
        RecordBytes b;
        b.append(bytes);
        AllOptions o;
        const auto start = std::chrono::steady_clock::now();
        EXPECT_FALSE(loadWhole(o, b));
        EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
    }
}

TEST(AllOptionsRecord, PathsAreCutTo2047Characters) {
    // A record with a path of 3000 characters, laid by a save that doesn't
    // cut: the same record with the path's field patched.
    AllOptions o;
    o.output_img_file = u"@@path@@";
    std::vector<std::uint8_t> bytes = savedBytes(o);
    const std::uint8_t marker[] = {8, 0, 0, 0, '@', '@', 'p', 'a', 't', 'h', '@', '@'};
    auto at = std::search(bytes.begin(), bytes.end(), std::begin(marker), std::end(marker));
    ASSERT_NE(bytes.end(), at);
    const std::string longPath(3000, 'p');
    RecordBytes laid;
    laid.append(std::vector<std::uint8_t>(bytes.begin(), at));
    wstr(laid, longPath);
    laid.append(std::vector<std::uint8_t>(at + sizeof marker, bytes.end()));

    AllOptions p;
    ASSERT_TRUE(loadWhole(p, laid));
    EXPECT_EQ(std::u16string(2047, u'p'), p.output_img_file);

    // A longer text in memory is saved cut.
    p.output_luimg_file = std::u16string(2100, u'q');
    RecordBytes again;
    again.append(savedBytes(p));
    AllOptions q;
    ASSERT_TRUE(loadWhole(q, again));
    EXPECT_EQ(std::u16string(2047, u'p'), q.output_img_file);
    EXPECT_EQ(std::u16string(2047, u'q'), q.output_luimg_file);

    const std::u16string xml = documentXml(q);
    EXPECT_NE(std::u16string::npos, xml.find(u"<value>" + std::u16string(2047, u'p') + u"</value>"));
}

TEST(AllOptionsRecord, TextureTagsWithoutAClassFail) {
    // The bg texture's flag says present; the tag that follows has no class.
    for (std::int32_t badTag : {-1, 13, 100}) {
        RecordBytes b;
        b.u32(documentTag(0));
        b.append(paramsRecord(5).bytes());
        b.append(frameRecord().bytes());
        b.append(stampV1Record().bytes());
        b.u8(1).i32(badTag);
        AllOptions o;
        EXPECT_FALSE(loadWhole(o, b)) << badTag;
    }
}

TEST(AllOptionsRecord, SaveAndLoadGiveEqualOptions) {
    AllOptions o;
    ASSERT_TRUE(loadWhole(o, documentRecord(23, {100, 110, 132})));
    o.bgTexture.reset(new AColorTexture(AColor(0.5f, 0.25f, 1, 1)));
    o.refractTexture.reset(new AColorTexture(AColor(1, 0, 0, 0.5f)));
    o.keptFloat1 = 3.5f;
    o.stampInfo.fontDescription[7] = 42;
    o.frameData.worldToCam.offs[2] = 2.5;
    o.physicalCamera.focal_length.setValue(70, 2.0);

    const std::vector<std::uint8_t> bytes = savedBytes(o);
    std::uint32_t tagSaved = 0;
    for (int k = 3; k >= 0; --k) tagSaved = (tagSaved << 8) | bytes[k];
    EXPECT_EQ(0x00170001u, tagSaved);

    RecordBytes again;
    again.append(bytes);
    AllOptions p;
    ASSERT_TRUE(loadWhole(p, again));
    EXPECT_EQ(documentXml(o), documentXml(p));
    EXPECT_EQ(bytes, savedBytes(p));
    EXPECT_EQ(3.5f, p.keptFloat1);
    EXPECT_EQ(42, p.stampInfo.fontDescription[7]);
    EXPECT_EQ(2u, p.physicalCamera.focal_length.getKeyCount());
    ASSERT_TRUE(p.refractTexture);
    EXPECT_TRUE(p.refractTexture->isEqual(o.refractTexture));
    EXPECT_FALSE(p.giTexture);
}

TEST(AllOptionsRecord, ResetKeepsTheCarriedFloats) {
    AllOptions o;
    o.keptFloat1 = 4;
    o.filterKernel = 9;
    o.renderChannels.push_back(111);
    o.giTexture.reset(new AColorTexture());
    o.caustics_file = u"x";
    o.reset();
    EXPECT_EQ(4.0f, o.keptFloat1);
    EXPECT_EQ(5, o.filterKernel);
    EXPECT_EQ((std::vector<std::int32_t>{126, 125}), o.renderChannels);
    EXPECT_FALSE(o.giTexture);
    EXPECT_EQ(u"", o.caustics_file);
    // The four parameters in which a document differs from a bare OrvaneParams.
    EXPECT_EQ(1, o.params.imageFilter_on);
    EXPECT_EQ(2, o.params.imageSampler_type);
    EXPECT_EQ(1, o.params.options_mtl_limitDepth);
    EXPECT_EQ(20.0f, o.params.caustics_search_distance);
}

TEST(AllOptionsRecord, ShortAndDamagedRecordsNeverCrash) {
    AllOptions source;
    ASSERT_TRUE(loadWhole(source, documentRecord(23, {100, 101, 102})));
    source.giTexture.reset(new AColorTexture());
    source.reflectTexture.reset(new InvertTexture());
    static_cast<InvertTexture&>(*source.reflectTexture).texture.reset(new AColorTexture());
    const std::vector<std::uint8_t> bytes = savedBytes(source);

    // Every prefix of the record.
    for (std::size_t n = 0; n <= bytes.size(); n += 7) {
        QuickArchive ar(bytes.data(), n);
        AllOptions o;
        o.load(ar);
        documentXml(o);
    }
    // Bytes overwritten at every place with values that make counts, tags
    // and lengths absurd.
    std::uint32_t seed = 12345;
    for (std::size_t at = 0; at + 4 <= bytes.size(); at += 6) {
        std::vector<std::uint8_t> damaged = bytes;
        seed = seed * 1103515245u + 12345u;
        const std::uint8_t fill = (seed >> 16) & 1 ? 0xFF : static_cast<std::uint8_t>(seed >> 8);
        for (int k = 0; k < 4; ++k) damaged[at + k] = fill;
        QuickArchive ar(damaged.data(), damaged.size());
        AllOptions o;
        o.load(ar);
        documentXml(o);
    }
}
