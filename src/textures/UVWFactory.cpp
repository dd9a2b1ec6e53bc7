#include "textures/BaseUVW.h"
#include "textures/UVWGenerators.h"

namespace OrvaneLumoCore {

// Tag 2 has no class.
UVWPtr createUVW(std::int32_t tag) {
    switch (tag) {
        case 0: return UVWPtr(new GenPlanarWorldUVW());
        case 1: return UVWPtr(new GenObjectUVW());
        case 3: return UVWPtr(new GenEnvironmentUVW());
        case 4: return UVWPtr(new GenChannelUVW());
        default: return UVWPtr();
    }
}

UVWPtr defaultPlanarUVW() { return createUVW(0); }

}  // namespace OrvaneLumoCore
