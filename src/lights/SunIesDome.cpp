#include "lights/SunIesDome.h"

#include <boost/make_shared.hpp>

#include "persistence/QuickArchive.h"
#include "platform/Uuid.h"
#include "platform/WideChar.h"

namespace OrvaneLumoCore {

namespace {

const RecordRow<SunSettings> kSunSettingsRecord[] = {
    {&SunSettings::up_vector},
    {&SunSettings::shadowBias},
    {&SunSettings::turbidity},
    {&SunSettings::water_vapour},
    {&SunSettings::intensity_multiplier},
    {&SunSettings::size_multiplier},
    {&SunSettings::photon_radius},
    {&SunSettings::photon_emit_distance},
    {&SunSettings::ozone},
    {&SunSettings::photonSubdivs},
    {&SunSettings::causticSubdivs},
    {&SunSettings::shadow_subdivs},
    {&SunSettings::shadows},
};

// Followed by "transform", the value at time 0.
const ParamRow<SunLight> kSunParams[] = {
    {"up_vector", &SunLight::up_vector},
    {"shadowBias", &SunLight::shadowBias},
    {"turbidity", &SunLight::turbidity},
    {"water_vapour", &SunLight::water_vapour},
    {"intensity_multiplier", &SunLight::intensity_multiplier},
    {"size_multiplier", &SunLight::size_multiplier},
    {"photon_radius", &SunLight::photon_radius},
    {"photon_emit_distance", &SunLight::photon_emit_distance},
    {"ozone", &SunLight::ozone},
    {"photonSubdivs", &SunLight::photonSubdivs},
    {"causticSubdivs", &SunLight::causticSubdivs},
    {"shadow_subdivs", &SunLight::shadow_subdivs},
    {"enabled", &SunLight::enabled},
    {"shadows", &SunLight::shadows},
    {"invisible", &SunLight::invisible},
};

// The fields in record order, with the versions that hold them, the XML
// parameters that show them and their places among the parameters.
const RecordRow<IESLight> kIesRecord[] = {
    {&IESLight::transform, "transform", 1},
    {&IESLight::color, "color", 2},
    {&IESLight::shadowColor, "shadowColor", 3},
    {&IESLight::filter_color, "filter_color", 4},
    {&IESLight::shadowBias, "shadowBias", 5},
    {&IESLight::cutoffThreshold, "cutoffThreshold", 6},
    {&IESLight::photonSubdivs, "photonSubdivs", 8},
    {&IESLight::causticSubdivs, "causticSubdivs", 9},
    {&IESLight::shadow_subdivs, "shadow_subdivs", 10},
    {&IESLight::enabled, "enabled", 11},
    {&IESLight::shadows, "shadows", 12},
    {&IESLight::soft_shadows, "soft_shadows", 13},
    {FieldRef<IESLight>::path(&IESLight::ies_file), "ies_file", 16},
    {&IESLight::affectDiffuse, 2, "affectDiffuse", 14},
    {&IESLight::affectSpecular, 2, "affectSpecular", 15},
    {&IESLight::intensity, 3, "intensity", 7},
};

constexpr int kSunNewest = 4;

}  // namespace

// ---- sun settings ----

void readSunSettings(QuickArchive& ar, SunSettings& s) { readFields(ar, s, kSunSettingsRecord, 1); }

void writeSunSettings(QuickArchive& ar, const SunSettings& s) {
    writeFields(ar, s, kSunSettingsRecord, 1);
}

bool sunSettingsEqual(const SunSettings& a, const SunSettings& b) {
    return fieldsEqual(a, b, kSunSettingsRecord);
}

// ---- SunLight ----

SunLight::SunLight() : id(platform::newUuidString()) {}

SunLight::SunLight(const std::u16string& name_, const std::u16string& id_) : SunLight() {
    name = name_;
    id = id_;
}

// Version 4: settings, id, name, enabled, invisible, then the transform.
// Up to version 3 the transform stood first, as a plain transform.
bool SunLight::save(QuickArchive& ar) const {
    writeVersion(ar, kSunNewest);
    writeSunSettings(ar, *this);
    ar.writeWString(id);
    ar.writeWString(name);
    ar.writeByte(enabled);
    ar.writeByte(invisible);
    return transform.save(ar);
}

bool SunLight::load(QuickArchive& ar) {
    const int v = resetAndReadVersion(*this, ar, kSunNewest);
    if (v < 0) return false;
    if (v <= 3) {
        Transform t;
        ar.readTransform(t);
        transform.setValue(t, 0.0);
    }
    readSunSettings(ar, *this);
    // Version 1 keeps the new id of reset and an empty name.
    if (v >= 2) {
        ar.readWString(id);
        ar.readWString(name);
    }
    if (v >= 3) {
        ar.readByte(enabled);
        ar.readByte(invisible);
    }
    if (v >= 4) return loadNested(ar, transform);
    return true;
}

void SunLight::finishClone() {
    id = platform::newUuidString();
}

bool SunLight::sameContent(const SunLight& o) const {
    return id == o.id && name == o.name && transform == o.transform &&
           sunSettingsEqual(*this, o) && enabled == o.enabled && invisible == o.invisible;
}

void SunLight::writeXml(AssetXmlWriter& writer, std::u16string url) {
    if (writer.sunRegistry.count(id)) return;
    if (url.empty()) {
        // The consumer knows the document sun already.
        if (isDocumentSunId(id)) return;
        url = u"/" + id;
    }
    writer.sunRegistry[id] = url;
    writeLightAsset(writer, url, getPluginName(), [&] {
        writeParams(writer, *this, kSunParams);
        writer.writeTransform("transform", transform.getValue(0.0));
    });
}

const SunLightPtr& documentSun() {
    static const SunLightPtr sun = boost::make_shared<SunLight>(u"Default", documentSunId);
    return sun;
}

void resetDocumentSun() { *documentSun() = SunLight(u"Default", documentSunId); }

bool isDocumentSunId(const std::u16string& id) { return platform::iequals(id, documentSunId); }

namespace {
// Makes the document sun while the library loads rather than at its first
// use, so it exists for the whole life of the process.
[[maybe_unused]] const bool kDocumentSunMade = static_cast<bool>(documentSun());
}  // namespace

// ---- IESLight ----

RowSpan<RecordRow<IESLight>> IESLight::record() { return rowSpan(kIesRecord); }


// ---- DomeLight ----

bool DomeLight::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    return true;
}

bool DomeLight::load(QuickArchive& ar) {
    return resetAndReadVersion(*this, ar, 1) > 0;
}

}  // namespace OrvaneLumoCore
