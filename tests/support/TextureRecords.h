#pragma once
// The newest records of the textures, read by their golden tests and damaged by the table of every family.
#include <functional>
#include <vector>

#include "support/RecordBytes.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "textures/UVWGenerators.h"

namespace testsupport {

// The newest record of every class with a distinct value in each field, as a
// texture (generators in a UVWTexture, the buffer in a BitmapTexture), and
// the offsets of a child's tag and of a nested record's version tag (0: none).
struct TextureRow {
    int tag;
    RecordBytes bytes;
    const char* golden;
    std::size_t child, inner;
    std::function<void(BaseTexture&)> deepChange = nullptr;  // of a copy, leaving the original as it was
};

inline std::vector<TextureRow> textureRows() {
    const RecordBytes buffer = RecordBytes().version(1).i32(2).f32(0.5f).f32(2.2f).wstr("C:\\maps\\\xC3\xA9t\xC3\xA9.png");
    return {
        // FresnelTexture 2: whiteInverse, blackInverse, fresnel_ior, refract_ior,
        // four multipliers, four optional children. The second child is
        // BlendTexture 2 (color_a, color_b: optional children, each with its
        // multiplier behind it if present; blend_amount) without color_a.
        {1, RecordBytes().version(2).floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 1.3f, 1.7f, 2, 3, 4, 5}).u8(0)
             .u8(1).i32(10).version(2).u8(0).u8(1).acolor(0, 0, 1, 1).f32(0.25f).f32(0.125f)
             .u8(0).u8(1).acolor(1, 1, 0, 0), "fresnel.xml", 54, 58, [](BaseTexture& t) {
             auto& blend = static_cast<BlendTexture&>(*static_cast<FresnelTexture&>(t).refraction_tex);
             static_cast<AColorTexture&>(*blend.color_b).color.a = 0; }},
        {10, RecordBytes().version(2).u8(1).acolor(1, 0, 0, 1).f32(2).u8(1).acolor(0, 0, 1, 1).f32(0.25f).f32(0.125f),
         "blend.xml", 5, 9},
        // InvertTexture 1: texture (tag and record), invert_alpha.
        {9, RecordBytes().version(1).acolor(1, 1, 1, 1).u8(1), "invert.xml", 4, 8},
        // AColorTexture 1: the acolor.
        {5, RecordBytes().version(1).floats({0.25f, 0.5f, 0.75f, 0.125f}), "acolor.xml", 0, 0},
        // UVWTexture 1: generator tag and record. GenPlanarWorldUVW and
        // GenObjectUVW 1: uvwTransform, components record.
        {2, RecordBytes().version(1).i32(0).version(1).floats({1, 0, 0, 0, 1, 0, 0, 0, 1, 7, 8, 9})
             .components({0, 0, 0, 2, 2, 2, 1, 1, 1}, 0, 0, 0), "uvw_planar.xml", 4, 60},
        {2, RecordBytes().version(1).i32(1).version(1).floats({1, 0, 0, 0, 1, 0, 0, 0, 1, 7, 8, 9})
             .components({0, 0, 0, 2, 3, 4, 1, 1, 1}, 1, 0, 0), "uvw_object.xml", 4, 8, [](BaseTexture& t) {
             static_cast<GenObjectUVW&>(*static_cast<UVWTexture&>(t).uvw).uvwComponents.offset.z = 9; }},
        // GenEnvironmentUVW 2: uvw_matrix, mapping_type, components record.
        {2, RecordBytes().version(1).i32(3).version(2).floats({0, 1, 0, 1, 0, 0, 0, 0, -1}).i32(0)
             .components({0, 0, 45, 1, 1, 1, 0, 0, 0}, 0, 1, 0), "uvw_environment.xml", 4, 8},
        // GenChannelUVW 2: uvwTransform, texTransform, wrap_u, wrap_v,
        // uvw_channel, uvwComponents, texComponents. XML shows the components.
        {2, RecordBytes().version(1).i32(4).version(2).floats({1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12})
             .floats({3, 0, 0, 0, 3, 0, 0, 0, 3, 100, 100, 100}).ints({1, 0, 2})
             .components({10, 20, 30, 1, 2, 3, 4, 5, 6}, 1, 0, 1)
             .components({15, 25, 35, 1, 2, 3, 4, 5, 6}, 1, 0, 0), "uvw_channel.xml", 4, 8},
        // BitmapTexture 1: uvw tag, bitmap tag, uvw record, bitmap record,
        // tile. BitmapBuffer 1: filter_type, filter_blur, gamma, file.
        {0, RecordBytes().version(1).ints({0, 0}).placement().append(buffer).u8(0), "bitmap.xml", 8, 116,
         [](BaseTexture& t) { static_cast<BitmapBuffer&>(*static_cast<BitmapTexture&>(t).bitmap).gamma = 3; }},
        // RampTexture 1: uvw, colors, positions, u_wave, v_wave, type, interpolation.
        {11, RecordBytes().version(1).planar().acolor(0.5f, 0.25f, 0.75f, 1).floats({0.25f, 0.5f, 0.75f}).ints({2, 3}),
         "ramp.xml", 4, 116},
        // BulgeTexture 1: uvw, u_width, v_width.
        {8, RecordBytes().version(1).planar().floats({0.2f, 0.3f}), "bulge.xml", 4, 8},
        // GridTexture 2: uvw, line_color, fill_color, lineColorMult,
        // fillColorMult, u_width, v_width.
        {6, RecordBytes().version(2).planar().acolor(1, 0, 0, 1).acolor(0, 1, 0, 0.5f)
             .floats({0.5f, 0.25f, 0.05f, 0.15f}), "grid.xml", 4, 116,
         [](BaseTexture& t) { static_cast<AColorTexture&>(*static_cast<GridTexture&>(t).fill_color).color.r = 3; }},
        // ClothTexture 2: uvw, gap_color, u_color, v_color, u_width, v_width, tile.
        {7, RecordBytes().version(2).planar().floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 0.7f, 0.8f, 0.9f, 1})
             .floats({0.125f, 0.25f, 0.2f, 0.4f}).u8(0), "cloth.xml", 4, 8},
        // NoiseTexture 1: uvw, color1_tex (present), color2_tex (absent), color1,
        // color2, ten reals (persistence to color2_tex_mult), octaves,
        // noiseType, inflection.
        {3, RecordBytes().version(1).planar().u8(1).acolor(0.2f, 0.4f, 0.6f, 0.8f).u8(0)
             .floats({0.9f, 0.8f, 0.7f, 0.1f, 0.2f, 0.3f, 0.5f, 1.5f, 2.5f, 3, 4, 5, 0.25f, 0.125f, 0.75f, 0.875f})
             .ints({4, 1, 1}), "noise.xml", 113, 117},
        // CheckerTexture 2: uvw, white_color, black_color, tile_u, tile_v,
        // whiteColorMult, blackColorMult.
        {4, RecordBytes().version(2).planar().acolor(0.9f, 0.9f, 0.9f, 1).acolor(0.1f, 0.1f, 0.1f, 1)
             .u8(0).u8(1).floats({0.5f, 2}), "checker.xml", 4, 116},
    };
}

}  // namespace testsupport
