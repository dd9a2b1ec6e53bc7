// One whole document: a library of four materials, the first holding all six
// layers with textures in some slots and none in others, saved to a file and
// converted by the material file driver.
#include <gtest/gtest.h>

#include <cstdio>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/MaterialAssets.h"
#include "materials/SceneMaterials.h"
#include "persistence/OrvMatFile.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

namespace {

TexturePtr acolor(float r, float g, float b, float a) {
    boost::shared_ptr<AColorTexture> t(new AColorTexture);
    t->color = AColor(r, g, b, a);
    return t;
}

template <class L>
boost::shared_ptr<L> layer(const std::u16string& name) {
    boost::shared_ptr<L> l(new L);
    l->name = name;
    return l;
}

std::vector<MaterialPtr> goldenLibrary() {
    boost::shared_ptr<MaterialLayeredBRDF> lib(new MaterialLayeredBRDF);
    lib->name = u"Lib";
    lib->uuid = u"never-in-xml";
    lib->double_sided = 2;

    boost::shared_ptr<Glass_BRDF> glass = layer<Glass_BRDF>(u"Glass");
    glass->color_tex = acolor(0.5f, 0.25f, 1, 1);
    glass->ior = 1.33f;
    glass->affect_shadows = 2;
    lib->brdfs.push_back(glass);

    boost::shared_ptr<Diffuse_BRDF> base = layer<Diffuse_BRDF>(u"Base");
    base->color = Color(0.8f, 0.6f, 0.4f);
    boost::shared_ptr<InvertTexture> invert(new InvertTexture);
    invert->texture = acolor(0, 0, 0, 1);
    invert->invert_alpha = true;
    base->transparency_tex = invert;
    base->use_color_tex_alpha_as_transparency = true;
    lib->brdfs.push_back(base);

    // Default Fresnel texture; reflection outside [0, 1].
    boost::shared_ptr<Blinn_BRDF> coat = layer<Blinn_BRDF>(u"Coat");
    coat->reflection = Color(0.25f, 1.5f, -0.5f);
    lib->brdfs.push_back(coat);

    boost::shared_ptr<Phong_BRDF> sheen = layer<Phong_BRDF>(u"Sheen");
    sheen->transparency_tex.reset();
    sheen->color_tex = acolor(1, 0.5f, 0.25f, 0.5f);
    sheen->reflection = Color(0.2f, 0.2f, 0.2f);
    sheen->hilightGlossiness = 0.65f;
    sheen->anisotropy = 0.5f;
    sheen->back_side = 1;
    sheen->subdivs = 16;
    lib->brdfs.push_back(sheen);

    lib->brdfs.push_back(layer<Mirror_BRDF>(u"Chrome"));

    boost::shared_ptr<Light_BRDF> glow = layer<Light_BRDF>(u"Glow");
    glow->color = Color(1, 0.9f, 0.5f);
    glow->intensity = 2.5f;
    glow->doubleSided = 0;
    glow->transparency_tex = acolor(0.1f, 0.2f, 0.3f, 0.4f);
    lib->brdfs.push_back(glow);

    MaterialPtr group(new MaterialMulti);
    group->name = u"Group";
    static_cast<MaterialMulti&>(*group).materials.push_back(lib->clone());

    MaterialPtr empty(new MaterialLayeredBRDF);
    empty->name = u"Empty & <Odd>";

    boost::shared_ptr<MaterialSingleBRDF> single(new MaterialSingleBRDF);
    single->name = u"Single";
    single->brdf = layer<Diffuse_BRDF>(u"Alone");

    return {lib, group, empty, single};
}

const char* const kGolden = R"(<orvmat>
  <Assets>
    <Asset layout="" renderer="lumo" type="texture" url="/Lib/Glass/color_texture/TexAColor" >
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
    <Asset layout="" renderer="lumo" type="BRDF" url="/Lib/Glass" >
      <plugin>
        <lumoplugin name="BRDFRefraction" type="BRDF">
          <parameters>
            <parameter type="color" name="color" handler="default" listType="none" label="color">
              <value>
                <r>1</r>
                <g>1</g>
                <b>1</b>
              </value>
            </parameter>
            <parameter type="color" name="transparency" handler="default" listType="none" label="transparency">
              <value>
                <r>0</r>
                <g>0</g>
                <b>0</b>
              </value>
            </parameter>
            <parameter type="color" name="fog_color" handler="default" listType="none" label="fog_color">
              <value>
                <r>1</r>
                <g>1</g>
                <b>1</b>
              </value>
            </parameter>
            <parameter type="color" name="translucency" handler="default" listType="none" label="translucency">
              <value>
                <r>1</r>
                <g>1</g>
                <b>1</b>
              </value>
            </parameter>
            <parameter type="bool" name="affect_shadows" handler="default" listType="none" label="affect_shadows">
              <value>1</value>
            </parameter>
            <parameter type="bool" name="affect_alpha" handler="default" listType="none" label="affect_alpha">
              <value>0</value>
            </parameter>
            <parameter type="bool" name="translucency_on" handler="default" listType="none" label="translucency_on">
              <value>0</value>
            </parameter>
            <parameter type="float" name="ior" handler="default" listType="none" label="ior">
              <value>1.33</value>
            </parameter>
            <parameter type="float" name="fog_color_mult" handler="default" listType="none" label="fog_color_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="glossiness" handler="default" listType="none" label="glossiness">
              <value>1</value>
            </parameter>
            <parameter type="float" name="glossiness_tex_mult" handler="default" listType="none" label="glossiness_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="ior_tex_mult" handler="default" listType="none" label="ior_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="translucency_tex_mult" handler="default" listType="none" label="translucency_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="scatter_coeff" handler="default" listType="none" label="scatter_coeff">
              <value>0</value>
            </parameter>
            <parameter type="float" name="scatter_direction" handler="default" listType="none" label="scatter_direction">
              <value>1</value>
            </parameter>
            <parameter type="float" name="thickness" handler="default" listType="none" label="thickness">
              <value>1000</value>
            </parameter>
            <parameter type="float" name="transparency_tex_mult" handler="default" listType="none" label="transparency_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="cutoff" handler="default" listType="none" label="cutoff">
              <value>0.001</value>
            </parameter>
            <parameter type="float" name="color_tex_mult" handler="default" listType="none" label="color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="integer" name="subdivs" handler="default" listType="none" label="subdivs">
              <value>8</value>
            </parameter>
            <parameter type="plugin" name="transparency_tex" handler="default" listType="none" label="transparency_tex">
            </parameter>
            <parameter type="plugin" name="color_tex" handler="default" listType="none" label="color_tex">
              <value>/Lib/Glass/color_texture/TexAColor</value>
            </parameter>
            <parameter type="plugin" name="glossiness_tex" handler="default" listType="none" label="glossiness_tex">
            </parameter>
            <parameter type="plugin" name="ior_texture" handler="default" listType="none" label="ior_texture">
            </parameter>
            <parameter type="plugin" name="translucency_tex" handler="default" listType="none" label="translucency_tex">
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="texture" url="/Lib/Base/transparency_texture/TexInvert/base_texture/TexAColor" >
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
    <Asset layout="" renderer="lumo" type="texture" url="/Lib/Base/transparency_texture/TexInvert" >
      <plugin>
        <lumoplugin name="TexInvert" type="texture">
          <parameters>
            <parameter type="plugin" name="texture" handler="default" listType="none" label="texture">
              <value>/Lib/Base/transparency_texture/TexInvert/base_texture/TexAColor</value>
            </parameter>
            <parameter type="bool" name="invert_alpha" handler="default" listType="none" label="invert_alpha">
              <value>1</value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="BRDF" url="/Lib/Base" >
      <plugin>
        <lumoplugin name="BRDFDiffuse" type="BRDF">
          <parameters>
            <parameter type="color" name="color" handler="default" listType="none" label="color">
              <value>
                <r>0.8</r>
                <g>0.6</g>
                <b>0.4</b>
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
              <value>/Lib/Base/transparency_texture/TexInvert</value>
            </parameter>
            <parameter type="bool" name="use_color_tex_alpha_as_transparency" handler="default" listType="none" label="use_color_tex_alpha_as_transparency">
              <value>1</value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="texture" url="/Lib/Coat/transparency_texture/TexFresnel" >
      <plugin>
        <lumoplugin name="TexFresnel" type="texture">
          <parameters>
            <parameter type="color" name="white_color" handler="default" listType="none" label="white_color">
              <value>
                <r>0</r>
                <g>0</g>
                <b>0</b>
              </value>
            </parameter>
            <parameter type="color" name="black_color" handler="default" listType="none" label="black_color">
              <value>
                <r>0.745098</r>
                <g>0.745098</g>
                <b>0.745098</b>
              </value>
            </parameter>
            <parameter type="float" name="fresnel_ior" handler="default" listType="none" label="fresnel_ior">
              <value>1.55</value>
            </parameter>
            <parameter type="float" name="refract_ior" handler="default" listType="none" label="refract_ior">
              <value>1.55</value>
            </parameter>
            <parameter type="float" name="black_color_tex_mult" handler="default" listType="none" label="black_color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="white_color_tex_mult" handler="default" listType="none" label="white_color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="fresnel_ior_tex_mult" handler="default" listType="none" label="fresnel_ior_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="refract_ior_tex_mult" handler="default" listType="none" label="refract_ior_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="plugin" name="black_color_tex" handler="default" listType="none" label="black_color_tex">
            </parameter>
            <parameter type="plugin" name="white_color_tex" handler="default" listType="none" label="white_color_tex">
            </parameter>
            <parameter type="plugin" name="fresnel_ior_tex" handler="default" listType="none" label="fresnel_ior_tex">
            </parameter>
            <parameter type="plugin" name="refract_ior_tex" handler="default" listType="none" label="refract_ior_tex">
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="BRDF" url="/Lib/Coat" >
      <plugin>
        <lumoplugin name="BRDFReflection" type="BRDF">
          <parameters>
            <parameter type="color" name="color" handler="default" listType="none" label="color">
              <value>
                <r>1</r>
                <g>1</g>
                <b>1</b>
              </value>
            </parameter>
            <parameter type="color" name="transparency" handler="default" listType="none" label="transparency">
              <value>
                <r>0.75</r>
                <g>0</g>
                <b>1.5</b>
              </value>
            </parameter>
            <parameter type="float" name="hilightGlossiness" handler="default" listType="none" label="hilightGlossiness">
              <value>1</value>
            </parameter>
            <parameter type="float" name="reflectionGlossiness" handler="default" listType="none" label="reflectionGlossiness">
              <value>1</value>
            </parameter>
            <parameter type="float" name="cutoff" handler="default" listType="none" label="cutoff">
              <value>0.01</value>
            </parameter>
            <parameter type="integer" name="subdivs" handler="default" listType="none" label="subdivs">
              <value>8</value>
            </parameter>
            <parameter type="integer" name="back_side" handler="default" listType="none" label="back_side">
              <value>0</value>
            </parameter>
            <parameter type="float" name="color_tex_mult" handler="default" listType="none" label="color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="hilightGlossiness_tex_mult" handler="default" listType="none" label="hilightGlossiness_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="reflectionGlossiness_tex_mult" handler="default" listType="none" label="reflectionGlossiness_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="transparency_tex_mult" handler="default" listType="none" label="transparency_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="anisotropy" handler="default" listType="none" label="anisotropy">
              <value>0</value>
            </parameter>
            <parameter type="float" name="anisotropy_rotation" handler="default" listType="none" label="anisotropy_rotation">
              <value>0</value>
            </parameter>
            <parameter type="plugin" name="color_tex" handler="default" listType="none" label="color_tex">
            </parameter>
            <parameter type="plugin" name="hilightGlossiness_tex" handler="default" listType="none" label="hilightGlossiness_tex">
            </parameter>
            <parameter type="plugin" name="reflectionGlossiness_tex" handler="default" listType="none" label="reflectionGlossiness_tex">
            </parameter>
            <parameter type="plugin" name="transparency_tex" handler="default" listType="none" label="transparency_tex">
              <value>/Lib/Coat/transparency_texture/TexFresnel</value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="texture" url="/Lib/Sheen/color_texture/TexAColor" >
      <plugin>
        <lumoplugin name="TexAColor" type="texture">
          <parameters>
            <parameter type="acolor" name="texture" handler="default" listType="none" label="texture">
              <value>
                <r>1</r>
                <g>0.5</g>
                <b>0.25</b>
                <a>0.5</a>
              </value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="BRDF" url="/Lib/Sheen" >
      <plugin>
        <lumoplugin name="BRDFReflection" type="BRDF">
          <parameters>
            <parameter type="color" name="color" handler="default" listType="none" label="color">
              <value>
                <r>1</r>
                <g>1</g>
                <b>1</b>
              </value>
            </parameter>
            <parameter type="color" name="transparency" handler="default" listType="none" label="transparency">
              <value>
                <r>0.8</r>
                <g>0.8</g>
                <b>0.8</b>
              </value>
            </parameter>
            <parameter type="float" name="hilightGlossiness" handler="default" listType="none" label="hilightGlossiness">
              <value>0.65</value>
            </parameter>
            <parameter type="float" name="reflectionGlossiness" handler="default" listType="none" label="reflectionGlossiness">
              <value>1</value>
            </parameter>
            <parameter type="float" name="cutoff" handler="default" listType="none" label="cutoff">
              <value>0.01</value>
            </parameter>
            <parameter type="integer" name="subdivs" handler="default" listType="none" label="subdivs">
              <value>16</value>
            </parameter>
            <parameter type="integer" name="back_side" handler="default" listType="none" label="back_side">
              <value>1</value>
            </parameter>
            <parameter type="float" name="color_tex_mult" handler="default" listType="none" label="color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="hilightGlossiness_tex_mult" handler="default" listType="none" label="hilightGlossiness_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="reflectionGlossiness_tex_mult" handler="default" listType="none" label="reflectionGlossiness_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="transparency_tex_mult" handler="default" listType="none" label="transparency_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="anisotropy" handler="default" listType="none" label="anisotropy">
              <value>0.5</value>
            </parameter>
            <parameter type="float" name="anisotropy_rotation" handler="default" listType="none" label="anisotropy_rotation">
              <value>0</value>
            </parameter>
            <parameter type="plugin" name="color_tex" handler="default" listType="none" label="color_tex">
              <value>/Lib/Sheen/color_texture/TexAColor</value>
            </parameter>
            <parameter type="plugin" name="hilightGlossiness_tex" handler="default" listType="none" label="hilightGlossiness_tex">
            </parameter>
            <parameter type="plugin" name="reflectionGlossiness_tex" handler="default" listType="none" label="reflectionGlossiness_tex">
            </parameter>
            <parameter type="plugin" name="transparency_tex" handler="default" listType="none" label="transparency_tex">
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="texture" url="/Lib/Chrome/transparency_texture/TexFresnel" >
      <plugin>
        <lumoplugin name="TexFresnel" type="texture">
          <parameters>
            <parameter type="color" name="white_color" handler="default" listType="none" label="white_color">
              <value>
                <r>0</r>
                <g>0</g>
                <b>0</b>
              </value>
            </parameter>
            <parameter type="color" name="black_color" handler="default" listType="none" label="black_color">
              <value>
                <r>0.745098</r>
                <g>0.745098</g>
                <b>0.745098</b>
              </value>
            </parameter>
            <parameter type="float" name="fresnel_ior" handler="default" listType="none" label="fresnel_ior">
              <value>1.55</value>
            </parameter>
            <parameter type="float" name="refract_ior" handler="default" listType="none" label="refract_ior">
              <value>1.55</value>
            </parameter>
            <parameter type="float" name="black_color_tex_mult" handler="default" listType="none" label="black_color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="white_color_tex_mult" handler="default" listType="none" label="white_color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="fresnel_ior_tex_mult" handler="default" listType="none" label="fresnel_ior_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="refract_ior_tex_mult" handler="default" listType="none" label="refract_ior_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="plugin" name="black_color_tex" handler="default" listType="none" label="black_color_tex">
            </parameter>
            <parameter type="plugin" name="white_color_tex" handler="default" listType="none" label="white_color_tex">
            </parameter>
            <parameter type="plugin" name="fresnel_ior_tex" handler="default" listType="none" label="fresnel_ior_tex">
            </parameter>
            <parameter type="plugin" name="refract_ior_tex" handler="default" listType="none" label="refract_ior_tex">
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="BRDF" url="/Lib/Chrome" >
      <plugin>
        <lumoplugin name="BRDFReflection" type="BRDF">
          <parameters>
            <parameter type="color" name="color" handler="default" listType="none" label="color">
              <value>
                <r>1</r>
                <g>1</g>
                <b>1</b>
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
            <parameter type="float" name="cutoff" handler="default" listType="none" label="cutoff">
              <value>0.01</value>
            </parameter>
            <parameter type="plugin" name="transparency_tex" handler="default" listType="none" label="transparency_tex">
              <value>/Lib/Chrome/transparency_texture/TexFresnel</value>
            </parameter>
            <parameter type="plugin" name="color_tex" handler="default" listType="none" label="color_tex">
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="texture" url="/Lib/Glow/transp_texture/TexAColor" >
      <plugin>
        <lumoplugin name="TexAColor" type="texture">
          <parameters>
            <parameter type="acolor" name="texture" handler="default" listType="none" label="texture">
              <value>
                <r>0.1</r>
                <g>0.2</g>
                <b>0.3</b>
                <a>0.4</a>
              </value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="" renderer="lumo" type="BRDF" url="/Lib/Glow" >
      <plugin>
        <lumoplugin name="BRDFLight" type="BRDF">
          <parameters>
            <parameter type="color" name="color" handler="default" listType="none" label="color">
              <value>
                <r>1</r>
                <g>0.9</g>
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
            <parameter type="float" name="intensity" handler="default" listType="none" label="intensity">
              <value>2.5</value>
            </parameter>
            <parameter type="float" name="transparency_tex_mult" handler="default" listType="none" label="transparency_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="float" name="color_tex_mult" handler="default" listType="none" label="color_tex_mult">
              <value>1</value>
            </parameter>
            <parameter type="bool" name="doubleSided" handler="default" listType="none" label="doubleSided">
              <value>0</value>
            </parameter>
            <parameter type="plugin" name="color_tex" handler="default" listType="none" label="color_tex">
            </parameter>
            <parameter type="plugin" name="transparency_tex" handler="default" listType="none" label="transparency_tex">
              <value>/Lib/Glow/transp_texture/TexAColor</value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
    <Asset layout="deflumat" renderer="lumo" type="material" url="/Lib" >
      <plugin>
        <lumoplugin name="MtlORVANE" type="material">
          <parameters>
            <parameter type="integer" name="double_sided" handler="default" listType="none" label="double_sided">
              <value>2</value>
            </parameter>
            <parameter type="list" name="brdfs" handler="default" listType="plugin" label="brdfs">
              <value>
              <list>
                <entry>/Lib/Glass</entry>
                <entry>/Lib/Base</entry>
                <entry>/Lib/Coat</entry>
                <entry>/Lib/Sheen</entry>
                <entry>/Lib/Chrome</entry>
                <entry>/Lib/Glow</entry>
              </list>
              </value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
  </Assets>
  <Assets>
  </Assets>
  <Assets>
    <Asset layout="deflumat" renderer="lumo" type="material" url="/Empty &amp; &lt;Odd&gt;" >
      <plugin>
        <lumoplugin name="MtlORVANE" type="material">
          <parameters>
            <parameter type="integer" name="double_sided" handler="default" listType="none" label="double_sided">
              <value>1</value>
            </parameter>
            <parameter type="list" name="brdfs" handler="default" listType="plugin" label="brdfs">
              <value>
              <list>
              </list>
              </value>
            </parameter>
          </parameters>
        </lumoplugin>
      </plugin>
    </Asset>
  </Assets>
  <Assets>
  </Assets>
</orvmat>
)";

