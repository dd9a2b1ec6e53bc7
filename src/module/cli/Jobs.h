#pragma once
// Converting the jobs: one at a time in this process, or spread over worker
// processes. The library keeps process-wide state (the document sun, the
// scene's material table, the text converters' buffers) that isn't safe for
// threads, so parallel conversions each get a process of their own.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "module/cli/Tree.h"

namespace orvxml {

struct FileResult {
    OrvaneLumoCore::FileStatus status = OrvaneLumoCore::FileStatus::Unreadable;
    std::uint64_t characters = 0;  // of the text, in code points
    double milliseconds = 0;
    std::string line;        // the --explain line, behind the path
    std::string reason;      // why the file isn't a document; empty for one
    std::string writeError;  // why the output couldn't be written; empty if it was
    int writeErrno = 0;      // the errno of that failure
    bool upToDate = false;   // not converted: its output was newer (--update)
    // The file paths that the job's path rules rewrote: stored, written (UTF-8).
    std::vector<std::pair<std::string, std::string>> remapped;
};

// The result of a job that --update finds up to date.
FileResult upToDate();

// Converts one job in this process: the output file gets the text as UTF-8,
// or, if the job has none and `textOut` is given, the text goes there.
FileResult runJob(const Job& job, std::FILE* textOut);

// Whether the output failed for lack of space: then no further job is
// started, since its output couldn't be written either.
bool stopsTheRun(const FileResult& result);

// Takes a result; returns false when no further job is to be started.
typedef std::function<bool(std::size_t index, const FileResult& result)> ResultSink;

// Runs every job once, on up to `workers` processes, and hands each result
// to `sink` in this process as it comes in (from one thread at a time). A
// worker that dies leaves its file unreadable, with the signal or status as
// its reason; jobs no worker took are run here. Once the process is
// interrupted, or a result stops the run (the sink says so, or a worker
// finds the disk full), no job is started; the jobs under way are finished.
void runJobs(const std::vector<Job>& jobs, unsigned workers, const ResultSink& sink);

// Where workers are separate programs (Windows), a process started with the
// hidden worker argument first serves its parent's jobs: then this returns
// true with the exit status. Elsewhere it returns false.
bool runAsWorker(const std::vector<std::string>& args, int& status);

// Creates `dir` and the folders above it that are missing. Returns 0, or
// the errno of the failure.
int makeFolders(const std::string& dir);

// Whether `name` is that of a part file that the outputs are written
// through ("a.orvmat.xml.part1234").
bool isPartName(const std::string& name);

// Removes the part files that an earlier run, stopped for good (killed, or
// the machine went down), left in the folders that these jobs write to.
void removeLeftParts(const std::vector<Job>& jobs);

// Bytes as UTF-16: UTF-8, or where they aren't, Windows-1252.
std::u16string toWide(const std::string& bytes);

// The text as UTF-8; a lone surrogate becomes U+FFFD.
std::string toUtf8(const std::u16string& text);

}  // namespace orvxml
