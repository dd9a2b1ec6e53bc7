#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "animation/Camera.h"
#include "persistence/QuickArchive.h"
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

// A camera with every field off its default, and extra keys in both reals.
PhysicalCamera busyCamera() {
    PhysicalCamera c;
    c.type = 2;
    c.film_width = 24;
    c.focal_length.setValue(85, 0.0);
    c.focal_length.setValue(35, 10.0);
    c.zoom_factor = 1.5f;
    c.distortion = 0.25f;
    c.f_number = 2.8f;
    c.lens_shift = -0.5f;
    c.shutter_speed = 125;
    c.shutter_angle = 90;
    c.shutter_offset = 10;
    c.latency = 0.125f;
    c.ISO = 800;
    c.specify_focus = true;
    c.focus_distance.setValue(3, 0.0);
    c.focus_distance.setValue(5, -1.0);
    c.focus_distance.interpolate = false;
    c.targeted = true;
    c.target_distance = 321;
    c.dof_display_threshold = 0.001f;
    c.exposure = false;
    c.white_balance = Color(1, 0.5f, 0.25f);
    c.vignetting = false;
    c.blades_enable = true;
    c.blades_num = 7;
    c.blades_rotation = 0.75f;
    c.center_bias = -1;
    c.anisotropy = 0.3f;
    c.use_dof = true;
    c.use_moblur = true;
    c.subdivs = 16;
    return c;
}

}  // namespace

// ---- factory ---------------------------------------------------------------------

TEST(CameraFactory, OnlyTagZeroHasAClass) {
    CameraPtr camera = createCamera(0);
    ASSERT_TRUE(camera);
    EXPECT_EQ(camera->getType(), 0u);
    EXPECT_TRUE(dynamic_cast<PhysicalCamera*>(camera.get()));
    EXPECT_EQ(camera->getPluginName(), u"CameraPhysical");
    EXPECT_EQ(camera->getAssetType(), u"settings");
    const std::int32_t noClass[] = {1, 2, -1, 255, 0x10000, INT32_MIN, INT32_MAX};
    for (std::int32_t tag : noClass) EXPECT_FALSE(createCamera(tag)) << tag;
}

// ---- physical camera --------------------------------------------------------------

TEST(PhysicalCamera, Defaults) {
    const PhysicalCamera c;
    EXPECT_EQ(c.type, 0);
    EXPECT_EQ(c.film_width, 36.0f);
    EXPECT_EQ(c.focal_length.getKeyCount(), 1u);
    EXPECT_EQ(c.focal_length.getValue(0.0), 40.0f);
    EXPECT_TRUE(c.focal_length.interpolate);
    EXPECT_EQ(c.zoom_factor, 1.0f);
    EXPECT_EQ(c.distortion, 0.0f);
    EXPECT_EQ(c.f_number, 8.0f);
    EXPECT_EQ(c.lens_shift, 0.0f);
    EXPECT_EQ(c.shutter_speed, 30.0f);
    EXPECT_EQ(c.shutter_angle, 180.0f);
    EXPECT_EQ(c.shutter_offset, 0.0f);
    EXPECT_EQ(c.latency, 0.0f);
    EXPECT_EQ(c.ISO, 200.0f);
    EXPECT_FALSE(c.specify_focus);
    EXPECT_EQ(c.focus_distance.getKeyCount(), 1u);
    EXPECT_EQ(c.focus_distance.getValue(0.0), 200.0f);
    EXPECT_TRUE(c.focus_distance.interpolate);
    EXPECT_FALSE(c.targeted);
    EXPECT_EQ(c.target_distance, 200.0f);
    EXPECT_EQ(c.dof_display_threshold, 0.0f);
    EXPECT_TRUE(c.exposure);
    EXPECT_EQ(c.white_balance, Color(1, 1, 1));
    EXPECT_TRUE(c.vignetting);
    EXPECT_FALSE(c.blades_enable);
    EXPECT_EQ(c.blades_num, 5);
    EXPECT_EQ(c.blades_rotation, 0.0f);
    EXPECT_EQ(c.center_bias, 0.0f);
    EXPECT_EQ(c.anisotropy, 0.0f);
    EXPECT_FALSE(c.use_dof);
    EXPECT_FALSE(c.use_moblur);
    EXPECT_EQ(c.subdivs, 6);
}

