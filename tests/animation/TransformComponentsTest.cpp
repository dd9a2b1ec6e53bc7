#include <gtest/gtest.h>

#include "animation/TransformComponents.h"
#include "persistence/QuickArchive.h"
#include "RecordBytes.h"

using namespace OrvaneLumoCore;
using animtest::RecordBytes;
using animtest::savedBytes;

namespace {

TransformComponents sample() {
    TransformComponents c;
    c.rotation = Vector(10, 20, 30);
    c.scale = Vector(2, 3, 4);
    c.offset = Vector(-1, -2, -3);
    c.mirror[0] = 1;
    c.mirror[1] = 0;
    c.mirror[2] = -1;
    return c;
}

// Version 1 holds: rotation x y z, scale x y z, offset x y z (f32), mirror x y z (i32).
RecordBytes sampleBytes() {
    RecordBytes b;
    b.u32(0x10000).vec(10, 20, 30).vec(2, 3, 4).vec(-1, -2, -3).i32(1).i32(0).i32(-1);
    return b;
}

}  // namespace

TEST(TransformComponents, Defaults) {
    const TransformComponents c;
    EXPECT_EQ(c.rotation, Vector(0, 0, 0));
    EXPECT_EQ(c.scale, Vector(1, 1, 1));
    EXPECT_EQ(c.offset, Vector(0, 0, 0));
    EXPECT_EQ(c.mirror[0], 0);
    EXPECT_EQ(c.mirror[1], 0);
    EXPECT_EQ(c.mirror[2], 0);
}

TEST(TransformComponents, SavesItsFieldsInRecordOrder) {
    EXPECT_EQ(savedBytes(sample()), sampleBytes().bytes());
}

TEST(TransformComponents, LoadsAHandLaidRecordAndRoundTrips) {
    QuickArchive ar = sampleBytes().archive();
    TransformComponents c;
    ASSERT_TRUE(c.load(ar));
    EXPECT_EQ(c, sample());
    EXPECT_EQ(ar.getReadPosition(), 52u);

    QuickArchive again(1);
    ASSERT_TRUE(sample().save(again));
    TransformComponents d;
    ASSERT_TRUE(d.load(again));
    EXPECT_EQ(d, sample());
}

TEST(TransformComponents, RefusedTagLeavesTheDefaults) {
    const std::uint32_t tags[] = {0x20000, 0x10001, 0, 0xFFFFFFFFu};
    for (std::uint32_t tag : tags) {
        RecordBytes b;
        b.u32(tag).vec(10, 20, 30).vec(2, 3, 4).vec(-1, -2, -3).i32(1).i32(0).i32(-1);
        QuickArchive ar = b.archive();
        TransformComponents c = sample();
        EXPECT_FALSE(c.load(ar)) << std::hex << tag;
        EXPECT_EQ(c, TransformComponents()) << std::hex << tag;
    }
    QuickArchive empty(static_cast<const void*>(nullptr), 0);
    TransformComponents c = sample();
    EXPECT_FALSE(c.load(empty));
    EXPECT_EQ(c, TransformComponents());
}
