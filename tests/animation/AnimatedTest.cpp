#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

#include "animation/Animated.h"
#include "RecordBytes.h"

using namespace OrvaneLumoCore;
using animtest::RecordBytes;
using animtest::savedBytes;

namespace {

const double kInf = std::numeric_limits<double>::infinity();

// A transform whose twelve numbers are base, base + 1, ..., base + 11.
Transform numbered(float b) {
    return Transform(Matrix(Vector(b, b + 1, b + 2), Vector(b + 3, b + 4, b + 5), Vector(b + 6, b + 7, b + 8)),
                     Vector(b + 9, b + 10, b + 11));
}

}  // namespace

TEST(KeySet, TimesWithinTheToleranceAreOneKey) {
    struct Case { double existing, added; std::size_t keys; };  // keys incl. reset's key at 0
    const Case cases[] = {
        {1.0, 1.0 + 1e-13, 2}, {1.0, 1.0 - 5e-13, 2}, {0.0, -1e-13, 1},  // replace
        {1.0, 1.0 + 2e-12, 3}, {1.0, 1.0 - 2e-12, 3},                    // keys of their own
    };
    for (const Case& c : cases) {
        AnimatedReal real(true);
        real.setValue(5.0f, c.existing);
        real.setValue(7.0f, c.added);
        ASSERT_EQ(real.getKeyCount(), c.keys) << c.added;
        if (c.keys == 3) continue;
        // The replaced key has the new value and keeps its own time.
        EXPECT_EQ(real.getValue(c.existing), 7.0f) << c.added;
        EXPECT_EQ(real.getKeyTime(static_cast<std::int64_t>(c.keys) - 1), c.existing) << c.added;
    }
}

TEST(KeySet, AscendingOrderAndIndexesOutsideTheKeys) {
    AnimatedInt integer(false);
    for (double t : {5.0, -3.0, 2.0}) integer.setValue(1, t);
    const double expected[] = {-3, 0, 2, 5};
    ASSERT_EQ(integer.getKeyCount(), 4u);
    for (int i = 0; i < 4; ++i) EXPECT_EQ(integer.getKeyTime(i), expected[i]);

    AnimatedTransform transform;
    transform.setValue(numbered(1), 2.0);
    EXPECT_EQ(transform.getKeyValue(1), numbered(1));
    EXPECT_TRUE(std::isnan(integer.getKeyTime(-1)));
    EXPECT_TRUE(std::isnan(integer.getKeyTime(4)));
    EXPECT_TRUE(std::isnan(AnimatedReal(true).getKeyTime(1)));
    for (std::int64_t index : {std::int64_t(-1), std::int64_t(2), std::numeric_limits<std::int64_t>::min()}) {
        EXPECT_TRUE(std::isnan(transform.getKeyTime(index))) << index;
        EXPECT_EQ(transform.getKeyValue(index), Transform()) << index;
    }
}

// Keys (0, 10) and (2, 20), with and without interpolation.
TEST(Interpolation, RealCases) {
    struct Case { double time; float interpolated, stepped; };
    const Case cases[] = {
        {1.0, 15, 10}, {0.5, 12.5f, 10}, {2.0, 20, 20},
        {2.0 + 5e-13, 20, 20}, {2.0 - 5e-13, 20, 20}, {1e-13, 10, 10},  // the same key: exact
        {3.0, 20, 20}, {kInf, 20, 20},                                 // after the last key
        // Before the first key both keys of the formula would be the first
        // one (a zero span): the first key's value is the answer.
        {-1.0, 10, 10}, {-kInf, 10, 10},
    };
    for (const Case& c : cases) {
        AnimatedReal on(true), off(false);
        for (AnimatedReal* r : {&on, &off}) { r->setValue(10, 0.0); r->setValue(20, 2.0); }
        EXPECT_EQ(on.getValue(c.time), c.interpolated) << c.time;
        EXPECT_EQ(off.getValue(c.time), c.stepped) << c.time;
    }
}

// Keys (0, a) and (1, b); interpolated values are truncated towards zero.
TEST(Interpolation, IntCases) {
    const std::int32_t kMax = std::numeric_limits<std::int32_t>::max();
    struct Case { std::int32_t a, b; double time; std::int32_t interpolated, stepped; };
    const Case cases[] = {
        {1, 2, 0.5, 1, 1}, {1, 2, 0.99, 1, 1}, {1, 2, 1.0, 2, 2}, {-1, -2, 0.5, -1, -1},
        {0, 10, 0.25, 2, 0}, {5, 7, -0.5, 5, 5}, {5, 7, 4.0, 7, 7},
        // INT32_MAX becomes the f32 2^31, which no int32 holds: the x86
        // conversion's INT32_MIN rather than undefined behaviour.
        {kMax, kMax, 0.5, std::numeric_limits<std::int32_t>::min(), kMax},
    };
    for (const Case& c : cases) {
        AnimatedInt on(true), off(false);
        for (AnimatedInt* i : {&on, &off}) { i->setValue(c.a, 0.0); i->setValue(c.b, 1.0); }
        EXPECT_EQ(on.getValue(c.time), c.interpolated) << c.a << "," << c.b << " @" << c.time;
        EXPECT_EQ(off.getValue(c.time), c.stepped) << c.a << "," << c.b << " @" << c.time;
    }
}

