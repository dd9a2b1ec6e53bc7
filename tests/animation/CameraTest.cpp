#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "animation/Camera.h"
#include "RecordBytes.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;
using animtest::RecordBytes;
using animtest::savedBytes;

namespace {

// An AnimatedReal record with the single key (0, value).
RecordBytes& realAtZero(RecordBytes& b, float value) {
    return b.u32(0x10000).u32(1).u32(8).u8(1).f64(0.0).f32(value);
}

// Every row off its default; the version 1 record below holds the same
// values, with the two animated rows as their value at time 0.
PhysicalCamera busyCamera() {
    PhysicalCamera c;
    c.type = 2; c.film_width = 24; c.focal_length.setValue(50, 0.0); c.zoom_factor = 1.5f;
    c.distortion = 0.25f; c.f_number = 2.8f; c.lens_shift = -0.5f; c.shutter_speed = 125;
    c.shutter_angle = 90; c.shutter_offset = 10; c.latency = 0.125f; c.ISO = 800;
    c.specify_focus = true; c.focus_distance.setValue(3, 0.0); c.targeted = true;
    c.target_distance = 321; c.dof_display_threshold = 0.001f; c.exposure = false;
    c.white_balance = Color(1, 0.5f, 0.25f); c.vignetting = false; c.blades_enable = true;
    c.blades_num = 7; c.blades_rotation = 0.75f; c.center_bias = -1; c.anisotropy = 0.3f;
    c.use_dof = true; c.use_moblur = true; c.subdivs = 16;
    return c;
}

// Version 1: the 28 rows, focal_length and focus_distance as one f32 each.
// targeted is 7 and blades_enable -1: any non-zero bool32 is true.
RecordBytes busyVersion1() {
    RecordBytes b;
    b.u32(0x10000).i32(2).f32(24).f32(50).f32(1.5f).f32(0.25f).f32(2.8f).f32(-0.5f).f32(125);
    b.f32(90).f32(10).f32(0.125f).f32(800).i32(1).f32(3).i32(7).f32(321).f32(0.001f).i32(0);
    b.vec(1, 0.5f, 0.25f).i32(0).i32(-1).i32(7).f32(0.75f).f32(-1).f32(0.3f).i32(1).i32(1).i32(16);
    return b;
}

Transform turned() {
    return Transform(Matrix(Vector(0, 1, 0), Vector(-1, 0, 0), Vector(0, 0, 2)), Vector(5, 6, 7));
}

Rect rect(std::int32_t x0, std::int32_t y0, std::int32_t x1, std::int32_t y1) {
    Rect r;
    r.x0 = x0; r.y0 = y0; r.x1 = x1; r.y1 = y1;
    return r;
}

template <class T>
bool loads(const RecordBytes& bytes, T& object) {
    QuickArchive ar = bytes.archive();
    return object.load(ar) && ar.getReadPosition() == bytes.size();
}

}  // namespace

TEST(CameraFactory, OnlyTagZeroHasAClass) {
    CameraPtr camera = createCamera(0);
    ASSERT_TRUE(dynamic_cast<PhysicalCamera*>(camera.get()));
    EXPECT_EQ(camera->getType(), 0u);
    EXPECT_EQ(camera->getPluginName(), u"CameraPhysical");
    for (std::int32_t tag : {1, 2, -1, 0x10000, INT32_MIN, INT32_MAX}) EXPECT_FALSE(createCamera(tag)) << tag;
}

TEST(PhysicalCamera, DefaultRecordVersion2) {
    // Version 2: type, film_width, focal_length (AnimatedReal record),
    // zoom_factor .. ISO, specify_focus, focus_distance (AnimatedReal record),
    // targeted, target_distance, dof_display_threshold, exposure,
    // white_balance, vignetting, blades_enable, blades_num, blades_rotation,
    // center_bias, anisotropy, use_dof, use_moblur, subdivs.
    RecordBytes b;
    realAtZero(b.u32(0x20000).i32(0).f32(36), 40);
    realAtZero(b.f32(1).f32(0).f32(8).f32(0).f32(30).f32(180).f32(0).f32(0).f32(200).i32(0), 200);
    b.i32(0).f32(200).f32(0).i32(1).vec(1, 1, 1).i32(1).i32(0).i32(5).f32(0).f32(0).f32(0).i32(0).i32(0).i32(6);
    EXPECT_EQ(savedBytes(PhysicalCamera()), b.bytes());
    PhysicalCamera loaded = busyCamera();
    ASSERT_TRUE(loads(b, loaded));
    EXPECT_EQ(loaded, PhysicalCamera());
}

