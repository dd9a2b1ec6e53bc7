#include "module/TextFallback.h"

#include <fstream>
#include <vector>

#include "persistence/QuickArchive.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

std::u16string readFileAsText(const std::u16string& path) {
    std::ifstream file;
    platform::openForReading(file, path);
    if (!file.is_open()) return std::u16string();
    file.seekg(0, std::ios::end);
    const std::streamoff size = file.tellg();
    file.seekg(0, std::ios::beg);
    if (size <= 0) return std::u16string();
    std::vector<char> buffer(static_cast<std::size_t>(size));
    file.read(buffer.data(), size);
    // utf8ToWide ends the text at the first zero byte.
    return utf8ToWide(buffer.data(), static_cast<std::size_t>(file.gcount()));
}

}  // namespace OrvaneLumoCore
