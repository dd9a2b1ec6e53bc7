#include "textures/BaseBitmap.h"
#include "textures/Bitmaps.h"

namespace OrvaneLumoCore {

BitmapPtr createBitmap(std::int32_t tag) {
    switch (tag) {
        case 0: return BitmapPtr(new BitmapBuffer());
        default: return BitmapPtr();
    }
}

}  // namespace OrvaneLumoCore
