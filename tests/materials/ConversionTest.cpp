// The asset conversion of materials against the golden documents under
// golden/: whole libraries through the file driver, the folded wrappers, the
// top-level branches and the classes' own writeXml forms; and the search for
// the layered material inside a tree.
#include <cstdio>

#include "materials/MaterialAssets.h"
#include "materials/ReferenceMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrapperAssets.h"
#include "materials/WrappingMaterials.h"
#include "materials/MaterialTestUtil.h"
#include "persistence/OrvMatFile.h"

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

template <class W>
boost::shared_ptr<W> wrap(const MaterialPtr& base, const std::u16string& name = u"Wall") {
    boost::shared_ptr<W> w(new W);
    w->name = name;
    w->base_mtl = base;
    return w;
}

// A two-sided material (either class) or an angle blend with its two children.
template <class T>
boost::shared_ptr<T> sided(const std::u16string& name, const MaterialPtr& front, const MaterialPtr& back) {
    boost::shared_ptr<T> m(new T);
    m->name = name, m->front = front, m->back = back;
    return m;
}
boost::shared_ptr<MaterialAngleBlend> blend(const std::u16string& name, const MaterialPtr& one, const MaterialPtr& two) {
    boost::shared_ptr<MaterialAngleBlend> m(new MaterialAngleBlend);
    m->name = name, m->mtl_one = one, m->mtl_two = two;
    return m;
}

boost::shared_ptr<MaterialReference> referenceTo(const std::u16string& uuid, const MaterialPtr& copy,
                                                 const std::u16string& name = u"Ref") {
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->name = name, ref->target_uuid = uuid, ref->target = copy;
    return ref;
}

std::vector<std::u16string> namesOf(const std::vector<MaterialPtr>& materials) {
    std::vector<std::u16string> names;
    for (const MaterialPtr& m : materials) names.push_back(m->name);
    return names;
}

// ---- whole documents ------------------------------------------------------------------------

// A library of four materials: the first holds all six layers, with textures
// in some slots and none in others; then a multi material, a layered material
// without layers whose name needs escapes, and a single material.
std::vector<MaterialPtr> goldenLibrary() {
    boost::shared_ptr<MaterialLayeredBRDF> lib(new MaterialLayeredBRDF);
    lib->name = u"Lib", lib->uuid = u"never-in-xml", lib->double_sided = 2;
    boost::shared_ptr<Glass_BRDF> glass = layer<Glass_BRDF>(u"Glass");
    glass->color_tex = acolor(0.5f, 0.25f, 1), glass->ior = 1.33f, glass->affect_shadows = 2;
    boost::shared_ptr<Diffuse_BRDF> base = layer<Diffuse_BRDF>(u"Base");
    base->color = Color(0.8f, 0.6f, 0.4f), base->use_color_tex_alpha_as_transparency = true;
    boost::shared_ptr<InvertTexture> invert(new InvertTexture);
    invert->texture = acolor(0, 0, 0), invert->invert_alpha = true;
    base->transparency_tex = invert;
    // Default Fresnel texture; reflection outside [0, 1].
    boost::shared_ptr<Blinn_BRDF> coat = layer<Blinn_BRDF>(u"Coat");
    coat->reflection = Color(0.25f, 1.5f, -0.5f);
    boost::shared_ptr<Phong_BRDF> sheen = layer<Phong_BRDF>(u"Sheen");
    sheen->transparency_tex.reset(), sheen->color_tex = acolor(1, 0.5f, 0.25f, 0.5f);
    sheen->reflection = Color(0.2f, 0.2f, 0.2f), sheen->hilightGlossiness = 0.65f, sheen->anisotropy = 0.5f;
    sheen->back_side = 1, sheen->subdivs = 16;
    boost::shared_ptr<Light_BRDF> glow = layer<Light_BRDF>(u"Glow");
    glow->color = Color(1, 0.9f, 0.5f), glow->intensity = 2.5f, glow->doubleSided = 0;
    glow->transparency_tex = acolor(0.1f, 0.2f, 0.3f, 0.4f);
    lib->brdfs = {glass, base, coat, sheen, layer<Mirror_BRDF>(u"Chrome"), glow};

    boost::shared_ptr<MaterialMulti> group(new MaterialMulti);
    group->name = u"Group";
    group->materials.push_back(lib->clone());
    MaterialPtr empty(new MaterialLayeredBRDF);
    empty->name = u"Empty & <Odd>";
    boost::shared_ptr<MaterialSingleBRDF> single(new MaterialSingleBRDF);
    single->name = u"Single";
    single->brdf = layer<Diffuse_BRDF>(u"Alone");
    return {lib, group, empty, single};
}