class GoldenDocument : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

// Compares line by line first, so that a failure names the first line that
// differs rather than printing two whole documents.
void expectSameDocument(const std::u16string& actual, const std::string& expected) {
    const std::string got = wideToUtf8(actual);
    std::size_t a = 0, e = 0;
    int line = 1;
    while (a < got.size() && e < expected.size()) {
        const std::size_t aEnd = got.find('\n', a), eEnd = expected.find('\n', e);
        const std::string gotLine = got.substr(a, aEnd - a);
        const std::string wantLine = expected.substr(e, eEnd - e);
        ASSERT_EQ(gotLine, wantLine) << "line " << line;
        if (aEnd == std::string::npos || eEnd == std::string::npos) break;
        a = aEnd + 1;
        e = eEnd + 1;
        ++line;
    }
    EXPECT_EQ(got, expected);
}

TEST_F(GoldenDocument, LibraryThroughTheFileDriver) {
    OrvMatFile file;
    file.materials = goldenLibrary();
    const std::string path = ::testing::TempDir() + "golden_library.orvmat";
    ASSERT_TRUE(file.save(utf8ToWide(path)));
    const std::u16string xml = OrvMatFile().getXml(utf8ToWide(path));
    std::remove(path.c_str());
    expectSameDocument(xml, kGolden);
}

