#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

#include "animation/Animated.h"
#include "persistence/QuickArchive.h"
#include "RecordBytes.h"

using namespace OrvaneLumoCore;
using animtest::RecordBytes;
using animtest::savedBytes;

namespace {

Transform makeTransform(float base) {
    return Transform(Matrix(Vector(base, base + 1, base + 2), Vector(base + 3, base + 4, base + 5),
                            Vector(base + 6, base + 7, base + 8)),
                     Vector(base + 9, base + 10, base + 11));
}

std::vector<float> numbersOf(const Transform& t) {
    std::vector<float> out;
    for (int r = 0; r < 3; ++r)
        for (int c = 0; c < 3; ++c) out.push_back(t.m[r][c]);
    for (int c = 0; c < 3; ++c) out.push_back(t.offs[c]);
    return out;
}

}  // namespace

// ---- key sets ------------------------------------------------------------------

TEST(KeySet, FreshValuesHoldOneKeyAtZero) {
    AnimatedReal real(true);
    AnimatedInt integer(false);
    AnimatedTransform transform;
    EXPECT_EQ(real.getKeyCount(), 1u);
    EXPECT_EQ(real.getKeyTime(0), 0.0);
    EXPECT_EQ(real.getValue(0), 0.0f);
    EXPECT_EQ(integer.getKeyCount(), 1u);
    EXPECT_EQ(integer.getValue(0), 0);
    EXPECT_EQ(transform.getKeyCount(), 1u);
    EXPECT_EQ(transform.getKeyValue(0), Transform());
}

TEST(KeySet, TimesWithinTheToleranceAreOneKey) {
    struct Case {
        double existing, added;
        std::size_t keys;  // count after the second setValue (the key at 0 included)
    };
    const Case cases[] = {
        {1.0, 1.0 + 1e-13, 2},   // replaces
        {1.0, 1.0 - 5e-13, 2},   // replaces, from below
        {1.0, 1.0 + 2e-12, 3},   // a key of its own
        {1.0, 1.0 - 2e-12, 3},
        {0.0, 1e-13, 1},         // lands on the key that reset set
        {0.0, -1e-13, 1},
    };
    for (const Case& c : cases) {
        AnimatedReal real(true);
        real.setValue(5.0f, c.existing);
        real.setValue(7.0f, c.added);
        EXPECT_EQ(real.getKeyCount(), c.keys) << c.existing << " / " << c.added;
        // The replaced key keeps its first time; the value is the new one.
        if (c.keys == 1 || c.keys == 2) {
            EXPECT_EQ(real.getValue(c.existing), 7.0f);
            bool timeKept = false;
            for (std::size_t i = 0; i < real.getKeyCount(); ++i)
                timeKept |= real.getKeyTime(static_cast<std::int64_t>(i)) == c.existing;
            EXPECT_TRUE(timeKept);
        }
    }
}

TEST(KeySet, KeysAreInAscendingTimeWhateverTheInsertionOrder) {
    AnimatedInt integer(false);
    const double times[] = {5, -3, 2, 10, -1};
    for (double t : times) integer.setValue(static_cast<std::int32_t>(t * 10), t);
    const double expected[] = {-3, -1, 0, 2, 5, 10};
    ASSERT_EQ(integer.getKeyCount(), 6u);
    for (int i = 0; i < 6; ++i) EXPECT_EQ(integer.getKeyTime(i), expected[i]) << i;
}

TEST(KeySet, IndexesOutsideTheKeysGiveNaNOrIdentity) {
    AnimatedReal real(true);
    AnimatedInt integer(true);
    AnimatedTransform transform;
    transform.setValue(makeTransform(1), 2.0);
    const std::int64_t bad[] = {-1, static_cast<std::int64_t>(transform.getKeyCount()), 1000000,
                                std::numeric_limits<std::int64_t>::min()};
    for (std::int64_t index : bad) {
        EXPECT_TRUE(std::isnan(real.getKeyTime(index))) << index;
        EXPECT_TRUE(std::isnan(integer.getKeyTime(index))) << index;
        EXPECT_TRUE(std::isnan(transform.getKeyTime(index))) << index;
        EXPECT_EQ(transform.getKeyValue(index), Transform()) << index;
    }
    EXPECT_TRUE(std::isnan(real.getKeyTime(static_cast<std::int64_t>(real.getKeyCount()))));
    EXPECT_EQ(transform.getKeyValue(1), makeTransform(1));
    EXPECT_EQ(transform.getKeyTime(1), 2.0);
}

