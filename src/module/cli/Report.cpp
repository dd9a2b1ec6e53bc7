#include "module/cli/Report.h"

#include <cerrno>
#include <cstring>

#include "module/Inventory.h"

namespace orvxml {

using OrvaneLumoCore::FileKind;
using OrvaneLumoCore::FileStatus;

std::string jsonString(const std::string& bytes) { return OrvaneLumoCore::jsonText(toWide(bytes)); }

namespace {

// [{"from": stored, "to": written}, ...]
std::string remappedJson(const FileResult& r) {
    std::string out = "[";
    for (const auto& path : r.remapped)
        out += (out.size() > 1 ? ", {\"from\": " : "{\"from\": ") + jsonString(path.first) +
               ", \"to\": " + jsonString(path.second) + "}";
    return out + "]";
}

}  // namespace

std::string jsonLine(const Job& job, const FileResult& r) {
    std::string reason = r.reason;
    if (!r.writeError.empty()) reason += (reason.empty() ? "" : "; ") + ("not written: " + r.writeError);
    char ms[32];
    std::snprintf(ms, sizeof ms, "%.3f", r.milliseconds);
    return "{\"path\": " + jsonString(job.source) + ", \"kind\": " +
           (job.hasKind ? (job.kind == FileKind::Materials ? "\"materials\"" : "\"options\"") : "null") +
           ", \"status\": \"" + (r.upToDate ? "up to date" : OrvaneLumoCore::statusWord(r.status)) + "\", \"reason\": " +
           (reason.empty() ? std::string("null") : jsonString(reason)) +
           ", \"characters\": " + std::to_string(r.characters) + ", \"milliseconds\": " + ms +
           (job.xml && !job.xml->pathRules.empty() ? ", \"remapped\": " + remappedJson(r) : std::string()) + "}";
}

void Tally::count(FileStatus status) {
    switch (status) {
    case FileStatus::Document: ++documents; break;
    case FileStatus::Text: ++texts; break;
    case FileStatus::Unreadable: ++unreadable; break;
    }
}

bool Tally::say(const std::string& source, const std::string& line) {
    if (std::printf("%s: %s\n", source.c_str(), line.c_str()) >= 0) return true;
    if (!stdoutError) stdoutError = errno ? errno : EIO;
    return false;
}

void Tally::unreadableFile(const std::string& source, const std::string& reason) {
    std::fprintf(stderr, "orvxml: %s: %s\n", source.c_str(), reason.c_str());
}

void Tally::flushStandardOutput() {
    errno = 0;
    if (std::fflush(stdout) != 0 && !stdoutError) stdoutError = errno ? errno : EIO;
    if (stdoutError) std::fprintf(stderr, "orvxml: can't write standard output: %s\n", std::strerror(stdoutError));
}

void Tally::summaryEnd() const { std::fprintf(stderr, ", %zu fell back to text, %zu unreadable", texts, unreadable); }

int Tally::interrupted(int signal, std::size_t left, std::size_t files, const char* verb) {
    std::fprintf(stderr, "orvxml: interrupted, %zu of %zu files not %s\n", left, files, verb);
    return 128 + signal;
}

int Tally::status(bool failed, bool fellShort) const {
    if (unreadable || stdoutError || failed) return 3;
    return texts || fellShort ? 1 : 0;
}

Collector::Collector(const std::vector<Job>& jobs, bool explain, bool quiet, Progress& progress,
                     std::FILE* report, bool update)
    : jobs_(jobs),
      explain_(explain),
      quiet_(quiet),
      update_(update),
      progress_(progress),
      report_(report),
      results_(jobs.size()),
      arrived_(jobs.size(), false),
      start_(std::chrono::steady_clock::now()) {}

bool Collector::add(std::size_t index, const FileResult& result) {
    if (index >= results_.size() || arrived_[index]) return noSpace_ == 0;
    results_[index] = result;
    arrived_[index] = true;
    ++done_;
    if (result.upToDate) {
        ++upToDate_;
    } else if (!result.writeError.empty()) {
        ++notWritten_;
        if (!noSpace_ && stopsTheRun(result)) noSpace_ = result.writeErrno;
    } else {
        tally_.count(result.status);
    }
    while (next_ < results_.size() && arrived_[next_]) {
        emit(next_);
        results_[next_] = FileResult();  // its text is no longer needed
        ++next_;
    }
    progress_.converting(done_, jobs_.size(), done_ - upToDate_,
                         std::chrono::duration<double>(std::chrono::steady_clock::now() - start_).count());
    return noSpace_ == 0;
}

void Collector::emit(std::size_t index) {
    const Job& job = jobs_[index];
    const FileResult& r = results_[index];
    const bool unreadable = r.status == FileStatus::Unreadable && !r.upToDate;
    if (unreadable || !r.writeError.empty() || explain_) progress_.clear();
    if (explain_ && !tally_.say(job.source, r.line) && platform::isNoSpace(tally_.stdoutError) && !noSpace_)
        noSpace_ = tally_.stdoutError;
    if (unreadable) Tally::unreadableFile(job.source, r.reason);
    if (!r.writeError.empty()) std::fprintf(stderr, "orvxml: can't write %s\n", r.writeError.c_str());
    if (report_) std::fprintf(report_, "%s\n", jsonLine(job, r).c_str());
}

int Collector::finish(int interruption) {
    // An interrupted run leaves gaps: what came in after one still shows.
    for (std::size_t i = next_; i < results_.size(); ++i)
        if (arrived_[i]) emit(i);
    progress_.clear();
    tally_.flushStandardOutput();
    if (!quiet_) {
        const double seconds =
            std::chrono::duration<double>(std::chrono::steady_clock::now() - start_).count();
        std::fprintf(stderr, "orvxml: %zu converted", tally_.documents);
        tally_.summaryEnd();
        if (notWritten_) std::fprintf(stderr, ", %zu not written", notWritten_);
        if (update_) std::fprintf(stderr, ", %zu up to date", upToDate_);
        std::fprintf(stderr, " (%.2f s)\n", seconds);
    }
    if (interruption) return Tally::interrupted(interruption, jobs_.size() - done_, jobs_.size(), "converted");
    if (noSpace_ && done_ < jobs_.size())
        std::fprintf(stderr, "orvxml: stopped: no space for the outputs (%s), %zu of %zu files not "
                     "converted\n", std::strerror(noSpace_), jobs_.size() - done_, jobs_.size());
    return tally_.status(notWritten_ != 0, false);
}

}  // namespace orvxml
