#pragma once
// Textures without a UVW generator: Fresnel, blend, invert and constant colour.
#include <cstdint>
#include <string>

#include "persistence/Types.h"
#include "textures/BaseTexture.h"

namespace OrvaneLumoCore {

// Mixes two colours or textures by the angle of view. The colours are kept
// as their complements; XML writes them back as max(0, 1 - c).
class FresnelTexture : public BaseTexture {
public:
    static const std::uint32_t kType = 1;
    FresnelTexture() { reset(); }

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    std::uint32_t getType() const override { return kType; }
    TexturePtr clone() const override;
    bool isEqual(const TexturePtr& other) const override;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
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
class BlendTexture : public BaseTexture {
public:
    static const std::uint32_t kType = 10;
    BlendTexture() { reset(); }

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    std::uint32_t getType() const override { return kType; }
    TexturePtr clone() const override;
    bool isEqual(const TexturePtr& other) const override;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"TexBlend"; }

    TexturePtr color_a;
    TexturePtr color_b;
    float colorAMult;  // stored behind color_a, only while it is present
    float colorBMult;
    float blend_amount;
};

// Inverts one texture.
class InvertTexture : public BaseTexture {
public:
    static const std::uint32_t kType = 9;
    InvertTexture() { reset(); }

    bool save(QuickArchive& ar) const override;  // false without `texture`
    bool load(QuickArchive& ar) override;
    void reset() override;
    std::uint32_t getType() const override { return kType; }
    TexturePtr clone() const override;
    bool isEqual(const TexturePtr& other) const override;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"TexInvert"; }

    TexturePtr texture;
    bool invert_alpha;
};

// A constant colour with alpha.
class AColorTexture : public BaseTexture {
public:
    static const std::uint32_t kType = 5;
    AColorTexture() { reset(); }
    explicit AColorTexture(const AColor& c) : color(c) {}

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    std::uint32_t getType() const override { return kType; }
    TexturePtr clone() const override;
    bool isEqual(const TexturePtr& other) const override;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"TexAColor"; }

    AColor color;
};

}  // namespace OrvaneLumoCore
