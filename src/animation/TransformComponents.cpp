#include "animation/TransformComponents.h"

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"

namespace OrvaneLumoCore {

bool TransformComponents::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    ar.writeVector(rotation);
    ar.writeVector(scale);
    ar.writeVector(offset);
    for (std::int32_t m : mirror) ar.writeInt(m);
    return true;
}

bool TransformComponents::load(QuickArchive& ar) {
    std::uint32_t tag = 0;
    ar.readUInt(tag);
    // A refused tag leaves the defaults.
    setDefaults();
    if (tag != versionTag(1)) return false;
    ar.readVector(rotation);
    ar.readVector(scale);
    ar.readVector(offset);
    for (std::int32_t& m : mirror) ar.readInt(m);
    return true;
}

}  // namespace OrvaneLumoCore
