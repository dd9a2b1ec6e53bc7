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

// The record, version 2, with the defaults, and the parameters that show the
// fields with their places (in the options document). A bool is stored as a
// bool32.
const RecordRow<C> kPhysicalCameraRows[] = {
    CR::i32(&C::type, 0, 1).shownAs("type", 2),
    CR::f32(&C::film_width, 36, 1).shownAs("film_width", 3),
    CR::hook(kFocalLength, 1, {}, 40).shownAs("focal_length", 4),
    CR::f32(&C::zoom_factor, 1, 1).shownAs("zoom_factor", 5),
    CR::f32(&C::distortion, 0, 1).shownAs("distortion", 6),
    CR::f32(&C::f_number, 8, 1).shownAs("f_number", 7),
    CR::f32(&C::lens_shift, 0, 1).shownAs("lens_shift", 8),
    CR::f32(&C::shutter_speed, 30, 1).shownAs("shutter_speed", 9),
    CR::f32(&C::shutter_angle, 180, 1).shownAs("shutter_angle", 10),
    CR::f32(&C::shutter_offset, 0, 1).shownAs("shutter_offset", 11),
    CR::f32(&C::latency, 0, 1).shownAs("latency", 12),
    CR::f32(&C::ISO, 200, 1).shownAs("ISO", 13),
    CR::b32(&C::specify_focus, false, 1).shownAs("specify_focus", 14),
    CR::hook(kFocusDistance, 1, {}, 200).shownAs("focus_distance", 15),
    CR::b32(&C::targeted, false, 1).shownAs("targeted", 16),
    CR::f32(&C::target_distance, 200, 1).shownAs("target_distance", 17),
    CR::f32(&C::dof_display_threshold, 0, 1).shownAs("dof_display_threshold", 18),
    CR::b32(&C::exposure, true, 1).shownAs("exposure", 19),
    CR::color(&C::white_balance, Color(1, 1, 1), 1).shownAs("white_balance", 20),
    CR::b32(&C::vignetting, true, 1).shownAs("vignetting", 21),
    CR::b32(&C::blades_enable, false, 1).shownAs("blades_enable", 22),
    CR::i32(&C::blades_num, 5, 1).shownAs("blades_num", 23),
    CR::f32(&C::blades_rotation, 0, 1).shownAs("blades_rotation", 24),
    CR::f32(&C::center_bias, 0, 1).shownAs("center_bias", 25),
    CR::f32(&C::anisotropy, 0, 1).shownAs("anisotropy", 26),
    CR::b32(&C::use_dof, false, 1).shownAs("use_dof", 27),
    CR::b32(&C::use_moblur, false, 1).shownAs("use_moblur", 28),
    CR::i32(&C::subdivs, 6, 1).shownAs("subdivs", 29),
};

}  // namespace

// ---- PhysicalCamera ------------------------------------------------------------

PhysicalCamera::PhysicalCamera() : focal_length(true), focus_distance(true) { reset(); }

RowSpan<RecordRow<C>> PhysicalCamera::record() { return rowSpan(kPhysicalCameraRows); }

const AnimatedReal& PhysicalCamera::animated(const RecordRow<C>& row) const { return this->*animatedField(row); }

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
    // Written by hand: the versions hold the fields in other orders and forms.
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
