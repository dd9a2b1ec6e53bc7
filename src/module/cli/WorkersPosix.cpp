// Workers on POSIX systems: forked from the parent before it converts
// anything, so each starts as a fresh process. They take the next job from a
// counter on a shared page and report on a pipe of their own.
#include <algorithm>
#include <atomic>
#include <cerrno>
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
    if (workers > jobs.size()) workers = static_cast<unsigned>(jobs.size());
    if (workers <= 1 || !counter.next) {
        runHere(jobs, reported, sink);
        return;
    }
    std::fflush(nullptr);
    std::map<pid_t, std::uint32_t> pids;
    std::vector<int> pipes(workers, -1);  // each worker's pipe, read end; -1 once it has ended
    for (std::uint32_t w = 0; w < workers; ++w) {
        int fds[2];
        if (::pipe2(fds, O_CLOEXEC) != 0) continue;
        const pid_t pid = ::fork();
        if (pid == 0) {
            for (const int fd : pipes)
                if (fd >= 0) ::close(fd);
            ::close(fds[0]);
            workerLoop(jobs, w, *counter.next, fds[1]);
        }
        ::close(fds[1]);
        if (pid > 0) {
            pids[pid] = w;
            pipes[w] = fds[0];
        } else {
            ::close(fds[0]);
        }
    }

    // What each worker holds: the index it started and hasn't finished.
    const std::uint64_t kNone = ~std::uint64_t(0);
    std::vector<std::uint64_t> holding(workers, kNone);
    std::vector<FrameReader> frames(workers);
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
        std::vector<pollfd> open;
        for (const int fd : pipes)
            if (fd >= 0) open.push_back(pollfd{fd, POLLIN, 0});
        if (open.empty()) break;
        if (::poll(open.data(), open.size(), 100) <= 0) continue;
        for (std::uint32_t w = 0; w < workers; ++w) {
            if (pipes[w] < 0) continue;
            const auto ready = std::find_if(open.begin(), open.end(),
                                            [&](const pollfd& p) { return p.fd == pipes[w]; });
            if (ready == open.end() || ready->revents == 0) continue;
            const ssize_t n = ::read(pipes[w], chunk, sizeof chunk);
            if (n < 0 && errno == EINTR) continue;
            if (n <= 0) {
                ::close(pipes[w]);
                pipes[w] = -1;
                continue;
            }
            frames[w].append(chunk, static_cast<std::size_t>(n));
            while (frames[w].next(body)) {
                Message m;
                if (!parseMessage(body.data(), body.size(), m) || m.worker != w || m.index >= jobs.size() ||
                    reported[m.index])
                    continue;
                if (m.type == MessageType::Started) {
                    holding[w] = m.index;
                } else {
                    holding[w] = kNone;
                    reported[m.index] = true;
                    if (!sink(static_cast<std::size_t>(m.index), m.result)) {
                        goOn = false;
                        counter.next->store(jobs.size());  // the workers take no further job
                    }
                }
            }
        }
    }

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
