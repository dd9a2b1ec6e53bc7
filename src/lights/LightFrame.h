#pragma once
// What the light classes share: the operations that follow from a class's
// tag and defaults, the record frame of a flat record, and the Asset frame.
#include <cstddef>
#include <cstdint>
#include <string>

#include <boost/make_shared.hpp>

#include "lights/BaseLight.h"
#include "persistence/FamilyOf.h"
#include "persistence/FieldRows.h"
#include "xml/ParamRows.h"
#include "persistence/Record.h"
#include "xml/AssetScope.h"

namespace OrvaneLumoCore {

// Base of a light class `Derived` with type tag `Tag`. The class's defaults
// are its member initialisers, so the family's `reset` serves, and `clone`
// copies (lights hold no shared children).
template <class Derived, std::uint32_t Tag>
using LightOf = FamilyOf<Derived, Tag, BaseLight>;

// Resets `light` and reads a version tag of 1 to `newest`, then the fields
// of `rows` that the version holds. Returns the version, or -1 for a tag
// that isn't listed.
template <class L, std::size_t N>
int loadFlatRecord(L& light, QuickArchive& ar, const RecordRow<L> (&rows)[N], int newest) {
    light.reset();
    const int v = readVersion(ar, 1, newest);
    if (v < 0) return -1;
    readFields(ar, light, rows, v);
    return v;
}

// Writes the tag of version `newest` and the fields of that version.
template <class L, std::size_t N>
void saveFlatRecord(const L& light, QuickArchive& ar, const RecordRow<L> (&rows)[N], int newest) {
    writeVersion(ar, newest);
    writeFields(ar, light, rows, newest);
}

// The Asset of a light under `url`: Asset, plugin and parameters opened,
// `writeParams()` called, everything closed again.
template <class WriteParams>
void writeLightAsset(AssetXmlWriter& w, const std::u16string& url, const std::u16string& plugin,
                     WriteParams writeParams) {
    writeAsset(w, url, "light", plugin, writeParams);
}

}  // namespace OrvaneLumoCore
