// Records of the two-sided, bump, wrapping and toon materials: every version
// laid by hand, copies, comparisons, damaged data and deep nesting.
#include <sstream>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTestUtil.h"
#include "materials/MaterialTree.h"
#include "materials/WrapperAssets.h"
#include "persistence/OrvMatFile.h"
#include "persistence/Record.h"

using namespace mattest;

namespace {

typedef TableTest WrappingRecords;

struct MaterialRecord {
    std::uint32_t tag;
    RecordBytes bytes;
    bool current;
};

// Toon 1: base_mtl; lineWidth, lineWidthTexMult, lineWidthTex; opacity,
// opacityTexMult, opacityTex; distort, distortTexMult, distortTex; lineColor,
// lineColorTexMult, lineColorTex; zThreshold, traceBias, normalThreshold,
// lineUnits; doSecondary, divideByDist; base record. Toon 2 adds doSilhouetteMult, silhouetteMult.
RecordBytes toon(int version) {
    RecordBytes b;
    b.version(version).multiMember("Base").f32(2).f32(3).acolor(0.1f).f32(0.5f).f32(4).b8(false).f32(0.25f).f32(5).acolor(0.3f);
    b.color(0.2f, 0.4f, 0.6f).f32(6).acolor(0.4f).f32(0.9f).f32(0.01f).f32(0.6f).f32(2.5f).b8(false).b8(true).base("Ink");
    return version == 1 ? b : b.b8(true).f32(3);
}

const std::vector<MaterialRecord>& materialRecords() {
    static const std::vector<MaterialRecord> all = {
        // Two-sided 1: front, back, translucency_tex, translucency, translucency_tex_mult, force_1sided.
        {kMaterial2Sided, RecordBytes().version(1).multiMember("F").b8(false).acolor(0.25f).color(0.1f, 0.2f, 0.3f).f32(0.5f).b8(true), false},
        // Two-sided 2: as 1, then transparency_tex, transparency, transparency_tex_mult. 3: as 2, then the base record.
        {kMaterial2Sided, RecordBytes().version(2).b8(false).b8(false).b8(false).color(0, 0, 0).f32(1).b8(false).acolor(0.75f)
                              .color(0.4f, 0.5f, 0.6f).f32(2), false},
        {kMaterial2Sided, RecordBytes().version(3).b8(false).multiMember("B").b8(false).color(0, 0, 0).f32(1).b8(false).b8(false)
                              .color(0, 0, 0).f32(1).base("Sheet", "uu"), true},
        // Skp two-sided 1: base record, front, back, force_1sided.
        {kMaterialSkp2Sided, RecordBytes().version(1).base("Skp").multiMember("F").multiMember("K").b8(true), true},
        // Bump 1: name (empty: the default name), path of bump_tex, bump_tex_mult, base_mtl as tag and record.
        {kMaterialBump, RecordBytes().version(1).str("").str("C:/maps/bump.png").f32(0.5f).multi("Base"), false},
        // Bump 2: name (an empty one stays empty), bump_tex_mult, bump_tex as member, base_mtl bare.
        {kMaterialBump, RecordBytes().version(2).str("").f32(3).acolor(0.5f).multi("Base"), false},
        // Bump 3: bump_tex_mult, bump_tex, base_mtl, base record.
        {kMaterialBump, RecordBytes().version(3).f32(2).b8(false).multi("Base").base("Wall", "u-3"), true},
        // Environment override 1: base record, base_mtl, the textures bg, gi,
        // reflect, refract, then colours, multipliers and switches in that order.
        {kMaterialOverrideEnvironment, RecordBytes().version(1).base("Env").b8(true).layered("Base").acolor(0.1f).b8(false).acolor(0.3f)
                                           .acolor(0.4f).color(1, 0, 0).color(0, 1, 0).color(0, 0, 1).color(1, 1, 0).f32(2).f32(3)
                                           .f32(4).f32(5).b8(true).b8(false).b8(false).b8(true), true},
        // Displaced 1: base record, base_mtl, displace_tex, displace_tex_mult.
        // 2: as 1, then displace_shift, displace_edge_length, the four integers.
        {kMaterialDisplaced, RecordBytes().version(1).base("D1").b8(true).layered("Base").b8(false).f32(3), false},
        {kMaterialDisplaced, RecordBytes().version(2).base("D").b8(true).layered("Base").acolor(0.5f).f32(2).f32(0.25f).f32(8)
                                 .i32(64).i32(0).i32(0).i32(0), true},
        // Object exclusion 1: mode, base_mtl, the object names; no base record.
        // 2: as 1, then the base record. 3: as 2, then short_circuit.
        {kMaterialObjectExclusion, RecordBytes().version(1).i32(1).multiMember("Base").u32(2).str("Chair").str("Table"), false},
        {kMaterialObjectExclusion, RecordBytes().version(2).i32(0).b8(false).u32(0).base("Ex2"), false},
        {kMaterialObjectExclusion, RecordBytes().version(3).i32(7).b8(false).u32(1).str("Lamp").base("Ex3").b8(false), true},
        // Angle blend 1: base record, mtl_one, mtl_two, start_angle, stop_angle.
        {kMaterialAngleBlend, RecordBytes().version(1).base("Blend").b8(false).multiMember("Two").f32(10).f32(20), true},
        // Alpha contribution 1: base record, base_mtl, alpha_tex, alpha_tex_mult, alpha.
        {kMaterialAlphaContribution, RecordBytes().version(1).base("Alpha").multiMember("Base").acolor(0.5f).f32(2).f32(0.25f), true},
        {kMaterialToon, toon(1), false},
        {kMaterialToon, toon(2), true},
    };
    return all;
}

TEST_F(WrappingRecords, EveryVersionLoads) {
    // Each record loaded into a new material and written under a url that
    // names the record and its uuid: the golden tells where every value landed.
    // The environment override and the displaced material show their fields
    // only in the conversion, folded into their layered base.
    std::string xml;
    for (const MaterialRecord& r : materialRecords()) {
        const std::string what = "record " + std::to_string(&r - &materialRecords()[0]);
        SCOPED_TRACE(what);
        const MaterialPtr m = createMaterial(r.tag);
        QuickArchive ar = r.bytes.archive();
        ASSERT_TRUE(m->load(ar));
        EXPECT_EQ(ar.getReadPosition(), r.bytes.size());
        if (r.tag == kMaterialOverrideEnvironment || r.tag == kMaterialDisplaced) xml += wideToUtf8(materialToXml(m));
        else xml += ownXml(*m, utf8ToWide("/" + what + " uuid " + wideToUtf8(m->uuid)));
        if (!r.current) continue;
        QuickArchive out;
        ASSERT_TRUE(m->save(out));
        EXPECT_EQ(savedBytes(out), r.bytes.bytes());
    }
    expectGolden("wrapper_records.xml", xml);

    // Displaced 1 loaded over a displaced 2: the later fields are back at their defaults.
    const MaterialPtr d = createMaterial(kMaterialDisplaced);
    QuickArchive v2 = materialRecords()[9].bytes.archive(), v1 = materialRecords()[8].bytes.archive();
    ASSERT_TRUE(d->load(v2) && d->load(v1));
    EXPECT_EQ(materialToXml(d), materialToXml(loaded<MaterialDisplaced>(materialRecords()[8].bytes)));
    // A refused base record ends the load before any child is read.
    EXPECT_FALSE(loaded<MaterialSkp2Sided>(RecordBytes().version(1).version(3).str("X").multiMember("F"), false)->front);
    // A bump can't leave out its base material: save fails without it, and a
    // tag without a class fails the load.
    QuickArchive out;
    EXPECT_FALSE(MaterialBump().save(out));
    loaded<MaterialBump>(RecordBytes().version(3).f32(1).b8(false).u32(15), false);
    // A count of object names beyond the data fails instead of filling memory.
    loaded<MaterialObjectExclusion>(RecordBytes().version(3).i32(0).b8(false).u32(0x7FFFFFFF), false);
}

// One object of each class, with children and values away from the defaults.
std::vector<MaterialPtr> sampleMaterials() {
    auto twoSided = sided<Material2Sided>(u"TwoSided", layered(u"Front"), layered(u"Back"));
    twoSided->translucency_tex = acolor(0.5f, 0, 0), twoSided->transparency = Color(0.1f, 0.2f, 0.3f), twoSided->force_1sided = true;
    auto skp = sided<MaterialSkp2Sided>(u"Skp", MaterialPtr(), layered(u"Back"));
    skp->force_1sided = true;
    auto bump = wrap<MaterialBump>(layered(u"Base"), u"Bump");
    bump->bump_tex = acolor(0.25f, 0, 0), bump->bump_tex_mult = 0.75f;
    auto env = wrap<MaterialOverrideEnvironment>(layered(u"Base"), u"Env");
    env->gi_tex = acolor(0.1f, 0, 0), env->refract_color = Color(1, 0, 1), env->reflect_tex_mult = 3, env->override_gi = true;
    auto displaced = wrap<MaterialDisplaced>(layered(u"Base"), u"Displaced");
    displaced->displace_tex = acolor(0.2f, 0, 0), displaced->displace_shift = 0.5f, displaced->displace_use_globals = 0;
    auto exclusion = wrap<MaterialObjectExclusion>(layered(u"Base"), u"Exclusion");
    exclusion->mode = 1, exclusion->objects = {u"Chair", u"Table"}, exclusion->short_circuit = false;
    auto alpha = wrap<MaterialAlphaContribution>(layered(u"Base"), u"Alpha");
    alpha->alpha_tex = acolor(0.3f, 0, 0), alpha->alpha = 0.5f;
    auto angle = blend(u"Blend", layered(u"One"), layered(u"Two"));
    angle->stop_angle = 90;
    auto toon = wrap<MaterialToon>(layered(u"Base"), u"Toon");
    toon->opacityTex = acolor(0.4f, 0, 0), toon->lineUnits = 2, toon->doSilhouetteMult = true;
    return {twoSided, skp, bump, env, displaced, exclusion, alpha, angle, toon};
}

#define CHANGE(Class, change) {k##Class, [](BaseMaterial& m) { static_cast<Class&>(m).change; }}

TEST_F(WrappingRecords, FieldsTakePartInTheComparison) {
    // One field changed at a time must make a copy differ.
    const std::pair<std::uint32_t, void (*)(BaseMaterial&)> cases[] = {
        CHANGE(Material2Sided, transparency_tex_mult = 9),  CHANGE(Material2Sided, translucency_tex.reset()),
        CHANGE(MaterialSkp2Sided, force_1sided = false),    CHANGE(MaterialBump, bump_tex_mult = 9),
        CHANGE(MaterialOverrideEnvironment, override_refract = true),
        CHANGE(MaterialOverrideEnvironment, bg_color = Color(0, 0, 1)),
        CHANGE(MaterialDisplaced, displace_max_subdivs = 1), CHANGE(MaterialObjectExclusion, objects[1] = u"Sofa"),
        CHANGE(MaterialObjectExclusion, mode = 0),           CHANGE(MaterialAlphaContribution, alpha = 1),
        CHANGE(MaterialAngleBlend, start_angle = 1),         CHANGE(MaterialToon, lineUnits = 1),
        CHANGE(MaterialToon, divideByDist = true),           CHANGE(MaterialToon, opacityTex.reset()),
    };
    const std::vector<MaterialPtr> all = sampleMaterials();
    for (const auto& c : cases) {
        const MaterialPtr m = *std::find_if(all.begin(), all.end(), [&c](const MaterialPtr& s) { return s->getType() == c.first; });
        const MaterialPtr copy = m->clone();
        ASSERT_TRUE(copy->isEqual(m)) << c.first;
        c.second(*copy);
        EXPECT_FALSE(copy->isEqual(m)) << c.first << " case " << &c - cases;
    }
    // Object names compare without regard to case.
    const MaterialPtr copy = all[5]->clone();
    static_cast<MaterialObjectExclusion&>(*copy).objects[0] = u"CHAIR";
    EXPECT_TRUE(copy->isEqual(all[5]));
    // Each child takes part; so does the class.
    for (const MaterialPtr& m : all) {
        for (std::size_t i = 0; i < childMaterials(*m).size(); ++i) {
            const MaterialPtr other = m->clone();
            boost::static_pointer_cast<MaterialLayeredBRDF>(childMaterials(*other)[i])->double_sided = 5;
            EXPECT_FALSE(other->isEqual(m) || m->isEqual(other)) << wideToUtf8(m->name) << " child " << i;
        }
        EXPECT_FALSE(m->isEqual(MaterialPtr()) || m->isEqual(layered(u"Other")));
    }
}

TEST_F(WrappingRecords, CopiesTakeNamesAndShareTexturesAsTheirClassSays) {
    // Make the names of the sample materials and their children taken, so that
    // a new unique name differs from the old one.
    const std::vector<MaterialPtr> all = sampleMaterials();
    for (const MaterialPtr& m : all) {
        table().addMaterial(m);
        for (const MaterialPtr& child : childMaterials(*m)) table().addMaterial(child->clone());
    }
    for (const MaterialPtr& m : all) {
        SCOPED_TRACE(wideToUtf8(m->name));
        m->uuid = u"some-uuid";
        const MaterialPtr dup = m->duplicate(), cl = m->clone();
        EXPECT_EQ(std::make_tuple(dup->name != m->name, cl->name, dup->uuid + cl->uuid), std::make_tuple(true, m->name, u""));
        EXPECT_TRUE(dup->isEqual(m) && cl->isEqual(m));
        const std::vector<MaterialPtr> mine = childMaterials(*m), dupChildren = childMaterials(*dup), clChildren = childMaterials(*cl);
        ASSERT_EQ(dupChildren.size(), mine.size());
        ASSERT_EQ(clChildren.size(), mine.size());
        for (std::size_t i = 0; i < mine.size(); ++i) {
            EXPECT_TRUE(dupChildren[i] != mine[i] && clChildren[i] != mine[i]);
            EXPECT_NE(dupChildren[i]->name, mine[i]->name) << "children of a duplicate are duplicated";
            // A toon clone takes its base material's duplicate too.
            EXPECT_EQ(clChildren[i]->name == mine[i]->name, m->getType() != kMaterialToon);
        }
    }
    // Two-sided copies share their textures; the others clone them.
    auto& twoSided = static_cast<const Material2Sided&>(*all[0]);
    EXPECT_EQ(static_cast<const Material2Sided&>(*twoSided.duplicate()).translucency_tex, twoSided.translucency_tex);
    auto& bump = static_cast<const MaterialBump&>(*all[2]);
    EXPECT_NE(static_cast<const MaterialBump&>(*bump.clone()).bump_tex, bump.bump_tex);
    auto& toon = static_cast<const MaterialToon&>(*all[8]);
    EXPECT_NE(static_cast<const MaterialToon&>(*toon.clone()).opacityTex, toon.opacityTex);
}

TEST_F(WrappingRecords, ResetsRefusedTagsAndTruncatedRecords) {
    // Only the bump's reset takes a new default name and drops the uuid.
    for (const MaterialPtr& m : sampleMaterials()) {
        m->uuid = u"kept-uuid";
        const std::u16string name = m->name;
        m->reset();
        EXPECT_EQ(std::make_tuple(m->name, m->uuid), m->getType() == kMaterialBump ? std::make_tuple(std::u16string(u"DefaultMaterial"), std::u16string())
                                                                                   : std::make_tuple(name, std::u16string(u"kept-uuid")));
    }
    const std::pair<std::uint32_t, std::vector<std::uint32_t>> cases[] = {
        {kMaterial2Sided, {0, 0x40000, 0x30001}},    {kMaterialSkp2Sided, {0, 0x20000, 0x10001}},
        {kMaterialBump, {0, 0x40000, 0x10100}},      {kMaterialOverrideEnvironment, {0, 0x20000}},
        {kMaterialDisplaced, {0, 0x30000, 0x20001}}, {kMaterialObjectExclusion, {0, 0x40000}},
        {kMaterialAlphaContribution, {0, 0x20000}},  {kMaterialAngleBlend, {0, 0x20000}},
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

// How one wrapper class lays its record around its (first) child: the bytes in
// front of the child's tag, whether a present flag stands there, and the bytes
// behind the child's record.
struct WrapperLayout {
    std::uint32_t tag;
    bool presentFlag;
    std::function<void(RecordBytes&)> head, tail;
};

const std::vector<WrapperLayout>& layouts() {
    typedef RecordBytes& B;
    static const std::vector<WrapperLayout> all = {
        // Bump 3: bump_tex_mult, bump_tex | base_mtl bare | base record.
        {kMaterialBump, false, [](B b) { b.version(3).f32(1).b8(false); }, [](B b) { b.base("N"); }},
        // Two-sided 1: front | back, translucency_tex, translucency, mult, force.
        {kMaterial2Sided, true, [](B b) { b.version(1); }, [](B b) { b.b8(false).b8(false).color(0, 0, 0).f32(1).b8(false); }},
        // Skp two-sided 1: base record | front | back, force.
        {kMaterialSkp2Sided, true, [](B b) { b.version(1).base("N"); }, [](B b) { b.b8(false).b8(false); }},
        // Linked 1: id (kind 2) | material bare | base record.
        {kMaterialLinked, false, [](B b) { b.version(1).version(1).u32(2).i32(7); }, [](B b) { b.base("N"); }},
        // Environment override 1: base record | base_mtl | four textures, colours, multipliers, switches.
        {kMaterialOverrideEnvironment, true, [](B b) { b.version(1).base("N"); },
         [](B b) {
             b.b8(false).b8(false).b8(false).b8(false).color(0, 0, 0).color(0, 0, 0).color(0, 0, 0).color(0, 0, 0);
             b.f32(1).f32(1).f32(1).f32(1).b8(false).b8(false).b8(false).b8(false);
         }},
        // Displaced 1: base record | base_mtl | displace_tex, mult.
        {kMaterialDisplaced, true, [](B b) { b.version(1).base("N"); }, [](B b) { b.b8(false).f32(1); }},
        // Object exclusion 3: mode | base_mtl | names, base record, short_circuit.
        {kMaterialObjectExclusion, true, [](B b) { b.version(3).i32(0); }, [](B b) { b.u32(0).base("N").b8(true); }},
        // Alpha contribution 1: base record | base_mtl | alpha_tex, two floats.
        {kMaterialAlphaContribution, true, [](B b) { b.version(1).base("N"); }, [](B b) { b.b8(false).f32(1).f32(1); }},
        // Angle blend 1: base record | mtl_one | mtl_two, two angles.
        {kMaterialAngleBlend, true, [](B b) { b.version(1).base("N"); }, [](B b) { b.b8(false).f32(75).f32(150); }},
        // Reference 2: base record, target_uuid | embedded copy.
        {kMaterialReference, true, [](B b) { b.version(2).base("N").str("t"); }, [](B) {}},
        // Toon 2: base_mtl | the line fields, base record, silhouette fields.
        {kMaterialToon, true, [](B b) { b.version(2); },
         [](B b) {
             b.f32(1.5f).f32(1).b8(false).f32(1).f32(1).b8(false).f32(0).f32(1).b8(false);
             b.color(0, 0, 0).f32(1).b8(false).f32(0.95f).f32(0.02f).f32(0.7f).f32(1).b8(true).b8(false).base("N").b8(false).f32(1.5f);
         }},
    };
    return all;
}

// A chain of `depth` wrappers, level i of the class layouts()[pick(i)], over a
// layered material: the record of the top, without its tag.
RecordBytes chain(int depth, const std::function<std::size_t(int)>& pick) {
    RecordBytes b;
    for (int i = 0; i < depth; ++i) {
        const WrapperLayout& w = layouts()[pick(i)];
        w.head(b);
        if (w.presentFlag) b.b8(true);
        if (i + 1 < depth) b.u32(layouts()[pick(i + 1)].tag);
    }
    b.layered("N");
    for (int i = depth; i-- > 0;) layouts()[pick(i)].tail(b);
    return b;
}

TEST_F(WrappingRecords, EveryWrapperClassStopsAtTheNestingLimit) {
    for (std::size_t k = 0; k < layouts().size(); ++k) {
        SCOPED_TRACE(layouts()[k].tag);
        auto same = [k](int) { return k; };
        // The top record isn't nested; its child is one level deep, and so on:
        // the layered material at the bottom stands kMaxNestingDepth deep.
        for (int depth : {kMaxNestingDepth, kMaxNestingDepth + 1, 1000}) {
            QuickArchive ar = chain(depth, same).archive();
            EXPECT_EQ(createMaterial(layouts()[k].tag)->load(ar), depth == kMaxNestingDepth) << depth;
        }
    }
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
            EXPECT_EQ(std::make_tuple(countOf(xml, "layout=\"deflumat\""), countOf(xml, "name=\"bump_on\"")), std::make_tuple(1, 1));
        }
    }
    // Built in memory: saving works at any depth; loading the result fails at
    // the limit, while the conversion still finds the layered material.
    MaterialPtr tree = layered(u"Bottom");
    for (int i = 0; i < 1000; ++i) tree = wrap<MaterialBump>(tree);
    QuickArchive ar = savedArchive(*tree);
    EXPECT_FALSE(MaterialBump().load(ar));
    EXPECT_EQ(countOf(wideToUtf8(materialToXml(tree)), "layout=\"deflumat\""), 1);
}

}  // namespace
