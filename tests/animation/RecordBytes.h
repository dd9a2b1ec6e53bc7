#pragma once
// Test helpers: record bytes laid by hand (little-endian like the archive),
// the bytes a save writes, and golden documents kept beside the tests.
#include <gtest/gtest.h>

#include <cstring>
#include <fstream>
#include <iterator>

#include "persistence/QuickArchive.h"  // with the value types, <cstdint>, <string>, <vector>

namespace animtest {

class RecordBytes {
public:
    RecordBytes& u8(std::uint8_t v) { bytes_.push_back(v); return *this; }
    RecordBytes& u32(std::uint32_t v) { return u8(v & 0xFF).u8(v >> 8 & 0xFF).u8(v >> 16 & 0xFF).u8(v >> 24); }
    RecordBytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    RecordBytes& f32(float v) { std::uint32_t u; std::memcpy(&u, &v, 4); return u32(u); }
    RecordBytes& f64(double v) { std::uint64_t u; std::memcpy(&u, &v, 8); return u32(u & 0xFFFFFFFF).u32(u >> 32); }
    RecordBytes& vec(float x, float y, float z) { return f32(x).f32(y).f32(z); }
    // Twelve floats: the three matrix rows, then the offset.
    RecordBytes& transform(const OrvaneLumoCore::Transform& t) {
        for (int r = 0; r < 3; ++r) vec(t.m[r].x, t.m[r].y, t.m[r].z);
        return vec(t.offs.x, t.offs.y, t.offs.z);
    }
    // The head of an animated value's record: tag 0x10000, key count, time width 8.
    RecordBytes& keys(std::uint32_t count) { return u32(0x10000).u32(count).u32(8); }
    RecordBytes& append(const std::vector<std::uint8_t>& more) {
        bytes_.insert(bytes_.end(), more.begin(), more.end());
        return *this;
    }
    RecordBytes& append(const RecordBytes& more) { return append(more.bytes_); }
    const std::vector<std::uint8_t>& bytes() const { return bytes_; }
    std::size_t size() const { return bytes_.size(); }
    OrvaneLumoCore::QuickArchive archive() const { return {bytes_.data(), bytes_.size()}; }

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

// Loads the whole record and nothing behind it.
template <class T>
bool loadsWhole(T& object, const RecordBytes& bytes) {
    OrvaneLumoCore::QuickArchive ar = bytes.archive();
    return object.load(ar) && ar.getReadPosition() == bytes.size();
}

// `value` saves as `laid`, and `laid` loaded into `other` gives `value`.
template <class T>
void expectRecord(const T& value, T other, const RecordBytes& laid) {
    EXPECT_EQ(savedBytes(value), laid.bytes());
    ASSERT_TRUE(loadsWhole(other, laid));
    EXPECT_EQ(other, value);
}

// A golden document under tests/, to compare with EXPECT_EQ: on a mismatch
// googletest shows the lines that differ.
inline std::string golden(const std::string& path) {
    std::ifstream in(std::string(ORVXML_SOURCE_DIR) + "/tests/" + path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

}  // namespace animtest
