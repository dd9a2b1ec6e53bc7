#pragma once
// Shared by the material tests: records of several classes loaded in one go, and small builders of material trees.
#include <gtest/gtest.h>

#include <functional>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "support/Golden.h"
#include "support/RecordBytes.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"

namespace mattest {

using namespace OrvaneLumoCore;
using namespace testsupport;

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
        EXPECT_TRUE(!r.current || (object->save(saved) && writtenBytes(saved) == r.bytes.bytes()));
    }
    return out;
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

// Tests that use the scene table start with an empty one.
class TableTest : public ::testing::Test {
protected:
    void SetUp() override { table().clear(); }
    static SceneMaterials& table() { return *SceneMaterials::instance(); }
};

}  // namespace mattest
