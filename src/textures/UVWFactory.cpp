#include "textures/BaseUVW.h"
#include "textures/UVWGenerators.h"

namespace OrvaneLumoCore {

// Tag 2 has no class.
UVWPtr createUVW(std::int32_t tag) {
    return createByTag<BaseUVW, GenPlanarWorldUVW, GenObjectUVW, GenEnvironmentUVW, GenChannelUVW>(tag);
}

UVWPtr defaultPlanarUVW() { return createUVW(0); }

}  // namespace OrvaneLumoCore
