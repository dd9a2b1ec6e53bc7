// Windows' names are UTF-16 and may hold lone surrogates: the command's
// UTF-8 paths carry them through and back unchanged. (Wine makes no file of
// such a name, so the names are checked here, not on disk.)
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/Windows.h"

namespace {

std::string utf8(const std::u16string& s) {
    const std::wstring w = platform::toWide(s);
    return platform::utf8Path(w.data(), w.size());
}

TEST(WindowsPaths, Utf8FormOfUtf16) {
    EXPECT_EQ(utf8(u"a/\u00e9\u03a9\u6750"), "a/\xC3\xA9\xCE\xA9\xE6\x9D\x90");
    EXPECT_EQ(utf8(u"\U0001F600"), "\xF0\x9F\x98\x80");
    // Lone surrogates take the three bytes that UTF-8 would give their value.
    EXPECT_EQ(utf8(std::u16string(1, char16_t(0xD800))), "\xED\xA0\x80");
    EXPECT_EQ(utf8(std::u16string(1, char16_t(0xDFFF))), "\xED\xBF\xBF");
    // A low surrogate before a high one is two lone ones.
    EXPECT_EQ(utf8(std::u16string{char16_t(0xDC00), char16_t(0xD800)}), "\xED\xB0\x80\xED\xA0\x80");
}

TEST(WindowsPaths, EveryNameComesBack) {
    const std::vector<std::u16string> names = {
        u"plain.orvmat", u"\u03a9\u03bc\u03ad\u03b3\u03b1_\u6750\u6599", u"\U0001F600\U00010000\U0010FFFF",
        std::u16string{u'a', char16_t(0xD83D)}, std::u16string{char16_t(0xDE00), u'b'},
        std::u16string{char16_t(0xDBFF), char16_t(0xDBFF), char16_t(0xDFFF)}};
    for (const std::u16string& name : names) EXPECT_EQ(platform::utf16Path(utf8(name)), name);
}

TEST(WindowsPaths, BytesThatNoNameGivesBecomeReplacementCharacters) {
    EXPECT_EQ(platform::utf16Path("a\xFF" "b"), u"a\uFFFDb");
    EXPECT_EQ(platform::utf16Path("\xE6\x9D"), u"\uFFFD\uFFFD");
    EXPECT_EQ(platform::utf16Path("\x80z"), u"\uFFFDz");
}

}  // namespace
