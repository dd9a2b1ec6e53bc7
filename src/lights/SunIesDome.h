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

// The settings a sun shares with the sky that it drives. Both records hold
// them in this order; their table gives the defaults.
struct SunSettings {
    SunSettings();

    Vector up_vector;
    float shadowBias;
    float turbidity;
    float water_vapour;
    float intensity_multiplier;
    float size_multiplier;
    float photon_radius;
    float photon_emit_distance;
    float ozone;
    std::int32_t photonSubdivs;
    std::int32_t causticSubdivs;
    std::int32_t shadow_subdivs;
    bool shadows;
};

// From `up_vector` to `shadows`: vector, eight f32, three i32, bool8.
void readSunSettings(QuickArchive& ar, SunSettings& s);
void writeSunSettings(QuickArchive& ar, const SunSettings& s);
bool sunSettingsEqual(const SunSettings& a, const SunSettings& b);

// Id of the process-wide document sun.
constexpr char16_t documentSunId[] = u"{D3BE9766-E4AA-418b-81A9-23414A2BA98D}";

class SunLight : public LightOf<SunLight, BaseLight::kSunLightType>, public SunSettings {
public:
    // The table's defaults and a new UUID string as id.
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
    bool enabled;
    bool invisible;
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

    IESLight() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"LightIES"; }

    Transform transform;
    Color color;
    Color shadowColor;
    Color filter_color;
    float shadowBias;
    float cutoffThreshold;
    float intensity;
    std::int32_t photonSubdivs;
    std::int32_t causticSubdivs;
    std::int32_t shadow_subdivs;
    bool enabled;
    bool shadows;
    bool soft_shadows;
    bool affectDiffuse;
    bool affectSpecular;
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
