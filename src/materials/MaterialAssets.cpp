#include "materials/MaterialAssets.h"

#include "materials/LayeredMaterials.h"
#include "materials/ReferenceMaterials.h"
#include "materials/WrapperAssets.h"
#include "persistence/Record.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

// The children that findMaterialsOfType descends into, in search order. The
// materials that hold layers or a list of sub-materials end the search.
std::vector<MaterialPtr> searchChildren(const MaterialPtr& material) {
    return wrapperSearchChildren(*material);
}

// A reference leads the search into the scene table, where a material may
// hold a reference to itself; the search gives up below this depth.
const int kMaxSearchDepth = 4 * kMaxNestingDepth;

void findOfType(const MaterialPtr& material, std::uint32_t tag, int depth, std::vector<MaterialPtr>& found) {
    if (!material || depth > kMaxSearchDepth) return;
    if (material->getType() == tag) {
        found.push_back(material);
        return;
    }
    const std::vector<MaterialPtr> children = searchChildren(material);
    for (std::size_t i = 0; i < children.size(); ++i) findOfType(children[i], tag, depth + 1, found);
}

}  // namespace

// A reference stands for its embedded copy, which may be empty.
MaterialPtr resolveReference(const MaterialPtr& material) {
    if (material && material->getType() == kMaterialReference) {
        const MaterialReference* ref = dynamic_cast<const MaterialReference*>(material.get());
        return ref ? ref->target : MaterialPtr();
    }
    return material;
}

std::vector<MaterialPtr> findMaterialsOfType(const MaterialPtr& material, std::uint32_t tag) {
    std::vector<MaterialPtr> found;
    findOfType(material, tag, 0, found);
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
        case kMaterialAngleBlend:
        case kMaterial2Sided:
        case kMaterialSkp2Sided: writeTwoChildAssets(writer, material); break;
        case kMaterialToon: writeToonAssets(writer, material); break;
        default: writeLayeredAsset(writer, material); break;
        }
    }
    writer.closeAssets();
}

}  // namespace OrvaneLumoCore
