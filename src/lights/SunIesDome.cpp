#include "lights/SunIesDome.h"

#include <boost/make_shared.hpp>

#include "persistence/QuickArchive.h"
#include "platform/Uuid.h"
#include "platform/WideChar.h"

namespace OrvaneLumoCore {

namespace {

// The settings that the sun and the sky hold, with the parameters that
// show them in the sun's XML and their places there.
const RecordRow<SunSettings> kSunSettingsRecord[] = {
    {&SunSettings::up_vector, "up_vector", 1},
    {&SunSettings::shadowBias, "shadowBias", 2},
    {&SunSettings::turbidity, "turbidity", 3},
    {&SunSettings::water_vapour, "water_vapour", 4},
    {&SunSettings::intensity_multiplier, "intensity_multiplier", 5},
    {&SunSettings::size_multiplier, "size_multiplier", 6},
    {&SunSettings::photon_radius, "photon_radius", 7},
    {&SunSettings::photon_emit_distance, "photon_emit_distance", 8},
    {&SunSettings::ozone, "ozone", 9},
    {&SunSettings::photonSubdivs, "photonSubdivs", 10},
    {&SunSettings::causticSubdivs, "causticSubdivs", 11},
    {&SunSettings::shadow_subdivs, "shadow_subdivs", 12},
    {&SunSettings::shadows, "shadows", 14},
};

// The sun's fields behind its settings; its XML shows two of them among the
// settings' parameters and the transform last.
const RecordRow<SunLight> kSunRecord[] = {
    {&SunLight::id, 2},
    {&SunLight::name, 2},
    {&SunLight::enabled, 3, "enabled", 13},
    {&SunLight::invisible, 3, "invisible", 15},
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
// Up to version 3 the transform stood first, as a plain transform: the
// record branches on it, so the transform is read and written by hand.
bool SunLight::save(QuickArchive& ar) const {
    writeVersion(ar, kSunNewest);
    writeSunSettings(ar, *this);
    writeFields(ar, *this, kSunRecord, kSunNewest);
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
    readFields(ar, *this, kSunRecord, v);
    if (v >= 4) return loadNested(ar, transform);
    return true;
}

void SunLight::finishClone() {
    id = platform::newUuidString();
}

bool SunLight::sameContent(const SunLight& o) const {
    return fieldsEqual(*this, o, kSunRecord) && transform == o.transform && sunSettingsEqual(*this, o);
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
        writeShownFieldsWithPart(writer, *this, kSunRecord, static_cast<const SunSettings&>(*this),
                                 kSunSettingsRecord);
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
