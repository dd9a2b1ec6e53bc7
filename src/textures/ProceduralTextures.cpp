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

typedef RampTexture Ramp;
// "colors" is one reference and "positions" one float, not lists.
const RecordRow<Ramp> kRamp[] = {
    {&Ramp::uvw, "uvwgen"},
    required<Ramp>({&Ramp::colors, "colors"}),
    RecordRow<Ramp>(&Ramp::positions, "positions").byDefault(0.5),
    {&Ramp::u_wave, "u_wave"},
    {&Ramp::v_wave, "v_wave"},
    {&Ramp::type, "type"},
    RecordRow<Ramp>(&Ramp::interpolation, "interpolation").byDefault(1),
};

// ---- BulgeTexture: one version ----

typedef BulgeTexture Bulge;
const RecordRow<Bulge> kBulge[] = {
    {&Bulge::uvw, "uvwgen"},
    RecordRow<Bulge>(&Bulge::u_width, "u_width").byDefault(0.1),
    RecordRow<Bulge>(&Bulge::v_width, "v_width").byDefault(0.1),
};

// ---- GridTexture: version 2 adds the multipliers ahead of the widths ----

typedef GridTexture Grid;
const RecordRow<Grid> kGrid[] = {
    {&Grid::uvw, "uvwgen"},
    required<Grid>({&Grid::line_color, "line_color"}),
    required<Grid>({&Grid::fill_color, "fill_color"}),
    RecordRow<Grid>(&Grid::lineColorMult, 2).byDefault(1),
    RecordRow<Grid>(&Grid::fillColorMult, 2).byDefault(1),
    RecordRow<Grid>(&Grid::u_width, "u_width").byDefault(0.1),
    RecordRow<Grid>(&Grid::v_width, "v_width").byDefault(0.1),
};

// ---- ClothTexture: version 2 adds `tile` ----

typedef ClothTexture Cloth;
// One field drives both directions.
const RecordRow<Cloth> kCloth[] = {
    {&Cloth::uvw, "uvwgen"},
    RecordRow<Cloth>(&Cloth::gap_color, "gap_color").byDefault(AColor(1, 1, 1, 1)),
    RecordRow<Cloth>(&Cloth::u_color, "u_color").byDefault(AColor(0, 0, 0, 1)),
    RecordRow<Cloth>(&Cloth::v_color, "v_color").byDefault(AColor(1, 1, 1, 1)),
    RecordRow<Cloth>(&Cloth::u_width, "u_width").byDefault(0.1),
    RecordRow<Cloth>(&Cloth::v_width, "v_width").byDefault(0.1),
    RecordRow<Cloth>(&Cloth::tile, 2, "tile_u").byDefault(true),
    RecordRow<Cloth>::shownAgain(&Cloth::tile, "tile_v"),
};

// ---- NoiseTexture: one version ----

typedef NoiseTexture Noise;
typedef RecordRow<Noise> NoiseRow;
const NoiseRow kNoise[] = {
    {&Noise::uvw, "uvwgen"},
    optional<Noise>({&Noise::color1_tex, "color1_tex"}),
    optional<Noise>({&Noise::color2_tex, "color2_tex"}),
    NoiseRow(&Noise::color1, "color1").byDefault(kWhite),
    {&Noise::color2, "color2"},
    NoiseRow(&Noise::persistence, "persistence").byDefault(1),
    NoiseRow(&Noise::amplitude_ratio, "amplitude_ratio").byDefault(1),
    NoiseRow(&Noise::frequency_ratio, "frequency_ratio").byDefault(2),
    NoiseRow(&Noise::frequency1, "frequency1").byDefault(1),
    NoiseRow(&Noise::amplitude1, "amplitude1").byDefault(1),
    NoiseRow(&Noise::size, "size").byDefault(1),
    NoiseRow(&Noise::mix_ratio, "mix_ratio").byDefault(0.5),
    {&Noise::bias, "bias"},
    NoiseRow(&Noise::color1_tex_mult, "color1_tex_mult").byDefault(1),
    NoiseRow(&Noise::color2_tex_mult, "color2_tex_mult").byDefault(1),
    NoiseRow(&Noise::octaves, "octaves").byDefault(3),
    {&Noise::noiseType, "noiseType"},
    {&Noise::inflection, "inflection"},
};

// ---- CheckerTexture: version 2 adds the multipliers behind the flags ----

typedef CheckerTexture Checker;
const RecordRow<Checker> kChecker[] = {
    {&Checker::uvw, "uvwgen"},
    required<Checker>({&Checker::white_color, "white_color"}),
    required<Checker>({&Checker::black_color, "black_color"}),
    RecordRow<Checker>(&Checker::tile_u, "tile_u").byDefault(true),
    RecordRow<Checker>(&Checker::tile_v, "tile_v").byDefault(true),
    RecordRow<Checker>(&Checker::whiteColorMult, 2).byDefault(1),
    RecordRow<Checker>(&Checker::blackColorMult, 2).byDefault(1),
};

}  // namespace

CheckerTexture::CheckerTexture()
    : uvw(defaultPlanarUVW()),
      white_color(new AColorTexture(AColor(1, 1, 1, 1))),
      black_color(new AColorTexture(AColor(0, 0, 0, 1))) {
    setTableDefaults();
}

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
