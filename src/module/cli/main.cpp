// orvxml: converts material libraries and render options files to XML, one
// file, a list or whole trees, and says why a file fell back to text.
#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "module/cli/Args.h"
#include "module/cli/Jobs.h"
#include "module/cli/Report.h"
#include "module/cli/Tree.h"
#include "platform/Interrupt.h"
#include "platform/Program.h"
#include "platform/System.h"

namespace {

using platform::PathKind;

int usageError(const std::string& message) {
    std::fprintf(stderr, "orvxml: %s\nTry 'orvxml --help' for more information.\n", message.c_str());
    return 2;
}

// A failure of the run's own files (the output folder, the report): exit 3.
int runError(const std::string& message, int error) {
    std::fprintf(stderr, "orvxml: %s: %s\n", message.c_str(), std::strerror(error));
    return 3;
}

bool isFolder(const std::string& path, int& error) { return platform::pathKind(path, error) == PathKind::Folder; }

// Creates `dir` and the folders above it that are missing. Returns 0, or
// the errno of the failure.
int makeFolders(const std::string& dir) {
    int error = 0;
    if (isFolder(dir, error)) return 0;
    error = platform::makeFolder(dir);
    if (error == ENOENT) {
        const std::size_t end = dir.find_last_not_of(platform::kPathSeparators);
        const std::size_t at = end == std::string::npos ? end : dir.find_last_of(platform::kPathSeparators, end);
        if (at != std::string::npos && at > 0 && makeFolders(dir.substr(0, at)) == 0)
            error = platform::makeFolder(dir);
    }
    // Something else of that name, or a link that leads nowhere.
    if (error == EEXIST) {
        int why = 0;
        const PathKind kind = platform::pathKind(dir, why);
        if (kind == PathKind::Folder) return 0;
        if (kind == PathKind::Missing) return why;
    }
    return error;
}

std::string folderOf(const std::string& path) {
    const std::size_t slash = path.find_last_of(platform::kPathSeparators);
    return slash == std::string::npos ? std::string(".") : path.substr(0, slash);
}

}  // namespace

int runProgram(const std::vector<std::string>& args) {
    using namespace orvxml;
    platform::catchInterrupts();
    int status = 0;
    if (runAsWorker(args, status)) return status;

    Settings settings;
    std::string error;
    switch (parseArgs(args, settings, error)) {
    case Parsed::Help: std::fputs(kUsage, stdout); return 0;
    case Parsed::Version: std::fputs(kVersion, stdout); return 0;
    case Parsed::UsageError: return usageError(error);
    case Parsed::Run: break;
    }

    const bool toStdout = settings.outDir.empty() && !settings.explain;
    std::vector<Job> jobs;
    if (!collectJobs(settings.paths, settings.outDir, !toStdout, jobs, error)) return usageError(error);
    for (Job& job : jobs) job.writeText = settings.writeFallbacks;

    if (!settings.outDir.empty()) {
        if (const int e = makeFolders(settings.outDir))
            return runError("can't create the folder " + settings.outDir, e);
        std::set<std::string> made;
        for (const Job& job : jobs) {
            if (job.output.empty()) continue;
            const std::string folder = folderOf(job.output);
            if (made.insert(folder).second) makeFolders(folder);  // a failure shows at the write
        }
    }
    std::FILE* report = nullptr;
    if (!settings.reportPath.empty()) {
        report = platform::openOutputFile(settings.reportPath);
        if (!report) return runError("can't write the report " + settings.reportPath, errno);
    }

    // A lone file on standard output needs no progress line.
    const platform::Terminal progress = toStdout ? platform::Terminal::None : platform::errorTerminal();
    Collector collector(jobs, settings.explain, settings.quiet, progress, report);
    if (toStdout) {
        for (std::size_t i = 0; i < jobs.size() && !platform::interruption(); ++i)
            if (!collector.add(i, runJob(jobs[i], stdout))) break;
    } else {
        unsigned workers = settings.jobs;
        if (workers == 0) workers = std::max(1u, std::thread::hardware_concurrency());
        runJobs(jobs, workers, [&](std::size_t i, const FileResult& r) { return collector.add(i, r); });
    }
    status = collector.finish(platform::interruption());
    if (report && std::fclose(report) != 0) {
        const int e = runError("can't write the report " + settings.reportPath, errno);
        if (status < 128) status = e;
    }
    return status;
}
