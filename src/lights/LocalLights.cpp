#include "lights/LocalLights.h"

#include "persistence/QuickArchive.h"

namespace OrvaneLumoCore {

namespace {

// ---- records: the fields in record order, with the versions that hold them,
// the XML parameters that show them and their places among the parameters ----

typedef MayaDirectLight Dir;
// Behind these fields stands the transform: a plain transform in version 2,
// the AnimatedTransform record from version 3 on.
const RecordRow<Dir> kDirectRecord[] = {
    {&Dir::color, "color", 1},
    {&Dir::shadowColor, 4, "shadowColor", 2},
    {&Dir::shadowBias, "shadowBias", 3},
    {&Dir::intensity, "intensity", 5},
    {&Dir::storedFactor},
    {&Dir::causticSubdivs, "causticSubdivs", 6},
    {&Dir::photonSubdivs, "photonSubdivs", 7},
    {&Dir::storedMode},
    {&Dir::enabled, "enabled", 9},
    {&Dir::shadows, 2, "shadows", 10},
    {&Dir::shadowSubdivs, 2, "shadowSubdivs", 8},
    {&Dir::shadowRadius, 2, "shadowRadius", 4},
};

const RecordRow<OmniLight> kOmniRecord[] = {
    {&OmniLight::color, "color", 1},
    {&OmniLight::shadowColor, 3, "shadowColor", 2},
    {&OmniLight::cutoffThreshold, 3, "cutoffThreshold", 3},
    {&OmniLight::shadowBias, "shadowBias", 4},
    {&OmniLight::decay, "decay", 5},
    {&OmniLight::intensity, "intensity", 6},
    {&OmniLight::storedFactor},
    {&OmniLight::units, 3, "units", 8},
    {&OmniLight::photonSubdivs, "photonSubdivs", 9},
    {&OmniLight::causticSubdivs, "causticSubdivs", 10},
    {&OmniLight::storedMode},
    {&OmniLight::enabled, "enabled", 12},
    {&OmniLight::shadows, 2, "shadows", 13},
    {&OmniLight::shadowSubdivs, 2, "shadowSubdivs", 11},
    {&OmniLight::shadowRadius, 2, "shadowRadius", 7},
    {&OmniLight::transform, 2, "transform", 16},
    {&OmniLight::affectDiffuse, 4, "affectDiffuse", 14},
    {&OmniLight::affectSpecular, 4, "affectSpecular", 15},
};

const RecordRow<SpotLight> kSpotRecord[] = {
    {&SpotLight::color, "color", 1},
    {&SpotLight::shadowColor, 3, "shadowColor", 2},
    {&SpotLight::cutoffThreshold, 3, "cutoffThreshold", 3},
    {&SpotLight::barnDoorLeft, 3, "barnDoorLeft", 4},
    {&SpotLight::barnDoorRight, 3, "barnDoorRight", 5},
    {&SpotLight::barnDoorTop, 3, "barnDoorTop", 6},
    {&SpotLight::barnDoorBottom, 3, "barnDoorBottom", 7},
    {&SpotLight::shadowBias, "shadowBias", 8},
    {&SpotLight::decay, "decay", 9},
    {&SpotLight::intensity, "intensity", 10},
    {&SpotLight::storedFactor},
    {&SpotLight::units, 3, "units", 14},
    {&SpotLight::photonSubdivs, "photonSubdivs", 15},
    {&SpotLight::causticSubdivs, "causticSubdivs", 16},
    {&SpotLight::storedMode},
    {&SpotLight::enabled, "enabled", 18},
    {&SpotLight::barnDoor, 3, "barnDoor", 19},
    {&SpotLight::shadows, 2, "shadows", 20},
    {&SpotLight::shadowSubdivs, 2, "shadowSubdivs", 17},
    {&SpotLight::shadowRadius, 2, "shadowRadius", 11},
    {&SpotLight::transform, 2, "transform", 23},
    {&SpotLight::coneAngle, 2, "coneAngle", 12},
    {&SpotLight::penumbraAngle, 2, "penumbraAngle", 13},
    {&SpotLight::affectDiffuse, 4, "affectDiffuse", 21},
    {&SpotLight::affectSpecular, 4, "affectSpecular", 22},
};

typedef RectangleLight RectLight;
const RecordRow<RectLight> kRectangleRecord[] = {
    {&RectLight::color, "color", 1},
    {&RectLight::shadowColor, 3, "shadowColor", 2},
    {&RectLight::cutoffThreshold, 3, "cutoffThreshold", 3},
    {&RectLight::shadowBias, "shadowBias", 4},
    {&RectLight::intensity, "intensity", 5},
    {&RectLight::storedFactor},
    {&RectLight::units, 3, "units", 8},
    {&RectLight::subdivs, "subdivs", 11},
    {&RectLight::causticSubdivs, "causticSubdivs", 10},
    {&RectLight::photonSubdivs, "photonSubdivs", 9},
    {&RectLight::storedMode},
    {&RectLight::doubleSided, "doubleSided", 13},
    {&RectLight::invisible, "invisible", 14},
    {&RectLight::lightPortal, "lightPortal", 15},
    {&RectLight::noDecay, "noDecay", 16},
    {&RectLight::enabled, "enabled", 12},
    {&RectLight::storeWithIrradianceMap, "storeWithIrradianceMap", 17},
    {&RectLight::ignoreLightNormals, "ignoreLightNormals", 18},
    {&RectLight::shadows, 2, "shadows", 19},
    {&RectLight::transform, 2, "transform", 23},
    {&RectLight::u_size, 2, "u_size", 6},
    {&RectLight::v_size, 2, "v_size", 7},
    {&RectLight::affectDiffuse, 4, "affectDiffuse", 20},
    {&RectLight::affectSpecular, 4, "affectSpecular", 21},
    {&RectLight::affectReflections, 4, "affectReflections", 22},
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
