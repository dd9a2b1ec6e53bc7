// The system calls of the orvxml command on Linux and other POSIX systems.
#include "platform/System.h"

#include <cerrno>
#include <cstdlib>

#include <dirent.h>
#include <fcntl.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace platform {

const char kPathSeparators[] = "/";
const bool kNamesIgnoreCase = false;

PathKind pathKind(const std::string& path, int& error) {
    struct stat st;
    if (::stat(path.c_str(), &st) != 0) {
        error = errno;
        return PathKind::Missing;
    }
    return S_ISDIR(st.st_mode) ? PathKind::Folder : PathKind::Other;
}

int listFolder(const std::string& dir, std::vector<FolderEntry>& entries) {
    entries.clear();
    DIR* d = ::opendir(dir.c_str());
    if (!d) return errno;
    const std::string prefix = dir.empty() || dir.back() == '/' ? dir : dir + "/";
    while (const dirent* e = ::readdir(d)) {
        FolderEntry entry;
        entry.name = e->d_name;
        if (entry.name == "." || entry.name == "..") continue;
        // The entry's own kind, then a link's target: a name that vanished
        // since the listing is left out.
        const std::string path = prefix + entry.name;
        struct stat own, target;
        if (::lstat(path.c_str(), &own) != 0) continue;
        if (S_ISDIR(own.st_mode))
            entry.kind = FolderEntry::Folder;
        else if (S_ISLNK(own.st_mode) && ::stat(path.c_str(), &target) == 0 && S_ISDIR(target.st_mode))
            entry.kind = FolderEntry::LinkToFolder;
        entries.push_back(entry);
    }
    ::closedir(d);
    return 0;
}

int makeFolder(const std::string& path) { return ::mkdir(path.c_str(), 0777) == 0 ? 0 : errno; }

bool writeAll(int fd, const std::string& bytes) {
    const char* data = bytes.data();
    std::size_t size = bytes.size();
    while (size > 0) {
        const ssize_t n = ::write(fd, data, size);
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) return false;
        data += n;
        size -= static_cast<std::size_t>(n);
    }
    return true;
}

int writeNewFile(const std::string& path, const std::string& bytes) {
    const int fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (fd < 0) return errno;
    const bool written = writeAll(fd, bytes);
    const int writeErrno = errno;
    if (::close(fd) != 0 || !written) {
        const int e = written ? errno : writeErrno;
        ::unlink(path.c_str());
        return e;
    }
    return 0;
}

int replaceFile(const std::string& from, const std::string& to) {
    return ::rename(from.c_str(), to.c_str()) == 0 ? 0 : errno;
}

void removeFile(const std::string& path) { ::unlink(path.c_str()); }

std::FILE* openOutputFile(const std::string& path) { return std::fopen(path.c_str(), "wb"); }

bool isNoSpace(int error) { return error == ENOSPC || error == EDQUOT; }

unsigned long processId() { return static_cast<unsigned long>(::getpid()); }

Terminal errorTerminal() { return ::isatty(STDERR_FILENO) ? Terminal::Escapes : Terminal::None; }

int errorTerminalColumns() {
    winsize size = {};
    if (::ioctl(STDERR_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0) return size.ws_col;
    // A terminal that doesn't tell its size (a serial line) may still be
    // described by the shell.
    const char* columns = std::getenv("COLUMNS");
    const long n = columns ? std::strtol(columns, nullptr, 10) : 0;
    return n > 0 && n < 10000 ? static_cast<int>(n) : 80;
}

std::string fullPath(const std::string& path) {
    char* full = ::realpath(path.c_str(), nullptr);
    if (!full) return path;
    const std::string result(full);
    std::free(full);
    return result;
}

bool modificationTime(const std::string& path, long long& nanoseconds) {
    struct stat st;
    if (::stat(path.c_str(), &st) != 0) return false;
    nanoseconds = static_cast<long long>(st.st_mtim.tv_sec) * 1000000000LL + st.st_mtim.tv_nsec;
    return true;
}

}  // namespace platform
