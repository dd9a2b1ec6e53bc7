#pragma once
// Shared by the material tests: hand-laid record bytes, small builders, round trips and the golden documents under
// golden/.
#include <gtest/gtest.h>

#include <algorithm>
#include <boost/make_shared.hpp>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <functional>
#include <sstream>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "xml/AssetXmlWriter.h"

namespace mattest {

using namespace OrvaneLumoCore;

// Little-endian values appended one by one, the way the archive stores them.
class RecordBytes {
public:
    RecordBytes& b8(bool v) { bytes_.push_back(v ? 1 : 0); return *this; }
    RecordBytes& u32(std::uint32_t v) {
        for (int i = 0; i < 4; ++i) bytes_.push_back(static_cast<char>(v >> (8 * i)));
        return *this;
    }
    RecordBytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    RecordBytes& version(int v) { return u32(static_cast<std::uint32_t>(v) << 16); }
    RecordBytes& f32(float v) { std::uint32_t bits; std::memcpy(&bits, &v, 4); return u32(bits); }
    RecordBytes& color(float r, float g, float b) { return f32(r).f32(g).f32(b); }
    RecordBytes& str(const std::string& utf8) {  // a wstring given as its UTF-8 bytes
        u32(static_cast<std::uint32_t>(utf8.size()));
        bytes_.insert(bytes_.end(), utf8.begin(), utf8.end());
        return *this;
    }
    // Base record of a material, version 2: name, uuid.
    RecordBytes& base(const std::string& name, const std::string& uuid = "") { return version(2).str(name).str(uuid); }
    // Optional texture member: an AColorTexture (tag 5, version 1: acolor) whose red channel marks it.
    RecordBytes& acolor(float red) { return b8(true).u32(5).version(1).f32(red).f32(0).f32(0).f32(1); }
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
            .version(4).str(name).b8(true).b8(false).b8(false).b8(false);
    }
    // A bare MaterialLayeredBRDF, version 4: no layers, four integers, base record, one integer.
    RecordBytes& layered(const std::string& name) {
        return u32(kMaterialLayeredBRDF).version(4).u32(0).i32(1).i32(0).i32(1).i32(1).base(name).i32(0);
    }

    const std::vector<char>& bytes() const { return bytes_; }
    std::size_t size() const { return bytes_.size(); }
    // An archive holding the bytes, the first `length` only if given.
    QuickArchive archive(std::size_t length = std::string::npos) const {
        return QuickArchive(bytes_.data(), length < bytes_.size() ? length : bytes_.size());
    }

private:
    std::vector<char> bytes_;
};

// The bytes that a save wrote, from the start of the archive.
inline std::vector<char> savedBytes(const QuickArchive& ar) {
    std::vector<char> out(static_cast<std::size_t>(ar.getWritePosition()));
    QuickArchive copy(ar);
    copy.setReadPosition(0);
    if (!out.empty()) copy.getRaw(out.data(), out.size());
    return out;
}

// Loads `bytes` into a new T; on success the record must be read to its end.
template <class T>
boost::shared_ptr<T> loaded(const RecordBytes& bytes, bool expectOk = true) {
    boost::shared_ptr<T> object(new T);
    QuickArchive ar = bytes.archive();
    EXPECT_EQ(object->load(ar), expectOk) << bytes.size() << " bytes";
    EXPECT_TRUE(!expectOk || ar.getReadPosition() == bytes.size()) << "the record was read to its end";
    return object;
}

// A hand-laid record of the class `tag`; a current one saves back to the same bytes.
struct Record {
    std::uint32_t tag;
    RecordBytes bytes;
    bool current;
};

