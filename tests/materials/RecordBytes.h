#pragma once
// Hand-laid record bytes for tests: little-endian values appended one by one,
// the way the archive stores them.
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "persistence/QuickArchive.h"

namespace testbytes {

class RecordBytes {
public:
    RecordBytes& u8(std::uint8_t v) { bytes_.push_back(static_cast<char>(v)); return *this; }
    RecordBytes& b8(bool v) { return u8(v ? 1 : 0); }
    RecordBytes& u32(std::uint32_t v) {
        for (int i = 0; i < 4; ++i) u8(static_cast<std::uint8_t>(v >> (8 * i)));
        return *this;
    }
    RecordBytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    RecordBytes& version(int v) { return u32(static_cast<std::uint32_t>(v) << 16); }
    RecordBytes& f32(float v) {
        std::uint32_t bits;
        std::memcpy(&bits, &v, 4);
        return u32(bits);
    }
    RecordBytes& color(float r, float g, float b) { return f32(r).f32(g).f32(b); }
    // A wstring given as its UTF-8 bytes.
    RecordBytes& str(const std::string& utf8) {
        u32(static_cast<std::uint32_t>(utf8.size()));
        bytes_.insert(bytes_.end(), utf8.begin(), utf8.end());
        return *this;
    }
    RecordBytes& raw(const std::vector<char>& more) {
        bytes_.insert(bytes_.end(), more.begin(), more.end());
        return *this;
    }

    const std::vector<char>& bytes() const { return bytes_; }
    std::size_t size() const { return bytes_.size(); }
    // An archive holding the bytes, the first `length` only if given.
    OrvaneLumoCore::QuickArchive archive(std::size_t length = std::string::npos) const {
        const std::size_t n = length < bytes_.size() ? length : bytes_.size();
        return OrvaneLumoCore::QuickArchive(bytes_.data(), n);
    }

private:
    std::vector<char> bytes_;
};

// The bytes that a save wrote, from the start of the archive.
inline std::vector<char> savedBytes(const OrvaneLumoCore::QuickArchive& ar) {
    std::vector<char> out(static_cast<std::size_t>(ar.getWritePosition()));
    OrvaneLumoCore::QuickArchive copy(ar);
    copy.setReadPosition(0);
    if (!out.empty()) copy.getRaw(out.data(), out.size());
    return out;
}

}  // namespace testbytes