TEST(PhysicalCamera, ResetRestoresTheDefaults) {
    PhysicalCamera c = busyCamera();
    c.reset();
    // Like the animated values' own reset, the camera's leaves their
    // interpolation flags alone.
    EXPECT_FALSE(c.focus_distance.interpolate);
    c.focus_distance.interpolate = true;
    EXPECT_EQ(c, PhysicalCamera());
    EXPECT_EQ(c.focal_length.getKeyCount(), 1u);
}

TEST(PhysicalCamera, DefaultRecordVersion2) {
    // Version 2: type, film_width, focal_length (AnimatedReal record),
    // zoom_factor .. ISO, specify_focus, focus_distance (AnimatedReal record),
    // targeted, target_distance, dof_display_threshold, exposure,
    // white_balance, vignetting, blades_enable, blades_num, blades_rotation,
    // center_bias, anisotropy, use_dof, use_moblur, subdivs.
    RecordBytes b;
    b.u32(0x20000).i32(0).f32(36);
    realAtZero(b, 40);
    b.f32(1).f32(0).f32(8).f32(0).f32(30).f32(180).f32(0).f32(0).f32(200);
    b.i32(0);
    realAtZero(b, 200);
    b.i32(0).f32(200).f32(0).i32(1).vec(1, 1, 1).i32(1).i32(0).i32(5);
    b.f32(0).f32(0).f32(0).i32(0).i32(0).i32(6);
    EXPECT_EQ(savedBytes(PhysicalCamera()), b.bytes());

    QuickArchive ar = b.archive();
    PhysicalCamera loaded = busyCamera();
    ASSERT_TRUE(loaded.load(ar));
    EXPECT_EQ(loaded, PhysicalCamera());
    EXPECT_EQ(ar.getReadPosition(), b.size());
}

TEST(PhysicalCamera, HandLaidVersion1) {
    // Version 1: as version 2, but focal_length and focus_distance are one
    // f32 each, the value at time 0.
    RecordBytes b;
    b.u32(0x10000).i32(2).f32(24).f32(50);
    b.f32(1.5f).f32(0.25f).f32(2.8f).f32(-0.5f).f32(125).f32(90).f32(10).f32(0.125f).f32(800);
    b.i32(1).f32(3);
    b.i32(7).f32(321).f32(0.001f).i32(0).vec(1, 0.5f, 0.25f).i32(0).i32(-1).i32(7);
    b.f32(0.75f).f32(-1).f32(0.3f).i32(1).i32(1).i32(16);
    QuickArchive ar = b.archive();
    PhysicalCamera c;
    ASSERT_TRUE(c.load(ar));
    EXPECT_EQ(ar.getReadPosition(), b.size());

    EXPECT_EQ(c.focal_length.getKeyCount(), 1u);
    EXPECT_EQ(c.focal_length.getKeyTime(0), 0.0);
    EXPECT_EQ(c.focal_length.getValue(0.0), 50.0f);
    EXPECT_EQ(c.focus_distance.getKeyCount(), 1u);
    EXPECT_EQ(c.focus_distance.getValue(0.0), 3.0f);
    EXPECT_TRUE(c.targeted);       // any non-zero bool32 is true
    EXPECT_TRUE(c.blades_enable);  // -1 as well

    // Everything else matches the busy camera, apart from its extra keys
    // and the interpolation flag it changed.
    PhysicalCamera expected = busyCamera();
    expected.focal_length.reset();
    expected.focal_length.setValue(50, 0.0);
    expected.focus_distance = AnimatedReal(true);
    expected.focus_distance.setValue(3, 0.0);
    EXPECT_EQ(c, expected);
}

