// A library of wrapped trees, saved as a file and converted by the module's
// driver, against the whole expected document:
//   Wall  a bump over a two-sided material over two layered materials;
//   Ref   a reference whose embedded copy is the layered material Stone;
//   Ink   a toon material over the layered material Paper;
//   Outer an angle blend whose first child is another angle blend.
#include <gtest/gtest.h>

#include <fstream>
#include <string>

#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "persistence/OrvMatFile.h"
#include "test_wrapping_util.h"

using namespace OrvaneLumoCore;
using namespace wraptest;

namespace {

// The Asset of a default diffuse layer under `url`.
std::string diffuseLayer(const std::string& url) {
    return R"(    <Asset layout="" renderer="lumo" type="BRDF" url=")" + url + R"(" >
      <plugin>
        <lumoplugin name="BRDFDiffuse" type="BRDF">
          <parameters>
            <parameter type="color" name="color" handler="default" listType="none" label="color">
              <value>
                <r>0.5</r>
                <g>0.5</g>
                <b>0.5</b>
              </value>
            </parameter>
            <parameter type="color" name="transparency" handler="default" listType="none" label="transparency">
              <value>
                <r>0</r>
                <g>0</g>
                <b>0</b>
              </value>
            </parameter>
            <parameter type="float" name="color_tex_mult" handler="default" listType="none" label="color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="transparency_tex_mult" handler="default" listType="none" label="transparency_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="plugin" name="color_tex" handler="default" listType="none" label="color_tex">
            </parameter>
            <parameter type="plugin" name="transparency_tex" handler="default" listType="none" label="transparency_tex">
            </parameter>
            <parameter type="bool" name="use_color_tex_alpha_as_transparency" handler="default" listType="none" label="use_color_tex_alpha_as_transparency">
              <value>0</value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
)";
}

// The head and the own parameters of a flat main Asset under `url` with
// the one layer `url`/`layer`; the parameters of folded wrappers follow.
std::string mainAssetHead(const std::string& url, const std::string& layer) {
    return R"(    <Asset layout="deflumat" renderer="lumo" type="material" url=")" + url + R"(" >
      <plugin>
        <lumoplugin name="MtlORVANE" type="material">
          <parameters>
            <parameter type="integer" name="double_sided" handler="default" listType="none" label="double_sided">
              <value>1</value>
            </parameter>
            <parameter type="list" name="brdfs" handler="default" listType="plugin" label="brdfs">
              <value>
              <list>
                <entry>)" + url + "/" + layer + R"(</entry>
              </list>
              </value>
            </parameter>
)";
}

const char* const kAssetTail = R"(          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
)";

