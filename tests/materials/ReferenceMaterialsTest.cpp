// Reference, instance and linked materials, the scene table's operations on
// references and the default material, and the walks over a material's tree.
#include <algorithm>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTestUtil.h"
#include "materials/MaterialTree.h"
#include "textures/ProceduralTextures.h"

using namespace mattest;

namespace {

typedef TableTest ReferenceMaterials;
typedef TableTest MaterialTreeWalks;

TEST_F(ReferenceMaterials, ReferenceVersions) {
    // Version 1: base record, target_uuid; no embedded copy.
    RecordBytes v1, v2;
    auto ref = loaded<MaterialReference>(v1.version(1).base("Ref", "own").str("target"));
    EXPECT_EQ(std::make_tuple(ref->name, ref->uuid, ref->target_uuid), std::make_tuple(u"Ref", u"own", u"target"));
    EXPECT_FALSE(ref->target);
    // Version 2: as 1, then the embedded copy as an optional member.
    ref = loaded<MaterialReference>(v2.version(2).base("Ref2").str("t").multiMember("Copy"));
    ASSERT_TRUE(ref->target);
    EXPECT_EQ(std::make_tuple(ref->name, ref->target->name), std::make_tuple(u"Ref2", u"Copy"));
    // A refused base record, a copy whose tag has no class, refused tags.
    loaded<MaterialReference>(RecordBytes().version(2).version(3).str("X").str("").str("t").b8(false), false);
    loaded<MaterialReference>(RecordBytes().version(2).base("R").str("t").b8(true).u32(99), false);
    for (std::uint32_t tag : {0u, 0x30000u, 0x20001u}) loaded<MaterialReference>(RecordBytes().u32(tag).base("R").str("t").b8(false), false);
}

TEST_F(ReferenceMaterials, SaveEmbedsTheTablesMaterialAndDropsTheOldCopy) {
    auto ref = referenceTo(u"WOOD-1", u"Ref", layered(u"Stale"));
    // Not in the table: saved without a copy, and the old copy is gone.
    auto back = roundTrip(*ref);
    EXPECT_FALSE(ref->target || back->target);
    EXPECT_EQ(back->target_uuid, u"WOOD-1");
    auto wood = layered(u"Wood", u"Grain");
    wood->uuid = u"wood-1";
    ASSERT_TRUE(table().addMaterial(wood));
    back = roundTrip(*ref);
    EXPECT_EQ(ref->target, wood);
    ASSERT_TRUE(back->target);
    EXPECT_EQ(back->target->name, u"Wood");
    EXPECT_TRUE(back->target->isEqual(wood));
}

TEST_F(ReferenceMaterials, ReferenceCopiesAndComparisons) {
    auto ref = referenceTo(u"abc", u"Ref", layered(u"Copy"));
    ref->uuid = u"own";
    table().addMaterial(layered(u"Ref"));  // the name is taken: copies keep it all the same
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

TEST_F(ReferenceMaterials, ATableCycleEnds) {
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
}

TEST_F(ReferenceMaterials, InstanceIsAnAliasThatIsNeverEqual) {
    auto wood = layered(u"Wood");
    boost::shared_ptr<MaterialInstance> inst(new MaterialInstance(wood));
    EXPECT_EQ(std::make_tuple(inst->name, inst->instance_of), std::make_tuple(u"Wood", MaterialPtr(wood)));
    EXPECT_FALSE(inst->isEqual(inst));
    MaterialInstance other;
    other = layered(u"Stone");
    EXPECT_EQ(other.name, u"Stone");
    const MaterialPtr dup = inst->duplicate();
    EXPECT_EQ(std::make_tuple(dup->name, static_cast<const MaterialInstance&>(*dup).instance_of), std::make_tuple(u"Wood", MaterialPtr(wood)));
    // The record is the base record alone.
    inst->uuid = u"u";
    QuickArchive ar;
    ASSERT_TRUE(inst->save(ar));
    EXPECT_EQ(savedBytes(ar), RecordBytes().version(1).base("Wood", "u").bytes());
    EXPECT_FALSE(loaded<MaterialInstance>(RecordBytes().version(1).base("Wood", "u"))->instance_of);
    for (std::uint32_t tag : {0x10001u, 0x20000u, 0u}) loaded<MaterialInstance>(RecordBytes().u32(tag).base("W"), false);
}

TEST_F(ReferenceMaterials, LinkedRecordsOfEveryIdKind) {
    const std::tuple<std::int32_t, std::u16string, std::int32_t> cases[] = {{0, u"obj-0", 0}, {1, u"", 0}, {1, u"Node", 0}, {2, u"", 42}};
    for (const auto& c : cases) {
        const std::int32_t kind = std::get<0>(c);
        // Version 1: the id record (version 1: kind, then text or number), the
        // material's tag and record, the base record.
        RecordBytes b;
        b.version(1).version(1).u32(static_cast<std::uint32_t>(kind));
        if (kind == 2) b.i32(std::get<2>(c));
        else b.str(wideToUtf8(std::get<1>(c)));
        const auto linked = loaded<MaterialLinked>(b.multi("Inside").base("Linked"));
        EXPECT_EQ(std::make_tuple(linked->id.kind, linked->id.getText(), linked->id.getNumber()),
                  std::make_tuple(kind, std::get<1>(c), kind == 2 ? std::get<2>(c) : -1));
        EXPECT_EQ(std::make_tuple(linked->linked_material->name, linked->name), std::make_tuple(u"Inside", u"Linked"));
        const auto again = roundTrip(*linked);
        EXPECT_TRUE(again->isEqual(linked));
        EXPECT_EQ(again->id.text, std::get<1>(c));
    }
    // No material: save fails and writes nothing. An invalid id kind fails save and load.
    QuickArchive ar(1);
    EXPECT_FALSE(MaterialLinked().save(ar));
    EXPECT_EQ(ar.getWritePosition(), 0u);
    MaterialLinked bad;
    bad.linked_material = layered(u"L");
    bad.id.kind = 3;
    EXPECT_FALSE(bad.save(ar));
    loaded<MaterialLinked>(RecordBytes().version(1).version(1).u32(3).i32(0).multi("Inside").base("L"), false);
    // A material tag without a class, a refused id tag, a refused tag.
    loaded<MaterialLinked>(RecordBytes().version(1).version(1).u32(2).i32(1).u32(15), false);
    loaded<MaterialLinked>(RecordBytes().version(1).version(2).u32(2).i32(1).multi("Inside"), false);
    loaded<MaterialLinked>(RecordBytes().version(2), false);
}

TEST_F(ReferenceMaterials, LinkedCopiesAndComparisons) {
    auto linked = boost::make_shared<MaterialLinked>();
    linked->name = u"Linked", linked->linked_material = layered(u"Inner"), linked->id.kind = 0, linked->id.text = u"Node";
    table().addMaterial(layered(u"Linked"));
    table().addMaterial(layered(u"Inner"));
    // duplicate takes new names for itself and its material; clone keeps them, copying the material.
    const MaterialPtr dup = linked->duplicate(), cl = linked->clone();
    MaterialLinked& c = static_cast<MaterialLinked&>(*cl);
    EXPECT_EQ(std::make_tuple(dup->name, static_cast<const MaterialLinked&>(*dup).linked_material->name),
              std::make_tuple(u"Linked1", u"Inner1"));
    EXPECT_EQ(std::make_tuple(c.name, c.linked_material->name, c.id.text), std::make_tuple(u"Linked", u"Inner", u"Node"));
    EXPECT_NE(c.linked_material, linked->linked_material);
    EXPECT_TRUE(dup->isEqual(linked));
    c.id.text = u"NODE";
    EXPECT_TRUE(c.isEqual(linked)) << "id texts compare without regard to case";
    c.id.kind = 1;
    EXPECT_FALSE(c.isEqual(linked));
    c.id.kind = 0;
    c.linked_material.reset();
    EXPECT_FALSE(c.isEqual(linked));
    MaterialLinked::IdData a, b;
    a.number = 5, b.number = 6;
    EXPECT_FALSE(a.isEqual(b));
    b.text = u"ignored for numbers", b.number = 5;
    EXPECT_TRUE(a.isEqual(b));
}

TEST_F(ReferenceMaterials, CreateReferenceAndDefaultMaterial) {
    auto wood = layered(u"Wood");
    wood->uuid = u"wood-uuid";
    table().addMaterial(wood);
    EXPECT_EQ(table().createReference(u"WOOD")->target_uuid, u"wood-uuid");
    EXPECT_EQ(table().createReference(u"Nothing")->target_uuid, u"");

    table().clear();
    EXPECT_FALSE(table().getDefaultMaterial());
    table().ensureDefaultMaterial();
    const MaterialPtr m = table().getDefaultMaterial();
    ASSERT_TRUE(m);
    EXPECT_EQ(m->name, u"Default_Lumo_Material");
    EXPECT_TRUE(m->isEqual(layered(u"Any")));
    EXPECT_EQ(static_cast<const MaterialLayeredBRDF&>(*m).brdfs[0]->name, u"Diffuse");
    EXPECT_FALSE(table().getUuid(u"Default_Lumo_Material").empty());
    // A second call is refused by the table without a word.
    table().ensureDefaultMaterial();
    EXPECT_EQ(table().getDefaultMaterial(), m);
    EXPECT_EQ(table().getMaterials().size(), 1u);
    // Each call takes a fresh copy: a cleared table gets a new object.
    table().clear();
    table().ensureDefaultMaterial();
    EXPECT_NE(table().getDefaultMaterial(), m);
}

// A version 2 table record: the layered material Wood, the bump Wrap over a
// reference to "A-1", the layered material Other; then six UUID pairs, two of
// them for Wood, two for the missing Ghost.
QuickArchive tableWithDuplicates() {
    RecordBytes b;
    // MaterialLayeredBRDF version 4: no layers, four integers, base record, one integer.
    b.version(2).u32(3).u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1).base("Wood").i32(0);
    // MaterialBump version 3: mult, no texture, the reference (version 2, no copy), base record.
    b.u32(kMaterialBump).version(3).f32(1).b8(false).u32(kMaterialReference).version(2).base("Ref").str("A-1").b8(false);
    b.base("Wrap").u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1).base("Other").i32(0);
    b.u32(6).str("a-1").str("Wood").str("b-2").str("wood").str("c-3").str("Wrap");
    return b.str("x-1").str("Ghost").str("y-2").str("Ghost").str("z-9").str("Other").archive();
}

