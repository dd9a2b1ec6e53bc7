#pragma once
// Procedural textures: ramp, bulge, grid, cloth, noise and checker. Each has
// a UVW generator as its first child.
//
// All six share one shape. The record is the version tag, the children,
// then the plain fields; the XML has one child slot per child, a `plugin`
// parameter per slot in slot order (the slot's word is also the parameter's
// name), then the plain parameters. A class therefore only describes its
// record table, one row per child or field with the XML parameter that shows
// it and its default (in ProceduralTextures.cpp); TableTextureOf and the texture family's
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
    RampTexture() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"TexRamp"; }

    UVWPtr uvw;
    TexturePtr colors;
    float positions;
    float u_wave;
    float v_wave;
    std::int32_t type;
    std::int32_t interpolation;
};

class BulgeTexture : public ProceduralTexture<BulgeTexture, 8> {
public:
    BulgeTexture() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"TexBulge"; }

    UVWPtr uvw;
    float u_width;
    float v_width;
};

class GridTexture : public ProceduralTexture<GridTexture, 6> {
public:
    GridTexture() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"TexGrid"; }

    UVWPtr uvw;
    TexturePtr line_color;
    TexturePtr fill_color;
    float lineColorMult;  // in the record only
    float fillColorMult;
    float u_width;
    float v_width;
};

class ClothTexture : public ProceduralTexture<ClothTexture, 7> {
public:
    ClothTexture() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"TexCloth"; }

    UVWPtr uvw;
    AColor gap_color;
    AColor u_color;
    AColor v_color;
    float u_width;
    float v_width;
    bool tile;  // tiles in both directions
};

class NoiseTexture : public ProceduralTexture<NoiseTexture, 3> {
public:
    NoiseTexture() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"TexNoise"; }

    UVWPtr uvw;
    TexturePtr color1_tex;  // optional
    TexturePtr color2_tex;  // optional
    Color color1;
    Color color2;
    float persistence;
    float amplitude_ratio;
    float frequency_ratio;
    float frequency1;
    float amplitude1;
    float size;
    float mix_ratio;
    float bias;
    float color1_tex_mult;
    float color2_tex_mult;
    std::int32_t octaves;
    std::int32_t noiseType;
    std::int32_t inflection;
};

// The one texture whose defaults hold children: a planar world generator
// and two constant colours, new ones at every reset, which its constructor
// makes.
class CheckerTexture : public ProceduralTexture<CheckerTexture, 4> {
public:
    CheckerTexture();
    std::u16string getPluginName() const override { return u"TexChecker"; }

    UVWPtr uvw;
    TexturePtr white_color;
    TexturePtr black_color;
    float whiteColorMult;  // in the record only
    float blackColorMult;
    bool tile_u;
    bool tile_v;
};

extern template class TableTextureOf<RampTexture, 11>;
extern template class TableTextureOf<BulgeTexture, 8>;
extern template class TableTextureOf<GridTexture, 6>;
extern template class TableTextureOf<ClothTexture, 7>;
extern template class TableTextureOf<NoiseTexture, 3>;
extern template class TableTextureOf<CheckerTexture, 4>;

}  // namespace OrvaneLumoCore
