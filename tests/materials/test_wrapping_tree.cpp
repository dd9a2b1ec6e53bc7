// Walks over a material's tree: children, the parent of a child, usable
// materials and the bitmap files of a whole tree.
#include <gtest/gtest.h>

#include <algorithm>

#include "materials/MaterialTree.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "test_wrapping_util.h"

using namespace OrvaneLumoCore;
using namespace wraptest;

namespace {

class MaterialTreeWalks : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

TexturePtr bitmap(const std::u16string& path) { return makeBitmapTextureFromPath(path); }

template <class W>
boost::shared_ptr<W> wrap(const MaterialPtr& base) {
    boost::shared_ptr<W> w(new W);
    w->base_mtl = base;
    return w;
}

TEST_F(MaterialTreeWalks, FindParentFollowsFirstChildren) {
    const MaterialPtr leaf = layered(u"Leaf");
    const MaterialPtr other = layered(u"Other");

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
    // The second child of an angle blend isn't searched.
    EXPECT_FALSE(findParentMaterial(other, root));
    // The same object, not an equal one.
    EXPECT_FALSE(findParentMaterial(leaf->clone(), root));
    EXPECT_FALSE(findParentMaterial(leaf, MaterialPtr()));
    EXPECT_FALSE(findParentMaterial(MaterialPtr(), root));
    EXPECT_FALSE(findParentMaterial(root, root));

    // Two-sided materials and references end the search.
    boost::shared_ptr<Material2Sided> two(new Material2Sided);
    two->front = leaf;
    EXPECT_FALSE(findParentMaterial(leaf, two));
    EXPECT_FALSE(findParentMaterial(leaf, wrap<MaterialBump>(two)));
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->target = leaf;
    EXPECT_FALSE(findParentMaterial(leaf, ref));
    // An empty first child of an angle blend isn't skipped over.
    boost::shared_ptr<MaterialAngleBlend> gap(new MaterialAngleBlend);
    gap->mtl_two = leaf;
    EXPECT_FALSE(findParentMaterial(leaf, gap));
}

TEST_F(MaterialTreeWalks, UsableMaterials) {
    EXPECT_FALSE(isUsableMaterial(MaterialPtr()));
    EXPECT_TRUE(isUsableMaterial(layered(u"L")));
    EXPECT_TRUE(isUsableMaterial(MaterialPtr(new MaterialMulti)));
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    EXPECT_FALSE(isUsableMaterial(ref));
    ref->target_uuid = u"x";
    EXPECT_TRUE(isUsableMaterial(ref));
}

TEST_F(MaterialTreeWalks, BitmapFilesOfEveryClass) {
    // A layered material whose layers hold bitmaps, directly and below
    // other textures.
    boost::shared_ptr<MaterialLayeredBRDF> layers = layered(u"Layers");
    boost::shared_ptr<Glass_BRDF> glass(new Glass_BRDF);
    glass->color_tex = bitmap(u"glass_color.png");
    glass->ior_tex = bitmap(u"glass_ior.png");
    layers->brdfs.push_back(glass);
    boost::shared_ptr<Phong_BRDF> phong(new Phong_BRDF);
    boost::shared_ptr<FresnelTexture> fresnel(new FresnelTexture);
    fresnel->refract_ior_tex = bitmap(u"fresnel.png");
    phong->transparency_tex = fresnel;
    layers->brdfs.push_back(phong);
    boost::shared_ptr<Light_BRDF> light(new Light_BRDF);
    boost::shared_ptr<BlendTexture> blend(new BlendTexture);
    boost::shared_ptr<InvertTexture> invert(new InvertTexture);
    invert->texture = bitmap(u"inverted.png");
    blend->color_b = invert;
    light->color_tex = blend;
    layers->brdfs.push_back(light);
    static_cast<Diffuse_BRDF&>(*layers->brdfs[0]).transparency_tex = bitmap(u"diffuse.png");

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

    // Each texture here holds at most one bitmap, so the order is that of
    // the walk through the materials: a wrapper's base before its own
    // textures, except for the bump, whose texture comes first.
    std::vector<std::u16string> files = {u"already.png"};
    EXPECT_EQ(collectBitmapFiles(top, files), 14u);
    EXPECT_EQ(files, (std::vector<std::u16string>{
                         u"already.png",
                         u"bump.png",
                         u"diffuse.png", u"glass_color.png", u"glass_ior.png", u"fresnel.png", u"inverted.png",
                         u"toon_opacity.png", u"toon_distort.png",
                         u"alpha.png",
                         u"displace.png",
                         u"gi.png", u"refract.png",
                         u"linked.png",
                     }));

    // A reference is followed through the scene table only.
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->target_uuid = u"t-1";
    ref->target = bump;
    std::vector<std::u16string> none;
    EXPECT_EQ(collectBitmapFiles(ref, none), 0u);
    boost::shared_ptr<MaterialBump> inTable = wrap<MaterialBump>(layered(u"T"));
    inTable->name = u"InTable";
    inTable->uuid = u"T-1";
    inTable->bump_tex = bitmap(u"table.png");
    ASSERT_TRUE(SceneMaterials::instance()->addMaterial(inTable));
    std::vector<std::u16string> fromTable;
    EXPECT_EQ(collectBitmapFiles(ref, fromTable), 1u);
    EXPECT_EQ(fromTable, std::vector<std::u16string>{u"table.png"});

    // Single, multi and instance hold nothing that is visited.
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(bump);
    std::vector<std::u16string> empty;
    EXPECT_EQ(collectBitmapFiles(multi, empty), 0u);
    EXPECT_EQ(collectBitmapFiles(MaterialPtr(new MaterialInstance(bump)), empty), 0u);
    EXPECT_EQ(collectBitmapFiles(MaterialPtr(), empty), 0u);
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
