#include "module/cli/Report.h"

#include "platform/Text.h"

namespace orvxml {

using OrvaneLumoCore::FileKind;
using OrvaneLumoCore::FileStatus;

namespace {

// A JSON string. Bytes that aren't UTF-8 (a file name may hold any) are
// read as Windows-1252, so that the line stays valid JSON.
std::string jsonString(const std::string& bytes) {
    std::u16string wide;
    std::string text = bytes;
    if (!platform::decodeUtf8Strict(bytes.data(), bytes.size(), wide))
        text = toUtf8(platform::decodeAnsi(bytes.data(), bytes.size()));
    std::string out = "\"";
    for (const char c : text) {
        const unsigned char u = static_cast<unsigned char>(c);
        if (c == '"' || c == '\\') {
            out += '\\';
            out += c;
        } else if (u < 0x20) {
            static const char kHex[] = "0123456789abcdef";
            out += "\\u00";
            out += kHex[u >> 4];
            out += kHex[u & 15];
        } else {
            out += c;
        }
    }
    return out + "\"";
}

const char* statusWord(FileStatus status) {
    switch (status) {
    case FileStatus::Document: return "document";
    case FileStatus::Text: return "text";
    case FileStatus::Unreadable: break;
    }
    return "unreadable";
}

}  // namespace

std::string jsonLine(const Job& job, const FileResult& r) {
    std::string reason = r.reason;
    if (!r.writeError.empty()) reason += (reason.empty() ? "" : "; ") + ("not written: " + r.writeError);
    char ms[32];
    std::snprintf(ms, sizeof ms, "%.3f", r.milliseconds);
    return "{\"path\": " + jsonString(job.source) + ", \"kind\": " +
           (job.hasKind ? (job.kind == FileKind::Materials ? "\"materials\"" : "\"options\"") : "null") +
           ", \"status\": \"" + statusWord(r.status) + "\", \"reason\": " +
           (reason.empty() ? std::string("null") : jsonString(reason)) +
           ", \"characters\": " + std::to_string(r.characters) + ", \"milliseconds\": " + ms + "}";
}

Collector::Collector(const std::vector<Job>& jobs, bool explain, bool quiet, bool progress,
                     std::FILE* report)
    : jobs_(jobs),
      explain_(explain),
      quiet_(quiet),
      progress_(progress && !quiet),
      report_(report),
      results_(jobs.size()),
      arrived_(jobs.size(), false),
      start_(std::chrono::steady_clock::now()),
      lastProgress_(start_) {}

void Collector::add(std::size_t index, const FileResult& result) {
    if (index >= results_.size() || arrived_[index]) return;
    results_[index] = result;
    arrived_[index] = true;
    ++done_;
    switch (result.status) {
    case FileStatus::Document: ++documents_; break;
    case FileStatus::Text: ++texts_; break;
    case FileStatus::Unreadable: ++unreadable_; break;
    }
    if (!result.writeError.empty()) ++notWritten_;
    while (next_ < results_.size() && arrived_[next_]) {
        emit(next_);
        results_[next_] = FileResult();  // its text is no longer needed
        ++next_;
    }
    showProgress(false);
}

void Collector::emit(std::size_t index) {
    const Job& job = jobs_[index];
    const FileResult& r = results_[index];
    const bool error = r.status == FileStatus::Unreadable || !r.writeError.empty();
    if (error || explain_) clearProgress();
    if (explain_) std::printf("%s: %s\n", job.source.c_str(), r.line.c_str());
    if (r.status == FileStatus::Unreadable)
        std::fprintf(stderr, "orvxml: %s: %s\n", job.source.c_str(), r.reason.c_str());
    if (!r.writeError.empty()) std::fprintf(stderr, "orvxml: can't write %s\n", r.writeError.c_str());
    if (report_) std::fprintf(report_, "%s\n", jsonLine(job, r).c_str());
}

void Collector::showProgress(bool force) {
    if (!progress_) return;
    const auto now = std::chrono::steady_clock::now();
    // The first file shows the line at once, then it changes ten times a second.
    if (!force && done_ > 1 && now - lastProgress_ < std::chrono::milliseconds(100)) return;
    lastProgress_ = now;
    const double seconds = std::chrono::duration<double>(now - start_).count();
    std::fprintf(stderr, "\r\033[Korvxml: %zu of %zu files, %.0f files/s", done_, jobs_.size(),
                 seconds > 0 ? done_ / seconds : 0.0);
    std::fflush(stderr);
    progressShown_ = true;
}

void Collector::clearProgress() {
    if (!progressShown_) return;
    std::fputs("\r\033[K", stderr);
    progressShown_ = false;
}

int Collector::finish() {
    std::fflush(stdout);
    clearProgress();
    if (!quiet_) {
        const double seconds =
            std::chrono::duration<double>(std::chrono::steady_clock::now() - start_).count();
        std::fprintf(stderr, "orvxml: %zu converted, %zu fell back to text, %zu unreadable", documents_,
                     texts_, unreadable_);
        if (notWritten_) std::fprintf(stderr, ", %zu not written", notWritten_);
        std::fprintf(stderr, " (%.2f s)\n", seconds);
    }
    return documents_ == jobs_.size() && notWritten_ == 0 ? 0 : 1;
}

}  // namespace orvxml
