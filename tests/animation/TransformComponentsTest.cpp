#include <gtest/gtest.h>

#include "animation/TransformComponents.h"
#include "RecordBytes.h"

using namespace OrvaneLumoCore;
using animtest::RecordBytes;
using animtest::savedBytes;

namespace {

// Version 1 holds: rotation x y z, scale x y z, offset x y z (f32), mirror x y z (i32).
RecordBytes sampleBytes(std::uint32_t tag = 0x10000) {
    return RecordBytes().u32(tag).vec(10, 20, 30).vec(2, 3, 4).vec(-1, -2, -3).i32(1).i32(0).i32(-1);
}

TransformComponents sample() {
    TransformComponents c;
    c.rotation = Vector(10, 20, 30);
    c.scale = Vector(2, 3, 4);
    c.offset = Vector(-1, -2, -3);
    c.mirror[0] = 1;
    c.mirror[2] = -1;
    return c;
}

}  // namespace

TEST(TransformComponents, RecordBytesBothWays) {
    EXPECT_EQ(savedBytes(sample()), sampleBytes().bytes());
    QuickArchive ar = sampleBytes().archive();
    TransformComponents c;
    ASSERT_TRUE(c.load(ar));
    EXPECT_EQ(c, sample());
    EXPECT_EQ(ar.getReadPosition(), 52u);
}

TEST(TransformComponents, RefusedTagLeavesTheDefaults) {
    for (std::uint32_t tag : {0x20000u, 0x10001u, 0u, 0xFFFFFFFFu}) {
        QuickArchive ar = sampleBytes(tag).archive();
        TransformComponents c = sample();
        EXPECT_FALSE(c.load(ar)) << std::hex << tag;
        EXPECT_EQ(c, TransformComponents()) << std::hex << tag;
    }
    QuickArchive empty(static_cast<const void*>(nullptr), 0);
    TransformComponents c = sample();
    EXPECT_FALSE(c.load(empty));
    EXPECT_EQ(c, TransformComponents());
}
