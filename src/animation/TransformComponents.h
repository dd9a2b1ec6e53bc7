#pragma once
// A transform held as its parts: rotation (degrees), scale, offset and mirror
// flags per axis. The UVW generators compose their matrices from it.
#include <cstdint>

#include "persistence/Serializable.h"
#include "persistence/Types.h"

namespace OrvaneLumoCore {

class TransformComponents : public OrvaneSerializable {
public:
    TransformComponents() { setDefaults(); }
    ~TransformComponents() override = default;

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;

    // Rotation 0, scale 1, offset 0, no mirror.
    void setDefaults() {
        rotation = Vector(0, 0, 0);
        scale = Vector(1, 1, 1);
        offset = Vector(0, 0, 0);
        mirror[0] = mirror[1] = mirror[2] = 0;
    }

    bool operator==(const TransformComponents& o) const {
        return rotation == o.rotation && scale == o.scale && offset == o.offset &&
               mirror[0] == o.mirror[0] && mirror[1] == o.mirror[1] && mirror[2] == o.mirror[2];
    }
    bool operator!=(const TransformComponents& o) const { return !(*this == o); }

    Vector rotation;
    Vector scale;
    Vector offset;
    std::int32_t mirror[3];
};

}  // namespace OrvaneLumoCore
