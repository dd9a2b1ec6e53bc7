#include "module/cli/Args.h"

#include <cstdlib>

namespace orvxml {

#ifndef ORVXML_VERSION
#define ORVXML_VERSION "0.1.0"
#endif

const char kVersion[] = "orvxml " ORVXML_VERSION "\n";

const char kUsage[] =
    "Usage: orvxml [OPTION]... FILE\n"
    "  or:  orvxml -o DIR [OPTION]... PATH...\n"
    "  or:  orvxml --explain [OPTION]... PATH...\n"
    "  or:  orvxml --list [OPTION]... PATH...\n"
    "  or:  orvxml --files [--search=DIR]... [OPTION]... PATH...\n"
    "Convert material libraries (.orvmat, .lumat) and render options files\n"
    "(.orvopt, .luopt) to XML, exactly as the PyOrvXml module does. A file that\n"
    "doesn't load as binary comes back as its own text.\n"
    "\n"
    "Without -o the result goes to standard output as UTF-8. With -o each FILE\n"
    "gives DIR/FILE.xml (a.orvmat gives a.orvmat.xml), and a folder is walked\n"
    "and its content mirrored under DIR; with several folders, each one under\n"
    "DIR/<its own name>, as cp -r does. Files of other extensions in a folder\n"
    "are skipped. Two inputs that would write one output are a usage error.\n"
    "Every file is converted as if it were the first in a fresh process, so\n"
    "the results don't depend on the order of the files or on -j.\n"
    "\n"
    "  -o, --output=DIR   write one .xml file per input under DIR\n"
    "  -j, --jobs=N       convert N files at a time (default: one per core)\n"
    "      --update       with -o, convert only files whose output is missing or\n"
    "                     older than the file; count the rest as up to date\n"
    "      --explain      print one line per file: a document with its size, or\n"
    "                     why the file fell back to text\n"
    "      --report=FILE  write JSON Lines to FILE, one object per file: path,\n"
    "                     kind, status, reason, characters, milliseconds (and\n"
    "                     with --remap the paths rewritten); with --list or\n"
    "                     --files one per material, options file or reference\n"
    "      --fallbacks=write|skip\n"
    "                     with -o, write the text of a file that falls back to\n"
    "                     text as its output (the default), or skip it: no\n"
    "                     file, but it is still explained, reported and counted\n"
    "      --well-formed  write documents that every XML parser reads: every text\n"
    "                     escaped, characters XML doesn't allow as U+FFFD (the\n"
    "                     default is the module's exact text)\n"
    "      --remap=OLD=NEW\n"
    "                     write a stored file path that starts with OLD (whole\n"
    "                     folders; case, / and \\ as Windows compares them) with\n"
    "                     NEW in its place; repeat for more rules, the first\n"
    "                     that matches wins\n"
    "      --list         print what each file holds without converting it: a\n"
    "                     library's materials (name, class, UUID, textures,\n"
    "                     shape), an options file's record version and camera\n"
    "      --files        print every file that each file refers to, and where\n"
    "                     it is found or that it is missing\n"
    "      --search=DIR   with --files, look for a referenced file in DIR too,\n"
    "                     after the file's own folder (a Windows path by its name)\n"
    "  -q, --quiet        print nothing but errors\n"
    "  -h, --help         show this help and exit\n"
    "      --version      show the version and exit\n"
    "\n"
    "While standard error is a terminal, one line there shows the progress:\n"
    "the files found while folders are walked, then the files done of those,\n"
    "the rate and the time left. A summary line (converted, fell back to\n"
    "text, unreadable, outputs not written, and with --update up to date)\n"
    "ends every run. A file that can't be read gets no output file.\n"
    "\n"
    "Ctrl-C, SIGINT, SIGTERM and SIGHUP stop the run between two files: the\n"
    "outputs written so far stay, and no partial file is left (a run that is\n"
    "killed may leave some: the next run into DIR removes them). --update\n"
    "then finishes the job. An output that finds no space left on its disk\n"
    "stops the run too: no further file is converted.\n"
    "\n"
    "Exit status:\n"
    "  0        every file became a document\n"
    "  1        some file fell back to text (its text is written), or with\n"
    "           --files a referenced file is missing; nothing worse\n"
    "  2        a usage error\n"
    "  3        some input could not be read, or some output (a file, standard\n"
    "           output, the output folder, the report) could not be written\n"
    "  128 + N  the run was stopped by signal N (130 for Ctrl-C)\n";

namespace {

bool parseJobs(const std::string& text, unsigned& jobs) {
    if (text.empty() || text.size() > 6) return false;
    for (char c : text)
        if (c < '0' || c > '9') return false;
    const long n = std::strtol(text.c_str(), nullptr, 10);
    if (n < 1) return false;
    jobs = static_cast<unsigned>(n);
    return true;
}

}  // namespace

Parsed parseArgs(const std::vector<std::string>& args, Settings& s, std::string& error) {
    bool optionsEnded = false;
    for (std::size_t i = 0; i < args.size(); ++i) {
        const std::string& a = args[i];
        if (optionsEnded || a.size() < 2 || a[0] != '-') {
            s.paths.push_back(a);
            continue;
        }
        // The option's name and its value, from "--name=value", "--name value",
        // "-xvalue" or "-x value".
        std::string name = a, value;
        bool hasValue = false;
        if (a.compare(0, 2, "--") == 0) {
            const std::size_t eq = a.find('=');
            if (eq != std::string::npos) {
                name = a.substr(0, eq);
                value = a.substr(eq + 1);
                hasValue = true;
            }
        } else if (a.size() > 2) {
            name = a.substr(0, 2);
            value = a.substr(2);
            hasValue = true;
        }
        const bool takesValue = name == "-o" || name == "--output" || name == "-j" || name == "--jobs" ||
                                name == "--report" || name == "--fallbacks" || name == "--remap" ||
                                name == "--search";
        if (takesValue && !hasValue) {
            if (i + 1 >= args.size()) {
                error = "option " + name + " needs a value";
                return Parsed::UsageError;
            }
            value = args[++i];
        } else if (!takesValue && hasValue) {
            error = (a.compare(0, 2, "--") == 0 ? "option " + name + " takes no value"
                                                : "unknown option " + a);
            return Parsed::UsageError;
        }

        if (name == "--") {
            optionsEnded = true;
        } else if (name == "-h" || name == "--help") {
            return Parsed::Help;
        } else if (name == "--version") {
            return Parsed::Version;
        } else if (name == "-q" || name == "--quiet") {
            s.quiet = true;
        } else if (name == "--explain") {
            s.explain = true;
        } else if (name == "--update") {
            s.update = true;
        } else if (name == "--well-formed") {
            s.wellFormed = true;
        } else if (name == "--list" || name == "--files") {
            const Mode mode = name == "--list" ? Mode::List : Mode::Files;
            if (s.mode != Mode::Convert && s.mode != mode) {
                error = "--list and --files don't go together";
                return Parsed::UsageError;
            }
            s.mode = mode;
        } else if (name == "--remap") {
            const std::size_t eq = value.find('=');
            if (eq == std::string::npos || eq == 0) {
                error = "--remap takes OLD=NEW, not '" + value + "'";
                return Parsed::UsageError;
            }
            s.remap.emplace_back(value.substr(0, eq), value.substr(eq + 1));
        } else if (name == "--search") {
            if (value.empty()) {
                error = "the search folder is empty";
                return Parsed::UsageError;
            }
            s.searchFolders.push_back(value);
        } else if (name == "-o" || name == "--output") {
            if (value.empty()) {
                error = "the output folder is empty";
                return Parsed::UsageError;
            }
            s.outDir = value;
        } else if (name == "--report") {
            if (value.empty()) {
                error = "the report file is empty";
                return Parsed::UsageError;
            }
            s.reportPath = value;
        } else if (name == "--fallbacks") {
            if (value != "write" && value != "skip") {
                error = "--fallbacks takes write or skip, not '" + value + "'";
                return Parsed::UsageError;
            }
            s.writeFallbacks = value == "write";
        } else if (name == "-j" || name == "--jobs") {
            if (!parseJobs(value, s.jobs)) {
                error = "--jobs needs a whole number from 1 on, not '" + value + "'";
                return Parsed::UsageError;
            }
        } else {
            error = "unknown option " + name;
            return Parsed::UsageError;
        }
    }
    if (s.paths.empty()) {
        error = "no file given";
        return Parsed::UsageError;
    }
    if (s.mode != Mode::Convert) {
        const char* what = s.mode == Mode::List ? "--list" : "--files";
        const char* other = !s.outDir.empty() ? "-o" : s.explain ? "--explain" : s.update ? "--update"
                          : s.wellFormed ? "--well-formed" : !s.writeFallbacks ? "--fallbacks"
                          : s.mode == Mode::List && !s.remap.empty() ? "--remap" : nullptr;
        if (other) {
            error = std::string(what) + " doesn't go with " + other;
            return Parsed::UsageError;
        }
    } else if (!s.searchFolders.empty()) {
        error = "--search goes with --files";
        return Parsed::UsageError;
    }
    if (s.update && s.outDir.empty()) {
        error = "--update needs -o DIR";
        return Parsed::UsageError;
    }
    if (s.mode == Mode::Convert && s.outDir.empty() && !s.explain && s.paths.size() > 1) {
        error = "more than one path needs -o DIR (or --explain)";
        return Parsed::UsageError;
    }
    return Parsed::Run;
}

}  // namespace orvxml
