// Records of every material class: each version laid by hand, the name rules, comparison, copies, resets, damaged
// data and deep nesting.
#include <sstream>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTree.h"
#include "materials/RecordLists.h"
#include "materials/WrapperAssets.h"
#include "persistence/Record.h"

using namespace mattest;

namespace {

typedef TableTest MaterialRecords;
typedef MaterialLayeredBRDF Layered;

// The hand-laid record of class `tag` and `version`.
const RecordBytes& recordOf(std::uint32_t tag, int version) {
    auto is = [=](const Record& r) { return r.tag == tag && r.bytes.bytes()[2] == version; };
    return std::find_if(records().begin(), records().end(), is)->bytes;
}

std::string u8(const std::u16string& text) { return wideToUtf8(text); }
std::string nameOf(const MaterialPtr& m) { return m ? u8(m->name) : "<none>"; }

// The `skip`+1-th sample of class `type`.
MaterialPtr sample(const std::vector<MaterialPtr>& all, std::uint32_t type, int skip = 0) {
    for (const MaterialPtr& m : all)
        if (m->getType() == type && skip-- == 0) return m;
    return MaterialPtr();
}

// A comment line with what the XML doesn't show of a material.
std::string hidden(const BaseMaterial& m) {
    std::ostringstream s;
    s << "<!-- name " << u8(m.name) << " uuid " << u8(m.uuid);
    if (auto l = dynamic_cast<const Layered*>(&m))
        s << " values " << l->layered_value_a << ' ' << l->layered_value_b << ' ' << l->layered_value_c << ' '
          << l->layered_value_d;
    if (auto x = dynamic_cast<const MaterialSingleBRDF*>(&m))
        s << " values " << x->single_value_a << ' ' << x->single_value_b << " layer " << (x->brdf ? u8(x->brdf->name) : "-");
    if (auto x = dynamic_cast<const MaterialMulti*>(&m))
        for (const MaterialPtr& sub : x->materials) s << " sub " << nameOf(sub);
    if (auto x = dynamic_cast<const MaterialReference*>(&m))
        s << " target " << u8(x->target_uuid) << " copy " << nameOf(x->target);
    if (auto x = dynamic_cast<const MaterialLinked*>(&m))
        s << " id " << x->id.kind << ' ' << u8(x->id.getText()) << ' ' << x->id.getNumber() << " material "
          << nameOf(x->linked_material);
    return s.str() + " -->\n";
}

TEST_F(MaterialRecords, EveryVersionLoads) {
    // Each record loaded into a new material: a comment line with what no XML shows, then its own XML under a url
    // that names the record. The environment override and the displaced material show their fields only in the
    // conversion, folded into their layered base.
    auto show = [](const MaterialPtr& m, const std::string& what, const RecordBytes&) {
        const bool folded = m->getType() == kMaterialOverrideEnvironment || m->getType() == kMaterialDisplaced;
        return hidden(*m) + (folded ? wideToUtf8(materialToXml(m)) : xmlOf(*m, utf8ToWide("/" + what)));
    };
    expectGolden("materials/golden/material_records.xml", loadEach<MaterialPtr>(records(), createMaterial, show));
}

std::vector<MaterialPtr> samples() {
    std::vector<MaterialPtr> all;
    for (const Record& r : records()) {
        if (!r.current) continue;
        all.push_back(createMaterial(r.tag));
        QuickArchive ar = r.bytes.archive();
        EXPECT_TRUE(all.back()->load(ar));
    }
    return all;
}

TEST_F(MaterialRecords, NamesAndLoadsIntoUsedObjects) {
    const std::tuple<int, std::string, std::u16string> cases[] = {
        // Control characters removed, C1 controls too; an empty name takes the default, one of controls only
        // stays empty; version 1: name only.
        {2, "Wood", u"Wood"}, {2, "Wo\nod\x7f\t", u"Wood"}, {2, "A\xc2\x85" "B", u"AB"},
        {2, "", u"DefaultMaterial"}, {2, "\r\n", u""}, {1, "Old", u"Old"},
    };
    for (const auto& c : cases) {
        // MaterialMulti version 2: count 0, then the base record.
        RecordBytes bytes;
        bytes.version(2).u32(0).version(std::get<0>(c)).wstr(std::get<1>(c));
        if (std::get<0>(c) == 2) bytes.wstr("UU-1");
        MaterialMulti m;
        m.uuid = u"kept";
        QuickArchive ar = bytes.archive();
        ASSERT_TRUE(m.load(ar)) << std::get<1>(c);
        EXPECT_EQ(m.name, std::get<2>(c)) << std::get<1>(c);
        EXPECT_EQ(m.uuid, std::get<0>(c) == 2 ? u"UU-1" : u"kept");
    }
    // A refused base record still cleans the name the material had.
    MaterialMulti m;
    m.name = u"A\tB";
    QuickArchive ar = RecordBytes().version(2).u32(0).u32(0x20001).wstr("X").wstr("").archive();
    EXPECT_FALSE(m.load(ar));
    EXPECT_EQ(m.name, u"AB");
    // A layered material starts from its defaults.
    Layered l;
    l.brdfs.push_back(createBrdf(kGlassBrdf));
    l.layered_value_b = 42, l.uuid = u"old";
    // Version 2: no layers, double_sided, layered_value_a, base record version 1 (name only).
    QuickArchive v2 = RecordBytes().version(2).u32(0).i32(0).i32(0).version(1).wstr("N").archive();
    ASSERT_TRUE(l.load(v2));
    EXPECT_EQ(std::make_tuple(l.brdfs.size(), l.layered_value_b, l.uuid), std::make_tuple(0u, 1, u""));
    // Version 4 reads layered_value_d behind a base record of a refused version.
    QuickArchive d = RecordBytes().version(4).u32(0).i32(1).i32(0).i32(1).i32(1).version(3).i32(5).archive();
    EXPECT_FALSE(l.load(d));
    EXPECT_EQ(l.layered_value_d, 5);
    // A multi material appends to its list.
    MaterialMulti multi;
    QuickArchive first = recordOf(kMaterialMulti, 1).archive(), again = recordOf(kMaterialMulti, 1).archive();
    ASSERT_TRUE(multi.load(first) && multi.load(again));
    EXPECT_EQ(multi.materials.size(), 2u);
    // A displaced material: version 1 over version 2 brings the later fields back to their defaults.
    const MaterialPtr displaced = createMaterial(kMaterialDisplaced);
    QuickArchive d2 = recordOf(kMaterialDisplaced, 2).archive(), d1 = recordOf(kMaterialDisplaced, 1).archive();
    ASSERT_TRUE(displaced->load(d2) && displaced->load(d1));
    EXPECT_EQ(materialToXml(displaced), materialToXml(loaded<MaterialDisplaced>(recordOf(kMaterialDisplaced, 1))));
}

#define CHANGE(Class, change) {Class().getType(), [](BaseMaterial& m) { static_cast<Class&>(m).change; }, false}
#define KEEP(Class, change) {Class().getType(), [](BaseMaterial& m) { static_cast<Class&>(m).change; }, true}

TEST_F(MaterialRecords, FieldsTakePartInTheComparison) {
    // One field changed at a time must make a copy differ, except for names, object names and id texts in another
    // case.
    const std::tuple<std::uint32_t, void (*)(BaseMaterial&), bool> cases[] = {
        CHANGE(Layered, double_sided = 99),      CHANGE(Layered, layered_value_a = 99), CHANGE(Layered, layered_value_b = 99),
        CHANGE(Layered, layered_value_c = 99),   CHANGE(Layered, layered_value_d = 99), CHANGE(Layered, brdfs.pop_back()),
        CHANGE(Layered, brdfs[0] = createBrdf(kGlassBrdf)), CHANGE(MaterialSingleBRDF, single_value_a = 99),
        CHANGE(Material2Sided, transparency_tex_mult = 9),   CHANGE(Material2Sided, translucency_tex.reset()),
        CHANGE(MaterialSkp2Sided, force_1sided = false),     CHANGE(MaterialBump, bump_tex_mult = 9),
        CHANGE(MaterialOverrideEnvironment, override_refract = false),
        CHANGE(MaterialOverrideEnvironment, bg_color = Color(0, 0, 1)),
        CHANGE(MaterialDisplaced, displace_max_subdivs = 1), CHANGE(MaterialObjectExclusion, objects[0] = u"Sofa"),
        CHANGE(MaterialObjectExclusion, mode = 0),           CHANGE(MaterialAlphaContribution, alpha = 1),
        CHANGE(MaterialAngleBlend, start_angle = 1),         CHANGE(MaterialToon, lineUnits = 1),
        CHANGE(MaterialToon, divideByDist = false),          CHANGE(MaterialToon, lineWidthTex.reset()),
        CHANGE(MaterialLinked, id.kind = 1),                 CHANGE(MaterialLinked, linked_material.reset()),
        KEEP(Layered, name = u"Other"),  KEEP(MaterialToon, name = u"Other"), KEEP(MaterialObjectExclusion, objects[0] = u"LAMP"),
        KEEP(MaterialLinked, id.text = u"OBJ-0"),
    };
    const std::vector<MaterialPtr> all = samples();
    for (const auto& c : cases) {
        const MaterialPtr m = sample(all, std::get<0>(c)), copy = m->clone();
        ASSERT_TRUE(copy->isEqual(m)) << std::get<0>(c);
        std::get<1>(c)(*copy);
        EXPECT_EQ(copy->isEqual(m), std::get<2>(c)) << std::get<0>(c) << " case " << &c - cases;
    }
    // Each child takes part (the sub-materials of a multi material are shared by its copies); so does the class.
    for (const MaterialPtr& m : all) {
        if (m->getType() == kMaterialInstance) continue;  // equal to nothing, not even itself
        for (std::size_t i = 0; m->getType() != kMaterialMulti && i < childMaterials(*m).size(); ++i) {
            const MaterialPtr other = m->clone(), child = childMaterials(*other)[i];
            if (auto l = boost::dynamic_pointer_cast<Layered>(child)) l->double_sided = 5;
            else static_cast<MaterialMulti&>(*child).materials.push_back(layered(u"More"));
            EXPECT_FALSE(other->isEqual(m) || m->isEqual(other)) << nameOf(m) << " child " << i;
        }
        const MaterialPtr otherClass = m->getType() == kMaterialMulti ? layered(u"L") : MaterialPtr(new MaterialMulti);
        EXPECT_FALSE(m->isEqual(MaterialPtr()) || m->isEqual(otherClass));
    }
    // A number id ignores the text.
    MaterialLinked::IdData a, b;
    a.number = 5, b.number = 6;
    EXPECT_FALSE(a.isEqual(b));
    b.text = u"ignored for numbers", b.number = 5;
    EXPECT_TRUE(a.isEqual(b));
    EXPECT_FALSE(sample(all, kMaterialInstance)->isEqual(sample(all, kMaterialInstance)));  // an instance
}

TEST_F(MaterialRecords, CopiesAndResets) {
    // Make the names of the samples and their children taken, so that a new unique name differs from the old one.
    const std::vector<MaterialPtr> all = samples();
    for (const MaterialPtr& m : all) {
        table().addMaterial(m->clone());
        for (const MaterialPtr& child : childMaterials(*m)) table().addMaterial(child->clone());
    }
    for (const MaterialPtr& m : all) {
        SCOPED_TRACE(nameOf(m));
        const std::uint32_t type = m->getType();
        const MaterialPtr dup = m->duplicate(), cl = m->clone();
        // Only an instance's duplicate keeps the name; no copy keeps the uuid.
        EXPECT_EQ(std::make_tuple(dup->name == m->name, cl->name, dup->uuid + cl->uuid),
                  std::make_tuple(type == kMaterialInstance, m->name, u""));
        EXPECT_TRUE(type == kMaterialInstance || (dup->isEqual(m) && cl->isEqual(m)));
        const std::vector<MaterialPtr> mine = childMaterials(*m), dupKids = childMaterials(*dup), clKids = childMaterials(*cl);
        ASSERT_EQ(std::make_tuple(dupKids.size(), clKids.size()), std::make_tuple(mine.size(), mine.size()));
        for (std::size_t i = 0; i < mine.size(); ++i) {
            // A multi material's copies share its sub-materials; the other copies take their children's duplicate or
            // clone, a toon's clone its base material's duplicate.
            const bool shared = type == kMaterialMulti;
            EXPECT_EQ(std::make_tuple(dupKids[i] == mine[i], clKids[i] == mine[i]), std::make_tuple(shared, shared));
            EXPECT_EQ(dupKids[i]->name == mine[i]->name, shared);
            EXPECT_EQ(clKids[i]->name == mine[i]->name, type != kMaterialToon);
        }
    }
    // The layers are cloned; a single material shares its layer, an instance its material; two-sided copies share
    // their textures, the others clone them.
    auto layers = [](const MaterialPtr& m) { return static_cast<const Layered&>(*m).brdfs[0]; };
    EXPECT_NE(layers(sample(all, kMaterialLayeredBRDF)->duplicate()), layers(sample(all, kMaterialLayeredBRDF)));
    auto single = [](const MaterialPtr& m) { return static_cast<const MaterialSingleBRDF&>(*m).brdf; };
    EXPECT_EQ(single(sample(all, kMaterialSingleBRDF)->clone()), single(sample(all, kMaterialSingleBRDF)));
    boost::shared_ptr<MaterialInstance> inst(new MaterialInstance(layered(u"Wood")));
    EXPECT_EQ(std::make_tuple(inst->name, static_cast<const MaterialInstance&>(*inst->duplicate()).instance_of),
              std::make_tuple(u"Wood", inst->instance_of));
    auto translucency = [](const MaterialPtr& m) { return static_cast<const Material2Sided&>(*m).translucency_tex; };
    EXPECT_EQ(translucency(sample(all, kMaterial2Sided)->duplicate()), translucency(sample(all, kMaterial2Sided)));
    auto bumpTex = [](const MaterialPtr& m) { return static_cast<const MaterialBump&>(*m).bump_tex; };
    EXPECT_NE(bumpTex(sample(all, kMaterialBump)->clone()), bumpTex(sample(all, kMaterialBump)));
    auto widthTex = [](const MaterialPtr& m) { return static_cast<const MaterialToon&>(*m).lineWidthTex; };
    EXPECT_NE(widthTex(sample(all, kMaterialToon)->clone()), widthTex(sample(all, kMaterialToon)));
    // The wrapping classes keep name and uuid; the bump, a reference and a linked material take a new default name
    // and drop the uuid.
    for (const MaterialPtr& m : samples()) {
        const std::uint32_t type = m->getType();
        if (type < kMaterialBump || type == kMaterialInstance) continue;
        m->name = u"Kept", m->uuid = u"kept-uuid";
        m->reset();
        const bool base = type == kMaterialBump || type == kMaterialLinked;
        EXPECT_EQ(m->name + u"|" + m->uuid, base ? u"DefaultMaterial|" : u"Kept|kept-uuid") << type;
    }
}

TEST_F(MaterialRecords, WhatSaveAndLoadStopAt) {
    // A refused base record ends the load before any child is read.
    EXPECT_FALSE(loaded<MaterialSkp2Sided>(RecordBytes().version(1).version(3).wstr("X").multiMember("F"), false)->front);
    // Without the material it can't leave out, a linked material fails to save, writing nothing; so do an invalid id
    // kind, a bump and a single material.
    auto linked = boost::make_shared<MaterialLinked>();
    QuickArchive out(1);
    EXPECT_FALSE(linked->save(out));
    EXPECT_EQ(out.getWritePosition(), 0u);
    linked->linked_material = layered(u"L"), linked->id.kind = 3;
    EXPECT_FALSE(linked->save(out) || MaterialBump().save(out) || MaterialSingleBRDF().save(out));
    EXPECT_FALSE(createMaterial(kMaterialTagCount) || createMaterial(0xFFFFFFFFu));
}

// How one wrapper class lays its record around its (first) child: the bytes in front of the child's tag, whether a
// present flag stands there, and the bytes behind the child's record.
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
        {kMaterialReference, true, [](B b) { b.version(2).base("N").wstr("t"); }, [](B) {}},
        // Toon 2: base_mtl | the line fields, base record, silhouette fields.
        {kMaterialToon, true, [](B b) { b.version(2); },
         [](B b) {
             b.f32(1.5f).f32(1).b8(false).f32(1).f32(1).b8(false).f32(0).f32(1).b8(false);
             b.color(0, 0, 0).f32(1).b8(false).f32(0.95f).f32(0.02f).f32(0.7f).f32(1).b8(true).b8(false);
             b.base("N").b8(false).f32(1.5f);
         }},
    };
    return all;
}

// A chain of `depth` wrappers, level i of the class layouts()[pick(i)], over a layered material: the record of the
// top, without its tag.
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

TEST_F(MaterialRecords, AThousandNestedWrappers) {
    // All classes mixed, a bump at the top: within the limit the tree converts, flattened under the top.
    QuickArchive ar = chain(100, [](int i) { return static_cast<std::size_t>(i) % layouts().size(); }).archive();
    const MaterialPtr mixed = createMaterial(kMaterialBump);
    ASSERT_TRUE(mixed->load(ar));
    expectGolden("materials/golden/mixed_chain.xml", wideToUtf8(materialToXml(mixed)));
    // Built in memory: saving works at any depth; loading the result fails at the limit, while the conversion still
    // finds the layered material.
    MaterialPtr tree = layered(u"Bottom");
    for (int i = 0; i < 1000; ++i) tree = wrap<MaterialBump>(tree);
    QuickArchive saved;
    EXPECT_TRUE(tree->save(saved));
    EXPECT_FALSE(MaterialBump().load(saved));
    EXPECT_EQ(materialToXml(tree), materialToXml(wrap<MaterialBump>(layered(u"Bottom"))));
}

}  // namespace