TEST(PhysicalCamera, RoundTripKeepsKeysAtAllTimes) {
    const PhysicalCamera original = busyCamera();
    QuickArchive ar(1);
    ASSERT_TRUE(original.save(ar));
    PhysicalCamera loaded;
    ASSERT_TRUE(loaded.load(ar));
    EXPECT_EQ(loaded, original);
    EXPECT_EQ(loaded.focal_length.getKeyCount(), 2u);
    EXPECT_EQ(loaded.focal_length.getValue(10.0), 35.0f);
    EXPECT_EQ(loaded.focus_distance.getValue(-1.0), 5.0f);
    EXPECT_FALSE(loaded.focus_distance.interpolate);
    EXPECT_TRUE(loaded.targeted);
    EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition());
}

TEST(PhysicalCamera, CloneIsAnIndependentCopy) {
    const PhysicalCamera original = busyCamera();
    boost::shared_ptr<BaseCamera> copy = original.clone();
    auto* camera = dynamic_cast<PhysicalCamera*>(copy.get());
    ASSERT_TRUE(camera);
    EXPECT_EQ(*camera, original);
    camera->focal_length.setValue(1, 20.0);
    camera->subdivs = 1;
    EXPECT_EQ(original.focal_length.getKeyCount(), 2u);
    EXPECT_EQ(original.subdivs, 16);
}

TEST(PhysicalCamera, RefusedRecords) {
    const std::vector<std::uint8_t> goodTail = [] {
        std::vector<std::uint8_t> all = savedBytes(PhysicalCamera());
        return std::vector<std::uint8_t>(all.begin() + 4, all.end());
    }();
    struct Case {
        const char* what;
        RecordBytes bytes;
    };
    std::vector<Case> cases = {
        {"version 3", RecordBytes().u32(0x30000).append(goodTail)},
        {"version 0", RecordBytes().u32(0).append(goodTail)},
        {"low half set", RecordBytes().u32(0x20001).append(goodTail)},
        {"no data", RecordBytes()},
        // Version 2 whose focal length record has a wrong tag.
        {"bad focal length tag", RecordBytes().u32(0x20000).i32(0).f32(36).u32(0x20000).u32(0).u32(8).u8(1)},
        // ... or an impossible key count.
        {"huge key count", RecordBytes().u32(0x20000).i32(0).f32(36).u32(0x10000).u32(0xFFFFFFFFu).u32(8).u8(1)},
    };
    for (Case& c : cases) {
        QuickArchive ar = c.bytes.archive();
        PhysicalCamera camera;
        EXPECT_FALSE(camera.load(ar)) << c.what;
    }
}

TEST(PhysicalCamera, BadSecondRealEndsTheLoad) {
    // A version 2 record that is good up to focus_distance, whose time width is 4.
    std::vector<std::uint8_t> all = savedBytes(PhysicalCamera());
    // tag 4, type 4, film 4, focal record 25, nine f32 36, specify_focus 4:
    // focus_distance's record starts at 77; its width field 8 bytes later.
    const std::size_t widthAt = 77 + 8;
    ASSERT_EQ(all[widthAt], 8);
    all[widthAt] = 4;
    QuickArchive ar(all.data(), all.size());
    PhysicalCamera camera;
    EXPECT_FALSE(camera.load(ar));
}

// ---- render view ------------------------------------------------------------------

namespace {

Transform sampleTransform() {
    return Transform(Matrix(Vector(0, 1, 0), Vector(-1, 0, 0), Vector(0, 0, 2)), Vector(5, 6, 7));
}

void expectRect(const Rect& r, std::int32_t x0, std::int32_t y0, std::int32_t x1, std::int32_t y1) {
    EXPECT_EQ(r.x0, x0);
    EXPECT_EQ(r.y0, y0);
    EXPECT_EQ(r.x1, x1);
    EXPECT_EQ(r.y1, y1);
    EXPECT_EQ(r.width, x1 - x0);
    EXPECT_EQ(r.height, y1 - y0);
}

}  // namespace

