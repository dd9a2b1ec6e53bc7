// Animated values, transform components, cameras and the render view.
#include <gtest/gtest.h>

#include <cmath>

#include "support/Golden.h"
#include "support/RecordBytes.h"
#include "animation/Camera.h"
#include "animation/TransformComponents.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;
using namespace testsupport;

namespace {

template <class T, class V>
T keyed(T object, const V& value) { object.setValue(value, 2.0); return object; }

// An AnimatedReal record with the single key (0, value).
RecordBytes& realAtZero(RecordBytes& b, float value) { return b.keys(1).u8(1).f64(0.0).f32(value); }

}  // namespace

TEST(KeySet, ToleranceAndIndexesOutsideTheKeys) {
    // {existing, added, keys with reset's key at 0}: within 1e-12 the added
    // key replaces the existing one, which keeps its time.
    const double cases[][3] = {{1, 1 + 1e-13, 2}, {1, 1 - 5e-13, 2}, {0, -1e-13, 1}, {1, 1 + 2e-12, 3},
                               {1, 1 - 2e-12, 3}};
    for (const auto& c : cases) {
        AnimatedReal real(true);
        real.setValue(5.0f, c[0]); real.setValue(7.0f, c[1]);
        ASSERT_EQ(real.getKeyCount(), c[2]) << c[1];
        EXPECT_TRUE(c[2] == 3 || (real.getValue(c[0]) == 7 && real.getKeyTime(c[2] - 1) == c[0])) << c[1];
    }
    const AnimatedTransform transform = keyed(AnimatedTransform(), countingTransform(1));
    EXPECT_EQ(transform.getKeyValue(1), countingTransform(1));
    for (std::int64_t index : {std::int64_t(-1), std::int64_t(2), INT64_MIN})
        EXPECT_TRUE(std::isnan(transform.getKeyTime(index)) && transform.getKeyValue(index) == Transform()) << index;
}

// Keys (0, a) and (1, b); interpolated ints are truncated towards zero.
TEST(Interpolation, RealAndInt) {
    struct Case { std::int32_t a, b; double time; float real; std::int32_t integer, stepped; };
    const Case cases[] = {
        {10, 20, 0.5, 15, 15, 10}, {1, 2, 0.75, 1.75f, 1, 1}, {-1, -2, 0.5, -1.5f, -1, -1}, {0, 10, 0.25, 2.5f, 2, 0},
        {10, 20, 1 + 5e-13, 20, 20, 20}, {10, 20, 1 - 5e-13, 20, 20, 20}, {10, 20, 1e-13, 10, 10, 10},  // the same key
        {10, 20, 3, 20, 20, 20}, {10, 20, HUGE_VAL, 20, 20, 20},  // after the last key
        // Before the first key: the first key's value, not a zero span's.
        {10, 20, -1, 10, 10, 10}, {10, 20, -HUGE_VAL, 10, 10, 10},
        // INT32_MAX as f32 is 2^31, which no int32 holds: the x86 conversion's INT32_MIN.
        {INT32_MAX, INT32_MAX, 0.5, 2147483648.0f, INT32_MIN, INT32_MAX},
    };
    for (const Case& c : cases) {
        AnimatedReal real(true);
        AnimatedInt integer(true), off(false);
        real.setValue(c.a, 0.0); real.setValue(c.b, 1.0);
        for (AnimatedInt* i : {&integer, &off}) { i->setValue(c.a, 0.0); i->setValue(c.b, 1.0); }
        EXPECT_EQ(real.getValue(c.time), c.real) << c.a << "," << c.b << " @" << c.time;
        EXPECT_EQ(integer.getValue(c.time), c.integer) << c.a << "," << c.b << " @" << c.time;
        EXPECT_EQ(off.getValue(c.time), c.stepped) << c.a << "," << c.b << " @" << c.time;
    }
}

// The head of RecordBytes::keys, the interpolation flag (bool8; the transform
// has none), then each key as f64 time and value, in ascending time.
TEST(AnimatedRecord, BothWays) {
    AnimatedReal real = keyed(AnimatedReal(true), 2.5f);
    real.setValue(-8.0f, -1e6);
    expectRecord(real, AnimatedReal(false),
                 RecordBytes().keys(3).u8(1).f64(-1e6).f32(-8).f64(0).f32(0).f64(2).f32(2.5f));
    expectRecord(keyed(AnimatedInt(false), -7), AnimatedInt(true),
                 RecordBytes().keys(2).u8(0).f64(0).i32(0).f64(2).i32(-7));
    expectRecord(keyed(AnimatedTransform(), countingTransform(1)), AnimatedTransform(),
                 RecordBytes().keys(2).f64(0).transform(Transform()).f64(2).transform(countingTransform(1)));
}

TEST(AnimatedRecord, StoredKeysJoinOrReplaceTheKeyAtZero) {
    // A real's keys at 2 and 1 join reset's (0, 0), and a resave holds three
    // in order; no keys at all leave (0, 0).
    AnimatedReal real(true);
    ASSERT_TRUE(loadsWhole(real, RecordBytes().keys(2).u8(1).f64(2).f32(20).f64(1).f32(10)));
    EXPECT_EQ(savedBytes(real), RecordBytes().keys(3).u8(1).f64(0).f32(0).f64(1).f32(10).f64(2).f32(20).bytes());
    ASSERT_TRUE(loadsWhole(real, RecordBytes().keys(0).u8(0)));
    EXPECT_EQ(real, AnimatedReal(false));
    // A transform's keys at 1 and 3 replace the identity; no keys leave none.
    AnimatedTransform transform;
    ASSERT_TRUE(loadsWhole(transform,
                           RecordBytes().keys(2).f64(1).transform(countingTransform(0)).f64(3).transform(countingTransform(10))));
    EXPECT_EQ(transform.getValue(1.5), countingTransform(2.5f));  // each number on its own
    EXPECT_EQ(transform.getValue(0.0), countingTransform(0));
    ASSERT_TRUE(loadsWhole(transform, RecordBytes().keys(0)));
    EXPECT_EQ(transform.getKeyCount(), 0u);
    EXPECT_EQ(transform.getValue(0.0), Transform());
}

