#include "platform/WideChar.h"

#include <algorithm>

namespace platform {

namespace {
inline unsigned fold(char16_t c) {
    return (c >= u'A' && c <= u'Z') ? static_cast<unsigned>(c) + 32u : static_cast<unsigned>(c);
}
}  // namespace

int wcsicmp(const std::u16string& a, const std::u16string& b) {
    const std::size_t n = a.size() < b.size() ? a.size() : b.size();
    for (std::size_t i = 0; i < n; ++i) {
        const unsigned ca = fold(a[i]), cb = fold(b[i]);
        if (ca != cb) return ca < cb ? -1 : 1;
    }
    if (a.size() == b.size()) return 0;
    return a.size() < b.size() ? -1 : 1;
}

void removeControlCharacters(std::u16string& text) {
    text.erase(std::remove_if(text.begin(), text.end(), &isControl), text.end());
}

}  // namespace platform
