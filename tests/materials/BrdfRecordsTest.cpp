// Records of the six BRDF layers: every version laid by hand, comparison, copies, damaged data.
#include "materials/MaterialTestUtil.h"

using namespace mattest;

namespace {

// Rows 1 to 3 of every Glass_BRDF record: color, fog_color; ior, ior_second, cutoff, fog_color_mult, glossiness;
// depth_value, subdivs, affect_shadows, affect_alpha.
RecordBytes glassHead(int version) {
    return RecordBytes().version(version).color(0.1f, 0.2f, 0.3f).color(0.4f, 0.5f, 0.6f)
        .f32(1.4f).f32(1.6f).f32(0.002f).f32(2).f32(0.7f).i32(3).i32(12).i32(1).i32(4);
}
// Rows 5 to 7: translucency_on; thickness, scatter_coeff, scatter_direction, translucency_tex_mult; translucency.
RecordBytes& translucency(RecordBytes& b) { return b.i32(1).f32(50).f32(0.5f).f32(0.25f).f32(0.44f).color(0.7f, 0.8f, 0.9f); }

// The head H of old glossy records: color, reflection; hilightGlossiness, reflectionGlossiness; Fresnel f32; cutoff;
// subdivs; Fresnel i32; back_side, depth_value.
RecordBytes glossyHead(int version, float fresnelIor, std::int32_t fresnelSwitch) {
    return RecordBytes().version(version).color(0.9f, 0.8f, 0.7f).color(0.6f, 0.5f, 0.4f).f32(0.3f).f32(0.35f)
        .f32(fresnelIor).f32(0.02f).i32(9).i32(fresnelSwitch).i32(1).i32(6);
}

// The head of old Mirror_BRDF records: color, reflection; transparency_tex_mult; Fresnel f32; cutoff; Fresnel i32;
// mirror_value.
RecordBytes mirrorHead(int version, float fresnelIor, std::int32_t fresnelSwitch) {
    return RecordBytes().version(version).color(0.2f, 0.3f, 0.4f).color(0.5f, 0.6f, 0.7f).f32(0.8f).f32(fresnelIor)
        .f32(0.03f).i32(fresnelSwitch).i32(4);
}

// Diffuse_BRDF records start with color, transparency; color_tex_mult, transparency_tex_mult.
RecordBytes diffuseHead(int version) {
    return RecordBytes().version(version).color(0.1f, 0.2f, 0.3f).color(0.4f, 0.5f, 0.6f).f32(0.7f).f32(0.8f);
}

// Light_BRDF records from 2 on start with color, transparency; intensity, light_value, color_tex_mult,
// transparency_tex_mult.
RecordBytes lightHead(int version) {
    return RecordBytes().version(version).color(0.9f, 0.8f, 0.7f).color(0.1f, 0.2f, 0.3f).f32(3).f32(4).f32(0.25f).f32(0.5f);
}

const std::vector<Record>& layerRecords() {
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

// The flags and the numbers that no XML shows.
std::string hidden(const Base_BRDF& l) {
    std::ostringstream s;
    s << "flags " << l.layer_flag_a << l.layer_flag_b << l.layer_flag_c;
    if (auto g = dynamic_cast<const Glass_BRDF*>(&l)) s << " ior_second " << g->ior_second << " depth " << g->depth_value;
    if (auto p = dynamic_cast<const BaseGlossy_BRDF*>(&l)) s << " depth " << p->depth_value;
    if (auto m = dynamic_cast<const Mirror_BRDF*>(&l)) s << " mirror_value " << m->mirror_value;
    if (auto e = dynamic_cast<const Light_BRDF*>(&l)) s << " light_value " << e->light_value;
    return s.str();
}

TEST(LayerRecords, EveryVersionLoads) {
    // Each record loaded into a new layer and written under a url that names the record and what no XML shows: the
    // golden tells where every value landed. Blinn_BRDF reads the glossy records as Phong_BRDF does.
    auto show = [](const BrdfPtr& l, const std::string& what, const RecordBytes& bytes) {
        auto xml = [&what](const BrdfPtr& layer) { return xmlOf(*layer, utf8ToWide("/" + what + " " + hidden(*layer))); };
        EXPECT_TRUE(l->clone()->isEqual(l));  // a clone copies every field
        const BrdfPtr blinn = createBrdf(kBlinnBrdf);
        QuickArchive again = bytes.archive();
        EXPECT_TRUE(l->getType() != kPhongBrdf || (blinn->load(again) && xml(blinn) == xml(l)));
        return xml(l);
    };
    expectGolden("materials/golden/layer_records.xml", loadEach<BrdfPtr>(layerRecords(), createBrdf, show));

    // Glass resets only the base part before reading.
    Glass_BRDF used;
    used.name = u"Used", used.thickness = 7, used.layer_flag_b = true;
    QuickArchive ar = layerRecords()[0].bytes.archive();
    ASSERT_TRUE(used.load(ar));
    EXPECT_EQ(std::make_tuple(used.name, used.layer_flag_b, used.thickness), std::make_tuple(u"BRDFRefraction", false, 7.f));
}

// Each byte of a current record changed alone (its low bit flipped): where the
// layer still reads the whole record, it differs from the layer of the
// unchanged record, unless the change only reached the base record's name or
// flags, which take no part in the comparison.
TEST(LayerEquality, EveryByteOfACurrentRecordCounts) {
    for (const Record& r : layerRecords()) {
        if (!r.current) continue;
        const BrdfPtr a = loadedInto(createBrdf(r.tag), r.bytes);
        int compared = 0;
        for (std::size_t k = 4; k < r.bytes.size(); ++k) {
            RecordBytes changed = r.bytes;
            changed.data[k] ^= 1;
            const BrdfPtr b = createBrdf(r.tag);
            QuickArchive ar = changed.archive();
            if (!b->load(ar) || ar.getReadPosition() != changed.size()) continue;
            const bool baseOnly = std::make_tuple(b->name, b->layer_flag_a, b->layer_flag_b, b->layer_flag_c) !=
                                  std::make_tuple(a->name, a->layer_flag_a, a->layer_flag_b, a->layer_flag_c);
            EXPECT_EQ(baseOnly, a->isEqual(b)) << "class " << r.tag << ", byte " << k;
            EXPECT_EQ(baseOnly, b->isEqual(a)) << "class " << r.tag << ", byte " << k;
            ++compared;
        }
        EXPECT_GT(compared, 20) << "class " << r.tag;
        EXPECT_FALSE(a->isEqual(BrdfPtr()));
    }
}

TEST(LayerEquality, ClonesShareNothing) {
    EXPECT_FALSE(Phong_BRDF().isEqual(BrdfPtr(new Blinn_BRDF)));  // same content, other class
    typedef Glass_BRDF G;
    G g;
    g.name = u"Kept", g.layer_flag_c = true;
    g.color_tex = g.transparency_tex = g.glossiness_tex = g.ior_tex = g.translucency_tex = acolor(0, 0, 0);
    const BrdfPtr copy = g.clone();
    const G& c = static_cast<const G&>(*copy);
    EXPECT_EQ(std::make_tuple(c.name, c.layer_flag_c), std::make_tuple(u"Kept", true));
    for (TexturePtr G::*t : {&G::color_tex, &G::transparency_tex, &G::glossiness_tex, &G::ior_tex, &G::translucency_tex})
        EXPECT_NE(c.*t, g.*t);
    EXPECT_TRUE(c.isEqual(BrdfPtr(new G(g))));
    // The default Fresnel texture of a new layer: one each, cloned by clone.
    Mirror_BRDF m;
    Phong_BRDF p;
    EXPECT_NE(static_cast<Mirror_BRDF&>(*m.clone()).transparency_tex, m.transparency_tex);
    EXPECT_NE(p.transparency_tex, Phong_BRDF().transparency_tex);
    EXPECT_TRUE(p.transparency_tex->isEqual(TexturePtr(new FresnelTexture)));
    // Two owners of one texture save two copies.
    g.transparency_tex = g.glossiness_tex = g.translucency_tex = TexturePtr();
    const boost::shared_ptr<G> back = roundTrip(g);
    ASSERT_TRUE(back->color_tex && back->ior_tex);
    EXPECT_NE(back->color_tex, back->ior_tex);
    EXPECT_TRUE(back->isEqual(BrdfPtr(new G(g))));
}

TEST(LayerRecords, BadTagsAndChildrenFail) {
    for (std::uint32_t tag : {0u, 3u, 5u, 6u, 7u, 64u, 0xFFFFFFFFu}) EXPECT_FALSE(createBrdf(tag)) << tag;
    // Refused version tags fail and leave the reset state.
    const std::pair<std::uint32_t, std::uint32_t> cases[] = {
        {kGlassBrdf, 0x70000},  {kGlassBrdf, 0x60001},   {kGlassBrdf, 0},         {kPhongBrdf, 0x70000}, {kBlinnBrdf, 0x10001},
        {kMirrorBrdf, 0x60000}, {kDiffuseBrdf, 0x50000}, {kLightBrdf, 0x60000}, {kLightBrdf, 0}};
    for (const auto& c : cases) {
        const BrdfPtr l = createBrdf(c.first);
        l->name = u"Used";
        QuickArchive ar = RecordBytes().u32(c.second).archive();
        EXPECT_FALSE(l->load(ar)) << c.first << " " << std::hex << c.second;
        EXPECT_EQ(l->name, l->getPluginName());
    }
    // Diffuse_BRDF records whose color_tex names texture tag 13; whose AColor child has a refused version; that end
    // inside the base record's tag; whose base record has a version the layer doesn't know.
    EXPECT_FALSE(loaded<Diffuse_BRDF>(diffuseHead(2).b8(true).i32(13), false)->color_tex);
    loaded<Diffuse_BRDF>(diffuseHead(2).b8(true).i32(5).version(2), false);
    loaded<Diffuse_BRDF>(diffuseHead(3).b8(false).b8(false), false);
    loaded<Diffuse_BRDF>(diffuseHead(3).b8(false).b8(false).version(5), false);
    // The base record's name loses its control characters.
    EXPECT_EQ(loaded<Diffuse_BRDF>(diffuseHead(3).b8(false).b8(false).version(1).wstr("\tLine\nFeed"))->name, u"LineFeed");
}

}  // namespace
