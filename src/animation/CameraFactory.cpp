#include "animation/BaseCamera.h"

#include <boost/make_shared.hpp>

#include "animation/Camera.h"

namespace OrvaneLumoCore {

CameraPtr createCamera(std::int32_t tag) {
    switch (tag) {
        case PhysicalCamera::kType: return boost::make_shared<PhysicalCamera>();
        default: return CameraPtr();
    }
}

}  // namespace OrvaneLumoCore
