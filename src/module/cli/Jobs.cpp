#include "module/cli/Jobs.h"

#include <atomic>
#include <cerrno>
#include <climits>
#include <chrono>
#include <cstring>
#include <map>

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include "platform/Text.h"

namespace orvxml {

using OrvaneLumoCore::FileStatus;

std::string toUtf8(const std::u16string& text) { return platform::encodeUtf8(text.data(), text.size()); }

namespace {

std::uint64_t codePoints(const std::u16string& text) {
    std::uint64_t n = text.size();
    for (std::size_t i = 0; i + 1 < text.size(); ++i) {
        const bool high = text[i] >= 0xD800 && text[i] <= 0xDBFF;
        const bool low = text[i + 1] >= 0xDC00 && text[i + 1] <= 0xDFFF;
        if (high && low) {
            --n;
            ++i;
        }
    }
    return n;
}

bool writeAll(int fd, const char* data, std::size_t size) {
    while (size > 0) {
        const ssize_t n = ::write(fd, data, size);
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) return false;
        data += n;
        size -= static_cast<std::size_t>(n);
    }
    return true;
}

// The temporary file beside `path` that process `pid` writes first.
std::string partPath(const std::string& path, pid_t pid) { return path + ".part" + std::to_string(pid); }

// Writes `bytes` to `path` through a temporary file beside it, so that a
// reader never sees half a file. Returns why it failed, or nothing.
std::string writeFile(const std::string& path, const std::string& bytes) {
    const std::string part = partPath(path, ::getpid());
    const int fd = ::open(part.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (fd < 0) return path + ": " + std::strerror(errno);
    const bool written = writeAll(fd, bytes.data(), bytes.size());
    const int writeErrno = errno;
    if (::close(fd) != 0 || !written) {
        ::unlink(part.c_str());
        return path + ": " + std::strerror(written ? errno : writeErrno);
    }
    if (::rename(part.c_str(), path.c_str()) != 0) {
        const int e = errno;
        ::unlink(part.c_str());
        return path + ": " + std::strerror(e);
    }
    return std::string();
}

}  // namespace

FileResult runJob(const Job& job, std::FILE* textOut) {
    const auto start = std::chrono::steady_clock::now();
    FileResult r;
    if (!job.refusal.empty()) {
        r.reason = job.refusal;
        r.line = "unreadable: " + job.refusal;
    } else {
        const OrvaneLumoCore::ConversionOutcome o = OrvaneLumoCore::convertFile(job.widePath, job.kind);
        r.status = o.status;
        r.characters = codePoints(o.text);
        r.line = OrvaneLumoCore::explainOutcome(o, job.kind);
        if (o.status != FileStatus::Document) r.reason = OrvaneLumoCore::describe(o.note);
        if (!job.output.empty()) {
            r.writeError = writeFile(job.output, toUtf8(o.text));
        } else if (textOut) {
            const std::string bytes = toUtf8(o.text);
            if (std::fwrite(bytes.data(), 1, bytes.size(), textOut) != bytes.size() ||
                std::fflush(textOut) != 0)
                r.writeError = std::string("standard output: ") + std::strerror(errno);
        }
    }
    r.milliseconds =
        std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - start).count();
    return r;
}

// ---- workers -----------------------------------------------------------------------

