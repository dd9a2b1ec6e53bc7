// Records of the two-sided, bump, wrapping and toon materials: every version
// hand-laid and checked field by field after loading, round trips, copies,
// comparisons and refused tags.
#include <gtest/gtest.h>

#include "materials/MaterialTree.h"
#include "materials/RecordBytes.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "textures/Bitmaps.h"
#include "test_wrapping_util.h"

using namespace OrvaneLumoCore;
using namespace wraptest;
using testbytes::RecordBytes;

namespace {

class WrappingRecords : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

// ---- pieces of hand-laid records ---------------------------------------------------

// Base record, version 2: name, uuid.
RecordBytes& baseRecord(RecordBytes& b, const std::string& name, const std::string& uuid = "") {
    return b.version(2).str(name).str(uuid);
}

// A present material member holding an empty MaterialMulti (version 2: count
// 0, base record) named `name`.
RecordBytes& multiMember(RecordBytes& b, const std::string& name) {
    b.b8(true).u32(kMaterialMulti).version(2).u32(0);
    return baseRecord(b, name);
}

// The same without the present flag (a bare material).
RecordBytes& bareMulti(RecordBytes& b, const std::string& name) {
    b.u32(kMaterialMulti).version(2).u32(0);
    return baseRecord(b, name);
}

// A present texture member holding an AColorTexture (version 1, acolor).
RecordBytes& acolorMember(RecordBytes& b, float r) { return b.b8(true).u32(5).version(1).f32(r).f32(0).f32(0).f32(1); }

template <class T>
boost::shared_ptr<T> loadFrom(const RecordBytes& b, bool expectOk = true) {
    boost::shared_ptr<T> m(new T);
    QuickArchive ar = b.archive();
    EXPECT_EQ(m->load(ar), expectOk);
    if (expectOk) {
        EXPECT_EQ(ar.getReadPosition(), b.size()) << "the record was read to its end";
    }
    return m;
}

float acolorRed(const TexturePtr& t) {
    const AColorTexture* a = dynamic_cast<const AColorTexture*>(t.get());
    return a ? a->color.r : -1;
}

// ---- Material2Sided ---------------------------------------------------------------------

TEST_F(WrappingRecords, TwoSidedVersions) {
    // Version 1: front, back, translucency_tex, translucency,
    // translucency_tex_mult, force_1sided.
    RecordBytes v1;
    v1.version(1);
    multiMember(v1, "F").b8(false);
    acolorMember(v1, 0.25f).color(0.1f, 0.2f, 0.3f).f32(0.5f).b8(true);
    boost::shared_ptr<Material2Sided> m = loadFrom<Material2Sided>(v1);
    ASSERT_TRUE(m->front);
    EXPECT_EQ(m->front->name, u"F");
    EXPECT_FALSE(m->back);
    EXPECT_EQ(acolorRed(m->translucency_tex), 0.25f);
    EXPECT_EQ(m->translucency, Color(0.1f, 0.2f, 0.3f));
    EXPECT_EQ(m->translucency_tex_mult, 0.5f);
    EXPECT_TRUE(m->force_1sided);
    EXPECT_FALSE(m->transparency_tex);
    EXPECT_EQ(m->transparency, Color(0, 0, 0));
    EXPECT_EQ(m->transparency_tex_mult, 1);
    EXPECT_EQ(m->name, u"DefaultMaterial");  // no name in the record

    // Version 2: as 1, then transparency_tex, transparency,
    // transparency_tex_mult.
    RecordBytes v2;
    v2.version(2).b8(false).b8(false).b8(false).color(0, 0, 0).f32(1).b8(false);
    acolorMember(v2, 0.75f).color(0.4f, 0.5f, 0.6f).f32(2);
    m = loadFrom<Material2Sided>(v2);
    EXPECT_EQ(acolorRed(m->transparency_tex), 0.75f);
    EXPECT_EQ(m->transparency, Color(0.4f, 0.5f, 0.6f));
    EXPECT_EQ(m->transparency_tex_mult, 2);
    EXPECT_EQ(m->name, u"DefaultMaterial");

    // Version 3: as 2, then the base record.
    RecordBytes v3;
    v3.version(3).b8(false);
    multiMember(v3, "B").b8(false).color(0, 0, 0).f32(1).b8(false).b8(false).color(0, 0, 0).f32(1);
    baseRecord(v3, "Sheet", "uu");
    m = loadFrom<Material2Sided>(v3);
    EXPECT_FALSE(m->front);
    EXPECT_EQ(m->back->name, u"B");
    EXPECT_EQ(m->name, u"Sheet");
    EXPECT_EQ(m->uuid, u"uu");
}

TEST_F(WrappingRecords, SkpTwoSidedHasTheBaseRecordFirst) {
    RecordBytes b;
    b.version(1);
    baseRecord(b, "Skp");
    multiMember(b, "F");
    multiMember(b, "K").b8(true);
    boost::shared_ptr<MaterialSkp2Sided> m = loadFrom<MaterialSkp2Sided>(b);
    EXPECT_EQ(m->name, u"Skp");
    EXPECT_EQ(m->front->name, u"F");
    EXPECT_EQ(m->back->name, u"K");
    EXPECT_TRUE(m->force_1sided);

    // A refused base record ends the load before any child is read.
    RecordBytes bad;
    bad.version(1).version(3).str("X");
    multiMember(bad, "F");
    m = loadFrom<MaterialSkp2Sided>(bad, false);
    EXPECT_FALSE(m->front);
}

// ---- MaterialBump -------------------------------------------------------------------------

TEST_F(WrappingRecords, BumpVersions) {
    // Version 1: name (empty -> default name), path of bump_tex,
    // bump_tex_mult, base_mtl as tag and record.
    RecordBytes v1;
    v1.version(1).str("").str("C:/maps/bump.png").f32(0.5f);
    bareMulti(v1, "Base");
    boost::shared_ptr<MaterialBump> m = loadFrom<MaterialBump>(v1);
    EXPECT_EQ(m->name, u"DefaultMaterial");
    EXPECT_EQ(m->bump_tex_mult, 0.5f);
    EXPECT_EQ(m->base_mtl->name, u"Base");
    const BitmapTexture* bitmap = dynamic_cast<const BitmapTexture*>(m->bump_tex.get());
    ASSERT_TRUE(bitmap);
    const BitmapBuffer* buffer = dynamic_cast<const BitmapBuffer*>(bitmap->bitmap.get());
    ASSERT_TRUE(buffer);
    EXPECT_EQ(buffer->file, u"C:/maps/bump.png");

    // An empty path gives no texture.
    RecordBytes v1NoPath;
    v1NoPath.version(1).str("Old").str("").f32(1);
    bareMulti(v1NoPath, "Base");
    m = loadFrom<MaterialBump>(v1NoPath);
    EXPECT_EQ(m->name, u"Old");
    EXPECT_FALSE(m->bump_tex);

    // Version 2: name (an empty one stays empty), bump_tex_mult, bump_tex
    // as texture member, base_mtl bare.
    RecordBytes v2;
    v2.version(2).str("").f32(3);
    acolorMember(v2, 0.5f);
    bareMulti(v2, "Base");
    m = loadFrom<MaterialBump>(v2);
    EXPECT_EQ(m->name, u"");
    EXPECT_EQ(m->bump_tex_mult, 3);
    EXPECT_EQ(acolorRed(m->bump_tex), 0.5f);

    // Version 3: bump_tex_mult, bump_tex, base_mtl, base record.
    RecordBytes v3;
    v3.version(3).f32(2).b8(false);
    bareMulti(v3, "Base");
    baseRecord(v3, "Wall", "u-3");
    m = loadFrom<MaterialBump>(v3);
    EXPECT_EQ(m->name, u"Wall");
    EXPECT_EQ(m->uuid, u"u-3");
    EXPECT_FALSE(m->bump_tex);
    EXPECT_EQ(m->bump_tex_mult, 2);
}

TEST_F(WrappingRecords, BumpNeedsItsBaseMaterial) {
    MaterialBump bump;
    QuickArchive ar(1);
    EXPECT_FALSE(bump.save(ar));
    // The bare material has no present flag: a tag without a class fails.
    RecordBytes b;
    b.version(3).f32(1).b8(false).u32(15);
    loadFrom<MaterialBump>(b, false);
}

// ---- wrapping materials --------------------------------------------------------------------

TEST_F(WrappingRecords, OverrideEnvironmentRecordHasTheBackgroundFirst) {
    // Version 1: base record, base_mtl, the textures bg, gi, reflect,
    // refract, then colours, multipliers and switches in the same order.
    RecordBytes b;
    b.version(1);
    baseRecord(b, "Env");
    multiMember(b, "Base");
    acolorMember(b, 0.1f).b8(false);
    acolorMember(b, 0.3f);
    acolorMember(b, 0.4f);
    b.color(1, 0, 0).color(0, 1, 0).color(0, 0, 1).color(1, 1, 0);
    b.f32(2).f32(3).f32(4).f32(5);
    b.b8(true).b8(false).b8(false).b8(true);
    boost::shared_ptr<MaterialOverrideEnvironment> m = loadFrom<MaterialOverrideEnvironment>(b);
    EXPECT_EQ(m->name, u"Env");
    EXPECT_EQ(m->base_mtl->name, u"Base");
    EXPECT_EQ(acolorRed(m->bg_tex), 0.1f);
    EXPECT_FALSE(m->gi_tex);
    EXPECT_EQ(acolorRed(m->reflect_tex), 0.3f);
    EXPECT_EQ(acolorRed(m->refract_tex), 0.4f);
    EXPECT_EQ(m->bg_color, Color(1, 0, 0));
    EXPECT_EQ(m->gi_color, Color(0, 1, 0));
    EXPECT_EQ(m->reflect_color, Color(0, 0, 1));
    EXPECT_EQ(m->refract_color, Color(1, 1, 0));
    EXPECT_EQ(m->bg_tex_mult, 2);
    EXPECT_EQ(m->gi_tex_mult, 3);
    EXPECT_EQ(m->reflect_tex_mult, 4);
    EXPECT_EQ(m->refract_tex_mult, 5);
    EXPECT_TRUE(m->override_bg);
    EXPECT_FALSE(m->override_gi);
    EXPECT_FALSE(m->override_reflect);
    EXPECT_TRUE(m->override_refract);
}

TEST_F(WrappingRecords, DisplacedVersionOneKeepsTheDefaultsOfLaterFields) {
    // Version 2: base record, base_mtl, displace_tex, the three floats, the
    // four integers.
    RecordBytes v2;
    v2.version(2);
    baseRecord(v2, "D").b8(false);
    acolorMember(v2, 0.5f).f32(2).f32(0.25f).f32(8).i32(64).i32(0).i32(0).i32(0);
    boost::shared_ptr<MaterialDisplaced> m = loadFrom<MaterialDisplaced>(v2);
    EXPECT_EQ(m->displace_tex_mult, 2);
    EXPECT_EQ(m->displace_shift, 0.25f);
    EXPECT_EQ(m->displace_edge_length, 8);
    EXPECT_EQ(m->displace_max_subdivs, 64);
    EXPECT_EQ(m->displace_continuity, 0);
    EXPECT_EQ(m->displace_view_dependent, 0);
    EXPECT_EQ(m->displace_use_globals, 0);

    // Version 1 stops behind displace_tex_mult. Loaded into the same
    // object, the later fields are back at their defaults.
    RecordBytes v1;
    v1.version(1);
    baseRecord(v1, "D1");
    multiMember(v1, "Base").b8(false).f32(3);
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(m->load(ar));
    EXPECT_EQ(m->name, u"D1");
    EXPECT_EQ(m->base_mtl->name, u"Base");
    EXPECT_FALSE(m->displace_tex);
    EXPECT_EQ(m->displace_tex_mult, 3);
    EXPECT_EQ(m->displace_shift, 0);
    EXPECT_EQ(m->displace_edge_length, 4);
    EXPECT_EQ(m->displace_max_subdivs, 256);
    EXPECT_EQ(m->displace_continuity, 1);
    EXPECT_EQ(m->displace_view_dependent, 1);
    EXPECT_EQ(m->displace_use_globals, 1);
}

TEST_F(WrappingRecords, ObjectExclusionVersions) {
    // Version 1: mode, base_mtl, the object names; no base record.
    RecordBytes v1;
    v1.version(1).i32(1);
    multiMember(v1, "Base").u32(2).str("Chair").str("Table");
    boost::shared_ptr<MaterialObjectExclusion> m = loadFrom<MaterialObjectExclusion>(v1);
    EXPECT_EQ(m->mode, 1);
    EXPECT_EQ(m->objects, (std::vector<std::u16string>{u"Chair", u"Table"}));
    EXPECT_EQ(m->name, u"DefaultMaterial");
    EXPECT_TRUE(m->short_circuit);

    // Version 2: as 1, then the base record.
    RecordBytes v2;
    v2.version(2).i32(0).b8(false).u32(0);
    baseRecord(v2, "Ex2");
    m = loadFrom<MaterialObjectExclusion>(v2);
    EXPECT_EQ(m->name, u"Ex2");
    EXPECT_TRUE(m->objects.empty());
    EXPECT_TRUE(m->short_circuit);

    // Version 3: as 2, then short_circuit.
    RecordBytes v3;
    v3.version(3).i32(7).b8(false).u32(1).str("Lamp");
    baseRecord(v3, "Ex3").b8(false);
    m = loadFrom<MaterialObjectExclusion>(v3);
    EXPECT_EQ(m->mode, 7);
    EXPECT_FALSE(m->short_circuit);

    // A count beyond the data fails instead of filling memory.
    RecordBytes huge;
    huge.version(3).i32(0).b8(false).u32(0x7FFFFFFF);
    loadFrom<MaterialObjectExclusion>(huge, false);
}

TEST_F(WrappingRecords, AngleBlendAndAlphaContribution) {
    // Angle blend, version 1: base record, mtl_one, mtl_two, start, stop.
    RecordBytes blend;
    blend.version(1);
    baseRecord(blend, "Blend").b8(false);
    multiMember(blend, "Two").f32(10).f32(20);
    boost::shared_ptr<MaterialAngleBlend> a = loadFrom<MaterialAngleBlend>(blend);
    EXPECT_FALSE(a->mtl_one);
    EXPECT_EQ(a->mtl_two->name, u"Two");
    EXPECT_EQ(a->start_angle, 10);
    EXPECT_EQ(a->stop_angle, 20);

    // Alpha contribution, version 1: base record, base_mtl, alpha_tex,
    // alpha_tex_mult, alpha.
    RecordBytes alpha;
    alpha.version(1);
    baseRecord(alpha, "Alpha");
    multiMember(alpha, "Base");
    acolorMember(alpha, 0.5f).f32(2).f32(0.25f);
    boost::shared_ptr<MaterialAlphaContribution> c = loadFrom<MaterialAlphaContribution>(alpha);
    EXPECT_EQ(c->base_mtl->name, u"Base");
    EXPECT_EQ(acolorRed(c->alpha_tex), 0.5f);
    EXPECT_EQ(c->alpha_tex_mult, 2);
    EXPECT_EQ(c->alpha, 0.25f);
}

// ---- MaterialToon ----------------------------------------------------------------------------

// Rows 1 to 13 of the toon record, with distinct values.
RecordBytes toonHead() {
    RecordBytes b;
    b.version(1);
    multiMember(b, "Base");
    b.f32(2).f32(3);  // lineWidth, lineWidthTexMult
    acolorMember(b, 0.1f);
    b.f32(0.5f).f32(4);  // opacity, opacityTexMult
    b.b8(false);
    b.f32(0.25f).f32(5);  // distort, distortTexMult
    acolorMember(b, 0.3f);
    b.color(0.2f, 0.4f, 0.6f).f32(6);  // lineColor, lineColorTexMult
    acolorMember(b, 0.4f);
    b.f32(0.9f).f32(0.01f).f32(0.6f).f32(2.5f);  // zThreshold, traceBias, normalThreshold, lineUnits
    b.b8(false).b8(true);                        // doSecondary, divideByDist
    return baseRecord(b, "Ink");
}

TEST_F(WrappingRecords, ToonVersions) {
    boost::shared_ptr<MaterialToon> t = loadFrom<MaterialToon>(toonHead());
    EXPECT_EQ(t->base_mtl->name, u"Base");
    EXPECT_EQ(t->lineWidth, 2);
    EXPECT_EQ(t->lineWidthTexMult, 3);
    EXPECT_EQ(acolorRed(t->lineWidthTex), 0.1f);
    EXPECT_EQ(t->opacity, 0.5f);
    EXPECT_EQ(t->opacityTexMult, 4);
    EXPECT_FALSE(t->opacityTex);
    EXPECT_EQ(t->distort, 0.25f);
    EXPECT_EQ(t->distortTexMult, 5);
    EXPECT_EQ(acolorRed(t->distortTex), 0.3f);
    EXPECT_EQ(t->lineColor, Color(0.2f, 0.4f, 0.6f));
    EXPECT_EQ(t->lineColorTexMult, 6);
    EXPECT_EQ(acolorRed(t->lineColorTex), 0.4f);
    EXPECT_EQ(t->zThreshold, 0.9f);
    EXPECT_EQ(t->traceBias, 0.01f);
    EXPECT_EQ(t->normalThreshold, 0.6f);
    EXPECT_EQ(t->lineUnits, 2.5f);
    EXPECT_FALSE(t->doSecondary);
    EXPECT_TRUE(t->divideByDist);
    EXPECT_EQ(t->name, u"Ink");
    // Version 1 has neither of the silhouette fields.
    EXPECT_FALSE(t->doSilhouetteMult);
    EXPECT_EQ(t->silhouetteMult, 1.5f);

    // Version 2 adds doSilhouetteMult and silhouetteMult.
    RecordBytes v2 = toonHead();
    v2.b8(true).f32(3);
    std::vector<char> bytes = v2.bytes();
    bytes[2] = 2;  // the version tag 0x20000
    RecordBytes relaid;
    relaid.raw(bytes);
    t = loadFrom<MaterialToon>(relaid);
    EXPECT_TRUE(t->doSilhouetteMult);
    EXPECT_EQ(t->silhouetteMult, 3);
}

// ---- every class: round trips, copies, comparisons, refused tags --------------------------

// One object of each class, with children and values away from the defaults.
std::vector<MaterialPtr> sampleMaterials() {
    std::vector<MaterialPtr> all;

    boost::shared_ptr<Material2Sided> twoSided(new Material2Sided);
    twoSided->name = u"TwoSided";
    twoSided->front = layered(u"Front");
    twoSided->back = layered(u"Back");
    twoSided->translucency_tex = acolor(0.5f, 0, 0);
    twoSided->transparency = Color(0.1f, 0.2f, 0.3f);
    twoSided->force_1sided = true;
    all.push_back(twoSided);

    boost::shared_ptr<MaterialSkp2Sided> skp(new MaterialSkp2Sided);
    skp->name = u"Skp";
    skp->back = layered(u"Back");
    skp->force_1sided = true;
    all.push_back(skp);

    boost::shared_ptr<MaterialBump> bump(new MaterialBump);
    bump->name = u"Bump";
    bump->base_mtl = layered(u"Base");
    bump->bump_tex = acolor(0.25f, 0, 0);
    bump->bump_tex_mult = 0.75f;
    all.push_back(bump);

    boost::shared_ptr<MaterialOverrideEnvironment> env(new MaterialOverrideEnvironment);
    env->name = u"Env";
    env->base_mtl = layered(u"Base");
    env->gi_tex = acolor(0.1f, 0, 0);
    env->refract_color = Color(1, 0, 1);
    env->reflect_tex_mult = 3;
    env->override_gi = true;
    all.push_back(env);

    boost::shared_ptr<MaterialDisplaced> displaced(new MaterialDisplaced);
    displaced->name = u"Displaced";
    displaced->base_mtl = layered(u"Base");
    displaced->displace_tex = acolor(0.2f, 0, 0);
    displaced->displace_shift = 0.5f;
    displaced->displace_use_globals = 0;
    all.push_back(displaced);

    boost::shared_ptr<MaterialObjectExclusion> exclusion(new MaterialObjectExclusion);
    exclusion->name = u"Exclusion";
    exclusion->base_mtl = layered(u"Base");
    exclusion->mode = 1;
    exclusion->objects = {u"Chair", u"Table"};
    exclusion->short_circuit = false;
    all.push_back(exclusion);

    boost::shared_ptr<MaterialAlphaContribution> alpha(new MaterialAlphaContribution);
    alpha->name = u"Alpha";
    alpha->base_mtl = layered(u"Base");
    alpha->alpha_tex = acolor(0.3f, 0, 0);
    alpha->alpha = 0.5f;
    all.push_back(alpha);

    boost::shared_ptr<MaterialAngleBlend> blend(new MaterialAngleBlend);
    blend->name = u"Blend";
    blend->mtl_one = layered(u"One");
    blend->mtl_two = layered(u"Two");
    blend->stop_angle = 90;
    all.push_back(blend);

    boost::shared_ptr<MaterialToon> toon(new MaterialToon);
    toon->name = u"Toon";
    toon->base_mtl = layered(u"Base");
    toon->opacityTex = acolor(0.4f, 0, 0);
    toon->lineUnits = 2;
    toon->doSilhouetteMult = true;
    all.push_back(toon);
    return all;
}

TEST_F(WrappingRecords, EveryClassRoundTripsAndCompares) {
    for (const MaterialPtr& m : sampleMaterials()) {
        SCOPED_TRACE(wideToUtf8(m->name));
        QuickArchive ar = savedArchive(*m);
        MaterialPtr copy = createMaterial(m->getType());
        ASSERT_TRUE(copy);
        ASSERT_TRUE(copy->load(ar));
        EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition());
        EXPECT_EQ(copy->name, m->name);
        EXPECT_TRUE(copy->isEqual(m));
        EXPECT_TRUE(m->isEqual(copy));
        // A changed child makes them differ.
        for (const MaterialPtr& child : childMaterials(*copy)) {
            const std::u16string old = child->name;
            boost::dynamic_pointer_cast<MaterialLayeredBRDF>(child)->double_sided = 5;
            EXPECT_FALSE(copy->isEqual(m));
            boost::dynamic_pointer_cast<MaterialLayeredBRDF>(child)->double_sided = 1;
        }
        EXPECT_FALSE(m->isEqual(MaterialPtr()));
        EXPECT_FALSE(m->isEqual(layered(u"Other")));
    }
}

