#pragma once
// What the orvxml command needs of the system besides reading files:
// folders, writing and replacing whole files, the kind of a path, the
// process id and the terminal. Paths are UTF-8 byte strings; POSIX systems
// take them as they are, Windows gets them as UTF-16 (paths beyond 260
// characters included). Failures come back as errno values, so that messages
// read the same on every system.
#include <cstddef>
#include <cstdio>
#include <string>
#include <vector>

namespace platform {

// The characters that end a folder's name in a path: "/", and on Windows
// also "\".
extern const char kPathSeparators[];

// Whether names that differ only in the case of letters name one file, as
// on Windows.
extern const bool kNamesIgnoreCase;

enum class PathKind { Missing, Folder, Other };

// The absolute form of `path`, with "." and ".." steps resolved (on POSIX
// systems links too); `path` itself if that can't be told.
std::string fullPath(const std::string& path);

// When the file at `path` was last written, in nanoseconds
// since an epoch that is the same for every file of the system. False if it
// can't be told.
bool modificationTime(const std::string& path, long long& nanoseconds);

// What `path` names, following links. For Missing, `error` says why.
PathKind pathKind(const std::string& path, int& error);

struct FolderEntry {
    enum Kind { Folder, LinkToFolder, Other };
    std::string name;  // UTF-8 on Windows, the bytes of the name elsewhere
    Kind kind = Other;
};

// The entries of the folder `dir` except "." and "..", in no particular
// order. A link (symbolic link, junction) to a folder is a LinkToFolder, not
// a Folder. Returns 0, or the errno of why the folder can't be read.
int listFolder(const std::string& dir, std::vector<FolderEntry>& entries);

// Creates the folder `path` (its parent must exist). Returns 0, or an errno:
// EEXIST if something of that name exists.
int makeFolder(const std::string& path);

// Writes `bytes` to `path`, created or emptied first. Returns 0, or an errno;
// a file that was created but not completely written is removed.
int writeNewFile(const std::string& path, const std::string& bytes);

// Renames `from` to `to`, replacing a file at `to` in one step: a reader sees
// the old file or the new one, never a mix. Returns 0 or an errno.
int replaceFile(const std::string& from, const std::string& to);

void removeFile(const std::string& path);

// Whether the errno of a failed write means that the disk or the user's
// quota is full, so that any further write fails as well.
bool isNoSpace(int error);

// Writes all of `bytes` to the open file descriptor `fd` (a pipe, standard
// output), through any number of partial writes. False on an error.
bool writeAll(int fd, const std::string& bytes);

// Opens `path` for writing bytes as they are given (no line end
// translation), emptied first. nullptr with errno set if it can't.
std::FILE* openOutputFile(const std::string& path);

// This process's id.
unsigned long processId();

// What standard error shows on: not a terminal; a terminal that takes the
// escape sequence "\033[K" (erase to the end of the line); or a console
// that doesn't, where a shorter line must be padded with spaces.
enum class Terminal { None, Escapes, Plain };
Terminal errorTerminal();

// How many columns the terminal that standard error shows on has; 80 when
// that can't be told.
int errorTerminalColumns();

}  // namespace platform
