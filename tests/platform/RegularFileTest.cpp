// Only regular files are read: anything else behind a path is a file that
// can't be opened, found out at once, without blocking.
#include <gtest/gtest.h>

#include <fstream>
#include <string>
#include <vector>

#include "platform/File.h"
#include "support/TempFiles.h"

using namespace tempfiles;

namespace {

TEST(RegularFile, OnlyRegularFilesOpen) {
    TempDir dir;
    ASSERT_TRUE(writeFile(dir.file("plain.orvmat"), "abc"));
    ASSERT_TRUE(writeFile(dir.file("empty.orvmat"), ""));
    const std::vector<std::string> special = specialFiles(dir);  // folders, fifos, sockets, devices
    std::filesystem::create_symlink(dir.file("plain.orvmat"), dir.file("link.orvmat"));
    std::filesystem::create_symlink(dir.file("folder.orvmat"), dir.file("folderlink.orvmat"));
    struct Case {
        std::string path;
        bool opens;
        std::uint64_t size;
    };
    std::vector<Case> cases = {
        {dir.file("plain.orvmat"), true, 3},
        {dir.file("empty.orvmat"), true, 0},
        {dir.file("link.orvmat"), true, 3},
        {dir.file("folderlink.orvmat"), false, 0},
        {dir.file("missing.orvmat"), false, 0},
        {"", false, 0},
    };
    // Fifos have no writer: a blocking open would wait forever.
    for (const std::string& path : special) cases.push_back({path, false, 0});
    for (const auto& c : cases) {
        platform::RegularFile file;
        EXPECT_EQ(c.opens, file.open(wide(c.path))) << c.path;
        EXPECT_EQ(c.opens, file.isOpen()) << c.path;
        EXPECT_EQ(c.size, file.size()) << c.path;
        char byte = 'x';
        EXPECT_EQ(c.size > 0 ? 1u : 0u, file.readAt(0, &byte, 1)) << c.path;

        std::ifstream stream;
        platform::openForReading(stream, wide(c.path));
        EXPECT_EQ(c.opens, stream.is_open()) << c.path;
    }
}

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
