#include "module/cli/Tree.h"

#include <algorithm>
#include <cstring>
#include <map>

#include "platform/Interrupt.h"
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
          std::vector<Job>& jobs, const std::function<void(std::size_t)>& found) {
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
        if (platform::interruption()) return;  // the run ends with what was found
        const std::string path = joinPath(dir, entry.name);
        const std::string relPath = rel.empty() ? entry.name : rel + separatorOf(outDir) + entry.name;
        if (entry.kind == platform::FolderEntry::Folder) {
            walk(path, relPath, outDir, jobs, found);
            continue;
        }
        if (entry.kind == platform::FolderEntry::LinkToFolder) continue;
        Job job = makeJob(path, outDir.empty() ? std::string() : joinPath(outDir, relPath + ".xml"));
        if (!job.hasKind) continue;
        jobs.push_back(job);
        if (found) found(jobs.size());
    }
}

// The name a folder argument is mirrored under when there are several: its
// last step, or for "." and ".." (and "lib/.") the name the folder really
// has. A root has none: its content goes right under the output folder.
std::string ownName(const std::string& dir) {
    std::string name = baseName(dir);
    if (name == "." || name == ".." || name.empty() || isSeparator(name[0]) || name.back() == ':')
        name = baseName(platform::fullPath(dir));
    if (name == "." || name == ".." || name.empty() || isSeparator(name[0]) || name.back() == ':')
        return std::string();
    return name;
}

}  // namespace

bool collectJobs(const std::vector<std::string>& paths, const std::string& outDir, bool walkFolders,
                 std::vector<Job>& jobs, std::string& error, const std::function<void(std::size_t)>& found) {
    std::vector<platform::PathKind> kinds;
    std::vector<int> openErrors;
    std::size_t folders = 0;
    for (const std::string& path : paths) {
        int openError = 0;
        kinds.push_back(platform::pathKind(path, openError));
        openErrors.push_back(openError);
        if (kinds.back() == platform::PathKind::Folder) ++folders;
    }
    for (std::size_t i = 0; i < paths.size(); ++i) {
        const std::string& path = paths[i];
        if (kinds[i] == platform::PathKind::Folder) {
            if (!walkFolders) {
                error = path + " is a folder: give -o DIR to convert a tree";
                return false;
            }
            walk(path, folders > 1 ? ownName(path) : std::string(), outDir, jobs, found);
            continue;
        }
        Job job = makeJob(path, outDir.empty() ? std::string() : joinPath(outDir, baseName(path) + ".xml"));
        if (!job.hasKind) {
            job.refusal = kinds[i] != platform::PathKind::Missing
                              ? "not a .orvmat, .lumat, .orvopt or .luopt file"
                              : std::string("can't be opened: ") + std::strerror(openErrors[i]);
            job.output.clear();
        }
        jobs.push_back(job);
        if (found) found(jobs.size());
    }
    // Two inputs must not write one output; the same path given twice is
    // converted once.
    std::map<std::string, std::size_t> writers;
    std::vector<Job> unique;
    for (Job& job : jobs) {
        if (job.output.empty() || !job.refusal.empty()) {
            unique.push_back(job);
            continue;
        }
        const auto at = writers.emplace(sameFileKey(job.output), unique.size());
        if (at.second) {
            unique.push_back(job);
        } else if (unique[at.first->second].source != job.source) {
            error = unique[at.first->second].source + " and " + job.source + " would both be written to " +
                    job.output;
            return false;
        }
    }
    jobs.swap(unique);
    return true;
}

std::size_t markUpToDate(std::vector<Job>& jobs) {
    std::size_t n = 0;
    for (Job& job : jobs) {
        long long input = 0, output = 0;
        if (job.output.empty() || !job.refusal.empty()) continue;
        job.upToDate = platform::modificationTime(job.output, output) &&
                       platform::modificationTime(job.source, input) && output >= input;
        n += job.upToDate;
    }
    return n;
}

}  // namespace orvxml
