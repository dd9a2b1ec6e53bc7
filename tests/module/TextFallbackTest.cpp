// The text road: a file's text up to its first zero byte, read in chunks up
// to that byte and no further.
#include <gtest/gtest.h>

#include <string>

#include "module/TextFallback.h"
#include "persistence/QuickArchive.h"
#include "support/TempFiles.h"

using namespace OrvaneLumoCore;
using namespace tempfiles;

namespace {

TEST(TextFallback, TextEndsAtTheFirstZeroByte) {
    TempDir dir;
    // Lengths around the reading chunk of 64 KiB.
    const std::string longText(200000, 'a');
    const struct {
        std::string bytes;
        std::string text;
    } cases[] = {
        {"", ""},
        {std::string("\0after", 6), ""},
        {"plain text", "plain text"},
        {std::string("before\0after", 12), "before"},
        {std::string(65536, 'b'), std::string(65536, 'b')},
        {std::string(65536, 'b') + std::string("\0c", 2), std::string(65536, 'b')},
        {std::string(65535, 'b') + std::string("\0c", 2), std::string(65535, 'b')},
        {longText + std::string("\0", 1) + longText, longText},
        {"caf\xC3\xA9", "caf\xC3\xA9"},
        {"caf\xE9", "caf\xC3\xA9"},  // not UTF-8: the ANSI code page
    };
    for (const auto& c : cases) {
        ASSERT_TRUE(writeFile(dir.file("t.orvmat"), c.bytes));
        EXPECT_EQ(c.text, wideToUtf8(readFileAsText(wide(dir.file("t.orvmat"))))) << c.bytes.size();
    }
}

}  // namespace
