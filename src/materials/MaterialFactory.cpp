#include "materials/BaseMaterial.h"
#include "materials/LayeredMaterials.h"
#include "materials/ReferenceMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"

namespace OrvaneLumoCore {

MaterialPtr createMaterial(std::uint32_t tag) {
    return createByTag<BaseMaterial, MaterialSingleBRDF, MaterialLayeredBRDF, MaterialMulti, MaterialBump,
                       MaterialInstance, Material2Sided, MaterialLinked, MaterialSkp2Sided,
                       MaterialOverrideEnvironment, MaterialDisplaced, MaterialObjectExclusion,
                       MaterialAlphaContribution, MaterialAngleBlend, MaterialReference, MaterialToon>(tag);
}

}  // namespace OrvaneLumoCore
