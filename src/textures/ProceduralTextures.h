#pragma once
// Procedural textures: ramp, bulge, grid, cloth, noise and checker. Each has
// a UVW generator as its first child.
//
// All six share one shape. The record is the version tag, the children,
// then the plain fields; the XML has one child slot per child, a `plugin`
// parameter per slot in slot order (the slot's word is also the parameter's
// name), then the plain parameters. A class therefore only describes its
// record table, one row per child or field with the XML parameter that shows
// it (in ProceduralTextures.cpp); TableTextureOf and the texture family's
// walkers (textures/TextureRows.h) do the rest. A required child that is
// missing makes `save` fail before anything is written.
#include <cstdint>
#include <string>

#include "textures/BaseTexture.h"
#include "textures/BaseUVW.h"
#include "textures/TableTextureOf.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

template <class Derived, std::uint32_t Tag>
using ProceduralTexture = TableTextureOf<Derived, Tag>;

class RampTexture : public ProceduralTexture<RampTexture, 11> {
public:
    std::u16string getPluginName() const override { return u"TexRamp"; }

    UVWPtr uvw;
    TexturePtr colors;
    float positions = 0.5f;
    float u_wave = 0.0f;
    float v_wave = 0.0f;
    std::int32_t type = 0;
    std::int32_t interpolation = 1;
};

class BulgeTexture : public ProceduralTexture<BulgeTexture, 8> {
public:
    std::u16string getPluginName() const override { return u"TexBulge"; }

    UVWPtr uvw;
    float u_width = 0.1f;
    float v_width = 0.1f;
};

class GridTexture : public ProceduralTexture<GridTexture, 6> {
public:
    std::u16string getPluginName() const override { return u"TexGrid"; }

    UVWPtr uvw;
    TexturePtr line_color;
    TexturePtr fill_color;
    float lineColorMult = 1.0f;  // in the record only
    float fillColorMult = 1.0f;
    float u_width = 0.1f;
    float v_width = 0.1f;
};

class ClothTexture : public ProceduralTexture<ClothTexture, 7> {
public:
    std::u16string getPluginName() const override { return u"TexCloth"; }

    UVWPtr uvw;
    AColor gap_color{1, 1, 1, 1};
    AColor u_color{0, 0, 0, 1};
    AColor v_color{1, 1, 1, 1};
    float u_width = 0.1f;
    float v_width = 0.1f;
    bool tile = true;  // tiles in both directions
};

class NoiseTexture : public ProceduralTexture<NoiseTexture, 3> {
public:
    std::u16string getPluginName() const override { return u"TexNoise"; }

    UVWPtr uvw;
    TexturePtr color1_tex;  // optional
    TexturePtr color2_tex;  // optional
    Color color1{1, 1, 1};
    Color color2{0, 0, 0};
    float persistence = 1.0f;
    float amplitude_ratio = 1.0f;
    float frequency_ratio = 2.0f;
    float frequency1 = 1.0f;
    float amplitude1 = 1.0f;
    float size = 1.0f;
    float mix_ratio = 0.5f;
    float bias = 0.0f;
    float color1_tex_mult = 1.0f;
    float color2_tex_mult = 1.0f;
    std::int32_t octaves = 3;
    std::int32_t noiseType = 0;
    std::int32_t inflection = 0;
};

// The one texture whose defaults hold children: a planar world generator
// and two constant colours, new ones at every reset.
class CheckerTexture : public ProceduralTexture<CheckerTexture, 4> {
public:
    CheckerTexture();
    std::u16string getPluginName() const override { return u"TexChecker"; }

    UVWPtr uvw;
    TexturePtr white_color;
    TexturePtr black_color;
    float whiteColorMult = 1.0f;  // in the record only
    float blackColorMult = 1.0f;
    bool tile_u = true;
    bool tile_v = true;
};

extern template class TableTextureOf<RampTexture, 11>;
extern template class TableTextureOf<BulgeTexture, 8>;
extern template class TableTextureOf<GridTexture, 6>;
extern template class TableTextureOf<ClothTexture, 7>;
extern template class TableTextureOf<NoiseTexture, 3>;
extern template class TableTextureOf<CheckerTexture, 4>;

}  // namespace OrvaneLumoCore