TEST(KeySet, ResetKeepsTheInterpolationFlag) {
    AnimatedReal real(false);
    real.setValue(3.0f, 0.0);
    real.setValue(4.0f, 1.0);
    real.interpolate = true;
    real.reset();
    EXPECT_TRUE(real.interpolate);
    EXPECT_EQ(real.getKeyCount(), 1u);
    EXPECT_EQ(real.getValue(0), 0.0f);
}

TEST(KeySet, CopiesTakeKeysAndFlag) {
    AnimatedReal real(false);
    real.setValue(3.0f, 1.0);
    AnimatedReal copy(real);
    EXPECT_EQ(copy, real);
    EXPECT_FALSE(copy.interpolate);
    copy.setValue(9.0f, 1.0);
    EXPECT_EQ(real.getValue(1.0), 3.0f);
}

// ---- values between and beside keys ------------------------------------------------

// Keys (0, 10) and (2, 20).
TEST(Interpolation, RealCases) {
    struct Case {
        double time;
        float interpolated, stepped;
    };
    const Case cases[] = {
        {1.0, 15.0f, 10.0f},
        {0.5, 12.5f, 10.0f},
        {2.0, 20.0f, 20.0f},
        {2.0 + 5e-13, 20.0f, 20.0f},  // the same key as 2: its value exactly
        {2.0 - 5e-13, 20.0f, 20.0f},
        {1e-13, 10.0f, 10.0f},
        {3.0, 20.0f, 20.0f},          // after the last key
        {1e300, 20.0f, 20.0f},
        {std::numeric_limits<double>::infinity(), 20.0f, 20.0f},
        // Before the first key both keys of the formula would be the first
        // one; the first key's value is the answer, interpolating or not.
        {-1.0, 10.0f, 10.0f},
        {-std::numeric_limits<double>::infinity(), 10.0f, 10.0f},
    };
    for (const Case& c : cases) {
        AnimatedReal on(true), off(false);
        for (AnimatedReal* r : {&on, &off}) {
            r->setValue(10.0f, 0.0);
            r->setValue(20.0f, 2.0);
        }
        EXPECT_EQ(on.getValue(c.time), c.interpolated) << c.time;
        EXPECT_EQ(off.getValue(c.time), c.stepped) << c.time;
    }
}

TEST(Interpolation, IntCases) {
    struct Case {
        std::int32_t a, b;
        double time;
        std::int32_t interpolated, stepped;
    };
    const Case cases[] = {
        {1, 2, 0.5, 1, 1},      // 1.5 truncates to 1
        {1, 2, 0.99, 1, 1},
        {1, 2, 1.0, 2, 2},
        {-1, -2, 0.5, -1, -1},  // -1.5 truncates towards zero
        {0, 10, 0.25, 2, 0},
        {5, 7, -0.5, 5, 5},     // before the first key: the first key's value
        {5, 7, 4.0, 7, 7},
    };
    for (const Case& c : cases) {
        AnimatedInt on(true), off(false);
        for (AnimatedInt* i : {&on, &off}) {
            i->setValue(c.a, 0.0);
            i->setValue(c.b, 1.0);
        }
        EXPECT_EQ(on.getValue(c.time), c.interpolated) << c.a << "," << c.b << " @" << c.time;
        EXPECT_EQ(off.getValue(c.time), c.stepped) << c.a << "," << c.b << " @" << c.time;
    }
}

TEST(Interpolation, IntOutsideTheRangeOfF32TruncationIsDefined) {
    // INT32_MAX turns into the f32 2^31, which no int32 holds.
    AnimatedInt integer(true);
    integer.setValue(std::numeric_limits<std::int32_t>::max(), 0.0);
    integer.setValue(std::numeric_limits<std::int32_t>::max(), 1.0);
    EXPECT_EQ(integer.getValue(0.5), std::numeric_limits<std::int32_t>::min());
    EXPECT_EQ(integer.getValue(0.0), std::numeric_limits<std::int32_t>::max());
}

TEST(Interpolation, TransformMixesEachNumberOnItsOwn) {
    AnimatedTransform transform;
    transform.setValue(makeTransform(0), 0.0);
    transform.setValue(makeTransform(10), 4.0);
    const std::vector<float> mid = numbersOf(transform.getValue(1.0));
    for (std::size_t i = 0; i < mid.size(); ++i) EXPECT_EQ(mid[i], static_cast<float>(i) + 2.5f) << i;
    EXPECT_EQ(transform.getValue(4.0), makeTransform(10));
    EXPECT_EQ(transform.getValue(9.0), makeTransform(10));
}

