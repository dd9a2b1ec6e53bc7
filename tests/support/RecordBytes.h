#pragma once
// Record bytes laid by hand, field by field, little-endian like the archive;
// the bytes a save writes; loads that must read a record to its end; damaged
// copies of a record. Shared by every test folder.
#include <gtest/gtest.h>

#include <boost/make_shared.hpp>
#include <cstdint>
#include <cstring>
#include <functional>
#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

#include "materials/BaseMaterial.h"
#include "materials/Base_BRDF.h"
#include "persistence/QuickArchive.h"
#include "values/Types.h"

namespace testsupport {

using namespace OrvaneLumoCore;

// A transform whose twelve numbers are base, base + 1, ... base + 11.
inline Transform countingTransform(float base) {
    return Transform(Matrix(Vector(base, base + 1, base + 2), Vector(base + 3, base + 4, base + 5),
                            Vector(base + 6, base + 7, base + 8)), Vector(base + 9, base + 10, base + 11));
}

struct RecordBytes {
    using Floats = std::initializer_list<float>;
    std::vector<std::uint8_t> data;

    // ---- plain values
    RecordBytes& u8(std::uint8_t v) { data.push_back(v); return *this; }
    RecordBytes& b8(bool v) { return u8(v ? 1 : 0); }
    RecordBytes& u32(std::uint32_t v) { for (int s = 0; s < 32; s += 8) u8(std::uint8_t(v >> s)); return *this; }
    RecordBytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    RecordBytes& f32(float f) { std::uint32_t v; std::memcpy(&v, &f, 4); return u32(v); }
    RecordBytes& f64(double d) { std::uint64_t v; std::memcpy(&v, &d, 8); return u32(std::uint32_t(v)).u32(v >> 32); }
    RecordBytes& vec(float x, float y, float z) { return f32(x).f32(y).f32(z); }
    RecordBytes& color(float r, float g, float b) { return vec(r, g, b); }
    RecordBytes& floats(Floats fs) { for (float f : fs) f32(f); return *this; }
    RecordBytes& ints(std::initializer_list<std::int32_t> is) { for (std::int32_t i : is) i32(i); return *this; }
    RecordBytes& flags(std::initializer_list<int> bs) { for (int b : bs) u8(std::uint8_t(b)); return *this; }
    // A record's tag: the version in the high half.
    RecordBytes& version(int v) { return u32(static_cast<std::uint32_t>(v) << 16); }
    // wstring: u32 byte length of the UTF-8 form, then the bytes.
    RecordBytes& wstr(const std::string& utf8) { u32(std::uint32_t(utf8.size())); for (char c : utf8) u8(c); return *this; }
    // Twelve floats: the three matrix rows, then the offset.
    RecordBytes& transform(const Transform& t) {
        for (const Vector& v : {t.m[0], t.m[1], t.m[2], t.offs}) vec(v.x, v.y, v.z);
        return *this;
    }
    RecordBytes& append(const std::vector<std::uint8_t>& more) { data.insert(data.end(), more.begin(), more.end()); return *this; }
    RecordBytes& append(const RecordBytes& more) { return append(more.data); }
    // A copy with the u32 at `at` replaced.
    RecordBytes with(std::size_t at, std::uint32_t v) const {
        RecordBytes b(*this);
        for (int i = 0; i < 4; ++i) b.data.at(at + i) = std::uint8_t(v >> (8 * i));
        return b;
    }

    // ---- animated values and placements
    // The head of an animated value's record: tag 0x10000, key count, time width 8.
    RecordBytes& keys(std::uint32_t count) { return u32(0x10000).u32(count).u32(8); }
    // AnimatedTransform record: the head, then each key as f64 time and transform.
    RecordBytes& animated(const std::vector<std::pair<double, Transform>>& all) {
        keys(std::uint32_t(all.size()));
        for (const auto& k : all) f64(k.first).transform(k.second);
        return *this;
    }
    // TransformComponents record: tag, rotation, scale, offset (nine floats), mirrors.
    RecordBytes& components(Floats nine, int x, int y, int z) { return version(1).floats(nine).ints({x, y, z}); }
    RecordBytes& defaultComponents() { return components({0, 0, 0, 1, 1, 1, 0, 0, 0}, 0, 0, 0); }
    // GenPlanarWorldUVW or GenObjectUVW record: version 1, uvwTransform, components.
    RecordBytes& placement() { return version(1).transform(Transform()).defaultComponents(); }

    // ---- children, tag and record
    // A planar generator; an AColorTexture.
    RecordBytes& planar() { return i32(0).placement(); }
    RecordBytes& acolor(float r, float g, float b, float a) { return i32(5).version(1).floats({r, g, b, a}); }
    // Optional texture member: an AColorTexture whose red channel marks it.
    RecordBytes& acolorMember(float red) { return b8(true).acolor(red, 0, 0, 1); }
    // Base record of a material, version 2: name, uuid.
    RecordBytes& base(const std::string& name, const std::string& uuid = "") { return version(2).wstr(name).wstr(uuid); }
    // A bare material (tag and record): an empty MaterialMulti, version 2 (count 0, base record).
    RecordBytes& multi(const std::string& name, const std::string& uuid = "") {
        return u32(kMaterialMulti).version(2).u32(0).base(name, uuid);
    }
    // The same as an optional material member.
    RecordBytes& multiMember(const std::string& name) { return b8(true).multi(name); }
    // A Diffuse_BRDF with its tag, version 4: colour `grey`, no textures, base record version 4 named `name`,
    // use_color_tex_alpha_as_transparency.
    RecordBytes& diffuse(const std::string& name, float grey) {
        return i32(kDiffuseBrdf).version(4).color(grey, grey, grey).color(0, 0, 0).f32(1).f32(1).b8(false).b8(false)
            .version(4).wstr(name).b8(true).b8(false).b8(false).b8(false);
    }
    // A bare MaterialLayeredBRDF, version 4: no layers, four integers, base record, one integer.
    RecordBytes& layered(const std::string& name) {
        return u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1).base(name).i32(0);
    }

