#include "animation/BaseCamera.h"

namespace OrvaneLumoCore {

// No class of this family exists yet: every tag gives a null pointer.
CameraPtr createCamera(std::int32_t tag) {
    (void)tag;
    return CameraPtr();
}

}  // namespace OrvaneLumoCore
