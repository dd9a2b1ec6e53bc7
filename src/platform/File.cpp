#include "platform/File.h"

#include <cerrno>
#include <cstring>
#include <limits>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/Text.h"

namespace platform {

std::string pathToNative(const std::u16string& path) {
    return encodeUtf8(path.data(), path.size());
}

void openForReading(std::ifstream& file, const std::u16string& path) {
    // The stream would block on a FIFO and read garbage sizes from a folder:
    // only a path that opens as a regular file is handed to it.
    if (!RegularFile().open(path)) return;
    file.open(pathToNative(path), std::ios::in | std::ios::binary);
}

void openForWriting(std::ofstream& file, const std::u16string& path) {
    file.open(pathToNative(path), std::ios::out | std::ios::binary | std::ios::trunc);
}

std::size_t MemoryBytes::readAt(std::uint64_t offset, void* dst, std::size_t n) const {
    if (offset >= size_) return 0;
    const std::size_t count = static_cast<std::size_t>(std::min<std::uint64_t>(n, size_ - offset));
    std::memcpy(dst, data_ + offset, count);
    return count;
}

RegularFile::~RegularFile() {
    if (fd_ >= 0) ::close(fd_);
}

bool RegularFile::open(const std::u16string& path) {
    if (fd_ >= 0) {
        ::close(fd_);
        fd_ = -1;
    }
    size_ = 0;
    notRegular_ = false;
    error_ = 0;
    const std::string native = pathToNative(path);
    // O_NONBLOCK: opening a FIFO with no writer returns at once instead of
    // waiting. It has no effect on reads from a regular file.
    int fd;
    do {
        fd = ::open(native.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY);
    } while (fd < 0 && errno == EINTR);
    if (fd < 0) {
        error_ = errno;
        return false;
    }
    struct stat st;
    if (::fstat(fd, &st) != 0) {
        error_ = errno;
        ::close(fd);
        return false;
    }
    if (!S_ISREG(st.st_mode) || st.st_size < 0) {
        notRegular_ = true;
        ::close(fd);
        return false;
    }
    fd_ = fd;
    size_ = static_cast<std::uint64_t>(st.st_size);
    return true;
}

std::size_t RegularFile::readAt(std::uint64_t offset, void* dst, std::size_t n) const {
    char* p = static_cast<char*>(dst);
    std::size_t done = 0;
    if (offset > static_cast<std::uint64_t>(std::numeric_limits<off_t>::max()) - n) return 0;
    while (fd_ >= 0 && done < n) {
        const ssize_t got = ::pread(fd_, p + done, n - done, static_cast<off_t>(offset + done));
        if (got < 0 && errno == EINTR) continue;
        if (got <= 0) break;
        done += static_cast<std::size_t>(got);
    }
    return done;
}

}  // namespace platform
