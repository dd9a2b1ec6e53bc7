// Records of the two-sided, bump, wrapping and toon materials: the old
// versions laid by hand, round trips, copies, comparisons, refused tags,
// truncation, and chains nested deeper than any real file.
#include <sstream>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTree.h"
#include "materials/ReferenceMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrapperAssets.h"
#include "materials/WrappingMaterials.h"
#include "materials/MaterialTestUtil.h"
#include "persistence/OrvMatFile.h"
#include "persistence/Record.h"

using namespace mattest;

namespace {

typedef TableTest WrappingRecords;

std::u16string nameOf(const MaterialPtr& m) { return m ? m->name : u"<none>"; }

// ---- old versions ---------------------------------------------------------------------------

TEST_F(WrappingRecords, TwoSidedVersions) {
    // Version 1: front, back, translucency_tex, translucency, translucency_tex_mult, force_1sided.
    RecordBytes v1, v2, v3, skp, skpBad;
    v1.version(1).multiMember("F").b8(false).acolor(0.25f).color(0.1f, 0.2f, 0.3f).f32(0.5f).b8(true);
    boost::shared_ptr<Material2Sided> m = loaded<Material2Sided>(v1);
    EXPECT_EQ(nameOf(m->front), u"F");
    EXPECT_FALSE(m->back);
    EXPECT_EQ(acolorRed(m->translucency_tex), 0.25f);
    EXPECT_EQ(std::make_tuple(m->translucency, m->translucency_tex_mult, m->force_1sided),
              std::make_tuple(Color(0.1f, 0.2f, 0.3f), 0.5f, true));
    EXPECT_EQ(std::make_tuple(!m->transparency_tex, m->transparency, m->transparency_tex_mult),
              std::make_tuple(true, Color(0, 0, 0), 1.f));
    EXPECT_EQ(m->name, u"DefaultMaterial");  // no name in the record
    // Version 2: as 1, then transparency_tex, transparency, transparency_tex_mult.
    v2.version(2).b8(false).b8(false).b8(false).color(0, 0, 0).f32(1).b8(false).acolor(0.75f).color(0.4f, 0.5f, 0.6f).f32(2);
    m = loaded<Material2Sided>(v2);
    EXPECT_EQ(acolorRed(m->transparency_tex), 0.75f);
    EXPECT_EQ(std::make_tuple(m->transparency, m->transparency_tex_mult), std::make_tuple(Color(0.4f, 0.5f, 0.6f), 2.f));
    // Version 3: as 2, then the base record.
    v3.version(3).b8(false).multiMember("B").b8(false).color(0, 0, 0).f32(1).b8(false).b8(false).color(0, 0, 0).f32(1);
    m = loaded<Material2Sided>(v3.base("Sheet", "uu"));
    EXPECT_FALSE(m->front);
    EXPECT_EQ(nameOf(m->back), u"B");
    EXPECT_EQ(m->name + m->uuid, u"Sheetuu");

    // Skp two-sided, version 1: base record, front, back, force_1sided.
    const boost::shared_ptr<MaterialSkp2Sided> s =
        loaded<MaterialSkp2Sided>(skp.version(1).base("Skp").multiMember("F").multiMember("K").b8(true));
    EXPECT_EQ(s->name + nameOf(s->front) + nameOf(s->back), u"SkpFK");
    EXPECT_TRUE(s->force_1sided);
    // A refused base record ends the load before any child is read.
    EXPECT_FALSE(loaded<MaterialSkp2Sided>(skpBad.version(1).version(3).str("X").multiMember("F"), false)->front);
}

TEST_F(WrappingRecords, BumpVersions) {
    // Version 1: name (empty: the default name), path of bump_tex, bump_tex_mult, base_mtl as tag and record.
    RecordBytes v1, v1NoPath, v2, v3;
    boost::shared_ptr<MaterialBump> m = loaded<MaterialBump>(v1.version(1).str("").str("C:/maps/bump.png").f32(0.5f).multi("Base"));
    EXPECT_EQ(m->name, u"DefaultMaterial");
    EXPECT_EQ(m->bump_tex_mult, 0.5f);
    EXPECT_EQ(nameOf(m->base_mtl), u"Base");
    ASSERT_TRUE(m->bump_tex);
    EXPECT_TRUE(m->bump_tex->isEqual(bitmap(u"C:/maps/bump.png")));
    // An empty path gives no texture.
    m = loaded<MaterialBump>(v1NoPath.version(1).str("Old").str("").f32(1).multi("Base"));
    EXPECT_EQ(m->name, u"Old");
    EXPECT_FALSE(m->bump_tex);
    // Version 2: name (an empty one stays empty), bump_tex_mult, bump_tex as member, base_mtl bare.
    m = loaded<MaterialBump>(v2.version(2).str("").f32(3).acolor(0.5f).multi("Base"));
    EXPECT_EQ(m->name, u"");
    EXPECT_EQ(m->bump_tex_mult, 3);
    EXPECT_EQ(acolorRed(m->bump_tex), 0.5f);
    // Version 3 (current): bump_tex_mult, bump_tex, base_mtl, base record.
    m = loaded<MaterialBump>(v3.version(3).f32(2).b8(false).multi("Base").base("Wall", "u-3"));
    EXPECT_EQ(m->name + m->uuid, u"Wallu-3");
    EXPECT_FALSE(m->bump_tex);
    EXPECT_EQ(m->bump_tex_mult, 2);
    QuickArchive out;
    ASSERT_TRUE(m->save(out));
    EXPECT_EQ(savedBytes(out), v3.bytes());
    // The base material can't be left out: save fails without it, and a tag
    // without a class fails the load.
    m->base_mtl.reset();
    EXPECT_FALSE(m->save(out));
    loaded<MaterialBump>(RecordBytes().version(3).f32(1).b8(false).u32(15), false);
}

TEST_F(WrappingRecords, WrapperVersions) {
    // Environment override, version 1: base record, base_mtl, the textures bg,
    // gi, reflect, refract, then colours, multipliers and switches in that order.
    RecordBytes env, d2, d1, x1, x2, x3, blend, alpha;
    env.version(1).base("Env").multiMember("Base").acolor(0.1f).b8(false).acolor(0.3f).acolor(0.4f);
    env.color(1, 0, 0).color(0, 1, 0).color(0, 0, 1).color(1, 1, 0).f32(2).f32(3).f32(4).f32(5).b8(true).b8(false).b8(false).b8(true);
    const boost::shared_ptr<MaterialOverrideEnvironment> e = loaded<MaterialOverrideEnvironment>(env);
    EXPECT_EQ(e->name + nameOf(e->base_mtl), u"EnvBase");
    EXPECT_EQ(std::make_tuple(acolorRed(e->bg_tex), acolorRed(e->gi_tex), acolorRed(e->reflect_tex), acolorRed(e->refract_tex)),
              std::make_tuple(0.1f, -1.f, 0.3f, 0.4f));
    EXPECT_EQ(std::make_tuple(e->bg_color, e->gi_color, e->reflect_color, e->refract_color),
              std::make_tuple(Color(1, 0, 0), Color(0, 1, 0), Color(0, 0, 1), Color(1, 1, 0)));
    EXPECT_EQ(std::make_tuple(e->bg_tex_mult, e->gi_tex_mult, e->reflect_tex_mult, e->refract_tex_mult),
              std::make_tuple(2.f, 3.f, 4.f, 5.f));
    EXPECT_EQ(std::make_tuple(e->override_bg, e->override_gi, e->override_reflect, e->override_refract),
              std::make_tuple(true, false, false, true));

    // Displaced, version 2: base record, base_mtl, displace_tex, the three floats, the four integers.
    d2.version(2).base("D").b8(false).acolor(0.5f).f32(2).f32(0.25f).f32(8).i32(64).i32(0).i32(0).i32(0);
    const boost::shared_ptr<MaterialDisplaced> d = loaded<MaterialDisplaced>(d2);
    auto displaced = [&d] {
        return std::make_tuple(d->displace_tex_mult, d->displace_shift, d->displace_edge_length, d->displace_max_subdivs,
                               d->displace_continuity, d->displace_view_dependent, d->displace_use_globals);
    };
    EXPECT_EQ(displaced(), std::make_tuple(2.f, 0.25f, 8.f, 64, 0, 0, 0));
    // Version 1 stops behind displace_tex_mult. Loaded into the same object,
    // the later fields are back at their defaults.
    QuickArchive ar = d1.version(1).base("D1").multiMember("Base").b8(false).f32(3).archive();
    ASSERT_TRUE(d->load(ar));
    EXPECT_EQ(d->name + nameOf(d->base_mtl), u"D1Base");
    EXPECT_FALSE(d->displace_tex);
    EXPECT_EQ(displaced(), std::make_tuple(3.f, 0.f, 4.f, 256, 1, 1, 1));

    // Object exclusion, version 1: mode, base_mtl, the object names; no base record.
    boost::shared_ptr<MaterialObjectExclusion> x =
        loaded<MaterialObjectExclusion>(x1.version(1).i32(1).multiMember("Base").u32(2).str("Chair").str("Table"));
    EXPECT_EQ(x->mode, 1);
    EXPECT_EQ(x->objects, (std::vector<std::u16string>{u"Chair", u"Table"}));
    EXPECT_EQ(x->name, u"DefaultMaterial");
    EXPECT_TRUE(x->short_circuit);
    // Version 2: as 1, then the base record.
    x = loaded<MaterialObjectExclusion>(x2.version(2).i32(0).b8(false).u32(0).base("Ex2"));
    EXPECT_EQ(x->name, u"Ex2");
    EXPECT_TRUE(x->objects.empty() && x->short_circuit);
    // Version 3: as 2, then short_circuit.
    x = loaded<MaterialObjectExclusion>(x3.version(3).i32(7).b8(false).u32(1).str("Lamp").base("Ex3").b8(false));
    EXPECT_EQ(x->mode, 7);
    EXPECT_FALSE(x->short_circuit);
    // A count beyond the data fails instead of filling memory.
    loaded<MaterialObjectExclusion>(RecordBytes().version(3).i32(0).b8(false).u32(0x7FFFFFFF), false);

    // Angle blend, version 1: base record, mtl_one, mtl_two, start, stop.
    const boost::shared_ptr<MaterialAngleBlend> a =
        loaded<MaterialAngleBlend>(blend.version(1).base("Blend").b8(false).multiMember("Two").f32(10).f32(20));
    EXPECT_FALSE(a->mtl_one);
    EXPECT_EQ(nameOf(a->mtl_two), u"Two");
    EXPECT_EQ(std::make_tuple(a->start_angle, a->stop_angle), std::make_tuple(10.f, 20.f));

    // Alpha contribution, version 1: base record, base_mtl, alpha_tex, alpha_tex_mult, alpha.
    const boost::shared_ptr<MaterialAlphaContribution> c =
        loaded<MaterialAlphaContribution>(alpha.version(1).base("Alpha").multiMember("Base").acolor(0.5f).f32(2).f32(0.25f));
    EXPECT_EQ(nameOf(c->base_mtl), u"Base");
    EXPECT_EQ(std::make_tuple(acolorRed(c->alpha_tex), c->alpha_tex_mult, c->alpha), std::make_tuple(0.5f, 2.f, 0.25f));
}

TEST_F(WrappingRecords, ToonVersions) {
    // Version 1: base_mtl; lineWidth, lineWidthTexMult, lineWidthTex;
    // opacity, opacityTexMult, opacityTex; distort, distortTexMult,
    // distortTex; lineColor, lineColorTexMult, lineColorTex; zThreshold,
    // traceBias, normalThreshold, lineUnits; doSecondary, divideByDist; base record.
    RecordBytes v1;
    v1.version(1).multiMember("Base").f32(2).f32(3).acolor(0.1f).f32(0.5f).f32(4).b8(false).f32(0.25f).f32(5).acolor(0.3f);
    v1.color(0.2f, 0.4f, 0.6f).f32(6).acolor(0.4f).f32(0.9f).f32(0.01f).f32(0.6f).f32(2.5f).b8(false).b8(true).base("Ink");
    boost::shared_ptr<MaterialToon> t = loaded<MaterialToon>(v1);
    EXPECT_EQ(t->name + nameOf(t->base_mtl), u"InkBase");
    EXPECT_EQ(std::make_tuple(t->lineWidth, t->lineWidthTexMult, acolorRed(t->lineWidthTex), t->opacity, t->opacityTexMult,
                              acolorRed(t->opacityTex), t->distort, t->distortTexMult, acolorRed(t->distortTex)),
              std::make_tuple(2.f, 3.f, 0.1f, 0.5f, 4.f, -1.f, 0.25f, 5.f, 0.3f));
    EXPECT_EQ(std::make_tuple(t->lineColor, t->lineColorTexMult, acolorRed(t->lineColorTex), t->zThreshold, t->traceBias,
                              t->normalThreshold, t->lineUnits, t->doSecondary, t->divideByDist),
              std::make_tuple(Color(0.2f, 0.4f, 0.6f), 6.f, 0.4f, 0.9f, 0.01f, 0.6f, 2.5f, false, true));
    // Version 1 has neither of the silhouette fields.
    EXPECT_EQ(std::make_tuple(t->doSilhouetteMult, t->silhouetteMult), std::make_tuple(false, 1.5f));
    // Version 2 adds doSilhouetteMult and silhouetteMult.
    std::vector<char> bytes = v1.bytes();
    bytes[2] = 2;  // the version tag 0x20000
    t = loaded<MaterialToon>(RecordBytes().raw(bytes).b8(true).f32(3));
    EXPECT_EQ(std::make_tuple(t->doSilhouetteMult, t->silhouetteMult, t->lineUnits), std::make_tuple(true, 3.f, 2.5f));
}

// ---- every class: round trips, copies, comparisons, refused tags --------------------------

// One object of each class, with children and values away from the defaults.
std::vector<MaterialPtr> sampleMaterials() {
    boost::shared_ptr<Material2Sided> twoSided(new Material2Sided);
    twoSided->name = u"TwoSided", twoSided->front = layered(u"Front"), twoSided->back = layered(u"Back");
    twoSided->translucency_tex = acolor(0.5f, 0, 0), twoSided->transparency = Color(0.1f, 0.2f, 0.3f);
    twoSided->force_1sided = true;
    boost::shared_ptr<MaterialSkp2Sided> skp(new MaterialSkp2Sided);
    skp->name = u"Skp", skp->back = layered(u"Back"), skp->force_1sided = true;
    boost::shared_ptr<MaterialBump> bump(new MaterialBump);
    bump->name = u"Bump", bump->base_mtl = layered(u"Base"), bump->bump_tex = acolor(0.25f, 0, 0), bump->bump_tex_mult = 0.75f;
    boost::shared_ptr<MaterialOverrideEnvironment> env(new MaterialOverrideEnvironment);
    env->name = u"Env", env->base_mtl = layered(u"Base"), env->gi_tex = acolor(0.1f, 0, 0);
    env->refract_color = Color(1, 0, 1), env->reflect_tex_mult = 3, env->override_gi = true;
    boost::shared_ptr<MaterialDisplaced> displaced(new MaterialDisplaced);
    displaced->name = u"Displaced", displaced->base_mtl = layered(u"Base"), displaced->displace_tex = acolor(0.2f, 0, 0);
    displaced->displace_shift = 0.5f, displaced->displace_use_globals = 0;
    boost::shared_ptr<MaterialObjectExclusion> exclusion(new MaterialObjectExclusion);
    exclusion->name = u"Exclusion", exclusion->base_mtl = layered(u"Base"), exclusion->mode = 1;
    exclusion->objects = {u"Chair", u"Table"}, exclusion->short_circuit = false;
    boost::shared_ptr<MaterialAlphaContribution> alpha(new MaterialAlphaContribution);
    alpha->name = u"Alpha", alpha->base_mtl = layered(u"Base"), alpha->alpha_tex = acolor(0.3f, 0, 0), alpha->alpha = 0.5f;
    boost::shared_ptr<MaterialAngleBlend> blend(new MaterialAngleBlend);
    blend->name = u"Blend", blend->mtl_one = layered(u"One"), blend->mtl_two = layered(u"Two"), blend->stop_angle = 90;
    boost::shared_ptr<MaterialToon> toon(new MaterialToon);
    toon->name = u"Toon", toon->base_mtl = layered(u"Base"), toon->opacityTex = acolor(0.4f, 0, 0);
    toon->lineUnits = 2, toon->doSilhouetteMult = true;
    return {twoSided, skp, bump, env, displaced, exclusion, alpha, blend, toon};
}

TEST_F(WrappingRecords, EveryClassRoundTripsAndCompares) {
    for (const MaterialPtr& m : sampleMaterials()) {
        SCOPED_TRACE(wideToUtf8(m->name));
        QuickArchive ar = savedArchive(*m);
        const MaterialPtr copy = createMaterial(m->getType());
        ASSERT_TRUE(copy->load(ar));
        EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition());
        EXPECT_EQ(copy->name, m->name);
        EXPECT_TRUE(copy->isEqual(m));
        EXPECT_TRUE(m->isEqual(copy));
        // A changed child makes them differ.
        for (const MaterialPtr& child : childMaterials(*copy)) {
            boost::dynamic_pointer_cast<MaterialLayeredBRDF>(child)->double_sided = 5;
            EXPECT_FALSE(copy->isEqual(m));
            boost::dynamic_pointer_cast<MaterialLayeredBRDF>(child)->double_sided = 1;
        }
        EXPECT_FALSE(m->isEqual(MaterialPtr()));
        EXPECT_FALSE(m->isEqual(layered(u"Other")));
    }
}

