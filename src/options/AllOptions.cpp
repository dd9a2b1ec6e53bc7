#include "options/AllOptions.h"

namespace OrvaneLumoCore {

// The option records are not built yet: no options file loads, so every
// options file takes the text road.
AllOptions::AllOptions() { reset(); }
bool AllOptions::save(QuickArchive&) const { return false; }
bool AllOptions::load(QuickArchive&) { return false; }
void AllOptions::reset() {}
void AllOptions::writeXml(AssetXmlWriter&, std::u16string) {}
std::u16string AllOptions::getPluginName() const { return std::u16string(); }

}  // namespace OrvaneLumoCore
