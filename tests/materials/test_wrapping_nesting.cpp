// Deeply nested wrappers: records nested deeper than any real file fail to
// load cleanly, whatever wrapper class makes the chain, while chains within
// the limit load and convert.
#include <gtest/gtest.h>

#include <functional>
#include <sstream>

#include "materials/MaterialAssets.h"
#include "materials/RecordBytes.h"
#include "materials/SceneMaterials.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrapperAssets.h"
#include "persistence/OrvMatFile.h"
#include "persistence/Record.h"
#include "test_wrapping_util.h"

using namespace OrvaneLumoCore;
using namespace wraptest;
using testbytes::RecordBytes;

namespace {

class WrapperNesting : public ::testing::Test {
protected:
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override { SceneMaterials::instance()->clear(); }
};

RecordBytes& baseRecord(RecordBytes& b) { return b.version(2).str("N").str(""); }

// How one wrapper class lays its record around its (first) child: the bytes
// in front of the child's tag, whether a present flag stands there, and the
// bytes behind the child's record.
struct WrapperLayout {
    const char* what;
    std::uint32_t tag;
    bool presentFlag;
    std::function<void(RecordBytes&)> head;
    std::function<void(RecordBytes&)> tail;
};

const std::vector<WrapperLayout>& layouts() {
    static const std::vector<WrapperLayout> all = {
        // Bump 3: bump_tex_mult, bump_tex | base_mtl bare | base record.
        {"bump", kMaterialBump, false, [](RecordBytes& b) { b.version(3).f32(1).b8(false); },
         [](RecordBytes& b) { baseRecord(b); }},
        // Two-sided 1: front | back, translucency_tex, translucency, mult, force.
        {"two-sided", kMaterial2Sided, true, [](RecordBytes& b) { b.version(1); },
         [](RecordBytes& b) { b.b8(false).b8(false).color(0, 0, 0).f32(1).b8(false); }},
        // Skp two-sided 1: base record | front | back, force.
        {"skp two-sided", kMaterialSkp2Sided, true, [](RecordBytes& b) { baseRecord(b.version(1)); },
         [](RecordBytes& b) { b.b8(false).b8(false); }},
        // Linked 1: id (kind 2) | material bare | base record.
        {"linked", kMaterialLinked, false, [](RecordBytes& b) { b.version(1).version(1).u32(2).i32(7); },
         [](RecordBytes& b) { baseRecord(b); }},
        // Environment override 1: base record | base_mtl | four textures,
        // colours, multipliers, switches.
        {"environment", kMaterialOverrideEnvironment, true, [](RecordBytes& b) { baseRecord(b.version(1)); },
         [](RecordBytes& b) {
             for (int i = 0; i < 4; ++i) b.b8(false);
             for (int i = 0; i < 4; ++i) b.color(0, 0, 0);
             for (int i = 0; i < 4; ++i) b.f32(1);
             for (int i = 0; i < 4; ++i) b.b8(false);
         }},
        // Displaced 1: base record | base_mtl | displace_tex, mult.
        {"displaced", kMaterialDisplaced, true, [](RecordBytes& b) { baseRecord(b.version(1)); },
         [](RecordBytes& b) { b.b8(false).f32(1); }},
        // Object exclusion 3: mode | base_mtl | names, base record, short_circuit.
        {"exclusion", kMaterialObjectExclusion, true, [](RecordBytes& b) { b.version(3).i32(0); },
         [](RecordBytes& b) { baseRecord(b.u32(0)).b8(true); }},
        // Alpha contribution 1: base record | base_mtl | alpha_tex, two floats.
        {"alpha", kMaterialAlphaContribution, true, [](RecordBytes& b) { baseRecord(b.version(1)); },
         [](RecordBytes& b) { b.b8(false).f32(1).f32(1); }},
        // Angle blend 1: base record | mtl_one | mtl_two, two angles.
        {"angle blend", kMaterialAngleBlend, true, [](RecordBytes& b) { baseRecord(b.version(1)); },
         [](RecordBytes& b) { b.b8(false).f32(75).f32(150); }},
        // Reference 2: base record, target_uuid | embedded copy.
        {"reference", kMaterialReference, true, [](RecordBytes& b) { baseRecord(b.version(2)).str("t"); },
         [](RecordBytes&) {}},
        // Toon 2: base_mtl | the line fields, base record, silhouette fields.
        {"toon", kMaterialToon, true, [](RecordBytes& b) { b.version(2); },
         [](RecordBytes& b) {
             b.f32(1.5f).f32(1).b8(false).f32(1).f32(1).b8(false).f32(0).f32(1).b8(false);
             b.color(0, 0, 0).f32(1).b8(false).f32(0.95f).f32(0.02f).f32(0.7f).f32(1).b8(true).b8(false);
             baseRecord(b).b8(false).f32(1.5f);
         }},
    };
    return all;
}

// A chain of `depth` wrappers, level i of the class layouts()[pick(i)], over
// one layered material without layers. The record of the top, without its tag.
RecordBytes chain(int depth, const std::function<std::size_t(int)>& pick) {
    RecordBytes b;
    for (int i = 0; i < depth; ++i) {
        const WrapperLayout& w = layouts()[pick(i)];
        w.head(b);
        if (w.presentFlag) b.b8(true);
        b.u32(i + 1 < depth ? layouts()[pick(i + 1)].tag : kMaterialLayeredBRDF);
    }
    // MaterialLayeredBRDF 4: no layers, four integers, base record, one integer.
    baseRecord(b.version(4).u32(0).i32(1).i32(0).i32(1).i32(1)).i32(0);
    for (int i = depth; i-- > 0;) layouts()[pick(i)].tail(b);
    return b;
}

bool loadChain(const RecordBytes& bytes, std::uint32_t topTag, MaterialPtr* out = nullptr) {
    MaterialPtr top = createMaterial(topTag);
    QuickArchive ar = bytes.archive();
    const bool ok = top->load(ar);
    if (ok) {
        EXPECT_EQ(ar.getReadPosition(), bytes.size());
    }
    if (out) *out = top;
    return ok;
}

TEST_F(WrapperNesting, EveryWrapperClassStopsAtTheNestingLimit) {
    for (std::size_t k = 0; k < layouts().size(); ++k) {
        SCOPED_TRACE(layouts()[k].what);
        auto same = [k](int) { return k; };
        // The top record isn't nested; its child is one level deep, and so
        // on: the layered material at the bottom stands kMaxNestingDepth deep.
        EXPECT_TRUE(loadChain(chain(kMaxNestingDepth, same), layouts()[k].tag));
        EXPECT_FALSE(loadChain(chain(kMaxNestingDepth + 1, same), layouts()[k].tag));
        EXPECT_FALSE(loadChain(chain(1000, same), layouts()[k].tag));
    }
}

TEST_F(WrapperNesting, AThousandNestedWrappersInAFileFailToLoad) {
    // All classes mixed, a bump at the top.
    auto mixed = [](int i) { return static_cast<std::size_t>(i) % layouts().size(); };
    for (int depth : {100, 1000}) {
        const RecordBytes body = chain(depth, mixed);
        RecordBytes whole;
        whole.version(2).u32(1).u32(kMaterialBump).raw(body.bytes());  // header, the bump's tag
        const std::string file(whole.bytes().begin(), whole.bytes().end());
        OrvMatFile library;
        std::istringstream in(file);
        EXPECT_EQ(library.load(in), depth == 100) << depth;
        if (depth == 100) {
            // Within the limit the tree converts, flattened under the top.
            const std::string xml = wideToUtf8(materialToXml(library.materials[0]));
            EXPECT_EQ(countOf(xml, "layout=\"deflumat\""), 1);
            EXPECT_EQ(countOf(xml, "name=\"bump_on\""), 1);
        }
    }
}

TEST_F(WrapperNesting, AReferenceWhoseCopyHoldsAReference) {
    const std::size_t reference = 9;
    ASSERT_EQ(layouts()[reference].tag, kMaterialReference);
    auto refs = [reference](int) { return reference; };
    MaterialPtr top;
    ASSERT_TRUE(loadChain(chain(3, refs), kMaterialReference, &top));
    // Converted from the copy of the copy of the copy, under the innermost
    // reference's name.
    const std::string xml = wideToUtf8(materialToXml(top));
    EXPECT_EQ(countOf(xml, "url=\"/N\""), 1);
    EXPECT_FALSE(loadChain(chain(1000, refs), kMaterialReference));
}

TEST_F(WrapperNesting, AThousandWrappersBuiltInMemory) {
    // Saving works at any depth; loading the result fails at the limit.
    MaterialPtr tree = layered(u"Bottom");
    for (int i = 0; i < 1000; ++i) {
        boost::shared_ptr<MaterialBump> bump(new MaterialBump);
        bump->base_mtl = tree;
        tree = bump;
    }
    QuickArchive ar = savedArchive(*tree);
    EXPECT_FALSE(MaterialBump().load(ar));
    // The conversion still finds the layered material at this depth.
    const std::string xml = wideToUtf8(materialToXml(tree));
    EXPECT_EQ(countOf(xml, "layout=\"deflumat\""), 1);
}

}  // namespace
