#include "lights/BaseLight.h"

namespace OrvaneLumoCore {

// No class of this family exists yet: every tag gives a null pointer.
LightPtr createLight(std::int32_t tag) {
    (void)tag;
    return LightPtr();
}

}  // namespace OrvaneLumoCore