TEST_F(WrappingRecords, FieldsTakePartInTheComparison) {
    // One field changed at a time must make a copy differ.
    const std::vector<std::pair<std::uint32_t, std::function<void(BaseMaterial&)>>> cases = {
        {kMaterial2Sided, [](BaseMaterial& m) { static_cast<Material2Sided&>(m).transparency_tex_mult = 9; }},
        {kMaterial2Sided, [](BaseMaterial& m) { static_cast<Material2Sided&>(m).translucency_tex.reset(); }},
        {kMaterialSkp2Sided, [](BaseMaterial& m) { static_cast<MaterialSkp2Sided&>(m).force_1sided = false; }},
        {kMaterialBump, [](BaseMaterial& m) { static_cast<MaterialBump&>(m).bump_tex_mult = 9; }},
        {kMaterialOverrideEnvironment, [](BaseMaterial& m) { static_cast<MaterialOverrideEnvironment&>(m).override_refract = true; }},
        {kMaterialOverrideEnvironment, [](BaseMaterial& m) { static_cast<MaterialOverrideEnvironment&>(m).bg_color = Color(0, 0, 1); }},
        {kMaterialDisplaced, [](BaseMaterial& m) { static_cast<MaterialDisplaced&>(m).displace_max_subdivs = 1; }},
        {kMaterialObjectExclusion, [](BaseMaterial& m) { static_cast<MaterialObjectExclusion&>(m).objects[1] = u"Sofa"; }},
        {kMaterialObjectExclusion, [](BaseMaterial& m) { static_cast<MaterialObjectExclusion&>(m).mode = 0; }},
        {kMaterialAlphaContribution, [](BaseMaterial& m) { static_cast<MaterialAlphaContribution&>(m).alpha = 1; }},
        {kMaterialAngleBlend, [](BaseMaterial& m) { static_cast<MaterialAngleBlend&>(m).start_angle = 1; }},
        {kMaterialToon, [](BaseMaterial& m) { static_cast<MaterialToon&>(m).lineUnits = 1; }},
        {kMaterialToon, [](BaseMaterial& m) { static_cast<MaterialToon&>(m).divideByDist = true; }},
        {kMaterialToon, [](BaseMaterial& m) { static_cast<MaterialToon&>(m).opacityTex.reset(); }},
    };
    const std::vector<MaterialPtr> all = sampleMaterials();
    for (const auto& c : cases) {
        for (const MaterialPtr& m : all) {
            if (m->getType() != c.first) continue;
            const MaterialPtr copy = m->clone();
            ASSERT_TRUE(copy->isEqual(m)) << c.first;
            c.second(*copy);
            EXPECT_FALSE(copy->isEqual(m)) << c.first << " case " << &c - &cases[0];
        }
    }
    // Object names compare without regard to case.
    const MaterialPtr copy = all[5]->clone();
    static_cast<MaterialObjectExclusion&>(*copy).objects[0] = u"CHAIR";
    EXPECT_TRUE(copy->isEqual(all[5]));
}

