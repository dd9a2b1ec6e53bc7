// The wrapping materials in the asset conversion: the search for the
// layered material, the folded wrappers, the top-level branches, and the
// classes' own writeXml forms.
#include <gtest/gtest.h>

#include <regex>

#include "materials/MaterialAssets.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrapperAssets.h"
#include "materials/WrappingMaterials.h"
#include "test_wrapping_util.h"

using namespace OrvaneLumoCore;
using namespace wraptest;

namespace {

class WrappingConversion : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

std::string conversion(const MaterialPtr& m) { return wideToUtf8(materialToXml(m)); }

// "type name" of each parameter, in document order.
std::vector<std::string> parameters(const std::string& xml) {
    static const std::regex re("<parameter type=\"([a-zA-Z]+)\" name=\"([a-zA-Z_0-9]+)\"");
    std::vector<std::string> out;
    for (std::sregex_iterator it(xml.begin(), xml.end(), re), end; it != end; ++it)
        out.push_back((*it)[1].str() + " " + (*it)[2].str());
    return out;
}

// "layout url" of each Asset, in document order.
std::vector<std::string> assets(const std::string& xml) {
    static const std::regex re("<Asset layout=\"([^\"]*)\" renderer=\"lumo\" type=\"[a-zA-Z]+\" url=\"([^\"]*)\" >");
    std::vector<std::string> out;
    for (std::sregex_iterator it(xml.begin(), xml.end(), re), end; it != end; ++it)
        out.push_back((*it)[1].str() + " " + (*it)[2].str());
    return out;
}

// The text of the one parameter `name` of the last Asset that has it.
std::string parameterText(const std::string& xml, const std::string& name) {
    const std::size_t head = xml.rfind("\" name=\"" + name + "\" ");
    if (head == std::string::npos) return "<missing>";
    const std::size_t start = xml.find('\n', head) + 1;
    const std::size_t end = xml.find("</parameter>", start);
    std::string text = xml.substr(start, end - start);
    text.erase(std::remove(text.begin(), text.end(), ' '), text.end());
    return text;
}

boost::shared_ptr<MaterialBump> bumpOver(const MaterialPtr& base, const std::u16string& name = u"Wall") {
    boost::shared_ptr<MaterialBump> bump(new MaterialBump);
    bump->name = name;
    bump->base_mtl = base;
    return bump;
}

template <class T>
boost::shared_ptr<T> twoChild(const std::u16string& name, const MaterialPtr& first, const MaterialPtr& second);

template <>
boost::shared_ptr<Material2Sided> twoChild(const std::u16string& name, const MaterialPtr& first,
                                           const MaterialPtr& second) {
    boost::shared_ptr<Material2Sided> m(new Material2Sided);
    m->name = name;
    m->front = first;
    m->back = second;
    return m;
}

template <>
boost::shared_ptr<MaterialSkp2Sided> twoChild(const std::u16string& name, const MaterialPtr& first,
                                              const MaterialPtr& second) {
    boost::shared_ptr<MaterialSkp2Sided> m(new MaterialSkp2Sided);
    m->name = name;
    m->front = first;
    m->back = second;
    return m;
}

template <>
boost::shared_ptr<MaterialAngleBlend> twoChild(const std::u16string& name, const MaterialPtr& first,
                                               const MaterialPtr& second) {
    boost::shared_ptr<MaterialAngleBlend> m(new MaterialAngleBlend);
    m->name = name;
    m->mtl_one = first;
    m->mtl_two = second;
    return m;
}

boost::shared_ptr<MaterialReference> referenceTo(const std::u16string& uuid, const MaterialPtr& copy,
                                                 const std::u16string& name = u"Ref") {
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->name = name;
    ref->target_uuid = uuid;
    ref->target = copy;
    return ref;
}

std::vector<std::u16string> namesOf(const std::vector<MaterialPtr>& materials) {
    std::vector<std::u16string> names;
    for (const MaterialPtr& m : materials) names.push_back(m->name);
    return names;
}

// ---- the search ------------------------------------------------------------------

TEST_F(WrappingConversion, SearchGoesThroughEveryWrapperInChildOrder) {
    boost::shared_ptr<MaterialToon> toon(new MaterialToon);
    toon->base_mtl = layered(u"D");
    boost::shared_ptr<MaterialLinked> linked(new MaterialLinked);
    linked->linked_material = layered(u"E");
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(layered(u"Hidden"));
    const MaterialPtr tree = bumpOver(twoChild<Material2Sided>(
        u"Two", twoChild<MaterialAngleBlend>(u"Blend", layered(u"A"), layered(u"B")),
        twoChild<MaterialSkp2Sided>(u"Skp", layered(u"C"),
                                    twoChild<MaterialAngleBlend>(u"Blend2", toon, linked))));
    EXPECT_EQ(namesOf(findMaterialsOfType(tree, kMaterialLayeredBRDF)),
              (std::vector<std::u16string>{u"A", u"B", u"C", u"D", u"E"}));

    // A material of the type ends the search below it.
    EXPECT_EQ(namesOf(findMaterialsOfType(tree, kMaterialAngleBlend)),
              (std::vector<std::u16string>{u"Blend", u"Blend2"}));
    EXPECT_EQ(namesOf(findMaterialsOfType(tree, kMaterialBump)), (std::vector<std::u16string>{u"Wall"}));

    // A multi material isn't entered; empty children are skipped.
    EXPECT_TRUE(findMaterialsOfType(bumpOver(multi), kMaterialLayeredBRDF).empty());
    EXPECT_EQ(namesOf(findMaterialsOfType(twoChild<Material2Sided>(u"T", MaterialPtr(), layered(u"Back")),
                                          kMaterialLayeredBRDF)),
              (std::vector<std::u16string>{u"Back"}));
    EXPECT_TRUE(findMaterialsOfType(MaterialPtr(), kMaterialLayeredBRDF).empty());
}

TEST_F(WrappingConversion, SearchThroughAReferenceAsksTheTableFirst) {
    boost::shared_ptr<MaterialLayeredBRDF> inTable = layered(u"InTable");
    inTable->uuid = u"aaaa-1";
    const MaterialPtr ref = referenceTo(u"AAAA-1", layered(u"Embedded"));
    EXPECT_EQ(namesOf(findMaterialsOfType(ref, kMaterialLayeredBRDF)), (std::vector<std::u16string>{u"Embedded"}));
    ASSERT_TRUE(SceneMaterials::instance()->addMaterial(inTable));
    EXPECT_EQ(namesOf(findMaterialsOfType(ref, kMaterialLayeredBRDF)), (std::vector<std::u16string>{u"InTable"}));
    // The conversion's own resolution takes the embedded copy alone.
    EXPECT_EQ(resolveReference(ref)->name, u"Embedded");
    EXPECT_EQ(resolveReference(inTable), inTable);
    EXPECT_FALSE(resolveReference(MaterialPtr()));
    EXPECT_FALSE(resolveReference(referenceTo(u"x", MaterialPtr())));
}

// ---- folded wrappers -----------------------------------------------------------------

MaterialPtr allFiveWrappers(bool bumpOutermost) {
    boost::shared_ptr<MaterialDisplaced> displaced(new MaterialDisplaced);
    displaced->displace_tex = acolor(0.2f, 0, 0);
    displaced->displace_view_dependent = 0;
    boost::shared_ptr<MaterialOverrideEnvironment> env(new MaterialOverrideEnvironment);
    env->bg_tex = acolor(0.3f, 0, 0);
    env->refract_tex = acolor(0.4f, 0, 0);
    env->gi_tex_mult = 7;
    env->override_refract = true;
    boost::shared_ptr<MaterialObjectExclusion> exclusion(new MaterialObjectExclusion);
    exclusion->mode = 2;
    exclusion->objects = {u"Chair"};
    boost::shared_ptr<MaterialAlphaContribution> alpha(new MaterialAlphaContribution);
    alpha->alpha_tex = acolor(0.5f, 0, 0);
    alpha->alpha = 0.25f;
    boost::shared_ptr<MaterialBump> bump(new MaterialBump);
    bump->bump_tex = acolor(0.1f, 0, 0);
    bump->bump_tex_mult = 0.5f;

    // Chain them in one order or the other; the output doesn't depend on it.
    std::vector<MaterialPtr> chain = {bump, displaced, env, exclusion, alpha};
    if (!bumpOutermost) std::reverse(chain.begin(), chain.end());
    MaterialPtr below = layered(u"Inner", u"Coat");
    for (std::size_t i = chain.size(); i-- > 0;) {
        const MaterialPtr& w = chain[i];
        if (MaterialBump* b = dynamic_cast<MaterialBump*>(w.get())) b->base_mtl = below;
        if (MaterialDisplaced* d = dynamic_cast<MaterialDisplaced*>(w.get())) d->base_mtl = below;
        if (MaterialOverrideEnvironment* e = dynamic_cast<MaterialOverrideEnvironment*>(w.get())) e->base_mtl = below;
        if (MaterialObjectExclusion* x = dynamic_cast<MaterialObjectExclusion*>(w.get())) x->base_mtl = below;
        if (MaterialAlphaContribution* a = dynamic_cast<MaterialAlphaContribution*>(w.get())) a->base_mtl = below;
        below = w;
    }
    below->name = u"Top";
    return below;
}

TEST_F(WrappingConversion, FoldedWrappersGoOutInTheirOrderWithTheirTexturesFirst) {
    for (bool bumpOutermost : {true, false}) {
        const std::string xml = conversion(allFiveWrappers(bumpOutermost));
        EXPECT_EQ(assets(xml), (std::vector<std::string>{
                                   " /Top/bump_tex/TexAColor",
                                   " /Top/displace_tex/TexAColor",
                                   " /Top/bg_tex/TexAColor",
                                   " /Top/refract_tex/TexAColor",
                                   " /Top/alpha_tex/TexAColor",
                                   " /Top/Coat",
                                   "deflumat /Top",
                               }));
        const std::vector<std::string> params = parameters(xml);
        // The last Asset's parameters: the layered material's, then the
        // wrappers' in the order bump, displaced, environment, exclusion,
        // alpha contribution.
        const std::vector<std::string> expected = {
            "integer double_sided",      "list brdfs",
            "bool bump_on",              "float bump_tex_mult",
            "plugin bump_tex",           "bool displace_on",
            "float displace_shift",      "float displace_edge_length",
            "float displace_tex_mult",   "integer displace_max_subdivs",
            "integer displace_continuity", "integer displace_view_dependent",
            "integer displace_use_globals", "plugin displace_tex",
            "plugin gi_tex",             "plugin bg_tex",
            "plugin reflect_tex",        "plugin refract_tex",
            "color gi_color",            "color bg_color",
            "color reflect_color",       "color refract_color",
            "float bg_tex_mult",         "float gi_tex_mult",
            "float reflect_tex_mult",    "float refract_tex_mult",
            "bool override_bg",          "bool override_gi",
            "bool override_reflect",     "bool override_refract",
            "bool ignore_objects",       "bool short_circuit",
            "float alpha",               "float alpha_tex_mult",
            "plugin alpha_tex",
        };
        ASSERT_GE(params.size(), expected.size());
        EXPECT_EQ(std::vector<std::string>(params.end() - expected.size(), params.end()), expected);

        EXPECT_EQ(parameterText(xml, "bump_on"), "<value>1</value>\n");
        EXPECT_EQ(parameterText(xml, "bump_tex"), "<value>/Top/bump_tex/TexAColor</value>\n");
        EXPECT_EQ(parameterText(xml, "displace_view_dependent"), "<value>0</value>\n");
        EXPECT_EQ(parameterText(xml, "displace_max_subdivs"), "<value>256</value>\n");
        EXPECT_EQ(parameterText(xml, "gi_tex"), "");  // absent: no value element
        EXPECT_EQ(parameterText(xml, "gi_tex_mult"), "<value>7</value>\n");
        EXPECT_EQ(parameterText(xml, "override_refract"), "<value>1</value>\n");
        EXPECT_EQ(parameterText(xml, "ignore_objects"), "<value>1</value>\n");  // mode 2
        EXPECT_EQ(parameterText(xml, "alpha"), "<value>0.25</value>\n");
        EXPECT_EQ(countOf(xml, "Chair"), 0) << "the object list doesn't go out";
    }
}

TEST_F(WrappingConversion, OnlyTheFirstWrapperOfATypeCounts) {
    boost::shared_ptr<MaterialBump> inner = bumpOver(layered(u"L"), u"InnerBump");
    inner->bump_tex_mult = 9;
    inner->bump_tex = acolor(1, 0, 0);
    boost::shared_ptr<MaterialBump> outer = bumpOver(inner, u"Outer");
    outer->bump_tex_mult = 2;
    const std::string xml = conversion(outer);
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Outer/Base", "deflumat /Outer"}));
    EXPECT_EQ(countOf(xml, "name=\"bump_on\""), 1);
    EXPECT_EQ(parameterText(xml, "bump_tex_mult"), "<value>2</value>\n");
    EXPECT_EQ(parameterText(xml, "bump_tex"), "");
    EXPECT_EQ(parameterText(xml, "double_sided"), "<value>1</value>\n");
}

TEST_F(WrappingConversion, TreesWithoutALayeredMaterialGiveAnEmptyAssetsElement) {
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(layered(u"Sub"));
    boost::shared_ptr<MaterialSingleBRDF> single(new MaterialSingleBRDF);
    const MaterialPtr empties[] = {
        bumpOver(multi), single, multi, MaterialPtr(new MaterialInstance(layered(u"Aliased"))),
        referenceTo(u"no-such-uuid", MaterialPtr()), MaterialPtr(), bumpOver(MaterialPtr()),
    };
    for (const MaterialPtr& m : empties) EXPECT_EQ(conversion(m), "  <Assets>\n  </Assets>\n");
}

TEST_F(WrappingConversion, TwoSidedBelowABumpIsFlattened) {
    const std::string xml = conversion(bumpOver(twoChild<Material2Sided>(u"Two", layered(u"F", u"Front"),
                                                                         layered(u"B", u"Back"))));
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Wall/Front", "deflumat /Wall"}));
    // Without a layered material in front, the back one is taken.
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    const std::string back = conversion(bumpOver(twoChild<Material2Sided>(u"Two", multi, layered(u"B", u"Back"))));
    EXPECT_EQ(assets(back), (std::vector<std::string>{" /Wall/Back", "deflumat /Wall"}));
}

TEST_F(WrappingConversion, ToonBelowABumpIsPassedThrough) {
    boost::shared_ptr<MaterialToon> toon(new MaterialToon);
    toon->name = u"Toon";
    toon->base_mtl = layered(u"Paper");
    toon->lineColorTex = acolor(1, 0, 0);
    const std::string xml = conversion(bumpOver(toon));
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Wall/Base", "deflumat /Wall"}));
    EXPECT_EQ(countOf(xml, "lineWidth"), 0);
    EXPECT_EQ(countOf(xml, "MtlToon"), 0);
}

TEST_F(WrappingConversion, TwoChildBranches) {
    boost::shared_ptr<Material2Sided> two = twoChild<Material2Sided>(u"Two", layered(u"F", u"FL"), layered(u"B", u"BL"));
    two->translucency = Color(0.25f, 0.5f, 0.75f);
    two->transparency = Color(1, 1, 1);
    two->translucency_tex = acolor(1, 1, 1);
    two->force_1sided = true;
    std::string xml = conversion(two);
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /F/FL", "deflumat /F", " /B/BL", "deflumat /B",
                                                     "TwoSidedMatLayout /Two"}));
    std::vector<std::string> params = parameters(xml);
    EXPECT_EQ(std::vector<std::string>(params.end() - 4, params.end()),
              (std::vector<std::string>{"plugin front", "plugin back", "color translucency", "bool force_1sided"}));
    EXPECT_EQ(parameterText(xml, "front"), "<value>/F</value>\n");
    EXPECT_EQ(parameterText(xml, "back"), "<value>/B</value>\n");
    EXPECT_EQ(parameterText(xml, "force_1sided"), "<value>1</value>\n");
    EXPECT_EQ(countOf(xml, "<lumoplugin name=\"Mtl2Sided\" type=\"material\">"), 1);

    xml = conversion(twoChild<MaterialSkp2Sided>(u"Skp", layered(u"F"), MaterialPtr()));
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /F/Base", "deflumat /F", "SkpTwoSidedMatLayout /Skp"}));
    params = parameters(xml);
    // An absent child leaves its parameter out altogether.
    EXPECT_EQ(std::vector<std::string>(params.end() - 2, params.end()),
              (std::vector<std::string>{"plugin front", "bool force_1sided"}));
    EXPECT_EQ(countOf(xml, "name=\"back\""), 0);

    // A child that is usable but holds no layered material gets no Asset,
    // yet the parent refers to it by its name. A child that resolves to a
    // reference without a target UUID isn't usable: its parameter is left
    // out, while its flat Asset is written from the inner copy.
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->name = u"Multi";
    xml = conversion(twoChild<MaterialAngleBlend>(u"Blend", multi,
                                                  referenceTo(u"outer", referenceTo(u"", layered(u"Copy")))));
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Copy/Base", "deflumat /Copy", "AngleBlendMatLayout /Blend"}));
    EXPECT_EQ(parameterText(xml, "mtl_one"), "<value>/Multi</value>\n");
    EXPECT_EQ(countOf(xml, "name=\"mtl_two\""), 0);
    xml = conversion(twoChild<MaterialAngleBlend>(u"Blend", referenceTo(u"u-1", layered(u"Copy")), MaterialPtr()));
    EXPECT_EQ(parameterText(xml, "mtl_one"), "<value>/Copy</value>\n");
    params = parameters(xml);
    EXPECT_EQ(std::vector<std::string>(params.end() - 3, params.end()),
              (std::vector<std::string>{"plugin mtl_one", "float start_angle", "float stop_angle"}));
}

