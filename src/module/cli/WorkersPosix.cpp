// Workers on POSIX systems: forked from the parent before it converts
// anything, so each starts as a fresh process. They take the next job from a
// counter on a shared page and report on one pipe that all of them share.
#include <atomic>
#include <cerrno>
#include <climits>
#include <csignal>
#include <map>

#include <fcntl.h>
#include <poll.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include "module/cli/Workers.h"
#include "platform/Interrupt.h"
#include "platform/System.h"

namespace orvxml {

bool runAsWorker(const std::vector<std::string>&, int&) { return false; }

namespace {

// Each message is written with a single write() of at most PIPE_BUF bytes,
// so messages of different workers never interleave.
// Length, type, worker, index, status, characters, milliseconds, three
// texts, the write's errno.
static_assert(4 + 1 + 4 + 8 + 1 + 8 + 8 + 3 * (2 + kMaxText) + 4 <= PIPE_BUF,
              "a message is written in one piece");

// The next job's index, shared by all workers through a shared page.
struct SharedCounter {
    SharedCounter() {
        void* p = ::mmap(nullptr, sizeof(std::atomic<std::uint64_t>), PROT_READ | PROT_WRITE,
                         MAP_SHARED | MAP_ANONYMOUS, -1, 0);
        if (p != MAP_FAILED) next = new (p) std::atomic<std::uint64_t>(0);
    }
    ~SharedCounter() {
        if (next) ::munmap(next, sizeof *next);
    }
    std::atomic<std::uint64_t>* next = nullptr;
};
static_assert(std::atomic<std::uint64_t>::is_always_lock_free, "the counter is shared by processes");

// Takes jobs until none is left or the process is interrupted; a job taken
// is always finished, its file written or its part file removed. A write
// that finds the disk full leaves no job for any worker.
[[noreturn]] void workerLoop(const std::vector<Job>& jobs, std::uint32_t worker,
                             std::atomic<std::uint64_t>& next, int fd) {
    while (!platform::interruption()) {
        Message m;
        m.worker = worker;
        m.index = next.fetch_add(1);
        if (m.index >= jobs.size()) break;
        if (!platform::writeAll(fd, packMessage(m))) break;
        m.type = MessageType::Finished;
        m.result = runJob(jobs[m.index], nullptr);
        if (stopsTheRun(m.result)) next.store(jobs.size());
        if (!platform::writeAll(fd, packMessage(m))) break;
    }
    ::_exit(platform::interruption() ? 128 + platform::interruption() : 0);
}

FileResult crashed(int status) {
    return stopped(WIFSIGNALED(status)
                       ? std::string("the conversion stopped on signal ") + std::to_string(WTERMSIG(status))
                       : std::string("the conversion stopped with status ") +
                             std::to_string(WEXITSTATUS(status)));
}

}  // namespace

void runJobs(const std::vector<Job>& jobs, unsigned workers, const ResultSink& sink) {
    std::vector<bool> reported(jobs.size(), false);
    SharedCounter counter;
    int fds[2];
    if (workers > jobs.size()) workers = static_cast<unsigned>(jobs.size());
    if (workers <= 1 || !counter.next || ::pipe2(fds, O_CLOEXEC) != 0) {
        runHere(jobs, reported, sink);
        return;
    }
    std::fflush(nullptr);
    std::map<pid_t, std::uint32_t> pids;
    for (std::uint32_t w = 0; w < workers; ++w) {
        const pid_t pid = ::fork();
        if (pid == 0) {
            ::close(fds[0]);
            workerLoop(jobs, w, *counter.next, fds[1]);
        }
        if (pid > 0) pids[pid] = w;
    }
    ::close(fds[1]);

    // What each worker holds: the index it started and hasn't finished.
    const std::uint64_t kNone = ~std::uint64_t(0);
    std::vector<std::uint64_t> holding(workers, kNone);
    FrameReader frames;
    std::string body;
    char chunk[1 << 16];
    bool forwarded = false, goOn = true;
    for (;;) {
        // A signal that reached only this process (a SIGTERM to its pid) is
        // passed on to the workers, which stop after their current file.
        if (platform::interruption() && !forwarded) {
            for (const auto& p : pids) ::kill(p.first, platform::interruption());
            forwarded = true;
        }
        pollfd ready = {fds[0], POLLIN, 0};
        if (::poll(&ready, 1, 100) <= 0) continue;
        const ssize_t n = ::read(fds[0], chunk, sizeof chunk);
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) break;
        frames.append(chunk, static_cast<std::size_t>(n));
        while (frames.next(body)) {
            Message m;
            if (!parseMessage(body.data(), body.size(), m) || m.worker >= workers || m.index >= jobs.size() ||
                reported[m.index])
                continue;
            if (m.type == MessageType::Started) {
                holding[m.worker] = m.index;
            } else {
                holding[m.worker] = kNone;
                reported[m.index] = true;
                if (!sink(static_cast<std::size_t>(m.index), m.result)) {
                    goOn = false;
                    counter.next->store(jobs.size());  // the workers take no further job
                }
            }
        }
    }
    ::close(fds[0]);

    for (const auto& p : pids) {
        int status = 0;
        while (::waitpid(p.first, &status, 0) < 0 && errno == EINTR) {
        }
        const std::uint64_t held = holding[p.second];
        if (held == kNone || reported[held]) continue;
        reported[held] = true;
        if (!jobs[held].output.empty()) platform::removeFile(partPath(jobs[held].output, p.first));
        sink(static_cast<std::size_t>(held), crashed(status));
    }
    // Jobs that no worker finished, if workers stopped early or couldn't start.
    if (goOn) runHere(jobs, reported, sink);
}

}  // namespace orvxml