TEST_F(WrappingRecords, CopiesTakeNamesAndShareTexturesAsTheirClassSays) {
    // Make the names of the sample materials and their children taken, so
    // that a new unique name differs from the old one.
    const std::vector<MaterialPtr> all = sampleMaterials();
    for (const MaterialPtr& m : all) {
        table().addMaterial(m);
        for (const MaterialPtr& child : childMaterials(*m)) table().addMaterial(child->clone());
    }
    for (const MaterialPtr& m : all) {
        SCOPED_TRACE(wideToUtf8(m->name));
        m->uuid = u"some-uuid";
        const MaterialPtr dup = m->duplicate(), cl = m->clone();
        EXPECT_NE(dup->name, m->name);
        EXPECT_EQ(cl->name, m->name);
        EXPECT_TRUE(dup->uuid.empty() && cl->uuid.empty());
        EXPECT_TRUE(dup->isEqual(m) && cl->isEqual(m));
        const std::vector<MaterialPtr> mine = childMaterials(*m), dupChildren = childMaterials(*dup),
                                       clChildren = childMaterials(*cl);
        ASSERT_EQ(dupChildren.size(), mine.size());
        ASSERT_EQ(clChildren.size(), mine.size());
        for (std::size_t i = 0; i < mine.size(); ++i) {
            EXPECT_NE(dupChildren[i], mine[i]);
            EXPECT_NE(clChildren[i], mine[i]);
            EXPECT_NE(dupChildren[i]->name, mine[i]->name) << "children of a duplicate are duplicated";
            // A toon clone takes its base material's duplicate too.
            EXPECT_EQ(clChildren[i]->name == mine[i]->name, m->getType() != kMaterialToon);
        }
    }
    // Two-sided copies share their textures; the others clone them.
    const Material2Sided& twoSided = static_cast<const Material2Sided&>(*all[0]);
    EXPECT_EQ(static_cast<const Material2Sided&>(*twoSided.duplicate()).translucency_tex, twoSided.translucency_tex);
    const MaterialBump& bump = static_cast<const MaterialBump&>(*all[2]);
    EXPECT_NE(static_cast<const MaterialBump&>(*bump.clone()).bump_tex, bump.bump_tex);
    const MaterialToon& toon = static_cast<const MaterialToon&>(*all[8]);
    EXPECT_NE(static_cast<const MaterialToon&>(*toon.clone()).opacityTex, toon.opacityTex);
}