TEST_F(WrappingConversion, ReferenceAtTheTopIsWrittenFromItsCopy) {
    // A reference resolving to a further reference is searched through,
    // under the inner reference's name.
    boost::shared_ptr<MaterialReference> inner = referenceTo(u"u-2", layered(u"Deep", u"Layer"), u"InnerRef");
    std::string xml = conversion(referenceTo(u"u-1", inner));
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /InnerRef/Layer", "deflumat /InnerRef"}));
    xml = conversion(referenceTo(u"u-1", layered(u"Copy", u"Layer")));
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Copy/Layer", "deflumat /Copy"}));
}

TEST_F(WrappingConversion, ToonBranch) {
    boost::shared_ptr<MaterialToon> toon(new MaterialToon);
    toon->name = u"Ink";
    toon->base_mtl = bumpOver(layered(u"Paper"), u"Bumped");
    toon->opacityTex = acolor(0.5f, 0, 0);
    toon->lineWidthTex = acolor(0.25f, 0, 0);
    toon->divideByDist = true;
    std::string xml = conversion(toon);
    // The base goes through the flat conversion under its own name, the
    // textures follow in slot order, then the toon Asset.
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Bumped/Base", "deflumat /Bumped",
                                                     " /Ink/opacity_tex/TexAColor", " /Ink/width_tex/TexAColor",
                                                     "ToonMatLayout /Ink"}));
    EXPECT_EQ(parameterText(xml, "base_mtl"), "<value>/Bumped</value>\n");
    EXPECT_EQ(parameterText(xml, "opacityTex"), "<value>/Ink/opacity_tex/TexAColor</value>\n");
    EXPECT_EQ(parameterText(xml, "divideByDist"), "<value>1</value>\n");
    EXPECT_EQ(countOf(xml, "line_units"), 0);
    EXPECT_EQ(countOf(xml, "lineUnits"), 0);

    // Without a base material nothing is written; with a base that holds no
    // layered material the toon Asset still refers to it.
    toon->base_mtl.reset();
    EXPECT_EQ(conversion(toon), "  <Assets>\n  </Assets>\n");
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->name = u"Multi";
    toon->base_mtl = multi;
    xml = conversion(toon);
    EXPECT_EQ(assets(xml).back(), "ToonMatLayout /Ink");
    EXPECT_EQ(parameterText(xml, "base_mtl"), "<value>/Multi</value>\n");
    // A base that resolves to a reference without a target UUID isn't
    // usable: no base_mtl.
    toon->base_mtl = referenceTo(u"outer", referenceTo(u"", layered(u"Copy")));
    xml = conversion(toon);
    EXPECT_EQ(countOf(xml, "name=\"base_mtl\""), 0);
    EXPECT_EQ(assets(xml).front(), " /Copy/Base");
}