TEST(Interpolation, TransformBeforeItsFirstStoredKeyGivesThatKey) {
    // A loaded set no longer has the identity at 0, so any time before the
    // first stored key comes here; the result is that key, never NaN.
    RecordBytes rec;
    rec.u32(0x10000).u32(2).u32(8);
    rec.f64(1.0).transform(makeTransform(1));
    rec.f64(3.0).transform(makeTransform(5));
    QuickArchive ar = rec.archive();
    AnimatedTransform transform;
    ASSERT_TRUE(transform.load(ar));
    EXPECT_EQ(transform.getValue(0.0), makeTransform(1));
    EXPECT_EQ(transform.getValue(-100.0), makeTransform(1));
    EXPECT_EQ(transform.getValue(2.0), makeTransform(3));
}

TEST(Interpolation, TransformWithoutKeysIsTheIdentity) {
    RecordBytes rec;
    rec.u32(0x10000).u32(0).u32(8);
    QuickArchive ar = rec.archive();
    AnimatedTransform transform;
    transform.setValue(makeTransform(3), 1.0);
    ASSERT_TRUE(transform.load(ar));
    EXPECT_EQ(transform.getKeyCount(), 0u);
    EXPECT_EQ(transform.getValue(0.0), Transform());
    EXPECT_EQ(transform.getValue(7.0), Transform());
}

// ---- records ------------------------------------------------------------------

TEST(AnimatedRecord, RealBytesAreTagCountWidthFlagKeys) {
    AnimatedReal real(true);
    real.setValue(2.5f, 1.0);
    RecordBytes expected;
    expected.u32(0x10000).u32(2).u32(8).u8(1);
    expected.f64(0.0).f32(0.0f);
    expected.f64(1.0).f32(2.5f);
    EXPECT_EQ(savedBytes(real), expected.bytes());
}

TEST(AnimatedRecord, IntAndTransformBytes) {
    AnimatedInt integer(false);
    integer.setValue(-7, 0.0);
    RecordBytes intBytes;
    intBytes.u32(0x10000).u32(1).u32(8).u8(0).f64(0.0).i32(-7);
    EXPECT_EQ(savedBytes(integer), intBytes.bytes());

    AnimatedTransform transform;
    transform.setValue(makeTransform(1), 0.5);
    RecordBytes trBytes;  // no flag in the transform's record
    trBytes.u32(0x10000).u32(2).u32(8);
    trBytes.f64(0.0).transform(Transform());
    trBytes.f64(0.5).transform(makeTransform(1));
    EXPECT_EQ(savedBytes(transform), trBytes.bytes());
}

TEST(AnimatedRecord, RoundTrips) {
    AnimatedReal real(false);
    real.setValue(1.25f, -2.0);
    real.setValue(3.5f, 0.0);
    real.setValue(-8.0f, 1e6);
    AnimatedInt integer(true);
    integer.setValue(42, 3.0);
    AnimatedTransform transform;
    transform.setValue(makeTransform(7), 0.0);
    transform.setValue(makeTransform(-2), 12.0);

    QuickArchive ar(1);
    ASSERT_TRUE(real.save(ar));
    ASSERT_TRUE(integer.save(ar));
    ASSERT_TRUE(transform.save(ar));

    AnimatedReal real2(true);  // the flag comes from the record
    AnimatedInt integer2(false);
    AnimatedTransform transform2;
    ASSERT_TRUE(real2.load(ar));
    ASSERT_TRUE(integer2.load(ar));
    ASSERT_TRUE(transform2.load(ar));
    EXPECT_EQ(real2, real);
    EXPECT_EQ(integer2, integer);
    EXPECT_EQ(transform2, transform);
    EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition());
}

TEST(AnimatedRecord, StoredKeysJoinTheKeyAtZero) {
    // Keys at 1 and 2 only: reset's (0, 0) stays beside them.
    RecordBytes rec;
    rec.u32(0x10000).u32(2).u32(8).u8(1).f64(1.0).f32(10.0f).f64(2.0).f32(20.0f);
    QuickArchive ar = rec.archive();
    AnimatedReal real(true);
    ASSERT_TRUE(real.load(ar));
    EXPECT_EQ(real.getKeyCount(), 3u);
    EXPECT_EQ(real.getValue(0.0), 0.0f);
    EXPECT_EQ(real.getValue(1.5), 15.0f);

    RecordBytes resaved;
    resaved.u32(0x10000).u32(3).u32(8).u8(1).f64(0.0).f32(0.0f).append(
        std::vector<std::uint8_t>(rec.bytes().begin() + 13, rec.bytes().end()));
    EXPECT_EQ(savedBytes(real), resaved.bytes());
}

