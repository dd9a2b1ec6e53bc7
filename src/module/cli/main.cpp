// orvxml: converts material libraries and render options files to XML, one
// file, a list or whole trees, and says why a file fell back to text.
#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "module/cli/Args.h"
#include "module/cli/Jobs.h"
#include "module/cli/Listing.h"
#include "module/cli/Progress.h"
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

// Closes the report, if there is one; a failure to write it makes the
// status 3 unless a signal stopped the run.
int closeReport(std::FILE* report, const std::string& path, int status) {
    if (report && std::fclose(report) != 0) {
        const int e = runError("can't write the report " + path, errno);
        if (status < 128) status = e;
    }
    return status;
}

// The command with the arguments behind its name; returns the exit status.
int runCommand(const std::vector<std::string>& args) {
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

    const bool listing = settings.mode != Mode::Convert;
    const bool toStdout = !listing && settings.outDir.empty() && !settings.explain;
    // A lone file on standard output needs no progress line, nor does a
    // listing, which prints as it goes.
    Progress progress(toStdout || listing || settings.quiet ? platform::Terminal::None
                                                            : platform::errorTerminal());
    std::vector<Job> jobs;
    if (!collectJobs(settings.paths, settings.outDir, !toStdout, jobs, error,
                     [&](std::size_t found) { progress.walking(found); })) {
        progress.clear();
        return usageError(error);
    }
    auto xml = std::make_shared<OrvaneLumoCore::XmlOptions>();
    xml->wellFormed = settings.wellFormed;
    for (const auto& rule : settings.remap) xml->pathRules.push_back({toWide(rule.first), toWide(rule.second)});
    for (Job& job : jobs) {
        job.writeText = settings.writeFallbacks;
        if (xml->wellFormed || !xml->pathRules.empty()) job.xml = xml;
    }
    if (settings.update) markUpToDate(jobs);

    if (!settings.outDir.empty()) {
        if (const int e = makeFolders(settings.outDir)) {
            progress.clear();
            return runError("can't create the folder " + settings.outDir, e);
        }
        removeLeftParts(jobs);
    }
    std::FILE* report = nullptr;
    if (!settings.reportPath.empty()) {
        report = platform::openOutputFile(settings.reportPath);
        if (!report) {
            progress.clear();
            return runError("can't write the report " + settings.reportPath, errno);
        }
    }

    if (listing) {
        status = runListing(settings, jobs, xml->pathRules, report);
        return closeReport(report, settings.reportPath, status);
    }

    Collector collector(jobs, settings.explain, settings.quiet, progress, report, settings.update);
    if (toStdout) {
        for (std::size_t i = 0; i < jobs.size() && !platform::interruption(); ++i)
            if (!collector.add(i, runJob(jobs[i], stdout))) break;
    } else {
        // Jobs that are up to date have their result at once; the others
        // are converted, and their results go back under their own index.
        std::vector<Job> todo;
        std::vector<std::size_t> where;
        for (std::size_t i = 0; i < jobs.size(); ++i) {
            if (jobs[i].upToDate) {
                collector.add(i, upToDate());
            } else {
                todo.push_back(jobs[i]);
                where.push_back(i);
            }
        }
        unsigned workers = settings.jobs;
        if (workers == 0) workers = std::max(1u, std::thread::hardware_concurrency());
        runJobs(todo, workers, [&](std::size_t k, const FileResult& r) { return collector.add(where[k], r); });
    }
    status = collector.finish(platform::interruption());
    return closeReport(report, settings.reportPath, status);
}

// The entry point of the system (platform/Program*.cpp) runs the command.
[[maybe_unused]] const bool kNamed = platform::setProgram(&runCommand);

}  // namespace
