// Only regular files are read: on a POSIX system a folder, FIFO, socket,
// device or a link to a folder is a file that can't be opened, found out at
// once, without blocking.
#include <gtest/gtest.h>

#include <fstream>
#include <string>
#include <vector>

#include "platform/File.h"
#include "support/PosixFiles.h"

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

}  // namespace
