// Workers on Windows, which has no fork(): the program starts itself again
// with a hidden first argument, as a fresh process. A thread of the parent
// feeds each worker one job at a time through its standard input and reads
// the result back from its standard output.
#include <atomic>
#include <cstdio>
#include <memory>
#include <mutex>
#include <thread>

#include <io.h>

#include "module/cli/Workers.h"
#include "platform/Interrupt.h"
#include "platform/Process.h"
#include "platform/System.h"

namespace orvxml {

namespace {

// The first argument of a worker; no path starts with "--".
const char kWorkerArgument[] = "--orvxml-worker";

std::string wideBytes(const std::u16string& text) {
    return std::string(reinterpret_cast<const char*>(text.data()), 2 * text.size());
}

std::u16string fromWideBytes(const std::string& bytes) {
    std::u16string text(bytes.size() / 2, u'\0');
    if (!text.empty()) std::memcpy(&text[0], bytes.data(), 2 * text.size());
    return text;
}

std::string packJob(std::uint64_t index, const Job& job) {
    Packer body;
    body.put(index);
    body.put(static_cast<std::uint8_t>(job.kind));
    body.put(static_cast<std::uint8_t>(job.hasKind));
    body.put(static_cast<std::uint8_t>(job.writeText));
    body.putText(job.source);
    body.putText(wideBytes(job.widePath));
    body.putText(job.output);
    body.putText(job.refusal);
    // The run's XML options travel with every job: a worker keeps nothing.
    body.put(static_cast<std::uint8_t>(job.xml ? 1 + job.xml->wellFormed : 0));
    body.put(static_cast<std::uint32_t>(job.xml ? job.xml->pathRules.size() : 0));
    if (job.xml)
        for (const OrvaneLumoCore::PathRule& rule : job.xml->pathRules) {
            body.putText(wideBytes(rule.from));
            body.putText(wideBytes(rule.to));
        }
    return frame(body.bytes);
}

bool parseJob(const std::string& body, std::uint64_t& index, Job& job) {
    Unpacker in(body.data(), body.size());
    std::uint8_t kind = 0, hasKind = 0, writeText = 0, xml = 0;
    std::uint32_t rules = 0;
    std::string wide;
    if (!in.get(index) || !in.get(kind) || !in.get(hasKind) || !in.get(writeText) || !in.getText(job.source) ||
        !in.getText(wide) || !in.getText(job.output) || !in.getText(job.refusal) || !in.get(xml) ||
        !in.get(rules))
        return false;
    job.kind = static_cast<OrvaneLumoCore::FileKind>(kind);
    job.hasKind = hasKind != 0;
    job.writeText = writeText != 0;
    job.widePath = fromWideBytes(wide);
    if (xml) {
        auto options = std::make_shared<OrvaneLumoCore::XmlOptions>();
        options->wellFormed = xml == 2;
        for (std::uint32_t i = 0; i < rules; ++i) {
            std::string from, to;
            if (!in.getText(from) || !in.getText(to)) return false;
            options->pathRules.push_back({fromWideBytes(from), fromWideBytes(to)});
        }
        job.xml = options;
    }
    return true;
}

// A worker that was interrupted ends with 128 plus the signal, or, ended
// by Ctrl-C before its handler was in place, with STATUS_CONTROL_C_EXIT.
bool interruptedStatus(unsigned long status) {
    return (status > 128 && status < 128 + 32) || status == 0xC000013Aul;
}

std::string stopReason(unsigned long status) {
    char text[32];
    // Exceptions (0xC0000005, an access violation) read best in hex.
    std::snprintf(text, sizeof text, status >= 0xC0000000ul ? "0x%08lX" : "%lu", status);
    return std::string("the conversion stopped with status ") + text;
}

// Feeds one worker until no job is left, the process is interrupted, the
// sink stops the run (`stop` is set then, and no feeder starts a job) or
// the worker ends.
void feed(platform::ChildProcess& child, const std::vector<Job>& jobs, std::atomic<std::size_t>& next,
          std::atomic<bool>& stop, std::vector<bool>& reported, std::mutex& lock, const ResultSink& sink) {
    FrameReader frames;
    std::string body;
    char chunk[1 << 16];
    while (!platform::interruption()) {
        const std::size_t i = next.fetch_add(1);
        if (i >= jobs.size()) break;
        // A worker gone before it got the job leaves it to the others.
        if (!child.write(packJob(i, jobs[i]))) break;
        bool whole = false;
        while (!(whole = frames.next(body))) {
            const std::size_t n = child.read(chunk, sizeof chunk);
            if (n == 0) break;
            frames.append(chunk, n);
        }
        Message m;
        if (whole && parseMessage(body.data(), body.size(), m) && m.type == MessageType::Finished &&
            m.index == i) {
            std::lock_guard<std::mutex> hold(lock);
            reported[i] = true;
            if (!sink(i, m.result)) {
                stop = true;
                next.store(jobs.size());
            }
            continue;
        }
        // The worker ended while it held job i: unless it stopped for an
        // interruption, the file is what ended it. A Ctrl-C reaches every
        // process of the console, and one that comes while a worker starts
        // ends it before its handler is in place: once this process is
        // interrupted too, the file is left unconverted, not unreadable.
        // Either way a write the worker began is gone.
        child.closeInput();
        const unsigned long status = child.wait();
        if (!jobs[i].output.empty()) platform::removeFile(partPath(jobs[i].output, child.id()));
        if (!interruptedStatus(status) && !platform::interruption()) {
            std::lock_guard<std::mutex> hold(lock);
            reported[i] = true;
            sink(i, stopped(stopReason(status)));
        }
        return;
    }
    child.closeInput();
    child.wait();
}

}  // namespace

bool runAsWorker(const std::vector<std::string>& args, int& status) {
    if (args.empty() || args[0] != kWorkerArgument) return false;
    FrameReader frames;
    std::string body;
    char chunk[1 << 16];
    status = 0;
    for (;;) {
        while (!frames.next(body)) {
            const int n = ::_read(0, chunk, sizeof chunk);
            if (n <= 0) {
                status = platform::interruption() ? 128 + platform::interruption() : 0;
                return true;
            }
            frames.append(chunk, static_cast<std::size_t>(n));
        }
        Message m;
        Job job;
        if (!parseJob(body, m.index, job)) {
            status = 2;
            return true;
        }
        m.type = MessageType::Finished;
        m.result = runJob(job, nullptr);
        if (!platform::writeAll(1, packMessage(m))) return true;
        // A job taken is finished; an interrupted worker takes no more.
        if (platform::interruption()) {
            status = 128 + platform::interruption();
            return true;
        }
    }
}

void runJobs(const std::vector<Job>& jobs, unsigned workers, const ResultSink& sink) {
    std::vector<bool> reported(jobs.size(), false);
    if (workers > jobs.size()) workers = static_cast<unsigned>(jobs.size());
    std::vector<std::unique_ptr<platform::ChildProcess>> children;
    for (unsigned w = 0; workers > 1 && w < workers; ++w) {
        std::unique_ptr<platform::ChildProcess> child(new platform::ChildProcess);
        if (child->startSelf({kWorkerArgument})) children.push_back(std::move(child));
    }
    std::atomic<std::size_t> next(0);
    std::atomic<bool> stop(false);
    std::mutex lock;
    std::vector<std::thread> threads;
    for (auto& child : children)
        threads.emplace_back(
            [&, worker = child.get()] { feed(*worker, jobs, next, stop, reported, lock, sink); });
    for (std::thread& t : threads) t.join();
    // Jobs that no worker finished, if workers stopped early or couldn't start.
    if (!stop) runHere(jobs, reported, sink);
}

}  // namespace orvxml