// A physical camera with every row off its default. Version 2: type, film_width,
// focal_length (AnimatedReal record), zoom_factor .. ISO, specify_focus,
// focus_distance (AnimatedReal record), targeted .. subdivs as declared; version
// 1 has an f32 (the key at 0) for each AnimatedReal. Non-zero bool32s are true.
RecordBytes busyRecord(int version) {
    RecordBytes b;
    const auto animated = [&](float v) { version == 1 ? b.f32(v) : realAtZero(b, v); };
    b.u32(version << 16).i32(2).f32(24);
    animated(50);
    b.f32(1.5f).f32(0.25f).f32(2.8f).f32(-0.5f).f32(125).f32(90).f32(10).f32(0.125f).f32(800).i32(1);
    animated(3);
    b.i32(version == 1 ? 7 : 1).f32(321).f32(0.001f).i32(0).vec(1, 0.5f, 0.25f).i32(0);
    return b.i32(version == 1 ? -1 : 1).i32(7).f32(0.75f).f32(-1).f32(0.3f).i32(1).i32(1).i32(16);
}

TEST(PhysicalCamera, FactoryRecordsCloneAndReset) {
    for (std::int32_t tag : {1, 2, -1, 0x10000, INT32_MIN, INT32_MAX}) EXPECT_FALSE(createCamera(tag)) << tag;
    CameraPtr camera = createCamera(0);
    ASSERT_TRUE(loadsWhole(*camera, busyRecord(1)));
    PhysicalCamera& busy = dynamic_cast<PhysicalCamera&>(*camera);
    expectRecord(busy, PhysicalCamera(), busyRecord(2));

    busy.focal_length.setValue(35, 10.0);
    busy.focus_distance.interpolate = false;
    EXPECT_EQ(dynamic_cast<PhysicalCamera&>(*busy.clone()), busy);
    // reset leaves the animated values' flags alone, like their own reset.
    busy.reset();
    EXPECT_FALSE(busy.focus_distance.interpolate);
    busy.focus_distance.interpolate = true;
    EXPECT_EQ(busy, PhysicalCamera());
}

TEST(RenderView, RecordVersionsAndXml) {
    RenderView v;  // the values that all three records hold
    v.viewRect1 = Rect{1, 2, 41, 32}; v.viewRect2 = Rect{0, 0, 8, 6}; v.img_width = 640; v.img_height = 480;
    v.viewAngle.setValue(0.5f, 0.0); v.viewReal2.setValue(2, 0.0); v.viewReal3.setValue(3, 0.0);
    v.cameraTransform.track.clear(); v.cameraTransform.setValue(countingTransform(1), 1.0);
    const RecordBytes rects = RecordBytes().i32(1).i32(2).i32(41).i32(32).i32(0).i32(0).i32(8).i32(6);
    // Version 3: viewRect1, viewRect2, img_width, img_height, then the records
    // of viewAngle, viewReal2, viewReal3, viewState, cameraTransform.
    RecordBytes v3 = RecordBytes().u32(0x30000).append(rects).i32(640).i32(480);
    realAtZero(realAtZero(realAtZero(v3, 0.5f), 2), 3).keys(1).u8(0).f64(0).i32(0);
    expectRecord(v, RenderView(), v3.keys(1).f64(1).transform(countingTransform(1)));
    for (std::uint8_t flag : {0, 1, 2}) {
        v.viewState.setValue(flag ? 0 : 1, 0.0);  // the flag false is state 1
        // Version 2: the rectangles, viewAngle, viewReal2, viewReal3 (f32: the
        // key at 0), the image size, the state flag (bool8), then the record
        // of cameraTransform, whose keys replace the identity.
        const RecordBytes middle = RecordBytes().append(rects).f32(0.5f).f32(2).f32(3).i32(640).i32(480).u8(flag);
        RenderView two, one;
        ASSERT_TRUE(loadsWhole(two, RecordBytes().u32(0x20000).append(middle).keys(1).f64(1).transform(countingTransform(1))));
        EXPECT_EQ(two, v) << int(flag);
        EXPECT_TRUE(two.viewRect1.width == 40 && two.viewRect1.height == 30);
        // Version 1: the transform (the key at 0), then version 2 up to the flag.
        ASSERT_TRUE(loadsWhole(one, RecordBytes().u32(0x10000).transform(countingTransform(1)).append(middle)));
        EXPECT_TRUE(one.cameraTransform.getKeyCount() == 1 && one.cameraTransform.getValue(0) == countingTransform(1));
        one.cameraTransform = two.cameraTransform;
        EXPECT_EQ(one, two) << int(flag);
    }
    v.img_height = -1;  // the XML shows the image size only
    std::u16string out;
    AssetXmlWriter writer(out);
    v.writeXml(writer, u"/a&b");
    expectGolden("animation/golden/render_view.xml", wideToUtf8(out));
}
