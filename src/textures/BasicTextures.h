#pragma once
// Textures without a UVW generator: Fresnel, blend, invert and constant colour.
#include <cstdint>
#include <string>

#include "persistence/FamilyOf.h"
#include "textures/BaseTexture.h"
#include "textures/TableTextureOf.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// Mixes two colours or textures by the angle of view. The colours are kept
// as their complements; XML writes them back as max(0, 1 - c).
class FresnelTexture : public TableTextureOf<FresnelTexture, 1> {
public:
    FresnelTexture() { setTableDefaults(); }
    void writeOwnForm(AssetXmlWriter& w, const RecordRow<FresnelTexture>& row) const;
    std::u16string getPluginName() const override { return u"TexFresnel"; }

    TexturePtr reflection_tex;
    TexturePtr refraction_tex;
    TexturePtr fresnel_ior_tex;
    TexturePtr refract_ior_tex;
    Color whiteInverse;
    Color blackInverse;
    float fresnel_ior;
    float refract_ior;
    float black_color_tex_mult;
    float white_color_tex_mult;
    float fresnel_ior_tex_mult;
    float refract_ior_tex_mult;
};

// Mixes two textures by a fixed amount.
class BlendTexture : public FamilyOf<BlendTexture, 10, BaseTexture> {
public:
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void finishClone();
    bool sameContent(const BlendTexture& o) const;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"TexBlend"; }

    TexturePtr color_a;
    TexturePtr color_b;
    float colorAMult = 1.0f;  // stored behind color_a, only while it is present
    float colorBMult = 1.0f;
    float blend_amount = 0.5f;
};

// Inverts one texture.
class InvertTexture : public TableTextureOf<InvertTexture, 9> {
public:
    InvertTexture() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"TexInvert"; }

    TexturePtr texture;  // required: save fails without it
    bool invert_alpha;
};

// A constant colour with alpha.
class AColorTexture : public TableTextureOf<AColorTexture, 5> {
public:
    AColorTexture() { setTableDefaults(); }
    explicit AColorTexture(const AColor& c) : AColorTexture() { color = c; }

    std::u16string getPluginName() const override { return u"TexAColor"; }

    AColor color;
};

extern template class TableTextureOf<FresnelTexture, 1>;
extern template class TableTextureOf<InvertTexture, 9>;
extern template class TableTextureOf<AColorTexture, 5>;

}  // namespace OrvaneLumoCore