TEST_F(WrappingConversion, MaterialToXmlHasNoRootElement) {
    const std::string xml = conversion(layered(u"Plain"));
    EXPECT_EQ(xml.substr(0, 11), "  <Assets>\n");
    EXPECT_EQ(xml.substr(xml.size() - 12), "  </Assets>\n");
    EXPECT_EQ(countOf(xml, "<orvmat>"), 0);
}

// ---- own writeXml forms ------------------------------------------------------------------

TEST_F(WrappingConversion, TwoSidedOwnFormIsWholeAndRefersToItsChildrenBelowItsUrl) {
    boost::shared_ptr<Material2Sided> two = twoChild<Material2Sided>(u"Two", MaterialPtr(), MaterialPtr());
    two->transparency_tex = acolor(1, 0.5f, 0);
    two->translucency_tex_mult = 2;
    const std::string expected = R"(  <Asset layout="" renderer="lumo" type="texture" url="/Lib/Two/transparency_tex/TexAColor" >
    <plugin>
      <lumoplugin name="TexAColor" type="texture">
        <parameters>
          <parameter type="acolor" name="texture" handler="default" listType="none" label="texture">
            <value>
              <r>1</r>
              <g>0.5</g>
              <b>0</b>
              <a>1</a>
            </value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
  <Asset layout="" renderer="lumo" type="material" url="/Lib/Two" >
    <plugin>
      <lumoplugin name="Mtl2Sided" type="material">
        <parameters>
          <parameter type="plugin" name="front" handler="default" listType="none" label="front">
          </parameter>
          <parameter type="plugin" name="back" handler="default" listType="none" label="back">
          </parameter>
          <parameter type="plugin" name="translucency_tex" handler="default" listType="none" label="translucency_tex">
          </parameter>
          <parameter type="plugin" name="transparency_tex" handler="default" listType="none" label="transparency_tex">
            <value>/Lib/Two/transparency_tex/TexAColor</value>
          </parameter>
          <parameter type="color" name="translucency" handler="default" listType="none" label="translucency">
            <value>
              <r>0</r>
              <g>0</g>
              <b>0</b>
            </value>
          </parameter>
          <parameter type="color" name="transparency" handler="default" listType="none" label="transparency">
            <value>
              <r>0</r>
              <g>0</g>
              <b>0</b>
            </value>
          </parameter>
          <parameter type="float" name="translucency_tex_mult" handler="default" listType="none" label="translucency_tex_mult">
            <value>2</value>
          </parameter>
          <parameter type="float" name="transparency_tex_mult" handler="default" listType="none" label="transparency_tex_mult">
            <value>1</value>
          </parameter>
          <parameter type="bool" name="force_1sided" handler="default" listType="none" label="force_1sided">
            <value>0</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
)";
    expectSameLines(expected, ownXml(*two, u"/Lib"));

    // With children: their Assets first, below the material's url, and the
    // references point there.
    two->front = layered(u"F", u"FL");
    const std::string xml = ownXml(*two, u"");
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Two/F/FL", "deflumat /Two/F",
                                                     " /Two/transparency_tex/TexAColor", " /Two"}));
    EXPECT_EQ(parameterText(xml, "front"), "<value>/Two/F</value>\n");
}