TEST_F(WrappingRecords, FieldsTakePartInTheComparison) {
    // One field changed at a time must make two copies differ.
    typedef void (*Change)(BaseMaterial&);
    struct Case {
        std::uint32_t type;
        Change change;
    };
    const Case cases[] = {
        {kMaterial2Sided, [](BaseMaterial& m) { static_cast<Material2Sided&>(m).transparency_tex_mult = 9; }},
        {kMaterial2Sided, [](BaseMaterial& m) { static_cast<Material2Sided&>(m).translucency_tex.reset(); }},
        {kMaterialSkp2Sided, [](BaseMaterial& m) { static_cast<MaterialSkp2Sided&>(m).force_1sided = false; }},
        {kMaterialBump, [](BaseMaterial& m) { static_cast<MaterialBump&>(m).bump_tex_mult = 9; }},
        {kMaterialOverrideEnvironment,
         [](BaseMaterial& m) { static_cast<MaterialOverrideEnvironment&>(m).override_refract = true; }},
        {kMaterialOverrideEnvironment,
         [](BaseMaterial& m) { static_cast<MaterialOverrideEnvironment&>(m).bg_color = Color(0, 0, 1); }},
        {kMaterialDisplaced, [](BaseMaterial& m) { static_cast<MaterialDisplaced&>(m).displace_max_subdivs = 1; }},
        {kMaterialObjectExclusion,
         [](BaseMaterial& m) { static_cast<MaterialObjectExclusion&>(m).objects[1] = u"Sofa"; }},
        {kMaterialObjectExclusion, [](BaseMaterial& m) { static_cast<MaterialObjectExclusion&>(m).mode = 0; }},
        {kMaterialAlphaContribution, [](BaseMaterial& m) { static_cast<MaterialAlphaContribution&>(m).alpha = 1; }},
        {kMaterialAngleBlend, [](BaseMaterial& m) { static_cast<MaterialAngleBlend&>(m).start_angle = 1; }},
        {kMaterialToon, [](BaseMaterial& m) { static_cast<MaterialToon&>(m).lineUnits = 1; }},
        {kMaterialToon, [](BaseMaterial& m) { static_cast<MaterialToon&>(m).divideByDist = true; }},
        {kMaterialToon, [](BaseMaterial& m) { static_cast<MaterialToon&>(m).opacityTex.reset(); }},
    };
    const std::vector<MaterialPtr> all = sampleMaterials();
    for (const Case& c : cases) {
        for (const MaterialPtr& m : all) {
            if (m->getType() != c.type) continue;
            MaterialPtr copy = m->clone();
            ASSERT_TRUE(copy->isEqual(m)) << c.type;
            c.change(*copy);
            EXPECT_FALSE(copy->isEqual(m)) << c.type;
        }
    }
    // Object names compare without regard to case.
    for (const MaterialPtr& m : all) {
        if (m->getType() != kMaterialObjectExclusion) continue;
        MaterialPtr copy = m->clone();
        static_cast<MaterialObjectExclusion&>(*copy).objects[0] = u"CHAIR";
        EXPECT_TRUE(copy->isEqual(m));
    }
}

