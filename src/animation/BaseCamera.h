#pragma once
// Root of the cameras.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class BaseCamera : public OrvaneRecord {
public:
    virtual std::uint32_t getType() const = 0;
    virtual boost::shared_ptr<BaseCamera> clone() const = 0;
};

typedef boost::shared_ptr<BaseCamera> CameraPtr;

// New PhysicalCamera for tag 0, null otherwise.
CameraPtr createCamera(std::int32_t tag);

}  // namespace OrvaneLumoCore
