#include "module/cli/Report.h"

#include <cerrno>
#include <cstring>

#include "module/Inventory.h"

namespace orvxml {

using OrvaneLumoCore::FileKind;
using OrvaneLumoCore::FileStatus;

std::string jsonString(const std::string& bytes) { return OrvaneLumoCore::jsonText(toWide(bytes)); }

namespace {

const char* statusWord(FileStatus status) {
    switch (status) {
    case FileStatus::Document: return "document";
    case FileStatus::Text: return "text";
    case FileStatus::Unreadable: break;
    }
    return "unreadable";
}

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
           ", \"status\": \"" + (r.upToDate ? "up to date" : statusWord(r.status)) + "\", \"reason\": " +
           (reason.empty() ? std::string("null") : jsonString(reason)) +
           ", \"characters\": " + std::to_string(r.characters) + ", \"milliseconds\": " + ms +
           (job.xml && !job.xml->pathRules.empty() ? ", \"remapped\": " + remappedJson(r) : std::string()) + "}";
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
        switch (result.status) {
        case FileStatus::Document: ++documents_; break;
        case FileStatus::Text: ++texts_; break;
        case FileStatus::Unreadable: ++unreadable_; break;
        }
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
    if (explain_ && std::printf("%s: %s\n", job.source.c_str(), r.line.c_str()) < 0 && !stdoutError_) {
        stdoutError_ = errno ? errno : EIO;
        if (platform::isNoSpace(stdoutError_) && !noSpace_) noSpace_ = stdoutError_;
    }
    if (unreadable)
        std::fprintf(stderr, "orvxml: %s: %s\n", job.source.c_str(), r.reason.c_str());
    if (!r.writeError.empty()) std::fprintf(stderr, "orvxml: can't write %s\n", r.writeError.c_str());
    if (report_) std::fprintf(report_, "%s\n", jsonLine(job, r).c_str());
}

int Collector::finish(int interruption) {
    // An interrupted run leaves gaps: what came in after one still shows.
    for (std::size_t i = next_; i < results_.size(); ++i)
        if (arrived_[i]) emit(i);
    errno = 0;
    if (std::fflush(stdout) != 0 && !stdoutError_) stdoutError_ = errno ? errno : EIO;
    progress_.clear();
    if (stdoutError_)
        std::fprintf(stderr, "orvxml: can't write standard output: %s\n", std::strerror(stdoutError_));
    if (!quiet_) {
        const double seconds =
            std::chrono::duration<double>(std::chrono::steady_clock::now() - start_).count();
        std::fprintf(stderr, "orvxml: %zu converted, %zu fell back to text, %zu unreadable", documents_,
                     texts_, unreadable_);
        if (notWritten_) std::fprintf(stderr, ", %zu not written", notWritten_);
        if (update_) std::fprintf(stderr, ", %zu up to date", upToDate_);
        std::fprintf(stderr, " (%.2f s)\n", seconds);
    }
    if (interruption) {
        std::fprintf(stderr, "orvxml: interrupted, %zu of %zu files not converted\n", jobs_.size() - done_,
                     jobs_.size());
        return 128 + interruption;
    }
    if (noSpace_ && done_ < jobs_.size())
        std::fprintf(stderr, "orvxml: stopped: no space for the outputs (%s), %zu of %zu files not "
                     "converted\n", std::strerror(noSpace_), jobs_.size() - done_, jobs_.size());
    if (unreadable_ || notWritten_ || stdoutError_) return 3;
    return texts_ ? 1 : 0;
}

}  // namespace orvxml
