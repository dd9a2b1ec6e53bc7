#include "textures/BaseBitmap.h"

namespace OrvaneLumoCore {

// No class of this family exists yet: every tag gives a null pointer.
BitmapPtr createBitmap(std::int32_t tag) {
    (void)tag;
    return BitmapPtr();
}

}  // namespace OrvaneLumoCore
