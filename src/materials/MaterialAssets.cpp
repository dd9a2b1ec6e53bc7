#include "materials/MaterialAssets.h"

#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

// No material class exists yet, so no file reaches this point.
void writeMaterialAssets(AssetXmlWriter& writer, const MaterialPtr& material) {
    writer.openAssets();
    writer.closeAssets();
}

}  // namespace OrvaneLumoCore
