#include "xml/PathRemap.h"

#include <cstddef>

namespace OrvaneLumoCore {

namespace {

bool isPathSeparator(char16_t c) { return c == u'\\' || c == u'/'; }

// The unit as paths compare it: ASCII letters in lower case, both separators
// as one.
char16_t foldPathUnit(char16_t c) {
    if (c >= u'A' && c <= u'Z') return static_cast<char16_t>(c - u'A' + u'a');
    if (c == u'/') return u'\\';
    return c;
}

// The length of `from` without its trailing separators when it is a run of
// whole steps at the start of `path`; npos otherwise.
std::size_t matchedLength(const std::u16string& from, const std::u16string& path) {
    std::size_t n = from.size();
    while (n > 0 && isPathSeparator(from[n - 1])) --n;
    if (n > path.size()) return std::u16string::npos;
    for (std::size_t i = 0; i < n; ++i)
        if (foldPathUnit(from[i]) != foldPathUnit(path[i])) return std::u16string::npos;
    // A whole step: the path ends there or goes on with a separator.
    if (n < path.size() && !isPathSeparator(path[n])) return std::u16string::npos;
    return n;
}

}  // namespace

bool remapPath(const PathRules& rules, const std::u16string& path, std::u16string& out) {
    // An empty path stands for no file at all.
    if (path.empty()) return false;
    for (const PathRule& rule : rules) {
        if (rule.from.empty()) continue;
        std::size_t rest = matchedLength(rule.from, path);
        if (rest == std::u16string::npos) continue;
        if (!rule.to.empty() && isPathSeparator(rule.to.back()) && rest < path.size()) ++rest;
        out = rule.to;
        out.append(path, rest, std::u16string::npos);
        return true;
    }
    return false;
}

}  // namespace OrvaneLumoCore
