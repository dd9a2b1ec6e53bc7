#pragma once
// The whole render options document.
#include "options/OrvaneOptionsBase.h"

namespace OrvaneLumoCore {

class AllOptions : public OrvaneOptionsBase {
public:
    AllOptions();
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override;
};

}  // namespace OrvaneLumoCore
