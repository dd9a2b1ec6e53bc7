#pragma once
// The sun, the photometric (IES) light and the dome light, and the one
// process-wide sun that every sky starts from.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "animation/Animated.h"
#include "lights/LightFrame.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// The settings a sun shares with the sky that it drives, with their
// defaults. Both records hold them in this order.
struct SunSettings {
    Vector up_vector{0, 0, 1};
    float shadowBias = 0.0f;
    float turbidity = 3.0f;
    float water_vapour = 2.0f;
    float intensity_multiplier = 1.0f;
    float size_multiplier = 1.0f;
    float photon_radius = 50.0f;
    float photon_emit_distance = 150.0f;
    float ozone = 0.35f;
    std::int32_t photonSubdivs = 500;
    std::int32_t causticSubdivs = 1000;
    std::int32_t shadow_subdivs = 8;
    bool shadows = true;
};

// From `up_vector` to `shadows`: vector, eight f32, three i32, bool8.
void readSunSettings(QuickArchive& ar, SunSettings& s);
void writeSunSettings(QuickArchive& ar, const SunSettings& s);
bool sunSettingsEqual(const SunSettings& a, const SunSettings& b);

// Id of the process-wide document sun.
constexpr char16_t documentSunId[] = u"{D3BE9766-E4AA-418b-81A9-23414A2BA98D}";

class SunLight : public LightOf<SunLight, BaseLight::kSunLightType>, public SunSettings {
public:
    // Defaults and a new UUID string as id.
    SunLight();
    // Defaults, then the given name and id.
    SunLight(const std::u16string& name, const std::u16string& id);

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    // A copy gets a new id.
    void finishClone();
    // Id and name compare exactly.
    bool sameContent(const SunLight& o) const;

    // Writes the sun once per writer and records its url in the writer's
    // sunRegistry. An empty url stands for "/" and the id; the document sun
    // under an empty url writes nothing.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"SunLight"; }

    AnimatedTransform transform;  // identity at time 0
    bool enabled = true;
    bool invisible = false;
    std::u16string id;
    std::u16string name;
};

typedef boost::shared_ptr<SunLight> SunLightPtr;

// The one process-wide sun: named "Default", with the id documentSunId. It
// is made when the library is loaded and lives until the process ends; a
// sky record of the newest version replaces its settings in place.
const SunLightPtr& documentSun();

// Puts the document sun back into the state it has when the library is
// loaded, in place: what a conversion sees first in a fresh process.
void resetDocumentSun();

// True if `id` is the document sun's id, ignoring case.
bool isDocumentSunId(const std::u16string& id);

class IESLight : public TableLightOf<IESLight, 6> {
public:
    static constexpr int kRecordVersion = 3;
    static RowSpan<RecordRow<IESLight>> record();  // the file path compares without regard to case

    std::u16string getPluginName() const override { return u"LightIES"; }

    Transform transform;
    Color color{1, 1, 1};
    Color shadowColor{0, 0, 0};
    Color filter_color{1, 1, 1};
    float shadowBias = 0.0f;
    float cutoffThreshold = 0.005f;
    float intensity = 1.0f;
    std::int32_t photonSubdivs = 8;
    std::int32_t causticSubdivs = 1000;
    std::int32_t shadow_subdivs = 8;
    bool enabled = true;
    bool shadows = true;
    bool soft_shadows = false;
    bool affectDiffuse = true;
    bool affectSpecular = true;
    std::u16string ies_file;
};

// A light without settings and without XML. The factory doesn't make it.
class DomeLight : public LightOf<DomeLight, 8> {
public:
    bool save(QuickArchive& ar) const override;
    // Reads the version tag that `save` writes.
    bool load(QuickArchive& ar) override;
    bool sameContent(const DomeLight&) const { return true; }
};

}  // namespace OrvaneLumoCore
