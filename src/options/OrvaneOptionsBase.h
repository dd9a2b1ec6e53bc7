#pragma once
// Root of the option groups.
#include <string>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class OrvaneOptionsBase : public OrvaneRecord {
public:
    std::u16string getAssetType() const override { return u"settings"; }
    // A group writes no XML of its own unless it says so: the document's
    // blocks read its fields.
    void writeXml(AssetXmlWriter&, std::u16string) override {}
};

}  // namespace OrvaneLumoCore
