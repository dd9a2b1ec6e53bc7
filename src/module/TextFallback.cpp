#include "module/TextFallback.h"

#include <cstring>
#include <string>

#include "platform/File.h"
#include "platform/Text.h"

namespace OrvaneLumoCore {

std::u16string readFileAsText(const std::u16string& path) {
    platform::RegularFile file;
    if (!file.open(path)) return std::u16string();
    // The text ends at the first zero byte: read in chunks up to it and no
    // further, so a large file costs what its text holds.
    constexpr std::size_t kChunk = 64 * 1024;
    std::string text;
    for (std::uint64_t offset = 0;; offset += kChunk) {
        const std::size_t start = text.size();
        text.resize(start + kChunk);
        const std::size_t got = file.readAt(offset, &text[start], kChunk);
        text.resize(start + got);
        if (std::memchr(text.data() + start, 0, got) || got < kChunk) break;
    }
    return platform::utf8ToWide(text);
}

}  // namespace OrvaneLumoCore
