#include "platform/File.h"

#include <algorithm>
#include <cstring>

namespace platform {

void openForReading(std::ifstream& file, const std::u16string& path) {
    // The stream would block on a FIFO and read garbage sizes from a folder:
    // only a path that opens as a regular file is handed to it.
    if (!RegularFile().open(path)) return;
    file.open(nativePath(path), std::ios::in | std::ios::binary);
}

void openForWriting(std::ofstream& file, const std::u16string& path) {
    file.open(nativePath(path), std::ios::out | std::ios::binary | std::ios::trunc);
}

RegularFile::~RegularFile() { close(); }

bool RegularFile::open(const std::u16string& path) {
    close();
    size_ = 0;
    notRegular_ = false;
    error_ = 0;
    return openNative(path);
}

std::size_t MemoryBytes::readAt(std::uint64_t offset, void* dst, std::size_t n) const {
    if (offset >= size_) return 0;
    const std::size_t count = static_cast<std::size_t>(std::min<std::uint64_t>(n, size_ - offset));
    std::memcpy(dst, data_ + offset, count);
    return count;
}

}  // namespace platform
