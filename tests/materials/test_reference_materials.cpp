// Reference, instance and linked materials, and the scene table's
// operations on references and the default material.
#include <gtest/gtest.h>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTree.h"
#include "materials/RecordBytes.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/TwoSidedBump.h"
#include "test_wrapping_util.h"

using namespace OrvaneLumoCore;
using namespace wraptest;
using testbytes::RecordBytes;

namespace {

class ReferenceMaterials : public ::testing::Test {
protected:
    void SetUp() override { table().clear(); }
    void TearDown() override { table().clear(); }
    static SceneMaterials& table() { return *SceneMaterials::instance(); }
};

RecordBytes& baseRecord(RecordBytes& b, const std::string& name, const std::string& uuid = "") {
    return b.version(2).str(name).str(uuid);
}

// An empty MaterialMulti record (version 2) named `name`, with its tag.
RecordBytes& taggedMulti(RecordBytes& b, const std::string& name) {
    b.u32(kMaterialMulti).version(2).u32(0);
    return baseRecord(b, name);
}

boost::shared_ptr<MaterialReference> referenceTo(const std::u16string& uuid, const std::u16string& name = u"Ref") {
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->name = name;
    ref->target_uuid = uuid;
    return ref;
}

// ---- MaterialReference ----------------------------------------------------------------

TEST_F(ReferenceMaterials, ReferenceVersions) {
    // Version 1: base record, target_uuid; no embedded copy.
    RecordBytes v1;
    v1.version(1);
    baseRecord(v1, "Ref", "own-uuid").str("target-uuid");
    MaterialReference ref;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(ref.load(ar));
    EXPECT_EQ(ref.name, u"Ref");
    EXPECT_EQ(ref.uuid, u"own-uuid");
    EXPECT_EQ(ref.target_uuid, u"target-uuid");
    EXPECT_FALSE(ref.target);

    // Version 2: as 1, then the embedded copy as an optional member.
    RecordBytes v2;
    v2.version(2);
    baseRecord(v2, "Ref2").str("t").b8(true);
    taggedMulti(v2, "Copy");
    QuickArchive ar2 = v2.archive();
    ASSERT_TRUE(ref.load(ar2));
    EXPECT_EQ(ref.name, u"Ref2");
    ASSERT_TRUE(ref.target);
    EXPECT_EQ(ref.target->name, u"Copy");
    EXPECT_EQ(ar2.getReadPosition(), v2.size());

    // A refused base record or a copy with a tag without a class fails.
    RecordBytes badBase;
    badBase.version(2).version(3).str("X").str("").str("t").b8(false);
    QuickArchive ar3 = badBase.archive();
    EXPECT_FALSE(MaterialReference().load(ar3));
    RecordBytes badCopy;
    badCopy.version(2);
    baseRecord(badCopy, "R").str("t").b8(true).u32(99);
    QuickArchive ar4 = badCopy.archive();
    EXPECT_FALSE(MaterialReference().load(ar4));
    for (std::uint32_t tag : {0u, 0x30000u, 0x20001u}) {
        RecordBytes b;
        b.u32(tag);
        baseRecord(b, "R").str("t").b8(false);
        QuickArchive a = b.archive();
        EXPECT_FALSE(MaterialReference().load(a)) << tag;
    }
}

TEST_F(ReferenceMaterials, SaveEmbedsTheTablesMaterialAndDropsTheOldCopy) {
    boost::shared_ptr<MaterialReference> ref = referenceTo(u"WOOD-1");
    ref->target = layered(u"Stale");
    // Not in the table: saved without a copy, and the old copy is gone.
    boost::shared_ptr<MaterialReference> loaded = roundTrip(*ref);
    EXPECT_FALSE(ref->target);
    EXPECT_FALSE(loaded->target);
    EXPECT_EQ(loaded->target_uuid, u"WOOD-1");

    boost::shared_ptr<MaterialLayeredBRDF> wood = layered(u"Wood", u"Grain");
    wood->uuid = u"wood-1";
    ASSERT_TRUE(table().addMaterial(wood));
    loaded = roundTrip(*ref);
    EXPECT_EQ(ref->target, wood);
    ASSERT_TRUE(loaded->target);
    EXPECT_EQ(loaded->target->name, u"Wood");
    EXPECT_TRUE(loaded->target->isEqual(wood));
}

TEST_F(ReferenceMaterials, ReferenceCopiesAndComparisons) {
    boost::shared_ptr<MaterialReference> ref = referenceTo(u"abc");
    ref->target = layered(u"Copy");
    ref->uuid = u"own";
    table().addMaterial(layered(u"Ref"));  // the name is taken: copies keep it all the same
    for (const MaterialPtr& copy : {ref->duplicate(), ref->clone()}) {
        const MaterialReference& c = static_cast<const MaterialReference&>(*copy);
        EXPECT_EQ(c.name, u"Ref");
        EXPECT_EQ(c.target_uuid, u"abc");
        EXPECT_FALSE(c.target);
        EXPECT_TRUE(c.uuid.empty());
    }

    // Equal target UUIDs (ignoring case), both unresolved: equal.
    EXPECT_TRUE(ref->isEqual(referenceTo(u"ABC", u"Other")));
    EXPECT_FALSE(ref->isEqual(referenceTo(u"abd")));
    EXPECT_FALSE(ref->isEqual(layered(u"L")));
    EXPECT_FALSE(ref->isEqual(MaterialPtr()));

    // Resolved through the table: the table's material compares with itself.
    boost::shared_ptr<MaterialLayeredBRDF> target = layered(u"T");
    target->uuid = u"ABC";
    table().addMaterial(target);
    EXPECT_TRUE(ref->isEqual(referenceTo(u"abc")));
}

TEST_F(ReferenceMaterials, ComparisonThroughATableCycleEnds) {
    // A table material that holds a reference to itself.
    boost::shared_ptr<MaterialBump> loop(new MaterialBump);
    loop->name = u"Loop";
    loop->uuid = u"loop-uuid";
    loop->base_mtl = referenceTo(u"loop-uuid");
    ASSERT_TRUE(table().addMaterial(loop));
    EXPECT_FALSE(loop->isEqual(loop->clone()));
    EXPECT_FALSE(findMaterialsOfType(loop, kMaterialLayeredBRDF).size());
    std::vector<std::u16string> files;
    EXPECT_EQ(collectBitmapFiles(loop, files), 0u);
    // Saving embeds the table's material, which embeds itself again: the
    // depth count stops it.
    QuickArchive ar(1);
    EXPECT_FALSE(loop->save(ar));
    loop->base_mtl.reset();  // break the cycle the save made
}

// ---- MaterialInstance --------------------------------------------------------------------

TEST_F(ReferenceMaterials, InstanceIsAnAliasThatIsNeverEqual) {
    boost::shared_ptr<MaterialLayeredBRDF> wood = layered(u"Wood");
    boost::shared_ptr<MaterialInstance> inst(new MaterialInstance(wood));
    EXPECT_EQ(inst->name, u"Wood");
    EXPECT_EQ(inst->instance_of, wood);
    EXPECT_FALSE(inst->isEqual(inst));

    MaterialInstance other;
    other = layered(u"Stone");
    EXPECT_EQ(other.name, u"Stone");

    const MaterialPtr dup = inst->duplicate();
    EXPECT_EQ(dup->name, u"Wood");
    EXPECT_EQ(static_cast<const MaterialInstance&>(*dup).instance_of, wood);

    // The record is the base record alone.
    inst->uuid = u"u";
    RecordBytes expected;
    expected.version(1);
    baseRecord(expected, "Wood", "u");
    QuickArchive ar = savedArchive(*inst);
    EXPECT_EQ(static_cast<std::size_t>(ar.getWritePosition()), expected.size());
    MaterialInstance loaded;
    ASSERT_TRUE(loaded.load(ar));
    EXPECT_EQ(loaded.name, u"Wood");
    EXPECT_FALSE(loaded.instance_of);

    for (std::uint32_t tag : {0x10001u, 0x20000u, 0u}) {
        RecordBytes b;
        b.u32(tag);
        baseRecord(b, "W");
        QuickArchive a = b.archive();
        EXPECT_FALSE(MaterialInstance().load(a)) << tag;
    }
}

// ---- MaterialLinked ------------------------------------------------------------------------

TEST_F(ReferenceMaterials, LinkedRecordsOfEveryIdKind) {
    struct Case {
        std::int32_t kind;
        std::u16string text;
        std::int32_t number;
    };
    const Case cases[] = {{0, u"obj-0", 0}, {1, u"", 0}, {1, u"Node", 0}, {2, u"", 42}};
    for (const Case& c : cases) {
        // Version 1: the id record, the material's tag and record, the base
        // record.
        RecordBytes b;
        b.version(1).version(1).u32(static_cast<std::uint32_t>(c.kind));
        if (c.kind == 2)
            b.i32(c.number);
        else
            b.str(wideToUtf8(c.text));
        taggedMulti(b, "Inside");
        baseRecord(b, "Linked");
        MaterialLinked linked;
        QuickArchive ar = b.archive();
        ASSERT_TRUE(linked.load(ar)) << c.kind;
        EXPECT_EQ(ar.getReadPosition(), b.size());
        EXPECT_EQ(linked.id.kind, c.kind);
        EXPECT_EQ(linked.id.getText(), c.text);
        EXPECT_EQ(linked.id.getNumber(), c.kind == 2 ? c.number : -1);
        EXPECT_EQ(linked.linked_material->name, u"Inside");
        EXPECT_EQ(linked.name, u"Linked");

        boost::shared_ptr<MaterialLinked> again = roundTrip(linked);
        EXPECT_TRUE(again->isEqual(MaterialPtr(new MaterialLinked(linked))));
        EXPECT_EQ(again->id.kind, c.kind);
        EXPECT_EQ(again->id.text, c.text);
    }
}

TEST_F(ReferenceMaterials, LinkedFailures) {
    // No material: save fails and writes nothing.
    MaterialLinked empty;
    QuickArchive ar(1);
    EXPECT_FALSE(empty.save(ar));
    EXPECT_EQ(ar.getWritePosition(), 0u);

    // An invalid id kind fails save and load.
    MaterialLinked bad;
    bad.linked_material = layered(u"L");
    bad.id.kind = 3;
    QuickArchive ar2(1);
    EXPECT_FALSE(bad.save(ar2));
    RecordBytes invalid;
    invalid.version(1).version(1).u32(3).i32(0);
    taggedMulti(invalid, "Inside");
    baseRecord(invalid, "L");
    QuickArchive ar3 = invalid.archive();
    EXPECT_FALSE(MaterialLinked().load(ar3));

    // A material tag without a class, a refused id tag, a refused tag.
    RecordBytes noClass;
    noClass.version(1).version(1).u32(2).i32(1).u32(15);
    QuickArchive ar4 = noClass.archive();
    EXPECT_FALSE(MaterialLinked().load(ar4));
    RecordBytes idTag;
    idTag.version(1).version(2).u32(2).i32(1);
    taggedMulti(idTag, "Inside");
    QuickArchive ar5 = idTag.archive();
    EXPECT_FALSE(MaterialLinked().load(ar5));
    RecordBytes tag;
    tag.version(2);
    QuickArchive ar6 = tag.archive();
    EXPECT_FALSE(MaterialLinked().load(ar6));
}

TEST_F(ReferenceMaterials, LinkedCopiesAndComparisons) {
    boost::shared_ptr<MaterialLinked> linked(new MaterialLinked);
    linked->name = u"Linked";
    linked->linked_material = layered(u"Inner");
    linked->id.kind = 0;
    linked->id.text = u"Node";
    table().addMaterial(layered(u"Linked"));
    table().addMaterial(layered(u"Inner"));

    const MaterialPtr dup = linked->duplicate(), cl = linked->clone();
    EXPECT_NE(dup->name, u"Linked");
    EXPECT_EQ(cl->name, u"Linked");
    EXPECT_NE(static_cast<const MaterialLinked&>(*dup).linked_material->name, u"Inner");
    EXPECT_EQ(static_cast<const MaterialLinked&>(*cl).linked_material->name, u"Inner");
    EXPECT_NE(static_cast<const MaterialLinked&>(*cl).linked_material, linked->linked_material);
    EXPECT_EQ(static_cast<const MaterialLinked&>(*cl).id.text, u"Node");
    EXPECT_TRUE(dup->isEqual(linked));

    MaterialLinked& c = static_cast<MaterialLinked&>(*cl);
    c.id.text = u"NODE";
    EXPECT_TRUE(c.isEqual(linked)) << "id texts compare without regard to case";
    c.id.kind = 1;
    EXPECT_FALSE(c.isEqual(linked));
    c.id.kind = 0;
    c.linked_material.reset();
    EXPECT_FALSE(c.isEqual(linked));
    MaterialLinked::IdData a, b;
    a.number = 5;
    b.number = 6;
    EXPECT_FALSE(a.isEqual(b));
    b.text = u"ignored for numbers";
    b.number = 5;
    EXPECT_TRUE(a.isEqual(b));
}

// ---- the scene table -------------------------------------------------------------------------

TEST_F(ReferenceMaterials, CreateReferenceTakesTheUuidOfTheName) {
    boost::shared_ptr<MaterialLayeredBRDF> wood = layered(u"Wood");
    wood->uuid = u"wood-uuid";
    table().addMaterial(wood);
    EXPECT_EQ(table().createReference(u"WOOD")->target_uuid, u"wood-uuid");
    EXPECT_EQ(table().createReference(u"Nothing")->target_uuid, u"");
}

TEST_F(ReferenceMaterials, DefaultMaterial) {
    EXPECT_FALSE(table().getDefaultMaterial());
    table().ensureDefaultMaterial();
    const MaterialPtr m = table().getDefaultMaterial();
    ASSERT_TRUE(m);
    EXPECT_EQ(m->name, u"Default_Lumo_Material");
    const MaterialLayeredBRDF* layeredDefault = dynamic_cast<const MaterialLayeredBRDF*>(m.get());
    ASSERT_TRUE(layeredDefault);
    ASSERT_EQ(layeredDefault->brdfs.size(), 1u);
    EXPECT_EQ(layeredDefault->brdfs[0]->name, u"Diffuse");
    EXPECT_TRUE(layeredDefault->brdfs[0]->isEqual(BrdfPtr(new Diffuse_BRDF)));
    EXPECT_FALSE(table().getUuid(u"Default_Lumo_Material").empty());

    // A second call is refused by the table without a word.
    table().ensureDefaultMaterial();
    EXPECT_EQ(table().getDefaultMaterial(), m);
    EXPECT_EQ(table().getMaterials().size(), 1u);
    EXPECT_FALSE(table().getMaterial(u"Default_Lumo_Material_Actual"));
    // Each call takes a fresh copy: a cleared table gets a new object.
    table().clear();
    table().ensureDefaultMaterial();
    EXPECT_NE(table().getDefaultMaterial(), m);
}

// A version 2 table record: the layered material Wood, the bump Wrap over a
// reference to "a-1", the layered material Ghostless; then the UUID pairs.
RecordBytes tableWithDuplicates() {
    RecordBytes b;
    b.version(2).u32(3);
    // MaterialLayeredBRDF version 4: no layers, four integers, base record, one integer.
    b.u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1);
    baseRecord(b, "Wood").i32(0);
    // MaterialBump version 3: mult, no texture, the reference, base record.
    b.u32(kMaterialBump).version(3).f32(1).b8(false);
    b.u32(kMaterialReference).version(2);
    baseRecord(b, "Ref").str("A-1").b8(false);
    baseRecord(b, "Wrap");
    b.u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1);
    baseRecord(b, "Other").i32(0);
    b.u32(6);
    b.str("a-1").str("Wood").str("b-2").str("wood").str("c-3").str("Wrap");
    b.str("x-1").str("Ghost").str("y-2").str("Ghost").str("z-9").str("Other");
    return b;
}

