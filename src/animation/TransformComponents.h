#pragma once
// A transform held as its parts (values/Types.h), with its record. The UVW
// generators compose their matrices from it.
#include "persistence/Serializable.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

class TransformComponents : public OrvaneSerializable, public TransformParts {
public:
    ~TransformComponents() override = default;

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;

    // Rotation 0, scale 1, offset 0, no mirror.
    void setDefaults() { static_cast<TransformParts&>(*this) = TransformParts(); }
};

}  // namespace OrvaneLumoCore
