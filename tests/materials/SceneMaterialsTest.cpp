// The scene table: naming rules, the table operations with their UUID
// housekeeping, and both versions of the table's record.
#include <gtest/gtest.h>

#include "materials/LayeredMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/RecordBytes.h"

using namespace OrvaneLumoCore;
using testbytes::RecordBytes;

namespace {

class SceneTable : public ::testing::Test {
protected:
    void SetUp() override { table().clear(); }
    void TearDown() override { table().clear(); }

    static SceneMaterials& table() { return *SceneMaterials::instance(); }

    // A layered material without layers, under the given name.
    static MaterialPtr named(const std::u16string& name, const std::u16string& uuid = u"") {
        MaterialPtr m(new MaterialLayeredBRDF);
        m->name = name;
        m->uuid = uuid;
        return m;
    }
};

struct UniqueNameCase {
    std::vector<std::u16string> taken;
    std::u16string candidate;
    std::u16string expected;
};

TEST_F(SceneTable, UniqueNames) {
    const UniqueNameCase cases[] = {
        {{}, u"Mat", u"Mat"},
        {{}, u"Mat7", u"Mat"},
        {{u"Mat"}, u"Mat", u"Mat1"},
        {{u"Mat"}, u"Mat7", u"Mat1"},
        {{u"Mat", u"Mat1", u"Mat2"}, u"Mat", u"Mat3"},
        {{u"MAT"}, u"mat", u"mat1"},  // keys ignore case
        {{}, u"3 Wood", u"a3_Wood"},
        {{}, u"Big Wood 12", u"Big_Wood_"},
        {{}, u"123", u""},
        {{}, u"", u""},
        {{u"a b"}, u"a b", u"a_b1"},  // the blank counts in the lookup
        {{u"a_b"}, u"a b", u"a_b"},   // the result is not looked up again
        {{u"x", u"x1", u"x2", u"x3", u"x4", u"x5", u"x6", u"x7", u"x8", u"x9"}, u"x", u"x10"},
    };
    for (const UniqueNameCase& c : cases) {
        table().clear();
        for (const std::u16string& t : c.taken) ASSERT_TRUE(table().addMaterial(named(t)));
        EXPECT_EQ(table().getUniqueName(c.candidate), c.expected)
            << wideToUtf8(c.candidate) << " with " << c.taken.size() << " taken";
    }
}

TEST_F(SceneTable, NewMaterialsAreNotEntered) {
    MaterialLayeredBRDF a, b;
    EXPECT_EQ(a.name, u"DefaultMaterial");
    EXPECT_EQ(b.name, u"DefaultMaterial");
    EXPECT_TRUE(a.uuid.empty());
    ASSERT_TRUE(table().addMaterial(named(u"DefaultMaterial")));
    MaterialMulti c;
    EXPECT_EQ(c.name, u"DefaultMaterial1");
    EXPECT_EQ(table().getDefaultMaterialName(), u"Default_Lumo_Material");
}

TEST_F(SceneTable, NameValidity) {
    ASSERT_TRUE(table().addMaterial(named(u"Wood")));
    std::u16string message = u"stale";
    EXPECT_TRUE(table().isNameValid(u"Stone", message));
    EXPECT_EQ(message, u"");
    EXPECT_FALSE(table().isNameValid(u"WOOD", message));
    EXPECT_EQ(message, u"The name, \"WOOD\", is already in use");
    EXPECT_FALSE(table().isNameValid(u"", message));
    EXPECT_EQ(message, u"A name must have at least one character");
    EXPECT_TRUE(table().isNameUnused(u"Stone"));
    EXPECT_FALSE(table().isNameUnused(u"wood"));
}

TEST_F(SceneTable, AddKeepsOneKeyPerNameAndMakesUuids) {
    EXPECT_FALSE(table().addMaterial(MaterialPtr()));
    EXPECT_FALSE(table().addMaterial(named(u"")));
    ASSERT_TRUE(table().addMaterial(named(u"wood", u"ID-1")));
    EXPECT_FALSE(table().addMaterial(named(u"WOOD", u"ID-2")));
    EXPECT_EQ(table().getMaterials().size(), 1u);
    EXPECT_EQ(table().getUuids().size(), 1u);
    EXPECT_EQ(table().getUuid(u"Wood"), u"ID-1");

    // A material without a uuid gets one in the map only.
    MaterialPtr stone = named(u"Stone");
    ASSERT_TRUE(table().addMaterial(stone));
    EXPECT_TRUE(stone->uuid.empty());
    const std::u16string id = table().getUuid(u"stone");
    EXPECT_EQ(id.size(), 36u);
    EXPECT_EQ(table().getMaterialByUuid(id), stone);
    EXPECT_EQ(table().getMaterialByUuid(u"id-1"), table().getMaterial(u"wood"));
    EXPECT_FALSE(table().getMaterialByUuid(u"nothing"));

    std::vector<std::u16string> names;
    table().getMaterialNames(names);
    EXPECT_EQ(names, (std::vector<std::u16string>{u"Stone", u"wood"}));
}

TEST_F(SceneTable, ReplaceMovesTheEntryAndItsUuid) {
    MaterialPtr wood = named(u"Wood", u"ID-W");
    ASSERT_TRUE(table().addMaterial(wood));
    ASSERT_TRUE(table().addMaterial(named(u"Stone", u"ID-S")));

    wood->name = u"Stone";
    EXPECT_FALSE(table().replaceMaterial(u"Wood", wood));  // new name taken
    wood->name = u"Oak";
    EXPECT_FALSE(table().replaceMaterial(u"Pine", wood));  // old name missing
    EXPECT_TRUE(table().replaceMaterial(u"wood", wood));
    EXPECT_FALSE(table().getMaterial(u"Wood"));
    EXPECT_EQ(table().getMaterial(u"oak"), wood);
    EXPECT_EQ(table().getUuid(u"Oak"), u"ID-W");
    EXPECT_EQ(table().getUuids().at(u"ID-W"), u"Oak");

    // Only a change of case: allowed although the key exists.
    wood->name = u"OAK";
    EXPECT_TRUE(table().replaceMaterial(u"Oak", wood));
    std::vector<std::u16string> names;
    table().getMaterialNames(names);
    EXPECT_EQ(names, (std::vector<std::u16string>{u"OAK", u"Stone"}));
    EXPECT_EQ(table().getUuids().at(u"ID-W"), u"OAK");
}

TEST_F(SceneTable, RemoveAndCopy) {
    ASSERT_TRUE(table().addMaterial(named(u"Wood", u"ID-W")));
    EXPECT_FALSE(table().removeMaterial(u"Stone"));
    MaterialPtr copy = table().getMaterialCopy(u"WOOD");
    ASSERT_TRUE(copy);
    EXPECT_EQ(copy->name, u"Wood1");
    EXPECT_TRUE(copy->uuid.empty());
    EXPECT_FALSE(table().getMaterialCopy(u"Stone"));

    EXPECT_TRUE(table().removeMaterial(u"wood"));
    EXPECT_TRUE(table().getMaterials().empty());
    EXPECT_TRUE(table().getUuids().empty());

    // An entry without a UUID entry is removed all the same: a version 2
    // record with one MaterialMulti (no sub-materials, base record "Solo")
    // and an empty UUID map.
    const RecordBytes bytes = RecordBytes()
                                  .version(2)
                                  .u32(1)
                                  .i32(kMaterialMulti)
                                  .version(2).u32(0).version(2).str("Solo").str("")
                                  .u32(0);
    QuickArchive ar = bytes.archive();
    ASSERT_TRUE(table().load(ar));
    ASSERT_TRUE(table().getUuids().empty());
    EXPECT_TRUE(table().removeMaterial(u"Solo"));
    EXPECT_TRUE(table().getMaterials().empty());
}

TEST_F(SceneTable, DumpListsNamesThenUuids) {
    ASSERT_TRUE(table().addMaterial(named(u"b", u"U2")));
    ASSERT_TRUE(table().addMaterial(named(u"A", u"U1")));
    std::u16string out;
    table().dump(out);
    EXPECT_EQ(out, u"A\nb\nBeginning UUIDs\nU1 A\nU2 b\n");
}

TEST_F(SceneTable, RoundTripOfTheCurrentRecord) {
    ASSERT_TRUE(table().addMaterial(named(u"Wood", u"ID-W")));
    ASSERT_TRUE(table().addMaterial(named(u"Stone")));
    QuickArchive ar;
    ASSERT_TRUE(table().save(ar));
    const SceneMaterials::UuidMap uuids = table().getUuids();

    SceneMaterials copy;
    ASSERT_TRUE(copy.load(ar));
    ASSERT_EQ(copy.getMaterials().size(), 2u);
    EXPECT_TRUE(copy.getMaterial(u"Wood")->isEqual(table().getMaterial(u"Wood")));
    EXPECT_EQ(copy.getMaterial(u"Wood")->uuid, u"ID-W");
    EXPECT_EQ(copy.getUuids(), uuids);
}

TEST_F(SceneTable, VersionOneRecordGoesThroughAdd) {
    // Table version 1: count, then per material its tag and record; no UUID
    // map. Each material here is a MaterialMulti record, version 2: no
    // sub-materials, base record version 2 (name, uuid).
    const RecordBytes bytes = RecordBytes()
                                  .version(1)
                                  .u32(2)
                                  .i32(kMaterialMulti)
                                  .version(2).u32(0).version(2).str("Wood").str("ID-W")
                                  .i32(kMaterialMulti)
                                  .version(2).u32(0).version(2).str("Stone").str("");
    SceneMaterials t;
    QuickArchive ar = bytes.archive();
    ASSERT_TRUE(t.load(ar));
    EXPECT_EQ(t.getMaterials().size(), 2u);
    EXPECT_EQ(t.getUuid(u"Wood"), u"ID-W");
    EXPECT_EQ(t.getUuid(u"Stone").size(), 36u);

    // A name that addMaterial refuses ends the load; what came before stays.
    const RecordBytes twice = RecordBytes()
                                  .version(1)
                                  .u32(2)
                                  .i32(kMaterialMulti)
                                  .version(2).u32(0).version(2).str("Wood").str("")
                                  .i32(kMaterialMulti)
                                  .version(2).u32(0).version(2).str("WOOD").str("");
    QuickArchive ar2 = twice.archive();
    EXPECT_FALSE(t.load(ar2));
    EXPECT_EQ(t.getMaterials().size(), 1u);
}

TEST_F(SceneTable, VersionTwoRecordInsertsAsItStands) {
    // Version 2 takes names and pairs without any test: an empty name and a
    // UUID of a name that isn't there are kept.
    const RecordBytes bytes = RecordBytes()
                                  .version(2)
                                  .u32(1)
                                  .i32(kMaterialMulti)
                                  .version(2).u32(0).version(2).str("").str("")
                                  .u32(2)
                                  .str("U1").str("Ghost")
                                  .str("U2").str("Other");
    SceneMaterials t;
    QuickArchive ar = bytes.archive();
    ASSERT_TRUE(t.load(ar));
    ASSERT_EQ(t.getMaterials().size(), 1u);
    // The empty stored name became a unique default name.
    EXPECT_EQ(t.getMaterials().begin()->first, u"DefaultMaterial");
    EXPECT_EQ(t.getUuids().size(), 2u);
    EXPECT_FALSE(t.getMaterialByUuid(u"U1"));
}

TEST_F(SceneTable, BadRecordsFail) {
    ASSERT_TRUE(table().addMaterial(named(u"Wood")));
    struct Case {
        const char* what;
        RecordBytes bytes;
    };
    const Case cases[] = {
        {"low half set", RecordBytes().u32(0x20001).u32(0).u32(0)},
        {"version 3", RecordBytes().version(3).u32(0).u32(0)},
        {"empty data", RecordBytes()},
        {"material tag 15", RecordBytes().version(2).u32(1).i32(15)},
        {"count past the data", RecordBytes().version(2).u32(0x7FFFFFFF)},
        {"truncated material", RecordBytes().version(2).u32(1).i32(kMaterialMulti).version(2)},
    };
    for (const Case& c : cases) {
        SceneMaterials t;
        QuickArchive ar = c.bytes.archive();
        EXPECT_FALSE(t.load(ar)) << c.what;
    }
}

}  // namespace