TEST_F(WrappingRecords, CopiesTakeNamesAndShareTexturesAsTheirClassSays) {
    // Make the names of the sample materials and their children taken, so
    // that a new unique name differs from the old one.
    const std::vector<MaterialPtr> all = sampleMaterials();
    for (const MaterialPtr& m : all) {
        SceneMaterials::instance()->addMaterial(m);
        for (const MaterialPtr& child : childMaterials(*m)) SceneMaterials::instance()->addMaterial(child->clone());
    }
    for (const MaterialPtr& m : all) {
        SCOPED_TRACE(wideToUtf8(m->name));
        m->uuid = u"some-uuid";
        const MaterialPtr dup = m->duplicate();
        const MaterialPtr cl = m->clone();
        EXPECT_NE(dup->name, m->name);
        EXPECT_EQ(cl->name, m->name);
        EXPECT_TRUE(dup->uuid.empty());
        EXPECT_TRUE(cl->uuid.empty());
        EXPECT_TRUE(dup->isEqual(m));
        EXPECT_TRUE(cl->isEqual(m));
        const std::vector<MaterialPtr> mine = childMaterials(*m), dupChildren = childMaterials(*dup),
                                       clChildren = childMaterials(*cl);
        ASSERT_EQ(dupChildren.size(), mine.size());
        ASSERT_EQ(clChildren.size(), mine.size());
        for (std::size_t i = 0; i < mine.size(); ++i) {
            EXPECT_NE(dupChildren[i].get(), mine[i].get());
            EXPECT_NE(clChildren[i].get(), mine[i].get());
            EXPECT_NE(dupChildren[i]->name, mine[i]->name) << "children of a duplicate are duplicated";
            // A toon clone takes its base material's duplicate too.
            if (m->getType() == kMaterialToon)
                EXPECT_NE(clChildren[i]->name, mine[i]->name);
            else
                EXPECT_EQ(clChildren[i]->name, mine[i]->name);
        }
    }
    // Two-sided copies share their textures; the others clone them.
    const Material2Sided& twoSided = static_cast<const Material2Sided&>(*all[0]);
    EXPECT_EQ(static_cast<const Material2Sided&>(*twoSided.duplicate()).translucency_tex.get(),
              twoSided.translucency_tex.get());
    const MaterialBump& bump = static_cast<const MaterialBump&>(*all[2]);
    EXPECT_NE(static_cast<const MaterialBump&>(*bump.clone()).bump_tex.get(), bump.bump_tex.get());
    const MaterialToon& toon = static_cast<const MaterialToon&>(*all[8]);
    EXPECT_NE(static_cast<const MaterialToon&>(*toon.clone()).opacityTex.get(), toon.opacityTex.get());
}

