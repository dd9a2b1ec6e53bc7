// Records of every texture, UVW generator and bitmap class: the newest
// versions against golden documents, the old versions, damaged records,
// copies and comparisons.
#include <gtest/gtest.h>

#include "TextureTestUtil.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;
using namespace textest;

namespace {

// The newest record of every class, with a distinct value in each field, as
// a texture (generators inside a UVWTexture, the buffer inside a
// BitmapTexture). `child` is the offset of a child's tag, `inner` that of a
// nested record's version tag (0: none).
struct Row {
    const char* name;
    int tag;
    Bytes bytes;
    const char* golden;
    std::size_t child, inner;
};

std::vector<Row> rows() {
    const Bytes buffer = Bytes().version(1).i32(2).f32(0.5f).f32(2.2f).wstr("C:\\maps\\\xC3\xA9t\xC3\xA9.png");
    return {
        // FresnelTexture 2: whiteInverse, blackInverse, fresnel_ior, refract_ior,
        // four multipliers, four optional children.
        {"fresnel", 1, Bytes().version(2).floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 1.3f, 1.7f, 2, 3, 4, 5})
             .u8(0).u8(1).acolor(0.5f, 0.25f, 0, 1).u8(0).u8(1).acolor(1, 1, 0, 0), "fresnel.xml", 54, 58},
        // BlendTexture 2: color_a, color_b (optional children, each with its
        // multiplier behind it if present), blend_amount.
        {"blend", 10, Bytes().version(2).u8(1).acolor(1, 0, 0, 1).f32(2).u8(1).acolor(0, 0, 1, 1).f32(0.25f).f32(0.125f),
         "blend.xml", 5, 9},
        // InvertTexture 1: texture (tag and record), invert_alpha. Here a blend
        // without color_a, and so without its multiplier.
        {"invert", 9, Bytes().version(1).i32(10).version(2).u8(0).u8(1).acolor(0, 0, 1, 1).f32(0.25f).f32(0.125f).u8(1),
         "invert_blend.xml", 4, 8},
        // AColorTexture 1: the acolor.
        {"acolor", 5, Bytes().version(1).floats({0.25f, 0.5f, 0.75f, 0.125f}), "acolor.xml", 0, 0},
        // UVWTexture 1: generator tag and record. GenPlanarWorldUVW and
        // GenObjectUVW 1: uvwTransform, components record.
        {"planar", 2, Bytes().version(1).i32(0).version(1).floats({1, 0, 0, 0, 1, 0, 0, 0, 1, 7, 8, 9})
             .components({0, 0, 0, 2, 2, 2, 1, 1, 1}, 0, 0, 0), "uvw_planar.xml", 4, 60},
        {"object", 2, Bytes().version(1).i32(1).version(1).floats({1, 0, 0, 0, 1, 0, 0, 0, 1, 7, 8, 9})
             .components({0, 0, 0, 2, 3, 4, 1, 1, 1}, 1, 0, 0), "uvw_object.xml", 4, 8},
        // GenEnvironmentUVW 2: uvw_matrix, mapping_type, components record.
        {"environment", 2, Bytes().version(1).i32(3).version(2).floats({0, 1, 0, 1, 0, 0, 0, 0, -1}).i32(0)
             .components({0, 0, 45, 1, 1, 1, 0, 0, 0}, 0, 1, 0), "uvw_environment.xml", 4, 8},
        // GenChannelUVW 2: uvwTransform, texTransform, wrap_u, wrap_v,
        // uvw_channel, uvwComponents, texComponents. XML shows the components.
        {"channel", 2, Bytes().version(1).i32(4).version(2).floats({1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12})
             .floats({3, 0, 0, 0, 3, 0, 0, 0, 3, 100, 100, 100}).ints({1, 0, 2})
             .components({10, 20, 30, 1, 2, 3, 4, 5, 6}, 1, 0, 1)
             .components({15, 25, 35, 1, 2, 3, 4, 5, 6}, 1, 0, 0), "uvw_channel.xml", 4, 8},
        // BitmapTexture 1: uvw tag, bitmap tag, uvw record, bitmap record,
        // tile. BitmapBuffer 1: filter_type, filter_blur, gamma, file.
        {"bitmap", 0, Bytes().version(1).ints({0, 0}).placement().append(buffer).u8(0), "bitmap.xml", 8, 116},
        // RampTexture 1: uvw, colors, positions, u_wave, v_wave, type, interpolation.
        {"ramp", 11, Bytes().version(1).planar().acolor(0.5f, 0.25f, 0.75f, 1).floats({0.25f, 0.5f, 0.75f})
             .ints({2, 3}), "ramp.xml", 4, 116},
        // BulgeTexture 1: uvw, u_width, v_width.
        {"bulge", 8, Bytes().version(1).planar().floats({0.2f, 0.3f}), "bulge.xml", 4, 8},
        // GridTexture 2: uvw, line_color, fill_color, lineColorMult,
        // fillColorMult, u_width, v_width.
        {"grid", 6, Bytes().version(2).planar().acolor(1, 0, 0, 1).acolor(0, 1, 0, 0.5f)
             .floats({0.5f, 0.25f, 0.05f, 0.15f}), "grid.xml", 4, 116},
        // ClothTexture 2: uvw, gap_color, u_color, v_color, u_width, v_width, tile.
        {"cloth", 7, Bytes().version(2).planar().floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 0.7f, 0.8f, 0.9f, 1})
             .floats({0.125f, 0.25f, 0.2f, 0.4f}).u8(0), "cloth.xml", 4, 8},
        // NoiseTexture 1: uvw, color1_tex (present), color2_tex (absent), color1,
        // color2, ten reals (persistence to color2_tex_mult), octaves,
        // noiseType, inflection.
        {"noise", 3, Bytes().version(1).planar().u8(1).acolor(0.2f, 0.4f, 0.6f, 0.8f).u8(0)
             .floats({0.9f, 0.8f, 0.7f, 0.1f, 0.2f, 0.3f, 0.5f, 1.5f, 2.5f, 3, 4, 5, 0.25f, 0.125f, 0.75f, 0.875f})
             .ints({4, 1, 1}), "noise.xml", 113, 117},
        // CheckerTexture 2: uvw, white_color, black_color, tile_u, tile_v,
        // whiteColorMult, blackColorMult.
        {"checker", 4, Bytes().version(2).planar().acolor(0.9f, 0.9f, 0.9f, 1).acolor(0.1f, 0.1f, 0.1f, 1)
             .u8(0).u8(1).floats({0.5f, 2}), "checker.xml", 4, 116},
    };
}

