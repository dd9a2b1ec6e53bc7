// An archive on a block source reads exactly what an archive holding the
// same bytes reads, and pulls each block only when a read reaches it.
#include <gtest/gtest.h>

#include <cstring>
#include <random>
#include <set>
#include <string>

#include "persistence/FileBlocks.h"
#include "persistence/QuickArchive.h"
#include "platform/File.h"

using namespace OrvaneLumoCore;

namespace {

class CountingBlocks : public QuickArchive::BlockSource {
public:
    explicit CountingBlocks(const BlockSource& inner) : inner_(inner) {}
    std::uint64_t blockCount() const override { return inner_.blockCount(); }
    void fill(std::uint64_t index, char* block) const override {
        pulled.insert(index);
        ++fills;
        inner_.fill(index, block);
    }
    mutable std::set<std::uint64_t> pulled;
    mutable int fills = 0;

private:
    const BlockSource& inner_;
};

std::string randomBytes(std::size_t n, unsigned seed) {
    std::mt19937 random(seed);
    std::string s(n, '\0');
    for (char& c : s) c = static_cast<char>(random() & 0xFF);
    // A few short strings: a length field, then text.
    for (std::size_t at = 100; at + 12 < n; at += 2500) s.replace(at, 8, std::string("\x04\0\0\0text", 8));
    return s;
}

TEST(BlockSource, ReadsLikeTheBytesInMemory) {
    for (std::size_t size : {std::size_t(0), std::size_t(1), std::size_t(4096), std::size_t(10000)}) {
        const std::string bytes = randomBytes(size, static_cast<unsigned>(size));
        const platform::MemoryBytes memory(bytes.data(), bytes.size());
        const RangeBlocks range(memory, 0, size, RangeBlocks::blocksFor(size));
        QuickArchive held(bytes.data(), bytes.size());
        QuickArchive onSource(range);
        std::mt19937 random(7);
        for (int step = 0; step < 3000; ++step) {
            // Jump now and then, to block borders and behind the end.
            if (step % 16 == 0) {
                const std::uint64_t to = random() % (size + 8200);
                held.setReadPosition(to);
                onSource.setReadPosition(to);
            }
            ASSERT_EQ(held.bytesLeft(), onSource.bytesLeft()) << size << " " << step;
            // Each value starts from the same filling, kept behind the end.
            std::uint8_t byteA = 0x55, byteB = 0x55;
            std::uint32_t uintA = 0xDEADBEEF, uintB = 0xDEADBEEF;
            double realA = 1.5, realB = 1.5;
            std::string textA, textB;
            char rawA[16] = {}, rawB[16] = {};
            switch (random() % 5) {
                case 0: ASSERT_EQ(held.readByte(byteA), onSource.readByte(byteB)); break;
                case 1: held.readUInt(uintA); onSource.readUInt(uintB); break;
                case 2: held.readDouble(realA); onSource.readDouble(realB); break;
                case 3: held.readString(textA); onSource.readString(textB); break;
                default:
                    ASSERT_EQ(held.readBytes(rawA, 16, step % 2 == 0), onSource.readBytes(rawB, 16, step % 2 == 0));
            }
            ASSERT_EQ(byteA, byteB);
            ASSERT_EQ(uintA, uintB);
            ASSERT_EQ(0, std::memcmp(&realA, &realB, sizeof realA));
            ASSERT_EQ(textA, textB);
            ASSERT_EQ(0, std::memcmp(rawA, rawB, sizeof rawA));
            ASSERT_EQ(held.getReadPosition(), onSource.getReadPosition());
        }
    }
}

TEST(BlockSource, PullsOnlyTheBlocksReadAndEachOnce) {
    const std::string bytes = randomBytes(10 * QuickArchive::kBlockSize, 3);
    const platform::MemoryBytes memory(bytes.data(), bytes.size());
    // The source holds more blocks than the bytes fill: those read as zero.
    const RangeBlocks range(memory, 0, bytes.size(), 1000);
    const CountingBlocks counting(range);
    QuickArchive ar(counting);
    EXPECT_EQ(1000 * QuickArchive::kBlockSize, ar.bytesLeft());
    EXPECT_TRUE(counting.pulled.empty());

    std::uint32_t v = 0;
    ar.setReadPosition(2 * QuickArchive::kBlockSize - 2);  // crosses into block 2
    ar.readUInt(v);
    ar.setReadPosition(2 * QuickArchive::kBlockSize - 2);
    ar.readUInt(v);
    ar.setReadPosition(999 * QuickArchive::kBlockSize);
    v = 7;
    ar.readUInt(v);
    EXPECT_EQ(0u, v);
    EXPECT_EQ((std::set<std::uint64_t>{1, 2, 999}), counting.pulled);
    EXPECT_EQ(3, counting.fills);

    // Read-only: a write changes nothing, clear drops the source.
    ar.writeUInt(1);
    EXPECT_EQ(0u, ar.getWritePosition());
    EXPECT_EQ(0u, ar.getBlockCount());
    ar.clear();
    EXPECT_EQ(0u, ar.bytesLeft());
}

}  // namespace
