#include "persistence/FileBlocks.h"

#include <algorithm>
#include <cstring>

namespace OrvaneLumoCore {

void RangeBlocks::fill(std::uint64_t index, char* block) const {
    const std::uint64_t start = index * QuickArchive::kBlockSize;
    std::size_t got = 0;
    if (start < length_) {
        const std::size_t want = static_cast<std::size_t>(
            std::min<std::uint64_t>(QuickArchive::kBlockSize, length_ - start));
        got = bytes_.readAt(offset_ + start, block, want);
    }
    std::memset(block + got, 0, QuickArchive::kBlockSize - got);
}

}  // namespace OrvaneLumoCore