TEST_F(WrappingConversion, OwnFormsOfTheOtherClasses) {
    // Bump: bump_tex_mult, base_mtl, bump_tex.
    boost::shared_ptr<MaterialBump> bump = bumpOver(layered(u"L"), u"Bump");
    bump->bump_tex = acolor(1, 0, 0);
    std::string xml = ownXml(*bump);
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Bump/L/Base", "deflumat /Bump/L",
                                                     " /Bump/bump_tex/TexAColor", " /Bump"}));
    std::vector<std::string> p = parameters(xml);
    EXPECT_EQ(std::vector<std::string>(p.end() - 3, p.end()),
              (std::vector<std::string>{"float bump_tex_mult", "plugin base_mtl", "plugin bump_tex"}));
    EXPECT_EQ(parameterText(xml, "base_mtl"), "<value>/Bump/L</value>\n");

    // Skp two-sided: front, back, force_1sided.
    boost::shared_ptr<MaterialSkp2Sided> skp = twoChild<MaterialSkp2Sided>(u"Skp", MaterialPtr(), layered(u"K"));
    xml = ownXml(*skp);
    p = parameters(xml);
    EXPECT_EQ(std::vector<std::string>(p.end() - 3, p.end()),
              (std::vector<std::string>{"plugin front", "plugin back", "bool force_1sided"}));
    EXPECT_EQ(parameterText(xml, "front"), "");
    EXPECT_EQ(parameterText(xml, "back"), "<value>/Skp/K</value>\n");

    // Object exclusion: the list has an empty list type and string entries.
    boost::shared_ptr<MaterialObjectExclusion> exclusion(new MaterialObjectExclusion);
    exclusion->name = u"Ex";
    exclusion->mode = 3;
    exclusion->objects = {u"Chair", u"Big <Table>"};
    xml = ownXml(*exclusion);
    const std::string list = R"(          <parameter type="list" name="objects" handler="default" listType="" label="objects">
            <value>
            <list>
              <string>"Chair"</string>
              <string>"Big <Table>"</string>
            </list>
            </value>
          </parameter>
)";
    EXPECT_NE(xml.find(list), std::string::npos) << xml;
    p = parameters(xml);
    EXPECT_EQ(p, (std::vector<std::string>{"plugin base_mtl", "integer mode", "bool short_circuit", "list objects"}));
    EXPECT_EQ(parameterText(xml, "mode"), "<value>3</value>\n");

    // Angle blend: mtl_one, mtl_two, start_angle, stop_angle.
    xml = ownXml(*twoChild<MaterialAngleBlend>(u"AB", layered(u"One"), MaterialPtr()));
    p = parameters(xml);
    EXPECT_EQ(std::vector<std::string>(p.end() - 4, p.end()),
              (std::vector<std::string>{"plugin mtl_one", "plugin mtl_two", "float start_angle", "float stop_angle"}));
    EXPECT_EQ(parameterText(xml, "start_angle"), "<value>75</value>\n");
    EXPECT_EQ(parameterText(xml, "stop_angle"), "<value>150</value>\n");

    // Alpha contribution: alpha, alpha_tex_mult, base_mtl, alpha_tex.
    boost::shared_ptr<MaterialAlphaContribution> alpha(new MaterialAlphaContribution);
    alpha->name = u"Al";
    alpha->alpha_tex = acolor(0, 0, 0);
    xml = ownXml(*alpha);
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Al/alpha_tex/TexAColor", " /Al"}));
    EXPECT_EQ(parameters(xml).back(), "plugin alpha_tex");
    p = parameters(xml);
    EXPECT_EQ(std::vector<std::string>(p.end() - 4, p.end()),
              (std::vector<std::string>{"float alpha", "float alpha_tex_mult", "plugin base_mtl", "plugin alpha_tex"}));
}