namespace {

// Messages from a worker to the parent on one shared pipe. Each is written
// with a single write() of at most PIPE_BUF bytes, so messages of different
// workers never interleave.
enum class MessageType : std::uint8_t { Started, Finished };
constexpr std::size_t kMaxText = 1200;  // bytes of each of the three texts
// Length, type, worker, index, status, characters, milliseconds, three texts.
static_assert(4 + 1 + 4 + 8 + 1 + 8 + 8 + 3 * (2 + kMaxText) <= PIPE_BUF,
              "a message is written in one piece");

struct Message {
    MessageType type = MessageType::Started;
    std::uint32_t worker = 0;
    std::uint64_t index = 0;
    FileResult result;
};

class Packer {
public:
    template <class T>
    void put(const T& v) {
        const char* p = reinterpret_cast<const char*>(&v);
        bytes.append(p, sizeof v);
    }
    void putText(const std::string& s) {
        const std::uint16_t n = static_cast<std::uint16_t>(std::min(s.size(), kMaxText));
        put(n);
        bytes.append(s, 0, n);
    }
    std::string bytes;
};

class Unpacker {
public:
    Unpacker(const char* p, std::size_t n) : p_(p), end_(p + n) {}
    template <class T>
    bool get(T& v) {
        if (static_cast<std::size_t>(end_ - p_) < sizeof v) return false;
        std::memcpy(&v, p_, sizeof v);
        p_ += sizeof v;
        return true;
    }
    bool getText(std::string& s) {
        std::uint16_t n = 0;
        if (!get(n) || static_cast<std::size_t>(end_ - p_) < n) return false;
        s.assign(p_, n);
        p_ += n;
        return true;
    }

private:
    const char* p_;
    const char* end_;
};

bool sendMessage(int fd, const Message& m) {
    Packer body;
    body.put(m.type);
    body.put(m.worker);
    body.put(m.index);
    if (m.type == MessageType::Finished) {
        body.put(static_cast<std::uint8_t>(m.result.status));
        body.put(m.result.characters);
        body.put(m.result.milliseconds);
        body.putText(m.result.line);
        body.putText(m.result.reason);
        body.putText(m.result.writeError);
    }
    Packer whole;
    whole.put(static_cast<std::uint32_t>(body.bytes.size()));
    whole.bytes += body.bytes;
    return writeAll(fd, whole.bytes.data(), whole.bytes.size());
}

bool parseMessage(const char* p, std::size_t n, Message& m) {
    Unpacker in(p, n);
    if (!in.get(m.type) || !in.get(m.worker) || !in.get(m.index)) return false;
    if (m.type != MessageType::Finished) return true;
    std::uint8_t status = 0;
    return in.get(status) && (m.result.status = static_cast<FileStatus>(status), true) &&
           in.get(m.result.characters) && in.get(m.result.milliseconds) && in.getText(m.result.line) &&
           in.getText(m.result.reason) && in.getText(m.result.writeError);
}

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

[[noreturn]] void workerLoop(const std::vector<Job>& jobs, std::uint32_t worker,
                             std::atomic<std::uint64_t>& next, int fd) {
    for (;;) {
        Message m;
        m.worker = worker;
        m.index = next.fetch_add(1);
        if (m.index >= jobs.size()) break;
        if (!sendMessage(fd, m)) break;
        m.type = MessageType::Finished;
        m.result = runJob(jobs[m.index], nullptr);
        if (!sendMessage(fd, m)) break;
    }
    ::_exit(0);
}

FileResult crashed(int status) {
    FileResult r;
    r.reason = WIFSIGNALED(status)
                   ? std::string("the conversion stopped on signal ") + std::to_string(WTERMSIG(status))
                   : std::string("the conversion stopped with status ") +
                         std::to_string(WEXITSTATUS(status));
    r.line = "unreadable: " + r.reason;
    return r;
}

}  // namespace

void runJobs(const std::vector<Job>& jobs, unsigned workers, const ResultSink& sink) {
    SharedCounter counter;
    int fds[2];
    if (workers > jobs.size()) workers = static_cast<unsigned>(jobs.size());
    if (workers <= 1 || !counter.next || ::pipe2(fds, O_CLOEXEC) != 0) {
        for (std::size_t i = 0; i < jobs.size(); ++i) sink(i, runJob(jobs[i], nullptr));
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
    std::vector<bool> reported(jobs.size(), false);
    std::string buffer;
    char chunk[1 << 16];
    for (;;) {
        const ssize_t n = ::read(fds[0], chunk, sizeof chunk);
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) break;
        buffer.append(chunk, static_cast<std::size_t>(n));
        std::size_t at = 0;
        std::uint32_t size = 0;
        while (buffer.size() - at >= sizeof size) {
            std::memcpy(&size, buffer.data() + at, sizeof size);
            if (buffer.size() - at - sizeof size < size) break;
            Message m;
            if (parseMessage(buffer.data() + at + sizeof size, size, m) && m.worker < workers &&
                m.index < jobs.size() && !reported[m.index]) {
                if (m.type == MessageType::Started) {
                    holding[m.worker] = m.index;
                } else {
                    holding[m.worker] = kNone;
                    reported[m.index] = true;
                    sink(static_cast<std::size_t>(m.index), m.result);
                }
            }
            at += sizeof size + size;
        }
        buffer.erase(0, at);
    }
    ::close(fds[0]);

    for (const auto& p : pids) {
        int status = 0;
        while (::waitpid(p.first, &status, 0) < 0 && errno == EINTR) {
        }
        const std::uint64_t held = holding[p.second];
        if (held == kNone || reported[held]) continue;
        reported[held] = true;
        if (!jobs[held].output.empty()) ::unlink(partPath(jobs[held].output, p.first).c_str());
        sink(static_cast<std::size_t>(held), crashed(status));
    }
    // Jobs that no worker finished, if workers stopped early or couldn't start.
    for (std::size_t i = 0; i < jobs.size(); ++i)
        if (!reported[i]) sink(i, runJob(jobs[i], nullptr));
}

}  // namespace orvxml
