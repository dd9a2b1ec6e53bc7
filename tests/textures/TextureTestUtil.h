#pragma once
// Helpers of the texture and light tests: hand-laid records, saved bytes, XML
// text, golden documents and damaged records.
#include <cstdint>
#include <cstring>
#include <fstream>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include <boost/make_shared.hpp>
#include <gtest/gtest.h>

#include "persistence/QuickArchive.h"
#include "persistence/Types.h"
#include "xml/AssetXmlWriter.h"

namespace textest {

using namespace OrvaneLumoCore;

// Little-endian record bytes, laid out field by field.
struct Bytes {
    using Floats = std::initializer_list<float>;
    std::vector<std::uint8_t> data;

    Bytes& u8(std::uint8_t v) { data.push_back(v); return *this; }
    Bytes& u32(std::uint32_t v) { for (int s = 0; s < 32; s += 8) u8(std::uint8_t(v >> s)); return *this; }
    Bytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    Bytes& f32(float f) { std::uint32_t v; std::memcpy(&v, &f, 4); return u32(v); }
    Bytes& f64(double d) { std::uint64_t v; std::memcpy(&v, &d, 8); return u32(std::uint32_t(v)).u32(v >> 32); }
    Bytes& version(int v) { return u32(static_cast<std::uint32_t>(v) << 16); }
    Bytes& floats(Floats fs) { for (float f : fs) f32(f); return *this; }
    Bytes& ints(std::initializer_list<std::int32_t> is) { for (std::int32_t i : is) i32(i); return *this; }
    Bytes& flags(std::initializer_list<int> bs) { for (int b : bs) u8(std::uint8_t(b)); return *this; }
    // wstring: u32 byte length of the UTF-8 form, then the bytes.
    Bytes& wstr(const std::string& utf8) { u32(std::uint32_t(utf8.size())); for (char c : utf8) u8(c); return *this; }
    // Twelve floats: the three matrix rows, then the offset.
    Bytes& transform(const Transform& t) {
        for (const Vector& v : {t.m[0], t.m[1], t.m[2], t.offs}) floats({v.x, v.y, v.z});
        return *this;
    }
    // AnimatedTransform record: tag 0x10000, key count, time width 8, then
    // each key as f64 time and transform.
    Bytes& animated(const std::vector<std::pair<double, Transform>>& keys) {
        u32(0x10000).u32(std::uint32_t(keys.size())).u32(8);
        for (const auto& k : keys) f64(k.first).transform(k.second);
        return *this;
    }
    // TransformComponents record: tag, rotation, scale, offset (nine floats), mirrors.
    Bytes& components(Floats nine, int x, int y, int z) { return version(1).floats(nine).ints({x, y, z}); }
    Bytes& defaultComponents() { return components({0, 0, 0, 1, 1, 1, 0, 0, 0}, 0, 0, 0); }
    // GenPlanarWorldUVW or GenObjectUVW record: version 1, uvwTransform, components.
    Bytes& placement() { return version(1).transform(Transform()).defaultComponents(); }
    // Children, tag and record: a planar generator, an AColorTexture.
    Bytes& planar() { return i32(0).placement(); }
    Bytes& acolor(float r, float g, float b, float a) { return i32(5).version(1).floats({r, g, b, a}); }
    Bytes& append(const Bytes& o) { data.insert(data.end(), o.data.begin(), o.data.end()); return *this; }
    // A copy with the u32 at `at` replaced.
    Bytes with(std::size_t at, std::uint32_t v) const {
        Bytes b(*this);
        for (int i = 0; i < 4; ++i) b.data.at(at + i) = std::uint8_t(v >> (8 * i));
        return b;
    }
};

// Loads `bytes` into `object`; with `whole`, the load must read them all.
template <class T>
bool loads(T&& object, const Bytes& bytes, bool whole = false) {
    QuickArchive ar(bytes.data.data(), bytes.data.size());
    const bool ok = object.load(ar);
    if (whole) { EXPECT_EQ(ar.getReadPosition(), bytes.data.size()); }
    return ok;
}

// `object`, or a new T, after loading the whole of `bytes`.
template <class T, class P = boost::shared_ptr<T>>
P loaded(const Bytes& bytes, P object = boost::make_shared<T>()) {
    EXPECT_TRUE(loads(*object, bytes, true));
    return object;
}

// The bytes an object's save wrote, and whether it succeeded.
template <class T>
std::vector<std::uint8_t> savedBytes(const T& object, bool* ok = nullptr) {
    QuickArchive ar(1);
    const bool saved = object.save(ar);
    if (ok) *ok = saved;
    std::vector<std::uint8_t> bytes(static_cast<std::size_t>(ar.getWritePosition()));
    if (!bytes.empty()) ar.getRaw(bytes.data(), bytes.size());
    return bytes;
}

// The XML of writeXml as UTF-8, on a fresh writer or inside an Assets element;
// the writer's level must come back to where it was.
template <class T>
std::string xmlOf(T& object, const std::u16string& url, bool underAssets = false) {
    std::u16string out;
    AssetXmlWriter writer(out);
    if (underAssets) writer.openAssets();
    out.clear();
    const int level = writer.getIndent();
    object.writeXml(writer, url);
    EXPECT_EQ(level, writer.getIndent());
    return wideToUtf8(out);
}

// The golden document tests/<path>; EXPECT_EQ on it prints a line-by-line diff.
inline std::string golden(const std::string& path) {
    std::ifstream in(std::string(ORVXML_SOURCE_DIR) + "/tests/" + path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    EXPECT_FALSE(text.str().empty()) << "no golden document " << path;
    return text.str();
}

// Damaged copies of `bytes`, the record of `original`, loaded into objects
// from `make`: every cut ends the load (a cut in the version tag fails it),
// and so does every byte set to a few values; what then loads and saves other
// bytes must be unequal to `original`.
template <class Ptr, class Make>
void expectDamageHandled(const Ptr& original, const Bytes& bytes, Make make) {
    for (std::size_t cut = 0; cut < bytes.data.size(); ++cut) {
        Bytes part;
        part.data.assign(bytes.data.begin(), bytes.data.begin() + cut);
        EXPECT_TRUE(cut >= 3 || !loads(*make(), part)) << cut;
    }
    for (std::size_t i = 0; i < bytes.data.size(); ++i)
        for (std::uint8_t value : {0x00, 0x01, 0x0D, 0x7F, 0xFF}) {
            Bytes b = bytes;
            b.data[i] = value;
            Ptr other = make();
            EXPECT_FALSE(loads(*other, b) && savedBytes(*other) != bytes.data && original->isEqual(other)) << i;
        }
}

}  // namespace textest
