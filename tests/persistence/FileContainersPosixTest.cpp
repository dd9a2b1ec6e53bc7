// The two containers on real files of POSIX systems: only regular files are
// read, and a large sparse file costs the blocks its records use, not its size.
#include <gtest/gtest.h>

#include <string>

#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "options/AllOptions.h"
#include "support/PosixFiles.h"

using namespace OrvaneLumoCore;
using namespace tempfiles;

namespace {

const std::uint64_t kGiB = 1ull << 30;

std::u16string convert(const std::string& path) {
    const bool options = path.compare(path.size() - 3, 3, "opt") == 0;
    return options ? OrvOptFile().getXml(wide(path)) : OrvMatFile().getXml(wide(path));
}

TEST(FileContainers, ANonRegularFileIsAFileThatCantBeOpened) {
    TempDir dir;
    for (const std::string& path : specialFiles(dir)) {
        OrvMatFile materials;
        AllOptions options;
        EXPECT_FALSE(materials.load(wide(path))) << path;
        EXPECT_FALSE(OrvOptFile().load(options, wide(path))) << path;
        EXPECT_EQ(u"", OrvMatFile().getXml(wide(path))) << path;
        EXPECT_EQ(u"", OrvOptFile().getXml(wide(path))) << path;
    }
}

TEST(FileContainers, LargeSparseFilesCostWhatTheirRecordsUse) {
    TempDir dir;
    const struct {
        const char* name;
        std::string head;  // then zeros up to 1 GiB
    } cases[] = {
        {"zeros.orvmat", ""},
        {"zeros.orvopt", ""},
        {"text.orvmat", "text up to the first zero byte"},
        {"library.orvmat", example("materials_all_layers.orvmat")},
        {"old_library.orvmat", example("materials_old_records_v2.orvmat")},
        {"claims_more.orvmat", claimsMore()},
        {"settings.orvopt", example("render_settings.orvopt")},
    };
    for (const auto& c : cases) {
        // What the head alone converts to: trailing zeros change nothing.
        const std::string head = dir.file(std::string("head_") + c.name);
        ASSERT_TRUE(writeFile(head, c.head));
        const std::u16string expected = convert(head);
        EXPECT_EQ(c.head.empty(), expected.empty()) << c.name;

        const std::string path = dir.file(c.name);
        ASSERT_TRUE(writeSparse(path, c.head, kGiB));
        expectSmallChild([&] { return convert(path) == expected; }, c.name);
    }
}

}  // namespace
