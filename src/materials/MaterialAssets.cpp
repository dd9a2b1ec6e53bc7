#include "materials/MaterialAssets.h"

#include "materials/LayeredMaterials.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

// The children that findMaterialsOfType descends into, in search order. The
// materials that hold layers or a list of sub-materials end the search.
std::vector<MaterialPtr> searchChildren(const MaterialPtr& material) {
    switch (material->getType()) {
    default: return std::vector<MaterialPtr>();
    }
}

// A wrapping material whose settings the main Asset of its tree takes over.
// Only the first of each type in the tree counts.
struct FoldedWrapper {
    std::uint32_t tag;
    // Writes the Assets of the wrapper's present textures; `url` is the url
    // of the main Asset.
    void (*writeTextures)(AssetXmlWriter& writer, const BaseMaterial& wrapper,
                          const std::u16string& url);
    // Writes the wrapper's parameters into the main Asset.
    void (*writeParameters)(AssetXmlWriter& writer, const BaseMaterial& wrapper,
                            const std::u16string& url);
};

// In the order in which their textures and parameters go out.
const std::vector<FoldedWrapper>& foldedWrappers() {
    static const std::vector<FoldedWrapper> wrappers;
    return wrappers;
}

void appendAll(std::vector<MaterialPtr>& to, const std::vector<MaterialPtr>& from) {
    to.insert(to.end(), from.begin(), from.end());
}

}  // namespace

MaterialPtr resolveReference(const MaterialPtr& material) { return material; }

std::vector<MaterialPtr> findMaterialsOfType(const MaterialPtr& material, std::uint32_t tag) {
    std::vector<MaterialPtr> found;
    if (!material) return found;
    if (material->getType() == tag) {
        found.push_back(material);
        return found;
    }
    const std::vector<MaterialPtr> children = searchChildren(material);
    for (std::size_t i = 0; i < children.size(); ++i) {
        appendAll(found, findMaterialsOfType(children[i], tag));
    }
    return found;
}

void writeLayeredAsset(AssetXmlWriter& writer, const MaterialPtr& material) {
    if (!material) return;
    // The top of the tree, not the layered material inside, names the Asset.
    const MaterialPtr top = resolveReference(material);
    if (!top) return;
    const std::u16string url = u"/" + top->name;

    const std::vector<MaterialPtr> layered = findMaterialsOfType(top, kMaterialLayeredBRDF);
    if (layered.empty()) return;
    const MaterialLayeredBRDF* main = dynamic_cast<const MaterialLayeredBRDF*>(layered[0].get());
    if (!main) return;

    const std::vector<FoldedWrapper>& kinds = foldedWrappers();
    std::vector<MaterialPtr> wrappers(kinds.size());
    for (std::size_t i = 0; i < kinds.size(); ++i) {
        const std::vector<MaterialPtr> found = findMaterialsOfType(top, kinds[i].tag);
        if (!found.empty()) wrappers[i] = found[0];
    }

    for (std::size_t i = 0; i < kinds.size(); ++i) {
        if (wrappers[i]) kinds[i].writeTextures(writer, *wrappers[i], url);
    }
    main->writeLayerAssets(writer, url);
    main->openMainAsset(writer, url);
    main->writeOwnParameters(writer, url);
    for (std::size_t i = 0; i < kinds.size(); ++i) {
        if (wrappers[i]) kinds[i].writeParameters(writer, *wrappers[i], url);
    }
    writer.closeParameters();
    writer.closePlugin();
    writer.closeAsset();
}

void writeMaterialAssets(AssetXmlWriter& writer, const MaterialPtr& material) {
    writer.openAssets();
    if (material) {
        // A few classes at the top of a file keep a plugin of their own and
        // get a branch here; every other tree becomes the flat main Asset.
        switch (material->getType()) {
        default: writeLayeredAsset(writer, material); break;
        }
    }
    writer.closeAssets();
}

}  // namespace OrvaneLumoCore