bool loadsAs(int tag, const Bytes& bytes) {
    TexturePtr t = createTexture(tag);
    return loads(*t, bytes);
}

}  // namespace

TEST(TextureRecords, NewestVersionsRoundTripAndMatchTheirGoldens) {
    for (const Row& r : rows()) {
        SCOPED_TRACE(r.name);
        TexturePtr t = createTexture(r.tag);
        ASSERT_TRUE(loads(*t, r.bytes, true));
        bool ok = false;
        EXPECT_EQ(savedBytes(*t, &ok), r.bytes.data);
        EXPECT_TRUE(ok);
        EXPECT_TRUE(t->isEqual(t->clone()));
        EXPECT_FALSE(t->isEqual(createTexture(r.tag)) || t->isEqual(TexturePtr()));
        const std::string xml = xmlOf(*t, u"/M");
        EXPECT_EQ(golden(std::string("textures/golden/") + r.golden), xml);
        EXPECT_EQ(xml, xmlOf(*t, u"/M"));
    }
}

TEST(TextureRecords, DamagedRecordsAreRefusedOrFailQuietly) {
    for (const Row& r : rows()) {
        SCOPED_TRACE(r.name);
        // Version tags: version 0, low half set, newer than the newest.
        for (std::size_t at : {std::size_t(0), r.inner}) {
            const std::uint32_t tag = std::uint32_t(r.bytes.data[at + 2]) << 16;
            for (std::uint32_t bad : {0u, tag | 1, tag + 0x10000, 0xFFFFFFFFu})
                EXPECT_FALSE(loadsAs(r.tag, r.bytes.with(at, bad))) << at << " " << std::hex << bad;
        }
        // A child tag that no factory knows.
        if (r.child) EXPECT_FALSE(loadsAs(r.tag, r.bytes.with(r.child, 13)));
        // Every cut ends the load; up to two bytes of the tag leave version 0.
        for (std::size_t cut = 0; cut < r.bytes.data.size(); ++cut) {
            Bytes part;
            part.data.assign(r.bytes.data.begin(), r.bytes.data.begin() + cut);
            if (!loadsAs(r.tag, part)) continue;
            EXPECT_GE(cut, 3u);
        }
        // Every byte set to a few values: the load ends either way, and a
        // record that loads and saves other bytes is unequal to the original.
        TexturePtr t = createTexture(r.tag);
        loads(*t, r.bytes);
        for (std::size_t i = 0; i < r.bytes.data.size(); ++i)
            for (std::uint8_t value : {0x00, 0x01, 0x0D, 0x7F, 0xFF}) {
                Bytes b = r.bytes;
                b.data[i] = value;
                TexturePtr other = createTexture(r.tag);
                if (loads(*other, b) && savedBytes(*other) != r.bytes.data) EXPECT_FALSE(t->isEqual(other)) << i;
            }
    }
}

