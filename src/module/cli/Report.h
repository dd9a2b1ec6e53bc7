#pragma once
// What orvxml says about its files: the --explain lines, the JSON Lines of
// --report, errors, the progress line and the summary.
#include <chrono>
#include <cstddef>
#include <cstdio>
#include <string>
#include <vector>

#include "module/cli/Jobs.h"
#include "module/cli/Progress.h"

namespace orvxml {

// A JSON string of a path or a message. Bytes that aren't UTF-8 (a file
// name may hold any) are read as Windows-1252, so the line stays valid JSON.
std::string jsonString(const std::string& bytes);

// One JSON object on one line: path, kind, status ("document", "text",
// "unreadable", or with --update "up to date"), reason, characters,
// milliseconds, and with path rules "remapped": the paths they rewrote.
std::string jsonLine(const Job& job, const FileResult& result);

// What a conversion and a listing both count and say: how many files ended
// in each status, the lines on standard output and its first failure, the
// unreadable files on standard error, the end of the summary and the exit
// status.
struct Tally {
    std::size_t documents = 0, texts = 0, unreadable = 0;
    int stdoutError = 0;  // the errno of the first line standard output refused, or 0

    void count(OrvaneLumoCore::FileStatus status);
    // "source: line" on standard output; false if it wasn't written.
    bool say(const std::string& source, const std::string& line);
    // "orvxml: source: reason" on standard error.
    static void unreadableFile(const std::string& source, const std::string& reason);
    // Flushes standard output and says on standard error if it failed, now or before.
    void flushStandardOutput();
    // ", N fell back to text, N unreadable": how the summary goes on.
    void summaryEnd() const;
    // "orvxml: interrupted, N of N files not <verb>"; returns 128 + the signal.
    static int interrupted(int signal, std::size_t left, std::size_t files, const char* verb);
    // 3 when a file was unreadable, standard output refused a line or
    // `failed`; else 1 when a file fell back to text or `fellShort`; else 0.
    int status(bool failed, bool fellShort) const;
};

// Collects the results as they come in, in any order, and passes them on in
// the order of the jobs, so that every output of a run is the same whatever
// the number of workers.
class Collector {
public:
    // `progress`: the line on standard error's terminal, if there is one.
    // `update`: the summary counts the files that were up to date.
    Collector(const std::vector<Job>& jobs, bool explain, bool quiet, Progress& progress, std::FILE* report,
              bool update);
    // Returns false once the run is to stop: an output found no space.
    bool add(std::size_t index, const FileResult& result);
    // Ends the progress line, prints the summary; returns the exit status:
    // 0 all documents, 1 some text, 3 some file unreadable or some output
    // (standard output included) not written. `interruption`: the signal
    // that stopped the run early, or 0; the results that came in are passed
    // on all the same.
    int finish(int interruption);

private:
    void emit(std::size_t index);

    const std::vector<Job>& jobs_;
    const bool explain_, quiet_, update_;
    Progress& progress_;
    std::FILE* report_;
    std::vector<FileResult> results_;
    std::vector<bool> arrived_;
    std::size_t next_ = 0, done_ = 0;
    // Each result counts once: not written if its output failed, else by its status.
    Tally tally_;
    std::size_t notWritten_ = 0, upToDate_ = 0;
    int noSpace_ = 0;  // the errno of the write that stopped the run, or 0
    std::chrono::steady_clock::time_point start_;
};

}  // namespace orvxml
