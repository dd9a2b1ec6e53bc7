#pragma once
// What the light classes share: the family base with the operations that
// follow from a class's tag and defaults, and the Asset of a light.
#include <cstddef>
#include <cstdint>
#include <string>

#include <boost/make_shared.hpp>

#include "lights/BaseLight.h"
#include "persistence/FamilyOf.h"
#include "persistence/FieldRows.h"
#include "persistence/Record.h"
#include "xml/AssetScope.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

// Base of a light class `Derived` with type tag `Tag`. The class's defaults
// are its member initialisers, so the family's `reset` serves, and `clone`
// copies (lights hold no shared children).
template <class Derived, std::uint32_t Tag>
using LightOf = FamilyOf<Derived, Tag, BaseLight>;

// The Asset of a light under `url`: Asset, plugin and parameters opened,
// `writeParams()` called, everything closed again.
template <class WriteParams>
void writeLightAsset(AssetXmlWriter& w, const std::u16string& url, const std::u16string& plugin,
                     WriteParams writeParams) {
    writeAsset(w, url, "light", plugin, writeParams);
}

}  // namespace OrvaneLumoCore