TEST_F(Conversion, LibraryThroughTheFileDriverAndFromMemory) {
    OrvMatFile file;
    file.materials = goldenLibrary();
    const std::string path = ::testing::TempDir() + "golden_library.orvmat";
    ASSERT_TRUE(file.save(utf8ToWide(path)));
    const std::u16string xml = OrvMatFile().getXml(utf8ToWide(path));
    std::remove(path.c_str());
    expectGolden("library.xml", wideToUtf8(xml));

    std::u16string own;
    AssetXmlWriter writer(own);
    writer.openRoot("orvmat");
    for (const MaterialPtr& m : file.materials) writeMaterialAssets(writer, m);
    writer.closeRoot();
    expectGolden("library.xml", wideToUtf8(own));
}

TEST_F(Conversion, LayeredMaterialWritesItselfTheSameWay) {
    // The material's own writeXml gives the layers and the main Asset with the
    // same urls as the conversion, from an empty url.
    const std::vector<MaterialPtr> library = goldenLibrary();
    std::u16string own, converted;
    AssetXmlWriter ownWriter(own), convertedWriter(converted);
    library[0]->writeXml(ownWriter, u"");
    writeLayeredAsset(convertedWriter, library[0]);
    EXPECT_EQ(own, converted);
    // MaterialMulti and MaterialSingleBRDF write nothing of their own.
    EXPECT_EQ(ownXml(*library[1]) + ownXml(*library[3]), "");
}

// A library of wrapped trees, saved as a file and converted by the driver:
//   Wall  a bump over a two-sided material over two layered materials;
//   Ref   a reference whose embedded copy, taken from the table at the save,
//         is the layered material Stone;
//   Ink   a toon material over the layered material Paper;
//   Outer an angle blend whose first child is another angle blend.
TEST_F(Conversion, WrappedTreesThroughTheFileDriver) {
    OrvMatFile file;
    boost::shared_ptr<Material2Sided> sheet = sided<Material2Sided>(u"Sheet", layered(u"Front", u"Face"), layered(u"Back", u"Paint"));
    sheet->translucency = Color(0.1f, 0.2f, 0.3f);
    boost::shared_ptr<MaterialBump> wall = wrap<MaterialBump>(sheet);
    wall->bump_tex = acolor(0.5f, 0.25f, 1), wall->bump_tex_mult = 0.5f;
    boost::shared_ptr<MaterialLayeredBRDF> stone = layered(u"Stone", u"Grain");
    stone->uuid = u"5a1e0000-0000-4000-8000-000000000001";
    ASSERT_TRUE(table().addMaterial(stone));
    boost::shared_ptr<MaterialToon> ink = wrap<MaterialToon>(layered(u"Paper", u"Fiber"), u"Ink");
    ink->lineColorTex = acolor(0, 0, 0), ink->lineColor = Color(0.2f, 0.4f, 0.6f), ink->lineWidth = 2;
    boost::shared_ptr<MaterialAngleBlend> outer =
        blend(u"Outer", blend(u"Inner", layered(u"Red", u"R"), layered(u"Blue", u"B")), layered(u"Green", u"G"));
    outer->start_angle = 30, outer->stop_angle = 120;
    file.materials = {wall, referenceTo(stone->uuid, MaterialPtr()), ink, outer};

    const std::string path = ::testing::TempDir() + "wrapped_trees.orvmat";
    ASSERT_TRUE(file.save(utf8ToWide(path)));
    table().clear();  // a conversion sees an empty table: the reference falls back on its copy
    const std::string xml = wideToUtf8(OrvMatFile().getXml(utf8ToWide(path)));
    std::remove(path.c_str());
    expectGolden("wrapped_trees.xml", xml);
}

