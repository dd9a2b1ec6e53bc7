#pragma once
// Root of the UVW generators.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class BaseUVW : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    ~BaseUVW() override = default;
    virtual void reset() = 0;
    virtual std::uint32_t getType() const = 0;
    // Recomputes the stored transforms from their components.
    virtual void syncTransforms() = 0;
    virtual boost::shared_ptr<BaseUVW> clone() const = 0;
    virtual bool isEqual(const boost::shared_ptr<BaseUVW>& other) const = 0;
    std::u16string getAssetType() const override { return u"uvw"; }
};

typedef boost::shared_ptr<BaseUVW> UVWPtr;

// New default generator for tags 0, 1, 3 and 4, null otherwise.
UVWPtr createUVW(std::int32_t tag);

// A new GenPlanarWorldUVW, the same as createUVW(0).
UVWPtr defaultPlanarUVW();

}  // namespace OrvaneLumoCore
