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
    std::size_t documents_ = 0, texts_ = 0, unreadable_ = 0, notWritten_ = 0, upToDate_ = 0;
    int noSpace_ = 0;      // the errno of the write that stopped the run, or 0
    int stdoutError_ = 0;  // the errno of the first failed --explain line, or 0
    std::chrono::steady_clock::time_point start_;
};

}  // namespace orvxml
