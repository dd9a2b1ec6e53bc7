#include "materials/Base_BRDF.h"

namespace OrvaneLumoCore {

// No class of this family exists yet: every tag gives a null pointer.
BrdfPtr createBrdf(std::uint32_t tag) {
    (void)tag;
    return BrdfPtr();
}

}  // namespace OrvaneLumoCore