// ---- conversions and own forms of single trees ---------------------------------------------

// Five folded wrappers over one layered material, bump outermost or innermost.
MaterialPtr allFiveWrappers(bool bumpOutermost) {
    boost::shared_ptr<MaterialDisplaced> displaced(new MaterialDisplaced);
    displaced->displace_tex = acolor(0.2f, 0, 0), displaced->displace_view_dependent = 0;
    boost::shared_ptr<MaterialOverrideEnvironment> env(new MaterialOverrideEnvironment);
    env->bg_tex = acolor(0.3f, 0, 0), env->refract_tex = acolor(0.4f, 0, 0), env->gi_tex_mult = 7, env->override_refract = true;
    boost::shared_ptr<MaterialObjectExclusion> exclusion(new MaterialObjectExclusion);
    exclusion->mode = 2, exclusion->objects = {u"Chair"};
    boost::shared_ptr<MaterialAlphaContribution> alpha(new MaterialAlphaContribution);
    alpha->alpha_tex = acolor(0.5f, 0, 0), alpha->alpha = 0.25f;
    boost::shared_ptr<MaterialBump> bump(new MaterialBump);
    bump->bump_tex = acolor(0.1f, 0, 0), bump->bump_tex_mult = 0.5f;
    std::vector<MaterialPtr> chain = {bump, displaced, env, exclusion, alpha};
    if (!bumpOutermost) std::reverse(chain.begin(), chain.end());
    MaterialPtr below = layered(u"Inner", u"Coat");
    for (std::size_t i = chain.size(); i-- > 0; below = chain[i]) {
        if (auto* b = dynamic_cast<MaterialBump*>(chain[i].get())) b->base_mtl = below;
        if (auto* d = dynamic_cast<MaterialDisplaced*>(chain[i].get())) d->base_mtl = below;
        if (auto* e = dynamic_cast<MaterialOverrideEnvironment*>(chain[i].get())) e->base_mtl = below;
        if (auto* x = dynamic_cast<MaterialObjectExclusion*>(chain[i].get())) x->base_mtl = below;
        if (auto* a = dynamic_cast<MaterialAlphaContribution*>(chain[i].get())) a->base_mtl = below;
    }
    below->name = u"Top";
    return below;
}

