#pragma once
// Archive blocks read from a byte range of a file, on demand.
#include <cstdint>

#include "persistence/QuickArchive.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

// `count` blocks laid one after the other from byte `offset` of `bytes`,
// which outlive the blocks. Bytes behind `offset + length` read as zero, as
// do bytes the file no longer holds.
class RangeBlocks : public QuickArchive::BlockSource {
public:
    RangeBlocks(const platform::ByteSource& bytes, std::uint64_t offset, std::uint64_t length,
                std::uint64_t count)
        : bytes_(bytes), offset_(offset), length_(length), count_(count) {}

    // Just enough blocks for `length` bytes.
    static std::uint64_t blocksFor(std::uint64_t length) {
        return length / QuickArchive::kBlockSize + (length % QuickArchive::kBlockSize != 0);
    }

    std::uint64_t blockCount() const override { return count_; }
    void fill(std::uint64_t index, char* block) const override;
    std::uint64_t dataSize() const override {
        const std::uint64_t blocks = count_ * QuickArchive::kBlockSize;
        return length_ < blocks ? length_ : blocks;
    }

private:
    const platform::ByteSource& bytes_;
    std::uint64_t offset_;
    std::uint64_t length_;
    std::uint64_t count_;
};

}  // namespace OrvaneLumoCore
