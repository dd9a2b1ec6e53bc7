#include "materials/BaseMaterial.h"
#include "materials/LayeredMaterials.h"
#include "materials/ReferenceMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"

namespace OrvaneLumoCore {

MaterialPtr createMaterial(std::uint32_t tag) {
    switch (tag) {
    case kMaterialSingleBRDF: return MaterialPtr(new MaterialSingleBRDF);
    case kMaterialLayeredBRDF: return MaterialPtr(new MaterialLayeredBRDF);
    case kMaterialMulti: return MaterialPtr(new MaterialMulti);
    case kMaterialBump: return MaterialPtr(new MaterialBump);
    case kMaterialInstance: return MaterialPtr(new MaterialInstance);
    case kMaterial2Sided: return MaterialPtr(new Material2Sided);
    case kMaterialLinked: return MaterialPtr(new MaterialLinked);
    case kMaterialSkp2Sided: return MaterialPtr(new MaterialSkp2Sided);
    case kMaterialOverrideEnvironment: return MaterialPtr(new MaterialOverrideEnvironment);
    case kMaterialDisplaced: return MaterialPtr(new MaterialDisplaced);
    case kMaterialObjectExclusion: return MaterialPtr(new MaterialObjectExclusion);
    case kMaterialAlphaContribution: return MaterialPtr(new MaterialAlphaContribution);
    case kMaterialAngleBlend: return MaterialPtr(new MaterialAngleBlend);
    case kMaterialReference: return MaterialPtr(new MaterialReference);
    case kMaterialToon: return MaterialPtr(new MaterialToon);
    default: return MaterialPtr();
    }
}

}  // namespace OrvaneLumoCore
