#pragma once
// The sky: a texture driven by a sun. Its XML is a single reference to that
// sun; its record also carries a copy of the sun's settings and, in the
// newest version, the process-wide document sun.
#include <cstdint>
#include <string>

#include "animation/Animated.h"
#include "lights/SunIesDome.h"
#include "textures/BaseTexture.h"

namespace OrvaneLumoCore {

class SkyTexture : public BaseTexture, public SunSettings {
public:
    static constexpr std::uint32_t kType = 12;

    // Defaults: the document sun and a new UUID string as skyId.
    SkyTexture();

    bool save(QuickArchive& ar) const override;
    // A version 3 record replaces the settings, id and name of the document
    // sun in place, for every sky of the process.
    bool load(QuickArchive& ar) override;
    void reset() override;
    std::uint32_t getType() const override { return kType; }
    // A copy with a clone of the sun (which has an id of its own) and a new
    // skyId: never equal to its source.
    TexturePtr clone() const override;
    // skyId compares without regard to case.
    bool isEqual(const TexturePtr& other) const override;
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
