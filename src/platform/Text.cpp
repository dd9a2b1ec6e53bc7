#include "platform/Text.h"

#include <cstring>

namespace platform {

std::u16string utf8ToWide(const char* data, std::size_t size) {
    // The text ends at its first zero byte, as a zero-terminated string would.
    const void* zero = std::memchr(data, 0, size);
    if (zero) size = static_cast<const char*>(zero) - data;
    std::u16string out;
    if (decodeUtf8Strict(data, size, out)) return out;
    return decodeAnsi(data, size);
}

std::u16string utf8ToWide(const std::string& s) { return utf8ToWide(s.data(), s.size()); }

std::string wideToUtf8(const std::u16string& s) {
    std::size_t n = s.find(u'\0');
    if (n == std::u16string::npos) n = s.size();
    return encodeUtf8(s.data(), n);
}

}  // namespace platform