TEST_F(WrappingConversion, EnvironmentAndDisplacedWriteOnlyTheirBase) {
    boost::shared_ptr<MaterialOverrideEnvironment> env(new MaterialOverrideEnvironment);
    env->name = u"Env";
    EXPECT_EQ(ownXml(*env, u"/Lib"), "");  // no base: nothing at all
    env->base_mtl = layered(u"L");
    env->gi_tex = acolor(1, 1, 1);
    EXPECT_EQ(assets(ownXml(*env, u"/Lib")), (std::vector<std::string>{" /Lib/L/Base", "deflumat /Lib/L"}));

    boost::shared_ptr<MaterialDisplaced> displaced(new MaterialDisplaced);
    displaced->name = u"Disp";
    displaced->base_mtl = layered(u"L");
    EXPECT_EQ(assets(ownXml(*displaced, u"/Lib")),
              (std::vector<std::string>{" /Lib/Disp/L/Base", "deflumat /Lib/Disp/L"}));
}

TEST_F(WrappingConversion, ToonOwnFormUsesTheLowerCaseWords) {
    boost::shared_ptr<MaterialToon> toon(new MaterialToon);
    toon->name = u"Toon";
    toon->distortTex = acolor(0, 0, 1);
    const std::string xml = ownXml(*toon);
    EXPECT_EQ(assets(xml), (std::vector<std::string>{" /Toon/distort_tex/TexAColor", " /Toon"}));
    const std::vector<std::string> p = parameters(xml);
    EXPECT_EQ(p.front(), "acolor texture");  // the texture's Asset
    EXPECT_EQ(std::vector<std::string>(p.begin() + 1, p.end()), (std::vector<std::string>{
                                   "plugin base_mtl",         "plugin color_tex",
                                   "plugin distort_tex",      "plugin opacity_tex",
                                   "plugin width_tex",        "color color",
                                   "float color_tex_mult",    "float distort",
                                   "float distort_tex_mult",  "float opacity",
                                   "float opacity_tex_mult",  "float width",
                                   "float width_tex_mult",    "float z_threshold",
                                   "float trace_bias",        "float normal_threshold",
                                   "float line_units",        "float silhouette_mult",
                                   "bool do_secondary",       "bool divide_by_distance",
                                   "bool do_silhouette_mult",
                               }));
    EXPECT_EQ(parameterText(xml, "distort_tex"), "<value>/Toon/distort_tex/TexAColor</value>\n");
    EXPECT_EQ(parameterText(xml, "base_mtl"), "");
    EXPECT_EQ(parameterText(xml, "width"), "<value>1.5</value>\n");
}

}  // namespace
