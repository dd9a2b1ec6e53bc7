#include "platform/Path.h"

namespace platform {

std::string folderOf(const std::string& path, const char* separators) {
    const std::size_t last = path.find_last_of(separators);
    if (last == std::string::npos) return ".";
    if (last == 0) return path.substr(0, 1);
    return path.substr(0, last);
}

}  // namespace platform