    const std::vector<std::uint8_t>& bytes() const { return data; }
    std::size_t size() const { return data.size(); }
    // An archive holding the bytes, the first `length` only if given.
    QuickArchive archive(std::size_t length = std::string::npos) const {
        return QuickArchive(data.data(), length < data.size() ? length : data.size());
    }
};

// The bytes written to `ar`, from its start.
inline std::vector<std::uint8_t> writtenBytes(const QuickArchive& ar) {
    std::vector<std::uint8_t> out(static_cast<std::size_t>(ar.getWritePosition()));
    const std::size_t block = QuickArchive::kBlockSize;
    for (std::size_t i = 0; i < out.size(); ++i)
        out[i] = static_cast<std::uint8_t>((*ar.getBlock(i / block))[i % block]);
    return out;
}

// The bytes an object's save wrote, and whether it succeeded.
template <class T>
std::vector<std::uint8_t> savedBytes(const T& object, bool* ok = nullptr) {
    QuickArchive ar(1);
    const bool saved = object.save(ar);
    if (ok) *ok = saved;
    return writtenBytes(ar);
}

// Loads `bytes` into `object`; with `whole`, the load must read them all.
template <class T>
bool loads(T&& object, const RecordBytes& bytes, bool whole = false) {
    QuickArchive ar = bytes.archive();
    const bool ok = object.load(ar);
    if (whole) { EXPECT_EQ(ar.getReadPosition(), bytes.size()); }
    return ok;
}

// Loads the whole record and nothing behind it.
template <class T>
bool loadsWhole(T& object, const RecordBytes& bytes) {
    QuickArchive ar = bytes.archive();
    return object.load(ar) && ar.getReadPosition() == bytes.size();
}

// `object` after loading `bytes`: the load must give `expectOk`, and on success read the record to its end.
template <class P>
P loadedInto(P object, const RecordBytes& bytes, bool expectOk = true) {
    QuickArchive ar = bytes.archive();
    EXPECT_EQ(object->load(ar), expectOk) << bytes.size() << " bytes";
    EXPECT_TRUE(!expectOk || ar.getReadPosition() == bytes.size()) << "the record was read to its end";
    return object;
}
// The same into a new T.
template <class T>
boost::shared_ptr<T> loaded(const RecordBytes& bytes, bool expectOk = true) {
    return loadedInto(boost::make_shared<T>(), bytes, expectOk);
}

// `bytes` in hex for a golden list: four to a group, 32 to a line, each line
// indented by two spaces.
inline std::string hexLines(const std::vector<std::uint8_t>& bytes) {
    static const char digits[] = "0123456789abcdef";
    std::string out;
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        out += i % 32 == 0 ? "  " : i % 4 == 0 ? " " : "";
        out += digits[bytes[i] >> 4];
        out += digits[bytes[i] & 15];
        if (i % 32 == 31 || i + 1 == bytes.size()) out += '\n';
    }
    return out;
}

// How an old record saves, for a golden list: `object` (which held a newest
// record) reads `old` to its end, `settle` gives it what the old record can't
// hold and leaves to chance (an id), and it saves; a fresh object from `make`
// reads the saved record to its end and equals it. Returns `label` and the
// saved bytes in hex, four to a group, 32 to a line.
template <class Ptr, class Make>
std::string savedFromOld(const std::string& label, const Ptr& object, const RecordBytes& old, Make make,
                         const std::function<void()>& settle = nullptr) {
    std::string out = label + "\n";
    if (!loadsWhole(*object, old)) return out + "  (not read to its end)\n";
    if (settle) settle();
    bool ok = false;
    const RecordBytes saved{savedBytes(*object, &ok)};
    const auto back = make();
    EXPECT_TRUE(ok && loadsWhole(*back, saved) && back->isEqual(object)) << label;
    return out + hexLines(saved.data);
}

// `value` saves as `laid`, and `laid` loaded into `other` gives `value`.
template <class T>
void expectRecord(const T& value, T other, const RecordBytes& laid) {
    EXPECT_EQ(savedBytes(value), laid.bytes());
    ASSERT_TRUE(loadsWhole(other, laid));
    EXPECT_EQ(other, value);
}

// Saves `object` and loads the bytes into a fresh object of the same class.
template <class T>
boost::shared_ptr<T> roundTrip(const T& object) {
    QuickArchive ar;
    EXPECT_TRUE(object.save(ar));
    boost::shared_ptr<T> copy(new T);
    EXPECT_TRUE(copy->load(ar));
    EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition()) << "the record was read to its end";
    return copy;
}

}  // namespace testsupport
