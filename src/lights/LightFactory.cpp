#include <boost/make_shared.hpp>

#include "lights/BaseLight.h"
#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"

namespace OrvaneLumoCore {

// Tag 1 has no class. DomeLight has tag 8 but no entry: no record can name it.
LightPtr createLight(std::int32_t tag) {
    switch (tag) {
        case MayaDirectLight::kType: return boost::make_shared<MayaDirectLight>();
        case OmniLight::kType: return boost::make_shared<OmniLight>();
        case RectangleLight::kType: return boost::make_shared<RectangleLight>();
        case SpotLight::kType: return boost::make_shared<SpotLight>();
        case SunLight::kType: return boost::make_shared<SunLight>();
        case IESLight::kType: return boost::make_shared<IESLight>();
        case SphereLight::kType: return boost::make_shared<SphereLight>();
        default: return LightPtr();
    }
}

}  // namespace OrvaneLumoCore
