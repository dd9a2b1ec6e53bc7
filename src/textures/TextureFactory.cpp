#include "textures/BaseTexture.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "textures/SkyTexture.h"
#include "textures/UVWGenerators.h"

namespace OrvaneLumoCore {

const char16_t* const kTextureLabels[kTextureTagCount] = {
    u"Bitmap", u"Fresnel", u"UVW",    u"Noise",  u"Checker", u"AColor", u"Grid",
    u"Cloth",  u"Bulge",   u"Invert", u"Blend",  u"Ramp",    u"Sky"};

std::u16string textureLabel(std::int32_t tag) {
    if (tag < 0 || tag >= kTextureTagCount) return std::u16string();
    return kTextureLabels[tag];
}

// Tags without a class, -1 among them, give a null pointer.
TexturePtr createTexture(std::int32_t tag) {
    return createByTag<BaseTexture, BitmapTexture, FresnelTexture, UVWTexture, NoiseTexture, CheckerTexture,
                       AColorTexture, GridTexture, ClothTexture, BulgeTexture, InvertTexture, BlendTexture,
                       RampTexture, SkyTexture>(tag);
}

}  // namespace OrvaneLumoCore
