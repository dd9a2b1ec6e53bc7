#pragma once
// The materials that hold BRDF layers or other materials directly:
// MaterialLayeredBRDF, an ordered stack of layers and the working material
// of the conversion; MaterialSingleBRDF, one layer; MaterialMulti, a list of
// sub-materials. The last two write no XML of their own.
#include <cstdint>
#include <vector>

#include "materials/MaterialOf.h"
#include "materials/Base_BRDF.h"

namespace OrvaneLumoCore {

class MaterialLayeredBRDF : public MaterialOf<MaterialLayeredBRDF, kMaterialLayeredBRDF> {
public:
    MaterialLayeredBRDF();

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    bool sameContent(const MaterialLayeredBRDF& o) const;

    // The layers' Assets, then the material's with a "brdfs" list.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlORVANE"; }

    // The pieces of the material's Asset, shared with the asset conversion,
    // which writes the same Asset under the url of the top of a tree. `url`
    // is the material's url; each layer's url is `url`, "/" and its name.
    // The Assets of all layers, in list order:
    void writeLayerAssets(AssetXmlWriter& writer, const std::u16string& url) const;
    // openAsset, openPlugin and openParameters of the material's Asset:
    void openMainAsset(AssetXmlWriter& writer, const std::u16string& url) const;
    // "double_sided" and the "brdfs" list:
    void writeOwnParameters(AssetXmlWriter& writer, const std::u16string& url) const;

    std::vector<BrdfPtr> brdfs;
    std::int32_t double_sided;
    // Stored, copied and compared; no XML shows them.
    std::int32_t layered_value_a;
    std::int32_t layered_value_b;
    std::int32_t layered_value_c;
    std::int32_t layered_value_d;

    // On a fresh copy: every layer cloned.
    void copyChildren(bool newName);
};

class MaterialSingleBRDF : public MaterialOf<MaterialSingleBRDF, kMaterialSingleBRDF> {
public:
    MaterialSingleBRDF();

    // save needs a layer: the record has no way to say that it is missing.
    bool save(QuickArchive& ar) const override;
    // Does not reset first.
    bool load(QuickArchive& ar) override;
    void reset() override;
    // duplicate() and clone() share the layer.
    bool sameContent(const MaterialSingleBRDF& o) const;
    std::u16string getPluginName() const override { return u"MtlSingleBRDF"; }

    BrdfPtr brdf;
    std::int32_t single_value_a;
    std::int32_t single_value_b;
};

class MaterialMulti : public MaterialOf<MaterialMulti, kMaterialMulti> {
public:
    MaterialMulti();

    bool save(QuickArchive& ar) const override;
    // Does not reset first: a load into a used object appends to its list.
    bool load(QuickArchive& ar) override;
    void reset() override;
    // duplicate() and clone() share the sub-materials.
    bool sameContent(const MaterialMulti& o) const;
    std::u16string getPluginName() const override { return u"MtlMulti"; }

    std::vector<MaterialPtr> materials;
};

}  // namespace OrvaneLumoCore
