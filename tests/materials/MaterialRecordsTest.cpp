// Records of every material class: each version laid by hand, the name rules, comparison, copies, resets, damaged
// data and deep nesting.
#include <sstream>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTestUtil.h"
#include "materials/MaterialTree.h"
#include "materials/WrapperAssets.h"
#include "persistence/Record.h"

using namespace mattest;

namespace {

typedef TableTest MaterialRecords;
typedef MaterialLayeredBRDF Layered;

// Layered 1: layer count, each layer's tag and record; double_sided, layered_value_a; the name inline. 2: the base
// record in place of the name. 3: as 2, layered_value_b and layered_value_c behind layered_value_a. 4: as 3,
// layered_value_d at the end. Only the base record removes control characters.
RecordBytes layeredRecord(int version) {
    RecordBytes b;
    b.version(version).u32(2).diffuse("Base", 0.25f).diffuse("Top", 0.75f).i32(2).i32(7);
    if (version >= 3) b.i32(8).i32(9);
    version == 1 ? b.wstr("Wall\n") : b.base(version == 4 ? "Wall" : "Wall\n", "U");
    return version >= 4 ? b.i32(10) : b;
}

// Toon 1: base_mtl; lineWidth, lineWidthTexMult, lineWidthTex; opacity, opacityTexMult, opacityTex; distort,
// distortTexMult, distortTex; lineColor, lineColorTexMult, lineColorTex; zThreshold, traceBias, normalThreshold,
// lineUnits; doSecondary, divideByDist; base record. 2 adds doSilhouetteMult, silhouetteMult.
RecordBytes toonRecord(int version) {
    RecordBytes b;
    b.version(version).multiMember("Base").f32(2).f32(3).acolorMember(0.1f).f32(0.5f).f32(4).b8(false).f32(0.25f).f32(5).acolorMember(0.3f);
    b.color(0.2f, 0.4f, 0.6f).f32(6).acolorMember(0.4f).f32(0.9f).f32(0.01f).f32(0.6f).f32(2.5f).b8(false).b8(true).base("Ink");
    return version == 1 ? b : b.b8(true).f32(3);
}

// Linked 1: the id record (version 1: kind, then a text for kinds 0 and 1, a number for kind 2), the material's tag
// and record, the base record.
RecordBytes linkedRecord(std::uint32_t kind, const std::string& text, std::int32_t number) {
    RecordBytes b;
    b.version(1).version(1).u32(kind);
    return (kind == 2 ? b.i32(number) : b.wstr(text)).multi("Inside").base("Linked");
}

const std::vector<Record>& records() {
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
    // A refused tag still cleans the name the material had.
    MaterialMulti m;
    m.name = u"A\tB";
    QuickArchive ar = RecordBytes().version(2).u32(0).u32(0x20001).wstr("X").wstr("").archive();
    EXPECT_FALSE(m.load(ar));
    EXPECT_EQ(m.name, u"AB");
    // A layered material starts from its defaults, even for a refused tag.
    Layered l;
    l.brdfs.push_back(createBrdf(kGlassBrdf));
    l.layered_value_b = 42, l.uuid = u"old";
    // Version 2: no layers, double_sided, layered_value_a, base record version 1 (name only).
    QuickArchive v2 = RecordBytes().version(2).u32(0).i32(0).i32(0).version(1).wstr("N").archive();
    ASSERT_TRUE(l.load(v2));
    EXPECT_EQ(std::make_tuple(l.brdfs.size(), l.layered_value_b, l.uuid), std::make_tuple(0u, 1, u""));
    l.brdfs.push_back(createBrdf(kGlassBrdf));
    QuickArchive bad = RecordBytes().version(5).archive();
    EXPECT_FALSE(l.load(bad));
    EXPECT_TRUE(l.brdfs.empty());
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

TEST_F(MaterialRecords, BadAndTruncatedRecordsFail) {
    // Refused version tags, for every class.
    const std::pair<std::uint32_t, std::vector<std::uint32_t>> refused[] = {
        {kMaterialLayeredBRDF, {0, 0x40001, 0x50000}}, {kMaterialMulti, {0x30000}},
        {kMaterial2Sided, {0, 0x40000, 0x30001}},      {kMaterialSkp2Sided, {0, 0x20000, 0x10001}},
        {kMaterialBump, {0, 0x40000, 0x10100}},        {kMaterialOverrideEnvironment, {0, 0x20000}},
        {kMaterialDisplaced, {0, 0x30000, 0x20001}},   {kMaterialObjectExclusion, {0, 0x40000}},
        {kMaterialAlphaContribution, {0, 0x20000}},    {kMaterialAngleBlend, {0, 0x20000}},
        {kMaterialToon, {0, 0x30000, 0x10002}},        {kMaterialReference, {0, 0x30000, 0x20001}},
        {kMaterialInstance, {0, 0x10001, 0x20000}},    {kMaterialLinked, {0x20000}},
    };
    for (const auto& c : refused) {
        for (std::uint32_t tag : c.second) {
            QuickArchive ar = RecordBytes().u32(tag).base("R").wstr("t").b8(false).archive();
            EXPECT_FALSE(createMaterial(c.first)->load(ar)) << c.first << " " << std::hex << tag;
        }
    }
    // Tags without a class, refused children, huge counts.
    const std::pair<std::uint32_t, RecordBytes> cases[] = {
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(1).i32(3)},             // layer tag 3
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(1).i32(0)},             // layer tag 0
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(0xFFFFFFFF)},           // layer count
        {kMaterialSingleBRDF, RecordBytes().version(2).i32(0).i32(0).i32(64)},      // layer tag 64
        {kMaterialMulti, RecordBytes().version(2).u32(1).i32(15)},                  // material tag 15
        {kMaterialObjectExclusion, RecordBytes().version(3).i32(0).b8(false).u32(0x7FFFFFFF)},  // name count
        {kMaterialBump, RecordBytes().version(3).f32(1).b8(false).u32(15)},         // bare base_mtl, tag 15
        {kMaterialReference, RecordBytes().version(2).base("R").wstr("t").b8(true).u32(99)},  // copy, tag 99
        {kMaterialReference, RecordBytes().version(2).version(3).wstr("X").wstr("").wstr("t").b8(false)},  // base record
        {kMaterialLinked, RecordBytes().version(1).version(1).u32(2).i32(1).u32(15)},          // material tag 15
        {kMaterialLinked, RecordBytes().version(1).version(2).u32(2).i32(1).multi("Inside")},  // id tag
        {kMaterialLinked, RecordBytes().version(1).version(1).u32(3).i32(0).multi("Inside").base("L")},  // id kind 3
    };
    for (const auto& c : cases) {
        QuickArchive ar = c.second.archive();
        EXPECT_FALSE(createMaterial(c.first)->load(ar)) << &c - cases;
    }
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

    // Every cut of a layered record up to the base record's tag fails: what lies behind the end of the data reads as
    // zeros, and the base record's tag then has no valid version. (Behind that tag zeros pass as an empty name.)
    const RecordBytes& good = recordOf(kMaterialLayeredBRDF, 4);
    for (std::size_t cut = 0; cut <= good.size() - 21; ++cut) {
        Layered m;
        QuickArchive ar = good.archive(cut);
        EXPECT_FALSE(m.load(ar)) << "cut at " << cut;
    }
    // Every current record, cut anywhere, returns (whatever the result) without reading outside its bytes; cut to
    // nothing, it is refused.
    for (const Record& r : records()) {
        for (std::size_t cut = 0; r.current && cut < r.bytes.size(); cut += 7) {
            QuickArchive ar = r.bytes.archive(cut);
            createMaterial(r.tag)->load(ar);
        }
        QuickArchive empty = r.bytes.archive(0);
        EXPECT_FALSE(createMaterial(r.tag)->load(empty)) << r.tag;
    }
    // 300 MaterialMulti records, each the only sub-material of the one before: deeper than any real file, and refused
    // instead of overflowing.
    RecordBytes deep;
    for (int i = 0; i < 300; ++i) deep.version(2).u32(1).i32(kMaterialMulti);
    loaded<MaterialMulti>(deep, false);
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

TEST_F(MaterialRecords, EveryWrapperClassStopsAtTheNestingLimit) {
    for (std::size_t k = 0; k < layouts().size(); ++k) {
        SCOPED_TRACE(layouts()[k].tag);
        auto same = [k](int) { return k; };
        // The top record isn't nested; its child is one level deep, and so on: the layered material at the bottom
        // stands kMaxNestingDepth deep.
        for (int depth : {kMaxNestingDepth, kMaxNestingDepth + 1, 1000}) {
            QuickArchive ar = chain(depth, same).archive();
            EXPECT_EQ(createMaterial(layouts()[k].tag)->load(ar), depth == kMaxNestingDepth) << depth;
        }
    }
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
