#pragma once
// Records of the newest version of each light, laid by hand with a distinct
// value in every field, so that a field read into the wrong member or
// written under the wrong parameter shows in the golden documents.
#include "TestSupport.h"

namespace lighttest {

// MayaDirectLight version 4: color, shadowColor, shadowBias, intensity,
// storedFactor, causticSubdivs, photonSubdivs, storedMode, enabled, shadows,
// shadowSubdivs, shadowRadius, AnimatedTransform.
inline RecordBytes directV4() {
    RecordBytes b;
    b.u32(0x40000);
    color(b, 0.25f, 0.5f, 0.75f);
    color(b, 0.125f, 0.375f, 0.625f);
    b.f32(0.07f).f32(2.0f).f32(3.0f);
    b.i32(1200).i32(700).i32(4);
    b.u8(1).u8(0);
    b.i32(10).f32(0.2f);
    return animatedTransform(b, {{0.0, countingTransform(1)}, {1.0, countingTransform(20)}});
}

// OmniLight version 4: color, shadowColor, cutoffThreshold, shadowBias,
// decay, intensity, storedFactor, units, photonSubdivs, causticSubdivs,
// storedMode, enabled, shadows, shadowSubdivs, shadowRadius, transform,
// affectDiffuse, affectSpecular.
inline RecordBytes omniV4() {
    RecordBytes b;
    b.u32(0x40000);
    color(b, 0.1f, 0.2f, 0.3f);
    color(b, 0.4f, 0.5f, 0.6f);
    b.f32(0.01f).f32(0.02f).f32(2.0f).f32(31.0f).f32(1.5f);
    b.i32(1).i32(501).i32(1001).i32(2);
    b.u8(0).u8(0);
    b.i32(9).f32(0.03f);
    b.transform(countingTransform(1));
    return b.u8(0).u8(1);
}

// SpotLight version 4: color, shadowColor, cutoffThreshold, four barn doors
// (left, right, top, bottom), shadowBias, decay, intensity, storedFactor,
// units, photonSubdivs, causticSubdivs, storedMode, enabled, barnDoor,
// shadows, shadowSubdivs, shadowRadius, transform, coneAngle, penumbraAngle,
// affectDiffuse, affectSpecular.
inline RecordBytes spotV4() {
    RecordBytes b;
    b.u32(0x40000);
    color(b, 0.9f, 0.8f, 0.7f);
    color(b, 0.1f, 0.0f, 0.2f);
    b.f32(0.002f);
    b.f32(21.0f).f32(22.0f).f32(23.0f).f32(24.0f);
    b.f32(0.05f).f32(1.0f).f32(55.0f).f32(2.0f);
    b.i32(3).i32(400).i32(900).i32(1);
    b.u8(1).u8(1).u8(0);
    b.i32(16).f32(0.5f);
    b.transform(countingTransform(-6));
    b.f32(0.75f).f32(0.125f);
    return b.u8(1).u8(0);
}

// RectangleLight version 4: color, shadowColor, cutoffThreshold,
// shadowBias, intensity, storedFactor, units, subdivs, causticSubdivs,
// photonSubdivs, storedMode, doubleSided, invisible, lightPortal, noDecay,
// enabled, storeWithIrradianceMap, ignoreLightNormals, shadows, transform,
// u_size, v_size, affectDiffuse, affectSpecular, affectReflections.
inline RecordBytes rectangleV4() {
    RecordBytes b;
    b.u32(0x40000);
    color(b, 1.0f, 0.5f, 0.0f);
    color(b, 0.0f, 0.5f, 1.0f);
    b.f32(0.004f).f32(0.06f).f32(33.0f).f32(0.5f);
    b.i32(2).i32(12).i32(1100).i32(600).i32(0);
    b.u8(1).u8(1).u8(0).u8(1).u8(1).u8(1).u8(0).u8(1);
    b.transform(countingTransform(0.5f));
    b.f32(2.5f).f32(3.5f);
    return b.u8(0).u8(1).u8(0);
}

// IESLight version 3: transform, color, shadowColor, filter_color,
// shadowBias, cutoffThreshold, photonSubdivs, causticSubdivs,
// shadow_subdivs, enabled, shadows, soft_shadows, ies_file, affectDiffuse,
// affectSpecular, intensity.
inline RecordBytes iesV3() {
    RecordBytes b;
    b.u32(0x30000);
    b.transform(countingTransform(100));
    color(b, 0.5f, 0.25f, 0.125f);
    color(b, 0.2f, 0.3f, 0.4f);
    color(b, 0.6f, 0.7f, 0.8f);
    b.f32(0.08f).f32(0.003f);
    b.i32(9).i32(1300).i32(7);
    b.u8(1).u8(0).u8(1);
    wstr(b, "C:\\lights\\a&b<1>.ies");
    b.u8(0).u8(1);
    return b.f32(4.5f);
}

// SunLight version 4: up_vector, shadowBias, turbidity, water_vapour,
// intensity_multiplier, size_multiplier, photon_radius,
// photon_emit_distance, ozone, photonSubdivs, causticSubdivs,
// shadow_subdivs, shadows, id, name, enabled, invisible, AnimatedTransform.
inline RecordBytes sunV4(const std::string& id = "sun-1") {
    RecordBytes b;
    b.u32(0x40000);
    b.vec(0.0f, 1.0f, 0.0f);
    b.f32(0.01f).f32(4.0f).f32(2.5f).f32(0.5f).f32(2.0f).f32(40.0f).f32(140.0f).f32(0.3f);
    b.i32(510).i32(1010).i32(6);
    b.u8(0);
    wstr(b, id);
    wstr(b, "Noon");
    b.u8(1).u8(1);
    return animatedTransform(b, {{0.0, countingTransform(2)}, {10.0, countingTransform(50)}});
}

}  // namespace lighttest
