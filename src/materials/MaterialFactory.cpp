#include "materials/BaseMaterial.h"
#include "materials/LayeredMaterials.h"

namespace OrvaneLumoCore {

MaterialPtr createMaterial(std::uint32_t tag) {
    switch (tag) {
    case kMaterialSingleBRDF: return MaterialPtr(new MaterialSingleBRDF);
    case kMaterialLayeredBRDF: return MaterialPtr(new MaterialLayeredBRDF);
    case kMaterialMulti: return MaterialPtr(new MaterialMulti);
    default: return MaterialPtr();
    }
}

}  // namespace OrvaneLumoCore
