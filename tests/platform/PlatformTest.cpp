#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <map>
#include <regex>
#include <string>

#include "platform/NumberFormat.h"
#include "platform/Path.h"
#include "platform/Text.h"
#include "platform/Uuid.h"
#include "platform/WideChar.h"

namespace {

std::string narrow(const std::u16string& s) { return std::string(s.begin(), s.end()); }

std::string fmt(double v) {
    std::u16string out;
    platform::appendFloat(out, v);
    return narrow(out);
}

TEST(NumberFormat, MatchesTheRuntimeStreamFormat) {
    const struct {
        double value;
        const char* text;
    } cases[] = {
        {0, "0"},
        {1, "1"},
        {3, "3"},
        {0.5, "0.5"},
        {1.5, "1.5"},
        {-2.25, "-2.25"},
        {100000, "100000"},
        {999999, "999999"},
        {1000000, "1e+006"},
        {1e-5, "1e-005"},
        {0.0001, "0.0001"},
        {1234567, "1.23457e+006"},
        {1e100, "1e+100"},
        {1.5e-300, "1.5e-300"},
        {-1e-5, "-1e-005"},
        {0.1f, "0.1"},          // float 0.1 is 0.100000001490116...
        {0.3f, "0.3"},
        {1.0f / 3.0f, "0.333333"},
        {2.0f / 3.0f, "0.666667"},
        {123.456f, "123.456"},
        {0.15f, "0.15"},
        {0.7853982f, "0.785398"},
        {3.4028234663852886e38, "3.40282e+038"},
        {1e-45f, "1.4013e-045"},  // smallest float denormal
    };
    for (const auto& c : cases) EXPECT_EQ(fmt(c.value), c.text) << c.value;
}

TEST(NumberFormat, ExactTiesRoundAwayFromZero) {
    // glibc rounds these ties to even; the runtime rounds them away from zero.
    EXPECT_EQ(fmt(123456.5), "123457");
    EXPECT_EQ(fmt(-123456.5), "-123457");
    EXPECT_EQ(fmt(1234565), "1.23457e+006");
    EXPECT_EQ(fmt(0.5 + 0.0000025), fmt(0.5000025));  // not an exact tie: plain rounding
    EXPECT_EQ(fmt(2.5), "2.5");
    EXPECT_EQ(fmt(1.0000005), "1");                  // 1.0000005 is below the tie in binary
    EXPECT_EQ(fmt(0.000123456789), "0.000123457");
    EXPECT_EQ(fmt(9999995), "1e+007");               // a tie that carries into the exponent
    EXPECT_EQ(fmt(9999985), "9.99999e+006");         // tie after an odd digit
    EXPECT_EQ(fmt(1.25e-5 * 0 + 0.1234565), "0.123456");  // inexact in binary: below the tie
    EXPECT_EQ(fmt(246912.5), "246913");
    EXPECT_EQ(fmt(0.03125 * 3), "0.09375");          // exact, fewer than six digits
    EXPECT_EQ(fmt(1.171875e-2 + 0.5), "0.511719");   // 0.51171875: tie at the sixth digit
}

TEST(NumberFormat, SpecialValues) {
    EXPECT_EQ(fmt(-0.0), "-0");
    EXPECT_EQ(fmt(std::numeric_limits<double>::infinity()), "1.#INF");
    EXPECT_EQ(fmt(-std::numeric_limits<double>::infinity()), "-1.#INF");
    EXPECT_EQ(fmt(std::numeric_limits<double>::quiet_NaN()), "1.#QNAN");
    EXPECT_EQ(fmt(-std::numeric_limits<double>::quiet_NaN()), "-1.#IND");
}

TEST(NumberFormat, Integers) {
    std::u16string out;
    platform::appendInt(out, -2147483648LL);
    platform::appendInt(out, 0);
    platform::appendInt(out, 42);
    EXPECT_EQ(narrow(out), "-2147483648042");
}

TEST(Text, StrictUtf8RejectsWhatTheSystemConverterRejects) {
    std::u16string out;
    const char* bad[] = {"\xC0\x80", "\xE0\x80\x80", "\xED\xA0\x80", "\xF4\x90\x80\x80",
                         "\xC3", "\x80", "\xE9", "\xF8\x88\x80\x80\x80"};
    for (const char* b : bad) EXPECT_FALSE(platform::decodeUtf8Strict(b, std::strlen(b), out)) << b;
    ASSERT_TRUE(platform::decodeUtf8Strict("a\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80", 10, out));
    EXPECT_EQ(out, std::u16string(u"a\u00E9\u20AC\U0001F600"));
}

TEST(Text, AnsiAndUtf8RoundTrips) {
    EXPECT_EQ(platform::decodeAnsi("\x80\x81\xE9\x9F", 4), std::u16string(u"\u20AC\u0081\u00E9\u0178"));
    const std::u16string wide = u"x\u00E9\u20AC\U0001F600";
    const std::string utf8 = platform::encodeUtf8(wide.data(), wide.size());
    EXPECT_EQ(utf8, "x\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80");
    const char16_t lone[] = {u'a', 0xD800, u'b'};
    EXPECT_EQ(platform::encodeUtf8(lone, 3), "a\xEF\xBF\xBD" "b");
}

TEST(WideChar, CaseFoldingIsAsciiOnly) {
    EXPECT_EQ(platform::wcsicmp(u"Wood", u"wOOD"), 0);
    EXPECT_NE(platform::wcsicmp(u"\u00C9", u"\u00E9"), 0);  // no folding beyond ASCII
    EXPECT_LT(platform::wcsicmp(u"a_b", u"aab"), 0);        // "_" sorts before letters
    EXPECT_LT(platform::wcsicmp(u"A_B", u"aab"), 0);
    EXPECT_LT(platform::wcsicmp(u"ab", u"abc"), 0);
    std::map<std::u16string, int, platform::CaseInsensitiveLess> m;
    m[u"wood"] = 1;
    m[u"WOOD"] = 2;
    EXPECT_EQ(m.size(), 1u);
    EXPECT_TRUE(platform::isControl(0x9F));
    EXPECT_TRUE(platform::isControl(0x7F));
    EXPECT_FALSE(platform::isControl(0xA0));
    std::u16string text = u"\u0001Wo\u007Fod\u009F\u00A0\t";
    platform::removeControlCharacters(text);
    EXPECT_EQ(text, u"Wood\u00A0");
}

TEST(Uuid, RandomVersion4LowerCaseWithoutBraces) {
    const std::u16string a = platform::newUuidString(), b = platform::newUuidString();
    EXPECT_NE(a, b);
    EXPECT_TRUE(std::regex_match(narrow(a), std::regex(
        "[0-9a-f]{8}-[0-9a-f]{4}-4[0-9a-f]{3}-[89ab][0-9a-f]{3}-[0-9a-f]{12}")));
}

TEST(Path, FolderOfAPathByTheGivenSeparators) {
    const struct {
        const char* path;
        const char* separators;
        const char* folder;
    } cases[] = {
        {"libs/walls.orvmat", "/", "libs"},
        {"walls.orvmat", "/", "."},
        {"/walls.orvmat", "/", "/"},
        {"/a/b/walls.orvmat", "/", "/a/b"},
        {"out/", "/", "out"},
        // A "\" is part of a name unless the set holds it.
        {"C:\\libs\\walls.orvmat", "/", "."},
        {"C:\\libs\\walls.orvmat", "/\\", "C:\\libs"},
        {"C:\\walls.orvmat", "/\\", "C:"},
        {"\\walls.orvmat", "/\\", "\\"},
        {"a/b\\c.png", "/\\", "a/b"},
        {"a\\b/c.png", "/\\", "a\\b"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(platform::folderOf(c.path, c.separators), c.folder) << c.path << " by " << c.separators;
}

}  // namespace
