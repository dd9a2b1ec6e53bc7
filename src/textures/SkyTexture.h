#pragma once
// The sky: a texture driven by a sun. Its XML is a single reference to that
// sun; its record also carries a copy of the sun's settings and, in the
// newest version, the process-wide document sun.
#include <cstdint>
#include <string>

#include "animation/Animated.h"
#include "lights/SunIesDome.h"
#include "persistence/FamilyOf.h"
#include "textures/BaseTexture.h"

namespace OrvaneLumoCore {

class SkyTexture : public FamilyOf<SkyTexture, 12, BaseTexture>, public SunSettings {
public:
    // Defaults: the document sun and a new UUID string as skyId.
    SkyTexture();

    bool save(QuickArchive& ar) const override;
    // A version 3 record replaces the settings, id and name of the document
    // sun in place, for every sky of the process.
    bool load(QuickArchive& ar) override;
    void reset() override;
    // A copy gets a clone of the sun (which has an id of its own) and a new
    // skyId: never equal to its source.
    void finishClone();
    // skyId compares without regard to case.
    bool sameContent(const SkyTexture& o) const;
    // The Asset with the one parameter "sun". No Asset of the sun itself is
    // written: the reference names one the consumer already knows.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"TexSky"; }

    // The sun as a SunLight, or null if `sun` holds anything else.
    const SunLight* sunLight() const;

    LightPtr sun;  // always a SunLight, never null after reset or load
    AnimatedTransform transform;
    bool skyFlag = false;
    std::u16string skyId;
};

}  // namespace OrvaneLumoCore
