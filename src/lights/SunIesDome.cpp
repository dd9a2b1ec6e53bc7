#include "lights/SunIesDome.h"

#include <boost/make_shared.hpp>

#include "persistence/QuickArchive.h"
#include "platform/Uuid.h"
#include "platform/WideChar.h"

namespace OrvaneLumoCore {

namespace {

// The settings that the sun and the sky hold, with the parameters that
// show them in the sun's XML, their places there and their defaults.
typedef SunSettings Set;
typedef RecordRow<Set> SetRow;
const SetRow kSunSettingsRecord[] = {
    SetRow(&Set::up_vector, "up_vector", 1).byDefault(Vector(0, 0, 1)),
    {&Set::shadowBias, "shadowBias", 2},
    SetRow(&Set::turbidity, "turbidity", 3).byDefault(3),
    SetRow(&Set::water_vapour, "water_vapour", 4).byDefault(2),
    SetRow(&Set::intensity_multiplier, "intensity_multiplier", 5).byDefault(1),
    SetRow(&Set::size_multiplier, "size_multiplier", 6).byDefault(1),
    SetRow(&Set::photon_radius, "photon_radius", 7).byDefault(50),
    SetRow(&Set::photon_emit_distance, "photon_emit_distance", 8).byDefault(150),
    SetRow(&Set::ozone, "ozone", 9).byDefault(0.35),
    SetRow(&Set::photonSubdivs, "photonSubdivs", 10).byDefault(500),
    SetRow(&Set::causticSubdivs, "causticSubdivs", 11).byDefault(1000),
    SetRow(&Set::shadow_subdivs, "shadow_subdivs", 12).byDefault(8),
    SetRow(&Set::shadows, "shadows", 14).byDefault(true),
};

// The sun's fields behind its settings; its XML shows two of them among the
// settings' parameters and the transform last.
const RecordRow<SunLight> kSunRecord[] = {
    {&SunLight::id, 2},
    {&SunLight::name, 2},
    RecordRow<SunLight>(&SunLight::enabled, 3, "enabled", 13).byDefault(true),
    {&SunLight::invisible, 3, "invisible", 15},
};

// The fields in record order, with the versions that hold them, the XML
// parameters that show them, their places among the parameters and their
// defaults.
typedef RecordRow<IESLight> IesRow;
const IesRow kIesRecord[] = {
    {&IESLight::transform, "transform", 1},
    IesRow(&IESLight::color, "color", 2).byDefault(kWhite),
    {&IESLight::shadowColor, "shadowColor", 3},
    IesRow(&IESLight::filter_color, "filter_color", 4).byDefault(kWhite),
    {&IESLight::shadowBias, "shadowBias", 5},
    IesRow(&IESLight::cutoffThreshold, "cutoffThreshold", 6).byDefault(0.005),
    IesRow(&IESLight::photonSubdivs, "photonSubdivs", 8).byDefault(8),
    IesRow(&IESLight::causticSubdivs, "causticSubdivs", 9).byDefault(1000),
    IesRow(&IESLight::shadow_subdivs, "shadow_subdivs", 10).byDefault(8),
    IesRow(&IESLight::enabled, "enabled", 11).byDefault(true),
    IesRow(&IESLight::shadows, "shadows", 12).byDefault(true),
    {&IESLight::soft_shadows, "soft_shadows", 13},
    {FieldRef<IESLight>::path(&IESLight::ies_file), "ies_file", 16},
    IesRow(&IESLight::affectDiffuse, 2, "affectDiffuse", 14).byDefault(true),
    IesRow(&IESLight::affectSpecular, 2, "affectSpecular", 15).byDefault(true),
    IesRow(&IESLight::intensity, 3, "intensity", 7).byDefault(1),
};

constexpr int kSunNewest = 4;

}  // namespace

// ---- sun settings ----

SunSettings::SunSettings() { resetFields(*this, kSunSettingsRecord); }

void readSunSettings(QuickArchive& ar, SunSettings& s) { readFields(ar, s, kSunSettingsRecord, 1); }

void writeSunSettings(QuickArchive& ar, const SunSettings& s) {
    writeFields(ar, s, kSunSettingsRecord, 1);
}

bool sunSettingsEqual(const SunSettings& a, const SunSettings& b) {
    return fieldsEqual(a, b, kSunSettingsRecord);
}

// ---- SunLight ----

SunLight::SunLight() {
    resetFields(*this, kSunRecord);
    id = platform::newUuidString();
}

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