TEST_F(WrappingRecords, ResetsLeaveTheNameAsTheirClassSays) {
    for (std::uint32_t tag : {kMaterial2Sided, kMaterialSkp2Sided, kMaterialOverrideEnvironment,
                              kMaterialDisplaced, kMaterialObjectExclusion, kMaterialAlphaContribution,
                              kMaterialAngleBlend, kMaterialToon}) {
        MaterialPtr m = createMaterial(tag);
        m->name = u"Kept";
        m->uuid = u"kept-uuid";
        m->reset();
        EXPECT_EQ(m->name, u"Kept") << tag;
        EXPECT_EQ(m->uuid, u"kept-uuid") << tag;
    }
    MaterialBump bump;
    bump.name = u"Gone";
    bump.uuid = u"gone";
    bump.reset();
    EXPECT_EQ(bump.name, u"DefaultMaterial");
    EXPECT_TRUE(bump.uuid.empty());
}

TEST_F(WrappingRecords, RefusedTagsAndTruncatedRecords) {
    struct Case {
        std::uint32_t type;
        std::vector<std::uint32_t> refused;
    };
    const Case cases[] = {
        {kMaterial2Sided, {0, 0x40000, 0x30001}},
        {kMaterialSkp2Sided, {0, 0x20000, 0x10001}},
        {kMaterialBump, {0, 0x40000, 0x10100}},
        {kMaterialOverrideEnvironment, {0, 0x20000}},
        {kMaterialDisplaced, {0, 0x30000, 0x20001}},
        {kMaterialObjectExclusion, {0, 0x40000}},
        {kMaterialAlphaContribution, {0, 0x20000}},
        {kMaterialAngleBlend, {0, 0x20000}},
        {kMaterialToon, {0, 0x30000, 0x10002}},
    };
    for (const Case& c : cases) {
        for (std::uint32_t tag : c.refused) {
            RecordBytes b;
            b.u32(tag);
            MaterialPtr m = createMaterial(c.type);
            QuickArchive ar = b.archive();
            EXPECT_FALSE(m->load(ar)) << c.type << " " << std::hex << tag;
        }
    }
    // Every saved record, cut anywhere, loads false or at least doesn't
    // read outside its bytes.
    for (const MaterialPtr& m : sampleMaterials()) {
        QuickArchive full = savedArchive(*m);
        const std::size_t size = static_cast<std::size_t>(full.getWritePosition());
        std::vector<char> bytes(size);
        full.getRaw(bytes.data(), size);
        for (std::size_t cut = 0; cut < size; cut += 7) {
            QuickArchive ar(bytes.data(), cut);
            MaterialPtr copy = createMaterial(m->getType());
            copy->load(ar);  // must return, whatever the result
        }
        // Cut in front of the base record's version tag: refused.
        QuickArchive empty(bytes.data(), 0);
        EXPECT_FALSE(createMaterial(m->getType())->load(empty));
    }
}

TEST_F(WrappingRecords, FactoryGivesEveryClass) {
    const struct {
        std::uint32_t tag;
        const char16_t* plugin;
    } classes[] = {
        {3, u"MtlBump"},
        {4, u""},
        {5, u"Mtl2Sided"},
        {6, u""},
        {7, u"MtlSkp2Sided"},
        {8, u"MtlOverrideEnvironment"},
        {9, u"MtlDisplaced"},
        {10, u"MtlObjectExclusion"},
        {11, u"MtlAlphaContribution"},
        {12, u"MtlAngleBlend"},
        {13, u""},
        {14, u"MtlToon"},
    };
    for (const auto& c : classes) {
        MaterialPtr m = createMaterial(c.tag);
        ASSERT_TRUE(m) << c.tag;
        EXPECT_EQ(m->getType(), c.tag);
        EXPECT_EQ(m->getPluginName(), c.plugin);
        EXPECT_EQ(m->getAssetType(), u"material");
    }
}

}  // namespace
