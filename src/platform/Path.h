#pragma once
// Taking paths apart by their separators. The set of separators is the
// caller's: the system's own (kPathSeparators) for a path of this system,
// "/\\" for one written on Windows, whatever system reads it.
#include <string>

namespace platform {

// The folder that holds the file `path`: what stands before its last
// separator, the separator itself for a file at the root ("/a" -> "/"),
// and "." for a bare name.
std::string folderOf(const std::string& path, const char* separators);

}  // namespace platform
