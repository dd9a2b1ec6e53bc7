#pragma once
// Root of the BRDF layers.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class Base_BRDF : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    ~Base_BRDF() override = default;
    virtual std::uint32_t getType() const = 0;
    virtual void reset() = 0;
    virtual boost::shared_ptr<Base_BRDF> clone() const = 0;
    virtual bool isEqual(const boost::shared_ptr<Base_BRDF>& other) const = 0;
    std::u16string getAssetType() const override { return u"BRDF"; }
};

typedef boost::shared_ptr<Base_BRDF> BrdfPtr;

// New default layer for tags 1, 2, 4, 8, 16 and 32, null otherwise.
BrdfPtr createBrdf(std::uint32_t tag);

}  // namespace OrvaneLumoCore
