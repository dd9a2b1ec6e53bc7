#pragma once
// Character classes and comparisons of wide text, with the behaviour of the
// C runtime in the "C" locale.
#include <string>

namespace platform {

// Case-insensitive comparison: ASCII letters fold to lower case, every other
// unit compares by its value ("_" therefore sorts before the letters).
// Returns <0, 0 or >0.
int wcsicmp(const std::u16string& a, const std::u16string& b);

inline bool iequals(const std::u16string& a, const std::u16string& b) {
    return wcsicmp(a, b) == 0;
}

// Decimal digits "0" to "9".
inline bool isDigit(char16_t c) { return c >= u'0' && c <= u'9'; }

// Control characters: C0, DEL and C1.
inline bool isControl(char16_t c) { return c < 0x20 || (c >= 0x7F && c <= 0x9F); }

// Drops every control character from `text`, in place.
void removeControlCharacters(std::u16string& text);

// Ordering of map keys that differ only in the case of ASCII letters as one key.
struct CaseInsensitiveLess {
    bool operator()(const std::u16string& a, const std::u16string& b) const {
        return wcsicmp(a, b) < 0;
    }
};

}  // namespace platform
