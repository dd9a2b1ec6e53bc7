// One table of the classes that the factories make and the records around them: textures, UVW generators, bitmaps,
// BRDF layers, materials, lights, the camera, animated values and the option records. Each row holds the newest record
// of its class as a populated object saves it, and says what the class does with that record damaged: cut short,
// under a refused version tag, with a nested record or a member refused, with any byte overwritten, nested too deep.
#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <map>
#include <set>
#include <type_traits>

#include "animation/Camera.h"
#include "animation/TransformComponents.h"
#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"
#include "materials/RecordLists.h"
#include "materials/SceneMaterials.h"
#include "options/OptionBytes.h"
#include "persistence/Record.h"
#include "support/LightFixtures.h"
#include "support/TextureRecords.h"
#include "textures/SkyTexture.h"

using namespace OrvaneLumoCore;
using namespace testsupport;

namespace {

typedef std::vector<std::uint8_t> Bytes;

// What a refused version tag leaves of an object that held the newest record: a new object's state; what the class's
// reset leaves of it (the wrapping materials keep their name, the options their carried floats); the state it had;
// that state with the base part of a layer new (a glass layer resets only that before it reads).
enum class Left { New, Reset, Loaded, NewBase };

// The class's own comparison: isEqual, else ==, else none.
template <class P>
auto same(const P& a, const P& b, int) -> decltype(bool(a->isEqual(b))) { return a->isEqual(b); }
template <class P>
auto same(const P& a, const P& b, long) -> decltype(bool(*a == *b)) { return *a == *b; }
template <class P>
bool same(const P&, const P&, ...) { return false; }

template <class T>
auto resetOf(T& o, int) -> decltype(o.reset()) { o.reset(); }
template <class T>
void resetOf(T&, long) { ADD_FAILURE() << "no reset"; }

template <class T>
void leave(T& o, Left left) {
    if constexpr (std::is_base_of<Base_BRDF, T>::value) {
        if (left == Left::NewBase) o.Base_BRDF::reset();
    }
    if (left == Left::Reset) resetOf(o, 0);
}

// The bytes a save writes; empty when the save fails.
template <class T>
Bytes savedOrNone(const T& o) {
    bool ok = false;
    const Bytes bytes = savedBytes(o, &ok);
    return ok ? bytes : Bytes();
}

// What a load into a new object gave.
struct Loaded {
    bool ok, whole, sound, unwound;  // read to the end; holds what must hold after any load; back at nesting depth 0
    bool equal, equalBack;  // the row's object equals it; it equals the row's object
    Bytes saved, compared;  // what it saves, without the fields outside the comparison
};

// Where `part` stands in `in`.
std::vector<std::size_t> offsetsOf(const RecordBytes& in, const RecordBytes& part) {
    std::vector<std::size_t> all;
    for (auto at = in.data.begin(); (at = std::search(at, in.data.end(), part.data.begin(), part.data.end())) != in.data.end(); ++at)
        all.push_back(static_cast<std::size_t>(at - in.data.begin()));
    return all;
}
std::size_t offsetOf(const RecordBytes& in, const RecordBytes& part) {
    const std::vector<std::size_t> all = offsetsOf(in, part);
    return all.empty() ? std::string::npos : all[0];
}

struct Row {
    std::string name;
    RecordBytes record;                  // the newest record, as a populated object saves it
    std::uint32_t type = 0;              // the type tag of a class that a factory makes
    std::function<Loaded(const RecordBytes&)> load;
    // After a refused `tag`: the state of the object, and the state the class's rule gives.
    std::function<std::pair<Bytes, Bytes>(std::uint32_t tag)> refuse;
    std::vector<std::uint32_t> refused;  // refused version tags; by default 0, the newest + 1, the low half set, all ones
    std::vector<std::size_t> inner;      // where the version tags of nested records stand
    std::vector<RecordBytes> fails;      // damaged records that fail: members without a class, huge counts, ...
    std::size_t cutsFail = 3;            // every cut shorter than this fails
    RecordBytes nest;                    // a member of the row's own family, as the record holds it
    int depth = 0;                       // how many levels the records of the record's members go down
    bool comparesAll = true;             // whether every field of the record takes part in the comparison
    Bytes compared;                      // the record without the fields outside the comparison, if the row knows them