TEST_F(Conversion, TopLevelTrees) {
    // Folded wrappers: the textures first, then the layer, then one main Asset
    // under the top's name with the wrappers' parameters behind the layered
    // material's, in the order bump, displaced, environment, exclusion, alpha,
    // whatever the order of the chain. No object list.
    std::string xml = conversion(allFiveWrappers(true));
    EXPECT_EQ(conversion(allFiveWrappers(false)), xml);
    // Only the first wrapper of a type counts.
    boost::shared_ptr<MaterialBump> inner = wrap<MaterialBump>(layered(u"L"), u"InnerBump");
    inner->bump_tex_mult = 9, inner->bump_tex = acolor(1, 0, 0);
    boost::shared_ptr<MaterialBump> outer = wrap<MaterialBump>(inner, u"Outer");
    outer->bump_tex_mult = 2;
    xml += conversion(outer);
    // Layers of one name share their url.
    boost::shared_ptr<MaterialLayeredBRDF> same = layered(u"M", u"Same");
    same->brdfs.push_back(layer<Diffuse_BRDF>(u"Same"));
    xml += conversion(same);
    // Below a bump a two-sided material is flattened to its front, or to its
    // back where the front holds no layered material; a toon is passed through.
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->name = u"Multi";
    xml += conversion(wrap<MaterialBump>(sided<Material2Sided>(u"Two", multi, layered(u"B", u"Back"))));
    boost::shared_ptr<MaterialToon> toon = wrap<MaterialToon>(layered(u"Paper"), u"Toon");
    toon->lineColorTex = acolor(1, 0, 0);
    xml += conversion(wrap<MaterialBump>(toon));
    // At the top, two-child classes write the flat Assets of their children,
    // then their own Asset, whose layout names the class. An absent child
    // leaves its parameter out. A usable child without a layered material gets
    // no Asset, yet the parent refers to it by name; a child that resolves to a
    // reference without a target UUID isn't usable: no parameter, while its
    // flat Asset is written from the inner copy.
    boost::shared_ptr<Material2Sided> two = sided<Material2Sided>(u"Two", layered(u"F", u"FL"), layered(u"B", u"BL"));
    two->translucency = Color(0.25f, 0.5f, 0.75f), two->transparency = Color(1, 1, 1);
    two->translucency_tex = acolor(1, 1, 1), two->force_1sided = true;
    xml += conversion(two);
    xml += conversion(sided<MaterialSkp2Sided>(u"Skp", layered(u"F"), MaterialPtr()));
    const MaterialPtr unusable = referenceTo(u"outer", referenceTo(u"", layered(u"Copy")));
    xml += conversion(blend(u"Blend", multi, unusable));
    xml += conversion(blend(u"Blend", referenceTo(u"u-1", layered(u"Copy")), MaterialPtr()));
    // A reference at the top is searched through a further reference, under that one's name.
    xml += conversion(referenceTo(u"u-1", referenceTo(u"u-2", layered(u"Deep", u"Layer"), u"InnerRef")));
    // A toon at the top: its base through the flat conversion under its own
    // name, the textures in slot order, then the toon Asset without lineUnits.
    // A base without a layered material is still referred to, an unusable one isn't.
    toon = wrap<MaterialToon>(wrap<MaterialBump>(layered(u"Paper"), u"Bumped"), u"Ink");
    toon->opacityTex = acolor(0.5f, 0, 0), toon->lineWidthTex = acolor(0.25f, 0, 0), toon->divideByDist = true;
    xml += conversion(toon);
    xml += conversion(wrap<MaterialToon>(multi, u"Ink"));
    xml += conversion(wrap<MaterialToon>(unusable, u"Ink"));
    expectGolden("top_level_trees.xml", xml);
}

TEST_F(Conversion, OwnForms) {
    // The two-sided material whole, its textures first.
    boost::shared_ptr<Material2Sided> two = sided<Material2Sided>(u"Two", MaterialPtr(), MaterialPtr());
    two->transparency_tex = acolor(1, 0.5f, 0), two->translucency_tex_mult = 2;
    expectGolden("own_two_sided.xml", ownXml(*two, u"/Lib"));
    // Every class in one tree: a parent writes its children's Assets first,
    // below its own url, and refers to them there. The environment override
    // writes only its base, under its own url; the displaced material its base
    // one step (the name) below. The object list has an empty list type and
    // string entries, unescaped. The toon's own form uses the lower-case words.
    boost::shared_ptr<MaterialOverrideEnvironment> env = wrap<MaterialOverrideEnvironment>(layered(u"L"), u"Env");
    env->gi_tex = acolor(1, 1, 1);
    boost::shared_ptr<MaterialObjectExclusion> exclusion = wrap<MaterialObjectExclusion>(wrap<MaterialDisplaced>(env, u"Disp"), u"Ex");
    exclusion->mode = 3, exclusion->objects = {u"Chair", u"Big <Table>"};
    boost::shared_ptr<MaterialAlphaContribution> alpha = wrap<MaterialAlphaContribution>(exclusion, u"Al");
    alpha->alpha_tex = acolor(0, 0, 0);
    boost::shared_ptr<MaterialToon> toon = wrap<MaterialToon>(alpha, u"Toon");
    toon->distortTex = acolor(0, 0, 1);
    boost::shared_ptr<MaterialBump> bump = wrap<MaterialBump>(toon, u"Bump");
    bump->bump_tex = acolor(1, 0, 0);
    two->front = bump;
    two->back = sided<MaterialSkp2Sided>(u"Skp", MaterialPtr(), blend(u"AB", layered(u"One"), MaterialPtr()));
    expectGolden("own_forms.xml", ownXml(*two, u"/Lib"));
    // Without a base the environment override writes nothing at all.
    EXPECT_EQ(ownXml(*wrap<MaterialOverrideEnvironment>(MaterialPtr(), u"Env"), u"/Lib"), "");
}