std::string expectedDocument() {
    std::string doc = "<orvmat>\n";

    // Wall: the bump's texture, the layer of Front (the front child of the
    // two-sided material wins), then the main Asset under the bump's name
    // with the bump's parameters behind the layered material's.
    doc += "  <Assets>\n";
    doc += R"(    <Asset layout="" renderer="lumo" type="texture" url="/Wall/bump_tex/TexAColor" >
      <plugin>
        <lumoplugin name="TexAColor" type="texture">
          <parameters>
            <parameter type="acolor" name="texture" handler="default" listType="none" label="texture">
              <value>
                <r>0.5</r>
                <g>0.25</g>
                <b>1</b>
                <a>1</a>
              </value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
)";
    doc += diffuseLayer("/Wall/Face");
    doc += mainAssetHead("/Wall", "Face");
    doc += R"(            <parameter type="bool" name="bump_on" handler="default" listType="none" label="bump_on">
              <value>1</value>
            </parameter>
            <parameter type="float" name="bump_tex_mult" handler="default" listType="none" label="bump_tex_mult">
              <value>0.5</value>
            </parameter>
            <parameter type="plugin" name="bump_tex" handler="default" listType="none" label="bump_tex">
              <value>/Wall/bump_tex/TexAColor</value>
            </parameter>
)";
    doc += kAssetTail;
    doc += "  </Assets>\n";

    // Ref: written from its embedded copy, under the copy's name.
    doc += "  <Assets>\n";
    doc += diffuseLayer("/Stone/Grain");
    doc += mainAssetHead("/Stone", "Grain");
    doc += kAssetTail;
    doc += "  </Assets>\n";

    // Ink: the flat Asset of the base material, the line texture, then the
    // toon Asset with the field names as words and no line_units.
    doc += "  <Assets>\n";
    doc += diffuseLayer("/Paper/Fiber");
    doc += mainAssetHead("/Paper", "Fiber");
    doc += kAssetTail;
    doc += R"(    <Asset layout="" renderer="lumo" type="texture" url="/Ink/color_tex/TexAColor" >
      <plugin>
        <lumoplugin name="TexAColor" type="texture">
          <parameters>
            <parameter type="acolor" name="texture" handler="default" listType="none" label="texture">
              <value>
                <r>0</r>
                <g>0</g>
                <b>0</b>
                <a>1</a>
              </value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="ToonMatLayout" renderer="lumo" type="material" url="/Ink" >
      <plugin>
        <lumoplugin name="MtlToon" type="material">
          <parameters>
            <parameter type="plugin" name="base_mtl" handler="default" listType="none" label="base_mtl">
              <value>/Paper</value>
            </parameter>
            <parameter type="plugin" name="lineColorTex" handler="default" listType="none" label="lineColorTex">
              <value>/Ink/color_tex/TexAColor</value>
            </parameter>
            <parameter type="plugin" name="distortTex" handler="default" listType="none" label="distortTex">
            </parameter>
            <parameter type="plugin" name="opacityTex" handler="default" listType="none" label="opacityTex">
            </parameter>
            <parameter type="plugin" name="lineWidthTex" handler="default" listType="none" label="lineWidthTex">
            </parameter>
            <parameter type="color" name="lineColor" handler="default" listType="none" label="lineColor">
              <value>
                <r>0.2</r>
                <g>0.4</g>
                <b>0.6</b>
              </value>
            </parameter>
            <parameter type="float" name="lineColorTexMult" handler="default" listType="none" label="lineColorTexMult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="distort" handler="default" listType="none" label="distort">
              <value>0</value>
            </parameter>
            <parameter type="float" name="distortTexMult" handler="default" listType="none" label="distortTexMult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="opacity" handler="default" listType="none" label="opacity">
              <value>1</value>
            </parameter>
            <parameter type="float" name="opacityTexMult" handler="default" listType="none" label="opacityTexMult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="lineWidth" handler="default" listType="none" label="lineWidth">
              <value>2</value>
            </parameter>
            <parameter type="float" name="lineWidthTexMult" handler="default" listType="none" label="lineWidthTexMult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="zThreshold" handler="default" listType="none" label="zThreshold">
              <value>0.95</value>
            </parameter>
            <parameter type="float" name="traceBias" handler="default" listType="none" label="traceBias">
              <value>0.02</value>
            </parameter>
            <parameter type="float" name="normalThreshold" handler="default" listType="none" label="normalThreshold">
              <value>0.7</value>
            </parameter>
            <parameter type="float" name="silhouetteMult" handler="default" listType="none" label="silhouetteMult">
              <value>1.5</value>
            </parameter>
            <parameter type="bool" name="doSecondary" handler="default" listType="none" label="doSecondary">
              <value>1</value>
            </parameter>
            <parameter type="bool" name="divideByDist" handler="default" listType="none" label="divideByDist">
              <value>0</value>
            </parameter>
            <parameter type="bool" name="doSilhouetteMult" handler="default" listType="none" label="doSilhouetteMult">
              <value>0</value>
            </parameter>
)";
    doc += kAssetTail;
    doc += "  </Assets>\n";

    // Outer: the inner angle blend is flattened to the first layered
    // material in it (Red) under its own name; then Green; then the outer
    // Asset, which refers to both flat Assets by name.
    doc += "  <Assets>\n";
    doc += diffuseLayer("/Inner/R");
    doc += mainAssetHead("/Inner", "R");
    doc += kAssetTail;
    doc += diffuseLayer("/Green/G");
    doc += mainAssetHead("/Green", "G");
    doc += kAssetTail;
    doc += R"(    <Asset layout="AngleBlendMatLayout" renderer="lumo" type="material" url="/Outer" >
      <plugin>
        <lumoplugin name="MtlAngleBlend" type="material">
          <parameters>
            <parameter type="plugin" name="mtl_one" handler="default" listType="none" label="mtl_one">
              <value>/Inner</value>
            </parameter>
            <parameter type="plugin" name="mtl_two" handler="default" listType="none" label="mtl_two">
              <value>/Green</value>
            </parameter>
            <parameter type="float" name="start_angle" handler="default" listType="none" label="start_angle">
              <value>30</value>
            </parameter>
            <parameter type="float" name="stop_angle" handler="default" listType="none" label="stop_angle">
              <value>120</value>
            </parameter>
)";
    doc += kAssetTail;
    doc += "  </Assets>\n";

    doc += "</orvmat>\n";
    return doc;
}

