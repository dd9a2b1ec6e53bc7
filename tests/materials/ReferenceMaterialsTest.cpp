// Reference, instance and linked materials, the scene table's operations on
// references and the default material, and the walks over a material's tree.
#include <algorithm>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTree.h"
#include "materials/ReferenceMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "materials/MaterialTestUtil.h"
#include "textures/ProceduralTextures.h"

using namespace mattest;

namespace {

typedef TableTest ReferenceMaterials;
typedef TableTest MaterialTreeWalks;

boost::shared_ptr<MaterialReference> referenceTo(const std::u16string& uuid, const std::u16string& name = u"Ref") {
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->name = name;
    ref->target_uuid = uuid;
    return ref;
}

template <class W>
boost::shared_ptr<W> wrap(const MaterialPtr& base, const std::u16string& name = u"W") {
    boost::shared_ptr<W> w(new W);
    w->name = name;
    w->base_mtl = base;
    return w;
}

// ---- MaterialReference ------------------------------------------------------------------

TEST_F(ReferenceMaterials, ReferenceVersions) {
    // Version 1: base record, target_uuid; no embedded copy.
    RecordBytes v1, v2;
    boost::shared_ptr<MaterialReference> ref = loaded<MaterialReference>(v1.version(1).base("Ref", "own").str("target"));
    EXPECT_EQ(ref->name, u"Ref");
    EXPECT_EQ(ref->uuid, u"own");
    EXPECT_EQ(ref->target_uuid, u"target");
    EXPECT_FALSE(ref->target);
    // Version 2: as 1, then the embedded copy as an optional member.
    ref = loaded<MaterialReference>(v2.version(2).base("Ref2").str("t").multiMember("Copy"));
    EXPECT_EQ(ref->name, u"Ref2");
    ASSERT_TRUE(ref->target);
    EXPECT_EQ(ref->target->name, u"Copy");
    // A refused base record, a copy whose tag has no class, refused tags.
    loaded<MaterialReference>(RecordBytes().version(2).version(3).str("X").str("").str("t").b8(false), false);
    loaded<MaterialReference>(RecordBytes().version(2).base("R").str("t").b8(true).u32(99), false);
    for (std::uint32_t tag : {0u, 0x30000u, 0x20001u})
        loaded<MaterialReference>(RecordBytes().u32(tag).base("R").str("t").b8(false), false);
}

TEST_F(ReferenceMaterials, SaveEmbedsTheTablesMaterialAndDropsTheOldCopy) {
    boost::shared_ptr<MaterialReference> ref = referenceTo(u"WOOD-1");
    ref->target = layered(u"Stale");
    // Not in the table: saved without a copy, and the old copy is gone.
    boost::shared_ptr<MaterialReference> back = roundTrip(*ref);
    EXPECT_FALSE(ref->target);
    EXPECT_FALSE(back->target);
    EXPECT_EQ(back->target_uuid, u"WOOD-1");
    boost::shared_ptr<MaterialLayeredBRDF> wood = layered(u"Wood", u"Grain");
    wood->uuid = u"wood-1";
    ASSERT_TRUE(table().addMaterial(wood));
    back = roundTrip(*ref);
    EXPECT_EQ(ref->target, wood);
    ASSERT_TRUE(back->target);
    EXPECT_EQ(back->target->name, u"Wood");
    EXPECT_TRUE(back->target->isEqual(wood));
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

TEST_F(ReferenceMaterials, ATableCycleEnds) {
    // A table material that holds a reference to itself.
    boost::shared_ptr<MaterialBump> loop = wrap<MaterialBump>(referenceTo(u"loop-uuid"), u"Loop");
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

// ---- MaterialInstance, MaterialLinked --------------------------------------------------------

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
    QuickArchive ar;
    ASSERT_TRUE(inst->save(ar));
    EXPECT_EQ(savedBytes(ar), RecordBytes().version(1).base("Wood", "u").bytes());
    EXPECT_FALSE(loaded<MaterialInstance>(RecordBytes().version(1).base("Wood", "u"))->instance_of);
    for (std::uint32_t tag : {0x10001u, 0x20000u, 0u}) loaded<MaterialInstance>(RecordBytes().u32(tag).base("W"), false);
}

TEST_F(ReferenceMaterials, LinkedRecordsOfEveryIdKind) {
    const std::tuple<std::int32_t, std::u16string, std::int32_t> cases[] = {
        {0, u"obj-0", 0}, {1, u"", 0}, {1, u"Node", 0}, {2, u"", 42}};
    for (const auto& c : cases) {
        const std::int32_t kind = std::get<0>(c);
        // Version 1: the id record (version 1: kind, then text or number), the
        // material's tag and record, the base record.
        RecordBytes b;
        b.version(1).version(1).u32(static_cast<std::uint32_t>(kind));
        if (kind == 2) b.i32(std::get<2>(c));
        else b.str(wideToUtf8(std::get<1>(c)));
        const boost::shared_ptr<MaterialLinked> linked = loaded<MaterialLinked>(b.multi("Inside").base("Linked"));
        EXPECT_EQ(linked->id.kind, kind);
        EXPECT_EQ(linked->id.getText(), std::get<1>(c));
        EXPECT_EQ(linked->id.getNumber(), kind == 2 ? std::get<2>(c) : -1);
        EXPECT_EQ(linked->linked_material->name, u"Inside");
        EXPECT_EQ(linked->name, u"Linked");
        const boost::shared_ptr<MaterialLinked> again = roundTrip(*linked);
        EXPECT_TRUE(again->isEqual(linked));
        EXPECT_EQ(again->id.text, std::get<1>(c));
    }
}

TEST_F(ReferenceMaterials, LinkedFailures) {
    // No material: save fails and writes nothing.
    QuickArchive ar(1);
    EXPECT_FALSE(MaterialLinked().save(ar));
    EXPECT_EQ(ar.getWritePosition(), 0u);
    // An invalid id kind fails save and load.
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
    boost::shared_ptr<MaterialLinked> linked(new MaterialLinked);
    linked->name = u"Linked";
    linked->linked_material = layered(u"Inner");
    linked->id.kind = 0;
    linked->id.text = u"Node";
    table().addMaterial(layered(u"Linked"));
    table().addMaterial(layered(u"Inner"));
    const MaterialPtr dup = linked->duplicate(), cl = linked->clone();
    MaterialLinked& c = static_cast<MaterialLinked&>(*cl);
    EXPECT_NE(dup->name, u"Linked");
    EXPECT_EQ(c.name, u"Linked");
    EXPECT_NE(static_cast<const MaterialLinked&>(*dup).linked_material->name, u"Inner");
    EXPECT_EQ(c.linked_material->name, u"Inner");
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

// ---- the scene table ----------------------------------------------------------------------

TEST_F(ReferenceMaterials, CreateReferenceAndDefaultMaterial) {
    boost::shared_ptr<MaterialLayeredBRDF> wood = layered(u"Wood");
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
    EXPECT_TRUE(m->isEqual(layered(u"Any", u"Diffuse")));
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
RecordBytes tableWithDuplicates() {
    RecordBytes b;
    // MaterialLayeredBRDF version 4: no layers, four integers, base record, one integer.
    b.version(2).u32(3).u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1).base("Wood").i32(0);
    // MaterialBump version 3: mult, no texture, the reference (version 2, no copy), base record.
    b.u32(kMaterialBump).version(3).f32(1).b8(false).u32(kMaterialReference).version(2).base("Ref").str("A-1").b8(false);
    b.base("Wrap").u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1).base("Other").i32(0);
    b.u32(6).str("a-1").str("Wood").str("b-2").str("wood").str("c-3").str("Wrap");
    return b.str("x-1").str("Ghost").str("y-2").str("Ghost").str("z-9").str("Other");
}

TEST_F(ReferenceMaterials, FindReferencesLooksInsideEveryMaterial) {
    QuickArchive ar = tableWithDuplicates().archive();
    ASSERT_TRUE(table().load(ar));
    ASSERT_EQ(table().findReferences(u"a-1").size(), 1u);
    EXPECT_TRUE(table().findReferences(u"b-2").empty());
    // A reference at the top, one in a two-sided back, and one inside an
    // embedded copy, which isn't entered.
    boost::shared_ptr<MaterialReference> top = referenceTo(u"A-1", u"Top");
    top->target = referenceTo(u"a-1", u"InCopy");
    table().addMaterial(top);
    boost::shared_ptr<Material2Sided> two(new Material2Sided);
    two->name = u"Two";
    two->back = referenceTo(u"a-1", u"Back");
    table().addMaterial(two);
    std::vector<std::u16string> names;
    for (const auto& r : table().findReferences(u"A-1")) names.push_back(r->name);
    EXPECT_EQ(names, (std::vector<std::u16string>{u"Top", u"Back", u"Ref"}));  // key order: Top, Two, Wrap
}

TEST_F(ReferenceMaterials, MergeDuplicateUuidsKeepsTheLastAndMovesTheReferences) {
    QuickArchive ar = tableWithDuplicates().archive();
    ASSERT_TRUE(table().load(ar));
    ASSERT_EQ(table().getUuids().size(), 6u);
    table().mergeDuplicateUuids();
    const SceneMaterials::UuidMap& uuids = table().getUuids();
    EXPECT_EQ(uuids.count(u"a-1"), 0u);
    // A name without a material is left alone.
    for (const char16_t* kept : {u"b-2", u"c-3", u"z-9", u"x-1", u"y-2"}) EXPECT_EQ(uuids.count(kept), 1u);
    const MaterialBump& wrap = static_cast<const MaterialBump&>(*table().getMaterial(u"Wrap"));
    const MaterialReference& ref = static_cast<const MaterialReference&>(*wrap.base_mtl);
    EXPECT_EQ(ref.target_uuid, u"b-2");
    EXPECT_EQ(ref.target, table().getMaterial(u"Wood"));
}

// ---- tree walks ------------------------------------------------------------------------------

TEST_F(MaterialTreeWalks, FindParentFollowsFirstChildren) {
    const MaterialPtr leaf = layered(u"Leaf"), other = layered(u"Other");
    // Every single-child wrapper and the angle blend's first child.
    boost::shared_ptr<MaterialLinked> linked(new MaterialLinked);
    linked->linked_material = leaf;
    boost::shared_ptr<MaterialAngleBlend> blend(new MaterialAngleBlend);
    blend->mtl_one = linked;
    blend->mtl_two = other;
    const MaterialPtr root = wrap<MaterialBump>(wrap<MaterialOverrideEnvironment>(wrap<MaterialDisplaced>(
        wrap<MaterialObjectExclusion>(wrap<MaterialAlphaContribution>(wrap<MaterialToon>(blend))))));
    EXPECT_EQ(findParentMaterial(leaf, root), linked);
    EXPECT_EQ(findParentMaterial(linked, root), blend);
    EXPECT_EQ(findParentMaterial(blend, root)->getType(), kMaterialToon);
    EXPECT_EQ(findParentMaterial(childMaterials(*root)[0], root), root);
    EXPECT_FALSE(findParentMaterial(other, root));  // the second child of an angle blend isn't searched
    EXPECT_FALSE(findParentMaterial(leaf->clone(), root));  // the same object, not an equal one
    EXPECT_FALSE(findParentMaterial(leaf, MaterialPtr()));
    EXPECT_FALSE(findParentMaterial(MaterialPtr(), root));
    EXPECT_FALSE(findParentMaterial(root, root));
    // Two-sided materials and references end the search.
    boost::shared_ptr<Material2Sided> two(new Material2Sided);
    two->front = leaf;
    EXPECT_FALSE(findParentMaterial(leaf, two));
    EXPECT_FALSE(findParentMaterial(leaf, wrap<MaterialBump>(two)));
    boost::shared_ptr<MaterialReference> ref = referenceTo(u"x");
    ref->target = leaf;
    EXPECT_FALSE(findParentMaterial(leaf, ref));
    // An empty first child of an angle blend isn't skipped over.
    boost::shared_ptr<MaterialAngleBlend> gap(new MaterialAngleBlend);
    gap->mtl_two = leaf;
    EXPECT_FALSE(findParentMaterial(leaf, gap));
    // Usable: anything but an empty pointer or a reference without a target UUID.
    EXPECT_FALSE(isUsableMaterial(MaterialPtr()));
    EXPECT_TRUE(isUsableMaterial(MaterialPtr(new MaterialMulti)));
    EXPECT_FALSE(isUsableMaterial(referenceTo(u"")));
    EXPECT_TRUE(isUsableMaterial(ref));
}

TEST_F(MaterialTreeWalks, BitmapFilesOfEveryClass) {
    // A layered material whose layers hold bitmaps, directly and below other textures.
    boost::shared_ptr<MaterialLayeredBRDF> layers = layered(u"Layers");
    static_cast<Diffuse_BRDF&>(*layers->brdfs[0]).transparency_tex = bitmap(u"diffuse.png");
    boost::shared_ptr<Glass_BRDF> glass(new Glass_BRDF);
    glass->color_tex = bitmap(u"glass_color.png");
    glass->ior_tex = bitmap(u"glass_ior.png");
    boost::shared_ptr<Phong_BRDF> phong(new Phong_BRDF);
    static_cast<FresnelTexture&>(*phong->transparency_tex).refract_ior_tex = bitmap(u"fresnel.png");
    boost::shared_ptr<Light_BRDF> light(new Light_BRDF);
    boost::shared_ptr<BlendTexture> blend(new BlendTexture);
    boost::shared_ptr<InvertTexture> invert(new InvertTexture);
    invert->texture = bitmap(u"inverted.png");
    blend->color_b = invert;
    light->color_tex = blend;
    layers->brdfs.insert(layers->brdfs.end(), {glass, phong, light});

    boost::shared_ptr<MaterialToon> toon = wrap<MaterialToon>(layers);
    toon->distortTex = bitmap(u"toon_distort.png");
    toon->opacityTex = bitmap(u"toon_opacity.png");
    boost::shared_ptr<MaterialAlphaContribution> alpha = wrap<MaterialAlphaContribution>(toon);
    alpha->alpha_tex = bitmap(u"alpha.png");
    boost::shared_ptr<MaterialDisplaced> displaced = wrap<MaterialDisplaced>(alpha);
    displaced->displace_tex = bitmap(u"displace.png");
    boost::shared_ptr<MaterialOverrideEnvironment> env =
        wrap<MaterialOverrideEnvironment>(wrap<MaterialObjectExclusion>(displaced));
    env->gi_tex = bitmap(u"gi.png");
    env->refract_tex = bitmap(u"refract.png");
    boost::shared_ptr<MaterialBump> bump = wrap<MaterialBump>(env);
    bump->bump_tex = bitmap(u"bump.png");
    // The textures of a two-sided material aren't visited, its children are.
    boost::shared_ptr<Material2Sided> two(new Material2Sided);
    two->translucency_tex = bitmap(u"not_visited.png");
    two->front = bump;
    boost::shared_ptr<MaterialLinked> linked(new MaterialLinked);
    linked->linked_material = wrap<MaterialBump>(layered(u"Plain"));
    static_cast<MaterialBump&>(*linked->linked_material).bump_tex = bitmap(u"linked.png");
    two->back = linked;
    boost::shared_ptr<MaterialAngleBlend> top(new MaterialAngleBlend);
    top->mtl_one = two;

    // Each texture here holds at most one bitmap, so the order is that of the
    // walk through the materials: a wrapper's base before its own textures,
    // except for the bump, whose texture comes first.
    std::vector<std::u16string> files = {u"already.png"};
    EXPECT_EQ(collectBitmapFiles(top, files), 14u);
    EXPECT_EQ(files, (std::vector<std::u16string>{
                         u"already.png", u"bump.png", u"diffuse.png", u"glass_color.png", u"glass_ior.png",
                         u"fresnel.png", u"inverted.png", u"toon_opacity.png", u"toon_distort.png", u"alpha.png",
                         u"displace.png", u"gi.png", u"refract.png", u"linked.png"}));

    // A reference is followed through the scene table only.
    boost::shared_ptr<MaterialReference> ref = referenceTo(u"t-1");
    ref->target = bump;
    std::vector<std::u16string> none, fromTable;
    EXPECT_EQ(collectBitmapFiles(ref, none), 0u);
    boost::shared_ptr<MaterialBump> inTable = wrap<MaterialBump>(layered(u"T"), u"InTable");
    inTable->uuid = u"T-1";
    inTable->bump_tex = bitmap(u"table.png");
    ASSERT_TRUE(table().addMaterial(inTable));
    EXPECT_EQ(collectBitmapFiles(ref, fromTable), 1u);
    EXPECT_EQ(fromTable, std::vector<std::u16string>{u"table.png"});
    // Single, multi and instance hold nothing that is visited.
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(bump);
    EXPECT_EQ(collectBitmapFiles(multi, none), 0u);
    EXPECT_EQ(collectBitmapFiles(MaterialPtr(new MaterialInstance(bump)), none), 0u);
    EXPECT_EQ(collectBitmapFiles(MaterialPtr(), none), 0u);
}

TEST_F(MaterialTreeWalks, BitmapFilesBelowProceduralTextures) {
    boost::shared_ptr<GridTexture> grid(new GridTexture);
    grid->line_color = bitmap(u"grid_line.png");
    grid->fill_color = bitmap(u"grid_fill.png");
    boost::shared_ptr<RampTexture> ramp(new RampTexture);
    ramp->colors = bitmap(u"ramp.png");
    boost::shared_ptr<NoiseTexture> noise(new NoiseTexture);
    noise->color2_tex = ramp;
    boost::shared_ptr<CheckerTexture> checker(new CheckerTexture);
    checker->white_color = grid;
    checker->black_color = noise;
    boost::shared_ptr<MaterialLayeredBRDF> m = layered(u"M");
    static_cast<Diffuse_BRDF&>(*m->brdfs[0]).color_tex = checker;
    std::vector<std::u16string> files;
    EXPECT_EQ(collectBitmapFiles(m, files), 3u);
    std::sort(files.begin(), files.end());
    EXPECT_EQ(files, (std::vector<std::u16string>{u"grid_fill.png", u"grid_line.png", u"ramp.png"}));
}

}  // namespace