TEST_F(WrappingRecords, ResetsLeaveTheNameAsTheirClassSays) {
    for (std::uint32_t tag : {kMaterial2Sided, kMaterialSkp2Sided, kMaterialOverrideEnvironment, kMaterialDisplaced,
                              kMaterialObjectExclusion, kMaterialAlphaContribution, kMaterialAngleBlend, kMaterialToon,
                              kMaterialBump}) {
        const MaterialPtr m = createMaterial(tag);
        m->name = u"Kept";
        m->uuid = u"kept-uuid";
        m->reset();
        // Only the bump takes a new default name and drops the uuid.
        EXPECT_EQ(m->name + m->uuid, tag == kMaterialBump ? u"DefaultMaterial" : u"Keptkept-uuid") << tag;
    }
}

TEST_F(WrappingRecords, RefusedTagsAndTruncatedRecords) {
    const std::pair<std::uint32_t, std::vector<std::uint32_t>> cases[] = {
        {kMaterial2Sided, {0, 0x40000, 0x30001}},   {kMaterialSkp2Sided, {0, 0x20000, 0x10001}},
        {kMaterialBump, {0, 0x40000, 0x10100}},     {kMaterialOverrideEnvironment, {0, 0x20000}},
        {kMaterialDisplaced, {0, 0x30000, 0x20001}}, {kMaterialObjectExclusion, {0, 0x40000}},
        {kMaterialAlphaContribution, {0, 0x20000}}, {kMaterialAngleBlend, {0, 0x20000}},
        {kMaterialToon, {0, 0x30000, 0x10002}},
    };
    for (const auto& c : cases) {
        for (std::uint32_t tag : c.second) {
            QuickArchive ar = RecordBytes().u32(tag).archive();
            EXPECT_FALSE(createMaterial(c.first)->load(ar)) << c.first << " " << std::hex << tag;
        }
    }
    // Every saved record, cut anywhere, returns (whatever the result) without
    // reading outside its bytes; cut to nothing, it is refused.
    for (const MaterialPtr& m : sampleMaterials()) {
        const std::vector<char> bytes = savedBytes(savedArchive(*m));
        for (std::size_t cut = 0; cut < bytes.size(); cut += 7) {
            QuickArchive ar(bytes.data(), cut);
            createMaterial(m->getType())->load(ar);
        }
        QuickArchive empty(bytes.data(), 0);
        EXPECT_FALSE(createMaterial(m->getType())->load(empty));
    }
}