TEST(RenderView, Defaults) {
    const RenderView v;
    EXPECT_EQ(v.cameraTransform.getKeyCount(), 1u);
    EXPECT_EQ(v.cameraTransform.getValue(0.0), Transform());
    expectRect(v.viewRect1, -1, -1, -1, -1);
    expectRect(v.viewRect2, -1, -1, -1, -1);
    EXPECT_EQ(v.viewAngle.getValue(0.0), 0.7853982f);
    EXPECT_EQ(v.viewReal2.getValue(0.0), 1.0f);
    EXPECT_EQ(v.viewReal3.getValue(0.0), 1.0f);
    EXPECT_TRUE(v.viewAngle.interpolate);
    EXPECT_TRUE(v.viewReal2.interpolate);
    EXPECT_TRUE(v.viewReal3.interpolate);
    EXPECT_EQ(v.img_width, 320);
    EXPECT_EQ(v.img_height, 240);
    EXPECT_EQ(v.viewState.getValue(0.0), 0);
    EXPECT_FALSE(v.viewState.interpolate);
    EXPECT_EQ(v.getPluginName(), u"RenderView");
    EXPECT_EQ(v.getAssetType(), u"settings");
}

TEST(RenderView, DefaultRecordVersion3) {
    // Version 3: viewRect1, viewRect2, img_width, img_height, then the
    // records of viewAngle, viewReal2, viewReal3, viewState, cameraTransform.
    RecordBytes b;
    b.u32(0x30000).rect(-1, -1, -1, -1).rect(-1, -1, -1, -1).i32(320).i32(240);
    realAtZero(b, 0.7853982f);
    realAtZero(b, 1);
    realAtZero(b, 1);
    b.u32(0x10000).u32(1).u32(8).u8(0).f64(0.0).i32(0);
    b.u32(0x10000).u32(1).u32(8).f64(0.0).transform(Transform());
    EXPECT_EQ(savedBytes(RenderView()), b.bytes());
}

TEST(RenderView, RoundTrip) {
    RenderView v;
    v.cameraTransform.setValue(sampleTransform(), 0.0);
    v.cameraTransform.setValue(Transform(), 3.0);
    v.viewRect1.x0 = 10;
    v.viewRect1.y0 = 20;
    v.viewRect1.x1 = 110;
    v.viewRect1.y1 = 70;
    v.viewAngle.setValue(1.2f, 0.0);
    v.viewAngle.setValue(0.4f, 2.0);
    v.viewReal2.setValue(3, 0.0);
    v.viewReal3.interpolate = false;
    v.img_width = 1920;
    v.img_height = 1080;
    v.viewState.setValue(4, 1.0);

    QuickArchive ar(1);
    ASSERT_TRUE(v.save(ar));
    RenderView loaded;
    ASSERT_TRUE(loaded.load(ar));
    EXPECT_EQ(loaded, v);
    expectRect(loaded.viewRect1, 10, 20, 110, 70);
    EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition());
}

TEST(RenderView, HandLaidVersion1) {
    // Version 1: transform, viewRect1, viewRect2, viewAngle, viewReal2,
    // viewReal3 (f32 each), img_width, img_height, the state flag (bool8).
    RecordBytes b;
    b.u32(0x10000).transform(sampleTransform()).rect(1, 2, 41, 32).rect(0, 0, 8, 6);
    b.f32(0.5f).f32(2).f32(3).i32(640).i32(480).u8(0);
    QuickArchive ar = b.archive();
    RenderView v;
    ASSERT_TRUE(v.load(ar));
    EXPECT_EQ(ar.getReadPosition(), b.size());
    EXPECT_EQ(v.cameraTransform.getKeyCount(), 1u);
    EXPECT_EQ(v.cameraTransform.getValue(0.0), sampleTransform());
    expectRect(v.viewRect1, 1, 2, 41, 32);
    expectRect(v.viewRect2, 0, 0, 8, 6);
    EXPECT_EQ(v.viewAngle.getKeyCount(), 1u);
    EXPECT_EQ(v.viewAngle.getValue(0.0), 0.5f);
    EXPECT_EQ(v.viewReal2.getValue(0.0), 2.0f);
    EXPECT_EQ(v.viewReal3.getValue(0.0), 3.0f);
    EXPECT_EQ(v.img_width, 640);
    EXPECT_EQ(v.img_height, 480);
    EXPECT_EQ(v.viewState.getKeyCount(), 1u);
    EXPECT_EQ(v.viewState.getValue(0.0), 1);  // flag false
}