    Row& inside(const std::vector<std::size_t>& at) { inner.insert(inner.end(), at.begin(), at.end()); return *this; }
    Row& failing(const std::vector<RecordBytes>& r) { fails.insert(fails.end(), r.begin(), r.end()); return *this; }
    Row& nests(const RecordBytes& member, int levels) { nest = member, depth = levels; return *this; }
    Row& comparesSome() { comparesAll = false; return *this; }
    // `copies` records of the class, each the member of the one before, the last with the member it holds.
    RecordBytes chain(int copies) const {
        const std::size_t at = offsetOf(record, nest);
        RecordBytes b;
        for (int i = 0; i < copies; ++i) {
            b.append(Bytes(record.data.begin(), record.data.begin() + at));
            if (i + 1 < copies) b.u32(type);
        }
        b.append(nest);
        for (int i = 0; i < copies; ++i) b.append(Bytes(record.data.begin() + at + nest.size(), record.data.end()));
        return b;
    }
};

// The row of the class that `make` creates, whose record is what the object saves after reading `laid`. `settle`
// fixes what the class leaves to chance (a new id) before two states compare; `sound` holds after any load; `outside`
// clears the fields outside the comparison.
template <class T>
Row row(const std::string& name, std::function<boost::shared_ptr<T>()> make, const RecordBytes& laid, Left left = Left::New,
        std::function<void(T&)> settle = nullptr, std::function<bool(T&)> sound = nullptr,
        std::function<void(T&)> outside = nullptr) {
    const boost::shared_ptr<T> original = make();
    EXPECT_TRUE(loadsWhole(*original, laid)) << name;
    Row r;
    r.name = name, r.record.data = savedOrNone(*original);
    const std::uint32_t v = r.record.size() < 4 ? 0 : std::uint32_t(r.record.data[2] | r.record.data[3] << 8);
    r.refused = {0u, (v + 1) << 16, v << 16 | 1, 0xFFFFFFFFu};
    r.load = [=](const RecordBytes& bytes) {
        const boost::shared_ptr<T> o = make();
        QuickArchive ar = bytes.archive();
        const bool ok = o->load(ar);
        Loaded l{ok, ar.getReadPosition() == bytes.size(), !sound || sound(*o), ar.nestingDepth == 0,
                 same(original, o, 0), same(o, original, 0), savedOrNone(*o), {}};
        if (outside) outside(*o), l.compared = savedOrNone(*o);
        return l;
    };
    if (outside) r.compared = r.load(r.record).compared;
    const RecordBytes record = r.record;
    r.refuse = [=](std::uint32_t tag) {
        const boost::shared_ptr<T> o = make(), expected = make();
        loads(*o, record);
        if (left != Left::New) loads(*expected, record);
        leave(*expected, left);
        EXPECT_FALSE(loads(*o, record.with(0, tag)));
        if (settle) settle(*o), settle(*expected);
        return std::make_pair(savedOrNone(*o), savedOrNone(*expected));
    };
    // An optional texture member that the record holds, an AColorTexture: its tag without a class, its version refused.
    const std::size_t member = offsetOf(r.record, RecordBytes().b8(true).i32(5).version(1));
    if (member != std::string::npos) r.inside({member + 5}).failing({r.record.with(member + 1, 13)});
    return r;
}
template <class P, class Tag>
Row factoryRow(const std::string& name, P (*create)(Tag), Tag tag, const RecordBytes& laid, Left left = Left::New) {
    Row r = row<typename P::element_type>(name, [=] { return create(tag); }, laid, left);
    r.type = std::uint32_t(tag);
    return r;
}
template <class T>
Row plainRow(const std::string& name, const T& prototype, const RecordBytes& laid) {
    return row<T>(name, [=] { return boost::make_shared<T>(prototype); }, laid);
}

void addTextures(std::vector<Row>& rows) {
    // The members to nest, and how many levels a record's members go down.
    const std::map<std::string, std::pair<RecordBytes, int>> nesting = {
        {"blend.xml", {RecordBytes().acolor(1, 0, 0, 1), 1}},      {"invert.xml", {RecordBytes().acolor(1, 1, 1, 1), 1}},
        {"fresnel.xml", {RecordBytes().acolor(1, 1, 0, 0), 2}},    {"noise.xml", {RecordBytes().acolor(0.2f, 0.4f, 0.6f, 0.8f), 2}},
        {"grid.xml", {RecordBytes().acolor(1, 0, 0, 1), 2}},       {"checker.xml", {RecordBytes().acolor(0.9f, 0.9f, 0.9f, 1), 2}},
        {"ramp.xml", {RecordBytes().acolor(0.5f, 0.25f, 0.75f, 1), 2}}};
    for (const TextureRow& t : textureRows()) {
        Row r = factoryRow(std::string("texture ") + t.golden, createTexture, t.tag, t.bytes);
        // A member's tag without a class; in the bitmap also the generator's.
        if (t.inner) r.inside({t.inner});
        if (t.child) r.failing({t.bytes.with(t.child, 13)});
        if (t.tag == 0) r.failing({t.bytes.with(4, 2)});
        if (nesting.count(t.golden)) r.nests(nesting.at(t.golden).first, nesting.at(t.golden).second);
        rows.push_back(r);
        // The generator of a UVWTexture, whose records end with the components records (52 bytes, the channel's two);
        // the buffer of a BitmapTexture.
        const TexturePtr texture = loadedInto(createTexture(t.tag), t.bytes);
        if (auto uvw = boost::dynamic_pointer_cast<UVWTexture>(texture)) {
            const RecordBytes generator{savedBytes(*uvw->uvw)};
            const std::int32_t type = std::int32_t(uvw->uvw->getType());
            rows.push_back(factoryRow(std::string("generator ") + t.golden, createUVW, type, generator).inside({generator.size() - 52}));
            if (type == 4) rows.back().inside({generator.size() - 104});
        }
        if (auto bitmap = boost::dynamic_pointer_cast<BitmapTexture>(texture))
            rows.push_back(factoryRow("bitmap buffer", createBitmap, 0, RecordBytes{savedBytes(*bitmap->bitmap)}));
    }
    // The sky: its own sun and the suns' and the sky's transforms are nested records; the document sun's record takes
    // no part in the comparison. A load never leaves it without a sun.
    const RecordBytes sky{savedBytes(SkyTexture())};
    rows.push_back(row<SkyTexture>("texture sky", [] { return boost::static_pointer_cast<SkyTexture>(createTexture(12)); }, sky,
                                   Left::New,
                                   [](SkyTexture& s) {
                                       s.skyId.clear();
                                       if (s.sun != documentSun()) static_cast<SunLight&>(*s.sun).id.clear();
                                   },
                                   [](SkyTexture& s) { return static_cast<bool>(s.sun); })
                       .inside({5}).inside(offsetsOf(sky, RecordBytes().keys(1))).comparesSome());
}

void addLayers(std::vector<Row>& rows) {
    for (const mattest::Record& l : mattest::layerRecords()) {
        // Blinn_BRDF reads and saves the glossy record as Phong_BRDF does.
        for (std::uint32_t tag : {l.tag, l.tag == kPhongBrdf ? std::uint32_t(kBlinnBrdf) : 0u}) {
            if (!l.current || !tag) continue;
            // The base record: version 4, the name, the flags. It takes no part in the comparison.
            Row r = row<Base_BRDF>("layer " + std::to_string(tag), [tag] { return createBrdf(tag); }, l.bytes,
                                   tag == kGlassBrdf ? Left::NewBase : Left::New, nullptr, nullptr, [](Base_BRDF& b) {
                                       b.name.clear(), b.layer_flag_a = b.layer_flag_b = b.layer_flag_c = false;
                                   });
            for (const char* name : {"Clear", "Gloss", "Shiny", "Matte", "Lamp"})
                for (std::size_t at : offsetsOf(r.record, RecordBytes().version(4).wstr(name))) r.inside({at});
            rows.push_back(r.comparesSome());
        }
    }
}

void addMaterials(std::vector<Row>& rows) {
    // The members to nest: the first material member of each class that holds one.
    const std::map<std::uint32_t, RecordBytes> nested = {
        {kMaterialMulti, RecordBytes().multi("Inner")},           {kMaterial2Sided, RecordBytes().multi("B")},
        {kMaterialSkp2Sided, RecordBytes().multi("F")},           {kMaterialBump, RecordBytes().multi("Base")},
        {kMaterialOverrideEnvironment, RecordBytes().layered("Base")}, {kMaterialDisplaced, RecordBytes().layered("Base")},
        {kMaterialObjectExclusion, RecordBytes().multi("Base")}, {kMaterialAngleBlend, RecordBytes().multi("Two")},
        {kMaterialAlphaContribution, RecordBytes().multi("Base")}, {kMaterialToon, RecordBytes().multi("Base")},
        {kMaterialLinked, RecordBytes().multi("Inside")},       {kMaterialReference, RecordBytes().multi("Copy", "t")}};
    // A reference saves the table's material of its target uuid as its embedded copy.
    SceneMaterials::instance()->addMaterial(loadedInto(createMaterial(kMaterialMulti), RecordBytes().version(2).u32(0).base("Copy", "t")));
    // Records that fail for what they hold: tags without a class, huge counts, a refused base or id record.
    const std::multimap<std::uint32_t, RecordBytes> failing = {
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(1).i32(3)},             // layer tag 3
        {kMaterialLayeredBRDF, RecordBytes().version(4).u32(0xFFFFFFFF)},           // layer count
        {kMaterialSingleBRDF, RecordBytes().version(2).i32(0).i32(0).i32(64)},      // layer tag 64
        {kMaterialObjectExclusion, RecordBytes().version(3).i32(0).b8(false).u32(0x7FFFFFFF)},  // name count
        {kMaterialReference, RecordBytes().version(2).base("R").wstr("t").b8(true).u32(99)},  // copy, tag 99
        {kMaterialReference, RecordBytes().version(2).version(3).wstr("X").wstr("").wstr("t").b8(false)},  // base record
        {kMaterialLinked, RecordBytes().version(1).version(2).u32(2).i32(1).multi("Inside")},  // id tag
        {kMaterialLinked, RecordBytes().version(1).version(1).u32(3).i32(0).multi("Inside").base("L")}};  // id kind 3
    // What a refused tag leaves: these classes start from their defaults, these from what reset leaves (the name),
    // the others from what they held.
    const std::set<std::uint32_t> fresh = {kMaterialLayeredBRDF, kMaterialLinked};
    const std::set<std::uint32_t> reset = {kMaterialOverrideEnvironment, kMaterialDisplaced, kMaterialObjectExclusion,
                                           kMaterialAlphaContribution, kMaterialAngleBlend, kMaterialToon};
    for (std::uint32_t tag = 0; tag < kMaterialTagCount; ++tag) {
        const mattest::Record* newest = nullptr;
        for (const mattest::Record& m : mattest::records()) newest = m.tag == tag ? &m : newest;
        Row r = factoryRow("material " + std::to_string(tag), createMaterial, tag, newest->bytes,
                           fresh.count(tag) ? Left::New : reset.count(tag) ? Left::Reset : Left::Loaded);
        if (nested.count(tag)) r.nests(nested.at(tag), 1);
        for (auto f = failing.lower_bound(tag); f != failing.upper_bound(tag); ++f) r.failing({f->second});
        // A layered record cut anywhere up to its base record's tag fails: what lies behind the end reads as zeros,
        // and the base record's tag then has no valid version. (Behind that tag zeros pass as an empty name.)
        if (tag == kMaterialLayeredBRDF) r.cutsFail = r.record.size() - 20;
        rows.push_back(r.comparesSome());  // names and uuids take no part in the comparison
    }
}

