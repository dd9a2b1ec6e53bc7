#include <gtest/gtest.h>

#include <cstdint>
#include <fstream>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include <boost/make_shared.hpp>

#include "TextureTestUtil.h"
#include "textures/BasicTextures.h"
#include "textures/ProceduralTextures.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;
using textest::Bytes;
using textest::savedBytes;
using textest::xmlOf;

namespace {

// Required child GenPlanarWorldUVW: tag 0, version 1, identity transform,
// default components.
Bytes& planar(Bytes& b) { return b.i32(0).version(1).identityTransform().defaultComponents(); }

// Required child AColorTexture: tag 5, version 1, the colour.
Bytes& acolor(Bytes& b, float r, float g, float bl, float a) {
    return b.i32(5).version(1).floats({r, g, bl, a});
}

// RampTexture version 1: uvw, colors, positions, u_wave, v_wave, type,
// interpolation.
Bytes rampV1() {
    Bytes b;
    b.version(1);
    planar(b);
    acolor(b, 0.5f, 0.25f, 0.75f, 1);
    return b.floats({0.25f, 0.5f, 0.75f}).i32(2).i32(3);
}

// BulgeTexture version 1: uvw, u_width, v_width.
Bytes bulgeV1() {
    Bytes b;
    b.version(1);
    planar(b);
    return b.floats({0.2f, 0.3f});
}

// GridTexture version 2: uvw, line_color, fill_color, lineColorMult,
// fillColorMult, u_width, v_width.
Bytes gridV2() {
    Bytes b;
    b.version(2);
    planar(b);
    acolor(b, 1, 0, 0, 1);
    acolor(b, 0, 1, 0, 0.5f);
    return b.floats({0.5f, 0.25f, 0.05f, 0.15f});
}

// ClothTexture version 2: uvw, gap_color, u_color, v_color, u_width,
// v_width, tile.
Bytes clothV2() {
    Bytes b;
    b.version(2);
    planar(b);
    b.floats({0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 0.7f, 0.8f, 0.9f, 1, 0.125f, 0.25f});
    return b.floats({0.2f, 0.4f}).u8(0);
}

// NoiseTexture version 1: uvw, color1_tex (present), color2_tex (absent),
// color1, color2, ten reals (persistence to color2_tex_mult), octaves,
// noiseType, inflection.
Bytes noiseV1() {
    Bytes b;
    b.version(1);
    planar(b);
    b.u8(1);
    acolor(b, 0.2f, 0.4f, 0.6f, 0.8f);
    b.u8(0);
    b.floats({0.9f, 0.8f, 0.7f, 0.1f, 0.2f, 0.3f});
    b.floats({0.5f, 1.5f, 2.5f, 3, 4, 5, 0.25f, 0.125f, 0.75f, 0.875f});
    return b.i32(4).i32(1).i32(1);
}

// CheckerTexture version 2: uvw, white_color, black_color, tile_u, tile_v,
// whiteColorMult, blackColorMult.
Bytes checkerV2() {
    Bytes b;
    b.version(2);
    planar(b);
    acolor(b, 0.9f, 0.9f, 0.9f, 1);
    acolor(b, 0.1f, 0.1f, 0.1f, 1);
    return b.u8(0).u8(1).floats({0.5f, 2});
}

std::string golden(const std::string& name) {
    std::ifstream in(std::string(ORVXML_SOURCE_DIR) + "/tests/textures/procedural_golden/" + name,
                     std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

TexturePtr loaded(std::int32_t tag, const Bytes& b) {
    TexturePtr t = createTexture(tag);
    QuickArchive ar = b.archive();
    EXPECT_TRUE(t->load(ar)) << "tag " << tag;
    EXPECT_EQ(ar.getReadPosition(), b.data.size());
    return t;
}

struct Newest {
    std::int32_t tag;
    std::function<Bytes()> bytes;
    const char* golden;
};

const Newest kNewest[] = {
    {11, rampV1, "ramp.xml"},   {8, bulgeV1, "bulge.xml"}, {6, gridV2, "grid.xml"},
    {7, clothV2, "cloth.xml"},  {3, noiseV1, "noise.xml"}, {4, checkerV2, nullptr},
};

}  // namespace

TEST(ProceduralTextures, NewestRecordsGoBackByteForByte) {
    for (const Newest& n : kNewest) {
        SCOPED_TRACE(n.tag);
        const Bytes b = n.bytes();
        TexturePtr t = loaded(n.tag, b);
        bool ok = false;
        EXPECT_EQ(savedBytes(*t, &ok), b.data);
        EXPECT_TRUE(ok);
        TexturePtr copy = t->clone();
        EXPECT_TRUE(t->isEqual(copy));
        EXPECT_FALSE(t->isEqual(createTexture(n.tag)));
        EXPECT_FALSE(t->isEqual(TexturePtr()));
    }
}

TEST(ProceduralTextures, GoldenAssets) {
    for (const Newest& n : kNewest) {
        if (!n.golden) continue;
        SCOPED_TRACE(n.golden);
        TexturePtr t = loaded(n.tag, n.bytes());
        const std::string expected = golden(n.golden);
        ASSERT_FALSE(expected.empty());
        EXPECT_EQ(xmlOf(*t, u"/M"), expected);
    }
}

TEST(ProceduralTextures, FreshCheckerWritesItsThreeDefaultChildren) {
    CheckerTexture checker;
    EXPECT_EQ(xmlOf(checker, u"/M"), golden("checker_fresh.xml"));
    // Each reset makes new children.
    const UVWPtr before = checker.uvw;
    checker.reset();
    EXPECT_NE(checker.uvw.get(), before.get());
    EXPECT_EQ(checker.uvw->getType(), 0u);
    EXPECT_NE(CheckerTexture().white_color.get(), CheckerTexture().white_color.get());
}

TEST(ProceduralTextures, FreshGridRefersToNothing) {
    GridTexture grid;
    EXPECT_EQ(xmlOf(grid, u"/M"), golden("grid_fresh.xml"));
}

TEST(ProceduralTextures, CheckerChildrenComeFromTheRecord) {
    // A version 1 record (uvw, white_color, black_color, tile_u, tile_v) whose
    // generator is an object generator (tag 1) and whose colours are a noise
    // texture and a constant colour.
    Bytes b;
    b.version(1);
    b.i32(1).version(1).identityTransform().defaultComponents();
    Bytes noise = noiseV1();
    b.i32(3).append(noise);
    acolor(b, 0, 0, 1, 1);
    b.u8(1).u8(0);
    TexturePtr t = loaded(4, b);
    const CheckerTexture& c = static_cast<const CheckerTexture&>(*t);
    EXPECT_EQ(c.uvw->getType(), 1u);
    EXPECT_EQ(c.white_color->getType(), 3u);
    EXPECT_EQ(static_cast<const AColorTexture&>(*c.black_color).color, AColor(0, 0, 1, 1));
    EXPECT_TRUE(c.tile_u);
    EXPECT_FALSE(c.tile_v);
    EXPECT_EQ(c.whiteColorMult, 1.0f);
    EXPECT_EQ(c.blackColorMult, 1.0f);
    const std::string xml = xmlOf(*t, u"/M");
    EXPECT_NE(xml.find("url=\"/M/TexChecker/uvwgen/UVWGenObject\""), std::string::npos);
    EXPECT_NE(xml.find("url=\"/M/TexChecker/white_color/TexNoise/uvwgen/UVWGenPlanarWorld\""),
              std::string::npos);
}

TEST(ProceduralTextures, OldVersions) {
    // GridTexture version 1: uvw, line_color, fill_color, u_width, v_width.
    Bytes grid;
    grid.version(1);
    planar(grid);
    acolor(grid, 1, 0, 0, 1);
    acolor(grid, 0, 1, 0, 1);
    grid.floats({0.3f, 0.4f});
    TexturePtr g = loaded(6, grid);
    const GridTexture& gt = static_cast<const GridTexture&>(*g);
    EXPECT_EQ(gt.u_width, 0.3f);
    EXPECT_EQ(gt.v_width, 0.4f);
    EXPECT_EQ(gt.lineColorMult, 1.0f);
    EXPECT_EQ(gt.fillColorMult, 1.0f);

    // ClothTexture version 1: as version 2 without `tile`; both directions tile.
    Bytes cloth;
    cloth.version(1);
    planar(cloth);
    cloth.floats({0, 0, 0, 1, 0, 0, 0, 1, 0, 0, 0, 1, 0.2f, 0.3f});
    TexturePtr ct = loaded(7, cloth);
    EXPECT_TRUE(static_cast<const ClothTexture&>(*ct).tile);
    const std::string xml = xmlOf(*ct, u"/M");
    for (const char* name : {"tile_u", "tile_v"}) {
        const std::string head = std::string("name=\"") + name + "\"";
        const std::size_t at = xml.find(head);
        ASSERT_NE(at, std::string::npos) << name;
        EXPECT_EQ(xml.compare(xml.find("<value>", at), 15, "<value>1</value"), 0) << name;
    }

    // CheckerTexture version 1 keeps the multipliers at 1.
    Bytes checker;
    checker.version(1);
    planar(checker);
    acolor(checker, 1, 1, 1, 1);
    acolor(checker, 0, 0, 0, 1);
    checker.u8(1).u8(1);
    TexturePtr ch = loaded(4, checker);
    EXPECT_TRUE(ch->isEqual(TexturePtr(new CheckerTexture)));
}

TEST(ProceduralTextures, RefusedRecords) {
    struct Case {
        std::int32_t tag;
        std::function<Bytes()> bytes;
        std::uint32_t beyondNewest;
    };
    const Case cases[] = {{11, rampV1, 0x20000}, {8, bulgeV1, 0x20000}, {6, gridV2, 0x30000},
                          {7, clothV2, 0x30000}, {3, noiseV1, 0x20000}, {4, checkerV2, 0x30000}};
    for (const Case& c : cases) {
        SCOPED_TRACE(c.tag);
        for (std::uint32_t tag : {0x20001u, 0u, c.beyondNewest}) {
            Bytes b = c.bytes();
            for (int i = 0; i < 4; ++i) b.data[i] = static_cast<std::uint8_t>(tag >> (8 * i));
            QuickArchive ar = b.archive();
            EXPECT_FALSE(createTexture(c.tag)->load(ar)) << tag;
        }
        // A generator tag without a class (2), and a texture tag without one (13).
        Bytes badUvw = c.bytes();
        badUvw.data[4] = 2;
        QuickArchive ar = badUvw.archive();
        EXPECT_FALSE(createTexture(c.tag)->load(ar));
        // Cut short inside the children: the archive runs dry.
        const Bytes whole = c.bytes();
        Bytes cut;
        cut.data.assign(whole.data.begin(), whole.data.begin() + 12);
        QuickArchive arCut = cut.archive();
        EXPECT_FALSE(createTexture(c.tag)->load(arCut));
    }
    // Noise: the optional child's present flag set, with a tag without a class.
    Bytes noise;
    noise.version(1);
    planar(noise);
    noise.u8(1).i32(13);
    QuickArchive ar = noise.archive();
    EXPECT_FALSE(createTexture(3)->load(ar));
}

TEST(ProceduralTextures, SaveWithoutARequiredChildWritesNothing) {
    struct Case {
        const char* name;
        std::function<TexturePtr()> make;
    };
    const Case cases[] = {
        {"ramp without colors",
         [] {
             auto t = boost::make_shared<RampTexture>();
             t->uvw = createUVW(0);
             return TexturePtr(t);
         }},
        {"ramp without uvw",
         [] {
             auto t = boost::make_shared<RampTexture>();
             t->colors = createTexture(5);
             return TexturePtr(t);
         }},
        {"bulge", [] { return TexturePtr(new BulgeTexture); }},
        {"cloth", [] { return TexturePtr(new ClothTexture); }},
        {"noise", [] { return TexturePtr(new NoiseTexture); }},
        {"grid without fill_color",
         [] {
             auto t = boost::make_shared<GridTexture>();
             t->uvw = createUVW(0);
             t->line_color = createTexture(5);
             return TexturePtr(t);
         }},
        {"checker without black_color",
         [] {
             auto t = boost::make_shared<CheckerTexture>();
             t->black_color.reset();
             return TexturePtr(t);
         }},
    };
    for (const Case& c : cases) {
        bool ok = true;
        EXPECT_TRUE(savedBytes(*c.make(), &ok).empty()) << c.name;
        EXPECT_FALSE(ok) << c.name;
    }
    // Noise needs no colour textures.
    NoiseTexture noise;
    noise.uvw = createUVW(4);
    bool ok = false;
    savedBytes(noise, &ok);
    EXPECT_TRUE(ok);
}

TEST(ProceduralTextures, CloneIsDeep) {
    TexturePtr grid = loaded(6, gridV2());
    TexturePtr copy = grid->clone();
    GridTexture& g = static_cast<GridTexture&>(*grid);
    GridTexture& c = static_cast<GridTexture&>(*copy);
    EXPECT_NE(g.uvw.get(), c.uvw.get());
    EXPECT_NE(g.line_color.get(), c.line_color.get());
    static_cast<AColorTexture&>(*c.fill_color).color.a = 1;
    EXPECT_FALSE(grid->isEqual(copy));

    // The multipliers are compared although XML doesn't show them.
    TexturePtr copy2 = grid->clone();
    static_cast<GridTexture&>(*copy2).lineColorMult = 3;
    EXPECT_FALSE(grid->isEqual(copy2));
    EXPECT_EQ(xmlOf(*grid, u"/M"), xmlOf(*copy2, u"/M"));
}

TEST(ProceduralTextures, DamagedRecordsFailQuietly) {
    // Every prefix of every record loads without a crash; the archive runs
    // dry somewhere, and the result is whatever the stale reads give.
    for (const Newest& n : kNewest) {
        const Bytes whole = n.bytes();
        for (std::size_t len = 0; len < whole.data.size(); ++len) {
            Bytes cut;
            cut.data.assign(whole.data.begin(), whole.data.begin() + len);
            QuickArchive ar = cut.archive();
            createTexture(n.tag)->load(ar);
        }
    }
    // Grids nested in grids, deeper than any real file: refused, no stack
    // overflow. Each level: version 2, the generator, then the next grid as
    // line_color.
    Bytes deep;
    for (int level = 0; level < 400; ++level) {
        deep.version(2);
        planar(deep);
        deep.i32(6);
    }
    QuickArchive ar = deep.archive();
    EXPECT_FALSE(createTexture(6)->load(ar));
}