TEST(RenderView, HandLaidVersion2) {
    // Version 2: viewRect1, viewRect2, viewAngle, viewReal2, viewReal3 (f32
    // each), img_width, img_height, the state flag (bool8), then the record
    // of cameraTransform.
    for (std::uint8_t flag : {0, 1, 2}) {
        RecordBytes b;
        b.u32(0x20000).rect(-5, -5, 5, 5).rect(0, 0, 100, 50);
        b.f32(0.25f).f32(4).f32(5).i32(800).i32(600).u8(flag);
        b.u32(0x10000).u32(2).u32(8).f64(1.0).transform(sampleTransform());
        b.f64(2.0).transform(Transform());
        QuickArchive ar = b.archive();
        RenderView v;
        ASSERT_TRUE(v.load(ar)) << int(flag);
        EXPECT_EQ(ar.getReadPosition(), b.size());
        expectRect(v.viewRect1, -5, -5, 5, 5);
        expectRect(v.viewRect2, 0, 0, 100, 50);
        EXPECT_EQ(v.viewAngle.getValue(0.0), 0.25f);
        EXPECT_EQ(v.viewReal2.getValue(0.0), 4.0f);
        EXPECT_EQ(v.viewReal3.getValue(0.0), 5.0f);
        EXPECT_EQ(v.img_width, 800);
        EXPECT_EQ(v.img_height, 600);
        EXPECT_EQ(v.viewState.getValue(0.0), flag ? 0 : 1) << int(flag);
        // The stored keys replace the identity key.
        EXPECT_EQ(v.cameraTransform.getKeyCount(), 2u);
        EXPECT_EQ(v.cameraTransform.getKeyTime(0), 1.0);
        EXPECT_EQ(v.cameraTransform.getValue(0.0), sampleTransform());
    }
}

TEST(RenderView, RefusedRecords) {
    std::vector<std::uint8_t> good = savedBytes(RenderView());
    const std::vector<std::uint8_t> tail(good.begin() + 4, good.end());
    struct Case {
        const char* what;
        RecordBytes bytes;
    };
    std::vector<Case> cases = {
        {"version 4", RecordBytes().u32(0x40000).append(tail)},
        {"version 0", RecordBytes().u32(0).append(tail)},
        {"low half set", RecordBytes().u32(0x30001).append(tail)},
        {"no data", RecordBytes()},
        // Version 3 whose viewAngle record has version 2.
        {"bad member", RecordBytes().u32(0x30000).rect(0, 0, 1, 1).rect(0, 0, 1, 1).i32(1).i32(1)
                           .u32(0x20000).u32(0).u32(8).u8(1)},
        // Version 2 whose transform record announces 0xFFFFFFFF keys.
        {"huge transform count", RecordBytes().u32(0x20000).rect(0, 0, 1, 1).rect(0, 0, 1, 1)
                                     .f32(1).f32(1).f32(1).i32(1).i32(1).u8(1)
                                     .u32(0x10000).u32(0xFFFFFFFFu).u32(8)},
    };
    for (Case& c : cases) {
        QuickArchive ar = c.bytes.archive();
        RenderView v;
        EXPECT_FALSE(v.load(ar)) << c.what;
    }
}

TEST(RenderView, WritesItsImageSize) {
    RenderView v;
    v.img_width = 640;
    v.img_height = -1;
    std::u16string out;
    AssetXmlWriter writer(out);
    v.writeXml(writer, u"/a&b");
    const std::u16string expected =
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
        u"  </Asset>\n";
    EXPECT_EQ(out, expected);
    EXPECT_EQ(writer.getIndent(), 0);
}