TEST_F(GoldenDocument, SameDocumentFromTheObjectsInMemory) {
    std::u16string xml;
    AssetXmlWriter writer(xml);
    writer.openRoot("orvmat");
    const std::vector<MaterialPtr> library = goldenLibrary();
    for (const MaterialPtr& m : library) writeMaterialAssets(writer, m);
    writer.closeRoot();
    expectSameDocument(xml, kGolden);
}

TEST_F(GoldenDocument, LayeredMaterialWritesItselfTheSameWay) {
    // The material's own writeXml gives the layers and the main Asset with
    // the same urls as the conversion, from an empty url.
    const std::vector<MaterialPtr> library = goldenLibrary();
    std::u16string own, converted;
    AssetXmlWriter ownWriter(own), convertedWriter(converted);
    library[2]->writeXml(ownWriter, u"");
    writeLayeredAsset(convertedWriter, library[2]);
    EXPECT_EQ(own, converted);
    EXPECT_NE(own.find(u"url=\"/Empty &amp; &lt;Odd&gt;\""), std::u16string::npos);

    // MaterialMulti and MaterialSingleBRDF write nothing of their own.
    std::u16string none;
    AssetXmlWriter noneWriter(none);
    library[1]->writeXml(noneWriter, u"");
    library[3]->writeXml(noneWriter, u"");
    EXPECT_EQ(none, u"");
}

}  // namespace