void addLights(std::vector<Row>& rows) {
    using namespace lighttest;
    // The direct light and the sun end with a transform record of two keys: its tag, and a key count too large.
    const RecordBytes direct = directV4(), sun = sunV4();
    rows.push_back(factoryRow("light 0", createLight, 0, direct).inside({direct.size() - 124})
                       .failing({direct.with(direct.size() - 120, 0x7FFFFFFF)}));
    const std::pair<std::int32_t, RecordBytes> newest[] = {{2, omniV4()}, {3, rectangleV4()}, {4, spotV4()}, {6, iesV3()}};
    for (const auto& n : newest) rows.push_back(factoryRow("light " + std::to_string(n.first), createLight, n.first, n.second));
    rows.push_back(row<SunLight>("light 5", [] { return boost::static_pointer_cast<SunLight>(createLight(5)); }, sun, Left::New,
                                 [](SunLight& s) { s.id.clear(); }).inside({sun.size() - 124}));
    rows.push_back(factoryRow("light 7", createLight, 7, RecordBytes{savedBytes(SphereLight())}));
    rows.push_back(plainRow("dome light", DomeLight(), RecordBytes{savedBytes(DomeLight())}));
}

void addAnimation(std::vector<Row>& rows) {
    // Animated values keyed at 0 (reset's key) and 2: tag, count, time width, (the interpolation flag,) the keys.
    // Refused: a count larger than the archive, time widths other than 8.
    AnimatedReal real(true);
    AnimatedInt integer(false);
    AnimatedTransform transform;
    real.setValue(4.0f, 2.0), integer.setValue(4, 2.0), transform.setValue(countingTransform(2), 2.0);
    for (Row r : {plainRow("animated real", AnimatedReal(true), RecordBytes{savedBytes(real)}),
                  plainRow("animated int", AnimatedInt(false), RecordBytes{savedBytes(integer)}),
                  plainRow("animated transform", AnimatedTransform(), RecordBytes{savedBytes(transform)})})
        rows.push_back(r.failing({r.record.with(4, 0xFFFFFFFFu), r.record.with(8, 4), r.record.with(8, 0)}));
    TransformComponents components;
    components.scale = Vector(2, 3, 4);
    rows.push_back(plainRow("transform components", TransformComponents(), RecordBytes{savedBytes(components)}));
    // The camera: type, film_width, then focal_length's record. The render view: the rectangles and the image size,
    // then viewAngle's record; cameraTransform's record last.
    const RecordBytes camera{savedBytes(PhysicalCamera())}, view{savedBytes(RenderView())};
    rows.push_back(factoryRow("camera 0", createCamera, 0, camera).inside({12}).failing({camera.with(16, 0xFFFFFFFFu)}));
    const std::size_t last = offsetsOf(view, RecordBytes().keys(1)).back();
    rows.push_back(plainRow("render view", RenderView(), view).inside({44, last}).failing({view.with(last + 4, 0xFFFFFFFFu)}));
}