class WrappedTreeDocument : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

TEST_F(WrappedTreeDocument, LibraryConvertsToTheExpectedDocument) {
    OrvMatFile file;

    boost::shared_ptr<Material2Sided> sheet(new Material2Sided);
    sheet->name = u"Sheet";
    sheet->front = layered(u"Front", u"Face");
    sheet->back = layered(u"Back", u"Paint");
    sheet->translucency = Color(0.1f, 0.2f, 0.3f);
    boost::shared_ptr<MaterialBump> wall(new MaterialBump);
    wall->name = u"Wall";
    wall->base_mtl = sheet;
    wall->bump_tex = acolor(0.5f, 0.25f, 1);
    wall->bump_tex_mult = 0.5f;
    file.materials.push_back(wall);

    // The reference takes its embedded copy from the scene table when saved.
    boost::shared_ptr<MaterialLayeredBRDF> stone = layered(u"Stone", u"Grain");
    stone->uuid = u"5a1e0000-0000-4000-8000-000000000001";
    ASSERT_TRUE(SceneMaterials::instance()->addMaterial(stone));
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->name = u"Ref";
    ref->target_uuid = stone->uuid;
    file.materials.push_back(ref);

    boost::shared_ptr<MaterialToon> ink(new MaterialToon);
    ink->name = u"Ink";
    ink->base_mtl = layered(u"Paper", u"Fiber");
    ink->lineColorTex = acolor(0, 0, 0);
    ink->lineColor = Color(0.2f, 0.4f, 0.6f);
    ink->lineWidth = 2;
    file.materials.push_back(ink);

    boost::shared_ptr<MaterialAngleBlend> inner(new MaterialAngleBlend);
    inner->name = u"Inner";
    inner->mtl_one = layered(u"Red", u"R");
    inner->mtl_two = layered(u"Blue", u"B");
    boost::shared_ptr<MaterialAngleBlend> outer(new MaterialAngleBlend);
    outer->name = u"Outer";
    outer->mtl_one = inner;
    outer->mtl_two = layered(u"Green", u"G");
    outer->start_angle = 30;
    outer->stop_angle = 120;
    file.materials.push_back(outer);

    const std::string path = ::testing::TempDir() + "wrapped_trees.orvmat";
    {
        std::ofstream out(path, std::ios::binary);
        ASSERT_TRUE(file.save(out));
    }
    // A conversion sees an empty table: the reference falls back on its copy.
    SceneMaterials::instance()->clear();

    OrvMatFile reader;
    const std::string xml = wideToUtf8(reader.getXml(utf8ToWide(path)));
    expectSameLines(expectedDocument(), xml);
    std::remove(path.c_str());
}

}  // namespace
