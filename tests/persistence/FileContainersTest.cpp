// The two containers read the header and the blocks their records use, not
// the whole file.
#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "options/AllOptions.h"
#include "platform/File.h"
#include "support/TempFiles.h"

using namespace OrvaneLumoCore;
using namespace tempfiles;

namespace {

// Remembers how many bytes were asked of the source.
class CountingBytes : public platform::ByteSource {
public:
    explicit CountingBytes(const std::string& bytes) : bytes_(bytes.data(), bytes.size()) {}
    std::uint64_t size() const override { return bytes_.size(); }
    std::size_t readAt(std::uint64_t offset, void* dst, std::size_t n) const override {
        const std::size_t got = bytes_.readAt(offset, dst, n);
        read += got;
        return got;
    }
    mutable std::uint64_t read = 0;

private:
    platform::MemoryBytes bytes_;
};

TEST(FileContainers, ALoaderReadsTheHeaderAndTheBlocksItUses) {
    const std::string garbage(1 << 20, '\x5A');
    const struct {
        std::string bytes;
        bool options;
        bool loads;
    } cases[] = {
        {example("materials_all_layers.orvmat") + garbage, false, true},
        {claimsMore() + garbage, false, true},
        {example("materials_old_records_v2.orvmat") + garbage, false, true},
        {example("render_settings.orvopt") + garbage, true, true},
        {std::string(8, '\0') + garbage, false, false},
        {std::string(8, '\0') + garbage, true, false},
    };
    for (const auto& c : cases) {
        CountingBytes bytes(c.bytes);
        AllOptions options;
        OrvMatFile materials;
        EXPECT_EQ(c.loads, c.options ? OrvOptFile().load(options, bytes) : materials.load(bytes));
        EXPECT_LE(bytes.read, 3 * QuickArchive::kBlockSize) << c.bytes.size();
    }
}

// Text mode undone across block borders: the same stream as a version 1, 2
// and 3 library gives the same materials.
TEST(FileContainers, AllContainerVersionsReadTheSameStream) {
    OrvMatFile source;
    ASSERT_TRUE(source.load(wide(examplePath("materials_all_layers.orvmat"))));
    std::vector<MaterialPtr> many;
    for (int i = 0; i < 40; ++i) {
        // Names full of line feeds put CR LF pairs at many offsets.
        MaterialPtr m = source.materials[0]->clone();
        m->name = std::u16string(static_cast<std::size_t>(i * 7 % 61), u'\n') + u"\r" + std::u16string(i, u'\n');
        many.push_back(m);
    }
    OrvMatFile file;
    file.materials = many;
    std::ostringstream out;
    ASSERT_TRUE(file.save(out));
    const std::string v3 = out.str();
    const std::string stream = v3.substr(12);
    ASSERT_GT(stream.size(), 4 * QuickArchive::kBlockSize);
    std::string crlf;
    for (char ch : stream) {
        if (ch == '\n') crlf += '\r';
        crlf += ch;
    }
    const std::string count = le32(static_cast<std::uint32_t>(many.size()));
    const std::string v2 = le32(0x20000) + count + stream;
    const std::string v1 = le32(0x10000) + count + crlf;

    TempDir dir;
    std::u16string expected;
    for (const std::string& bytes : {v3, v2, v1}) {
        OrvMatFile fromMemory;
        ASSERT_TRUE(fromMemory.load(bytes.data(), bytes.size()));
        if (expected.empty()) expected = fromMemory.documentXml();
        EXPECT_EQ(expected, fromMemory.documentXml());
        ASSERT_TRUE(writeFile(dir.file("lib.orvmat"), bytes));
        EXPECT_EQ(expected, OrvMatFile().getXml(wide(dir.file("lib.orvmat"))));
        std::istringstream in(bytes);
        OrvMatFile fromStream;
        ASSERT_TRUE(fromStream.load(in));
        EXPECT_EQ(many.size(), fromStream.getMaterialCount());
    }
}

}  // namespace
