#include "materials/BaseMaterial.h"

namespace OrvaneLumoCore {

// No class of this family exists yet: every tag gives a null pointer.
MaterialPtr createMaterial(std::uint32_t tag) {
    (void)tag;
    return MaterialPtr();
}

}  // namespace OrvaneLumoCore