// ---- nesting ------------------------------------------------------------------------------------

// How one wrapper class lays its record around its (first) child: the bytes in
// front of the child's tag, whether a present flag stands there, and the bytes
// behind the child's record.
struct WrapperLayout {
    const char* what;
    std::uint32_t tag;
    bool presentFlag;
    std::function<void(RecordBytes&)> head, tail;
};

const std::vector<WrapperLayout>& layouts() {
    static const std::vector<WrapperLayout> all = {
        // Bump 3: bump_tex_mult, bump_tex | base_mtl bare | base record.
        {"bump", kMaterialBump, false, [](RecordBytes& b) { b.version(3).f32(1).b8(false); },
         [](RecordBytes& b) { b.base("N"); }},
        // Two-sided 1: front | back, translucency_tex, translucency, mult, force.
        {"two-sided", kMaterial2Sided, true, [](RecordBytes& b) { b.version(1); },
         [](RecordBytes& b) { b.b8(false).b8(false).color(0, 0, 0).f32(1).b8(false); }},
        // Skp two-sided 1: base record | front | back, force.
        {"skp two-sided", kMaterialSkp2Sided, true, [](RecordBytes& b) { b.version(1).base("N"); },
         [](RecordBytes& b) { b.b8(false).b8(false); }},
        // Linked 1: id (kind 2) | material bare | base record.
        {"linked", kMaterialLinked, false, [](RecordBytes& b) { b.version(1).version(1).u32(2).i32(7); },
         [](RecordBytes& b) { b.base("N"); }},
        // Environment override 1: base record | base_mtl | four textures, colours, multipliers, switches.
        {"environment", kMaterialOverrideEnvironment, true, [](RecordBytes& b) { b.version(1).base("N"); },
         [](RecordBytes& b) {
             b.b8(false).b8(false).b8(false).b8(false).color(0, 0, 0).color(0, 0, 0).color(0, 0, 0).color(0, 0, 0);
             b.f32(1).f32(1).f32(1).f32(1).b8(false).b8(false).b8(false).b8(false);
         }},
        // Displaced 1: base record | base_mtl | displace_tex, mult.
        {"displaced", kMaterialDisplaced, true, [](RecordBytes& b) { b.version(1).base("N"); },
         [](RecordBytes& b) { b.b8(false).f32(1); }},
        // Object exclusion 3: mode | base_mtl | names, base record, short_circuit.
        {"exclusion", kMaterialObjectExclusion, true, [](RecordBytes& b) { b.version(3).i32(0); },
         [](RecordBytes& b) { b.u32(0).base("N").b8(true); }},
        // Alpha contribution 1: base record | base_mtl | alpha_tex, two floats.
        {"alpha", kMaterialAlphaContribution, true, [](RecordBytes& b) { b.version(1).base("N"); },
         [](RecordBytes& b) { b.b8(false).f32(1).f32(1); }},
        // Angle blend 1: base record | mtl_one | mtl_two, two angles.
        {"angle blend", kMaterialAngleBlend, true, [](RecordBytes& b) { b.version(1).base("N"); },
         [](RecordBytes& b) { b.b8(false).f32(75).f32(150); }},
        // Reference 2: base record, target_uuid | embedded copy.
        {"reference", kMaterialReference, true, [](RecordBytes& b) { b.version(2).base("N").str("t"); },
         [](RecordBytes&) {}},
        // Toon 2: base_mtl | the line fields, base record, silhouette fields.
        {"toon", kMaterialToon, true, [](RecordBytes& b) { b.version(2); },
         [](RecordBytes& b) {
             b.f32(1.5f).f32(1).b8(false).f32(1).f32(1).b8(false).f32(0).f32(1).b8(false);
             b.color(0, 0, 0).f32(1).b8(false).f32(0.95f).f32(0.02f).f32(0.7f).f32(1).b8(true).b8(false);
             b.base("N").b8(false).f32(1.5f);
         }},
    };
    return all;
}