TEST(PhysicalCamera, HandLaidVersion1) {
    PhysicalCamera c;
    ASSERT_TRUE(loads(busyVersion1(), c));
    EXPECT_EQ(c, busyCamera());
    EXPECT_EQ(c.focal_length.getKeyCount(), 1u);  // the single key (0, 50)
    EXPECT_EQ(c.focal_length.getValue(0.0), 50.0f);
}

TEST(PhysicalCamera, RoundTripCloneAndReset) {
    PhysicalCamera original = busyCamera();
    original.focal_length.setValue(35, 10.0);
    original.focus_distance.interpolate = false;
    QuickArchive ar(1);
    ASSERT_TRUE(original.save(ar));
    PhysicalCamera loaded;
    ASSERT_TRUE(loaded.load(ar));
    EXPECT_EQ(loaded, original);
    EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition());

    boost::shared_ptr<BaseCamera> copy = original.clone();
    auto* camera = dynamic_cast<PhysicalCamera*>(copy.get());
    ASSERT_TRUE(camera);
    EXPECT_EQ(*camera, original);
    camera->focal_length.setValue(1, 20.0);
    EXPECT_EQ(original.focal_length.getKeyCount(), 2u);

    // reset leaves the animated values' flags alone, like their own reset.
    original.reset();
    EXPECT_FALSE(original.focus_distance.interpolate);
    original.focus_distance.interpolate = true;
    EXPECT_EQ(original, PhysicalCamera());
}

TEST(PhysicalCamera, RefusedRecords) {
    const std::vector<std::uint8_t> all = savedBytes(PhysicalCamera());
    const std::vector<std::uint8_t> tail(all.begin() + 4, all.end());
    // focus_distance's record starts at 77 (tag, type, film_width, a 25-byte
    // focal_length record, nine f32, specify_focus); its time width at 85.
    std::vector<std::uint8_t> badWidth = all;
    ASSERT_EQ(badWidth[85], 8);
    badWidth[85] = 4;
    const RecordBytes cases[] = {
        RecordBytes().u32(0x30000).append(tail), RecordBytes().u32(0).append(tail),
        RecordBytes().u32(0x20001).append(tail), RecordBytes(),
        RecordBytes().u32(0x20000).i32(0).f32(36).u32(0x20000).u32(0).u32(8).u8(1),
        RecordBytes().u32(0x20000).i32(0).f32(36).u32(0x10000).u32(0xFFFFFFFFu).u32(8).u8(1),
        RecordBytes().append(badWidth),
    };
    for (const RecordBytes& bytes : cases) {
        PhysicalCamera camera;
        QuickArchive ar = bytes.archive();
        EXPECT_FALSE(camera.load(ar)) << (&bytes - cases);
    }
}

TEST(RenderView, DefaultsAndVersion3Record) {
    // Version 3: viewRect1, viewRect2, img_width, img_height, then the
    // records of viewAngle, viewReal2, viewReal3, viewState, cameraTransform.
    RecordBytes b;
    b.u32(0x30000).rect(-1, -1, -1, -1).rect(-1, -1, -1, -1).i32(320).i32(240);
    realAtZero(realAtZero(realAtZero(b, 0.7853982f), 1), 1);
    b.u32(0x10000).u32(1).u32(8).u8(0).f64(0.0).i32(0);
    b.u32(0x10000).u32(1).u32(8).f64(0.0).transform(Transform());
    const RenderView fresh;
    EXPECT_EQ(savedBytes(fresh), b.bytes());
    EXPECT_EQ(fresh.viewRect1.width, 0);
    EXPECT_EQ(fresh.viewRect2.height, 0);

    RenderView v;
    v.cameraTransform.setValue(turned(), 3.0);
    v.viewRect1 = rect(10, 20, 110, 70);
    v.viewAngle.setValue(0.4f, 2.0);
    v.viewReal3.interpolate = false;
    v.img_width = 1920;
    v.viewState.setValue(4, 1.0);
    QuickArchive ar(1);
    ASSERT_TRUE(v.save(ar));
    RenderView loaded;
    ASSERT_TRUE(loaded.load(ar));
    EXPECT_EQ(loaded, v);
    EXPECT_EQ(loaded.viewRect1.width, 100);
    EXPECT_EQ(loaded.viewRect1.height, 50);
}

