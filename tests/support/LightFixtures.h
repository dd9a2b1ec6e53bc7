#pragma once
// Records of the newest version of each light, laid by hand with a distinct
// value in every field, so that a field read into the wrong member or
// written under the wrong parameter shows in the golden documents.
#include "support/RecordBytes.h"

namespace lighttest {

using namespace testsupport;

// MayaDirectLight 4: color, shadowColor, shadowBias, intensity, storedFactor,
// causticSubdivs, photonSubdivs, storedMode, enabled, shadows,
// shadowSubdivs, shadowRadius, AnimatedTransform.
inline RecordBytes directV4() {
    return RecordBytes().version(4).floats({0.25f, 0.5f, 0.75f, 0.125f, 0.375f, 0.625f, 0.07f, 2, 3})
        .ints({1200, 700, 4}).flags({1, 0}).i32(10).f32(0.2f)
        .animated({{0.0, countingTransform(1)}, {1.0, countingTransform(20)}});
}

// OmniLight 4: color, shadowColor, cutoffThreshold, shadowBias, decay,
// intensity, storedFactor, units, photonSubdivs, causticSubdivs, storedMode,
// enabled, shadows, shadowSubdivs, shadowRadius, transform, affectDiffuse,
// affectSpecular.
inline RecordBytes omniV4() {
    return RecordBytes().version(4).floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 0.01f, 0.02f, 2, 31, 1.5f})
        .ints({1, 501, 1001, 2}).flags({0, 0}).i32(9).f32(0.03f).transform(countingTransform(1)).flags({0, 1});
}

// SpotLight 4: color, shadowColor, cutoffThreshold, barn doors (left, right,
// top, bottom), shadowBias, decay, intensity, storedFactor, units,
// photonSubdivs, causticSubdivs, storedMode, enabled, barnDoor, shadows,
// shadowSubdivs, shadowRadius, transform, coneAngle, penumbraAngle,
// affectDiffuse, affectSpecular.
inline RecordBytes spotV4() {
    return RecordBytes().version(4).floats({0.9f, 0.8f, 0.7f, 0.1f, 0, 0.2f, 0.002f, 21, 22, 23, 24, 0.05f, 1, 55, 2})
        .ints({3, 400, 900, 1}).flags({1, 1, 0}).i32(16).f32(0.5f).transform(countingTransform(-6))
        .floats({0.75f, 0.125f}).flags({1, 0});
}

// RectangleLight 4: color, shadowColor, cutoffThreshold, shadowBias,
// intensity, storedFactor, units, subdivs, causticSubdivs, photonSubdivs,
// storedMode, doubleSided, invisible, lightPortal, noDecay, enabled,
// storeWithIrradianceMap, ignoreLightNormals, shadows, transform, u_size,
// v_size, affectDiffuse, affectSpecular, affectReflections.
inline RecordBytes rectangleV4() {
    return RecordBytes().version(4).floats({1, 0.5f, 0, 0, 0.5f, 1, 0.004f, 0.06f, 33, 0.5f}).ints({2, 12, 1100, 600, 0})
        .flags({1, 1, 0, 1, 1, 1, 0, 1}).transform(countingTransform(0.5f)).floats({2.5f, 3.5f}).flags({0, 1, 0});
}

// IESLight 3: transform, color, shadowColor, filter_color, shadowBias,
// cutoffThreshold, photonSubdivs, causticSubdivs, shadow_subdivs, enabled,
// shadows, soft_shadows, ies_file, affectDiffuse, affectSpecular, intensity.
inline RecordBytes iesV3() {
    return RecordBytes().version(3).transform(countingTransform(100))
        .floats({0.5f, 0.25f, 0.125f, 0.2f, 0.3f, 0.4f, 0.6f, 0.7f, 0.8f, 0.08f, 0.003f}).ints({9, 1300, 7})
        .flags({1, 0, 1}).wstr("C:\\lights\\a&b<1>.ies").flags({0, 1}).f32(4.5f);
}

// SunLight 4: up_vector, shadowBias, turbidity, water_vapour,
// intensity_multiplier, size_multiplier, photon_radius, photon_emit_distance,
// ozone, photonSubdivs, causticSubdivs, shadow_subdivs, shadows, id, name,
// enabled, invisible, AnimatedTransform.
inline RecordBytes sunV4(const std::string& id = "sun-1") {
    return RecordBytes().version(4).floats({0, 1, 0, 0.01f, 4, 2.5f, 0.5f, 2, 40, 140, 0.3f}).ints({510, 1010, 6})
        .u8(0).wstr(id).wstr("Noon").flags({1, 1})
        .animated({{0.0, countingTransform(2)}, {10.0, countingTransform(50)}});
}

}  // namespace lighttest