// A chain of `depth` wrappers, level i of the class layouts()[pick(i)], over
// one layered material without layers. The record of the top, without its tag.
RecordBytes chain(int depth, const std::function<std::size_t(int)>& pick) {
    RecordBytes b;
    for (int i = 0; i < depth; ++i) {
        const WrapperLayout& w = layouts()[pick(i)];
        w.head(b);
        if (w.presentFlag) b.b8(true);
        b.u32(i + 1 < depth ? layouts()[pick(i + 1)].tag : kMaterialLayeredBRDF);
    }
    // MaterialLayeredBRDF 4: no layers, four integers, base record, one integer.
    b.version(4).u32(0).i32(1).i32(0).i32(1).i32(1).base("N").i32(0);
    for (int i = depth; i-- > 0;) layouts()[pick(i)].tail(b);
    return b;
}

bool loadChain(const RecordBytes& bytes, std::uint32_t topTag, MaterialPtr* out = nullptr) {
    const MaterialPtr top = createMaterial(topTag);
    QuickArchive ar = bytes.archive();
    const bool ok = top->load(ar);
    if (ok) {
        EXPECT_EQ(ar.getReadPosition(), bytes.size());
    }
    if (out) *out = top;
    return ok;
}

TEST_F(WrappingRecords, EveryWrapperClassStopsAtTheNestingLimit) {
    for (std::size_t k = 0; k < layouts().size(); ++k) {
        SCOPED_TRACE(layouts()[k].what);
        auto same = [k](int) { return k; };
        // The top record isn't nested; its child is one level deep, and so on:
        // the layered material at the bottom stands kMaxNestingDepth deep.
        EXPECT_TRUE(loadChain(chain(kMaxNestingDepth, same), layouts()[k].tag));
        EXPECT_FALSE(loadChain(chain(kMaxNestingDepth + 1, same), layouts()[k].tag));
        EXPECT_FALSE(loadChain(chain(1000, same), layouts()[k].tag));
    }
    // A reference whose copy holds a reference: converted from the copy of the
    // copy of the copy, under the innermost reference's name.
    MaterialPtr top;
    auto refs = [](int) { return std::size_t(9); };
    ASSERT_EQ(layouts()[9].tag, kMaterialReference);
    ASSERT_TRUE(loadChain(chain(3, refs), kMaterialReference, &top));
    EXPECT_EQ(countOf(wideToUtf8(materialToXml(top)), "url=\"/N\""), 1);
}