TEST(Interpolation, TransformCases) {
    // A loaded set has lost the identity at 0: keys at 1 and 3 only.
    RecordBytes rec;
    rec.u32(0x10000).u32(2).u32(8).f64(1.0).transform(numbered(0)).f64(3.0).transform(numbered(10));
    QuickArchive ar = rec.archive();
    AnimatedTransform transform;
    ASSERT_TRUE(transform.load(ar));
    EXPECT_EQ(transform.getValue(1.5), numbered(2.5f));  // each number on its own
    EXPECT_EQ(transform.getValue(9.0), numbered(10));
    EXPECT_EQ(transform.getValue(0.0), numbered(0));     // before the first key
    EXPECT_EQ(transform.getValue(-kInf), numbered(0));

    QuickArchive none = RecordBytes().u32(0x10000).u32(0).u32(8).archive();
    ASSERT_TRUE(transform.load(none));
    EXPECT_EQ(transform.getKeyCount(), 0u);
    EXPECT_EQ(transform.getValue(0.0), Transform());
}

TEST(AnimatedRecord, Bytes) {
    AnimatedReal real(true);
    real.setValue(2.5f, 1.0);
    EXPECT_EQ(savedBytes(real), RecordBytes().u32(0x10000).u32(2).u32(8).u8(1)
                                    .f64(0).f32(0).f64(1.0).f32(2.5f).bytes());
    AnimatedInt integer(false);
    integer.setValue(-7, 0.0);
    EXPECT_EQ(savedBytes(integer), RecordBytes().u32(0x10000).u32(1).u32(8).u8(0).f64(0).i32(-7).bytes());
    AnimatedTransform transform;  // no flag in this record
    transform.setValue(numbered(1), 0.5);
    EXPECT_EQ(savedBytes(transform), RecordBytes().u32(0x10000).u32(2).u32(8).f64(0).transform(Transform())
                                         .f64(0.5).transform(numbered(1)).bytes());
}

TEST(AnimatedRecord, RoundTrips) {
    AnimatedReal real(false);
    real.setValue(1.25f, -2.0);
    real.setValue(-8.0f, 1e6);
    AnimatedInt integer(true);
    integer.setValue(42, 3.0);
    AnimatedTransform transform;
    transform.setValue(numbered(-2), 12.0);
    QuickArchive ar(1);
    ASSERT_TRUE(real.save(ar) && integer.save(ar) && transform.save(ar));
    AnimatedReal real2(true);  // the flags come from the records
    AnimatedInt integer2(false);
    AnimatedTransform transform2;
    ASSERT_TRUE(real2.load(ar) && integer2.load(ar) && transform2.load(ar));
    EXPECT_EQ(real2, real);
    EXPECT_EQ(integer2, integer);
    EXPECT_EQ(transform2, transform);
    EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition());
}

TEST(AnimatedRecord, StoredKeysJoinTheKeyAtZero) {
    // Keys at 1 and 2 only: reset's (0, 0) stays beside them, and a resave holds three.
    QuickArchive ar = RecordBytes().u32(0x10000).u32(2).u32(8).u8(1)
                          .f64(1.0).f32(10).f64(2.0).f32(20).archive();
    AnimatedReal real(true);
    ASSERT_TRUE(real.load(ar));
    EXPECT_EQ(savedBytes(real), RecordBytes().u32(0x10000).u32(3).u32(8).u8(1)
                                    .f64(0).f32(0).f64(1.0).f32(10).f64(2.0).f32(20).bytes());
    // No keys at all: the single key (0, 0).
    QuickArchive empty = RecordBytes().u32(0x10000).u32(0).u32(8).u8(0).archive();
    ASSERT_TRUE(real.load(empty));
    EXPECT_EQ(real.getKeyCount(), 1u);
    EXPECT_EQ(real.getValue(5.0), 0.0f);
    EXPECT_FALSE(real.interpolate);
}

TEST(AnimatedRecord, RefusedRecordsLeaveTheObjectReset) {
    // Tag, count and width; the flag is left out (the transform has none).
    const std::vector<RecordBytes> heads = {
        RecordBytes().u32(0x20000).u32(0).u32(8), RecordBytes().u32(0x10001).u32(0).u32(8),
        RecordBytes().u32(0).u32(0).u32(8),       RecordBytes(),
        RecordBytes().u32(0x10000).u32(1).u32(4), RecordBytes().u32(0x10000).u32(0).u32(0),
        RecordBytes().u32(0x10000).u32(0xFFFFFFFFu).u32(8),  // more keys than bytes
    };
    for (std::size_t i = 0; i < heads.size(); ++i) {
        QuickArchive a1 = RecordBytes(heads[i]).u8(1).f64(1).f32(1).archive();
        AnimatedReal real(true);
        real.setValue(4.0f, 2.0);
        EXPECT_FALSE(real.load(a1)) << i;
        EXPECT_EQ(real, AnimatedReal(true)) << i;

        QuickArchive a2 = RecordBytes(heads[i]).u8(1).f64(1).i32(1).archive();
        AnimatedInt integer(false);
        integer.setValue(4, 2.0);
        EXPECT_FALSE(integer.load(a2)) << i;
        EXPECT_EQ(integer, AnimatedInt(false)) << i;

        QuickArchive a3 = RecordBytes(heads[i]).f64(1).transform(numbered(1)).archive();
        AnimatedTransform transform;
        transform.setValue(numbered(2), 1.0);
        EXPECT_FALSE(transform.load(a3)) << i;
        EXPECT_EQ(transform, AnimatedTransform()) << i;
    }
}

TEST(AnimatedRecord, HugeKeyCountFailsFast) {
    // 0xFFFFFFFF keys announced, 100 present: refused at the count, not after
    // four billion key reads.
    RecordBytes rec;
    rec.u32(0x10000).u32(0xFFFFFFFFu).u32(8).u8(1);
    for (int i = 0; i < 100; ++i) rec.f64(i).f32(1);
    QuickArchive ar = rec.archive();
    AnimatedReal real(true);
    EXPECT_FALSE(real.load(ar));
    EXPECT_LT(ar.getReadPosition(), 16u);
}