TEST_F(ReferenceMaterials, FindReferencesLooksInsideEveryMaterial) {
    QuickArchive ar = tableWithDuplicates();
    ASSERT_TRUE(table().load(ar));
    ASSERT_EQ(table().findReferences(u"a-1").size(), 1u);
    EXPECT_TRUE(table().findReferences(u"b-2").empty());
    // A reference at the top, one in a two-sided back, and one inside an
    // embedded copy, which isn't entered.
    table().addMaterial(referenceTo(u"A-1", u"Top", referenceTo(u"a-1", u"InCopy")));
    table().addMaterial(sided<Material2Sided>(u"Two", MaterialPtr(), referenceTo(u"a-1", u"Back")));
    std::vector<std::u16string> names;
    for (const auto& r : table().findReferences(u"A-1")) names.push_back(r->name);
    EXPECT_EQ(names, (std::vector<std::u16string>{u"Top", u"Back", u"Ref"}));  // key order: Top, Two, Wrap
}

TEST_F(ReferenceMaterials, MergeDuplicateUuidsKeepsTheLastAndMovesTheReferences) {
    QuickArchive ar = tableWithDuplicates();
    ASSERT_TRUE(table().load(ar));
    ASSERT_EQ(table().getUuids().size(), 6u);
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

TEST_F(MaterialTreeWalks, FindParentFollowsFirstChildren) {
    const MaterialPtr leaf = layered(u"Leaf");
    // Every single-child wrapper and the angle blend's first child.
    auto linked = boost::make_shared<MaterialLinked>();
    linked->linked_material = leaf;
    const MaterialPtr top = blend(u"B", linked, layered(u"Other"));
    const MaterialPtr root = wrap<MaterialBump>(wrap<MaterialOverrideEnvironment>(
        wrap<MaterialDisplaced>(wrap<MaterialObjectExclusion>(wrap<MaterialAlphaContribution>(wrap<MaterialToon>(top))))));
    EXPECT_EQ(findParentMaterial(leaf, root), linked);
    EXPECT_EQ(findParentMaterial(linked, root), top);
    EXPECT_EQ(findParentMaterial(top, root)->getType(), kMaterialToon);
    EXPECT_EQ(findParentMaterial(childMaterials(*root)[0], root), root);
    EXPECT_FALSE(findParentMaterial(childMaterials(*top)[1], root));  // the second child of an angle blend isn't searched
    EXPECT_FALSE(findParentMaterial(leaf->clone(), root));              // the same object, not an equal one
    EXPECT_FALSE(findParentMaterial(leaf, MaterialPtr()) || findParentMaterial(MaterialPtr(), root) || findParentMaterial(root, root));
    // Two-sided materials and references end the search; an empty first child
    // of an angle blend isn't skipped over.
    const MaterialPtr two = sided<Material2Sided>(u"T", leaf, MaterialPtr());
    EXPECT_FALSE(findParentMaterial(leaf, two) || findParentMaterial(leaf, wrap<MaterialBump>(two)));
    EXPECT_FALSE(findParentMaterial(leaf, referenceTo(u"x", u"Ref", leaf)));
    EXPECT_FALSE(findParentMaterial(leaf, blend(u"Gap", MaterialPtr(), leaf)));
    // Usable: anything but an empty pointer or a reference without a target UUID.
    EXPECT_FALSE(isUsableMaterial(MaterialPtr()) || isUsableMaterial(referenceTo(u"")));
    EXPECT_TRUE(isUsableMaterial(MaterialPtr(new MaterialMulti)) && isUsableMaterial(referenceTo(u"x")));
}

TEST_F(MaterialTreeWalks, BitmapFilesOfEveryClass) {
    // A layered material whose layers hold bitmaps, directly and below other
    // textures, procedural ones too.
    auto layers = layered(u"Layers");
    static_cast<Diffuse_BRDF&>(*layers->brdfs[0]).transparency_tex = bitmap(u"diffuse.png");
    auto glass = boost::make_shared<Glass_BRDF>();
    glass->color_tex = bitmap(u"glass_color.png"), glass->ior_tex = bitmap(u"glass_ior.png");
    auto phong = boost::make_shared<Phong_BRDF>();
    static_cast<FresnelTexture&>(*phong->transparency_tex).refract_ior_tex = bitmap(u"fresnel.png");
    auto invert = boost::make_shared<InvertTexture>();
    invert->texture = bitmap(u"inverted.png");
    auto mix = boost::make_shared<BlendTexture>();
    mix->color_b = invert;
    auto light = boost::make_shared<Light_BRDF>();
    light->color_tex = mix;
    auto grid = boost::make_shared<GridTexture>();
    grid->line_color = bitmap(u"grid_line.png"), grid->fill_color = bitmap(u"grid_fill.png");
    auto ramp = boost::make_shared<RampTexture>();
    ramp->colors = bitmap(u"ramp.png");
    auto noise = boost::make_shared<NoiseTexture>();
    noise->color2_tex = ramp;
    auto checker = boost::make_shared<CheckerTexture>();
    checker->white_color = grid, checker->black_color = noise;
    auto mirror = boost::make_shared<Mirror_BRDF>();
    mirror->color_tex = checker;
    layers->brdfs.insert(layers->brdfs.end(), {glass, phong, light, mirror});

    auto toon = wrap<MaterialToon>(layers);
    toon->distortTex = bitmap(u"toon_distort.png"), toon->opacityTex = bitmap(u"toon_opacity.png");
    auto alpha = wrap<MaterialAlphaContribution>(toon);
    alpha->alpha_tex = bitmap(u"alpha.png");
    auto displaced = wrap<MaterialDisplaced>(alpha);
    displaced->displace_tex = bitmap(u"displace.png");
    auto env = wrap<MaterialOverrideEnvironment>(wrap<MaterialObjectExclusion>(displaced));
    env->gi_tex = bitmap(u"gi.png"), env->refract_tex = bitmap(u"refract.png");
    auto bump = wrap<MaterialBump>(env);
    bump->bump_tex = bitmap(u"bump.png");
    // The textures of a two-sided material aren't visited, its children are.
    auto two = sided<Material2Sided>(u"Two", bump, boost::make_shared<MaterialLinked>());
    two->translucency_tex = bitmap(u"not_visited.png");
    auto linkedBump = wrap<MaterialBump>(layered(u"Plain"));
    linkedBump->bump_tex = bitmap(u"linked.png");
    static_cast<MaterialLinked&>(*two->back).linked_material = linkedBump;

    // The order is that of the walk through the materials: a wrapper's base
    // before its own textures, except for the bump, whose texture comes first.
    std::vector<std::u16string> files = {u"already.png"};
    EXPECT_EQ(collectBitmapFiles(blend(u"Top", two, MaterialPtr()), files), 17u);
    std::sort(files.begin() + 7, files.begin() + 10);  // the order inside the checker is not fixed
    EXPECT_EQ(files, (std::vector<std::u16string>{
                         u"already.png", u"bump.png", u"diffuse.png", u"glass_color.png", u"glass_ior.png",
                         u"fresnel.png", u"inverted.png", u"grid_fill.png", u"grid_line.png", u"ramp.png",
                         u"toon_opacity.png", u"toon_distort.png", u"alpha.png", u"displace.png", u"gi.png",
                         u"refract.png", u"linked.png"}));

    // A reference is followed through the scene table only.
    auto ref = referenceTo(u"t-1", u"Ref", bump);
    std::vector<std::u16string> none, fromTable;
    EXPECT_EQ(collectBitmapFiles(ref, none), 0u);
    auto inTable = wrap<MaterialBump>(layered(u"T"), u"InTable");
    inTable->uuid = u"T-1", inTable->bump_tex = bitmap(u"table.png");
    ASSERT_TRUE(table().addMaterial(inTable));
    EXPECT_EQ(collectBitmapFiles(ref, fromTable), 1u);
    EXPECT_EQ(fromTable, std::vector<std::u16string>{u"table.png"});
    // Single, multi and instance hold nothing that is visited.
    auto multi = boost::make_shared<MaterialMulti>();
    multi->materials.push_back(bump);
    EXPECT_EQ(collectBitmapFiles(multi, none) + collectBitmapFiles(MaterialPtr(new MaterialInstance(bump)), none), 0u);
    EXPECT_EQ(collectBitmapFiles(MaterialPtr(), none), 0u);
}

}  // namespace
