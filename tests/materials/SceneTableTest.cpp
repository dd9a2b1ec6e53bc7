// The scene table: name rules, operations with their UUID housekeeping, its records, references.
#include "materials/MaterialAssets.h"
#include "materials/MaterialTestUtil.h"
#include "materials/MaterialTree.h"

using namespace mattest;

namespace {

typedef TableTest SceneTable;

MaterialPtr named(const std::u16string& name, const std::u16string& uuid = u"") {
    MaterialPtr m(new MaterialLayeredBRDF);
    m->name = name, m->uuid = uuid;
    return m;
}

// The names of a table, then its pairs of UUID and name.
std::string state(const SceneMaterials& t) {
    std::u16string out;
    t.dump(out);
    return wideToUtf8(out);
}

TEST_F(SceneTable, UniqueNames) {
    const std::tuple<std::vector<std::u16string>, std::u16string, std::u16string> cases[] = {
        {{}, u"Mat", u"Mat"}, {{}, u"Mat7", u"Mat"}, {{u"Mat"}, u"Mat", u"Mat1"}, {{u"Mat"}, u"Mat7", u"Mat1"},
        {{u"Mat", u"Mat1", u"Mat2"}, u"Mat", u"Mat3"}, {{u"MAT"}, u"mat", u"mat1"},  // keys ignore case
        {{}, u"3 Wood", u"a3_Wood"}, {{}, u"Big Wood 12", u"Big_Wood_"}, {{}, u"123", u""}, {{}, u"", u""},
        {{u"a b"}, u"a b", u"a_b1"},  // the blank counts in the lookup
        {{u"a_b"}, u"a b", u"a_b"},   // the result is not looked up again
        {{u"x", u"x1", u"x2", u"x3", u"x4", u"x5", u"x6", u"x7", u"x8", u"x9"}, u"x", u"x10"},
    };
    for (const auto& c : cases) {
        table().clear();
        for (const std::u16string& t : std::get<0>(c)) ASSERT_TRUE(table().addMaterial(named(t)));
        EXPECT_EQ(table().getUniqueName(std::get<1>(c)), std::get<2>(c)) << wideToUtf8(std::get<1>(c));
    }
    // A new material takes a unique default name but isn't entered.
    ASSERT_TRUE(table().addMaterial(named(u"DefaultMaterial")));
    MaterialMulti a, b;
    EXPECT_EQ(std::make_tuple(a.name, b.name), std::make_tuple(u"DefaultMaterial1", u"DefaultMaterial1"));
    // Validity, with the message of a refusal.
    auto validity = [this](const std::u16string& name) {
        std::u16string message = u"stale";
        const bool valid = table().isNameValid(name, message);
        return std::make_tuple(valid, wideToUtf8(message));
    };
    EXPECT_EQ(validity(u"Stone"), std::make_tuple(true, ""));
    EXPECT_EQ(validity(u"DEFAULTmaterial"), std::make_tuple(false, "The name, \"DEFAULTmaterial\", is already in use"));
    EXPECT_EQ(validity(u""), std::make_tuple(false, "A name must have at least one character"));
    EXPECT_TRUE(table().isNameUnused(u"Stone") && !table().isNameUnused(u"defaultmaterial"));
}

TEST_F(SceneTable, AddReplaceCopyRemove) {
    EXPECT_FALSE(table().addMaterial(MaterialPtr()) || table().addMaterial(named(u"")));
    ASSERT_TRUE(table().addMaterial(named(u"wood", u"ID-W")));
    EXPECT_FALSE(table().addMaterial(named(u"WOOD", u"ID-2")));  // one key per name, ignoring case
    ASSERT_TRUE(table().addMaterial(named(u"Stone", u"ID-S")));
    EXPECT_EQ(state(table()), "Stone\nwood\nBeginning UUIDs\nID-S Stone\nID-W wood\n");
    EXPECT_TRUE(table().getMaterialByUuid(u"id-w") == table().getMaterial(u"WOOD") && !table().getMaterialByUuid(u"none"));
    // Replace moves the entry and its UUID: the new name must be free (a change of case alone is), the old one
    // present.
    const MaterialPtr wood = table().getMaterial(u"wood");
    wood->name = u"Stone";
    EXPECT_FALSE(table().replaceMaterial(u"wood", wood));
    wood->name = u"Oak";
    EXPECT_FALSE(table().replaceMaterial(u"Pine", wood));
    EXPECT_TRUE(table().replaceMaterial(u"WOOD", wood));
    wood->name = u"OAK";
    EXPECT_TRUE(table().replaceMaterial(u"Oak", wood));
    EXPECT_EQ(state(table()), "OAK\nStone\nBeginning UUIDs\nID-S Stone\nID-W OAK\n");
    // A copy takes a unique name and no uuid.
    const MaterialPtr copy = table().getMaterialCopy(u"oak");
    ASSERT_TRUE(copy);
    EXPECT_EQ(std::make_tuple(copy->name, copy->uuid), std::make_tuple(u"OAK1", u""));
    EXPECT_FALSE(table().getMaterialCopy(u"Pine") || table().removeMaterial(u"Pine"));
    EXPECT_TRUE(table().removeMaterial(u"oak"));
    EXPECT_EQ(state(table()), "Stone\nBeginning UUIDs\nID-S Stone\n");
    // A material without a uuid gets one in the map only.
    const MaterialPtr glass = named(u"Glass");
    ASSERT_TRUE(table().addMaterial(glass));
    EXPECT_EQ(std::make_tuple(glass->uuid, table().getUuid(u"glass").size()), std::make_tuple(u"", 36u));
    EXPECT_EQ(table().getMaterialByUuid(table().getUuid(u"glass")), glass);
    // An entry without a UUID entry is removed all the same: a version 2 record with one material and an empty UUID
    // map.
    QuickArchive ar = RecordBytes().version(2).u32(1).multi("Solo").u32(0).archive();
    ASSERT_TRUE(table().load(ar));
    EXPECT_TRUE(table().removeMaterial(u"Solo"));
    EXPECT_EQ(state(table()), "Beginning UUIDs\n");
}

TEST_F(SceneTable, RecordVersions) {
    // The current record, round trip.
    ASSERT_TRUE(table().addMaterial(named(u"Wood", u"ID-W")));
    ASSERT_TRUE(table().addMaterial(named(u"Stone", u"ID-S")));
    QuickArchive ar;
    ASSERT_TRUE(table().save(ar));
    SceneMaterials t;
    ASSERT_TRUE(t.load(ar));
    EXPECT_EQ(state(t), state(table()));
    EXPECT_TRUE(t.getMaterial(u"Wood")->isEqual(table().getMaterial(u"Wood")));
    EXPECT_EQ(t.getMaterial(u"Wood")->uuid, u"ID-W");
    // Version 1: count, then per material its tag and record; no UUID map. The materials go through addMaterial: one
    // without a uuid gets one, and a name it refuses ends the load, what came before staying.
    QuickArchive v1 = RecordBytes().version(1).u32(2).multi("Wood", "ID-W").multi("Stone").archive();
    ASSERT_TRUE(t.load(v1));
    EXPECT_EQ(std::make_tuple(t.getUuid(u"Wood"), t.getUuid(u"Stone").size()), std::make_tuple(u"ID-W", 36u));
    QuickArchive twice = RecordBytes().version(1).u32(2).multi("Wood").multi("WOOD").archive();
    EXPECT_FALSE(t.load(twice));
    EXPECT_EQ(t.getMaterials().size(), 1u);
    // Version 2 takes names and pairs without any test: an empty name (which became a unique default name) and a UUID
    // of a name that isn't there are kept.
    QuickArchive v2 = RecordBytes().version(2).u32(1).multi("").u32(2).wstr("U1").wstr("Ghost").wstr("U2").wstr("Other").archive();
    ASSERT_TRUE(t.load(v2));
    EXPECT_EQ(state(t), "DefaultMaterial\nBeginning UUIDs\nU1 Ghost\nU2 Other\n");
    EXPECT_FALSE(t.getMaterialByUuid(u"U1"));
    // Bad records fail: low half of the tag set, version 3, empty data, material tag 15, a count past the data, a
    // truncated material.
    const RecordBytes bad[] = {RecordBytes().u32(0x20001).u32(0).u32(0), RecordBytes().version(3).u32(0).u32(0), RecordBytes(),
                               RecordBytes().version(2).u32(1).i32(15), RecordBytes().version(2).u32(0x7FFFFFFF),
                               RecordBytes().version(2).u32(1).i32(kMaterialMulti).version(2)};
    for (const RecordBytes& b : bad) loaded<SceneMaterials>(b, false);
}

TEST_F(SceneTable, ReferencesSaveCopyAndCompareThroughTheTable) {
    auto ref = referenceTo(u"WOOD-1", u"Ref", layered(u"Stale"));
    // Not in the table: saved without a copy, and the old copy is gone.
    auto back = roundTrip(*ref);
    EXPECT_EQ(std::make_tuple(!ref->target, !back->target, back->target_uuid), std::make_tuple(true, true, u"WOOD-1"));
    auto wood = layered(u"Wood", u"Grain");
    wood->uuid = u"wood-1";
    ASSERT_TRUE(table().addMaterial(wood));
    back = roundTrip(*ref);
    EXPECT_EQ(ref->target, wood);
    ASSERT_TRUE(back->target && back->target->isEqual(wood));
    EXPECT_EQ(back->target->name, u"Wood");
    // Copies keep the name, although it is taken, and the target UUID, but no copy or uuid.
    table().clear();
    ref = referenceTo(u"abc", u"Ref", layered(u"Copy"));
    ref->uuid = u"own";
    table().addMaterial(layered(u"Ref"));
    for (const MaterialPtr& copy : {ref->duplicate(), ref->clone()}) {
        const MaterialReference& c = static_cast<const MaterialReference&>(*copy);
        EXPECT_EQ(std::make_tuple(c.name, c.target_uuid, c.uuid, !c.target), std::make_tuple(u"Ref", u"abc", u"", true));
    }
    // Equal target UUIDs (ignoring case), both unresolved: equal.
    EXPECT_TRUE(ref->isEqual(referenceTo(u"ABC", u"Other")));
    EXPECT_FALSE(ref->isEqual(referenceTo(u"abd")) || ref->isEqual(layered(u"L")) || ref->isEqual(MaterialPtr()));
    // Resolved through the table: the table's material compares with itself.
    auto target = layered(u"T");
    target->uuid = u"ABC";
    table().addMaterial(target);
    EXPECT_TRUE(ref->isEqual(referenceTo(u"abc")));
}

TEST_F(SceneTable, TableCycleCreatedReferenceAndDefaultMaterial) {
    // A table material that holds a reference to itself.
    auto loop = wrap<MaterialBump>(referenceTo(u"loop-uuid"), u"Loop");
    loop->uuid = u"loop-uuid";
    ASSERT_TRUE(table().addMaterial(loop));
    EXPECT_FALSE(loop->isEqual(loop->clone()));
    EXPECT_TRUE(findMaterialsOfType(loop, kMaterialLayeredBRDF).empty());
    std::vector<std::u16string> files;
    EXPECT_EQ(collectBitmapFiles(loop, files), 0u);
    // Saving embeds the table's material, which embeds itself again: the depth count stops it.
    QuickArchive ar(1);
    EXPECT_FALSE(loop->save(ar));
    loop->base_mtl.reset();  // break the cycle the save made

    // A reference created for a name takes its UUID.
    table().clear();
    auto wood = layered(u"Wood");
    wood->uuid = u"wood-uuid";
    table().addMaterial(wood);
    EXPECT_EQ(table().createReference(u"WOOD")->target_uuid, u"wood-uuid");
    EXPECT_EQ(table().createReference(u"Nothing")->target_uuid, u"");

    table().clear();
    EXPECT_FALSE(table().getDefaultMaterial());
    table().ensureDefaultMaterial();
    const MaterialPtr m = table().getDefaultMaterial();
    ASSERT_TRUE(m && m->isEqual(layered(u"Any")));
    EXPECT_EQ(m->name + u"/" + static_cast<const MaterialLayeredBRDF&>(*m).brdfs[0]->name, u"Default_Lumo_Material/Diffuse");
    // A second call is refused by the table without a word.
    table().ensureDefaultMaterial();
    EXPECT_EQ(std::make_tuple(table().getDefaultMaterial(), table().getMaterials().size()), std::make_tuple(m, 1u));
}

// A version 2 table record: the layered material Wood, the bump Wrap over a reference to "A-1", the layered material
// Other; then six UUID pairs, two of them for Wood, two for the missing Ghost.
QuickArchive tableWithDuplicates() {
    RecordBytes b;
    b.version(2).u32(3).layered("Wood");
    // MaterialBump version 3: mult, no texture, the reference (version 2, no copy), base record.
    b.u32(kMaterialBump).version(3).f32(1).b8(false).u32(kMaterialReference).version(2).base("Ref").wstr("A-1").b8(false);
    b.base("Wrap").layered("Other");
    b.u32(6).wstr("a-1").wstr("Wood").wstr("b-2").wstr("wood").wstr("c-3").wstr("Wrap");
    return b.wstr("x-1").wstr("Ghost").wstr("y-2").wstr("Ghost").wstr("z-9").wstr("Other").archive();
}

TEST_F(SceneTable, FindAndMergeReferences) {
    QuickArchive ar = tableWithDuplicates();
    ASSERT_TRUE(table().load(ar));
    ASSERT_EQ(table().getUuids().size(), 6u);
    ASSERT_EQ(table().findReferences(u"a-1").size(), 1u);
    EXPECT_TRUE(table().findReferences(u"b-2").empty());
    // A reference at the top, one in a two-sided back, and one inside an embedded copy, which isn't entered.
    table().addMaterial(referenceTo(u"A-1", u"Top", referenceTo(u"a-1", u"InCopy")));
    table().addMaterial(sided<Material2Sided>(u"Two", MaterialPtr(), referenceTo(u"a-1", u"Back")));
    std::vector<std::u16string> names;
    for (const auto& r : table().findReferences(u"A-1")) names.push_back(r->name);
    EXPECT_EQ(names, (std::vector<std::u16string>{u"Top", u"Back", u"Ref"}));  // key order: Top, Two, Wrap
    // Merging keeps the last of each material's UUIDs and moves the references to it.
    table().mergeDuplicateUuids();
    const SceneMaterials::UuidMap& uuids = table().getUuids();
    EXPECT_EQ(uuids.count(u"a-1"), 0u);
    // A name without a material is left alone.
    for (const char16_t* kept : {u"b-2", u"c-3", u"z-9", u"x-1", u"y-2"}) EXPECT_EQ(uuids.count(kept), 1u) << wideToUtf8(kept);
    const MaterialBump& wrap = static_cast<const MaterialBump&>(*table().getMaterial(u"Wrap"));
    const MaterialReference& ref = static_cast<const MaterialReference&>(*wrap.base_mtl);
    EXPECT_EQ(ref.target_uuid, u"b-2");
    EXPECT_EQ(ref.target, table().getMaterial(u"Wood"));
}


}  // namespace
