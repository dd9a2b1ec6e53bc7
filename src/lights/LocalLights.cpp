#include "lights/LocalLights.h"

#include "persistence/QuickArchive.h"

namespace OrvaneLumoCore {

namespace {

// ---- records: the fields in record order, with the versions that hold them,
// the XML parameters that show them, their places among the parameters and
// their defaults ----

typedef MayaDirectLight Dir;
typedef RecordRow<Dir> DirRow;
// Behind these fields stands the transform: a plain transform in version 2,
// the AnimatedTransform record from version 3 on.
const DirRow kDirectRecord[] = {
    DirRow(&Dir::color, "color", 1).byDefault(kWhite),
    {&Dir::shadowColor, 4, "shadowColor", 2},
    {&Dir::shadowBias, "shadowBias", 3},
    DirRow(&Dir::intensity, "intensity", 5).byDefault(1),
    DirRow(&Dir::storedFactor).byDefault(1),
    DirRow(&Dir::causticSubdivs, "causticSubdivs", 6).byDefault(1000),
    DirRow(&Dir::photonSubdivs, "photonSubdivs", 7).byDefault(500),
    DirRow(&Dir::storedMode).byDefault(3),
    DirRow(&Dir::enabled, "enabled", 9).byDefault(true),
    DirRow(&Dir::shadows, 2, "shadows", 10).byDefault(true),
    DirRow(&Dir::shadowSubdivs, 2, "shadowSubdivs", 8).byDefault(8),
    {&Dir::shadowRadius, 2, "shadowRadius", 4},
};

typedef OmniLight Omni;
typedef RecordRow<Omni> OmniRow;
const OmniRow kOmniRecord[] = {
    OmniRow(&Omni::color, "color", 1).byDefault(kWhite),
    {&Omni::shadowColor, 3, "shadowColor", 2},
    OmniRow(&Omni::cutoffThreshold, 3, "cutoffThreshold", 3).byDefault(0.005),
    {&Omni::shadowBias, "shadowBias", 4},
    {&Omni::decay, "decay", 5},
    OmniRow(&Omni::intensity, "intensity", 6).byDefault(30),
    OmniRow(&Omni::storedFactor).byDefault(1),
    {&Omni::units, 3, "units", 8},
    OmniRow(&Omni::photonSubdivs, "photonSubdivs", 9).byDefault(500),
    OmniRow(&Omni::causticSubdivs, "causticSubdivs", 10).byDefault(1000),
    OmniRow(&Omni::storedMode).byDefault(3),
    OmniRow(&Omni::enabled, "enabled", 12).byDefault(true),
    OmniRow(&Omni::shadows, 2, "shadows", 13).byDefault(true),
    OmniRow(&Omni::shadowSubdivs, 2, "shadowSubdivs", 11).byDefault(8),
    {&Omni::shadowRadius, 2, "shadowRadius", 7},
    {&Omni::transform, 2, "transform", 16},
    OmniRow(&Omni::affectDiffuse, 4, "affectDiffuse", 14).byDefault(true),
    OmniRow(&Omni::affectSpecular, 4, "affectSpecular", 15).byDefault(true),
};

typedef SpotLight Spot;
typedef RecordRow<Spot> SpotRow;
const SpotRow kSpotRecord[] = {
    SpotRow(&Spot::color, "color", 1).byDefault(kWhite),
    {&Spot::shadowColor, 3, "shadowColor", 2},
    SpotRow(&Spot::cutoffThreshold, 3, "cutoffThreshold", 3).byDefault(0.005),
    SpotRow(&Spot::barnDoorLeft, 3, "barnDoorLeft", 4).byDefault(20),
    SpotRow(&Spot::barnDoorRight, 3, "barnDoorRight", 5).byDefault(20),
    SpotRow(&Spot::barnDoorTop, 3, "barnDoorTop", 6).byDefault(20),
    SpotRow(&Spot::barnDoorBottom, 3, "barnDoorBottom", 7).byDefault(20),
    {&Spot::shadowBias, "shadowBias", 8},
    {&Spot::decay, "decay", 9},
    SpotRow(&Spot::intensity, "intensity", 10).byDefault(50),
    SpotRow(&Spot::storedFactor).byDefault(1),
    {&Spot::units, 3, "units", 14},
    SpotRow(&Spot::photonSubdivs, "photonSubdivs", 15).byDefault(500),
    SpotRow(&Spot::causticSubdivs, "causticSubdivs", 16).byDefault(1000),
    SpotRow(&Spot::storedMode).byDefault(3),
    SpotRow(&Spot::enabled, "enabled", 18).byDefault(true),
    {&Spot::barnDoor, 3, "barnDoor", 19},
    SpotRow(&Spot::shadows, 2, "shadows", 20).byDefault(true),
    SpotRow(&Spot::shadowSubdivs, 2, "shadowSubdivs", 17).byDefault(8),
    {&Spot::shadowRadius, 2, "shadowRadius", 11},
    {&Spot::transform, 2, "transform", 23},
    SpotRow(&Spot::coneAngle, 2, "coneAngle", 12).byDefault(1),
    {&Spot::penumbraAngle, 2, "penumbraAngle", 13},
    SpotRow(&Spot::affectDiffuse, 4, "affectDiffuse", 21).byDefault(true),
    SpotRow(&Spot::affectSpecular, 4, "affectSpecular", 22).byDefault(true),
};

typedef RectangleLight Rect;
typedef RecordRow<Rect> RectRow;
const RectRow kRectangleRecord[] = {
    RectRow(&Rect::color, "color", 1).byDefault(kWhite),
    {&Rect::shadowColor, 3, "shadowColor", 2},
    RectRow(&Rect::cutoffThreshold, 3, "cutoffThreshold", 3).byDefault(0.005),
    {&Rect::shadowBias, "shadowBias", 4},
    RectRow(&Rect::intensity, "intensity", 5).byDefault(30),
    RectRow(&Rect::storedFactor).byDefault(1),
    {&Rect::units, 3, "units", 8},
    RectRow(&Rect::subdivs, "subdivs", 11).byDefault(8),
    RectRow(&Rect::causticSubdivs, "causticSubdivs", 10).byDefault(1000),
    RectRow(&Rect::photonSubdivs, "photonSubdivs", 9).byDefault(500),
    RectRow(&Rect::storedMode).byDefault(3),
    {&Rect::doubleSided, "doubleSided", 13},
    {&Rect::invisible, "invisible", 14},
    {&Rect::lightPortal, "lightPortal", 15},
    {&Rect::noDecay, "noDecay", 16},
    RectRow(&Rect::enabled, "enabled", 12).byDefault(true),
    {&Rect::storeWithIrradianceMap, "storeWithIrradianceMap", 17},
    RectRow(&Rect::ignoreLightNormals, "ignoreLightNormals", 18).byDefault(true),
    RectRow(&Rect::shadows, 2, "shadows", 19).byDefault(true),
    {&Rect::transform, 2, "transform", 23},
    RectRow(&Rect::u_size, 2, "u_size", 6).byDefault(1),
    RectRow(&Rect::v_size, 2, "v_size", 7).byDefault(1),
    RectRow(&Rect::affectDiffuse, 4, "affectDiffuse", 20).byDefault(true),
    RectRow(&Rect::affectSpecular, 4, "affectSpecular", 21).byDefault(true),
    RectRow(&Rect::affectReflections, 4, "affectReflections", 22).byDefault(true),
};

constexpr int kNewest = 4;

// The light's Asset under its own url: the owner's url, "/", the plugin name.
template <class L, class Rows>
void writeParamAsset(AssetXmlWriter& w, const std::u16string& url, const L& light, const Rows& rows) {
    writeLightAsset(w, url + u"/" + light.getPluginName(), light.getPluginName(),
                    [&] { writeShownFields(w, light, rows); });
}

}  // namespace

// ---- MayaDirectLight ----

MayaDirectLight::MayaDirectLight() { resetFields(*this, kDirectRecord); }

bool MayaDirectLight::save(QuickArchive& ar) const {
    saveFlatRecord(*this, ar, kDirectRecord, kNewest);
    return transform.save(ar);
}

bool MayaDirectLight::load(QuickArchive& ar) {
    const int v = loadFlatRecord(*this, ar, kDirectRecord, kNewest);
    if (v < 0) return false;
    if (v == 2) {
        Transform t;
        ar.readTransform(t);
        transform.setValue(t, 0.0);
    } else if (v >= 3) {
        return loadNested(ar, transform);
    }
    return true;
}

bool MayaDirectLight::sameContent(const MayaDirectLight& o) const {
    return fieldsEqual(*this, o, kDirectRecord) && transform == o.transform;
}

void MayaDirectLight::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeParamAsset(writer, url, *this, kDirectRecord);
}