void addOptions(std::vector<Row>& rows) {
    using namespace opttest;
    rows.push_back(plainRow("params", OrvaneParams(), paramsRecord(5)));
    rows.push_back(plainRow("frame data", OrvaneFrameData(), rowsRecord(kFrame, kFrameRowTypes)));
    rows.push_back(plainRow("stamp info", OrvaneLFBStampInfo(), stampV1Record()));
    // A whole document with two textures; the versions 10 to 15 don't exist, and its tag has 1 in the low half. A
    // count of four billion fails at once: the channels' (records with and without an entry differ first there) and
    // the camera's focal length keys. The document writes whatever a load left.
    AllOptions source;
    EXPECT_TRUE(loadsWhole(source, documentRecord(23, {100, 101, 102})));
    source.giTexture.reset(new AColorTexture());
    source.reflectTexture = loadedInto(createTexture(9), RecordBytes().version(1).acolor(1, 1, 1, 1).u8(1));
    const RecordBytes empty = documentRecord(23, {}), one = documentRecord(23, {100});
    const std::size_t channels = std::mismatch(empty.data.begin(), empty.data.end(), one.data.begin()).first - empty.data.begin();
    Row r = row<AllOptions>("options", [] { return boost::make_shared<AllOptions>(); }, RecordBytes{savedBytes(source)},
                            Left::Reset, nullptr, [](AllOptions& o) { return !documentXml(o).empty(); });
    r.refused = {documentTag(10), documentTag(15), documentTag(24), tag(23), tag(0), tag(5) | 2};
    rows.push_back(r.failing({empty.with(channels, 0xFFFFFFFFu), r.record.with(offsetOf(r.record, RecordBytes().keys(1)) + 4, 0xFFFFFFFFu)}));
}

