// Records of the six BRDF layers: every old version laid by hand and checked
// field by field after loading, the Fresnel pair, paths of old records, the
// current record's bytes, copies, comparison and damaged data.
#include <gtest/gtest.h>

#include <cmath>
#include <functional>

#include "materials/Brdf.h"
#include "materials/RecordBytes.h"
#include "persistence/Record.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"

using namespace OrvaneLumoCore;
using testbytes::RecordBytes;

namespace {

// ---- helpers ------------------------------------------------------------------

// Optional texture member holding an AColorTexture (tag 5, record version 1:
// one acolor) whose red channel marks it.
RecordBytes& acolorMember(RecordBytes& b, float red) {
    return b.b8(true).i32(5).version(1).f32(red).f32(0).f32(0).f32(1);
}

RecordBytes& noTexture(RecordBytes& b) { return b.b8(false); }

// The red channel of an AColorTexture, or -1 for anything else.
float acolorRed(const TexturePtr& t) {
    const AColorTexture* a = dynamic_cast<const AColorTexture*>(t.get());
    return a ? a->color.r : -1;
}

// The file of a bitmap texture made from a path; "<none>" for anything else.
std::u16string bitmapFile(const TexturePtr& t) {
    const BitmapTexture* bt = dynamic_cast<const BitmapTexture*>(t.get());
    if (!bt) return u"<none>";
    const BitmapBuffer* buffer = dynamic_cast<const BitmapBuffer*>(bt->bitmap.get());
    return buffer ? buffer->file : u"<none>";
}

// The ior of a Fresnel texture, or NaN for anything else.
float fresnelIor(const TexturePtr& t) {
    const FresnelTexture* f = dynamic_cast<const FresnelTexture*>(t.get());
    return f ? f->fresnel_ior : std::nanf("");
}

bool isDefaultFresnel(const TexturePtr& t) {
    return t && t->isEqual(TexturePtr(new FresnelTexture));
}

template <class L>
boost::shared_ptr<L> load(const RecordBytes& bytes, bool expectOk = true) {
    boost::shared_ptr<L> layer(new L);
    QuickArchive ar = bytes.archive();
    EXPECT_EQ(layer->load(ar), expectOk);
    return layer;
}

void expectColor(const Color& c, float r, float g, float b) {
    EXPECT_EQ(c, Color(r, g, b));
}

// ---- Glass_BRDF --------------------------------------------------------------------

// Rows 1 to 3 of every Glass_BRDF record: color, fog_color; ior, ior_second,
// cutoff, fog_color_mult, glossiness; depth_value, subdivs, affect_shadows,
// affect_alpha.
RecordBytes& glassRows1to3(RecordBytes& b) {
    return b.color(0.1f, 0.2f, 0.3f)
        .color(0.4f, 0.5f, 0.6f)
        .f32(1.4f).f32(1.6f).f32(0.002f).f32(2).f32(0.7f)
        .i32(3).i32(12).i32(1).i32(4);
}

void expectGlassRows1to3(const Glass_BRDF& g) {
    expectColor(g.color, 0.1f, 0.2f, 0.3f);
    expectColor(g.fog_color, 0.4f, 0.5f, 0.6f);
    EXPECT_EQ(g.ior, 1.4f);
    EXPECT_EQ(g.ior_second, 1.6f);
    EXPECT_EQ(g.cutoff, 0.002f);
    EXPECT_EQ(g.fog_color_mult, 2);
    EXPECT_EQ(g.glossiness, 0.7f);
    EXPECT_EQ(g.depth_value, 3);
    EXPECT_EQ(g.subdivs, 12);
    EXPECT_EQ(g.affect_shadows, 1);
    EXPECT_EQ(g.affect_alpha, 4);
}

// Rows 5 to 7: translucency_on; thickness, scatter_coeff, scatter_direction,
// translucency_tex_mult; translucency.
RecordBytes& glassRows5to7(RecordBytes& b) {
    return b.i32(1).f32(50).f32(0.5f).f32(0.25f).f32(0.44f).color(0.7f, 0.8f, 0.9f);
}

void expectGlassRows5to7(const Glass_BRDF& g) {
    EXPECT_EQ(g.translucency_on, 1);
    EXPECT_EQ(g.thickness, 50);
    EXPECT_EQ(g.scatter_coeff, 0.5f);
    EXPECT_EQ(g.scatter_direction, 0.25f);
    EXPECT_EQ(g.translucency_tex_mult, 0.44f);
    expectColor(g.translucency, 0.7f, 0.8f, 0.9f);
}

void expectGlassRows5to7Default(const Glass_BRDF& g) {
    EXPECT_EQ(g.translucency_on, 0);
    EXPECT_EQ(g.thickness, 1000);
    EXPECT_EQ(g.scatter_coeff, 0);
    EXPECT_EQ(g.scatter_direction, 1);
    EXPECT_EQ(g.translucency_tex_mult, 1);
    expectColor(g.translucency, 1, 1, 1);
}

TEST(GlassRecords, Version1HoldsRows1to3) {
    RecordBytes b;
    glassRows1to3(b.version(1));
    auto g = load<Glass_BRDF>(b);
    expectGlassRows1to3(*g);
    expectGlassRows5to7Default(*g);
    expectColor(g->transparency, 0, 0, 0);
    EXPECT_EQ(g->transparency_tex_mult, 1);
    EXPECT_EQ(g->glossiness_tex_mult, 1);
    EXPECT_EQ(g->ior_tex_mult, 1);
    EXPECT_EQ(g->color_tex_mult, 1);
    EXPECT_FALSE(g->transparency_tex);
    EXPECT_EQ(g->name, u"BRDFRefraction");
}

TEST(GlassRecords, Version2AddsMultipliersAndPaths) {
    // Rows 1 to 3; transparency_tex_mult, glossiness_tex_mult, ior_tex_mult;
    // paths of transparency_tex, glossiness_tex, ior_tex.
    RecordBytes b;
    glassRows1to3(b.version(2)).f32(0.11f).f32(0.22f).f32(0.33f).str("t.png").str("").str("i.png");
    auto g = load<Glass_BRDF>(b);
    expectGlassRows1to3(*g);
    EXPECT_EQ(g->transparency_tex_mult, 0.11f);
    EXPECT_EQ(g->glossiness_tex_mult, 0.22f);
    EXPECT_EQ(g->ior_tex_mult, 0.33f);
    EXPECT_EQ(bitmapFile(g->transparency_tex), u"t.png");
    EXPECT_FALSE(g->glossiness_tex);  // an empty path gives no texture
    EXPECT_EQ(bitmapFile(g->ior_tex), u"i.png");
    EXPECT_EQ(g->color_tex_mult, 1);
    expectGlassRows5to7Default(*g);
}

TEST(GlassRecords, Version3AddsTranslucency) {
    // As version 2; rows 5 to 7; path of translucency_tex.
    RecordBytes b;
    glassRows1to3(b.version(3)).f32(0.11f).f32(0.22f).f32(0.33f).str("").str("g.png").str("");
    glassRows5to7(b).str("tl.png");
    auto g = load<Glass_BRDF>(b);
    expectGlassRows1to3(*g);
    EXPECT_FALSE(g->transparency_tex);
    EXPECT_EQ(bitmapFile(g->glossiness_tex), u"g.png");
    expectGlassRows5to7(*g);
    EXPECT_EQ(bitmapFile(g->translucency_tex), u"tl.png");
    EXPECT_FALSE(g->color_tex);
}

TEST(GlassRecords, Version4HasTextureMembers) {
    // Rows 1 to 3; the three multipliers of version 2; rows 5 to 7; texture
    // members transparency_tex, glossiness_tex, ior_tex, translucency_tex.
    RecordBytes b;
    glassRows1to3(b.version(4)).f32(0.11f).f32(0.22f).f32(0.33f);
    glassRows5to7(b);
    acolorMember(b, 0.1f);
    noTexture(b);
    acolorMember(b, 0.3f);
    acolorMember(b, 0.4f);
    auto g = load<Glass_BRDF>(b);
    expectGlassRows1to3(*g);
    EXPECT_EQ(g->transparency_tex_mult, 0.11f);
    expectGlassRows5to7(*g);
    EXPECT_EQ(acolorRed(g->transparency_tex), 0.1f);
    EXPECT_FALSE(g->glossiness_tex);
    EXPECT_EQ(acolorRed(g->ior_tex), 0.3f);
    EXPECT_EQ(acolorRed(g->translucency_tex), 0.4f);
    EXPECT_FALSE(g->color_tex);
}

TEST(GlassRecords, Version5IsTheCurrentRecordWithoutBase) {
    // Rows 1 to 11: rows 1 to 3; color_tex_mult, glossiness_tex_mult,
    // ior_tex_mult; rows 5 to 7; members color_tex, glossiness_tex, ior_tex,
    // translucency_tex; transparency; transparency_tex_mult; member
    // transparency_tex.
    RecordBytes b;
    glassRows1to3(b.version(5)).f32(0.55f).f32(0.22f).f32(0.33f);
    glassRows5to7(b);
    acolorMember(b, 0.5f);
    noTexture(b);
    noTexture(b);
    acolorMember(b, 0.4f);
    b.color(0.3f, 0.2f, 0.1f).f32(0.66f);
    acolorMember(b, 0.6f);
    auto g = load<Glass_BRDF>(b);
    expectGlassRows1to3(*g);
    EXPECT_EQ(g->color_tex_mult, 0.55f);
    EXPECT_EQ(g->glossiness_tex_mult, 0.22f);
    EXPECT_EQ(g->ior_tex_mult, 0.33f);
    expectGlassRows5to7(*g);
    EXPECT_EQ(acolorRed(g->color_tex), 0.5f);
    EXPECT_EQ(acolorRed(g->translucency_tex), 0.4f);
    expectColor(g->transparency, 0.3f, 0.2f, 0.1f);
    EXPECT_EQ(g->transparency_tex_mult, 0.66f);
    EXPECT_EQ(acolorRed(g->transparency_tex), 0.6f);
    EXPECT_EQ(g->name, u"BRDFRefraction");
}

TEST(GlassRecords, Version6BytesAndRoundTrip) {
    // Version 6: rows 1 to 11 as in version 5, then the base record version
    // 4 (name, three flags).
    RecordBytes b;
    glassRows1to3(b.version(6)).f32(0.55f).f32(0.22f).f32(0.33f);
    glassRows5to7(b);
    acolorMember(b, 0.5f);
    noTexture(b);
    noTexture(b);
    noTexture(b);
    b.color(0.3f, 0.2f, 0.1f).f32(0.66f);
    noTexture(b);
    b.version(4).str("Clear").b8(false).b8(true).b8(true);
    auto g = load<Glass_BRDF>(b);
    EXPECT_EQ(g->name, u"Clear");
    EXPECT_FALSE(g->layer_flag_a);
    EXPECT_TRUE(g->layer_flag_b);
    EXPECT_TRUE(g->layer_flag_c);
    QuickArchive out;
    ASSERT_TRUE(g->save(out));
    EXPECT_EQ(testbytes::savedBytes(out), b.bytes());
}

TEST(GlassRecords, LoadResetsOnlyTheBasePart) {
    Glass_BRDF g;
    g.name = u"Used";
    g.thickness = 7;
    g.color_tex = TexturePtr(new AColorTexture);
    g.layer_flag_b = true;
    RecordBytes b;
    glassRows1to3(b.version(1));
    QuickArchive ar = b.archive();
    ASSERT_TRUE(g.load(ar));
    EXPECT_EQ(g.name, u"BRDFRefraction");
    EXPECT_FALSE(g.layer_flag_b);
    EXPECT_EQ(g.thickness, 7);  // not in a version 1 record, and not reset
    EXPECT_TRUE(g.color_tex);
}

// ---- Phong_BRDF and Blinn_BRDF ----------------------------------------------------------

// The head H of old records: color, reflection; hilightGlossiness,
// reflectionGlossiness; Fresnel f32; cutoff; subdivs; Fresnel i32;
// back_side, depth_value.
RecordBytes& glossyHead(RecordBytes& b, float fresnelIor, std::int32_t fresnelSwitch) {
    return b.color(0.9f, 0.8f, 0.7f)
        .color(0.6f, 0.5f, 0.4f)
        .f32(0.3f).f32(0.35f)
        .f32(fresnelIor)
        .f32(0.02f)
        .i32(9)
        .i32(fresnelSwitch)
        .i32(1).i32(6);
}

void expectGlossyHead(const BaseGlossy_BRDF& p) {
    expectColor(p.color, 0.9f, 0.8f, 0.7f);
    expectColor(p.reflection, 0.6f, 0.5f, 0.4f);
    EXPECT_EQ(p.hilightGlossiness, 0.3f);
    EXPECT_EQ(p.reflectionGlossiness, 0.35f);
    EXPECT_EQ(p.cutoff, 0.02f);
    EXPECT_EQ(p.subdivs, 9);
    EXPECT_EQ(p.back_side, 1);
    EXPECT_EQ(p.depth_value, 6);
    EXPECT_EQ(p.transparency_tex_mult, 1);  // in no old record
}

template <class L>
void glossyOldVersions() {
    {
        // Version 1: H, then the Fresnel rule (switch on).
        RecordBytes b;
        glossyHead(b.version(1), 1.8f, 1);
        auto p = load<L>(b);
        expectGlossyHead(*p);
        EXPECT_EQ(fresnelIor(p->transparency_tex), 1.8f);
        EXPECT_EQ(p->anisotropy, 0);
        EXPECT_EQ(p->color_tex_mult, 1);
    }
    {
        // Version 1 with the switch at 0: the default Fresnel texture is gone.
        RecordBytes b;
        glossyHead(b.version(1), 1.8f, 0);
        EXPECT_FALSE(load<L>(b)->transparency_tex);
    }
    {
        // Version 2: H; color_tex_mult, hilightGlossiness_tex_mult,
        // reflectionGlossiness_tex_mult; paths of color_tex,
        // hilightGlossiness_tex, reflectionGlossiness_tex; Fresnel rule.
        RecordBytes b;
        glossyHead(b.version(2), 2.0f, -1).f32(0.1f).f32(0.2f).f32(0.3f);
        b.str("c.png").str("h.png").str("");
        auto p = load<L>(b);
        expectGlossyHead(*p);
        EXPECT_EQ(p->color_tex_mult, 0.1f);
        EXPECT_EQ(p->hilightGlossiness_tex_mult, 0.2f);
        EXPECT_EQ(p->reflectionGlossiness_tex_mult, 0.3f);
        EXPECT_EQ(bitmapFile(p->color_tex), u"c.png");
        EXPECT_EQ(bitmapFile(p->hilightGlossiness_tex), u"h.png");
        EXPECT_FALSE(p->reflectionGlossiness_tex);
        EXPECT_EQ(fresnelIor(p->transparency_tex), 2.0f);
        EXPECT_EQ(p->anisotropy, 0);
    }
    {
        // Version 3: as version 2; anisotropy, anisotropy_rotation.
        RecordBytes b;
        glossyHead(b.version(3), 2.0f, 0).f32(0.1f).f32(0.2f).f32(0.3f);
        b.str("").str("").str("r.png").f32(0.75f).f32(45);
        auto p = load<L>(b);
        expectGlossyHead(*p);
        EXPECT_EQ(bitmapFile(p->reflectionGlossiness_tex), u"r.png");
        EXPECT_EQ(p->anisotropy, 0.75f);
        EXPECT_EQ(p->anisotropy_rotation, 45);
        EXPECT_FALSE(p->transparency_tex);
    }
    {
        // Version 4: H; the three multipliers; members color_tex,
        // hilightGlossiness_tex, reflectionGlossiness_tex; anisotropy,
        // anisotropy_rotation; Fresnel rule.
        RecordBytes b;
        glossyHead(b.version(4), 1.3f, 1).f32(0.1f).f32(0.2f).f32(0.3f);
        acolorMember(b, 0.1f);
        noTexture(b);
        acolorMember(b, 0.3f);
        b.f32(0.75f).f32(45);
        auto p = load<L>(b);
        expectGlossyHead(*p);
        EXPECT_EQ(acolorRed(p->color_tex), 0.1f);
        EXPECT_FALSE(p->hilightGlossiness_tex);
        EXPECT_EQ(acolorRed(p->reflectionGlossiness_tex), 0.3f);
        EXPECT_EQ(p->anisotropy_rotation, 45);
        EXPECT_EQ(fresnelIor(p->transparency_tex), 1.3f);
    }
    {
        // Version 5: as version 4; base record (here version 2: name,
        // layer_flag_a); Fresnel rule.
        RecordBytes b;
        glossyHead(b.version(5), 1.3f, 0).f32(0.1f).f32(0.2f).f32(0.3f);
        noTexture(b);
        noTexture(b);
        noTexture(b);
        b.f32(0.75f).f32(45).version(2).str("Gloss").b8(false);
        auto p = load<L>(b);
        expectGlossyHead(*p);
        EXPECT_EQ(p->name, u"Gloss");
        EXPECT_FALSE(p->layer_flag_a);
        EXPECT_FALSE(p->transparency_tex);
    }
    {
        // Version 6: color, reflection; hilightGlossiness,
        // reflectionGlossiness, cutoff; subdivs, back_side, depth_value; the
        // four multipliers; members color_tex, hilightGlossiness_tex,
        // reflectionGlossiness_tex, transparency_tex; anisotropy,
        // anisotropy_rotation; base record version 4.
        RecordBytes b;
        b.version(6).color(0.9f, 0.8f, 0.7f).color(0.6f, 0.5f, 0.4f);
        b.f32(0.3f).f32(0.35f).f32(0.02f).i32(9).i32(1).i32(6);
        b.f32(0.1f).f32(0.2f).f32(0.3f).f32(0.4f);
        noTexture(b);
        acolorMember(b, 0.2f);
        noTexture(b);
        noTexture(b);
        b.f32(0.75f).f32(45).version(4).str("Gloss").b8(true).b8(false).b8(true);
        auto p = load<L>(b);
        EXPECT_EQ(p->transparency_tex_mult, 0.4f);
        p->transparency_tex_mult = 1;
        expectGlossyHead(*p);
        EXPECT_EQ(acolorRed(p->hilightGlossiness_tex), 0.2f);
        EXPECT_FALSE(p->transparency_tex);  // the default Fresnel is not kept
        EXPECT_TRUE(p->layer_flag_c);
        p->transparency_tex_mult = 0.4f;
        QuickArchive out;
        ASSERT_TRUE(p->save(out));
        EXPECT_EQ(testbytes::savedBytes(out), b.bytes());
    }
}

TEST(GlossyRecords, PhongVersions) { glossyOldVersions<Phong_BRDF>(); }
TEST(GlossyRecords, BlinnVersions) { glossyOldVersions<Blinn_BRDF>(); }

TEST(GlossyRecords, NewLayerHoldsADefaultFresnel) {
    Phong_BRDF p;
    Blinn_BRDF b;
    EXPECT_TRUE(isDefaultFresnel(p.transparency_tex));
    EXPECT_TRUE(isDefaultFresnel(b.transparency_tex));
    EXPECT_NE(p.transparency_tex, Phong_BRDF().transparency_tex);  // one each
    EXPECT_EQ(p.getPluginName(), u"BRDFReflection");
    EXPECT_EQ(b.getPluginName(), u"BRDFReflection");
    EXPECT_EQ(p.name, u"BRDFReflection");
    // Same content, other class: not equal.
    EXPECT_FALSE(p.isEqual(BrdfPtr(new Blinn_BRDF)));
    EXPECT_TRUE(p.isEqual(BrdfPtr(new Phong_BRDF)));
}

// ---- Mirror_BRDF -------------------------------------------------------------------------

// Version 1 up to mirror_value: color, reflection; transparency_tex_mult;
// Fresnel f32; cutoff; Fresnel i32; mirror_value.
RecordBytes& mirrorHead(RecordBytes& b, float fresnelIor, std::int32_t fresnelSwitch) {
    return b.color(0.2f, 0.3f, 0.4f)
        .color(0.5f, 0.6f, 0.7f)
        .f32(0.8f)
        .f32(fresnelIor)
        .f32(0.03f)
        .i32(fresnelSwitch)
        .i32(4);
}

void expectMirrorHead(const Mirror_BRDF& m) {
    expectColor(m.color, 0.2f, 0.3f, 0.4f);
    expectColor(m.reflection, 0.5f, 0.6f, 0.7f);
    EXPECT_EQ(m.transparency_tex_mult, 0.8f);
    EXPECT_EQ(m.cutoff, 0.03f);
    EXPECT_EQ(m.mirror_value, 4);
}

TEST(MirrorRecords, OldVersions) {
    {
        // Version 1: head; path of transparency_tex; Fresnel rule off.
        RecordBytes b;
        mirrorHead(b.version(1), 1.7f, 0).str("m.png");
        auto m = load<Mirror_BRDF>(b);
        expectMirrorHead(*m);
        EXPECT_EQ(bitmapFile(m->transparency_tex), u"m.png");
        EXPECT_EQ(m->color_tex_mult, 1);
    }
    {
        // Version 1 with the switch on: the Fresnel texture replaces the path.
        RecordBytes b;
        mirrorHead(b.version(1), 1.7f, 3).str("m.png");
        auto m = load<Mirror_BRDF>(b);
        EXPECT_EQ(fresnelIor(m->transparency_tex), 1.7f);
    }
    {
        // Version 2: head; a first path (transparency_tex); color_tex_mult; a
        // second path (color_tex).
        RecordBytes b;
        mirrorHead(b.version(2), 1.7f, 0).str("first.png").f32(0.9f).str("second.png");
        auto m = load<Mirror_BRDF>(b);
        expectMirrorHead(*m);
        EXPECT_EQ(bitmapFile(m->transparency_tex), u"first.png");
        EXPECT_EQ(bitmapFile(m->color_tex), u"second.png");
        EXPECT_EQ(m->color_tex_mult, 0.9f);
    }
    {
        // Version 3: head; color_tex_mult; members transparency_tex, color_tex;
        // Fresnel rule (on: replaces the member).
        RecordBytes b;
        mirrorHead(b.version(3), 1.25f, 1).f32(0.9f);
        acolorMember(b, 0.1f);
        acolorMember(b, 0.2f);
        auto m = load<Mirror_BRDF>(b);
        expectMirrorHead(*m);
        EXPECT_EQ(fresnelIor(m->transparency_tex), 1.25f);
        EXPECT_EQ(acolorRed(m->color_tex), 0.2f);
    }
    {
        // Version 4: as version 3; Fresnel rule (off); base record version 3
        // (name, layer_flag_a, layer_flag_b).
        RecordBytes b;
        mirrorHead(b.version(4), 1.25f, 0).f32(0.9f);
        acolorMember(b, 0.1f);
        noTexture(b);
        b.version(3).str("Shiny").b8(true).b8(true);
        auto m = load<Mirror_BRDF>(b);
        expectMirrorHead(*m);
        EXPECT_EQ(acolorRed(m->transparency_tex), 0.1f);
        EXPECT_FALSE(m->color_tex);
        EXPECT_EQ(m->name, u"Shiny");
        EXPECT_TRUE(m->layer_flag_b);
        EXPECT_FALSE(m->layer_flag_c);
    }
    {
        // Version 5: color, reflection; transparency_tex_mult, cutoff;
        // mirror_value; color_tex_mult; members transparency_tex, color_tex;
        // base record.
        RecordBytes b;
        b.version(5).color(0.2f, 0.3f, 0.4f).color(0.5f, 0.6f, 0.7f).f32(0.8f).f32(0.03f).i32(4);
        b.f32(0.9f);
        noTexture(b);
        acolorMember(b, 0.2f);
        b.version(4).str("Shiny").b8(true).b8(false).b8(false);
        auto m = load<Mirror_BRDF>(b);
        expectMirrorHead(*m);
        EXPECT_FALSE(m->transparency_tex);
        EXPECT_EQ(acolorRed(m->color_tex), 0.2f);
        QuickArchive out;
        ASSERT_TRUE(m->save(out));
        EXPECT_EQ(testbytes::savedBytes(out), b.bytes());
    }
}

// ---- Diffuse_BRDF ------------------------------------------------------------------------

TEST(DiffuseRecords, Versions) {
    // All versions start with color, transparency; color_tex_mult,
    // transparency_tex_mult.
    auto head = [](RecordBytes& b, int version) -> RecordBytes& {
        return b.version(version).color(0.1f, 0.2f, 0.3f).color(0.4f, 0.5f, 0.6f).f32(0.7f).f32(0.8f);
    };
    auto expectHead = [](const Diffuse_BRDF& d) {
        expectColor(d.color, 0.1f, 0.2f, 0.3f);
        expectColor(d.transparency, 0.4f, 0.5f, 0.6f);
        EXPECT_EQ(d.color_tex_mult, 0.7f);
        EXPECT_EQ(d.transparency_tex_mult, 0.8f);
    };
    {
        // Version 1: head; paths of color_tex, transparency_tex.
        RecordBytes b;
        head(b, 1).str("").str("alpha.png");
        auto d = load<Diffuse_BRDF>(b);
        expectHead(*d);
        EXPECT_FALSE(d->color_tex);
        EXPECT_EQ(bitmapFile(d->transparency_tex), u"alpha.png");
        EXPECT_EQ(d->name, u"BRDFDiffuse");
    }
    {
        // Version 2: head; members color_tex, transparency_tex.
        RecordBytes b;
        acolorMember(head(b, 2), 0.3f);
        noTexture(b);
        auto d = load<Diffuse_BRDF>(b);
        expectHead(*d);
        EXPECT_EQ(acolorRed(d->color_tex), 0.3f);
        EXPECT_FALSE(d->use_color_tex_alpha_as_transparency);
    }
    {
        // Version 3: as version 2; base record (version 1: name only).
        RecordBytes b;
        noTexture(head(b, 3));
        acolorMember(b, 0.4f);
        b.version(1).str("Matte");
        auto d = load<Diffuse_BRDF>(b);
        expectHead(*d);
        EXPECT_EQ(acolorRed(d->transparency_tex), 0.4f);
        EXPECT_EQ(d->name, u"Matte");
        EXPECT_TRUE(d->layer_flag_a);
    }
    {
        // Version 4: as version 3; use_color_tex_alpha_as_transparency.
        RecordBytes b;
        noTexture(head(b, 4));
        noTexture(b);
        b.version(4).str("Matte").b8(true).b8(false).b8(false).b8(true);
        auto d = load<Diffuse_BRDF>(b);
        expectHead(*d);
        EXPECT_TRUE(d->use_color_tex_alpha_as_transparency);
        QuickArchive out;
        ASSERT_TRUE(d->save(out));
        EXPECT_EQ(testbytes::savedBytes(out), b.bytes());
    }
}

// ---- Light_BRDF --------------------------------------------------------------------------

TEST(LightRecords, Versions) {
    {
        // Version 1: color; intensity, transparency_tex_mult; path of
        // transparency_tex.
        RecordBytes b;
        b.version(1).color(0.9f, 0.8f, 0.7f).f32(3).f32(0.5f).str("glow.png");
        auto l = load<Light_BRDF>(b);
        expectColor(l->color, 0.9f, 0.8f, 0.7f);
        EXPECT_EQ(l->intensity, 3);
        EXPECT_EQ(l->transparency_tex_mult, 0.5f);
        EXPECT_EQ(bitmapFile(l->transparency_tex), u"glow.png");
        expectColor(l->transparency, 0, 0, 0);
        EXPECT_EQ(l->light_value, 1);
        EXPECT_EQ(l->doubleSided, 1);
    }
    // Versions 2 to 5 start with color, transparency; intensity, light_value,
    // color_tex_mult, transparency_tex_mult.
    auto head = [](RecordBytes& b, int version) -> RecordBytes& {
        return b.version(version).color(0.9f, 0.8f, 0.7f).color(0.1f, 0.2f, 0.3f)
            .f32(3).f32(4).f32(0.25f).f32(0.5f);
    };
    auto expectHead = [](const Light_BRDF& l) {
        expectColor(l.transparency, 0.1f, 0.2f, 0.3f);
        EXPECT_EQ(l.intensity, 3);
        EXPECT_EQ(l.light_value, 4);
        EXPECT_EQ(l.color_tex_mult, 0.25f);
        EXPECT_EQ(l.transparency_tex_mult, 0.5f);
    };
    {
        // Version 2: head; paths of color_tex, transparency_tex.
        RecordBytes b;
        head(b, 2).str("c.png").str("t.png");
        auto l = load<Light_BRDF>(b);
        expectHead(*l);
        EXPECT_EQ(bitmapFile(l->color_tex), u"c.png");
        EXPECT_EQ(bitmapFile(l->transparency_tex), u"t.png");
    }
    {
        // Version 3: head; members color_tex, transparency_tex.
        RecordBytes b;
        noTexture(head(b, 3));
        acolorMember(b, 0.6f);
        auto l = load<Light_BRDF>(b);
        expectHead(*l);
        EXPECT_EQ(acolorRed(l->transparency_tex), 0.6f);
    }
    {
        // Version 4: as version 3; base record.
        RecordBytes b;
        acolorMember(head(b, 4), 0.6f);
        noTexture(b);
        b.version(4).str("Lamp").b8(false).b8(false).b8(false);
        auto l = load<Light_BRDF>(b);
        expectHead(*l);
        EXPECT_EQ(acolorRed(l->color_tex), 0.6f);
        EXPECT_EQ(l->name, u"Lamp");
        EXPECT_EQ(l->doubleSided, 1);
    }
    {
        // Version 5: as version 4; doubleSided as i32.
        RecordBytes b;
        noTexture(head(b, 5));
        noTexture(b);
        b.version(4).str("Lamp").b8(true).b8(false).b8(false).i32(0);
        auto l = load<Light_BRDF>(b);
        expectHead(*l);
        EXPECT_EQ(l->doubleSided, 0);
        QuickArchive out;
        ASSERT_TRUE(l->save(out));
        EXPECT_EQ(testbytes::savedBytes(out), b.bytes());
    }
}

// ---- every field takes part in isEqual, none of the base part does ----------------------

template <class L>
void eachFieldCounts(const std::vector<std::function<void(L&)>>& changes) {
    for (std::size_t i = 0; i < changes.size(); ++i) {
        boost::shared_ptr<L> a(new L), b(new L);
        b->transparency_tex = cloneChild(a->transparency_tex);
        ASSERT_TRUE(a->isEqual(b));
        changes[i](*b);
        EXPECT_FALSE(a->isEqual(b)) << "change " << i;
        EXPECT_FALSE(b->isEqual(a)) << "change " << i;
    }
    boost::shared_ptr<L> a(new L), b(new L);
    b->transparency_tex = cloneChild(a->transparency_tex);
    b->name = u"Other";
    b->layer_flag_a = !b->layer_flag_a;
    b->layer_flag_b = !b->layer_flag_b;
    b->layer_flag_c = !b->layer_flag_c;
    EXPECT_TRUE(a->isEqual(b));
    EXPECT_FALSE(a->isEqual(BrdfPtr()));
}

TexturePtr someTexture() { return TexturePtr(new AColorTexture); }

TEST(LayerEquality, EveryFieldCounts) {
    typedef Glass_BRDF G;
    eachFieldCounts<G>({
        [](G& l) { l.color.g = 0; }, [](G& l) { l.transparency.b = 1; },
        [](G& l) { l.fog_color.r = 0; }, [](G& l) { l.translucency.r = 0; },
        [](G& l) { l.ior = 2; }, [](G& l) { l.ior_second = 2; }, [](G& l) { l.cutoff = 2; },
        [](G& l) { l.fog_color_mult = 2; }, [](G& l) { l.glossiness = 2; },
        [](G& l) { l.color_tex_mult = 2; }, [](G& l) { l.transparency_tex_mult = 2; },
        [](G& l) { l.glossiness_tex_mult = 2; }, [](G& l) { l.ior_tex_mult = 2; },
        [](G& l) { l.translucency_tex_mult = 2; }, [](G& l) { l.thickness = 2; },
        [](G& l) { l.scatter_coeff = 2; }, [](G& l) { l.scatter_direction = 2; },
        [](G& l) { l.subdivs = 2; }, [](G& l) { l.depth_value = 2; },
        [](G& l) { l.affect_shadows = 2; }, [](G& l) { l.affect_alpha = 2; },
        [](G& l) { l.translucency_on = 2; }, [](G& l) { l.color_tex = someTexture(); },
        [](G& l) { l.transparency_tex = someTexture(); },
        [](G& l) { l.glossiness_tex = someTexture(); }, [](G& l) { l.ior_tex = someTexture(); },
        [](G& l) { l.translucency_tex = someTexture(); },
    });
    typedef Phong_BRDF P;
    eachFieldCounts<P>({
        [](P& l) { l.color.r = 0; }, [](P& l) { l.reflection.b = 0; },
        [](P& l) { l.hilightGlossiness = 2; }, [](P& l) { l.reflectionGlossiness = 2; },
        [](P& l) { l.cutoff = 2; }, [](P& l) { l.hilightGlossiness_tex_mult = 2; },
        [](P& l) { l.reflectionGlossiness_tex_mult = 2; }, [](P& l) { l.color_tex_mult = 2; },
        [](P& l) { l.transparency_tex_mult = 2; }, [](P& l) { l.anisotropy = 2; },
        [](P& l) { l.anisotropy_rotation = 2; }, [](P& l) { l.subdivs = 2; },
        [](P& l) { l.depth_value = 2; }, [](P& l) { l.back_side = 2; },
        [](P& l) { l.hilightGlossiness_tex = someTexture(); },
        [](P& l) { l.reflectionGlossiness_tex = someTexture(); },
        [](P& l) { l.color_tex = someTexture(); }, [](P& l) { l.transparency_tex.reset(); },
        [](P& l) { static_cast<FresnelTexture&>(*l.transparency_tex).fresnel_ior = 2; },
    });
    typedef Mirror_BRDF M;
    eachFieldCounts<M>({
        [](M& l) { l.color.r = 0; }, [](M& l) { l.reflection.g = 0; },
        [](M& l) { l.transparency_tex_mult = 2; }, [](M& l) { l.color_tex_mult = 2; },
        [](M& l) { l.cutoff = 2; }, [](M& l) { l.mirror_value = 2; },
        [](M& l) { l.transparency_tex.reset(); }, [](M& l) { l.color_tex = someTexture(); },
    });
    typedef Diffuse_BRDF D;
    eachFieldCounts<D>({
        [](D& l) { l.color.r = 0; }, [](D& l) { l.transparency.g = 1; },
        [](D& l) { l.color_tex_mult = 2; }, [](D& l) { l.transparency_tex_mult = 2; },
        [](D& l) { l.color_tex = someTexture(); },
        [](D& l) { l.transparency_tex = someTexture(); },
        [](D& l) { l.use_color_tex_alpha_as_transparency = true; },
    });
    typedef Light_BRDF E;
    eachFieldCounts<E>({
        [](E& l) { l.color.r = 0; }, [](E& l) { l.transparency.g = 1; },
        [](E& l) { l.intensity = 2; }, [](E& l) { l.light_value = 2; },
        [](E& l) { l.transparency_tex_mult = 2; }, [](E& l) { l.color_tex_mult = 2; },
        [](E& l) { l.transparency_tex = someTexture(); }, [](E& l) { l.color_tex = someTexture(); },
        [](E& l) { l.doubleSided = 0; },
    });
}

TEST(LayerCopies, CloneSharesNothing) {
    Glass_BRDF g;
    g.name = u"Kept";
    g.layer_flag_c = true;
    g.color_tex = someTexture();
    g.transparency_tex = someTexture();
    g.glossiness_tex = someTexture();
    g.ior_tex = someTexture();
    g.translucency_tex = someTexture();
    const BrdfPtr copy = g.clone();
    const Glass_BRDF& c = static_cast<const Glass_BRDF&>(*copy);
    EXPECT_EQ(c.name, u"Kept");
    EXPECT_TRUE(c.layer_flag_c);
    EXPECT_NE(c.color_tex, g.color_tex);
    EXPECT_NE(c.transparency_tex, g.transparency_tex);
    EXPECT_NE(c.glossiness_tex, g.glossiness_tex);
    EXPECT_NE(c.ior_tex, g.ior_tex);
    EXPECT_NE(c.translucency_tex, g.translucency_tex);
    EXPECT_TRUE(c.isEqual(BrdfPtr(new Glass_BRDF(g))));

    const BrdfPtr layers[] = {BrdfPtr(new Phong_BRDF), BrdfPtr(new Blinn_BRDF),
                              BrdfPtr(new Mirror_BRDF), BrdfPtr(new Diffuse_BRDF),
                              BrdfPtr(new Light_BRDF)};
    for (const BrdfPtr& l : layers) {
        const BrdfPtr k = l->clone();
        EXPECT_EQ(k->getType(), l->getType());
        EXPECT_TRUE(k->isEqual(l));
    }
    Mirror_BRDF m;
    EXPECT_NE(static_cast<Mirror_BRDF&>(*m.clone()).transparency_tex, m.transparency_tex);
}

// ---- factory, names, damaged data --------------------------------------------------------

TEST(LayerFactory, TagsAndNames) {
    struct Case {
        std::uint32_t tag;
        const char16_t* plugin;
    };
    const Case cases[] = {{1, u"BRDFRefraction"}, {2, u"BRDFDiffuse"}, {4, u"BRDFReflection"},
                          {8, u"BRDFReflection"}, {16, u"BRDFReflection"}, {32, u"BRDFLight"}};
    for (const Case& c : cases) {
        const BrdfPtr l = createBrdf(c.tag);
        ASSERT_TRUE(l) << c.tag;
        EXPECT_EQ(l->getType(), c.tag);
        EXPECT_EQ(l->getPluginName(), c.plugin);
        EXPECT_EQ(l->name, c.plugin);
        EXPECT_EQ(l->getAssetType(), u"BRDF");
    }
    for (std::uint32_t tag : {0u, 3u, 5u, 6u, 7u, 64u, 0xFFFFFFFFu}) EXPECT_FALSE(createBrdf(tag)) << tag;

    EXPECT_EQ(getBrdfGroupName(0), u"Emissive");
    EXPECT_EQ(getBrdfGroupName(1), u"Reflection");
    EXPECT_EQ(getBrdfGroupName(2), u"Diffuse");
    EXPECT_EQ(getBrdfGroupName(3), u"Refraction");
    EXPECT_EQ(getBrdfGroupName(4), u"");
    EXPECT_EQ(getBrdfGroupName(-1), u"");
}

TEST(LayerRecords, BadTagsFailAndLeaveTheResetState) {
    struct Case {
        std::uint32_t layerTag;
        std::uint32_t versionTag;
    };
    const Case cases[] = {
        {kGlassBrdf, 0x70000}, {kGlassBrdf, 0x60001}, {kGlassBrdf, 0},
        {kPhongBrdf, 0x70000}, {kBlinnBrdf, 0x10001}, {kMirrorBrdf, 0x60000},
        {kDiffuseBrdf, 0x50000}, {kLightBrdf, 0x60000}, {kLightBrdf, 0},
    };
    for (const Case& c : cases) {
        const BrdfPtr l = createBrdf(c.layerTag);
        l->name = u"Used";
        QuickArchive ar = RecordBytes().u32(c.versionTag).archive();
        EXPECT_FALSE(l->load(ar)) << c.layerTag << " " << std::hex << c.versionTag;
        EXPECT_EQ(l->name, l->getPluginName());
    }
}

TEST(LayerRecords, BadChildrenFail) {
    // A Diffuse_BRDF version 2 record whose color_tex names texture tag 13,
    // then one whose AColor child has a refused version, then one that ends
    // inside the base record's tag.
    RecordBytes unknownTag;
    unknownTag.version(2).color(0, 0, 0).color(0, 0, 0).f32(1).f32(1).b8(true).i32(13);
    EXPECT_FALSE(load<Diffuse_BRDF>(unknownTag, false)->color_tex);

    RecordBytes badChild;
    badChild.version(2).color(0, 0, 0).color(0, 0, 0).f32(1).f32(1).b8(true).i32(5).version(2);
    load<Diffuse_BRDF>(badChild, false);

    RecordBytes noBase;
    noBase.version(3).color(0, 0, 0).color(0, 0, 0).f32(1).f32(1).b8(false).b8(false);
    load<Diffuse_BRDF>(noBase, false);

    // Base record of a version the layer doesn't know.
    RecordBytes base5;
    base5.version(3).color(0, 0, 0).color(0, 0, 0).f32(1).f32(1).b8(false).b8(false).version(5);
    load<Diffuse_BRDF>(base5, false);
}

TEST(LayerRecords, NameLosesControlCharacters) {
    RecordBytes b;
    b.version(3).color(0, 0, 0).color(0, 0, 0).f32(1).f32(1).b8(false).b8(false);
    b.version(1).str("\tLine\nFeed");
    EXPECT_EQ(load<Diffuse_BRDF>(b)->name, u"LineFeed");
}

TEST(LayerRecords, TwoOwnersOfOneTextureSaveTwoCopies) {
    Glass_BRDF g;
    g.color_tex = someTexture();
    g.ior_tex = g.color_tex;
    QuickArchive ar;
    ASSERT_TRUE(g.save(ar));
    Glass_BRDF back;
    ASSERT_TRUE(back.load(ar));
    ASSERT_TRUE(back.color_tex && back.ior_tex);
    EXPECT_NE(back.color_tex, back.ior_tex);
    EXPECT_TRUE(back.isEqual(BrdfPtr(new Glass_BRDF(g))));
}

}  // namespace
