#pragma once
// orvxml --list and --files: what each file holds, or the files it refers
// to, without converting it. Files are read one after another in this
// process: loading is quick, and a listing has no output files to spread.
#include <cstdio>
#include <vector>

#include "module/cli/Args.h"
#include "module/cli/Tree.h"
#include "xml/PathRemap.h"

namespace orvxml {

// Prints a line per material, options file or file reference on standard
// output (and a JSON object each to `report`, if given), a line on standard
// error for each file that can't be read, and a summary. `rules` rewrite the
// stored paths that --files shows. Returns the exit status: 0, 1 when a file
// fell back to text or (--files) a referenced file is missing, 3 when a file
// or standard output couldn't be read or written, 128 + N when signal N
// stopped the run.
int runListing(const Settings& settings, const std::vector<Job>& jobs, const OrvaneLumoCore::PathRules& rules,
               std::FILE* report);

}  // namespace orvxml
