// Records of the six BRDF layers: every old version laid by hand and compared
// after loading with the layer it must give, the current record's bytes, the
// Fresnel pair, comparison, copies and damaged data.
#include "materials/MaterialTestUtil.h"

using namespace mattest;

namespace {

TexturePtr fresnel(float ior) {
    boost::shared_ptr<FresnelTexture> f(new FresnelTexture);
    f->fresnel_ior = ior;
    return f;
}
TexturePtr red(float r) { return acolor(r, 0, 0); }  // what RecordBytes::acolor lays

void flags(Base_BRDF& l, const char16_t* name, bool a, bool b, bool c) {
    l.name = name, l.layer_flag_a = a, l.layer_flag_b = b, l.layer_flag_c = c;
}

// Loads `bytes` into a new L and compares it with a new L changed by `want`:
// the content by isEqual (every field counts, see EveryFieldCounts), the base
// part field by field. The current record (`current`) must save back to the same bytes.
template <class L>
void expectLayer(const RecordBytes& bytes, const std::function<void(L&)>& want, bool current = false) {
    SCOPED_TRACE("record version " + std::to_string(bytes.bytes()[2]));
    L expected;
    want(expected);
    const boost::shared_ptr<L> got = loaded<L>(bytes);
    EXPECT_TRUE(got->isEqual(BrdfPtr(new L(expected))));
    EXPECT_EQ(std::make_tuple(got->name, got->layer_flag_a, got->layer_flag_b, got->layer_flag_c),
              std::make_tuple(expected.name, expected.layer_flag_a, expected.layer_flag_b, expected.layer_flag_c));
    if (!current) return;
    QuickArchive out;
    ASSERT_TRUE(got->save(out));
    EXPECT_EQ(savedBytes(out), bytes.bytes());
}

// ---- Glass_BRDF ----------------------------------------------------------------------------

// Rows 1 to 3 of every Glass_BRDF record: color, fog_color; ior, ior_second,
// cutoff, fog_color_mult, glossiness; depth_value, subdivs, affect_shadows, affect_alpha.
RecordBytes& glassHead(RecordBytes& b, int version) {
    return b.version(version).color(0.1f, 0.2f, 0.3f).color(0.4f, 0.5f, 0.6f)
        .f32(1.4f).f32(1.6f).f32(0.002f).f32(2).f32(0.7f).i32(3).i32(12).i32(1).i32(4);
}
void glassHead(Glass_BRDF& g) {
    g.color = Color(0.1f, 0.2f, 0.3f), g.fog_color = Color(0.4f, 0.5f, 0.6f);
    g.ior = 1.4f, g.ior_second = 1.6f, g.cutoff = 0.002f, g.fog_color_mult = 2, g.glossiness = 0.7f;
    g.depth_value = 3, g.subdivs = 12, g.affect_shadows = 1, g.affect_alpha = 4;
}
// Rows 5 to 7: translucency_on; thickness, scatter_coeff, scatter_direction,
// translucency_tex_mult; translucency.
RecordBytes& translucency(RecordBytes& b) { return b.i32(1).f32(50).f32(0.5f).f32(0.25f).f32(0.44f).color(0.7f, 0.8f, 0.9f); }
void translucency(Glass_BRDF& g) {
    g.translucency_on = 1, g.thickness = 50, g.scatter_coeff = 0.5f, g.scatter_direction = 0.25f;
    g.translucency_tex_mult = 0.44f, g.translucency = Color(0.7f, 0.8f, 0.9f);
}

TEST(LayerRecords, GlassVersions) {
    typedef Glass_BRDF G;
    RecordBytes v1, v2, v3, v4, v5, v6;
    // 1: rows 1 to 3.
    expectLayer<G>(glassHead(v1, 1), [](G& g) { glassHead(g); });
    // 2: rows 1 to 3; transparency_tex_mult, glossiness_tex_mult, ior_tex_mult;
    // paths of transparency_tex, glossiness_tex, ior_tex (empty: no texture).
    auto mults = [](G& g) { glassHead(g), g.transparency_tex_mult = 0.11f, g.glossiness_tex_mult = 0.22f, g.ior_tex_mult = 0.33f; };
    glassHead(v2, 2).f32(0.11f).f32(0.22f).f32(0.33f).str("t.png").str("").str("i.png");
    expectLayer<G>(v2, [&](G& g) { mults(g), g.transparency_tex = bitmap(u"t.png"), g.ior_tex = bitmap(u"i.png"); });
    // 3: as 2; rows 5 to 7; path of translucency_tex.
    translucency(glassHead(v3, 3).f32(0.11f).f32(0.22f).f32(0.33f).str("").str("g.png").str("")).str("tl.png");
    expectLayer<G>(v3, [&](G& g) {
        mults(g), translucency(g), g.glossiness_tex = bitmap(u"g.png"), g.translucency_tex = bitmap(u"tl.png");
    });
    // 4: the three multipliers of 2; rows 5 to 7; members transparency_tex,
    // glossiness_tex, ior_tex, translucency_tex.
    translucency(glassHead(v4, 4).f32(0.11f).f32(0.22f).f32(0.33f)).acolor(0.1f).b8(false).acolor(0.3f).acolor(0.4f);
    expectLayer<G>(v4, [&](G& g) {
        mults(g), translucency(g), g.transparency_tex = red(0.1f), g.ior_tex = red(0.3f), g.translucency_tex = red(0.4f);
    });
    // 5: rows 1 to 3; color_tex_mult, glossiness_tex_mult, ior_tex_mult; rows 5
    // to 7; members color_tex, glossiness_tex, ior_tex, translucency_tex;
    // transparency; transparency_tex_mult; member transparency_tex.
    translucency(glassHead(v5, 5).f32(0.55f).f32(0.22f).f32(0.33f)).acolor(0.5f).b8(false).b8(false).acolor(0.4f);
    v5.color(0.3f, 0.2f, 0.1f).f32(0.66f).acolor(0.6f);
    auto current = [](G& g) {
        glassHead(g), translucency(g), g.color_tex_mult = 0.55f, g.glossiness_tex_mult = 0.22f, g.ior_tex_mult = 0.33f;
        g.color_tex = red(0.5f), g.transparency = Color(0.3f, 0.2f, 0.1f), g.transparency_tex_mult = 0.66f;
    };
    expectLayer<G>(v5, [&](G& g) { current(g), g.translucency_tex = red(0.4f), g.transparency_tex = red(0.6f); });
    // 6 (current): as 5, then the base record version 4 (name, three flags).
    translucency(glassHead(v6, 6).f32(0.55f).f32(0.22f).f32(0.33f)).acolor(0.5f).b8(false).b8(false).b8(false);
    v6.color(0.3f, 0.2f, 0.1f).f32(0.66f).b8(false).version(4).str("Clear").b8(false).b8(true).b8(true);
    expectLayer<G>(v6, [&](G& g) { current(g), flags(g, u"Clear", false, true, true); }, true);

    // Glass resets only the base part before reading.
    G used;
    used.name = u"Used", used.thickness = 7, used.layer_flag_b = true;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(used.load(ar));
    EXPECT_EQ(std::make_tuple(used.name, used.layer_flag_b, used.thickness), std::make_tuple(u"BRDFRefraction", false, 7.f));
}

// ---- Phong_BRDF and Blinn_BRDF -------------------------------------------------------------

// The head H of old records: color, reflection; hilightGlossiness,
// reflectionGlossiness; Fresnel f32; cutoff; subdivs; Fresnel i32; back_side, depth_value.
RecordBytes& glossyHead(RecordBytes& b, int version, float fresnelIor, std::int32_t fresnelSwitch) {
    return b.version(version).color(0.9f, 0.8f, 0.7f).color(0.6f, 0.5f, 0.4f).f32(0.3f).f32(0.35f)
        .f32(fresnelIor).f32(0.02f).i32(9).i32(fresnelSwitch).i32(1).i32(6);
}
// A loaded layer holds a Fresnel texture only where the Fresnel rule made one
// (ior != 0). Version 1 has none of the multipliers.
void glossyHead(BaseGlossy_BRDF& p, float fresnelIor, bool mults = true) {
    p.color = Color(0.9f, 0.8f, 0.7f), p.reflection = Color(0.6f, 0.5f, 0.4f);
    p.hilightGlossiness = 0.3f, p.reflectionGlossiness = 0.35f, p.cutoff = 0.02f, p.subdivs = 9, p.back_side = 1, p.depth_value = 6;
    p.transparency_tex = fresnelIor != 0 ? fresnel(fresnelIor) : TexturePtr();
    if (mults) p.color_tex_mult = 0.1f, p.hilightGlossiness_tex_mult = 0.2f, p.reflectionGlossiness_tex_mult = 0.3f;
}

template <class L>
void glossyVersions() {
    RecordBytes v1, v1off, v2, v3, v4, v5, v6;
    // 1: H, then the Fresnel rule; with the switch at 0 the default Fresnel texture is gone.
    expectLayer<L>(glossyHead(v1, 1, 1.8f, 1), [](L& p) { glossyHead(p, 1.8f, false); });
    expectLayer<L>(glossyHead(v1off, 1, 1.8f, 0), [](L& p) { glossyHead(p, 0, false); });
    // 2: H; color_tex_mult, hilightGlossiness_tex_mult, reflectionGlossiness_tex_mult;
    // paths of color_tex, hilightGlossiness_tex, reflectionGlossiness_tex; Fresnel rule.
    glossyHead(v2, 2, 2.0f, -1).f32(0.1f).f32(0.2f).f32(0.3f).str("c.png").str("h.png").str("");
    expectLayer<L>(v2, [](L& p) { glossyHead(p, 2.0f), p.color_tex = bitmap(u"c.png"), p.hilightGlossiness_tex = bitmap(u"h.png"); });
    // 3: as 2; anisotropy, anisotropy_rotation; Fresnel rule.
    glossyHead(v3, 3, 2.0f, 0).f32(0.1f).f32(0.2f).f32(0.3f).str("").str("").str("r.png").f32(0.75f).f32(45);
    expectLayer<L>(v3, [](L& p) {
        glossyHead(p, 0), p.reflectionGlossiness_tex = bitmap(u"r.png"), p.anisotropy = 0.75f, p.anisotropy_rotation = 45;
    });
    // 4: H; the three multipliers; members color_tex, hilightGlossiness_tex,
    // reflectionGlossiness_tex; anisotropy, anisotropy_rotation; Fresnel rule.
    glossyHead(v4, 4, 1.3f, 1).f32(0.1f).f32(0.2f).f32(0.3f).acolor(0.1f).b8(false).acolor(0.3f).f32(0.75f).f32(45);
    expectLayer<L>(v4, [](L& p) {
        glossyHead(p, 1.3f), p.anisotropy = 0.75f, p.anisotropy_rotation = 45, p.color_tex = red(0.1f), p.reflectionGlossiness_tex = red(0.3f);
    });
    // 5: as 4; base record (here version 2: name, layer_flag_a); Fresnel rule.
    glossyHead(v5, 5, 1.3f, 0).f32(0.1f).f32(0.2f).f32(0.3f).b8(false).b8(false).b8(false).f32(0.75f).f32(45).version(2).str("G").b8(false);
    expectLayer<L>(v5, [](L& p) { glossyHead(p, 0), p.anisotropy = 0.75f, p.anisotropy_rotation = 45, flags(p, u"G", false, false, false); });
    // 6 (current): color, reflection; hilightGlossiness, reflectionGlossiness,
    // cutoff; subdivs, back_side, depth_value; the four multipliers
    // (transparency_tex_mult last); members color_tex, hilightGlossiness_tex,
    // reflectionGlossiness_tex, transparency_tex; anisotropy, anisotropy_rotation; base record version 4.
    v6.version(6).color(0.9f, 0.8f, 0.7f).color(0.6f, 0.5f, 0.4f).f32(0.3f).f32(0.35f).f32(0.02f).i32(9).i32(1).i32(6);
    v6.f32(0.1f).f32(0.2f).f32(0.3f).f32(0.4f).b8(false).acolor(0.2f).b8(false).b8(false).f32(0.75f).f32(45);
    expectLayer<L>(v6.version(4).str("G").b8(true).b8(false).b8(true), [](L& p) {
        glossyHead(p, 0), p.transparency_tex_mult = 0.4f, p.hilightGlossiness_tex = red(0.2f);
        p.anisotropy = 0.75f, p.anisotropy_rotation = 45, flags(p, u"G", true, false, true);
    }, true);
}

TEST(LayerRecords, PhongVersions) { glossyVersions<Phong_BRDF>(); }
TEST(LayerRecords, BlinnVersions) { glossyVersions<Blinn_BRDF>(); }

// ---- Mirror_BRDF, Diffuse_BRDF, Light_BRDF ------------------------------------------------

// The head of old Mirror_BRDF records: color, reflection;
// transparency_tex_mult; Fresnel f32; cutoff; Fresnel i32; mirror_value.
RecordBytes& mirrorHead(RecordBytes& b, int version, float fresnelIor, std::int32_t fresnelSwitch) {
    return b.version(version).color(0.2f, 0.3f, 0.4f).color(0.5f, 0.6f, 0.7f).f32(0.8f).f32(fresnelIor).f32(0.03f)
        .i32(fresnelSwitch).i32(4);
}
void mirrorHead(Mirror_BRDF& m, const TexturePtr& transparency, float colorTexMult = 0.9f) {
    m.color = Color(0.2f, 0.3f, 0.4f), m.reflection = Color(0.5f, 0.6f, 0.7f), m.transparency_tex_mult = 0.8f;
    m.cutoff = 0.03f, m.mirror_value = 4, m.transparency_tex = transparency, m.color_tex_mult = colorTexMult;
}

TEST(LayerRecords, MirrorVersions) {
    typedef Mirror_BRDF M;
    RecordBytes v1, v1on, v2, v3, v4, v5;
    // 1: head; path of transparency_tex; Fresnel rule (on: the Fresnel texture replaces the path).
    expectLayer<M>(mirrorHead(v1, 1, 1.7f, 0).str("m.png"), [](M& m) { mirrorHead(m, bitmap(u"m.png"), 1); });
    expectLayer<M>(mirrorHead(v1on, 1, 1.7f, 3).str("m.png"), [](M& m) { mirrorHead(m, fresnel(1.7f), 1); });
    // 2: head; path of transparency_tex; color_tex_mult; path of color_tex.
    mirrorHead(v2, 2, 1.7f, 0).str("first.png").f32(0.9f).str("second.png");
    expectLayer<M>(v2, [](M& m) { mirrorHead(m, bitmap(u"first.png")), m.color_tex = bitmap(u"second.png"); });
    // 3: head; color_tex_mult; members transparency_tex, color_tex; Fresnel rule (on).
    expectLayer<M>(mirrorHead(v3, 3, 1.25f, 1).f32(0.9f).acolor(0.1f).acolor(0.2f),
                   [](M& m) { mirrorHead(m, fresnel(1.25f)), m.color_tex = red(0.2f); });
    // 4: as 3 (Fresnel rule off); base record version 3 (name, layer_flag_a, layer_flag_b).
    mirrorHead(v4, 4, 1.25f, 0).f32(0.9f).acolor(0.1f).b8(false).version(3).str("Shiny").b8(true).b8(true);
    expectLayer<M>(v4, [](M& m) { mirrorHead(m, red(0.1f)), flags(m, u"Shiny", true, true, false); });
    // 5 (current): color, reflection; transparency_tex_mult, cutoff;
    // mirror_value; color_tex_mult; members transparency_tex, color_tex; base record.
    v5.version(5).color(0.2f, 0.3f, 0.4f).color(0.5f, 0.6f, 0.7f).f32(0.8f).f32(0.03f).i32(4).f32(0.9f).b8(false).acolor(0.2f);
    expectLayer<M>(v5.version(4).str("Shiny").b8(true).b8(false).b8(false),
                   [](M& m) { mirrorHead(m, TexturePtr()), m.color_tex = red(0.2f), flags(m, u"Shiny", true, false, false); }, true);
}

TEST(LayerRecords, DiffuseVersions) {
    typedef Diffuse_BRDF D;
    // All versions start with color, transparency; color_tex_mult, transparency_tex_mult.
    auto head = [](RecordBytes& b, int version) -> RecordBytes& {
        return b.version(version).color(0.1f, 0.2f, 0.3f).color(0.4f, 0.5f, 0.6f).f32(0.7f).f32(0.8f);
    };
    auto want = [](D& d) {
        d.color = Color(0.1f, 0.2f, 0.3f), d.transparency = Color(0.4f, 0.5f, 0.6f), d.color_tex_mult = 0.7f, d.transparency_tex_mult = 0.8f;
    };
    RecordBytes v1, v2, v3, v4;
    // 1: head; paths of color_tex, transparency_tex.
    expectLayer<D>(head(v1, 1).str("").str("alpha.png"), [&](D& d) { want(d), d.transparency_tex = bitmap(u"alpha.png"); });
    // 2: head; members color_tex, transparency_tex.
    expectLayer<D>(head(v2, 2).acolor(0.3f).b8(false), [&](D& d) { want(d), d.color_tex = red(0.3f); });
    // 3: as 2; base record (version 1: name only).
    expectLayer<D>(head(v3, 3).b8(false).acolor(0.4f).version(1).str("Matte"),
                   [&](D& d) { want(d), d.transparency_tex = red(0.4f), d.name = u"Matte"; });
    // 4 (current): as 3; use_color_tex_alpha_as_transparency.
    expectLayer<D>(head(v4, 4).b8(false).b8(false).version(4).str("Matte").b8(true).b8(false).b8(false).b8(true),
                   [&](D& d) { want(d), d.use_color_tex_alpha_as_transparency = true, d.name = u"Matte"; }, true);
}

TEST(LayerRecords, LightVersions) {
    typedef Light_BRDF E;
    RecordBytes v1, v2, v3, v4, v5;
    // 1: color; intensity, transparency_tex_mult; path of transparency_tex.
    expectLayer<E>(v1.version(1).color(0.9f, 0.8f, 0.7f).f32(3).f32(0.5f).str("glow.png"), [](E& l) {
        l.color = Color(0.9f, 0.8f, 0.7f), l.intensity = 3, l.transparency_tex_mult = 0.5f, l.transparency_tex = bitmap(u"glow.png");
    });
    // 2 to 5 start with color, transparency; intensity, light_value, color_tex_mult, transparency_tex_mult.
    auto head = [](RecordBytes& b, int version) -> RecordBytes& {
        return b.version(version).color(0.9f, 0.8f, 0.7f).color(0.1f, 0.2f, 0.3f).f32(3).f32(4).f32(0.25f).f32(0.5f);
    };
    auto want = [](E& l) {
        l.color = Color(0.9f, 0.8f, 0.7f), l.transparency = Color(0.1f, 0.2f, 0.3f);
        l.intensity = 3, l.light_value = 4, l.color_tex_mult = 0.25f, l.transparency_tex_mult = 0.5f;
    };
    // 2: head; paths of color_tex, transparency_tex.
    expectLayer<E>(head(v2, 2).str("c.png").str("t.png"),
                   [&](E& l) { want(l), l.color_tex = bitmap(u"c.png"), l.transparency_tex = bitmap(u"t.png"); });
    // 3: head; members color_tex, transparency_tex.
    expectLayer<E>(head(v3, 3).b8(false).acolor(0.6f), [&](E& l) { want(l), l.transparency_tex = red(0.6f); });
    // 4: as 3; base record.
    expectLayer<E>(head(v4, 4).acolor(0.6f).b8(false).version(4).str("Lamp").b8(false).b8(false).b8(false),
                   [&](E& l) { want(l), l.color_tex = red(0.6f), flags(l, u"Lamp", false, false, false); });
    // 5 (current): as 4; doubleSided as i32.
    expectLayer<E>(head(v5, 5).b8(false).b8(false).version(4).str("Lamp").b8(true).b8(false).b8(false).i32(0),
                   [&](E& l) { want(l), l.doubleSided = 0, l.name = u"Lamp"; }, true);
}

// ---- comparison, copies -------------------------------------------------------------------------

// The fields of a layer class; each one changed alone must make two layers differ.
template <class L>
struct Fields {
    std::vector<Color L::*> colors;
    std::vector<float L::*> floats;
    std::vector<std::int32_t L::*> ints;
    std::vector<TexturePtr L::*> textures;
    std::vector<std::function<void(L&)>> others;
};

template <class L>
void eachFieldCounts(const Fields<L>& f) {
    std::vector<std::function<void(L&)>> changes = f.others;
    for (auto m : f.colors) changes.push_back([m](L& l) { (l.*m).g += 0.5f; });
    for (auto m : f.floats) changes.push_back([m](L& l) { l.*m += 1.5f; });
    for (auto m : f.ints) changes.push_back([m](L& l) { l.*m += 1; });
    for (auto m : f.textures) changes.push_back([m](L& l) { l.*m = l.*m ? TexturePtr() : acolor(1, 1, 1); });
    for (std::size_t i = 0; i < changes.size(); ++i) {
        boost::shared_ptr<L> a(new L), b(new L);
        ASSERT_TRUE(a->isEqual(b));
        changes[i](*b);
        EXPECT_FALSE(a->isEqual(b) || b->isEqual(a)) << "change " << i;
    }
    // The base part takes no part.
    boost::shared_ptr<L> a(new L), b(new L);
    flags(*b, u"Other", !b->layer_flag_a, !b->layer_flag_b, !b->layer_flag_c);
    EXPECT_TRUE(a->isEqual(b));
    EXPECT_FALSE(a->isEqual(BrdfPtr()));
}

TEST(LayerEquality, EveryFieldCounts) {
    typedef Glass_BRDF G;
    eachFieldCounts<G>({{&G::color, &G::transparency, &G::fog_color, &G::translucency},
                        {&G::ior, &G::ior_second, &G::cutoff, &G::fog_color_mult, &G::glossiness, &G::color_tex_mult,
                         &G::transparency_tex_mult, &G::glossiness_tex_mult, &G::ior_tex_mult, &G::translucency_tex_mult,
                         &G::thickness, &G::scatter_coeff, &G::scatter_direction},
                        {&G::subdivs, &G::depth_value, &G::affect_shadows, &G::affect_alpha, &G::translucency_on},
                        {&G::color_tex, &G::transparency_tex, &G::glossiness_tex, &G::ior_tex, &G::translucency_tex}, {}});
    typedef Phong_BRDF P;
    eachFieldCounts<P>({{&P::color, &P::reflection},
                        {&P::hilightGlossiness, &P::reflectionGlossiness, &P::cutoff, &P::hilightGlossiness_tex_mult,
                         &P::reflectionGlossiness_tex_mult, &P::color_tex_mult, &P::transparency_tex_mult, &P::anisotropy,
                         &P::anisotropy_rotation},
                        {&P::subdivs, &P::depth_value, &P::back_side},
                        {&P::hilightGlossiness_tex, &P::reflectionGlossiness_tex, &P::color_tex, &P::transparency_tex},
                        {[](P& l) { static_cast<FresnelTexture&>(*l.transparency_tex).fresnel_ior = 2; }}});
    typedef Mirror_BRDF M;
    eachFieldCounts<M>({{&M::color, &M::reflection}, {&M::transparency_tex_mult, &M::color_tex_mult, &M::cutoff},
                        {&M::mirror_value}, {&M::transparency_tex, &M::color_tex}, {}});
    typedef Diffuse_BRDF D;
    eachFieldCounts<D>({{&D::color, &D::transparency}, {&D::color_tex_mult, &D::transparency_tex_mult}, {},
                        {&D::color_tex, &D::transparency_tex}, {[](D& l) { l.use_color_tex_alpha_as_transparency = true; }}});
    typedef Light_BRDF E;
    eachFieldCounts<E>({{&E::color, &E::transparency}, {&E::intensity, &E::light_value, &E::transparency_tex_mult, &E::color_tex_mult},
                        {&E::doubleSided}, {&E::transparency_tex, &E::color_tex}, {}});
    EXPECT_FALSE(Phong_BRDF().isEqual(BrdfPtr(new Blinn_BRDF)));  // same content, other class
}

TEST(LayerCopies, CloneSharesNothing) {
    typedef Glass_BRDF G;
    G g;
    flags(g, u"Kept", true, false, true);
    g.color_tex = g.transparency_tex = g.glossiness_tex = g.ior_tex = g.translucency_tex = acolor(0, 0, 0);
    const BrdfPtr copy = g.clone();
    const G& c = static_cast<const G&>(*copy);
    EXPECT_EQ(std::make_tuple(c.name, c.layer_flag_c), std::make_tuple(u"Kept", true));
    for (TexturePtr G::*t : {&G::color_tex, &G::transparency_tex, &G::glossiness_tex, &G::ior_tex, &G::translucency_tex})
        EXPECT_NE(c.*t, g.*t);
    EXPECT_TRUE(c.isEqual(BrdfPtr(new G(g))));
    for (std::uint32_t tag : {kPhongBrdf, kBlinnBrdf, kMirrorBrdf, kDiffuseBrdf, kLightBrdf})
        EXPECT_TRUE(createBrdf(tag)->clone()->isEqual(createBrdf(tag))) << tag;
    // The default Fresnel texture of a new layer: one each, cloned by clone.
    Mirror_BRDF m;
    Phong_BRDF p;
    EXPECT_NE(static_cast<Mirror_BRDF&>(*m.clone()).transparency_tex, m.transparency_tex);
    EXPECT_NE(p.transparency_tex, Phong_BRDF().transparency_tex);
    EXPECT_TRUE(p.transparency_tex->isEqual(fresnel(1.55f)));
    // Two owners of one texture save two copies.
    g.transparency_tex = g.glossiness_tex = g.translucency_tex = TexturePtr();
    const boost::shared_ptr<G> back = roundTrip(g);
    ASSERT_TRUE(back->color_tex && back->ior_tex);
    EXPECT_NE(back->color_tex, back->ior_tex);
    EXPECT_TRUE(back->isEqual(BrdfPtr(new G(g))));
}

// ---- factory, damaged data ------------------------------------------------------------------------

TEST(LayerRecords, FactoryAndBadTags) {
    for (std::uint32_t tag : {kGlassBrdf, kDiffuseBrdf, kBlinnBrdf, kPhongBrdf, kMirrorBrdf, kLightBrdf}) {
        EXPECT_EQ(createBrdf(tag)->getType(), tag);
        EXPECT_EQ(createBrdf(tag)->name, createBrdf(tag)->getPluginName());  // the plugin names are in the goldens
    }
    for (std::uint32_t tag : {0u, 3u, 5u, 6u, 7u, 64u, 0xFFFFFFFFu}) EXPECT_FALSE(createBrdf(tag)) << tag;
    EXPECT_EQ(getBrdfGroupName(3), u"Refraction");
    EXPECT_EQ(getBrdfGroupName(4) + getBrdfGroupName(-1), u"");
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
}

TEST(LayerRecords, BadChildrenFail) {
    // Diffuse_BRDF version 2 and 3 records (head: colours, multipliers) whose
    // color_tex names texture tag 13; whose AColor child has a refused
    // version; that end inside the base record's tag; whose base record has
    // a version the layer doesn't know.
    auto head = [](int version) { return RecordBytes().version(version).color(0, 0, 0).color(0, 0, 0).f32(1).f32(1); };
    EXPECT_FALSE(loaded<Diffuse_BRDF>(head(2).b8(true).i32(13), false)->color_tex);
    loaded<Diffuse_BRDF>(head(2).b8(true).i32(5).version(2), false);
    loaded<Diffuse_BRDF>(head(3).b8(false).b8(false), false);
    loaded<Diffuse_BRDF>(head(3).b8(false).b8(false).version(5), false);
    // The base record's name loses its control characters.
    EXPECT_EQ(loaded<Diffuse_BRDF>(head(3).b8(false).b8(false).version(1).str("\tLine\nFeed"))->name, u"LineFeed");
}

}  // namespace
