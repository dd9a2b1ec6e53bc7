// The result encoder against a plain reference: for random text cut into
// random pieces, the code points are those of the whole text.
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "module/python/ResultEncoder.h"

namespace {

// Code points of UTF-16 text up to its first zero unit: a high surrogate
// followed by a low one is one code point, any other surrogate stands alone.
std::u32string codePoints(const std::u16string& s) {
    std::u32string out;
    for (std::size_t i = 0; i < s.size() && s[i] != 0; ++i) {
        const char32_t c = s[i];
        if (c >= 0xD800 && c <= 0xDBFF && i + 1 < s.size() && s[i + 1] >= 0xDC00 && s[i + 1] <= 0xDFFF) {
            out += 0x10000 + ((c - 0xD800) << 10) + (s[i + 1] - 0xDC00);
            ++i;
        } else {
            out += c;
        }
    }
    return out;
}

// Cuts `s` into pieces at random places and encodes them one by one, each
// into a buffer of exactly the room the encoder asks for.
std::u32string encodeInPieces(const std::u16string& s, std::mt19937& rng) {
    ResultEncoder e;
    std::u32string out;
    for (std::size_t i = 0; i < s.size();) {
        const std::size_t n = std::min<std::size_t>(s.size() - i, 1 + rng() % 12);
        std::vector<char32_t> wide(ResultEncoder::maxUtf32(n));
        out.append(wide.data(), e.toUtf32(s.data() + i, n, wide.data()));
        i += n;
    }
    char32_t last[1];
    out.append(last, e.finishUtf32(last));
    return out;
}

TEST(ResultEncoder, PiecesGiveTheTextOfTheWhole) {
    // Pairs, lone and reversed surrogates, the edges of the plain range, long
    // runs for the eight-unit path, and now and then a zero.
    const std::u16string alphabet = u"aaaaaaaaaaaaaaaa<\u007F\u0080\u07FF\u0800\uD7FF\uE000\uFFFF\U0001F600\U0010FFFF";
    const char16_t lone[] = {0xD800, 0xDBFF, 0xDC00, 0xDFFF};
    std::mt19937 rng(3);
    for (int round = 0; round < 20000; ++round) {
        std::u16string s;
        const std::size_t length = rng() % 40;
        while (s.size() < length) {
            const unsigned pick = rng() % 100;
            if (pick < 6)
                s += lone[rng() % 4];
            else if (pick == 6 && round % 4 == 0)
                s += char16_t(0);
            else
                s += alphabet[rng() % alphabet.size()];
        }
        ASSERT_EQ(encodeInPieces(s, rng), codePoints(s)) << round;
    }
}

TEST(ResultEncoder, AHighSurrogateWaitsForTheNextPiece) {
    ResultEncoder e;
    char32_t out[4];
    const char16_t high[] = {u'x', 0xD83D}, low[] = {0xDE00, u'y'};
    ASSERT_EQ(e.toUtf32(high, 2, out), 1u);
    ASSERT_EQ(e.toUtf32(low, 2, out), 2u);
    EXPECT_EQ(out[0], U'\U0001F600');
    EXPECT_EQ(out[1], U'y');
    // At the end of the text it stands alone.
    ASSERT_EQ(e.toUtf32(high, 2, out), 1u);
    ASSERT_EQ(e.finishUtf32(out), 1u);
    EXPECT_EQ(out[0], 0xD83Du);
    // A zero unit ends the text for good.
    const char16_t zero[] = {u'a', 0, u'b'};
    EXPECT_EQ(e.toUtf32(zero, 3, out), 1u);
    EXPECT_EQ(e.toUtf32(low, 2, out), 0u);
}

}  // namespace