// Loads each record into a new object of its class, which must read it to its end; a current one must save back the
// same bytes. Returns what `show` writes of each, given its label and bytes.
template <class Ptr>
std::string loadEach(const std::vector<Record>& records, Ptr (*make)(std::uint32_t),
                     const std::function<std::string(const Ptr&, const std::string&, const RecordBytes&)>& show) {
    std::string out;
    for (const Record& r : records) {
        const std::string what = "record " + std::to_string(&r - &records[0]);
        SCOPED_TRACE(what);
        const Ptr object = make(r.tag);
        QuickArchive ar = r.bytes.archive(), saved;
        EXPECT_TRUE(object->load(ar));
        EXPECT_EQ(ar.getReadPosition(), r.bytes.size());
        out += show(object, what, r.bytes);
        EXPECT_TRUE(!r.current || (object->save(saved) && savedBytes(saved) == r.bytes.bytes()));
    }
    return out;
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

// A layered material `name` with one default diffuse layer `layerName`.
inline boost::shared_ptr<MaterialLayeredBRDF> layered(const std::u16string& name, const std::u16string& layerName = u"Base") {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = name;
    m->brdfs.push_back(BrdfPtr(new Diffuse_BRDF));
    m->brdfs[0]->name = layerName;
    return m;
}

// A wrapper of class W (with a base_mtl) named `name` over `base`.
template <class W>
boost::shared_ptr<W> wrap(const MaterialPtr& base, const std::u16string& name = u"Wall") {
    boost::shared_ptr<W> w(new W);
    w->name = name, w->base_mtl = base;
    return w;
}
// A two-sided material of either class with its two children.
template <class T>
boost::shared_ptr<T> sided(const std::u16string& name, const MaterialPtr& front, const MaterialPtr& back) {
    boost::shared_ptr<T> m(new T);
    m->name = name, m->front = front, m->back = back;
    return m;
}
inline boost::shared_ptr<MaterialAngleBlend> blend(const std::u16string& name, const MaterialPtr& one, const MaterialPtr& two) {
    boost::shared_ptr<MaterialAngleBlend> m(new MaterialAngleBlend);
    m->name = name, m->mtl_one = one, m->mtl_two = two;
    return m;
}
inline boost::shared_ptr<MaterialReference> referenceTo(const std::u16string& uuid, const std::u16string& name = u"Ref",
                                                        const MaterialPtr& copy = MaterialPtr()) {
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->name = name, ref->target_uuid = uuid, ref->target = copy;
    return ref;
}

inline TexturePtr acolor(float r, float g, float b, float a = 1) {
    boost::shared_ptr<AColorTexture> t(new AColorTexture);
    t->color = AColor(r, g, b, a);
    return t;
}
inline TexturePtr bitmap(const std::u16string& path) { return makeBitmapTextureFromPath(path); }

template <class T>
std::string ownXml(T& object, const std::u16string& url = u"") {
    std::u16string out;
    AssetXmlWriter writer(out);
    object.writeXml(writer, url);
    return wideToUtf8(out);
}

// Compares `actual` with tests/materials/golden/<name>, naming the first line that differs. With ORVXML_UPDATE_GOLDEN
// set the file is written instead.
inline void expectGolden(const std::string& name, const std::string& actual) {
    const std::string path = ORVXML_SOURCE_DIR "/tests/materials/golden/" + name;
    if (std::getenv("ORVXML_UPDATE_GOLDEN")) std::ofstream(path, std::ios::binary) << actual;
    std::ifstream file(path, std::ios::binary);
    ASSERT_TRUE(file.is_open()) << path;
    const std::string expected((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
    const std::size_t at = std::mismatch(expected.begin(), expected.end(), actual.begin(), actual.end()).first - expected.begin();
    if (expected == actual) return;
    auto lineAt = [at](const std::string& text) {
        const std::size_t start = at == 0 ? 0 : text.rfind('\n', at - 1) + 1;
        return at >= text.size() ? "<end>" : text.substr(start, text.find('\n', start) - start);
    };
    ADD_FAILURE() << name << " line " << std::count(expected.begin(), expected.begin() + at, '\n') + 1
                  << "\n expected: " << lineAt(expected) << "\n actual:   " << lineAt(actual);
}

// Tests that use the scene table start with an empty one.
class TableTest : public ::testing::Test {
protected:
    void SetUp() override { table().clear(); }
    static SceneMaterials& table() { return *SceneMaterials::instance(); }
};

}  // namespace mattest