TEST_F(WrappingRecords, AThousandNestedWrappersInAFileFailToLoad) {
    // All classes mixed, a bump at the top.
    auto mixed = [](int i) { return static_cast<std::size_t>(i) % layouts().size(); };
    for (int depth : {100, 1000}) {
        RecordBytes whole;
        whole.version(2).u32(1).u32(kMaterialBump).raw(chain(depth, mixed).bytes());  // header, the bump's tag
        OrvMatFile library;
        std::istringstream in(std::string(whole.bytes().begin(), whole.bytes().end()));
        EXPECT_EQ(library.load(in), depth == 100) << depth;
        if (depth == 100) {
            // Within the limit the tree converts, flattened under the top.
            const std::string xml = wideToUtf8(materialToXml(library.materials[0]));
            EXPECT_EQ(countOf(xml, "layout=\"deflumat\""), 1);
            EXPECT_EQ(countOf(xml, "name=\"bump_on\""), 1);
        }
    }
    // Built in memory: saving works at any depth; loading the result fails at
    // the limit, while the conversion still finds the layered material.
    MaterialPtr tree = layered(u"Bottom");
    for (int i = 0; i < 1000; ++i) {
        boost::shared_ptr<MaterialBump> bump(new MaterialBump);
        bump->base_mtl = tree;
        tree = bump;
    }
    QuickArchive ar = savedArchive(*tree);
    EXPECT_FALSE(MaterialBump().load(ar));
    EXPECT_EQ(countOf(wideToUtf8(materialToXml(tree)), "layout=\"deflumat\""), 1);
}

}  // namespace
