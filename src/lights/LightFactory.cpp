#include <boost/make_shared.hpp>

#include "lights/BaseLight.h"
#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"

namespace OrvaneLumoCore {

// Tag 1 has no class. DomeLight has tag 8 but no entry: no record can name it.
LightPtr createLight(std::int32_t tag) {
    return createByTag<BaseLight, MayaDirectLight, OmniLight, RectangleLight, SpotLight, SunLight, IESLight,
                       SphereLight>(tag);
}

}  // namespace OrvaneLumoCore
