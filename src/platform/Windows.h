#pragma once
// Helpers shared by the Windows faces of the platform layer (the *Windows.cpp
// files); nothing outside them includes this header.
#include <string>

namespace platform {

// The path as the wide file calls take it: as it is, or in the "\\?\" form
// when it is too long for the classic limit of 260 characters.
std::wstring extendedPath(const std::u16string& path);

// The errno value that stands for a Windows error code, so that messages
// read the same on every system ("No such file or directory").
int errnoOf(unsigned long windowsError);

// A UTF-8 path as UTF-16, and back (SystemWindows.cpp). A lone surrogate,
// which a Windows file name may hold, travels as its three-byte UTF-8 form,
// so that every name comes back as it was.
std::u16string utf16Path(const std::string& path);
std::string utf8Path(const wchar_t* s, std::size_t n);

inline std::wstring toWide(const std::u16string& s) { return std::wstring(s.begin(), s.end()); }
inline std::u16string fromWide(const wchar_t* s, std::size_t n) { return std::u16string(s, s + n); }

}  // namespace platform