TEST_F(Conversion, TreesWithoutALayeredMaterialGiveAnEmptyAssetsElement) {
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(layered(u"Sub"));
    boost::shared_ptr<MaterialSingleBRDF> single(new MaterialSingleBRDF);
    single->brdf = layer<Diffuse_BRDF>(u"L");
    boost::shared_ptr<MaterialToon> toon = wrap<MaterialToon>(MaterialPtr(), u"Ink");  // a toon without base
    const MaterialPtr empties[] = {
        wrap<MaterialBump>(multi), single, multi, MaterialPtr(new MaterialInstance(layered(u"Aliased"))),
        referenceTo(u"no-such-uuid", MaterialPtr()), MaterialPtr(), wrap<MaterialBump>(MaterialPtr()), toon,
    };
    for (const MaterialPtr& m : empties) EXPECT_EQ(conversion(m), "  <Assets>\n  </Assets>\n") << &m - empties;
}

// ---- the search ---------------------------------------------------------------------------------

TEST_F(Conversion, SearchGoesThroughEveryWrapperInChildOrder) {
    boost::shared_ptr<MaterialLinked> linked(new MaterialLinked);
    linked->linked_material = layered(u"E");
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(layered(u"Hidden"));
    const MaterialPtr tree = wrap<MaterialBump>(sided<Material2Sided>(
        u"Two", blend(u"Blend", layered(u"A"), layered(u"B")),
        sided<MaterialSkp2Sided>(u"Skp", layered(u"C"), blend(u"Blend2", wrap<MaterialToon>(layered(u"D")), linked))));
    EXPECT_EQ(namesOf(findMaterialsOfType(tree, kMaterialLayeredBRDF)),
              (std::vector<std::u16string>{u"A", u"B", u"C", u"D", u"E"}));
    // A material of the type ends the search below it.
    EXPECT_EQ(namesOf(findMaterialsOfType(tree, kMaterialAngleBlend)), (std::vector<std::u16string>{u"Blend", u"Blend2"}));
    EXPECT_EQ(namesOf(findMaterialsOfType(tree, kMaterialBump)), std::vector<std::u16string>{u"Wall"});
    // A multi material isn't entered (but found itself); empty children are skipped.
    EXPECT_TRUE(findMaterialsOfType(wrap<MaterialBump>(multi), kMaterialLayeredBRDF).empty());
    EXPECT_EQ(findMaterialsOfType(multi, kMaterialMulti), std::vector<MaterialPtr>{multi});
    EXPECT_EQ(namesOf(findMaterialsOfType(sided<Material2Sided>(u"T", MaterialPtr(), layered(u"Back")), kMaterialLayeredBRDF)),
              std::vector<std::u16string>{u"Back"});
    EXPECT_TRUE(findMaterialsOfType(MaterialPtr(), kMaterialLayeredBRDF).empty());
}

TEST_F(Conversion, SearchThroughAReferenceAsksTheTableFirst) {
    boost::shared_ptr<MaterialLayeredBRDF> inTable = layered(u"InTable");
    inTable->uuid = u"aaaa-1";
    const MaterialPtr ref = referenceTo(u"AAAA-1", layered(u"Embedded"));
    EXPECT_EQ(namesOf(findMaterialsOfType(ref, kMaterialLayeredBRDF)), std::vector<std::u16string>{u"Embedded"});
    ASSERT_TRUE(table().addMaterial(inTable));
    EXPECT_EQ(namesOf(findMaterialsOfType(ref, kMaterialLayeredBRDF)), std::vector<std::u16string>{u"InTable"});
    // The conversion's own resolution takes the embedded copy alone.
    EXPECT_EQ(resolveReference(ref)->name, u"Embedded");
    EXPECT_EQ(resolveReference(inTable), inTable);
    EXPECT_FALSE(resolveReference(MaterialPtr()));
    EXPECT_FALSE(resolveReference(referenceTo(u"x", MaterialPtr())));
}

}  // namespace
