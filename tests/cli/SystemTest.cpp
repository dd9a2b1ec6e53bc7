// The system calls that the orvxml command makes through the platform layer,
// checked alike on every system: the kinds of paths, folder listings,
// folders, whole-file writes that replace a file, the report's byte stream.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstring>
#include <thread>
#include <cerrno>
#include <string>
#include <vector>

#include "platform/File.h"
#include "platform/System.h"
#include "support/TempFiles.h"

namespace {

using platform::FolderEntry;
using platform::PathKind;
using tempfiles::TempDir;

// Greek and CJK letters: outside every ANSI code page at once.
const std::string kForeign = "\xCE\xA9\xCE\xBC\xCE\xAD\xCE\xB3\xCE\xB1_\xE6\x9D\x90\xE6\x96\x99";

// The bytes of a file, read through the library's wide path.
std::string contents(const std::string& path) {
    platform::RegularFile file;
    if (!file.open(tempfiles::wide(path))) return "<can't be opened>";
    std::string bytes(static_cast<std::size_t>(file.size()), '\0');
    bytes.resize(file.readAt(0, &bytes[0], bytes.size()));
    return bytes;
}

std::vector<std::string> listing(const std::string& dir) {
    std::vector<FolderEntry> entries;
    EXPECT_EQ(platform::listFolder(dir, entries), 0) << dir;
    std::vector<std::string> names;
    for (const FolderEntry& e : entries)
        names.push_back(e.name + (e.kind == FolderEntry::Folder ? "/" : e.kind == FolderEntry::LinkToFolder ? "@" : ""));
    std::sort(names.begin(), names.end());
    return names;
}

TEST(SystemPaths, KindsOfPaths) {
    TempDir dir;
    ASSERT_EQ(platform::makeFolder(dir.file("sub")), 0);
    ASSERT_EQ(platform::writeNewFile(dir.file("a.orvmat"), "x"), 0);
    int error = 0;
    EXPECT_EQ(platform::pathKind(dir.file("sub"), error), PathKind::Folder);
    EXPECT_EQ(platform::pathKind(dir.file("sub/"), error), PathKind::Folder);
    EXPECT_EQ(platform::pathKind(dir.file("a.orvmat"), error), PathKind::Other);
    EXPECT_EQ(platform::pathKind(dir.file("gone.orvmat"), error), PathKind::Missing);
    EXPECT_EQ(error, ENOENT);
    error = 0;
    EXPECT_EQ(platform::pathKind(dir.file("a.orvmat/below"), error), PathKind::Missing);
    EXPECT_NE(error, 0);
}

TEST(SystemPaths, FullPathsResolveDotsAndTimesFollowWrites) {
    TempDir dir;
    ASSERT_EQ(platform::makeFolder(dir.file("sub")), 0);
    const std::string sub = platform::fullPath(dir.file("sub"));
    EXPECT_EQ(platform::fullPath(dir.file("sub/../sub/.")), sub);
    ASSERT_GT(sub.size(), 4u);
    EXPECT_EQ(sub.compare(sub.size() - 3, 3, "sub"), 0) << sub;
    EXPECT_NE(std::strchr(platform::kPathSeparators, sub[sub.size() - 4]), nullptr) << sub;
    EXPECT_EQ(platform::fullPath(sub), sub);  // already absolute and resolved

    long long before = 0, after = 0;
    EXPECT_FALSE(platform::modificationTime(dir.file("gone.orvmat"), before));
    ASSERT_EQ(platform::writeNewFile(dir.file("a.orvmat"), "x"), 0);
    ASSERT_TRUE(platform::modificationTime(dir.file("a.orvmat"), before));
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    ASSERT_EQ(platform::writeNewFile(dir.file("b.orvmat"), "y"), 0);
    ASSERT_TRUE(platform::modificationTime(dir.file("b.orvmat"), after));
    EXPECT_GT(after, before);
    EXPECT_LT(after - before, 60LL * 1000000000LL);  // nanoseconds, not some coarser unit
}

TEST(SystemFolders, ListingHoldsEveryEntryButDots) {
    TempDir dir;
    ASSERT_EQ(platform::makeFolder(dir.file("lib")), 0);
    EXPECT_EQ(listing(dir.file("lib")), std::vector<std::string>());
    ASSERT_EQ(platform::makeFolder(dir.file("lib/x.orvmat")), 0);
    ASSERT_EQ(platform::writeNewFile(dir.file("lib/b.LUOPT"), ""), 0);
    ASSERT_EQ(platform::writeNewFile(dir.file("lib/notes.txt"), "n"), 0);
    ASSERT_EQ(platform::writeNewFile(dir.file("lib/" + kForeign + ".orvopt"), "f"), 0);
    EXPECT_EQ(listing(dir.file("lib")),
              (std::vector<std::string>{"b.LUOPT", "notes.txt", "x.orvmat/", kForeign + ".orvopt"}));
    // The listing's names lead back to the files.
    EXPECT_EQ(contents(dir.file("lib/" + kForeign + ".orvopt")), "f");

    std::vector<FolderEntry> entries;
    EXPECT_EQ(platform::listFolder(dir.file("missing"), entries), ENOENT);
    EXPECT_NE(platform::listFolder(dir.file("lib/notes.txt"), entries), 0);
}

TEST(SystemFolders, MakeFolderSaysWhatStandsInTheWay) {
    TempDir dir;
    EXPECT_EQ(platform::makeFolder(dir.file("new")), 0);
    EXPECT_EQ(platform::makeFolder(dir.file("new")), EEXIST);
    ASSERT_EQ(platform::writeNewFile(dir.file("file"), ""), 0);
    EXPECT_EQ(platform::makeFolder(dir.file("file")), EEXIST);
    EXPECT_EQ(platform::makeFolder(dir.file("missing/new")), ENOENT);
    EXPECT_EQ(platform::makeFolder(dir.file(kForeign)), 0);
    EXPECT_EQ(listing(dir.file("")), (std::vector<std::string>{"file", "new/", kForeign + "/"}));
}

TEST(SystemFiles, WriteAndReplace) {
    TempDir dir;
    const std::string target = dir.file("out.xml"), part = dir.file("out.xml.part1");
    const std::string bytes = std::string("<a>\n\r\n\0\x1a</a>\n", 14);
    ASSERT_EQ(platform::writeNewFile(part, bytes), 0);
    EXPECT_EQ(contents(part), bytes);  // no line end changed, nothing stops at ^Z
    ASSERT_EQ(platform::replaceFile(part, target), 0);
    EXPECT_EQ(contents(target), bytes);
    EXPECT_EQ(listing(dir.file("")), std::vector<std::string>{"out.xml"});

    // A second write empties the file first; the rename replaces the older one.
    ASSERT_EQ(platform::writeNewFile(part, "long long long"), 0);
    ASSERT_EQ(platform::writeNewFile(part, "new"), 0);
    ASSERT_EQ(platform::replaceFile(part, target), 0);
    EXPECT_EQ(contents(target), "new");

    EXPECT_EQ(platform::replaceFile(dir.file("gone"), target), ENOENT);
    EXPECT_EQ(contents(target), "new");
    EXPECT_EQ(platform::writeNewFile(dir.file("missing/out.xml"), "x"), ENOENT);
    platform::removeFile(target);
    EXPECT_EQ(listing(dir.file("")), std::vector<std::string>());
}

TEST(SystemFiles, PathsBeyond260Characters) {
    TempDir dir;
    std::string folder = dir.file("");
    for (int i = 0; i < 8; ++i) {
        folder += "folder_of_a_rather_long_name_" + std::to_string(i);
        ASSERT_EQ(platform::makeFolder(folder), 0) << folder.size();
        folder += "/";
    }
    ASSERT_GT(folder.size(), 260u);
    ASSERT_EQ(platform::writeNewFile(folder + "deep.part", "deep"), 0);
    ASSERT_EQ(platform::replaceFile(folder + "deep.part", folder + kForeign + ".xml"), 0);
    EXPECT_EQ(listing(folder), std::vector<std::string>{kForeign + ".xml"});
    int error = 0;
    EXPECT_EQ(platform::pathKind(folder + kForeign + ".xml", error), PathKind::Other);
    EXPECT_EQ(contents(folder + kForeign + ".xml"), "deep");
}

TEST(SystemFiles, OutputFileTakesBytesAsTheyAre) {
    TempDir dir;
    std::FILE* f = platform::openOutputFile(dir.file(kForeign + ".jsonl"));
    ASSERT_NE(f, nullptr);
    std::fputs("{\"a\": 1}\n{\"b\": 2}\r\n", f);
    ASSERT_EQ(std::fclose(f), 0);
    EXPECT_EQ(contents(dir.file(kForeign + ".jsonl")), "{\"a\": 1}\n{\"b\": 2}\r\n");
    errno = 0;
    EXPECT_EQ(platform::openOutputFile(dir.file("missing/report.jsonl")), nullptr);
    EXPECT_EQ(errno, ENOENT);
}

}  // namespace
