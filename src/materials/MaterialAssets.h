#pragma once
// Conversion of a material tree into its Assets.
#include "materials/BaseMaterial.h"

class AssetXmlWriter;

namespace OrvaneLumoCore {

// Writes one material of a file with everything it holds, as one Assets group.
void writeMaterialAssets(AssetXmlWriter& writer, const MaterialPtr& material);

}  // namespace OrvaneLumoCore