TEST(AnimatedRecord, StoredKeyAtZeroReplacesTheResetKey) {
    RecordBytes rec;
    rec.u32(0x10000).u32(1).u32(8).u8(0).f64(0.0).i32(9);
    QuickArchive ar = rec.archive();
    AnimatedInt integer(true);
    ASSERT_TRUE(integer.load(ar));
    EXPECT_EQ(integer.getKeyCount(), 1u);
    EXPECT_EQ(integer.getValue(0.0), 9);
    EXPECT_FALSE(integer.interpolate);
}

TEST(AnimatedRecord, RealWithoutKeysLoadsAsTheSingleKeyZero) {
    RecordBytes rec;
    rec.u32(0x10000).u32(0).u32(8).u8(1);
    QuickArchive ar = rec.archive();
    AnimatedReal real(true);
    real.setValue(4.0f, 2.0);
    ASSERT_TRUE(real.load(ar));
    EXPECT_EQ(real.getKeyCount(), 1u);
    EXPECT_EQ(real.getKeyTime(0), 0.0);
    EXPECT_EQ(real.getValue(0.0), 0.0f);
}

TEST(AnimatedRecord, RefusedRecordsLeaveTheObjectReset) {
    struct Case {
        const char* what;
        RecordBytes bytes;
    };
    const std::vector<Case> cases = {
        {"version 2", RecordBytes().u32(0x20000).u32(0).u32(8).u8(1)},
        {"low half set", RecordBytes().u32(0x10001).u32(0).u32(8).u8(1)},
        {"version 0", RecordBytes().u32(0).u32(0).u32(8).u8(1)},
        {"no data", RecordBytes()},
        {"time width 4", RecordBytes().u32(0x10000).u32(1).u32(4).u8(1).f64(1.0).f32(1.0f)},
        {"time width 0", RecordBytes().u32(0x10000).u32(0).u32(0).u8(1)},
        {"count beyond the data", RecordBytes().u32(0x10000).u32(0xFFFFFFFFu).u32(8).u8(1)},
    };
    for (const Case& c : cases) {
        {
            QuickArchive ar = c.bytes.archive();
            AnimatedReal real(true);
            real.setValue(4.0f, 2.0);
            EXPECT_FALSE(real.load(ar)) << c.what;
            EXPECT_EQ(real, AnimatedReal(true)) << c.what;
        }
        {
            QuickArchive ar = c.bytes.archive();
            AnimatedInt integer(false);
            integer.setValue(4, 2.0);
            EXPECT_FALSE(integer.load(ar)) << c.what;
            EXPECT_EQ(integer, AnimatedInt(false)) << c.what;
        }
    }
}

TEST(AnimatedRecord, RefusedTransformRecordsLeaveTheIdentity) {
    const RecordBytes cases[] = {
        RecordBytes().u32(0x20000).u32(0).u32(8),
        RecordBytes().u32(0x10000).u32(1).u32(16).f64(1.0).transform(Transform()),
        RecordBytes().u32(0x10000).u32(0xFFFFFFFFu).u32(8),
    };
    for (const RecordBytes& bytes : cases) {
        QuickArchive ar = bytes.archive();
        AnimatedTransform transform;
        transform.setValue(makeTransform(2), 1.0);
        EXPECT_FALSE(transform.load(ar));
        EXPECT_EQ(transform, AnimatedTransform());
    }
}

TEST(AnimatedRecord, HugeKeyCountFailsFast) {
    // A count of 0xFFFFFFFF with a few real keys behind it: the load must
    // refuse the count instead of running four billion key reads.
    RecordBytes rec;
    rec.u32(0x10000).u32(0xFFFFFFFFu).u32(8).u8(1);
    for (int i = 0; i < 100; ++i) rec.f64(i).f32(static_cast<float>(i));
    QuickArchive ar = rec.archive();
    AnimatedReal real(true);
    EXPECT_FALSE(real.load(ar));
    EXPECT_EQ(real.getKeyCount(), 1u);
    EXPECT_LT(ar.getReadPosition(), 16u);
}

TEST(AnimatedRecord, TruncatedKeysStillEndTheLoad) {
    // Three keys announced, one and a half present: the load completes
    // (the archive doesn't report running out) and holds what was read.
    RecordBytes rec;
    rec.u32(0x10000).u32(3).u32(8).u8(1).f64(1.0).f32(5.0f).f64(2.0);
    QuickArchive ar = rec.archive();
    AnimatedReal real(true);
    EXPECT_TRUE(real.load(ar));
    EXPECT_EQ(real.getValue(1.0), 5.0f);
    EXPECT_LE(real.getKeyCount(), 4u);
}
