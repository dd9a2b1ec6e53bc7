#pragma once
// Text conversion between byte strings and 16-bit wide text.
//
// The model library keeps all text as UTF-16 code units (std::u16string).
// Byte text is either UTF-8 or the single-byte ANSI code page, which here is
// Windows-1252; strict UTF-8 validation decides between the two.
#include <cstddef>
#include <string>

namespace platform {

// Decodes strictly: overlong forms, encoded surrogates, values above
// U+10FFFF and truncated sequences are errors. Returns false on an error and
// leaves `out` unspecified.
bool decodeUtf8Strict(const char* data, std::size_t size, std::u16string& out);

// Decodes Windows-1252. Every byte has a character; the five bytes that the
// code page leaves unassigned map to the C1 control of the same value, as the
// system converter does.
std::u16string decodeAnsi(const char* data, std::size_t size);

// Encodes UTF-16 as UTF-8. A lone surrogate becomes U+FFFD.
std::string encodeUtf8(const char16_t* data, std::size_t size);

// The system's conversions of all narrow text, built on the three above:
// narrow text ends at its first zero byte and is UTF-8 if it decodes
// strictly, else the ANSI code page; wide text ends at its first zero unit
// and becomes UTF-8.
std::u16string utf8ToWide(const char* data, std::size_t size);
std::u16string utf8ToWide(const std::string& s);
std::string wideToUtf8(const std::u16string& s);

}  // namespace platform