TEST_F(ReferenceMaterials, FindReferencesLooksInsideEveryMaterial) {
    RecordBytes b = tableWithDuplicates();
    QuickArchive ar = b.archive();
    ASSERT_TRUE(table().load(ar));
    std::vector<boost::shared_ptr<MaterialReference>> found = table().findReferences(u"a-1");
    ASSERT_EQ(found.size(), 1u);
    EXPECT_EQ(found[0]->name, u"Ref");
    EXPECT_TRUE(table().findReferences(u"b-2").empty());

    // A reference at the top, one in a two-sided back, and one inside an
    // embedded copy, which isn't entered.
    boost::shared_ptr<MaterialReference> top = referenceTo(u"A-1", u"Top");
    boost::shared_ptr<MaterialReference> inCopy = referenceTo(u"a-1", u"InCopy");
    top->target = inCopy;
    table().addMaterial(top);
    boost::shared_ptr<Material2Sided> two(new Material2Sided);
    two->name = u"Two";
    two->back = referenceTo(u"a-1", u"Back");
    table().addMaterial(two);
    found = table().findReferences(u"A-1");
    std::vector<std::u16string> names;
    for (const auto& r : found) names.push_back(r->name);
    EXPECT_EQ(names, (std::vector<std::u16string>{u"Top", u"Back", u"Ref"}));  // key order: Top, Two, Wrap
}

