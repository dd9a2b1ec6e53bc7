#pragma once
// From the paths on the command line to the list of files to convert.
#include <string>
#include <vector>

#include "module/Outcome.h"

namespace orvxml {

struct Job {
    std::string source;      // the path as the command line or the walk gives it
    std::u16string widePath; // the same path for the library
    std::string output;      // the file to write; empty: none
    OrvaneLumoCore::FileKind kind = OrvaneLumoCore::FileKind::Materials;
    bool hasKind = false;
    bool writeText = true;   // false: a file that falls back to text gets no output
    std::string refusal;     // why the path isn't converted at all; empty: it is
};

// Lists the jobs for `paths` in a fixed order: the arguments in their order,
// each folder's files by name, byte by byte. A folder is walked only when
// `walkFolders` is set; otherwise it is a usage error, with `error` set.
// `outDir` non-empty gives every job its output under it.
bool collectJobs(const std::vector<std::string>& paths, const std::string& outDir, bool walkFolders,
                 std::vector<Job>& jobs, std::string& error);

}  // namespace orvxml
