#include "module/cli/Tree.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <set>

#include <dirent.h>
#include <sys/stat.h>

#include "platform/Text.h"

namespace orvxml {

using OrvaneLumoCore::FileKind;

namespace {

// A job for `source`, writing to `output` if that isn't empty. The kind
// comes from the name; a name that isn't UTF-8 can't be handed to the
// library, whose paths are UTF-16.
Job makeJob(const std::string& source, const std::string& output) {
    Job job;
    job.source = source;
    job.output = output;
    std::u16string wide;
    const bool utf8 = platform::decodeUtf8Strict(source.data(), source.size(), wide);
    if (!utf8) wide = platform::decodeAnsi(source.data(), source.size());
    job.hasKind = OrvaneLumoCore::kindOfPath(wide, job.kind);
    if (utf8)
        job.widePath = wide;
    else
        job.refusal = "its name is not UTF-8";
    return job;
}

std::string joinPath(const std::string& dir, const std::string& name) {
    if (dir.empty() || dir.back() == '/') return dir + name;
    return dir + "/" + name;
}

std::string baseName(const std::string& path) {
    std::string p = path;
    while (p.size() > 1 && p.back() == '/') p.pop_back();
    const std::size_t slash = p.rfind('/');
    return slash == std::string::npos ? p : p.substr(slash + 1);
}

// Walks `dir` (mirrored as `rel` under the output folder): files of the four
// extensions become jobs, other files are skipped, subfolders are walked;
// links to folders are not followed, so a loop of links can't trap the walk.
void walk(const std::string& dir, const std::string& rel, const std::string& outDir,
          std::vector<Job>& jobs) {
    DIR* d = ::opendir(dir.c_str());
    if (!d) {
        Job job = makeJob(dir, std::string());
        job.refusal = std::string("the folder can't be read: ") + std::strerror(errno);
        jobs.push_back(job);
        return;
    }
    std::vector<std::string> names;
    while (const dirent* e = ::readdir(d)) {
        const std::string name = e->d_name;
        if (name != "." && name != "..") names.push_back(name);
    }
    ::closedir(d);
    std::sort(names.begin(), names.end());
    for (const std::string& name : names) {
        const std::string path = joinPath(dir, name);
        const std::string relPath = rel.empty() ? name : rel + "/" + name;
        struct stat own;
        if (::lstat(path.c_str(), &own) != 0) continue;
        if (S_ISDIR(own.st_mode)) {
            walk(path, relPath, outDir, jobs);
            continue;
        }
        struct stat target;
        if (S_ISLNK(own.st_mode) && ::stat(path.c_str(), &target) == 0 && S_ISDIR(target.st_mode))
            continue;
        Job job = makeJob(path, outDir.empty() ? std::string() : joinPath(outDir, relPath + ".xml"));
        if (job.hasKind) jobs.push_back(job);
    }
}

}  // namespace

bool collectJobs(const std::vector<std::string>& paths, const std::string& outDir, bool walkFolders,
                 std::vector<Job>& jobs, std::string& error) {
    for (const std::string& path : paths) {
        struct stat st;
        const bool exists = ::stat(path.c_str(), &st) == 0;
        if (exists && S_ISDIR(st.st_mode)) {
            if (!walkFolders) {
                error = path + " is a folder: give -o DIR to convert a tree";
                return false;
            }
            walk(path, std::string(), outDir, jobs);
            continue;
        }
        const int openError = errno;
        Job job = makeJob(path, outDir.empty() ? std::string() : joinPath(outDir, baseName(path) + ".xml"));
        if (!job.hasKind) {
            job.refusal = exists ? "not a .orvmat, .lumat, .orvopt or .luopt file"
                                 : std::string("can't be opened: ") + std::strerror(openError);
            job.output.clear();
        }
        jobs.push_back(job);
    }
    // Two inputs must not write one output.
    std::set<std::string> outputs;
    for (Job& job : jobs) {
        if (job.output.empty() || !job.refusal.empty()) continue;
        if (!outputs.insert(job.output).second) {
            job.refusal = "its output " + job.output + " is written for an earlier file";
            job.output.clear();
        }
    }
    return true;
}

}  // namespace orvxml
