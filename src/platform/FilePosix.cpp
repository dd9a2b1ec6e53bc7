// Files on Linux and other POSIX systems.
#include "platform/File.h"

#include <cerrno>
#include <cstring>
#include <limits>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/Text.h"

namespace platform {

std::filesystem::path nativePath(const std::u16string& path) {
    return std::filesystem::path(encodeUtf8(path.data(), path.size()));
}

void RegularFile::close() {
    if (handle_ != kClosed) ::close(static_cast<int>(handle_));
    handle_ = kClosed;
}

bool RegularFile::openNative(const std::u16string& path) {
    const std::string native = nativePath(path).native();
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
    handle_ = fd;
    size_ = static_cast<std::uint64_t>(st.st_size);
    return true;
}

std::size_t RegularFile::readAt(std::uint64_t offset, void* dst, std::size_t n) const {
    char* p = static_cast<char*>(dst);
    std::size_t done = 0;
    if (offset > static_cast<std::uint64_t>(std::numeric_limits<off_t>::max()) - n) return 0;
    const int fd = static_cast<int>(handle_);
    while (handle_ != kClosed && done < n) {
        const ssize_t got = ::pread(fd, p + done, n - done, static_cast<off_t>(offset + done));
        if (got < 0 && errno == EINTR) continue;
        if (got <= 0) break;
        done += static_cast<std::size_t>(got);
    }
    return done;
}

}  // namespace platform
