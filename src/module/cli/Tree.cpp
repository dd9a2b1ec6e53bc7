#include "module/cli/Tree.h"

#include <algorithm>
#include <cstring>
#include <set>

#include "platform/System.h"
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

bool isSeparator(char c) { return std::strchr(platform::kPathSeparators, c) != nullptr && c != '\0'; }

// The separator that a path joined to `dir` takes: the last one that `dir`
// holds, so that C:\libs gives C:\libs\a.orvmat on Windows; "/" for a
// path with none.
char separatorOf(const std::string& dir) {
    const std::size_t at = dir.find_last_of(platform::kPathSeparators);
    return at == std::string::npos ? '/' : dir[at];
}

std::string joinPath(const std::string& dir, const std::string& name) {
    if (dir.empty() || isSeparator(dir.back())) return dir + name;
    return dir + separatorOf(dir) + name;
}

std::string baseName(const std::string& path) {
    std::string p = path;
    while (p.size() > 1 && isSeparator(p.back())) p.pop_back();
    const std::size_t slash = p.find_last_of(platform::kPathSeparators);
    return slash == std::string::npos ? p : p.substr(slash + 1);
}

// What two paths of one file have in common, as far as the names tell:
// every separator as "/", and where case doesn't matter, ASCII letters in
// lower case.
std::string sameFileKey(const std::string& path) {
    std::string key = path;
    for (char& c : key) {
        if (isSeparator(c)) c = '/';
        if (platform::kNamesIgnoreCase && c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    }
    return key;
}

// Walks `dir` (mirrored as `rel` under the output folder): files of the four
// extensions become jobs, other files are skipped, subfolders are walked;
// links to folders are not followed, so a loop of links can't trap the walk.
void walk(const std::string& dir, const std::string& rel, const std::string& outDir,
          std::vector<Job>& jobs) {
    std::vector<platform::FolderEntry> entries;
    if (const int error = platform::listFolder(dir, entries)) {
        Job job = makeJob(dir, std::string());
        job.refusal = std::string("the folder can't be read: ") + std::strerror(error);
        jobs.push_back(job);
        return;
    }
    std::sort(entries.begin(), entries.end(),
              [](const platform::FolderEntry& a, const platform::FolderEntry& b) { return a.name < b.name; });
    for (const platform::FolderEntry& entry : entries) {
        const std::string path = joinPath(dir, entry.name);
        const std::string relPath = rel.empty() ? entry.name : rel + separatorOf(outDir) + entry.name;
        if (entry.kind == platform::FolderEntry::Folder) {
            walk(path, relPath, outDir, jobs);
            continue;
        }
        if (entry.kind == platform::FolderEntry::LinkToFolder) continue;
        Job job = makeJob(path, outDir.empty() ? std::string() : joinPath(outDir, relPath + ".xml"));
        if (job.hasKind) jobs.push_back(job);
    }
}

}  // namespace

bool collectJobs(const std::vector<std::string>& paths, const std::string& outDir, bool walkFolders,
                 std::vector<Job>& jobs, std::string& error) {
    for (const std::string& path : paths) {
        int openError = 0;
        const platform::PathKind pathKind = platform::pathKind(path, openError);
        const bool exists = pathKind != platform::PathKind::Missing;
        if (pathKind == platform::PathKind::Folder) {
            if (!walkFolders) {
                error = path + " is a folder: give -o DIR to convert a tree";
                return false;
            }
            walk(path, std::string(), outDir, jobs);
            continue;
        }
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
        if (!outputs.insert(sameFileKey(job.output)).second) {
            job.refusal = "its output " + job.output + " is written for an earlier file";
            job.output.clear();
        }
    }
    return true;
}

}  // namespace orvxml
