#pragma once
// The materials that hold BRDF layers or other materials directly:
// MaterialLayeredBRDF, an ordered stack of layers and the working material
// of the conversion; MaterialSingleBRDF, one layer; MaterialMulti, a list of
// sub-materials. The last two write no XML of their own.
#include <cstdint>
#include <vector>

#include "materials/BaseMaterial.h"
#include "materials/Base_BRDF.h"

namespace OrvaneLumoCore {

class MaterialLayeredBRDF : public BaseMaterial {
public:
    MaterialLayeredBRDF();

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    std::uint32_t getType() const override { return kMaterialLayeredBRDF; }
    void reset() override;
    MaterialPtr duplicate() const override;
    MaterialPtr clone() const override;
    bool isEqual(const MaterialPtr& other) const override;

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

private:
    void cloneLayers();
};

class MaterialSingleBRDF : public BaseMaterial {
public:
    MaterialSingleBRDF();

    // save needs a layer: the record has no way to say that it is missing.
    bool save(QuickArchive& ar) const override;
    // Does not reset first.
    bool load(QuickArchive& ar) override;
    std::uint32_t getType() const override { return kMaterialSingleBRDF; }
    void reset() override;
    // Both copies share the layer.
    MaterialPtr duplicate() const override;
    MaterialPtr clone() const override;
    bool isEqual(const MaterialPtr& other) const override;
    std::u16string getPluginName() const override { return u"MtlSingleBRDF"; }

    BrdfPtr brdf;
    std::int32_t single_value_a;
    std::int32_t single_value_b;
};

class MaterialMulti : public BaseMaterial {
public:
    MaterialMulti();

    bool save(QuickArchive& ar) const override;
    // Does not reset first: a load into a used object appends to its list.
    bool load(QuickArchive& ar) override;
    std::uint32_t getType() const override { return kMaterialMulti; }
    void reset() override;
    // Both copies share the sub-materials.
    MaterialPtr duplicate() const override;
    MaterialPtr clone() const override;
    bool isEqual(const MaterialPtr& other) const override;
    std::u16string getPluginName() const override { return u"MtlMulti"; }

    std::vector<MaterialPtr> materials;
};

}  // namespace OrvaneLumoCore
