#pragma once
// Helpers of the texture tests: hand-laid record bytes, saved bytes, XML text.
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "persistence/QuickArchive.h"
#include "xml/AssetXmlWriter.h"

namespace textest {

using OrvaneLumoCore::QuickArchive;

// Little-endian record bytes, laid out field by field.
struct Bytes {
    std::vector<std::uint8_t> data;

    Bytes& u8(std::uint8_t v) {
        data.push_back(v);
        return *this;
    }
    Bytes& u32(std::uint32_t v) {
        for (int i = 0; i < 4; ++i) data.push_back(static_cast<std::uint8_t>(v >> (8 * i)));
        return *this;
    }
    Bytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    Bytes& f32(float f) {
        std::uint32_t v;
        std::memcpy(&v, &f, 4);
        return u32(v);
    }
    Bytes& version(int v) { return u32(static_cast<std::uint32_t>(v) << 16); }
    Bytes& wstr(const std::string& utf8) {
        u32(static_cast<std::uint32_t>(utf8.size()));
        data.insert(data.end(), utf8.begin(), utf8.end());
        return *this;
    }
    Bytes& floats(std::initializer_list<float> fs) {
        for (float f : fs) f32(f);
        return *this;
    }
    Bytes& identityTransform() { return floats({1, 0, 0, 0, 1, 0, 0, 0, 1, 0, 0, 0}); }
    // A TransformComponents record: tag, rotation, scale, offset, mirrors.
    Bytes& components(std::initializer_list<float> nine, int mx, int my, int mz) {
        version(1);
        floats(nine);
        return i32(mx).i32(my).i32(mz);
    }
    Bytes& defaultComponents() { return components({0, 0, 0, 1, 1, 1, 0, 0, 0}, 0, 0, 0); }
    Bytes& append(const Bytes& o) {
        data.insert(data.end(), o.data.begin(), o.data.end());
        return *this;
    }

    QuickArchive archive() const { return QuickArchive(data.data(), data.size()); }
};

// The bytes an object's save wrote, and whether it succeeded.
template <class T>
std::vector<std::uint8_t> savedBytes(const T& object, bool* ok = nullptr) {
    QuickArchive ar(1);
    const bool result = object.save(ar);
    if (ok) *ok = result;
    std::vector<std::uint8_t> bytes(static_cast<std::size_t>(ar.getWritePosition()));
    if (!bytes.empty()) ar.getRaw(bytes.data(), bytes.size());
    return bytes;
}

// The XML that writeXml gives on a fresh writer, as UTF-8.
template <class T>
std::string xmlOf(T& object, const std::u16string& url) {
    std::u16string out;
    AssetXmlWriter writer(out);
    object.writeXml(writer, url);
    return OrvaneLumoCore::wideToUtf8(out);
}

}  // namespace textest
