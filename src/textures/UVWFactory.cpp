#include "textures/BaseUVW.h"

namespace OrvaneLumoCore {

// No class of this family exists yet: every tag gives a null pointer.
UVWPtr createUVW(std::int32_t tag) {
    (void)tag;
    return UVWPtr();
}

}  // namespace OrvaneLumoCore
