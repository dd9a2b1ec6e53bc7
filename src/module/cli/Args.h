#pragma once
// The command line of orvxml.
#include <string>
#include <utility>
#include <vector>

namespace orvxml {

// What the run does with its files: converts them, lists what they hold
// (--list), or lists the files they refer to (--files).
enum class Mode { Convert, List, Files };

struct Settings {
    Mode mode = Mode::Convert;
    std::vector<std::string> paths;
    std::string outDir;      // empty: the text goes to standard output
    std::string reportPath;  // empty: no report
    unsigned jobs = 0;       // 0: one per core
    bool explain = false;
    bool quiet = false;
    bool update = false;         // --update: files whose output is newer are left as they are
    bool writeFallbacks = true;  // --fallbacks skip: a file that falls back to text gets no output
    bool wellFormed = false;     // --well-formed: every text escaped for XML
    // --remap OLD=NEW, in the order given: the first rule that matches a path wins.
    std::vector<std::pair<std::string, std::string>> remap;
    std::vector<std::string> searchFolders;  // --search DIR, for --files
};

enum class Parsed { Run, Help, Version, UsageError };

// Reads the arguments behind the program name. On UsageError, `error` says
// what is wrong.
Parsed parseArgs(const std::vector<std::string>& args, Settings& settings, std::string& error);

extern const char kUsage[];
extern const char kVersion[];

}  // namespace orvxml
