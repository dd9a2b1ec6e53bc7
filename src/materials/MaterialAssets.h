#pragma once
// Conversion of a material tree into its Assets. The tree's layered material
// becomes one flat main Asset named after the top of the tree; wrapping
// materials above it lend their settings to that Asset.
#include <cstdint>
#include <vector>

#include "materials/BaseMaterial.h"

class AssetXmlWriter;

namespace OrvaneLumoCore {

// Writes one material of a file with everything it holds, as one Assets group
// (also when nothing stands inside it).
void writeMaterialAssets(AssetXmlWriter& writer, const MaterialPtr& material);

// The flat main Asset of a material: the Assets of the folded wrappers'
// textures and of the layers, then the "MtlORVANE" Asset under "/" and the
// name of the (resolved) material. Writes nothing if no layered material is
// found in the tree.
void writeLayeredAsset(AssetXmlWriter& writer, const MaterialPtr& material);

// The materials of type `tag` in the tree, depth first, children in order.
// A material of that type ends the search below it.
std::vector<MaterialPtr> findMaterialsOfType(const MaterialPtr& material, std::uint32_t tag);

// The material that stands for `material` at the top of a conversion.
MaterialPtr resolveReference(const MaterialPtr& material);

}  // namespace OrvaneLumoCore
