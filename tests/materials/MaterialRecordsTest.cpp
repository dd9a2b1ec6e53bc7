// Records of the material base and of the layered, single and multi materials,
// and the scene table: naming rules, the table operations with their UUID
// housekeeping, both versions of the table's record, and damaged data.
#include "materials/MaterialTestUtil.h"

using namespace mattest;

namespace {

typedef TableTest MaterialRecords;
typedef TableTest SceneTable;
typedef MaterialLayeredBRDF Layered;

MaterialPtr named(const std::u16string& name, const std::u16string& uuid = u"") {
    MaterialPtr m(new Layered);
    m->name = name, m->uuid = uuid;
    return m;
}

// A Diffuse_BRDF with its tag, version 4: colour `grey`, no textures, base
// record version 4 named `name`, use_color_tex_alpha_as_transparency.
RecordBytes& diffuseLayer(RecordBytes& b, const std::string& name, float grey) {
    return b.i32(kDiffuseBrdf).version(4).color(grey, grey, grey).color(0, 0, 0).f32(1).f32(1).b8(false).b8(false)
        .version(4).str(name).b8(true).b8(false).b8(false).b8(false);
}

// The names of a table, then its pairs of UUID and name.
std::string state(const SceneMaterials& t) {
    std::u16string out;
    t.dump(out);
    return wideToUtf8(out);
}

TEST_F(MaterialRecords, BaseRecordNames) {
    const std::tuple<int, std::string, std::u16string> cases[] = {
        {2, "Wood", u"Wood"},
        {2, "Wo\nod\x7f\t", u"Wood"},  // control characters removed
        {2, "A\xc2\x85" "B", u"AB"},   // C1 controls too
        {2, "", u"DefaultMaterial"},  // an empty name takes the default
        {2, "\r\n", u""},             // one of controls only stays empty
        {1, "Old", u"Old"},           // version 1: name only
    };
    for (const auto& c : cases) {
        // MaterialMulti version 2: count 0, then the base record.
        RecordBytes bytes;
        bytes.version(2).u32(0).version(std::get<0>(c)).str(std::get<1>(c));
        if (std::get<0>(c) == 2) bytes.str("UU-1");
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
    QuickArchive ar = RecordBytes().version(2).u32(0).u32(0x20001).str("X").str("").archive();
    EXPECT_FALSE(m.load(ar));
    EXPECT_EQ(m.name, u"AB");
}

TEST_F(MaterialRecords, LayeredVersions) {
    for (int version = 1; version <= 4; ++version) {
        RecordBytes bytes;
        diffuseLayer(diffuseLayer(bytes.version(version).u32(2), "Base", 0.25f), "Top", 0.75f);
        bytes.i32(2).i32(7);                    // double_sided, layered_value_a
        if (version >= 3) bytes.i32(8).i32(9);  // layered_value_b, layered_value_c
        if (version == 1) bytes.str("Wall\n");  // inline name
        else bytes.base("Wall\n", "U");         // base record
        if (version >= 4) bytes.i32(10);        // layered_value_d
        const boost::shared_ptr<Layered> m = loaded<Layered>(bytes);
        ASSERT_EQ(m->brdfs.size(), 2u) << version;
        EXPECT_EQ(m->brdfs[0]->name, u"Base");
        EXPECT_EQ(boost::dynamic_pointer_cast<Diffuse_BRDF>(m->brdfs[1])->color.r, 0.75f);
        const bool v3 = version >= 3;
        EXPECT_EQ(std::make_tuple(m->double_sided, m->layered_value_a, m->layered_value_b, m->layered_value_c, m->layered_value_d),
                  std::make_tuple(2, 7, v3 ? 8 : 1, v3 ? 9 : 1, version >= 4 ? 10 : 0)) << version;
        // Only the base record removes control characters.
        EXPECT_EQ(std::make_tuple(m->name, m->uuid), version == 1 ? std::make_tuple(u"Wall\n", u"") : std::make_tuple(u"Wall", u"U"));
    }
}

TEST_F(MaterialRecords, LayeredLoadStartsFromDefaults) {
    Layered m;
    m.brdfs.push_back(createBrdf(kGlassBrdf));
    m.layered_value_b = 42, m.uuid = u"old";
    // Version 2: no layers, double_sided, layered_value_a, base record version 1 (name only).
    QuickArchive ar = RecordBytes().version(2).u32(0).i32(0).i32(0).version(1).str("N").archive();
    ASSERT_TRUE(m.load(ar));
    EXPECT_TRUE(m.brdfs.empty());
    EXPECT_EQ(m.layered_value_b, 1);
    EXPECT_EQ(m.uuid, u"");
    // Even a refused tag leaves the list empty.
    m.brdfs.push_back(createBrdf(kGlassBrdf));
    QuickArchive bad = RecordBytes().version(5).archive();
    EXPECT_FALSE(m.load(bad));
    EXPECT_TRUE(m.brdfs.empty());
    // Version 4 reads layered_value_d behind a base record of a refused version.
    QuickArchive d = RecordBytes().version(4).u32(0).i32(1).i32(0).i32(1).i32(1).version(3).i32(5).archive();
    EXPECT_FALSE(m.load(d));
    EXPECT_EQ(m.layered_value_d, 5);
}

TEST_F(MaterialRecords, LayeredRoundTripAndCopies) {
    Layered m;
    m.name = u"Wall", m.uuid = u"U-1";
    m.double_sided = 2, m.layered_value_a = 3, m.layered_value_b = 4, m.layered_value_c = 5, m.layered_value_d = 6;
    m.brdfs = {BrdfPtr(new Diffuse_BRDF), createBrdf(kMirrorBrdf)};
    const boost::shared_ptr<Layered> back = roundTrip(m);
    const MaterialPtr original = m.clone();
    EXPECT_TRUE(back->isEqual(original));
    EXPECT_EQ(std::make_tuple(back->name, back->uuid), std::make_tuple(u"Wall", u"U-1"));
    // clone keeps the name, duplicate takes a unique one; neither keeps the
    // uuid, and both clone the layers.
    table().addMaterial(original);
    const MaterialPtr dup = m.duplicate();
    EXPECT_EQ(std::make_tuple(original->name, dup->name), std::make_tuple(u"Wall", u"Wall1"));
    EXPECT_TRUE(original->uuid.empty() && dup->uuid.empty());
    EXPECT_NE(static_cast<const Layered&>(*dup).brdfs[0], m.brdfs[0]);
    EXPECT_TRUE(dup->isEqual(original));
    // Each integer and each layer takes part in the comparison; the name doesn't.
    for (std::int32_t Layered::*f :
         {&Layered::double_sided, &Layered::layered_value_a, &Layered::layered_value_b, &Layered::layered_value_c, &Layered::layered_value_d}) {
        auto other = boost::static_pointer_cast<Layered>(m.clone());
        (*other).*f += 1;
        EXPECT_FALSE(other->isEqual(original));
    }
    auto other = boost::static_pointer_cast<Layered>(m.clone());
    other->name = u"Other";
    EXPECT_TRUE(other->isEqual(original));
    static_cast<Diffuse_BRDF&>(*other->brdfs[0]).color.b = 0.4f;
    EXPECT_FALSE(other->isEqual(original));
    other->brdfs.pop_back();
    EXPECT_FALSE(other->isEqual(original));
    EXPECT_FALSE(original->isEqual(MaterialPtr()) || original->isEqual(MaterialPtr(new MaterialMulti)));
}

TEST_F(MaterialRecords, SingleAndMultiVersions) {
    // Single version 1: single_value_a, single_value_b, inline name, layer tag and record.
    RecordBytes v1, v2;
    const boost::shared_ptr<MaterialSingleBRDF> a = loaded<MaterialSingleBRDF>(diffuseLayer(v1.version(1).i32(3).i32(4).str(""), "Only", 0.5f));
    EXPECT_EQ(std::make_tuple(a->single_value_a, a->single_value_b, a->name), std::make_tuple(3, 4, u"DefaultMaterial"));
    ASSERT_TRUE(a->brdf);
    EXPECT_EQ(a->brdf->name, u"Only");
    // Single version 2 (current): the two values, layer tag and record, base record.
    diffuseLayer(v2.version(2).i32(5).i32(6), "Only", 0.5f).base("Single", "S-1");
    const boost::shared_ptr<MaterialSingleBRDF> b = loaded<MaterialSingleBRDF>(v2);
    EXPECT_EQ(std::make_tuple(b->single_value_b, b->name, b->uuid), std::make_tuple(6, u"Single", u"S-1"));
    QuickArchive ar;
    ASSERT_TRUE(b->save(ar));
    EXPECT_EQ(savedBytes(ar), v2.bytes());
    // Copies share the layer; without a layer there is nothing to save.
    const MaterialPtr copy = b->clone();
    EXPECT_EQ(static_cast<MaterialSingleBRDF&>(*copy).brdf, b->brdf);
    EXPECT_TRUE(copy->isEqual(b));
    EXPECT_FALSE(MaterialSingleBRDF().save(ar));

    // Multi version 1: count, per sub-material tag and record, then the inline name.
    const RecordBytes multi = RecordBytes().version(1).u32(1).multi("Inner").str("Outer\t");
    MaterialMulti m;
    QuickArchive first = multi.archive(), again = multi.archive();
    ASSERT_TRUE(m.load(first));
    ASSERT_EQ(m.materials.size(), 1u);
    EXPECT_EQ(std::make_tuple(m.materials[0]->name, m.name), std::make_tuple(u"Inner", u"Outer\t"));
    ASSERT_TRUE(m.load(again));
    EXPECT_EQ(m.materials.size(), 2u);  // a second load appends to the list
    // Copies share the sub-materials.
    const MaterialPtr dup = m.duplicate();
    EXPECT_EQ(static_cast<MaterialMulti&>(*dup).materials[0], m.materials[0]);
    EXPECT_TRUE(dup->isEqual(m.clone()));
}

TEST_F(MaterialRecords, BadAndTruncatedRecordsFail) {
    RecordBytes good;
    diffuseLayer(good.version(4).u32(1), "Base", 0.5f).i32(1).i32(0).i32(1).i32(1).base("Wall").i32(0);
    ASSERT_TRUE(loaded<Layered>(good));
    // Every cut up to the base record's tag fails: what lies behind the end of
    // the data reads as zeros, and the base record's tag then has no valid
    // version. (Behind that tag zeros pass as an empty name.)
    for (std::size_t cut = 0; cut <= good.size() - 20; ++cut) {
        Layered m;
        QuickArchive ar = good.archive(cut);
        EXPECT_FALSE(m.load(ar)) << "cut at " << cut;
    }
    const std::pair<std::uint32_t, RecordBytes> cases[] = {
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(1).i32(3)},      // layer tag 3
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(1).i32(0)},      // layer tag 0
        {kMaterialLayeredBRDF, RecordBytes().u32(0x40001)},                  // low half set
        {kMaterialLayeredBRDF, RecordBytes().u32(0)},                        // version 0
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(0xFFFFFFFF)},    // huge layer count
        {kMaterialSingleBRDF, RecordBytes().version(2).i32(0).i32(0).i32(64)},  // layer tag 64
        {kMaterialMulti, RecordBytes().version(2).u32(1).i32(15)},           // material tag 15
        {kMaterialMulti, RecordBytes().version(3)},
    };
    for (const auto& c : cases) {
        QuickArchive ar = c.second.archive();
        EXPECT_FALSE(createMaterial(c.first)->load(ar)) << &c - cases;
    }
    // 300 MaterialMulti records, each the only sub-material of the one before:
    // deeper than any real file, and refused instead of overflowing.
    RecordBytes deep;
    for (int i = 0; i < 300; ++i) deep.version(2).u32(1).i32(kMaterialMulti);
    loaded<MaterialMulti>(deep, false);
    // The factory knows tags 0 to 14 only.
    for (std::uint32_t tag = 0; tag < kMaterialTagCount; ++tag) EXPECT_EQ(createMaterial(tag)->getType(), tag);
    EXPECT_FALSE(createMaterial(kMaterialTagCount) || createMaterial(0xFFFFFFFFu));
}

