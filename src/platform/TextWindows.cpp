// The text converters of Windows: MultiByteToWideChar and WideCharToMultiByte,
// strict UTF-8 (MB_ERR_INVALID_CHARS) and the ANSI code page as the system
// has it. The converters take int lengths, so very long texts go through in
// pieces that end on a whole character.
#include "platform/Text.h"

#include <climits>

#include <windows.h>

namespace platform {

namespace {

constexpr std::size_t kPiece = std::size_t(1) << 30;

// Appends the conversion of data[0, size) under `codePage` to `out`; false
// if the converter refuses it.
bool appendDecoded(unsigned codePage, DWORD flags, const char* data, std::size_t size, std::u16string& out) {
    while (size > 0) {
        std::size_t n = size;
        if (n > kPiece) {
            n = kPiece;
            // Not inside a UTF-8 sequence: back up over continuation bytes.
            if (codePage == CP_UTF8)
                while (n > kPiece - 4 && (static_cast<unsigned char>(data[n]) & 0xC0) == 0x80) --n;
        }
        const int units = MultiByteToWideChar(codePage, flags, data, static_cast<int>(n), nullptr, 0);
        if (units <= 0) return false;
        const std::size_t at = out.size();
        out.resize(at + static_cast<std::size_t>(units));
        if (MultiByteToWideChar(codePage, flags, data, static_cast<int>(n), reinterpret_cast<wchar_t*>(&out[at]),
                                units) != units)
            return false;
        data += n;
        size -= n;
    }
    return true;
}

}  // namespace

bool decodeUtf8Strict(const char* data, std::size_t size, std::u16string& out) {
    out.clear();
    return appendDecoded(CP_UTF8, MB_ERR_INVALID_CHARS, data, size, out);
}

std::u16string decodeAnsi(const char* data, std::size_t size) {
    std::u16string out;
    if (!appendDecoded(CP_ACP, MB_PRECOMPOSED, data, size, out)) out.clear();
    return out;
}

std::string encodeUtf8(const char16_t* data, std::size_t size) {
    std::string out;
    while (size > 0) {
        std::size_t n = size < kPiece ? size : kPiece;
        // Not between the two halves of a surrogate pair.
        if (n < size && data[n - 1] >= 0xD800 && data[n - 1] <= 0xDBFF) --n;
        const wchar_t* wide = reinterpret_cast<const wchar_t*>(data);
        const int bytes = WideCharToMultiByte(CP_UTF8, 0, wide, static_cast<int>(n), nullptr, 0, nullptr, nullptr);
        if (bytes <= 0) return std::string();
        const std::size_t at = out.size();
        out.resize(at + static_cast<std::size_t>(bytes));
        WideCharToMultiByte(CP_UTF8, 0, wide, static_cast<int>(n), &out[at], bytes, nullptr, nullptr);
        data += n;
        size -= n;
    }
    return out;
}

}  // namespace platform
