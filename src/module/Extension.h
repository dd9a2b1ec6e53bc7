#pragma once
#include <string>

namespace OrvaneLumoCore {

// True if the text behind the last "." of the whole path (directory
// separators included) equals `first` or `second`, ignoring case.
bool hasExtension(const std::u16string& path, const std::u16string& first,
                  const std::u16string& second);

// The two conversions as the module calls them: the extension test, then the
// file's document. `ok` is false when the extension is refused.
std::u16string convertMaterialPath(const std::u16string& path, bool& ok);
std::u16string convertOptionsPath(const std::u16string& path, bool& ok);

}  // namespace OrvaneLumoCore
