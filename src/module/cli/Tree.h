#pragma once
// From the paths on the command line to the list of files to convert.
#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "module/Outcome.h"
#include "xml/XmlOptions.h"

namespace orvxml {

struct Job {
    std::string source;      // the path as the command line or the walk gives it
    std::u16string widePath; // the same path for the library
    std::string output;      // the file to write; empty: none
    OrvaneLumoCore::FileKind kind = OrvaneLumoCore::FileKind::Materials;
    bool hasKind = false;
    bool writeText = true;   // false: a file that falls back to text gets no output
    bool upToDate = false;   // its output is newer than it: not converted again
    // How documents are written (well-formed, path rules), the same for every
    // job of a run; none: as the module writes them.
    std::shared_ptr<const OrvaneLumoCore::XmlOptions> xml;
    std::string refusal;     // why the path isn't converted at all; empty: it is
};

// Lists the jobs for `paths` in a fixed order: the arguments in their order,
// each folder's files by name, byte by byte. A folder is walked only when
// `walkFolders` is set; otherwise it is a usage error, with `error` set.
// `outDir` non-empty gives every job its output under it: a file as
// DIR/NAME.xml, a lone folder's content mirrored right under DIR, and with
// several folders each one's under DIR/<its own name>/, as `cp -r A B DIR`
// copies them. Two inputs that would write one output are a usage error
// that names both. `found`, if given, hears the count of jobs so far while
// the folders are walked.
bool collectJobs(const std::vector<std::string>& paths, const std::string& outDir, bool walkFolders,
                 std::vector<Job>& jobs, std::string& error,
                 const std::function<void(std::size_t)>& found = nullptr);

// Marks the jobs whose output exists and was written no earlier than their
// input, which --update doesn't convert again. Returns how many.
std::size_t markUpToDate(std::vector<Job>& jobs);

}  // namespace orvxml
