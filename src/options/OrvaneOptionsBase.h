#pragma once
// Root of the option groups.
#include <string>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class OrvaneOptionsBase : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    ~OrvaneOptionsBase() override = default;
    virtual void reset() = 0;
    std::u16string getAssetType() const override { return u"settings"; }
};

}  // namespace OrvaneLumoCore
