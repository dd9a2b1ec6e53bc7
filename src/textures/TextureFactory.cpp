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
    switch (tag) {
        case 0: return TexturePtr(new BitmapTexture());
        case 1: return TexturePtr(new FresnelTexture());
        case 2: return TexturePtr(new UVWTexture());
        case 3: return TexturePtr(new NoiseTexture());
        case 4: return TexturePtr(new CheckerTexture());
        case 5: return TexturePtr(new AColorTexture());
        case 6: return TexturePtr(new GridTexture());
        case 7: return TexturePtr(new ClothTexture());
        case 8: return TexturePtr(new BulgeTexture());
        case 9: return TexturePtr(new InvertTexture());
        case 10: return TexturePtr(new BlendTexture());
        case 11: return TexturePtr(new RampTexture());
        case 12: return TexturePtr(new SkyTexture());
        case -1:
        default: return TexturePtr();
    }
}

}  // namespace OrvaneLumoCore
