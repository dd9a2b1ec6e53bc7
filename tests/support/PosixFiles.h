#pragma once
// Scratch files that only POSIX systems have: sparse files, FIFOs, sockets
// and devices, and the peak memory of work done in a forked child.
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstring>
#include <functional>
#include <vector>

#include "support/TempFiles.h"

namespace tempfiles {

// Writes `head` and extends the file with a hole to `size` bytes, if larger.
inline bool writeSparse(const std::string& path, const std::string& head, std::uint64_t size) {
    return writeFile(path, head) && (size <= head.size() || ::truncate(path.c_str(), static_cast<off_t>(size)) == 0);
}

// A socket file at `path`; it stays behind when the socket is closed.
inline bool makeSocket(const std::string& path) {
    const int fd = ::socket(AF_UNIX, SOCK_STREAM, 0);
    if (fd < 0) return false;
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    bool bound = false;
    if (path.size() < sizeof address.sun_path) {
        std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
        bound = ::bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
    }
    ::close(fd);
    return bound;
}

// Paths in `dir` that are not regular files (folders, fifos without a writer,
// a socket) and two devices, under both file extensions.
inline std::vector<std::string> specialFiles(const TempDir& dir) {
    std::vector<std::string> paths;
    for (const char* ext : {".orvmat", ".orvopt"}) {
        const std::string folder = dir.file(std::string("folder") + ext), fifo = dir.file(std::string("fifo") + ext);
        const std::string socket = dir.file(std::string("socket") + ext);
        EXPECT_TRUE(std::filesystem::create_directory(folder));
        EXPECT_EQ(0, ::mkfifo(fifo.c_str(), 0600));
        EXPECT_TRUE(makeSocket(socket));
        paths.insert(paths.end(), {folder, fifo, socket});
    }
    paths.insert(paths.end(), {"/dev/null", "/dev/zero"});
    return paths;
}

// Runs `work` in a forked child. Returns the child's peak resident memory
// in MiB, or -1 if the child didn't exit normally; `passed` is what `work`
// returned.
inline long peakMiBOfChild(const std::function<bool()>& work, bool& passed) {
    passed = false;
    const pid_t pid = ::fork();
    if (pid < 0) return -1;
    if (pid == 0) _exit(work() ? 0 : 1);
    int status = 0;
    rusage usage = {};
    if (::wait4(pid, &status, 0, &usage) != pid || !WIFEXITED(status)) return -1;
    passed = WEXITSTATUS(status) == 0;
    return usage.ru_maxrss / 1024;
}

// `work` succeeds in a child whose peak stays under 100 MiB above that of a
// child that does nothing.
inline void expectSmallChild(const std::function<bool()>& work, const std::string& what) {
    bool idle = false, passed = false;
    const long base = peakMiBOfChild([] { return true; }, idle);
    const long peak = peakMiBOfChild(work, passed);
    EXPECT_TRUE(passed) << what;
    EXPECT_TRUE(base >= 0 && peak >= base) << what << ": " << base << " then " << peak;
    EXPECT_LT(peak - base, 100) << what;
}

}  // namespace tempfiles
