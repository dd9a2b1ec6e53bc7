#include "textures/BaseTexture.h"

namespace OrvaneLumoCore {

// No class of this family exists yet: every tag gives a null pointer.
TexturePtr createTexture(std::int32_t tag) {
    (void)tag;
    return TexturePtr();
}

}  // namespace OrvaneLumoCore
