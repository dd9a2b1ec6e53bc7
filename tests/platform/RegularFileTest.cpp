// Reading at any offset of a regular file, as of bytes in memory.
#include <gtest/gtest.h>

#include <fstream>
#include <string>
#include <vector>

#include "platform/File.h"
#include "support/TempFiles.h"

using namespace tempfiles;

namespace {

TEST(RegularFile, ReadAtAnyOffset) {
    TempDir dir;
    ASSERT_TRUE(writeFile(dir.file("f"), "0123456789"));
    platform::RegularFile file;
    ASSERT_TRUE(file.open(wide(dir.file("f"))));
    const std::string bytes = "0123456789";
    const platform::MemoryBytes memory(bytes.data(), bytes.size());
    // Both sources agree: up to n bytes, fewer at the end, none behind it.
    const struct {
        std::uint64_t offset;
        std::size_t n;
        const char* expected;
    } cases[] = {{0, 4, "0123"}, {6, 4, "6789"}, {8, 4, "89"}, {10, 4, ""}, {1ull << 40, 4, ""},
                 {~0ull - 2, 4, ""}};
    for (const auto& c : cases) {
        for (const platform::ByteSource* source : {static_cast<const platform::ByteSource*>(&file),
                                                   static_cast<const platform::ByteSource*>(&memory)}) {
            char buffer[8] = {};
            const std::size_t got = source->readAt(c.offset, buffer, c.n);
            EXPECT_EQ(c.expected, std::string(buffer, got)) << c.offset;
        }
    }
    // Opening another path closes the first.
    EXPECT_FALSE(file.open(wide(dir.file("missing"))));
    EXPECT_EQ(0u, file.size());
}

}  // namespace
