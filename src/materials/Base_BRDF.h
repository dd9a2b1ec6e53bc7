#pragma once
// Root of the BRDF layers: a layer's name and three flags, kept in the base
// record that every current layer record embeds.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

// Type tags of the layers: single bits, not a running count.
enum BrdfTag : std::uint32_t {
    kGlassBrdf = 1,
    kDiffuseBrdf = 2,
    kBlinnBrdf = 4,
    kPhongBrdf = 8,
    kMirrorBrdf = 16,
    kLightBrdf = 32
};

class Base_BRDF : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    ~Base_BRDF() override = default;

    // The base record: version 4 holds the name and the three flags.
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;

    virtual std::uint32_t getType() const = 0;
    // Back to the class's defaults. The base part sets the name to the
    // plugin name and the flags to their defaults.
    virtual void reset() = 0;
    // Deep copy: every texture cloned, the name kept.
    virtual boost::shared_ptr<Base_BRDF> clone() const = 0;
    // Equality of content; the name and the flags take no part.
    virtual bool isEqual(const boost::shared_ptr<Base_BRDF>& other) const = 0;

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override;
    std::u16string getAssetType() const override { return u"BRDF"; }

    std::u16string name;
    // Stored and copied; no XML shows them.
    bool layer_flag_a = true;
    bool layer_flag_b = false;
    bool layer_flag_c = false;
};

typedef boost::shared_ptr<Base_BRDF> BrdfPtr;

// New default layer for tags 1, 2, 4, 8, 16 and 32, null otherwise.
BrdfPtr createBrdf(std::uint32_t tag);

// Name of a layer group: 0 "Emissive", 1 "Reflection", 2 "Diffuse",
// 3 "Refraction", anything else empty.
std::u16string getBrdfGroupName(std::int32_t group);

}  // namespace OrvaneLumoCore
