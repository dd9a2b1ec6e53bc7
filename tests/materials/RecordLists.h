#pragma once
// Hand-laid records of every version of the material and BRDF layer classes: the golden tests of the materials read
// them all, and the damage table of every family damages the newest of each class.
#include "materials/MaterialTestUtil.h"

namespace mattest {

// Layered 1: layer count, each layer's tag and record; double_sided, layered_value_a; the name inline. 2: the base
// record in place of the name. 3: as 2, layered_value_b and layered_value_c behind layered_value_a. 4: as 3,
// layered_value_d at the end. Only the base record removes control characters.
inline RecordBytes layeredRecord(int version) {
    RecordBytes b;
    b.version(version).u32(2).diffuse("Base", 0.25f).diffuse("Top", 0.75f).i32(2).i32(7);
    if (version >= 3) b.i32(8).i32(9);
    version == 1 ? b.wstr("Wall\n") : b.base(version == 4 ? "Wall" : "Wall\n", "U");
    return version >= 4 ? b.i32(10) : b;
}

// Toon 1: base_mtl; lineWidth, lineWidthTexMult, lineWidthTex; opacity, opacityTexMult, opacityTex; distort,
// distortTexMult, distortTex; lineColor, lineColorTexMult, lineColorTex; zThreshold, traceBias, normalThreshold,
// lineUnits; doSecondary, divideByDist; base record. 2 adds doSilhouetteMult, silhouetteMult.
inline RecordBytes toonRecord(int version) {
    RecordBytes b;
    b.version(version).multiMember("Base").f32(2).f32(3).acolorMember(0.1f).f32(0.5f).f32(4).b8(false).f32(0.25f).f32(5).acolorMember(0.3f);
    b.color(0.2f, 0.4f, 0.6f).f32(6).acolorMember(0.4f).f32(0.9f).f32(0.01f).f32(0.6f).f32(2.5f).b8(false).b8(true).base("Ink");
    return version == 1 ? b : b.b8(true).f32(3);
}

// Linked 1: the id record (version 1: kind, then a text for kinds 0 and 1, a number for kind 2), the material's tag
// and record, the base record.
inline RecordBytes linkedRecord(std::uint32_t kind, const std::string& text, std::int32_t number) {
    RecordBytes b;
    b.version(1).version(1).u32(kind);
    return (kind == 2 ? b.i32(number) : b.wstr(text)).multi("Inside").base("Linked");
}

inline const std::vector<Record>& records() {
    static const std::vector<Record> all = {
        {kMaterialLayeredBRDF, layeredRecord(1), false}, {kMaterialLayeredBRDF, layeredRecord(2), false},
        {kMaterialLayeredBRDF, layeredRecord(3), false}, {kMaterialLayeredBRDF, layeredRecord(4), true},
        // Single 1: single_value_a, single_value_b, the name inline, the layer's tag and record. 2: the two values,
        // the layer, the base record.
        {kMaterialSingleBRDF, RecordBytes().version(1).i32(3).i32(4).wstr("").diffuse("Only", 0.5f), false},
        {kMaterialSingleBRDF, RecordBytes().version(2).i32(5).i32(6).diffuse("Only", 0.5f).base("Single", "S-1"), true},
        // Multi 1: count, each sub-material's tag and record, the name inline. 2: the base record for the name.
        {kMaterialMulti, RecordBytes().version(1).u32(1).multi("Inner").wstr("Outer\t"), false},
        {kMaterialMulti, RecordBytes().version(2).u32(1).multi("Inner").base("Outer", "M-1"), true},
        // Two-sided 1: front, back, translucency_tex, translucency, translucency_tex_mult, force_1sided.
        {kMaterial2Sided, RecordBytes().version(1).multiMember("F").b8(false).acolorMember(0.25f).color(0.1f, 0.2f, 0.3f)
                              .f32(0.5f).b8(true), false},
        // Two-sided 2: as 1, then transparency_tex, transparency, transparency_tex_mult. 3: as 2, then the base record.
        {kMaterial2Sided, RecordBytes().version(2).b8(false).b8(false).b8(false).color(0, 0, 0).f32(1).b8(false).acolorMember(0.75f)
                              .color(0.4f, 0.5f, 0.6f).f32(2), false},
        {kMaterial2Sided, RecordBytes().version(3).b8(false).multiMember("B").acolorMember(0.2f).color(0, 0, 0).f32(1)
                              .b8(false).b8(false).color(0, 0, 0).f32(1).base("Sheet", "uu"), true},
        // Skp two-sided 1: base record, front, back, force_1sided.
        {kMaterialSkp2Sided, RecordBytes().version(1).base("Skp").multiMember("F").multiMember("K").b8(true), true},
        // Bump 1: name (empty: the default name), path of bump_tex, bump_tex_mult, base_mtl as tag and record.
        {kMaterialBump, RecordBytes().version(1).wstr("").wstr("C:/maps/bump.png").f32(0.5f).multi("Base"), false},
        // Bump 2: name (an empty one stays empty), bump_tex_mult, bump_tex as member, base_mtl bare.
        {kMaterialBump, RecordBytes().version(2).wstr("").f32(3).acolorMember(0.5f).multi("Base"), false},
        // Bump 3: bump_tex_mult, bump_tex, base_mtl, base record.
        {kMaterialBump, RecordBytes().version(3).f32(2).acolorMember(0.6f).multi("Base").base("Wall", "u-3"), true},
        // Environment override 1: base record, base_mtl, the textures bg, gi, reflect, refract, then colours,
        // multipliers and switches in that order.
        {kMaterialOverrideEnvironment, RecordBytes().version(1).base("Env").b8(true).layered("Base").acolorMember(0.1f)
                                           .b8(false).acolorMember(0.3f).acolorMember(0.4f).color(1, 0, 0).color(0, 1, 0)
                                           .color(0, 0, 1).color(1, 1, 0).f32(2).f32(3).f32(4).f32(5).b8(true).b8(false)
                                           .b8(false).b8(true), true},
        // Displaced 1: base record, base_mtl, displace_tex, displace_tex_mult. 2: as 1, then displace_shift,
        // displace_edge_length, the four integers.
        {kMaterialDisplaced, RecordBytes().version(1).base("D1").b8(true).layered("Base").b8(false).f32(3), false},
        {kMaterialDisplaced, RecordBytes().version(2).base("D").b8(true).layered("Base").acolorMember(0.5f).f32(2).f32(0.25f).f32(8)
                                 .i32(64).i32(0).i32(0).i32(0), true},
        // Object exclusion 1: mode, base_mtl, the object names; no base record. 2: as 1, then the base record. 3: as
        // 2, then short_circuit.
        {kMaterialObjectExclusion, RecordBytes().version(1).i32(1).multiMember("Base").u32(2).wstr("Chair").wstr("Table"), false},
        {kMaterialObjectExclusion, RecordBytes().version(2).i32(0).b8(false).u32(0).base("Ex2"), false},
        {kMaterialObjectExclusion, RecordBytes().version(3).i32(7).multiMember("Base").u32(1).wstr("Lamp").base("Ex3")
                                       .b8(false), true},
        // Angle blend 1: base record, mtl_one, mtl_two, start_angle, stop_angle.
        {kMaterialAngleBlend, RecordBytes().version(1).base("Blend").b8(false).multiMember("Two").f32(10).f32(20), true},
        // Alpha contribution 1: base record, base_mtl, alpha_tex, alpha_tex_mult, alpha.
        {kMaterialAlphaContribution, RecordBytes().version(1).base("Alpha").multiMember("Base").acolorMember(0.5f).f32(2)
                                         .f32(0.25f), true},
        {kMaterialToon, toonRecord(1), false}, {kMaterialToon, toonRecord(2), true},
        // Reference 1: base record, target_uuid. 2: as 1, then the embedded copy as an optional member.
        {kMaterialReference, RecordBytes().version(1).base("Ref", "own").wstr("target"), false},
        {kMaterialReference, RecordBytes().version(2).base("Ref2").wstr("t").multiMember("Copy"), false},
        // Instance 1: the base record alone.
        {kMaterialInstance, RecordBytes().version(1).base("Wood", "u"), true},
        {kMaterialLinked, linkedRecord(0, "obj-0", 0), true}, {kMaterialLinked, linkedRecord(1, "", 0), true},
        {kMaterialLinked, linkedRecord(1, "Node", 0), true}, {kMaterialLinked, linkedRecord(2, "", 42), true},
    };
    return all;
}

// Rows 1 to 3 of every Glass_BRDF record: color, fog_color; ior, ior_second, cutoff, fog_color_mult, glossiness;
// depth_value, subdivs, affect_shadows, affect_alpha.
inline RecordBytes glassHead(int version) {
    return RecordBytes().version(version).color(0.1f, 0.2f, 0.3f).color(0.4f, 0.5f, 0.6f)
        .f32(1.4f).f32(1.6f).f32(0.002f).f32(2).f32(0.7f).i32(3).i32(12).i32(1).i32(4);
}
// Rows 5 to 7: translucency_on; thickness, scatter_coeff, scatter_direction, translucency_tex_mult; translucency.
inline RecordBytes& translucency(RecordBytes& b) { return b.i32(1).f32(50).f32(0.5f).f32(0.25f).f32(0.44f).color(0.7f, 0.8f, 0.9f); }

// The head H of old glossy records: color, reflection; hilightGlossiness, reflectionGlossiness; Fresnel f32; cutoff;
// subdivs; Fresnel i32; back_side, depth_value.
inline RecordBytes glossyHead(int version, float fresnelIor, std::int32_t fresnelSwitch) {
    return RecordBytes().version(version).color(0.9f, 0.8f, 0.7f).color(0.6f, 0.5f, 0.4f).f32(0.3f).f32(0.35f)
        .f32(fresnelIor).f32(0.02f).i32(9).i32(fresnelSwitch).i32(1).i32(6);
}

// The head of old Mirror_BRDF records: color, reflection; transparency_tex_mult; Fresnel f32; cutoff; Fresnel i32;
// mirror_value.
inline RecordBytes mirrorHead(int version, float fresnelIor, std::int32_t fresnelSwitch) {
    return RecordBytes().version(version).color(0.2f, 0.3f, 0.4f).color(0.5f, 0.6f, 0.7f).f32(0.8f).f32(fresnelIor)
        .f32(0.03f).i32(fresnelSwitch).i32(4);
}

// Diffuse_BRDF records start with color, transparency; color_tex_mult, transparency_tex_mult.
inline RecordBytes diffuseHead(int version) {
    return RecordBytes().version(version).color(0.1f, 0.2f, 0.3f).color(0.4f, 0.5f, 0.6f).f32(0.7f).f32(0.8f);
}

// Light_BRDF records from 2 on start with color, transparency; intensity, light_value, color_tex_mult,
// transparency_tex_mult.
inline RecordBytes lightHead(int version) {
    return RecordBytes().version(version).color(0.9f, 0.8f, 0.7f).color(0.1f, 0.2f, 0.3f).f32(3).f32(4).f32(0.25f).f32(0.5f);
}

inline const std::vector<Record>& layerRecords() {
    static const std::vector<Record> all = {
        // Glass 1: rows 1 to 3.
        {kGlassBrdf, glassHead(1), false},
        // Glass 2: rows 1 to 3; transparency_tex_mult, glossiness_tex_mult, ior_tex_mult; paths of transparency_tex,
        // glossiness_tex, ior_tex (empty: no texture).
        {kGlassBrdf, glassHead(2).f32(0.11f).f32(0.22f).f32(0.33f).wstr("t.png").wstr("").wstr("i.png"), false},
        // Glass 3: as 2; rows 5 to 7; path of translucency_tex.
        {kGlassBrdf, translucency(glassHead(3).f32(0.11f).f32(0.22f).f32(0.33f).wstr("").wstr("g.png").wstr(""))
                         .wstr("tl.png"), false},
        // Glass 4: the three multipliers of 2; rows 5 to 7; members transparency_tex, glossiness_tex, ior_tex,
        // translucency_tex.
        {kGlassBrdf, translucency(glassHead(4).f32(0.11f).f32(0.22f).f32(0.33f)).acolorMember(0.1f).b8(false).acolorMember(0.3f)
                         .acolorMember(0.4f), false},
        // Glass 5: rows 1 to 3; color_tex_mult, glossiness_tex_mult, ior_tex_mult; rows 5 to 7; members color_tex,
        // glossiness_tex, ior_tex, translucency_tex; transparency; transparency_tex_mult; member transparency_tex.
        {kGlassBrdf, translucency(glassHead(5).f32(0.55f).f32(0.22f).f32(0.33f)).acolorMember(0.5f).b8(false).b8(false).acolorMember(0.4f)
                         .color(0.3f, 0.2f, 0.1f).f32(0.66f).acolorMember(0.6f), false},
        // Glass 6 (current): as 5, then the base record version 4 (name, three flags).
        {kGlassBrdf, translucency(glassHead(6).f32(0.55f).f32(0.22f).f32(0.33f)).acolorMember(0.5f).b8(false).b8(false).b8(false)
                         .color(0.3f, 0.2f, 0.1f).f32(0.66f).b8(false).version(4).wstr("Clear").b8(false).b8(true).b8(true), true},
        // Glossy 1: H, then the Fresnel rule (on, off: the default Fresnel texture is gone).
        {kPhongBrdf, glossyHead(1, 1.8f, 1), false},
        {kPhongBrdf, glossyHead(1, 1.8f, 0), false},
        // Glossy 2: H; color_tex_mult, hilightGlossiness_tex_mult, reflectionGlossiness_tex_mult; paths of color_tex,
        // hilightGlossiness_tex, reflectionGlossiness_tex; Fresnel rule (on: any switch but 0).
        {kPhongBrdf, glossyHead(2, 2.0f, -1).f32(0.1f).f32(0.2f).f32(0.3f).wstr("c.png").wstr("h.png").wstr(""), false},
        // Glossy 3: as 2; anisotropy, anisotropy_rotation; Fresnel rule.
        {kPhongBrdf, glossyHead(3, 2.0f, 0).f32(0.1f).f32(0.2f).f32(0.3f).wstr("").wstr("").wstr("r.png").f32(0.75f).f32(45), false},
        // Glossy 4: H; the three multipliers; members color_tex, hilightGlossiness_tex, reflectionGlossiness_tex;
        // anisotropy, anisotropy_rotation; Fresnel rule.
        {kPhongBrdf, glossyHead(4, 1.3f, 1).f32(0.1f).f32(0.2f).f32(0.3f).acolorMember(0.1f).b8(false).acolorMember(0.3f)
                         .f32(0.75f).f32(45), false},
        // Glossy 5: as 4; base record (here version 2: name, layer_flag_a); Fresnel rule.
        {kPhongBrdf, glossyHead(5, 1.3f, 0).f32(0.1f).f32(0.2f).f32(0.3f).b8(false).b8(false).b8(false).f32(0.75f).f32(45)
                         .version(2).wstr("Gloss").b8(false), false},
        // Glossy 6 (current): color, reflection; hilightGlossiness, reflectionGlossiness, cutoff; subdivs, back_side,
        // depth_value; the four multipliers (transparency_tex_mult last); members color_tex, hilightGlossiness_tex,
        // reflectionGlossiness_tex, transparency_tex; anisotropy, anisotropy_rotation; base record version 4.
        {kPhongBrdf, RecordBytes().version(6).color(0.9f, 0.8f, 0.7f).color(0.6f, 0.5f, 0.4f).f32(0.3f).f32(0.35f).f32(0.02f)
                         .i32(9).i32(1).i32(6).f32(0.1f).f32(0.2f).f32(0.3f).f32(0.4f).b8(false).acolorMember(0.2f).b8(false).b8(false)
                         .f32(0.75f).f32(45).version(4).wstr("Gloss").b8(true).b8(false).b8(true), true},
        // Mirror 1: head; path of transparency_tex; Fresnel rule (on: the Fresnel texture replaces the path).
        {kMirrorBrdf, mirrorHead(1, 1.7f, 0).wstr("m.png"), false},
        {kMirrorBrdf, mirrorHead(1, 1.7f, 3).wstr("m.png"), false},
        // Mirror 2: head; path of transparency_tex; color_tex_mult; path of color_tex.
        {kMirrorBrdf, mirrorHead(2, 1.7f, 0).wstr("first.png").f32(0.9f).wstr("second.png"), false},
        // Mirror 3: head; color_tex_mult; members transparency_tex, color_tex; Fresnel rule.
        {kMirrorBrdf, mirrorHead(3, 1.25f, 1).f32(0.9f).acolorMember(0.1f).acolorMember(0.2f), false},
        // Mirror 4: as 3; base record version 3 (name, layer_flag_a, layer_flag_b).
        {kMirrorBrdf, mirrorHead(4, 1.25f, 0).f32(0.9f).acolorMember(0.1f).b8(false).version(3).wstr("Shiny").b8(true).b8(true), false},
        // Mirror 5 (current): color, reflection; transparency_tex_mult, cutoff; mirror_value; color_tex_mult; members
        // transparency_tex, color_tex; base record.
        {kMirrorBrdf, RecordBytes().version(5).color(0.2f, 0.3f, 0.4f).color(0.5f, 0.6f, 0.7f).f32(0.8f).f32(0.03f).i32(4)
                          .f32(0.9f).b8(false).acolorMember(0.2f).version(4).wstr("Shiny").b8(true).b8(false).b8(false), true},
        // Diffuse 1: head; paths of color_tex, transparency_tex. 2: head; members color_tex, transparency_tex. 3: as
        // 2; base record (version 1: name only). 4 (current): as 3; use_color_tex_alpha_as_transparency.
        {kDiffuseBrdf, diffuseHead(1).wstr("").wstr("alpha.png"), false},
        {kDiffuseBrdf, diffuseHead(2).acolorMember(0.3f).b8(false), false},
        {kDiffuseBrdf, diffuseHead(3).b8(false).acolorMember(0.4f).version(1).wstr("Matte"), false},
        {kDiffuseBrdf, diffuseHead(4).b8(false).b8(false).version(4).wstr("Matte").b8(true).b8(false).b8(false).b8(true), true},
        // Light 1: color; intensity, transparency_tex_mult; path of transparency_tex.
        {kLightBrdf, RecordBytes().version(1).color(0.9f, 0.8f, 0.7f).f32(3).f32(0.5f).wstr("glow.png"), false},
        // Light 2: head; paths of color_tex, transparency_tex. 3: head; members color_tex, transparency_tex. 4: as 3;
        // base record. 5 (current): as 4; doubleSided as i32.
        {kLightBrdf, lightHead(2).wstr("c.png").wstr("t.png"), false},
        {kLightBrdf, lightHead(3).b8(false).acolorMember(0.6f), false},
        {kLightBrdf, lightHead(4).acolorMember(0.6f).b8(false).version(4).wstr("Lamp").b8(false).b8(false).b8(false), false},
        {kLightBrdf, lightHead(5).b8(false).b8(false).version(4).wstr("Lamp").b8(true).b8(false).b8(false).i32(0), true},
    };
    return all;
}

}  // namespace mattest