std::vector<Row> rows() {
    std::vector<Row> all;
    for (auto family : {addTextures, addLayers, addMaterials, addLights, addAnimation, addOptions}) family(all);
    EXPECT_EQ(all.size(), 60u);
    return all;
}

// The document sun and the scene table belong to the process: a sky record changes one, a material's name the other.
class RecordDamage : public ::testing::Test {
    const Bytes documentSun_ = savedBytes(*documentSun());
    void SetUp() override { SceneMaterials::instance()->clear(); }
    void TearDown() override {
        loads(*documentSun(), RecordBytes{documentSun_});
        SceneMaterials::instance()->clear();
    }
};

}  // namespace

// A record cut short never loads as a whole record: what lies behind the end is read as nothing, and the read goes
// past the end. Cuts in the version tag, or wherever the row says, fail.
TEST_F(RecordDamage, EveryCutEndsTheLoadQuietly) {
    for (const Row& r : rows()) {
        EXPECT_TRUE(r.load(r.record).ok && r.load(r.record).saved == r.record.data) << r.name;
        for (std::size_t cut = 0; cut < r.record.size(); ++cut) {
            const Loaded l = r.load(RecordBytes{Bytes(r.record.data.begin(), r.record.data.begin() + cut)});
            EXPECT_TRUE((cut >= r.cutsFail || !l.ok) && !(l.ok && l.whole) && l.sound) << r.name << " cut at " << cut;
        }
    }
}