TEST_F(SceneTable, UniqueNames) {
    const std::tuple<std::vector<std::u16string>, std::u16string, std::u16string> cases[] = {
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
    std::u16string message = u"stale";
    EXPECT_TRUE(table().isNameValid(u"Stone", message));
    EXPECT_EQ(message, u"");
    EXPECT_FALSE(table().isNameValid(u"defaultMATERIAL", message));
    EXPECT_EQ(message, u"The name, \"defaultMATERIAL\", is already in use");
    EXPECT_FALSE(table().isNameValid(u"", message));
    EXPECT_EQ(message, u"A name must have at least one character");
    EXPECT_TRUE(table().isNameUnused(u"Stone") && !table().isNameUnused(u"defaultmaterial"));
}

TEST_F(SceneTable, AddReplaceCopyRemove) {
    EXPECT_FALSE(table().addMaterial(MaterialPtr()) || table().addMaterial(named(u"")));
    ASSERT_TRUE(table().addMaterial(named(u"wood", u"ID-W")));
    EXPECT_FALSE(table().addMaterial(named(u"WOOD", u"ID-2")));  // one key per name, ignoring case
    ASSERT_TRUE(table().addMaterial(named(u"Stone", u"ID-S")));
    EXPECT_EQ(state(table()), "Stone\nwood\nBeginning UUIDs\nID-S Stone\nID-W wood\n");
    EXPECT_EQ(table().getMaterialByUuid(u"id-w"), table().getMaterial(u"WOOD"));
    EXPECT_FALSE(table().getMaterialByUuid(u"nothing"));
    // Replace moves the entry and its UUID: the new name must be free (a change
    // of case alone is), the old one present.
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
    EXPECT_TRUE(glass->uuid.empty());
    EXPECT_EQ(table().getUuid(u"glass").size(), 36u);
    EXPECT_EQ(table().getMaterialByUuid(table().getUuid(u"glass")), glass);
    // An entry without a UUID entry is removed all the same: a version 2 record
    // with one material and an empty UUID map.
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
    // Version 1: count, then per material its tag and record; no UUID map. The
    // materials go through addMaterial: one without a uuid gets one, and a name
    // it refuses ends the load, what came before staying.
    QuickArchive v1 = RecordBytes().version(1).u32(2).multi("Wood", "ID-W").multi("Stone").archive();
    ASSERT_TRUE(t.load(v1));
    EXPECT_EQ(t.getUuid(u"Wood"), u"ID-W");
    EXPECT_EQ(t.getUuid(u"Stone").size(), 36u);
    QuickArchive twice = RecordBytes().version(1).u32(2).multi("Wood").multi("WOOD").archive();
    EXPECT_FALSE(t.load(twice));
    EXPECT_EQ(t.getMaterials().size(), 1u);
    // Version 2 takes names and pairs without any test: an empty name (which
    // became a unique default name) and a UUID of a name that isn't there are kept.
    QuickArchive v2 = RecordBytes().version(2).u32(1).multi("").u32(2).str("U1").str("Ghost").str("U2").str("Other").archive();
    ASSERT_TRUE(t.load(v2));
    EXPECT_EQ(state(t), "DefaultMaterial\nBeginning UUIDs\nU1 Ghost\nU2 Other\n");
    EXPECT_FALSE(t.getMaterialByUuid(u"U1"));
    // Bad records fail.
    const RecordBytes bad[] = {
        RecordBytes().u32(0x20001).u32(0).u32(0),                        // low half set
        RecordBytes().version(3).u32(0).u32(0),                          // version 3
        RecordBytes(),                                                   // empty data
        RecordBytes().version(2).u32(1).i32(15),                         // material tag 15
        RecordBytes().version(2).u32(0x7FFFFFFF),                        // count past the data
        RecordBytes().version(2).u32(1).i32(kMaterialMulti).version(2),  // truncated material
    };
    for (const RecordBytes& b : bad) {
        SceneMaterials fresh;
        QuickArchive in = b.archive();
        EXPECT_FALSE(fresh.load(in)) << &b - bad;
    }
}

}  // namespace