// ---- OmniLight ----

RowSpan<RecordRow<OmniLight>> OmniLight::record() { return rowSpan(kOmniRecord); }


// ---- SpotLight ----

RowSpan<RecordRow<SpotLight>> SpotLight::record() { return rowSpan(kSpotRecord); }

void SpotLight::writeConstantParams(AssetXmlWriter& writer) const {
    writer.writeBool("legacyMode", true, "Legacy Mode", true);
}

// ---- RectangleLight ----

RowSpan<RecordRow<RectangleLight>> RectangleLight::record() { return rowSpan(kRectangleRecord); }


// ---- SphereLight ----
//
// Record: tag, transform, color, shadowColor, the four reals, the four ints,
// then the flags as bool8: five in version 1, all eight in version 2.
// Written by hand: the fields are three unnamed arrays, which no row holds.

bool SphereLight::save(QuickArchive& ar) const {
    writeVersion(ar, 2);
    ar.writeTransform(transform);
    ar.writeColor(color);
    ar.writeColor(shadowColor);
    for (float r : reals) ar.writeFloat(r);
    for (std::int32_t i : ints) ar.writeInt(i);
    for (bool f : flags) ar.writeByte(f);
    return true;
}

bool SphereLight::load(QuickArchive& ar) {
    const int v = resetAndReadVersion(*this, ar, 2);
    if (v < 0) return false;
    ar.readTransform(transform);
    ar.readColor(color);
    ar.readColor(shadowColor);
    for (float& r : reals) ar.readFloat(r);
    for (std::int32_t& i : ints) ar.readInt(i);
    const int flagCount = v == 1 ? kVersion1FlagCount : kFlagCount;
    for (int k = 0; k < flagCount; ++k) ar.readByte(flags[k]);
    return true;
}

bool SphereLight::sameContent(const SphereLight& o) const {
    if (transform != o.transform || color != o.color || shadowColor != o.shadowColor)
        return false;
    for (int k = 0; k < kRealCount; ++k)
        if (reals[k] != o.reals[k]) return false;
    for (int k = 0; k < kIntCount; ++k)
        if (ints[k] != o.ints[k]) return false;
    for (int k = 0; k < kFlagCount; ++k)
        if (flags[k] != o.flags[k]) return false;
    return true;
}

}  // namespace OrvaneLumoCore
