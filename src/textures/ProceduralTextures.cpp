#include "textures/ProceduralTextures.h"

#include <boost/make_shared.hpp>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "textures/BasicTextures.h"
#include "textures/TextureFrame.h"
#include "textures/TextureRows.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

namespace {

template <class C>
constexpr RecordRow<C> optional(RecordRow<C> row) {
    return row.coded(kOptionalChild);
}

// ---- RampTexture: one version ----

// "colors" is one reference and "positions" one float, not lists.
const RecordRow<RampTexture> kRamp[] = {
    {&RampTexture::uvw, "uvwgen"},
    required<RampTexture>({&RampTexture::colors, "colors"}),
    {&RampTexture::positions, "positions"},
    {&RampTexture::u_wave, "u_wave"},
    {&RampTexture::v_wave, "v_wave"},
    {&RampTexture::type, "type"},
    {&RampTexture::interpolation, "interpolation"},
};

// ---- BulgeTexture: one version ----

const RecordRow<BulgeTexture> kBulge[] = {
    {&BulgeTexture::uvw, "uvwgen"},
    {&BulgeTexture::u_width, "u_width"},
    {&BulgeTexture::v_width, "v_width"},
};

// ---- GridTexture: version 2 adds the multipliers ahead of the widths ----

const RecordRow<GridTexture> kGrid[] = {
    {&GridTexture::uvw, "uvwgen"},
    required<GridTexture>({&GridTexture::line_color, "line_color"}),
    required<GridTexture>({&GridTexture::fill_color, "fill_color"}),
    {&GridTexture::lineColorMult, 2},
    {&GridTexture::fillColorMult, 2},
    {&GridTexture::u_width, "u_width"},
    {&GridTexture::v_width, "v_width"},
};

// ---- ClothTexture: version 2 adds `tile` ----

// One field drives both directions.
const RecordRow<ClothTexture> kCloth[] = {
    {&ClothTexture::uvw, "uvwgen"},
    {&ClothTexture::gap_color, "gap_color"},
    {&ClothTexture::u_color, "u_color"},
    {&ClothTexture::v_color, "v_color"},
    {&ClothTexture::u_width, "u_width"},
    {&ClothTexture::v_width, "v_width"},
    {&ClothTexture::tile, 2, "tile_u"},
    RecordRow<ClothTexture>::shownAgain(&ClothTexture::tile, "tile_v"),
};

// ---- NoiseTexture: one version ----

const RecordRow<NoiseTexture> kNoise[] = {
    {&NoiseTexture::uvw, "uvwgen"},
    optional<NoiseTexture>({&NoiseTexture::color1_tex, "color1_tex"}),
    optional<NoiseTexture>({&NoiseTexture::color2_tex, "color2_tex"}),
    {&NoiseTexture::color1, "color1"},
    {&NoiseTexture::color2, "color2"},
    {&NoiseTexture::persistence, "persistence"},
    {&NoiseTexture::amplitude_ratio, "amplitude_ratio"},
    {&NoiseTexture::frequency_ratio, "frequency_ratio"},
    {&NoiseTexture::frequency1, "frequency1"},
    {&NoiseTexture::amplitude1, "amplitude1"},
    {&NoiseTexture::size, "size"},
    {&NoiseTexture::mix_ratio, "mix_ratio"},
    {&NoiseTexture::bias, "bias"},
    {&NoiseTexture::color1_tex_mult, "color1_tex_mult"},
    {&NoiseTexture::color2_tex_mult, "color2_tex_mult"},
    {&NoiseTexture::octaves, "octaves"},
    {&NoiseTexture::noiseType, "noiseType"},
    {&NoiseTexture::inflection, "inflection"},
};

// ---- CheckerTexture: version 2 adds the multipliers behind the flags ----

const RecordRow<CheckerTexture> kChecker[] = {
    {&CheckerTexture::uvw, "uvwgen"},
    required<CheckerTexture>({&CheckerTexture::white_color, "white_color"}),
    required<CheckerTexture>({&CheckerTexture::black_color, "black_color"}),
    {&CheckerTexture::tile_u, "tile_u"},
    {&CheckerTexture::tile_v, "tile_v"},
    {&CheckerTexture::whiteColorMult, 2},
    {&CheckerTexture::blackColorMult, 2},
};

}  // namespace

CheckerTexture::CheckerTexture()
    : uvw(defaultPlanarUVW()),
      white_color(new AColorTexture(AColor(1, 1, 1, 1))),
      black_color(new AColorTexture(AColor(0, 0, 0, 1))) {}

// ---- the tables: the version save writes and the rows ----

TextureTable<RampTexture> textureTable(const RampTexture&) { return {1, rowSpan(kRamp)}; }
TextureTable<BulgeTexture> textureTable(const BulgeTexture&) { return {1, rowSpan(kBulge)}; }
TextureTable<GridTexture> textureTable(const GridTexture&) { return {2, rowSpan(kGrid)}; }
TextureTable<ClothTexture> textureTable(const ClothTexture&) { return {2, rowSpan(kCloth)}; }
TextureTable<NoiseTexture> textureTable(const NoiseTexture&) { return {1, rowSpan(kNoise)}; }
TextureTable<CheckerTexture> textureTable(const CheckerTexture&) { return {2, rowSpan(kChecker)}; }

template class TableTextureOf<RampTexture, 11>;
template class TableTextureOf<BulgeTexture, 8>;
template class TableTextureOf<GridTexture, 6>;
template class TableTextureOf<ClothTexture, 7>;
template class TableTextureOf<NoiseTexture, 3>;
template class TableTextureOf<CheckerTexture, 4>;

}  // namespace OrvaneLumoCore
