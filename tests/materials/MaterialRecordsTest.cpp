// Records of the material base and of the layered, single and multi
// materials: every version, the name rules, and damaged data.
#include <gtest/gtest.h>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/RecordBytes.h"
#include "materials/SceneMaterials.h"

using namespace OrvaneLumoCore;
using testbytes::RecordBytes;

namespace {

class MaterialRecords : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

template <class T>
boost::shared_ptr<T> loaded(const RecordBytes& bytes, bool expectOk = true) {
    boost::shared_ptr<T> m(new T);
    QuickArchive ar = bytes.archive();
    EXPECT_EQ(m->load(ar), expectOk);
    return m;
}

// ---- base record --------------------------------------------------------------

TEST_F(MaterialRecords, BaseRecordNames) {
    struct Case {
        const char* what;
        int version;
        std::string storedName;
        std::u16string expectedName;
    };
    const Case cases[] = {
        {"plain", 2, "Wood", u"Wood"},
        {"control characters removed", 2, "Wo\nod\x7f\t", u"Wood"},
        {"C1 control removed", 2, "A\xc2\x85" "B", u"AB"},
        {"empty becomes the default name", 2, "", u"DefaultMaterial"},
        {"only controls stay empty", 2, "\r\n", u""},
        {"version 1", 1, "Old", u"Old"},
    };
    for (const Case& c : cases) {
        // MaterialMulti version 2: count 0, then the base record.
        RecordBytes bytes;
        bytes.version(2).u32(0).version(c.version).str(c.storedName);
        if (c.version == 2) bytes.str("UU-1");
        MaterialMulti m;
        m.uuid = u"kept";
        QuickArchive ar = bytes.archive();
        ASSERT_TRUE(m.load(ar)) << c.what;
        EXPECT_EQ(m.name, c.expectedName) << c.what;
        EXPECT_EQ(m.uuid, c.version == 2 ? u"UU-1" : u"kept") << c.what;
    }
}

TEST_F(MaterialRecords, BaseRecordRefusedTagStillCleansTheName) {
    MaterialMulti m;
    m.name = u"A\tB";
    const RecordBytes bytes = RecordBytes().version(2).u32(0).u32(0x20001).str("X").str("");
    QuickArchive ar = bytes.archive();
    EXPECT_FALSE(m.load(ar));
    EXPECT_EQ(m.name, u"AB");
}

TEST_F(MaterialRecords, BaseRecordRoundTrip) {
    MaterialMulti m;
    m.name = u"Stein \u00e9";
    m.uuid = u"1234";
    QuickArchive ar;
    ASSERT_TRUE(m.save(ar));
    // MaterialMulti version 2: count 0, base record version 2.
    const RecordBytes expected =
        RecordBytes().version(2).u32(0).version(2).str("Stein \xc3\xa9").str("1234");
    EXPECT_EQ(testbytes::savedBytes(ar), expected.bytes());
}

// ---- MaterialLayeredBRDF ---------------------------------------------------------

// A Diffuse_BRDF record, version 4, named `name`, with colour `grey`.
RecordBytes& diffuseLayer(RecordBytes& b, const std::string& name, float grey) {
    return b.i32(kDiffuseBrdf)
        .version(4)
        .color(grey, grey, grey)
        .color(0, 0, 0)
        .f32(1)
        .f32(1)
        .b8(false)
        .b8(false)
        .version(4).str(name).b8(true).b8(false).b8(false)
        .b8(false);
}

TEST_F(MaterialRecords, LayeredVersions) {
    for (int version = 1; version <= 4; ++version) {
        RecordBytes bytes;
        bytes.version(version).u32(2);
        diffuseLayer(bytes, "Base", 0.25f);
        diffuseLayer(bytes, "Top", 0.75f);
        bytes.i32(2).i32(7);                         // double_sided, layered_value_a
        if (version >= 3) bytes.i32(8).i32(9);       // layered_value_b, layered_value_c
        if (version == 1) bytes.str("Wall\n");       // inline name
        else bytes.version(2).str("Wall\n").str("U");  // base record
        if (version >= 4) bytes.i32(10);             // layered_value_d

        boost::shared_ptr<MaterialLayeredBRDF> m = loaded<MaterialLayeredBRDF>(bytes);
        ASSERT_EQ(m->brdfs.size(), 2u) << version;
        EXPECT_EQ(m->brdfs[0]->name, u"Base");
        EXPECT_EQ(m->brdfs[1]->name, u"Top");
        EXPECT_EQ(boost::dynamic_pointer_cast<Diffuse_BRDF>(m->brdfs[1])->color.r, 0.75f);
        EXPECT_EQ(m->double_sided, 2);
        EXPECT_EQ(m->layered_value_a, 7);
        EXPECT_EQ(m->layered_value_b, version >= 3 ? 8 : 1) << version;
        EXPECT_EQ(m->layered_value_c, version >= 3 ? 9 : 1) << version;
        EXPECT_EQ(m->layered_value_d, version >= 4 ? 10 : 0) << version;
        // Only the base record removes control characters.
        EXPECT_EQ(m->name, version == 1 ? u"Wall\n" : u"Wall") << version;
        EXPECT_EQ(m->uuid, version == 1 ? u"" : u"U") << version;
    }
}

TEST_F(MaterialRecords, LayeredLoadStartsFromDefaults) {
    MaterialLayeredBRDF m;
    m.brdfs.push_back(createBrdf(kGlassBrdf));
    m.layered_value_b = 42;
    m.uuid = u"old";
    // Version 2: no layers, double_sided and layered_value_a, base record
    // version 1 (name only).
    const RecordBytes bytes = RecordBytes().version(2).u32(0).i32(0).i32(0).version(1).str("N");
    QuickArchive ar = bytes.archive();
    ASSERT_TRUE(m.load(ar));
    EXPECT_TRUE(m.brdfs.empty());
    EXPECT_EQ(m.layered_value_b, 1);
    EXPECT_EQ(m.uuid, u"");

    // Even a refused tag leaves the list empty.
    m.brdfs.push_back(createBrdf(kGlassBrdf));
    QuickArchive bad = RecordBytes().version(5).archive();
    EXPECT_FALSE(m.load(bad));
    EXPECT_TRUE(m.brdfs.empty());
}

TEST_F(MaterialRecords, LayeredVersionFourReadsValueDBehindAFailedBase) {
    // Layer count 0, four integers, a base record with a refused version,
    // then layered_value_d.
    const RecordBytes bytes =
        RecordBytes().version(4).u32(0).i32(1).i32(0).i32(1).i32(1).version(3).i32(5);
    MaterialLayeredBRDF m;
    QuickArchive ar = bytes.archive();
    EXPECT_FALSE(m.load(ar));
    EXPECT_EQ(m.layered_value_d, 5);
}

TEST_F(MaterialRecords, LayeredRoundTripAndCopies) {
    MaterialLayeredBRDF m;
    m.name = u"Wall";
    m.uuid = u"U-1";
    m.double_sided = 2;
    m.layered_value_a = 3;
    m.layered_value_b = 4;
    m.layered_value_c = 5;
    m.layered_value_d = 6;
    boost::shared_ptr<Diffuse_BRDF> base(new Diffuse_BRDF);
    base->name = u"Base";
    base->color = Color(0.1f, 0.2f, 0.3f);
    m.brdfs.push_back(base);
    m.brdfs.push_back(createBrdf(kMirrorBrdf));

    QuickArchive ar;
    ASSERT_TRUE(m.save(ar));
    MaterialPtr back = createMaterial(kMaterialLayeredBRDF);
    ASSERT_TRUE(back->load(ar));
    const MaterialPtr original = m.clone();
    EXPECT_TRUE(back->isEqual(original));
    EXPECT_EQ(back->name, u"Wall");
    EXPECT_EQ(back->uuid, u"U-1");

    // clone keeps the name, duplicate takes a unique one; neither keeps the
    // uuid, and both clone the layers.
    SceneMaterials::instance()->addMaterial(original);
    const MaterialPtr dup = m.duplicate();
    EXPECT_EQ(original->name, u"Wall");
    EXPECT_EQ(dup->name, u"Wall1");
    EXPECT_TRUE(original->uuid.empty());
    EXPECT_TRUE(dup->uuid.empty());
    const MaterialLayeredBRDF& d = static_cast<const MaterialLayeredBRDF&>(*dup);
    EXPECT_NE(d.brdfs[0], m.brdfs[0]);
    EXPECT_TRUE(d.brdfs[0]->isEqual(m.brdfs[0]));

    // Each integer and each layer takes part in the comparison.
    boost::shared_ptr<MaterialLayeredBRDF> other =
        boost::static_pointer_cast<MaterialLayeredBRDF>(m.clone());
    other->layered_value_d = 7;
    EXPECT_FALSE(other->isEqual(original));
    other = boost::static_pointer_cast<MaterialLayeredBRDF>(m.clone());
    boost::static_pointer_cast<Diffuse_BRDF>(other->brdfs[0])->color.b = 0.4f;
    EXPECT_FALSE(other->isEqual(original));
    other->brdfs.pop_back();
    EXPECT_FALSE(other->isEqual(original));
    EXPECT_FALSE(original->isEqual(MaterialPtr()));
    EXPECT_FALSE(original->isEqual(MaterialPtr(new MaterialMulti)));
}

// ---- MaterialSingleBRDF -------------------------------------------------------------

TEST_F(MaterialRecords, SingleVersions) {
    // Version 1: single_value_a, single_value_b, inline name, layer tag and
    // record.
    RecordBytes v1;
    v1.version(1).i32(3).i32(4).str("");
    diffuseLayer(v1, "Only", 0.5f);
    boost::shared_ptr<MaterialSingleBRDF> a = loaded<MaterialSingleBRDF>(v1);
    EXPECT_EQ(a->single_value_a, 3);
    EXPECT_EQ(a->single_value_b, 4);
    EXPECT_EQ(a->name, u"DefaultMaterial");
    ASSERT_TRUE(a->brdf);
    EXPECT_EQ(a->brdf->name, u"Only");

    // Version 2: the two values, layer tag and record, base record.
    RecordBytes v2;
    v2.version(2).i32(5).i32(6);
    diffuseLayer(v2, "Only", 0.5f);
    v2.version(2).str("Single").str("S-1");
    boost::shared_ptr<MaterialSingleBRDF> b = loaded<MaterialSingleBRDF>(v2);
    EXPECT_EQ(b->single_value_b, 6);
    EXPECT_EQ(b->name, u"Single");
    EXPECT_EQ(b->uuid, u"S-1");

    QuickArchive ar;
    ASSERT_TRUE(b->save(ar));
    EXPECT_EQ(testbytes::savedBytes(ar), v2.bytes());

    // Copies share the layer.
    const MaterialPtr copy = b->clone();
    EXPECT_EQ(static_cast<MaterialSingleBRDF&>(*copy).brdf, b->brdf);
    EXPECT_TRUE(copy->isEqual(b));
    MaterialSingleBRDF empty;
    QuickArchive none;
    EXPECT_FALSE(empty.save(none));
}

// ---- MaterialMulti ---------------------------------------------------------------------

TEST_F(MaterialRecords, MultiVersionsAndAppend) {
    // Version 1: count, per sub-material tag and record (here a
    // MaterialMulti version 2 without children), then the inline name.
    const RecordBytes v1 = RecordBytes()
                               .version(1)
                               .u32(1)
                               .i32(kMaterialMulti)
                               .version(2).u32(0).version(2).str("Inner").str("")
                               .str("Outer\t");
    MaterialMulti m;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(m.load(ar));
    ASSERT_EQ(m.materials.size(), 1u);
    EXPECT_EQ(m.materials[0]->name, u"Inner");
    EXPECT_EQ(m.name, u"Outer\t");

    // A second load appends to the list.
    QuickArchive again = v1.archive();
    ASSERT_TRUE(m.load(again));
    EXPECT_EQ(m.materials.size(), 2u);

    const MaterialPtr dup = m.duplicate();
    EXPECT_EQ(static_cast<MaterialMulti&>(*dup).materials[0], m.materials[0]);
    EXPECT_TRUE(dup->isEqual(m.clone()));
}

// ---- damaged data ------------------------------------------------------------------------

TEST_F(MaterialRecords, BadAndTruncatedRecordsFail) {
    RecordBytes good;
    good.version(4).u32(1);
    diffuseLayer(good, "Base", 0.5f);
    good.i32(1).i32(0).i32(1).i32(1).version(2).str("Wall").str("").i32(0);
    ASSERT_TRUE(loaded<MaterialLayeredBRDF>(good));

    // Every cut up to the base record's tag fails: what lies behind the end
    // of the data reads as zeros, and the tag of the base record then has
    // no valid version. (Behind that tag zeros pass as an empty name.)
    const std::size_t baseTag = good.size() - 20;
    for (std::size_t cut = 0; cut <= baseTag; ++cut) {
        MaterialLayeredBRDF m;
        QuickArchive ar = good.archive(cut);
        EXPECT_FALSE(m.load(ar)) << "cut at " << cut;
    }

    struct Case {
        const char* what;
        RecordBytes bytes;
    };
    const Case cases[] = {
        {"layer tag 3", RecordBytes().version(4).u32(1).i32(3)},
        {"layer tag 0", RecordBytes().version(4).u32(1).i32(0)},
        {"low half set", RecordBytes().u32(0x40001)},
        {"version 0", RecordBytes().u32(0)},
        {"huge layer count", RecordBytes().version(4).u32(0xFFFFFFFF)},
    };
    for (const Case& c : cases) {
        MaterialLayeredBRDF m;
        QuickArchive ar = c.bytes.archive();
        EXPECT_FALSE(m.load(ar)) << c.what;
    }

    MaterialSingleBRDF single;
    QuickArchive s = RecordBytes().version(2).i32(0).i32(0).i32(64).archive();
    EXPECT_FALSE(single.load(s));
    MaterialMulti multi;
    QuickArchive mm = RecordBytes().version(2).u32(1).i32(15).archive();
    EXPECT_FALSE(multi.load(mm));
    QuickArchive m3 = RecordBytes().version(3).archive();
    EXPECT_FALSE(multi.load(m3));
}

TEST_F(MaterialRecords, DeepNestingFailsInsteadOfOverflowing) {
    // 300 MaterialMulti records, each the only sub-material of the one
    // before: deeper than any real file.
    RecordBytes bytes;
    for (int i = 0; i < 300; ++i) bytes.version(2).u32(1).i32(kMaterialMulti);
    MaterialMulti m;
    QuickArchive ar = bytes.archive();
    EXPECT_FALSE(m.load(ar));
}

TEST_F(MaterialRecords, FactoryTags) {
    EXPECT_EQ(createMaterial(0)->getType(), kMaterialSingleBRDF);
    EXPECT_EQ(createMaterial(1)->getPluginName(), u"MtlORVANE");
    EXPECT_EQ(createMaterial(2)->getPluginName(), u"MtlMulti");
    EXPECT_EQ(createMaterial(0)->getPluginName(), u"MtlSingleBRDF");
    EXPECT_EQ(createMaterial(1)->getAssetType(), u"material");
    EXPECT_FALSE(createMaterial(15));
    EXPECT_FALSE(createMaterial(0xFFFFFFFFu));
}

}  // namespace
