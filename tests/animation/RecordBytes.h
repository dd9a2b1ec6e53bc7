#pragma once
// Builds record bytes by hand for the tests, little-endian like the archive.
#include <cstdint>
#include <cstring>
#include <vector>

#include "persistence/QuickArchive.h"
#include "persistence/Types.h"

namespace animtest {

class RecordBytes {
public:
    RecordBytes& u8(std::uint8_t v) { bytes_.push_back(v); return *this; }
    RecordBytes& u32(std::uint32_t v) {
        for (int i = 0; i < 4; ++i) bytes_.push_back(static_cast<std::uint8_t>(v >> (8 * i)));
        return *this;
    }
    RecordBytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    RecordBytes& f32(float v) {
        std::uint32_t u;
        std::memcpy(&u, &v, 4);
        return u32(u);
    }
    RecordBytes& f64(double v) {
        std::uint64_t u;
        std::memcpy(&u, &v, 8);
        return u32(static_cast<std::uint32_t>(u)).u32(static_cast<std::uint32_t>(u >> 32));
    }
    RecordBytes& vec(float x, float y, float z) { return f32(x).f32(y).f32(z); }
    // Twelve floats: the three matrix rows, then the offset.
    RecordBytes& transform(const OrvaneLumoCore::Transform& t) {
        for (int r = 0; r < 3; ++r) vec(t.m[r].x, t.m[r].y, t.m[r].z);
        return vec(t.offs.x, t.offs.y, t.offs.z);
    }
    RecordBytes& rect(std::int32_t x0, std::int32_t y0, std::int32_t x1, std::int32_t y1) {
        return i32(x0).i32(y0).i32(x1).i32(y1);
    }
    RecordBytes& append(const std::vector<std::uint8_t>& more) {
        bytes_.insert(bytes_.end(), more.begin(), more.end());
        return *this;
    }

    const std::vector<std::uint8_t>& bytes() const { return bytes_; }
    std::size_t size() const { return bytes_.size(); }
    OrvaneLumoCore::QuickArchive archive() const {
        return OrvaneLumoCore::QuickArchive(bytes_.data(), bytes_.size());
    }

private:
    std::vector<std::uint8_t> bytes_;
};

// The bytes an object's save wrote, from the start of the archive.
template <class T>
std::vector<std::uint8_t> savedBytes(const T& object) {
    OrvaneLumoCore::QuickArchive ar(1);
    object.save(ar);
    std::vector<std::uint8_t> out(static_cast<std::size_t>(ar.getWritePosition()));
    if (!out.empty()) ar.getRaw(out.data(), out.size());
    return out;
}

}  // namespace animtest
