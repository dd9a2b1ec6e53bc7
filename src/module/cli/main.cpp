// orvxml: converts material libraries and render options files to XML, one
// file, a list or whole trees, and says why a file fell back to text.
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <set>
#include <string>
#include <vector>

#include <sys/stat.h>
#include <unistd.h>

#include "module/cli/Args.h"
#include "module/cli/Jobs.h"
#include "module/cli/Report.h"
#include "module/cli/Tree.h"

namespace {

int usageError(const std::string& message) {
    std::fprintf(stderr, "orvxml: %s\nTry 'orvxml --help' for more information.\n", message.c_str());
    return 2;
}

// Creates `dir` and the folders above it that are missing.
bool makeFolders(const std::string& dir) {
    for (std::size_t at = dir.find('/', 1);; at = dir.find('/', at + 1)) {
        const std::string part = dir.substr(0, at);
        if (!part.empty() && ::mkdir(part.c_str(), 0777) != 0 && errno != EEXIST) return false;
        if (at == std::string::npos) break;
    }
    struct stat st;
    return ::stat(dir.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

std::string folderOf(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    return slash == std::string::npos ? std::string(".") : path.substr(0, slash);
}

}  // namespace

int main(int argc, char** argv) {
    using namespace orvxml;
    Settings settings;
    std::string error;
    switch (parseArgs(std::vector<std::string>(argv + 1, argv + argc), settings, error)) {
    case Parsed::Help: std::fputs(kUsage, stdout); return 0;
    case Parsed::Version: std::fputs(kVersion, stdout); return 0;
    case Parsed::UsageError: return usageError(error);
    case Parsed::Run: break;
    }

    const bool toStdout = settings.outDir.empty() && !settings.explain;
    std::vector<Job> jobs;
    if (!collectJobs(settings.paths, settings.outDir, !toStdout, jobs, error)) return usageError(error);

    if (!settings.outDir.empty()) {
        if (!makeFolders(settings.outDir))
            return usageError("can't create the folder " + settings.outDir + ": " + std::strerror(errno));
        std::set<std::string> made;
        for (const Job& job : jobs) {
            if (job.output.empty()) continue;
            const std::string folder = folderOf(job.output);
            if (made.insert(folder).second) makeFolders(folder);  // a failure shows at the write
        }
    }
    std::FILE* report = nullptr;
    if (!settings.reportPath.empty()) {
        report = std::fopen(settings.reportPath.c_str(), "w");
        if (!report)
            return usageError("can't write the report " + settings.reportPath + ": " + std::strerror(errno));
    }

    // A lone file on standard output needs no progress line.
    const bool progress = !toStdout && ::isatty(STDERR_FILENO);
    Collector collector(jobs, settings.explain, settings.quiet, progress, report);
    if (toStdout) {
        for (std::size_t i = 0; i < jobs.size(); ++i) collector.add(i, runJob(jobs[i], stdout));
    } else {
        unsigned workers = settings.jobs;
        if (workers == 0) {
            const long cores = ::sysconf(_SC_NPROCESSORS_ONLN);
            workers = cores > 0 ? static_cast<unsigned>(cores) : 1;
        }
        runJobs(jobs, workers, [&](std::size_t i, const FileResult& r) { collector.add(i, r); });
    }
    int status = collector.finish();
    if (report && std::fclose(report) != 0) {
        std::fprintf(stderr, "orvxml: can't write the report %s: %s\n", settings.reportPath.c_str(),
                     std::strerror(errno));
        status = 1;
    }
    return status;
}
