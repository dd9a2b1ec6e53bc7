#include "materials/Base_BRDF.h"
#include "materials/Brdf.h"

namespace OrvaneLumoCore {

BrdfPtr createBrdf(std::uint32_t tag) {
    return createByTag<Base_BRDF, Glass_BRDF, Diffuse_BRDF, Blinn_BRDF, Phong_BRDF, Mirror_BRDF, Light_BRDF>(tag);
}

}  // namespace OrvaneLumoCore
