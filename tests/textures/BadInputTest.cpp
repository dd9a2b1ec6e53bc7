// Damaged records: refused version tags, child tags without a class,
// truncated data and runaway nesting. None of them may crash or hang.
#include <functional>

#include <gtest/gtest.h>

#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/UVWGenerators.h"
#include "TextureTestUtil.h"

using namespace OrvaneLumoCore;
using textest::Bytes;
using textest::savedBytes;

namespace {

struct Family {
    const char* name;
    std::function<OrvaneSerializable*()> make;
    int newest;
};

// One fresh object of every class, with the newest version it reads.
std::vector<Family> families() {
    return {
        {"Fresnel", [] { return new FresnelTexture(); }, 2},
        {"Blend", [] { return new BlendTexture(); }, 2},
        {"Invert", [] { return new InvertTexture(); }, 1},
        {"AColor", [] { return new AColorTexture(); }, 1},
        {"UVWTexture", [] { return new UVWTexture(); }, 1},
        {"BitmapTexture", [] { return new BitmapTexture(); }, 1},
        {"BitmapBuffer", [] { return new BitmapBuffer(); }, 1},
        {"Channel", [] { return new GenChannelUVW(); }, 2},
        {"Environment", [] { return new GenEnvironmentUVW(); }, 2},
        {"Planar", [] { return new GenPlanarWorldUVW(); }, 1},
        {"Object", [] { return new GenObjectUVW(); }, 1},
    };
}

bool loads(OrvaneSerializable& object, const std::vector<std::uint8_t>& bytes) {
    QuickArchive ar(bytes.data(), bytes.size());
    return object.load(ar);
}

// A record of every class with all its children present.
std::vector<std::vector<std::uint8_t>> fullRecords() {
    boost::shared_ptr<FresnelTexture> fresnel(new FresnelTexture());
    fresnel->reflection_tex = makeBitmapTextureFromPath(u"a.png");
    fresnel->refract_ior_tex = TexturePtr(new AColorTexture());
    boost::shared_ptr<BlendTexture> blend(new BlendTexture());
    blend->color_a = fresnel;
    blend->color_b = TexturePtr(new AColorTexture());
    InvertTexture invert;
    invert.texture = blend;
    UVWTexture uvw;
    uvw.uvw = createUVW(3);
    return {savedBytes(invert), savedBytes(uvw), savedBytes(*fresnel),
            savedBytes(GenChannelUVW()), savedBytes(GenPlanarWorldUVW())};
}

}  // namespace

TEST(BadInput, RefusedVersionTags) {
    for (const Family& f : families()) {
        const std::uint32_t tags[] = {0u, 0x10001u, 0x20001u, 0xFFFFFFFFu,
                                      static_cast<std::uint32_t>(f.newest + 1) << 16};
        for (std::uint32_t tag : tags) {
            std::unique_ptr<OrvaneSerializable> object(f.make());
            EXPECT_FALSE(loads(*object, Bytes().u32(tag).data)) << f.name << " " << std::hex << tag;
        }
        std::unique_ptr<OrvaneSerializable> object(f.make());
        EXPECT_FALSE(loads(*object, {})) << f.name << ": empty archive";
    }
}

TEST(BadInput, ChildTagsWithoutAClass) {
    // Each record's first child carries a tag that its factory doesn't know.
    const Bytes acolor = Bytes().version(1).floats({1, 1, 1, 1});
    struct Case {
        const char* what;
        std::function<OrvaneSerializable*()> make;
        Bytes bytes;
    } cases[] = {
        {"fresnel -1", [] { return new FresnelTexture(); },
         Bytes().version(2).floats({1, 1, 1, 0, 0, 0, 1, 1, 1, 1, 1, 1}).u8(1).i32(-1).append(acolor)},
        {"fresnel 13", [] { return new FresnelTexture(); },
         Bytes().version(2).floats({1, 1, 1, 0, 0, 0, 1, 1, 1, 1, 1, 1}).u8(0).u8(1).i32(13).append(acolor)},
        {"blend 1000", [] { return new BlendTexture(); },
         Bytes().version(1).u8(1).i32(1000).append(acolor).u8(0).f32(0.5f)},
        {"invert -1", [] { return new InvertTexture(); },
         Bytes().version(1).i32(-1).append(acolor).u8(0)},
        {"uvw texture with uvw tag 2", [] { return new UVWTexture(); },
         Bytes().version(1).i32(2).version(1).identityTransform().defaultComponents()},
        {"nested child with a bad version", [] { return new InvertTexture(); },
         Bytes().version(1).i32(5).version(2).floats({1, 1, 1, 1}).u8(0)},
        {"components with a bad version", [] { return new GenPlanarWorldUVW(); },
         Bytes().version(1).identityTransform().version(2).floats({0, 0, 0, 1, 1, 1, 0, 0, 0})},
    };
    for (const Case& c : cases) {
        std::unique_ptr<OrvaneSerializable> object(c.make());
        EXPECT_FALSE(loads(*object, c.bytes.data)) << c.what;
    }
}

TEST(BadInput, EveryTruncationLoadsOrFailsQuietly) {
    for (const std::vector<std::uint8_t>& full : fullRecords()) {
        for (std::size_t cut = 0; cut < full.size(); ++cut) {
            const std::vector<std::uint8_t> part(full.begin(), full.begin() + cut);
            for (const Family& f : families()) {
                std::unique_ptr<OrvaneSerializable> object(f.make());
                const bool ok = loads(*object, part);
                // Up to two bytes of the version tag leave its version half 0.
                if (cut < 3) {
                    EXPECT_FALSE(ok) << f.name << " cut " << cut;
                }
            }
        }
    }
}

TEST(BadInput, EveryCorruptedByteLoadsOrFailsQuietly) {
    // Flip each byte of a deep record in turn to a few values; the load must
    // end either way.
    const std::vector<std::uint8_t> full = fullRecords()[0];
    for (std::size_t i = 0; i < full.size(); ++i) {
        for (std::uint8_t value : {0x00, 0x01, 0x0D, 0x7F, 0xFF}) {
            std::vector<std::uint8_t> bytes = full;
            bytes[i] = value;
            InvertTexture t;
            loads(t, bytes);
        }
    }
    SUCCEED();
}

TEST(BadInput, NestingDepthIsBounded) {
    // A chain of inverted textures: version 1 and tag 9, n times, then one
    // AColorTexture record and n invert_alpha flags.
    auto chain = [](int n) {
        Bytes b;
        b.version(1);
        for (int i = 0; i < n; ++i) b.i32(9).version(1);
        b.i32(5).version(1).floats({1, 1, 1, 1});
        for (int i = 0; i <= n; ++i) b.u8(0);
        return b;
    };
    InvertTexture shallow;
    EXPECT_TRUE(loads(shallow, chain(200).data));
    InvertTexture deep;
    EXPECT_FALSE(loads(deep, chain(100000).data));
}