TEST(TextureRecords, NestingDepthIsBounded) {
    // InvertTextures n deep: version 1 and tag 9 n times, an AColorTexture
    // record, then n + 1 invert_alpha flags.
    auto chain = [](int n) {
        Bytes b;
        b.version(1);
        for (int i = 0; i < n; ++i) b.i32(9).version(1);
        b.i32(5).version(1).floats({1, 1, 1, 1});
        for (int i = 0; i <= n; ++i) b.u8(0);
        return b;
    };
    EXPECT_TRUE(loadsAs(9, chain(200)));
    EXPECT_FALSE(loadsAs(9, chain(100000)));
    // Grids as line_color of grids: version 2, the generator, tag 6.
    Bytes grids;
    for (int level = 0; level < 100000; ++level) grids.version(2).planar().i32(6);
    EXPECT_FALSE(loadsAs(6, grids));
}

// An old record, read over an object that held the newest one, saves as the
// newest version with the defaults of the fields it lacks.
TEST(TextureRecords, OldVersionsSaveAsTheNewest) {
    const Bytes fresnel = Bytes().floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 1.3f, 1.7f});
    const Bytes cloth = Bytes().floats({0, 0, 0, 1, 0, 0, 0, 1, 0, 0, 0, 1, 0.2f, 0.3f});
    const Bytes gridV1 = Bytes().version(1).planar().acolor(1, 0, 0, 1).acolor(0, 1, 0, 1);
    const Bytes identity9 = Bytes().floats({1, 0, 0, 0, 1, 0, 0, 0, 1});
    const Bytes scaled = Bytes().floats({2, 0, 0, 0, 2, 0, 0, 0, 2, 4, 5, 6}).identityTransform();
    const Bytes checker = Bytes().i32(1).placement().i32(3).append(rows()[13].bytes).acolor(0, 0, 1, 1).flags({1, 0});
    const struct {
        int tag;
        Bytes old, newest;
    } cases[] = {
        // FresnelTexture 1: whiteInverse, blackInverse, fresnel_ior, refract_ior.
        {1, Bytes().version(1).append(fresnel), Bytes().version(2).append(fresnel).floats({1, 1, 1, 1}).flags({0, 0, 0, 0})},
        // BlendTexture 1: color_a, color_b (no multipliers), blend_amount.
        {10, Bytes().version(1).u8(1).acolor(1, 0, 0, 1).u8(1).acolor(0, 1, 0, 1).f32(0.75f),
         Bytes().version(2).u8(1).acolor(1, 0, 0, 1).f32(1).u8(1).acolor(0, 1, 0, 1).f32(1).f32(0.75f)},
        // GenChannelUVW 1: uvwTransform, texTransform, tex x and y rotation, tex x
        // and y mirror, wrap_u, wrap_v, uvw_channel.
        {2, Bytes().version(1).i32(4).version(1).append(scaled).floats({30, 45}).ints({1, 0, 1, 2, 3}),
         Bytes().version(1).i32(4).version(2).append(scaled).ints({1, 2, 3}).defaultComponents()
             .components({30, 45, 0, 1, 1, 1, 0, 0, 0}, 1, 0, 0)},
        // GenEnvironmentUVW 1: uvw_matrix, mapping_type, z rotation, x rotation,
        // z mirror, x mirror.
        {2, Bytes().version(1).i32(3).version(1).append(identity9).i32(3).floats({10, 20}).ints({1, 0}),
         Bytes().version(1).i32(3).version(2).append(identity9).i32(3).components({20, 0, 10, 1, 1, 1, 0, 0, 0}, 0, 0, 1)},
        // GridTexture 1: uvw, line_color, fill_color, u_width, v_width.
        {6, Bytes(gridV1).floats({0.3f, 0.4f}), Bytes(gridV1).with(0, 0x20000).floats({1, 1, 0.3f, 0.4f})},
        // ClothTexture 1: as 2 without tile; both directions tile.
        {7, Bytes().version(1).planar().append(cloth), Bytes().version(2).planar().append(cloth).u8(1)},
        // CheckerTexture 1: uvw, white_color, black_color, tile_u, tile_v; here an
        // object generator and a noise texture.
        {4, Bytes().version(1).append(checker), Bytes().version(2).append(checker).floats({1, 1})},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.tag);
        TexturePtr t = createTexture(c.tag);
        for (const Row& r : rows())
            if (r.tag == c.tag) loads(*t, r.bytes);
        ASSERT_TRUE(loads(*t, c.old, true));
        EXPECT_EQ(savedBytes(*t), c.newest.data);
    }
}