TEST_F(RecordDamage, RefusedVersionTagsFailAndLeaveWhatTheClassSays) {
    for (const Row& r : rows())
        for (std::uint32_t bad : r.refused) {
            SCOPED_TRACE(r.name + " tag " + std::to_string(bad));
            const std::pair<Bytes, Bytes> left = r.refuse(bad);
            EXPECT_EQ(left.first, left.second);
        }
}

TEST_F(RecordDamage, RefusedNestedRecordsAndMembersFail) {
    for (const Row& r : rows()) {
        for (std::size_t at : r.inner) {
            const std::uint32_t tag = std::uint32_t(r.record.data.at(at + 2)) << 16;
            for (std::uint32_t bad : {0u, tag | 1, tag + 0x10000, 0xFFFFFFFFu})
                EXPECT_FALSE(r.load(r.record.with(at, bad)).ok) << r.name << " at " << at << " tag " << std::hex << bad;
        }
        for (const RecordBytes& f : r.fails) EXPECT_FALSE(r.load(f).ok) << r.name << " damaged record " << &f - &r.fails[0];
    }
}

// Each byte set to a few values: the load ends, and what then loads and saves other bytes is unequal to the object of
// the whole record; where a row knows the fields outside the comparison, what reads the whole record is equal exactly
// when it differs only there.
TEST_F(RecordDamage, OverwrittenBytesNeverCrashOrCompareEqual) {
    for (const Row& r : rows())
        for (std::size_t i = 0; i < r.record.size(); ++i)
            for (std::uint8_t value : {0x00, 0x01, 0x0D, 0x7F, 0xFF}) {
                RecordBytes b = r.record;
                b.data[i] = value;
                const Loaded l = r.load(b);
                EXPECT_TRUE(l.sound && !(r.comparesAll && l.ok && l.saved != r.record.data && l.equal)) << r.name << " byte " << i;
                const bool equal = l.compared == r.compared;
                EXPECT_TRUE(r.compared.empty() || !l.ok || !l.whole || (l.equal == equal && l.equalBack == equal))
                    << r.name << " byte " << i;
            }
}

// Records of the class nested in one another: the innermost copy's members go `depth` levels below it; up to
// kMaxNestingDepth levels load, one more fails, and so do thousands, without running out of stack. A member's tag
// without a class (15 has none in either family) fails.
TEST_F(RecordDamage, NestingStopsAtTheLimit) {
    int nesting = 0;
    for (const Row& r : rows()) {
        if (r.nest.data.empty()) continue;
        ++nesting;
        ASSERT_NE(offsetOf(r.record, r.nest), std::string::npos) << r.name;
        const int most = kMaxNestingDepth + 1 - r.depth;
        for (int copies : {1, most, most + 1, 5000}) {
            const Loaded l = r.load(r.chain(copies));
            EXPECT_EQ(std::make_tuple(l.ok, l.ok && l.whole, l.unwound), std::make_tuple(copies <= most, copies <= most, true))
                << r.name << " " << copies;
        }
        EXPECT_FALSE(r.load(r.record.with(offsetOf(r.record, r.nest), 15)).ok) << r.name;
    }
    EXPECT_EQ(nesting, 19);
}
