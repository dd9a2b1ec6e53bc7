#include "materials/Base_BRDF.h"
#include "materials/Brdf.h"

namespace OrvaneLumoCore {

BrdfPtr createBrdf(std::uint32_t tag) {
    switch (tag) {
    case kGlassBrdf: return BrdfPtr(new Glass_BRDF);
    case kDiffuseBrdf: return BrdfPtr(new Diffuse_BRDF);
    case kBlinnBrdf: return BrdfPtr(new Blinn_BRDF);
    case kPhongBrdf: return BrdfPtr(new Phong_BRDF);
    case kMirrorBrdf: return BrdfPtr(new Mirror_BRDF);
    case kLightBrdf: return BrdfPtr(new Light_BRDF);
    default: return BrdfPtr();
    }
}

}  // namespace OrvaneLumoCore
