#pragma once
#include <string>

namespace OrvaneLumoCore {

// The text of a file up to its first zero byte, strict UTF-8 or else the
// ANSI code page; the empty string if the file can't be opened.
std::u16string readFileAsText(const std::u16string& path);

}  // namespace OrvaneLumoCore
