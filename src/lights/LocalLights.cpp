#include "lights/LocalLights.h"

#include "persistence/QuickArchive.h"

namespace OrvaneLumoCore {

namespace {

// ---- records: the fields in record order, with the versions that hold them ----

typedef MayaDirectLight Dir;
// Behind these fields stands the transform: a plain transform in version 2,
// the AnimatedTransform record from version 3 on.
const RecordRow<Dir> kDirectRecord[] = {
    {&Dir::color},
    {&Dir::shadowColor, 4},
    {&Dir::shadowBias},
    {&Dir::intensity},
    {&Dir::storedFactor},
    {&Dir::causticSubdivs},
    {&Dir::photonSubdivs},
    {&Dir::storedMode},
    {&Dir::enabled},
    {&Dir::shadows, 2},
    {&Dir::shadowSubdivs, 2},
    {&Dir::shadowRadius, 2},
};

const RecordRow<OmniLight> kOmniRecord[] = {
    {&OmniLight::color},
    {&OmniLight::shadowColor, 3},
    {&OmniLight::cutoffThreshold, 3},
    {&OmniLight::shadowBias},
    {&OmniLight::decay},
    {&OmniLight::intensity},
    {&OmniLight::storedFactor},
    {&OmniLight::units, 3},
    {&OmniLight::photonSubdivs},
    {&OmniLight::causticSubdivs},
    {&OmniLight::storedMode},
    {&OmniLight::enabled},
    {&OmniLight::shadows, 2},
    {&OmniLight::shadowSubdivs, 2},
    {&OmniLight::shadowRadius, 2},
    {&OmniLight::transform, 2},
    {&OmniLight::affectDiffuse, 4},
    {&OmniLight::affectSpecular, 4},
};

const RecordRow<SpotLight> kSpotRecord[] = {
    {&SpotLight::color},
    {&SpotLight::shadowColor, 3},
    {&SpotLight::cutoffThreshold, 3},
    {&SpotLight::barnDoorLeft, 3},
    {&SpotLight::barnDoorRight, 3},
    {&SpotLight::barnDoorTop, 3},
    {&SpotLight::barnDoorBottom, 3},
    {&SpotLight::shadowBias},
    {&SpotLight::decay},
    {&SpotLight::intensity},
    {&SpotLight::storedFactor},
    {&SpotLight::units, 3},
    {&SpotLight::photonSubdivs},
    {&SpotLight::causticSubdivs},
    {&SpotLight::storedMode},
    {&SpotLight::enabled},
    {&SpotLight::barnDoor, 3},
    {&SpotLight::shadows, 2},
    {&SpotLight::shadowSubdivs, 2},
    {&SpotLight::shadowRadius, 2},
    {&SpotLight::transform, 2},
    {&SpotLight::coneAngle, 2},
    {&SpotLight::penumbraAngle, 2},
    {&SpotLight::affectDiffuse, 4},
    {&SpotLight::affectSpecular, 4},
};

typedef RectangleLight RectLight;
const RecordRow<RectLight> kRectangleRecord[] = {
    {&RectLight::color},
    {&RectLight::shadowColor, 3},
    {&RectLight::cutoffThreshold, 3},
    {&RectLight::shadowBias},
    {&RectLight::intensity},
    {&RectLight::storedFactor},
    {&RectLight::units, 3},
    {&RectLight::subdivs},
    {&RectLight::causticSubdivs},
    {&RectLight::photonSubdivs},
    {&RectLight::storedMode},
    {&RectLight::doubleSided},
    {&RectLight::invisible},
    {&RectLight::lightPortal},
    {&RectLight::noDecay},
    {&RectLight::enabled},
    {&RectLight::storeWithIrradianceMap},
    {&RectLight::ignoreLightNormals},
    {&RectLight::shadows, 2},
    {&RectLight::transform, 2},
    {&RectLight::u_size, 2},
    {&RectLight::v_size, 2},
    {&RectLight::affectDiffuse, 4},
    {&RectLight::affectSpecular, 4},
    {&RectLight::affectReflections, 4},
};

// ---- XML parameters, in the order they are written ----

const ParamRow<Dir> kDirectParams[] = {
    {"color", &Dir::color},
    {"shadowColor", &Dir::shadowColor},
    {"shadowBias", &Dir::shadowBias},
    {"shadowRadius", &Dir::shadowRadius},
    {"intensity", &Dir::intensity},
    {"causticSubdivs", &Dir::causticSubdivs},
    {"photonSubdivs", &Dir::photonSubdivs},
    {"shadowSubdivs", &Dir::shadowSubdivs},
    {"enabled", &Dir::enabled},
    {"shadows", &Dir::shadows},
};

const ParamRow<OmniLight> kOmniParams[] = {
    {"color", &OmniLight::color},
    {"shadowColor", &OmniLight::shadowColor},
    {"cutoffThreshold", &OmniLight::cutoffThreshold},
    {"shadowBias", &OmniLight::shadowBias},
    {"decay", &OmniLight::decay},
    {"intensity", &OmniLight::intensity},
    {"shadowRadius", &OmniLight::shadowRadius},
    {"units", &OmniLight::units},
    {"photonSubdivs", &OmniLight::photonSubdivs},
    {"causticSubdivs", &OmniLight::causticSubdivs},
    {"shadowSubdivs", &OmniLight::shadowSubdivs},
    {"enabled", &OmniLight::enabled},
    {"shadows", &OmniLight::shadows},
    {"affectDiffuse", &OmniLight::affectDiffuse},
    {"affectSpecular", &OmniLight::affectSpecular},
    {"transform", &OmniLight::transform},
};

// Followed by "legacyMode", which no field holds.
const ParamRow<SpotLight> kSpotParams[] = {
    {"color", &SpotLight::color},
    {"shadowColor", &SpotLight::shadowColor},
    {"cutoffThreshold", &SpotLight::cutoffThreshold},
    {"barnDoorLeft", &SpotLight::barnDoorLeft},
    {"barnDoorRight", &SpotLight::barnDoorRight},
    {"barnDoorTop", &SpotLight::barnDoorTop},
    {"barnDoorBottom", &SpotLight::barnDoorBottom},
    {"shadowBias", &SpotLight::shadowBias},
    {"decay", &SpotLight::decay},
    {"intensity", &SpotLight::intensity},
    {"shadowRadius", &SpotLight::shadowRadius},
    {"coneAngle", &SpotLight::coneAngle},
    {"penumbraAngle", &SpotLight::penumbraAngle},
    {"units", &SpotLight::units},
    {"photonSubdivs", &SpotLight::photonSubdivs},
    {"causticSubdivs", &SpotLight::causticSubdivs},
    {"shadowSubdivs", &SpotLight::shadowSubdivs},
    {"enabled", &SpotLight::enabled},
    {"barnDoor", &SpotLight::barnDoor},
    {"shadows", &SpotLight::shadows},
    {"affectDiffuse", &SpotLight::affectDiffuse},
    {"affectSpecular", &SpotLight::affectSpecular},
    {"transform", &SpotLight::transform},
};

const ParamRow<RectLight> kRectangleParams[] = {
    {"color", &RectLight::color},
    {"shadowColor", &RectLight::shadowColor},
    {"cutoffThreshold", &RectLight::cutoffThreshold},
    {"shadowBias", &RectLight::shadowBias},
    {"intensity", &RectLight::intensity},
    {"u_size", &RectLight::u_size},
    {"v_size", &RectLight::v_size},
    {"units", &RectLight::units},
    {"photonSubdivs", &RectLight::photonSubdivs},
    {"causticSubdivs", &RectLight::causticSubdivs},
    {"subdivs", &RectLight::subdivs},
    {"enabled", &RectLight::enabled},
    {"doubleSided", &RectLight::doubleSided},
    {"invisible", &RectLight::invisible},
    {"lightPortal", &RectLight::lightPortal},
    {"noDecay", &RectLight::noDecay},
    {"storeWithIrradianceMap", &RectLight::storeWithIrradianceMap},
    {"ignoreLightNormals", &RectLight::ignoreLightNormals},
    {"shadows", &RectLight::shadows},
    {"affectDiffuse", &RectLight::affectDiffuse},
    {"affectSpecular", &RectLight::affectSpecular},
    {"affectReflections", &RectLight::affectReflections},
    {"transform", &RectLight::transform},
};

constexpr int kNewest = 4;

// The light's Asset under its own url: the owner's url, "/", the plugin name.
template <class L, std::size_t N>
void writeParamAsset(AssetXmlWriter& w, const std::u16string& url, const L& light,
                     const ParamRow<L> (&params)[N]) {
    writeLightAsset(w, url + u"/" + light.getPluginName(), light.getPluginName(),
                    [&] { writeParams(w, light, params); });
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
    writeParamAsset(writer, url, *this, kDirectParams);
}

// ---- OmniLight ----

RowSpan<RecordRow<OmniLight>> OmniLight::record() { return rowSpan(kOmniRecord); }

void OmniLight::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeParamAsset(writer, url, *this, kOmniParams);
}

// ---- SpotLight ----

RowSpan<RecordRow<SpotLight>> SpotLight::record() { return rowSpan(kSpotRecord); }

void SpotLight::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeLightAsset(writer, url + u"/" + getPluginName(), getPluginName(), [&] {
        writeParams(writer, *this, kSpotParams);
        // Always on; the consumer reads it as a setting of its own.
        writer.writeBool("legacyMode", true, "Legacy Mode", true);
    });
}

// ---- RectangleLight ----

RowSpan<RecordRow<RectangleLight>> RectangleLight::record() { return rowSpan(kRectangleRecord); }

void RectangleLight::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeParamAsset(writer, url, *this, kRectangleParams);
}

// ---- SphereLight ----
//
// Record: tag, transform, color, shadowColor, the four reals, the four ints,
// then the flags as bool8: five in version 1, all eight in version 2.

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
    reset();
    const int v = readVersion(ar, 1, 2);
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
