#pragma once
// Root of the option groups.
#include <string>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class OrvaneOptionsBase : public OrvaneRecord {
public:
    std::u16string getAssetType() const override { return u"settings"; }
};

}  // namespace OrvaneLumoCore