TEST(RenderView, HandLaidOldVersions) {
    // The values both old records below hold.
    RenderView expected;
    expected.viewRect1 = rect(1, 2, 41, 32);
    expected.viewRect2 = rect(0, 0, 8, 6);
    expected.viewAngle.setValue(0.5f, 0.0);
    expected.viewReal2.setValue(2, 0.0);
    expected.viewReal3.setValue(3, 0.0);
    expected.img_width = 640;
    expected.img_height = 480;
    for (std::uint8_t flag : {0, 1, 2}) {
        expected.viewState.setValue(flag ? 0 : 1, 0.0);  // the flag false is state 1

        // Version 1: transform, viewRect1, viewRect2, viewAngle, viewReal2,
        // viewReal3 (f32 each), img_width, img_height, the state flag (bool8).
        RecordBytes v1;
        v1.u32(0x10000).transform(turned()).rect(1, 2, 41, 32).rect(0, 0, 8, 6);
        v1.f32(0.5f).f32(2).f32(3).i32(640).i32(480).u8(flag);
        RenderView one;
        ASSERT_TRUE(loads(v1, one)) << int(flag);
        expected.cameraTransform.reset();
        expected.cameraTransform.setValue(turned(), 0.0);
        EXPECT_EQ(one, expected) << int(flag);
        EXPECT_EQ(one.viewRect1.width, 40);
        EXPECT_EQ(one.viewRect1.height, 30);

        // Version 2: as version 1 without the leading transform, and the
        // record of cameraTransform at the end. Its keys replace the identity.
        RecordBytes v2;
        v2.u32(0x20000).rect(1, 2, 41, 32).rect(0, 0, 8, 6);
        v2.f32(0.5f).f32(2).f32(3).i32(640).i32(480).u8(flag);
        v2.u32(0x10000).u32(1).u32(8).f64(1.0).transform(turned());
        RenderView two;
        ASSERT_TRUE(loads(v2, two)) << int(flag);
        expected.cameraTransform.track.clear();
        expected.cameraTransform.setValue(turned(), 1.0);
        EXPECT_EQ(two, expected) << int(flag);
    }
}

TEST(RenderView, RefusedRecords) {
    const std::vector<std::uint8_t> all = savedBytes(RenderView());
    const std::vector<std::uint8_t> tail(all.begin() + 4, all.end());
    const RecordBytes cases[] = {
        RecordBytes().u32(0x40000).append(tail), RecordBytes().u32(0).append(tail),
        RecordBytes().u32(0x30001).append(tail), RecordBytes(),
        // Version 3 whose viewAngle record is version 2.
        RecordBytes().u32(0x30000).rect(0, 0, 1, 1).rect(0, 0, 1, 1).i32(1).i32(1).u32(0x20000).u32(0).u32(8),
        // Version 2 whose transform record announces 0xFFFFFFFF keys.
        RecordBytes().u32(0x20000).rect(0, 0, 1, 1).rect(0, 0, 1, 1).f32(1).f32(1).f32(1).i32(1).i32(1).u8(1)
            .u32(0x10000).u32(0xFFFFFFFFu).u32(8),
    };
    for (const RecordBytes& bytes : cases) {
        RenderView v;
        QuickArchive ar = bytes.archive();
        EXPECT_FALSE(v.load(ar)) << (&bytes - cases);
    }
}

TEST(RenderView, WritesItsImageSize) {
    RenderView v;
    v.img_width = 640;
    v.img_height = -1;
    std::u16string out;
    AssetXmlWriter writer(out);
    v.writeXml(writer, u"/a&b");
    EXPECT_EQ(out,
              u"  <Asset layout=\"\" renderer=\"lumo\" type=\"settings\" url=\"/a&amp;b/RenderView\" >\n"
              u"    <plugin>\n"
              u"      <lumoplugin name=\"RenderView\" type=\"settings\">\n"
              u"        <parameters>\n"
              u"          <parameter type=\"integer\" name=\"img_width\" handler=\"default\" listType=\"none\" label=\"img_width\">\n"
              u"            <value>640</value>\n"
              u"          </parameter>\n"
              u"          <parameter type=\"integer\" name=\"img_height\" handler=\"default\" listType=\"none\" label=\"img_height\">\n"
              u"            <value>-1</value>\n"
              u"          </parameter>\n"
              u"        </parameters>\n"
              u"      </lumoplugin>\n"
              u"    </plugin>\n"
              u"  </Asset>\n");
    EXPECT_EQ(writer.getIndent(), 0);
}
