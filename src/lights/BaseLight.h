#pragma once
// Root of the lights.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class BaseLight : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    static constexpr std::uint32_t kSunLightType = 5;

    ~BaseLight() override = default;
    virtual std::uint32_t getType() const = 0;
    virtual boost::shared_ptr<BaseLight> clone() const = 0;
    virtual bool isEqual(const boost::shared_ptr<BaseLight>& other) const = 0;
    virtual void reset() = 0;

    // Lights without XML of their own write nothing.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override {}
    std::u16string getPluginName() const override { return std::u16string(); }
    std::u16string getAssetType() const override { return u"light"; }
    // A sun's Asset stands under the url that refers to it.
    const std::u16string* referenceName(std::u16string& scratch) const override {
        return getType() == kSunLightType ? nullptr : OrvaneXMLSerializable::referenceName(scratch);
    }
};

typedef boost::shared_ptr<BaseLight> LightPtr;

// New default light for tags 0, 2, 3, 4, 5, 6 and 7, null otherwise.
LightPtr createLight(std::int32_t tag);

}  // namespace OrvaneLumoCore
