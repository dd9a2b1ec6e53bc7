#pragma once
// Rewriting the beginnings of stored file paths: a list of rules, each an old
// beginning and the text that takes its place, as the command's --remap gives
// them. The XML writer applies them to every file path it writes; the
// command's file listing shows paths through the same function.
#include <string>
#include <vector>

namespace OrvaneLumoCore {

struct PathRule {
    std::u16string from;  // the old beginning, a run of whole path steps
    std::u16string to;    // what takes its place
};

using PathRules = std::vector<PathRule>;

// One path that a document shows rewritten: its stored text and the text
// written in its place.
struct RemappedPath {
    std::u16string from;
    std::u16string to;

    bool operator==(const RemappedPath& o) const { return from == o.from && to == o.to; }
};

// Rewrites `path` by the first rule that matches it; true, with the result in
// `out`, if one does (`out` is left alone otherwise).
//
// A rule's `from` matches as Windows compares paths: ASCII letters without
// regard to case, "\" and "/" as the same separator. It must cover whole
// steps: "C:\maps" matches "C:\maps" and "C:\maps\wood.png" but not
// "C:\maps2\wood.png". Separators at the end of `from` are not needed ("C:\maps\"
// is the same rule). The rest of the path follows `to` with its own separators;
// if `to` ends in a separator, the rest's first separator is dropped, so that
// "C:\maps" to "/mnt/maps/" gives "/mnt/maps/wood.png". An empty `from` matches
// nothing; one made only of separators matches every path that starts with one.
// An empty path (no file) is never rewritten.
bool remapPath(const PathRules& rules, const std::u16string& path, std::u16string& out);

}  // namespace OrvaneLumoCore