TEST_F(ReferenceMaterials, MergeDuplicateUuidsKeepsTheLastAndMovesTheReferences) {
    RecordBytes b = tableWithDuplicates();
    QuickArchive ar = b.archive();
    ASSERT_TRUE(table().load(ar));
    ASSERT_EQ(table().getUuids().size(), 6u);
    table().mergeDuplicateUuids();

    const SceneMaterials::UuidMap& uuids = table().getUuids();
    EXPECT_EQ(uuids.count(u"a-1"), 0u);
    EXPECT_EQ(uuids.count(u"b-2"), 1u);
    EXPECT_EQ(uuids.count(u"c-3"), 1u);
    EXPECT_EQ(uuids.count(u"z-9"), 1u);
    // A name without a material is left alone.
    EXPECT_EQ(uuids.count(u"x-1"), 1u);
    EXPECT_EQ(uuids.count(u"y-2"), 1u);

    const MaterialBump& wrap = static_cast<const MaterialBump&>(*table().getMaterial(u"Wrap"));
    const MaterialReference& ref = static_cast<const MaterialReference&>(*wrap.base_mtl);
    EXPECT_EQ(ref.target_uuid, u"b-2");
    EXPECT_EQ(ref.target, table().getMaterial(u"Wood"));
}

}  // namespace
