// The asset conversion against the golden documents under golden/, and the walks over a tree: the search for the
// layered material, parents, bitmap files.
#include <algorithm>

#include "materials/MaterialAssets.h"
#include "materials/MaterialTestUtil.h"
#include "materials/MaterialTree.h"
#include "materials/WrapperAssets.h"
#include "module/OrvMatFile.h"
#include "persistence/Record.h"
#include "support/TempFiles.h"
#include "textures/ProceduralTextures.h"

using namespace mattest;

namespace {

typedef TableTest Conversion;

std::string conversion(const MaterialPtr& m) { return wideToUtf8(materialToXml(m)); }

template <class L>
boost::shared_ptr<L> layer(const std::u16string& name) {
    boost::shared_ptr<L> l(new L);
    l->name = name;
    return l;
}

// The file driver's document of `materials`, saved to a file first.
std::string throughAFile(const std::vector<MaterialPtr>& materials, bool clearTable = false) {
    OrvMatFile file;
    file.materials = materials;
    const tempfiles::TempDir dir;
    const std::u16string path = utf8ToWide(dir.file("conversion_test.orvmat"));
    EXPECT_TRUE(file.save(path));
    if (clearTable) SceneMaterials::instance()->clear();
    return wideToUtf8(OrvMatFile().getXml(path));
}

// A library of four materials: the first holds all six layers, with textures in some slots and none in others; then a
// multi material, a layered material without layers whose name needs escapes, and a single material.
std::vector<MaterialPtr> goldenLibrary() {
    auto lib = boost::make_shared<MaterialLayeredBRDF>();
    lib->name = u"Lib", lib->uuid = u"never-in-xml", lib->double_sided = 2;
    auto glass = layer<Glass_BRDF>(u"Glass");
    glass->color_tex = acolor(0.5f, 0.25f, 1), glass->ior = 1.33f, glass->affect_shadows = 2;
    auto base = layer<Diffuse_BRDF>(u"Base");
    base->color = Color(0.8f, 0.6f, 0.4f), base->use_color_tex_alpha_as_transparency = true;
    auto invert = boost::make_shared<InvertTexture>();
    invert->texture = acolor(0, 0, 0), invert->invert_alpha = true;
    base->transparency_tex = invert;
    auto coat = layer<Blinn_BRDF>(u"Coat");  // default Fresnel texture; reflection outside [0, 1]
    coat->reflection = Color(0.25f, 1.5f, -0.5f);
    auto sheen = layer<Phong_BRDF>(u"Sheen");
    sheen->transparency_tex.reset(), sheen->color_tex = acolor(1, 0.5f, 0.25f, 0.5f), sheen->reflection = Color(0.2f, 0.2f, 0.2f);
    sheen->hilightGlossiness = 0.65f, sheen->anisotropy = 0.5f, sheen->back_side = 1, sheen->subdivs = 16;
    auto glow = layer<Light_BRDF>(u"Glow");
    glow->color = Color(1, 0.9f, 0.5f), glow->intensity = 2.5f, glow->doubleSided = 0;
    glow->transparency_tex = acolor(0.1f, 0.2f, 0.3f, 0.4f);
    lib->brdfs = {glass, base, coat, sheen, layer<Mirror_BRDF>(u"Chrome"), glow};

    auto group = boost::make_shared<MaterialMulti>();
    group->name = u"Group";
    group->materials.push_back(lib->clone());
    auto single = boost::make_shared<MaterialSingleBRDF>();
    single->name = u"Single", single->brdf = layer<Diffuse_BRDF>(u"Alone");
    auto empty = boost::make_shared<MaterialLayeredBRDF>();
    empty->name = u"Empty & <Odd>";
    return {lib, group, empty, single};
}

TEST_F(Conversion, DocumentsThroughTheFileDriver) {
    const std::vector<MaterialPtr> library = goldenLibrary();
    expectGolden("materials/golden/library.xml", throughAFile(library));
    // A layered material's own writeXml gives the layers and the main Asset with the same urls as the conversion,
    // from an empty url; MaterialMulti and MaterialSingleBRDF write nothing of their own.
    std::u16string converted;
    AssetXmlWriter convertedWriter(converted);
    writeLayeredAsset(convertedWriter, library[0]);
    EXPECT_EQ(xmlOf(*library[0]), wideToUtf8(converted));
    EXPECT_EQ(xmlOf(*library[1]) + xmlOf(*library[3]), "");

    // Wall: a bump over a two-sided material over two layered materials.
    auto sheet = sided<Material2Sided>(u"Sheet", layered(u"Front", u"Face"), layered(u"Back", u"Paint"));
    sheet->translucency = Color(0.1f, 0.2f, 0.3f);
    auto wall = wrap<MaterialBump>(sheet);
    wall->bump_tex = acolor(0.5f, 0.25f, 1), wall->bump_tex_mult = 0.5f;
    // Ref: a reference whose embedded copy, taken from the table at the save, is the layered material Stone; the
    // conversion sees an empty table.
    auto stone = layered(u"Stone", u"Grain");
    stone->uuid = u"5a1e0000-0000-4000-8000-000000000001";
    ASSERT_TRUE(table().addMaterial(stone));
    // Ink: a toon material over the layered material Paper.
    auto ink = wrap<MaterialToon>(layered(u"Paper", u"Fiber"), u"Ink");
    ink->lineColorTex = acolor(0, 0, 0), ink->lineColor = Color(0.2f, 0.4f, 0.6f), ink->lineWidth = 2;
    // Outer: an angle blend whose first child is another angle blend.
    auto outer = blend(u"Outer", blend(u"Inner", layered(u"Red", u"R"), layered(u"Blue", u"B")), layered(u"Green", u"G"));
    outer->start_angle = 30, outer->stop_angle = 120;
    expectGolden("materials/golden/wrapped_trees.xml", throughAFile({wall, referenceTo(stone->uuid), ink, outer}, true));
}

// Five folded wrappers over one layered material, bump outermost or innermost.
MaterialPtr allFiveWrappers(bool bumpOutermost) {
    auto displaced = boost::make_shared<MaterialDisplaced>();
    displaced->displace_tex = acolor(0.2f, 0, 0), displaced->displace_view_dependent = 0;
    auto env = boost::make_shared<MaterialOverrideEnvironment>();
    env->bg_tex = acolor(0.3f, 0, 0), env->refract_tex = acolor(0.4f, 0, 0), env->gi_tex_mult = 7, env->override_refract = true;
    auto exclusion = boost::make_shared<MaterialObjectExclusion>();
    exclusion->mode = 2, exclusion->objects = {u"Chair"};
    auto alpha = boost::make_shared<MaterialAlphaContribution>();
    alpha->alpha_tex = acolor(0.5f, 0, 0), alpha->alpha = 0.25f;
    auto bump = boost::make_shared<MaterialBump>();
    bump->bump_tex = acolor(0.1f, 0, 0), bump->bump_tex_mult = 0.5f;
    const MaterialPtr inner = layered(u"Inner", u"Coat");
    if (bumpOutermost) {
        bump->base_mtl = displaced, displaced->base_mtl = env, env->base_mtl = exclusion, exclusion->base_mtl = alpha;
        alpha->base_mtl = inner, bump->name = u"Top";
        return bump;
    }
    alpha->base_mtl = exclusion, exclusion->base_mtl = env, env->base_mtl = displaced, displaced->base_mtl = bump;
    bump->base_mtl = inner, alpha->name = u"Top";
    return alpha;
}

TEST_F(Conversion, TopLevelTrees) {
    // Folded wrappers: the textures first, then the layer, then one main Asset under the top's name with the
    // wrappers' parameters behind the layered material's, in the order bump, displaced, environment, exclusion,
    // alpha, whatever the order of the chain. No object list.
    std::string xml = conversion(allFiveWrappers(true));
    EXPECT_EQ(conversion(allFiveWrappers(false)), xml);
    // Only the first wrapper of a type counts.
    auto inner = wrap<MaterialBump>(layered(u"L"), u"InnerBump");
    inner->bump_tex_mult = 9, inner->bump_tex = acolor(1, 0, 0);
    auto outer = wrap<MaterialBump>(inner, u"Outer");
    outer->bump_tex_mult = 2;
    xml += conversion(outer);
    // Layers of one name share their url.
    auto same = layered(u"M", u"Same");
    same->brdfs.push_back(layer<Diffuse_BRDF>(u"Same"));
    xml += conversion(same);
    // Below a bump a two-sided material is flattened to its back where the front holds no layered material (see
    // wrapped_trees.xml for the front); a toon is passed through.
    auto multi = boost::make_shared<MaterialMulti>();
    multi->name = u"Multi";
    xml += conversion(wrap<MaterialBump>(sided<Material2Sided>(u"Two", multi, layered(u"B", u"Back"))));
    auto toon = wrap<MaterialToon>(layered(u"Paper"), u"Toon");
    toon->lineColorTex = acolor(1, 0, 0);
    xml += conversion(wrap<MaterialBump>(toon));
    // At the top, two-child classes write the flat Assets of their children, then their own Asset, whose layout names
    // the class. An absent child leaves its parameter out. A usable child without a layered material gets no Asset,
    // yet the parent refers to it by name; a child that resolves to a reference without a target UUID isn't usable:
    // no parameter, while its flat Asset is written from the inner copy.
    auto two = sided<Material2Sided>(u"Two", layered(u"F", u"FL"), layered(u"B", u"BL"));
    two->translucency = Color(0.25f, 0.5f, 0.75f), two->transparency = Color(1, 1, 1);
    two->translucency_tex = acolor(1, 1, 1), two->force_1sided = true;
    xml += conversion(two);
    xml += conversion(sided<MaterialSkp2Sided>(u"Skp", layered(u"F"), MaterialPtr()));
    const MaterialPtr unusable = referenceTo(u"outer", u"Ref", referenceTo(u"", u"Ref", layered(u"Copy")));
    xml += conversion(blend(u"Blend", multi, unusable));
    xml += conversion(blend(u"Blend", referenceTo(u"u-1", u"Ref", layered(u"Copy")), MaterialPtr()));
    // A reference at the top is searched through a further reference, under that one's name.
    xml += conversion(referenceTo(u"u-1", u"Ref", referenceTo(u"u-2", u"InnerRef", layered(u"Deep", u"Layer"))));
    // A toon at the top: its base through the flat conversion under its own name, the textures in slot order, then
    // the toon Asset without lineUnits. A base without a layered material is still referred to, an unusable one
    // isn't.
    toon = wrap<MaterialToon>(wrap<MaterialBump>(layered(u"Paper"), u"Bumped"), u"Ink");
    toon->opacityTex = acolor(0.5f, 0, 0), toon->lineWidthTex = acolor(0.25f, 0, 0), toon->divideByDist = true;
    xml += conversion(toon);
    xml += conversion(wrap<MaterialToon>(multi, u"Ink"));
    xml += conversion(wrap<MaterialToon>(unusable, u"Ink"));
    // Trees without a layered material give an empty Assets element.
    multi->materials.push_back(layered(u"Sub"));
    auto single = boost::make_shared<MaterialSingleBRDF>();
    single->brdf = layer<Diffuse_BRDF>(u"L");
    const MaterialPtr empties[] = {wrap<MaterialBump>(multi), single, multi, MaterialPtr(new MaterialInstance(layered(u"A"))),
                                   referenceTo(u"no-such-uuid"), MaterialPtr(), wrap<MaterialBump>(MaterialPtr()),
                                   wrap<MaterialToon>(MaterialPtr())};
    for (const MaterialPtr& m : empties) xml += conversion(m);
    expectGolden("materials/golden/top_level_trees.xml", xml);
}

// A tree with every wrapping class, each texture a bitmap:
//   Two, a two-sided material, with a texture of its own
//     front: Bump > Env > Ex > Disp > Al > Toon > Layers, a layered material
//            with every layer class, bitmaps directly and below other textures
//     back:  Skp, whose back is AB, an angle blend of Linked (over Bumped, a
//            bump over Plain) and Other
boost::shared_ptr<Material2Sided> everyWrapperTree() {
    auto layers = layered(u"Layers");
    static_cast<Diffuse_BRDF&>(*layers->brdfs[0]).transparency_tex = bitmap(u"diffuse.png");
    auto glass = layer<Glass_BRDF>(u"Glass");
    glass->color_tex = bitmap(u"glass_color.png"), glass->ior_tex = bitmap(u"glass_ior.png");
    auto phong = layer<Phong_BRDF>(u"Phong");
    static_cast<FresnelTexture&>(*phong->transparency_tex).refract_ior_tex = bitmap(u"fresnel.png");
    auto invert = boost::make_shared<InvertTexture>();
    invert->texture = bitmap(u"inverted.png");
    auto mix = boost::make_shared<BlendTexture>();
    mix->color_b = invert;
    auto light = layer<Light_BRDF>(u"Light");
    light->color_tex = mix;
    auto grid = boost::make_shared<GridTexture>();
    grid->line_color = bitmap(u"grid_line.png"), grid->fill_color = bitmap(u"grid_fill.png");
    auto ramp = boost::make_shared<RampTexture>();
    ramp->colors = bitmap(u"ramp.png");
    auto noise = boost::make_shared<NoiseTexture>();
    noise->color2_tex = ramp;
    auto checker = boost::make_shared<CheckerTexture>();
    checker->white_color = grid, checker->black_color = noise;
    auto mirror = layer<Mirror_BRDF>(u"Mirror");
    mirror->color_tex = checker;
    layers->brdfs.insert(layers->brdfs.end(), {glass, phong, light, mirror});

    auto toon = wrap<MaterialToon>(layers, u"Toon");
    toon->distortTex = bitmap(u"toon_distort.png"), toon->opacityTex = bitmap(u"toon_opacity.png");
    auto alpha = wrap<MaterialAlphaContribution>(toon, u"Al");
    alpha->alpha_tex = bitmap(u"alpha.png");
    auto displaced = wrap<MaterialDisplaced>(alpha, u"Disp");
    displaced->displace_tex = bitmap(u"displace.png");
    auto exclusion = wrap<MaterialObjectExclusion>(displaced, u"Ex");
    exclusion->mode = 3, exclusion->objects = {u"Chair", u"Big <Table>"};
    auto env = wrap<MaterialOverrideEnvironment>(exclusion, u"Env");
    env->gi_tex = bitmap(u"gi.png"), env->refract_tex = bitmap(u"refract.png");
    auto bump = wrap<MaterialBump>(env, u"Bump");
    bump->bump_tex = bitmap(u"bump.png");
    auto linked = boost::make_shared<MaterialLinked>();
    linked->name = u"Linked", linked->linked_material = wrap<MaterialBump>(layered(u"Plain"), u"Bumped");
    static_cast<MaterialBump&>(*linked->linked_material).bump_tex = bitmap(u"linked.png");
    auto two = sided<Material2Sided>(u"Two", bump,
                                     sided<MaterialSkp2Sided>(u"Skp", MaterialPtr(), blend(u"AB", linked, layered(u"Other"))));
    two->translucency_tex = bitmap(u"not_visited.png");
    return two;
}

TEST_F(Conversion, OwnForms) {
    // The two-sided material whole, its textures first.
    auto two = sided<Material2Sided>(u"Two", MaterialPtr(), MaterialPtr());
    two->transparency_tex = acolor(1, 0.5f, 0), two->translucency_tex_mult = 2;
    expectGolden("materials/golden/own_two_sided.xml", xmlOf(*two, u"/Lib"));
    // Every class: a parent writes its children's Assets first, below its own url, and refers to them there. The
    // environment override writes only its base, under its own url; the displaced material its base one step (the
    // name) below. The object list has an empty list type and string entries, unescaped. The toon's own form uses the
    // lower-case words.
    expectGolden("materials/golden/own_forms.xml", xmlOf(*everyWrapperTree(), u"/Lib"));
    // Without a base the environment override writes nothing at all.
    EXPECT_EQ(xmlOf(*wrap<MaterialOverrideEnvironment>(MaterialPtr(), u"Env"), u"/Lib"), "");
}

TEST_F(Conversion, ParentsAndBitmapFilesInTheTree) {
    // Every single-child wrapper and the angle blend's first child; two-sided materials end the search.
    const auto two = everyWrapperTree();
    const MaterialPtr front = two->front, blend = childMaterials(*two->back)[0], linked = childMaterials(*blend)[0];
    MaterialPtr layers = front;
    for (int i = 0; i < 6; ++i) layers = childMaterials(*layers)[0];
    EXPECT_EQ(layers->name + findParentMaterial(layers, front)->name, u"LayersToon");
    EXPECT_EQ(findParentMaterial(childMaterials(*front)[0], front), front);
    EXPECT_EQ(findParentMaterial(childMaterials(*linked)[0], blend), linked);
    EXPECT_EQ(findParentMaterial(linked, blend), blend);
    EXPECT_FALSE(findParentMaterial(childMaterials(*blend)[1], blend));  // the second child of an angle blend isn't searched
    EXPECT_FALSE(findParentMaterial(layers->clone(), front));              // the same object, not an equal one
    EXPECT_FALSE(findParentMaterial(layers, MaterialPtr()) || findParentMaterial(MaterialPtr(), front));
    EXPECT_FALSE(findParentMaterial(front, front));
    EXPECT_FALSE(findParentMaterial(front, two) || findParentMaterial(layers, two) || findParentMaterial(linked, two->back));
    // References end the search; an empty first child of an angle blend isn't skipped over.
    EXPECT_FALSE(findParentMaterial(layers, referenceTo(u"x", u"Ref", layers)));
    EXPECT_FALSE(findParentMaterial(layers, ::mattest::blend(u"Gap", MaterialPtr(), layers)));
    // Usable: anything but an empty pointer or a reference without a target UUID.
    EXPECT_FALSE(isUsableMaterial(MaterialPtr()) || isUsableMaterial(referenceTo(u"")));
    EXPECT_TRUE(isUsableMaterial(MaterialPtr(new MaterialMulti)) && isUsableMaterial(referenceTo(u"x")));

    // The order is that of the walk through the materials: a wrapper's base before its own textures, except for the
    // bump, whose texture comes first; the textures of a two-sided material aren't visited, its children are.
    std::vector<std::u16string> files = {u"already.png"};
    EXPECT_EQ(collectBitmapFiles(two, files), 17u);
    std::sort(files.begin() + 7, files.begin() + 10);  // the order inside the checker is not fixed
    EXPECT_EQ(files, (std::vector<std::u16string>{
                         u"already.png", u"bump.png", u"diffuse.png", u"glass_color.png", u"glass_ior.png",
                         u"fresnel.png", u"inverted.png", u"grid_fill.png", u"grid_line.png", u"ramp.png",
                         u"toon_opacity.png", u"toon_distort.png", u"alpha.png", u"displace.png", u"gi.png",
                         u"refract.png", u"linked.png"}));
    // A reference is followed through the scene table only.
    auto ref = referenceTo(u"t-1", u"Ref", two);
    std::vector<std::u16string> none, fromTable;
    EXPECT_EQ(collectBitmapFiles(ref, none), 0u);
    auto inTable = wrap<MaterialBump>(layered(u"T"), u"InTable");
    inTable->uuid = u"T-1", inTable->bump_tex = bitmap(u"table.png");
    ASSERT_TRUE(table().addMaterial(inTable));
    EXPECT_EQ(collectBitmapFiles(ref, fromTable), 1u);
    EXPECT_EQ(fromTable, std::vector<std::u16string>{u"table.png"});
    // Single, multi and instance hold nothing that is visited.
    auto multi = boost::make_shared<MaterialMulti>();
    multi->materials.push_back(two);
    EXPECT_EQ(collectBitmapFiles(multi, none) + collectBitmapFiles(MaterialPtr(new MaterialInstance(two)), none)
                  + collectBitmapFiles(MaterialPtr(), none), 0u);
}

std::vector<std::u16string> found(const MaterialPtr& tree, std::uint32_t tag) {
    std::vector<std::u16string> names;
    for (const MaterialPtr& m : findMaterialsOfType(tree, tag)) names.push_back(m->name);
    return names;
}

// A tree built in memory may be deeper than any file: the walk takes the
// textures of 4 x 256 levels below the top and none deeper.
TEST_F(Conversion, BitmapFilesOfADeepTreeUpToTheWalkLimit) {
    const int limit = 4 * kMaxNestingDepth;
    for (int depth : {limit, limit + 1}) {
        auto bottom = wrap<MaterialBump>(layered(u"L"), u"Bottom");
        bottom->bump_tex = bitmap(u"deep.png");
        MaterialPtr top = bottom;
        for (int level = 0; level < depth; ++level) top = wrap<MaterialBump>(top);
        std::vector<std::u16string> files;
        EXPECT_EQ(collectBitmapFiles(top, files), depth <= limit ? 1u : 0u) << depth;
    }
}

TEST_F(Conversion, SearchGoesThroughEveryWrapperInChildOrder) {
    EXPECT_EQ(found(everyWrapperTree(), kMaterialLayeredBRDF), (std::vector<std::u16string>{u"Layers", u"Plain", u"Other"}));
    // A material of the type ends the search below it; a multi material isn't entered, but is found itself.
    EXPECT_EQ(found(wrap<MaterialBump>(everyWrapperTree(), u"Outer"), kMaterialBump), std::vector<std::u16string>{u"Outer"});
    auto multi = boost::make_shared<MaterialMulti>();
    multi->name = u"Multi", multi->materials.push_back(layered(u"Hidden"));
    EXPECT_TRUE(found(wrap<MaterialBump>(multi), kMaterialLayeredBRDF).empty());
    EXPECT_EQ(found(wrap<MaterialBump>(multi), kMaterialMulti), std::vector<std::u16string>{u"Multi"});
    // Through a reference the search asks the table first, then takes the embedded copy; the conversion's own
    // resolution takes the copy alone.
    auto inTable = layered(u"InTable");
    inTable->uuid = u"aaaa-1";
    const MaterialPtr ref = referenceTo(u"AAAA-1", u"Ref", layered(u"Embedded"));
    EXPECT_EQ(found(ref, kMaterialLayeredBRDF), std::vector<std::u16string>{u"Embedded"});
    ASSERT_TRUE(table().addMaterial(inTable));
    EXPECT_EQ(found(ref, kMaterialLayeredBRDF), std::vector<std::u16string>{u"InTable"});
    EXPECT_EQ(resolveReference(ref)->name, u"Embedded");
    EXPECT_EQ(resolveReference(inTable), inTable);
    EXPECT_FALSE(resolveReference(MaterialPtr()));
    EXPECT_FALSE(resolveReference(referenceTo(u"x")));
}

}  // namespace
