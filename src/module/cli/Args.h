#pragma once
// The command line of orvxml.
#include <string>
#include <vector>

namespace orvxml {

struct Settings {
    std::vector<std::string> paths;
    std::string outDir;      // empty: the text goes to standard output
    std::string reportPath;  // empty: no report
    unsigned jobs = 0;       // 0: one per core
    bool explain = false;
    bool quiet = false;
    bool update = false;         // --update: files whose output is newer are left as they are
    bool writeFallbacks = true;  // --fallbacks skip: a file that falls back to text gets no output
};

enum class Parsed { Run, Help, Version, UsageError };

// Reads the arguments behind the program name. On UsageError, `error` says
// what is wrong.
Parsed parseArgs(const std::vector<std::string>& args, Settings& settings, std::string& error);

extern const char kUsage[];
extern const char kVersion[];

}  // namespace orvxml