TEST(TextureRecords, SaveWithoutARequiredChildWritesNothing) {
    std::vector<TexturePtr> cases;
    for (int tag : {0, 2, 3, 6, 7, 8, 9, 11}) cases.push_back(createTexture(tag));  // no children
    auto ramp = boost::make_shared<RampTexture>();   // without colors
    auto grid = boost::make_shared<GridTexture>();   // without fill_color
    auto checker = boost::make_shared<CheckerTexture>();
    auto bitmapOnly = boost::make_shared<BitmapTexture>(), uvwOnly = boost::make_shared<BitmapTexture>();
    ramp->uvw = grid->uvw = createUVW(0);
    grid->line_color = createTexture(5);
    checker->black_color.reset();
    bitmapOnly->bitmap = createBitmap(0);
    uvwOnly->uvw = createUVW(4);
    cases.insert(cases.end(), {ramp, grid, checker, bitmapOnly, uvwOnly});
    for (const TexturePtr& t : cases) {
        bool ok = true;
        EXPECT_TRUE(savedBytes(*t, &ok).empty()) << t->getType();
        EXPECT_FALSE(ok) << t->getType();
    }
    // Noise needs no colour textures.
    NoiseTexture noise;
    noise.uvw = createUVW(4);
    bool ok = false;
    savedBytes(noise, &ok);
    EXPECT_TRUE(ok);
}

TEST(TextureRecords, BlendSavesNoMultiplierForAnAbsentChild) {
    BlendTexture t;
    t.colorAMult = 7;
    t.color_b = createTexture(5);
    t.colorBMult = 3;
    EXPECT_EQ(savedBytes(t), Bytes().version(2).u8(0).u8(1).acolor(1, 1, 1, 1).f32(3).f32(0.5f).data);
}

TEST(TextureFactory, TagsWithoutAClassGiveNull) {
    for (int tag = 0; tag <= 12; ++tag) EXPECT_EQ(createTexture(tag)->getType(), std::uint32_t(tag));
    for (int tag : {-1, 13, 1 << 20}) EXPECT_FALSE(createTexture(tag)) << tag;
    for (int tag : {-1, 2, 5}) EXPECT_FALSE(createUVW(tag)) << tag;
    for (int tag : {-1, 1}) EXPECT_FALSE(createBitmap(tag)) << tag;
    EXPECT_TRUE(defaultPlanarUVW()->isEqual(createUVW(0)));
}

// A change deep in a copy leaves the original as it was.
TEST(TextureCopies, ClonesAreDeep) {
    const std::vector<std::pair<std::size_t, std::function<void(BaseTexture&)>>> cases = {
        {2, [](BaseTexture& t) { static_cast<AColorTexture&>(*static_cast<BlendTexture&>(
                                     *static_cast<InvertTexture&>(t).texture).color_b).color.a = 0.5f; }},
        {5, [](BaseTexture& t) { static_cast<GenObjectUVW&>(*static_cast<UVWTexture&>(t).uvw).uvwComponents.offset.z = 9; }},
        {8, [](BaseTexture& t) { static_cast<BitmapBuffer&>(*static_cast<BitmapTexture&>(t).bitmap).gamma = 3; }},
        {11, [](BaseTexture& t) { static_cast<AColorTexture&>(*static_cast<GridTexture&>(t).fill_color).color.r = 3; }},
    };
    for (const auto& c : cases) {
        const Row r = rows()[c.first];
        TexturePtr t = createTexture(r.tag);
        ASSERT_TRUE(loads(*t, r.bytes));
        TexturePtr copy = t->clone();
        c.second(*copy);
        EXPECT_FALSE(t->isEqual(copy)) << r.name;
    }
}

// Besides the damaged records above: the rules of isEqual.
TEST(TextureCopies, IsEqual) {
    // Same fields, other class.
    EXPECT_FALSE(GenPlanarWorldUVW().isEqual(createUVW(1)));
    // A buffer's file compares without regard to case.
    BitmapBuffer a;
    a.file = u"C:\\Maps\\Wood.PNG";
    auto b = boost::make_shared<BitmapBuffer>(a);
    b->file = u"c:\\maps\\wood.png";
    EXPECT_TRUE(a.isEqual(b));
    b->file = u"c:\\maps\\wood2.png";
    EXPECT_FALSE(a.isEqual(b));
}
