#include "textures/BaseBitmap.h"
#include "textures/Bitmaps.h"

namespace OrvaneLumoCore {

BitmapPtr createBitmap(std::int32_t tag) { return createByTag<BaseBitmap, BitmapBuffer>(tag); }

}  // namespace OrvaneLumoCore
