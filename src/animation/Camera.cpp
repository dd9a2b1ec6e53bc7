#include "animation/Camera.h"

#include <boost/make_shared.hpp>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "xml/AssetScope.h"

namespace OrvaneLumoCore {

namespace {

template <class... F>
struct Overload : F... {
    using F::operator()...;
};
template <class... F>
Overload(F...) -> Overload<F...>;

typedef PhysicalCamera C;

}  // namespace

const std::array<CameraRow, 28> kPhysicalCameraRows = {{
    {"type",                  &C::type,                  0},
    {"film_width",            &C::film_width,            36},
    {"focal_length",          &C::focal_length,          40},
    {"zoom_factor",           &C::zoom_factor,           1},
    {"distortion",            &C::distortion,            0},
    {"f_number",              &C::f_number,              8},
    {"lens_shift",            &C::lens_shift,            0},
    {"shutter_speed",         &C::shutter_speed,         30},
    {"shutter_angle",         &C::shutter_angle,         180},
    {"shutter_offset",        &C::shutter_offset,        0},
    {"latency",               &C::latency,               0},
    {"ISO",                   &C::ISO,                   200},
    {"specify_focus",         &C::specify_focus,         0},
    {"focus_distance",        &C::focus_distance,        200},
    {"targeted",              &C::targeted,              0},
    {"target_distance",       &C::target_distance,       200},
    {"dof_display_threshold", &C::dof_display_threshold, 0},
    {"exposure",              &C::exposure,              1},
    {"white_balance",         &C::white_balance,         1},
    {"vignetting",            &C::vignetting,            1},
    {"blades_enable",         &C::blades_enable,         0},
    {"blades_num",            &C::blades_num,            5},
    {"blades_rotation",       &C::blades_rotation,       0},
    {"center_bias",           &C::center_bias,           0},
    {"anisotropy",            &C::anisotropy,            0},
    {"use_dof",               &C::use_dof,               0},
    {"use_moblur",            &C::use_moblur,            0},
    {"subdivs",               &C::subdivs,               6},
}};

// ---- PhysicalCamera ------------------------------------------------------------

PhysicalCamera::PhysicalCamera() : focal_length(true), focus_distance(true) { reset(); }

boost::shared_ptr<BaseCamera> PhysicalCamera::clone() const {
    return boost::make_shared<PhysicalCamera>(*this);
}

void PhysicalCamera::reset() {
    for (const CameraRow& row : kPhysicalCameraRows) {
        const float d = row.byDefault;
        std::visit(Overload{
                       [&](std::int32_t C::*f) { this->*f = static_cast<std::int32_t>(d); },
                       [&](float C::*f) { this->*f = d; },
                       [&](bool C::*f) { this->*f = d != 0; },
                       [&](Color C::*f) { this->*f = Color(d, d, d); },
                       [&](AnimatedReal C::*f) {
                           (this->*f).reset();
                           (this->*f).setValue(d, 0.0);
                       },
                   },
                   row.field);
    }
}

bool PhysicalCamera::save(QuickArchive& ar) const {
    writeVersion(ar, 2);
    bool ok = true;
    for (const CameraRow& row : kPhysicalCameraRows) {
        std::visit(Overload{
                       [&](std::int32_t C::*f) { ar.writeInt(this->*f); },
                       [&](float C::*f) { ar.writeFloat(this->*f); },
                       [&](bool C::*f) { ar.writeInt(this->*f ? 1 : 0); },
                       [&](Color C::*f) { ar.writeColor(this->*f); },
                       [&](AnimatedReal C::*f) { ok = ok && (this->*f).save(ar); },
                   },
                   row.field);
        if (!ok) return false;
    }
    return true;
}

// Version 1 holds the two animated rows as one f32 each, the key at time 0;
// version 2 holds their records.
bool PhysicalCamera::load(QuickArchive& ar) {
    reset();
    const int version = readVersion(ar, 1, 2);
    if (version < 0) return false;
    bool ok = true;
    for (const CameraRow& row : kPhysicalCameraRows) {
        std::visit(Overload{
                       [&](std::int32_t C::*f) { ar.readInt(this->*f); },
                       [&](float C::*f) { ar.readFloat(this->*f); },
                       [&](bool C::*f) {
                           std::int32_t flag = (this->*f) ? 1 : 0;
                           ar.readInt(flag);
                           this->*f = flag != 0;
                       },
                       [&](Color C::*f) { ar.readColor(this->*f); },
                       [&](AnimatedReal C::*f) {
                           AnimatedReal& value = this->*f;
                           if (version >= 2) {
                               ok = loadNested(ar, value);
                               return;
                           }
                           float atZero = value.getValue(0.0);
                           ar.readFloat(atZero);
                           value.setValue(atZero, 0.0);
                       },
                   },
                   row.field);
        if (!ok) return false;
    }
    return true;
}

bool PhysicalCamera::operator==(const PhysicalCamera& o) const {
    bool same = true;
    for (const CameraRow& row : kPhysicalCameraRows) {
        std::visit([&](auto C::*f) { same = same && this->*f == o.*f; }, row.field);
    }
    return same;
}

// ---- RenderView ----------------------------------------------------------------

namespace {

const Rect kNoRect = [] {
    Rect r;
    r.x0 = r.y0 = r.x1 = r.y1 = -1;
    r.width = r.height = 0;
    return r;
}();

// An f32 of an old record that sets the key at time 0.
void readKeyAtZero(QuickArchive& ar, AnimatedReal& value) {
    float atZero = value.getValue(0.0);
    ar.readFloat(atZero);
    value.setValue(atZero, 0.0);
}

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
    if (version == 1) {
        // Version 1: transform (key at time 0), both rectangles, the three
        // reals as f32 keys at time 0, the image size and the state flag.
        Transform t = cameraTransform.getValue(0.0);
        ar.readTransform(t);
        cameraTransform.setValue(t, 0.0);
        ar.readRect(viewRect1);
        ar.readRect(viewRect2);
        readKeyAtZero(ar, viewAngle);
        readKeyAtZero(ar, viewReal2);
        readKeyAtZero(ar, viewReal3);
        ar.readInt(img_width);
        ar.readInt(img_height);
        readStateFlag(ar, viewState);
        return true;
    }
    ar.readRect(viewRect1);
    ar.readRect(viewRect2);
    if (version == 2) {
        // Version 2: the reals as f32 keys, the image size, the state flag,
        // then the transform's record.
        readKeyAtZero(ar, viewAngle);
        readKeyAtZero(ar, viewReal2);
        readKeyAtZero(ar, viewReal3);
        ar.readInt(img_width);
        ar.readInt(img_height);
        readStateFlag(ar, viewState);
        return loadNested(ar, cameraTransform);
    }
    ar.readInt(img_width);
    ar.readInt(img_height);
    return loadNested(ar, viewAngle) && loadNested(ar, viewReal2) && loadNested(ar, viewReal3) &&
           loadNested(ar, viewState) && loadNested(ar, cameraTransform);
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
