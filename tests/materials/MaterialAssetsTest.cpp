// The asset conversion of one top-level material: which Assets go out, in
// which order and under which urls, and the search for layered materials.
#include <gtest/gtest.h>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/MaterialAssets.h"
#include "materials/SceneMaterials.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

namespace {

class MaterialAssets : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

std::string convert(const MaterialPtr& material) {
    std::u16string xml;
    AssetXmlWriter writer(xml);
    writeMaterialAssets(writer, material);
    return wideToUtf8(xml);
}

// The lines of a document that open an Asset, a list entry or Assets, with
// their indentation: the skeleton of the output.
std::vector<std::string> skeleton(const std::string& xml) {
    std::vector<std::string> lines;
    std::size_t start = 0;
    while (start < xml.size()) {
        std::size_t end = xml.find('\n', start);
        if (end == std::string::npos) end = xml.size();
        const std::string line = xml.substr(start, end - start);
        if (line.find("<Asset ") != std::string::npos || line.find("<entry>") != std::string::npos ||
            line.find("Assets>") != std::string::npos) {
            lines.push_back(line);
        }
        start = end + 1;
    }
    return lines;
}

boost::shared_ptr<MaterialLayeredBRDF> layered(const std::u16string& name,
                                               std::initializer_list<BrdfPtr> layers) {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = name;
    m->brdfs.assign(layers.begin(), layers.end());
    return m;
}

BrdfPtr diffuse(const std::u16string& name) {
    BrdfPtr l(new Diffuse_BRDF);
    l->name = name;
    return l;
}

TEST_F(MaterialAssets, WallWithOneDiffuseLayer) {
    const std::string xml = convert(layered(u"Wall", {diffuse(u"Base")}));
    const std::vector<std::string> expected = {
        "  <Assets>",
        "    <Asset layout=\"\" renderer=\"lumo\" type=\"BRDF\" url=\"/Wall/Base\" >",
        "    <Asset layout=\"deflumat\" renderer=\"lumo\" type=\"material\" url=\"/Wall\" >",
        "                <entry>/Wall/Base</entry>",
        "  </Assets>",
    };
    EXPECT_EQ(skeleton(xml), expected);
    EXPECT_NE(xml.find("<lumoplugin name=\"BRDFDiffuse\" type=\"BRDF\">"), std::string::npos);
    EXPECT_NE(xml.find("<lumoplugin name=\"MtlORVANE\" type=\"material\">"), std::string::npos);
    // UUIDs never reach the XML.
    EXPECT_EQ(xml.find("uuid"), std::string::npos);
}

TEST_F(MaterialAssets, TexturesComeBeforeTheirLayerAndLayersBeforeTheMaterial) {
    boost::shared_ptr<Phong_BRDF> phong(new Phong_BRDF);
    phong->name = u"Gloss";
    phong->color_tex = TexturePtr(new AColorTexture);
    const std::string xml = convert(layered(u"M", {diffuse(u"A"), phong}));
    const std::vector<std::string> expected = {
        "  <Assets>",
        "    <Asset layout=\"\" renderer=\"lumo\" type=\"BRDF\" url=\"/M/A\" >",
        "    <Asset layout=\"\" renderer=\"lumo\" type=\"texture\" url=\"/M/Gloss/color_texture/TexAColor\" >",
        "    <Asset layout=\"\" renderer=\"lumo\" type=\"texture\" url=\"/M/Gloss/transparency_texture/TexFresnel\" >",
        "    <Asset layout=\"\" renderer=\"lumo\" type=\"BRDF\" url=\"/M/Gloss\" >",
        "    <Asset layout=\"deflumat\" renderer=\"lumo\" type=\"material\" url=\"/M\" >",
        "                <entry>/M/A</entry>",
        "                <entry>/M/Gloss</entry>",
        "  </Assets>",
    };
    EXPECT_EQ(skeleton(xml), expected);
}

TEST_F(MaterialAssets, LayersOfOneNameShareTheirUrl) {
    const std::string xml = convert(layered(u"M", {diffuse(u"Same"), diffuse(u"Same")}));
    const std::vector<std::string> expected = {
        "  <Assets>",
        "    <Asset layout=\"\" renderer=\"lumo\" type=\"BRDF\" url=\"/M/Same\" >",
        "    <Asset layout=\"\" renderer=\"lumo\" type=\"BRDF\" url=\"/M/Same\" >",
        "    <Asset layout=\"deflumat\" renderer=\"lumo\" type=\"material\" url=\"/M\" >",
        "                <entry>/M/Same</entry>",
        "                <entry>/M/Same</entry>",
        "  </Assets>",
    };
    EXPECT_EQ(skeleton(xml), expected);
}

TEST_F(MaterialAssets, MaterialsWithoutLayeredMaterialGiveAnEmptyGroup) {
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(layered(u"Inside", {diffuse(u"L")}));
    boost::shared_ptr<MaterialSingleBRDF> single(new MaterialSingleBRDF);
    single->brdf = diffuse(u"L");
    const MaterialPtr cases[] = {multi, single, MaterialPtr()};
    for (const MaterialPtr& m : cases) EXPECT_EQ(convert(m), "  <Assets>\n  </Assets>\n");
}

TEST_F(MaterialAssets, DoubleSidedIsANumber) {
    boost::shared_ptr<MaterialLayeredBRDF> m = layered(u"M", {});
    m->double_sided = 2;
    const std::string xml = convert(m);
    EXPECT_NE(xml.find("<parameter type=\"integer\" name=\"double_sided\" handler=\"default\" "
                       "listType=\"none\" label=\"double_sided\">\n              <value>2</value>"),
              std::string::npos)
        << xml;
    EXPECT_NE(xml.find("              <list>\n              </list>\n"), std::string::npos) << xml;
}

TEST_F(MaterialAssets, FindMaterialsOfType) {
    const MaterialPtr inner = layered(u"Inside", {});
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->materials.push_back(inner);

    EXPECT_TRUE(findMaterialsOfType(MaterialPtr(), kMaterialLayeredBRDF).empty());
    EXPECT_EQ(findMaterialsOfType(inner, kMaterialLayeredBRDF), std::vector<MaterialPtr>{inner});
    // The search doesn't enter a MaterialMulti, but finds the multi itself.
    EXPECT_TRUE(findMaterialsOfType(multi, kMaterialLayeredBRDF).empty());
    EXPECT_EQ(findMaterialsOfType(multi, kMaterialMulti), std::vector<MaterialPtr>{multi});
    EXPECT_TRUE(findMaterialsOfType(inner, kMaterialBump).empty());

    EXPECT_EQ(resolveReference(inner), inner);
    EXPECT_FALSE(resolveReference(MaterialPtr()));
}

}  // namespace
