#include "animation/Camera.h"

#include <boost/make_shared.hpp>

#include "persistence/FieldRows.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "xml/AssetScope.h"

namespace OrvaneLumoCore {

namespace {

typedef PhysicalCamera C;
typedef RowsOf<C> CR;

// The two animated rows: each holds its default as its key at time 0.
enum AnimatedRow { kFocalLength, kFocusDistance };

AnimatedReal C::*animatedField(const RecordRow<C>& row) {
    return row.hook == kFocalLength ? &C::focal_length : &C::focus_distance;
}

// An f32 of an old record that sets the key at time 0.
void readKeyAtZero(QuickArchive& ar, AnimatedReal& value) {
    float atZero = value.getValue(0.0);
    ar.readFloat(atZero);
    value.setValue(atZero, 0.0);
}

// The record, version 2, with the defaults. A bool is stored as a bool32.
const RecordRow<C> kPhysicalCameraRows[] = {
    CR::i32(&C::type, 0, 1),
    CR::f32(&C::film_width, 36, 1),
    CR::hook(kFocalLength, 1, {}, 40),
    CR::f32(&C::zoom_factor, 1, 1),
    CR::f32(&C::distortion, 0, 1),
    CR::f32(&C::f_number, 8, 1),
    CR::f32(&C::lens_shift, 0, 1),
    CR::f32(&C::shutter_speed, 30, 1),
    CR::f32(&C::shutter_angle, 180, 1),
    CR::f32(&C::shutter_offset, 0, 1),
    CR::f32(&C::latency, 0, 1),
    CR::f32(&C::ISO, 200, 1),
    CR::b32(&C::specify_focus, false, 1),
    CR::hook(kFocusDistance, 1, {}, 200),
    CR::b32(&C::targeted, false, 1),
    CR::f32(&C::target_distance, 200, 1),
    CR::f32(&C::dof_display_threshold, 0, 1),
    CR::b32(&C::exposure, true, 1),
    CR::color(&C::white_balance, Color(1, 1, 1), 1),
    CR::b32(&C::vignetting, true, 1),
    CR::b32(&C::blades_enable, false, 1),
    CR::i32(&C::blades_num, 5, 1),
    CR::f32(&C::blades_rotation, 0, 1),
    CR::f32(&C::center_bias, 0, 1),
    CR::f32(&C::anisotropy, 0, 1),
    CR::b32(&C::use_dof, false, 1),
    CR::b32(&C::use_moblur, false, 1),
    CR::i32(&C::subdivs, 6, 1),
};

}  // namespace

// ---- PhysicalCamera ------------------------------------------------------------

PhysicalCamera::PhysicalCamera() : focal_length(true), focus_distance(true) { reset(); }

boost::shared_ptr<BaseCamera> PhysicalCamera::clone() const {
    return boost::make_shared<PhysicalCamera>(*this);
}

void PhysicalCamera::reset() {
    resetFields(*this, kPhysicalCameraRows);
    for (const RecordRow<C>& row : kPhysicalCameraRows) {
        if (row.use != RowUse::Hook) continue;
        AnimatedReal& value = this->*animatedField(row);
        value.reset();
        value.setValue(static_cast<float>(row.number), 0.0);
    }
}

bool PhysicalCamera::save(QuickArchive& ar) const {
    writeVersion(ar, 2);
    return writeFields(ar, *this, kPhysicalCameraRows, 2,
                       [&](const RecordRow<C>& row) { return (this->*animatedField(row)).save(ar); });
}

// Version 1 holds the two animated rows as one f32 each, the key at time 0;
// version 2 holds their records.
bool PhysicalCamera::load(QuickArchive& ar) {
    reset();
    const int version = readVersion(ar, 1, 2);
    if (version < 0) return false;
    return readFields(ar, *this, kPhysicalCameraRows, version, [&](const RecordRow<C>& row) {
        AnimatedReal& value = this->*animatedField(row);
        if (version >= 2) return loadNested(ar, value);
        readKeyAtZero(ar, value);
        return true;
    });
}

bool PhysicalCamera::operator==(const PhysicalCamera& o) const {
    return fieldsEqual(*this, o, kPhysicalCameraRows) && focal_length == o.focal_length &&
           focus_distance == o.focus_distance;
}

// ---- RenderView ----------------------------------------------------------------

namespace {

const Rect kNoRect = [] {
    Rect r;
    r.x0 = r.y0 = r.x1 = r.y1 = -1;
    r.width = r.height = 0;
    return r;
}();

// Versions 1 and 2 keep the view state as a bool8 flag: false is state 1.
void readStateFlag(QuickArchive& ar, AnimatedInt& state) {
    bool flag = state.getValue(0.0) == 0;
    ar.readByte(flag);
    state.setValue(flag ? 0 : 1, 0.0);
}

}  // namespace

RenderView::RenderView() : viewAngle(true), viewReal2(true), viewReal3(true), viewState(false) {
    reset();
}

// Only the camera transform loses its other keys; the animated values get
// their defaults at time 0 and keep any further keys.
void RenderView::reset() {
    cameraTransform.reset();
    viewRect1 = kNoRect;
    viewRect2 = kNoRect;
    viewAngle.setValue(0.7853982f, 0.0);
    viewReal2.setValue(1.0f, 0.0);
    viewReal3.setValue(1.0f, 0.0);
    img_width = 320;
    img_height = 240;
    viewState.setValue(0, 0.0);
}

bool RenderView::save(QuickArchive& ar) const {
    writeVersion(ar, 3);
    ar.writeRect(viewRect1);
    ar.writeRect(viewRect2);
    ar.writeInt(img_width);
    ar.writeInt(img_height);
    return viewAngle.save(ar) && viewReal2.save(ar) && viewReal3.save(ar) && viewState.save(ar) &&
           cameraTransform.save(ar);
}

bool RenderView::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, 3);
    reset();
    if (version < 0) return false;
    if (version == 3) {
        ar.readRect(viewRect1);
        ar.readRect(viewRect2);
        ar.readInt(img_width);
        ar.readInt(img_height);
        return loadNested(ar, viewAngle) && loadNested(ar, viewReal2) && loadNested(ar, viewReal3) &&
               loadNested(ar, viewState) && loadNested(ar, cameraTransform);
    }
    // Versions 1 and 2: both rectangles, the three reals as f32 keys at time
    // 0, the image size and the state flag. The transform comes first in
    // version 1, as a key at time 0, and last in version 2, as its record.
    if (version == 1) {
        Transform t = cameraTransform.getValue(0.0);
        ar.readTransform(t);
        cameraTransform.setValue(t, 0.0);
    }
    ar.readRect(viewRect1);
    ar.readRect(viewRect2);
    readKeyAtZero(ar, viewAngle);
    readKeyAtZero(ar, viewReal2);
    readKeyAtZero(ar, viewReal3);
    ar.readInt(img_width);
    ar.readInt(img_height);
    readStateFlag(ar, viewState);
    return version == 1 || loadNested(ar, cameraTransform);
}

void RenderView::writeXml(AssetXmlWriter& writer, std::u16string url) {
    const std::u16string assetUrl = url + u"/" + getPluginName();
    writeAsset(writer, assetUrl, "settings", getPluginName(), [&] {
        writer.writeInteger("img_width", img_width);
        writer.writeInteger("img_height", img_height);
    });
}

bool RenderView::operator==(const RenderView& o) const {
    return cameraTransform == o.cameraTransform && viewRect1 == o.viewRect1 &&
           viewRect2 == o.viewRect2 && viewAngle == o.viewAngle && viewReal2 == o.viewReal2 &&
           viewReal3 == o.viewReal3 && img_width == o.img_width && img_height == o.img_height &&
           viewState == o.viewState;
}

}  // namespace OrvaneLumoCore
