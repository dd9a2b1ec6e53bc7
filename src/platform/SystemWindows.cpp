// The system calls of the orvxml command on Windows: the wide API on UTF-16
// paths, in the "\\?\" form beyond the classic length limit.
#include "platform/System.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cwchar>

#include <io.h>
#include <windows.h>

#include "platform/Windows.h"

#ifndef ENABLE_VIRTUAL_TERMINAL_PROCESSING
#define ENABLE_VIRTUAL_TERMINAL_PROCESSING 0x0004
#endif

namespace platform {

std::string utf8Path(const wchar_t* s, std::size_t n) {
    std::string out;
    out.reserve(n);
    for (std::size_t i = 0; i < n; ++i) {
        char32_t c = static_cast<char16_t>(s[i]);
        if (c >= 0xD800 && c <= 0xDBFF && i + 1 < n && s[i + 1] >= 0xDC00 && s[i + 1] <= 0xDFFF)
            c = 0x10000 + ((c - 0xD800) << 10) + (static_cast<char16_t>(s[++i]) - 0xDC00);
        if (c < 0x80) {
            out += static_cast<char>(c);
        } else if (c < 0x800) {
            out += static_cast<char>(0xC0 | (c >> 6));
            out += static_cast<char>(0x80 | (c & 0x3F));
        } else if (c < 0x10000) {
            out += static_cast<char>(0xE0 | (c >> 12));
            out += static_cast<char>(0x80 | ((c >> 6) & 0x3F));
            out += static_cast<char>(0x80 | (c & 0x3F));
        } else {
            out += static_cast<char>(0xF0 | (c >> 18));
            out += static_cast<char>(0x80 | ((c >> 12) & 0x3F));
            out += static_cast<char>(0x80 | ((c >> 6) & 0x3F));
            out += static_cast<char>(0x80 | (c & 0x3F));
        }
    }
    return out;
}

std::u16string utf16Path(const std::string& path) {
    std::u16string out;
    out.reserve(path.size());
    const unsigned char* p = reinterpret_cast<const unsigned char*>(path.data());
    const std::size_t n = path.size();
    for (std::size_t i = 0; i < n;) {
        const unsigned b = p[i];
        const int extra = b < 0x80 ? 0 : b >= 0xF0 ? 3 : b >= 0xE0 ? 2 : b >= 0xC0 ? 1 : -1;
        char32_t c = extra == 0 ? b : extra == 1 ? (b & 0x1F) : extra == 2 ? (b & 0x0F) : (b & 0x07);
        bool whole = extra >= 0 && n - i > static_cast<std::size_t>(extra);
        for (int k = 1; whole && k <= extra; ++k) {
            whole = (p[i + k] & 0xC0) == 0x80;
            c = (c << 6) | (p[i + k] & 0x3F);
        }
        if (!whole || c > 0x10FFFF) {
            // Not from utf8Path: the byte stands for itself as U+FFFD.
            out += u'\uFFFD';
            ++i;
            continue;
        }
        if (c >= 0x10000) {
            out += static_cast<char16_t>(0xD800 + ((c - 0x10000) >> 10));
            out += static_cast<char16_t>(0xDC00 + ((c - 0x10000) & 0x3FF));
        } else {
            out += static_cast<char16_t>(c);
        }
        i += static_cast<std::size_t>(extra) + 1;
    }
    return out;
}

namespace {

std::wstring native(const std::string& path) { return extendedPath(utf16Path(path)); }

int lastErrno() { return errnoOf(GetLastError()); }

}  // namespace

const char kPathSeparators[] = "/\\";
const bool kNamesIgnoreCase = true;

PathKind pathKind(const std::string& path, int& error) {
    const std::wstring wide = native(path);
    // Opening the path follows links to their target, and also finds
    // devices ("NUL") that have no attributes of their own.
    const HANDLE h = CreateFileW(wide.c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                 nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (h != INVALID_HANDLE_VALUE) {
        BY_HANDLE_FILE_INFORMATION info;
        const bool folder = GetFileType(h) == FILE_TYPE_DISK && GetFileInformationByHandle(h, &info) &&
                            (info.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY);
        CloseHandle(h);
        return folder ? PathKind::Folder : PathKind::Other;
    }
    error = lastErrno();
    // A file that no one may open (the page file) still has attributes.
    const DWORD attributes = GetFileAttributesW(wide.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES) return PathKind::Missing;
    return (attributes & FILE_ATTRIBUTE_DIRECTORY) ? PathKind::Folder : PathKind::Other;
}

int listFolder(const std::string& dir, std::vector<FolderEntry>& entries) {
    entries.clear();
    std::wstring pattern = native(dir);
    if (!pattern.empty() && pattern.back() != L'\\' && pattern.back() != L'/' && pattern.back() != L':')
        pattern += L'\\';
    pattern += L'*';
    WIN32_FIND_DATAW found;
    const HANDLE h = FindFirstFileW(pattern.c_str(), &found);
    if (h == INVALID_HANDLE_VALUE) {
        // A drive's root may hold no entry at all, not even ".".
        const DWORD e = GetLastError();
        const DWORD attributes = GetFileAttributesW(native(dir).c_str());
        const bool folder = attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY);
        return e == ERROR_FILE_NOT_FOUND && folder ? 0 : errnoOf(e);
    }
    do {
        FolderEntry entry;
        entry.name = utf8Path(found.cFileName, std::wcslen(found.cFileName));
        if (entry.name == "." || entry.name == "..") continue;
        if (found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) {
            // Symbolic links and junctions lead elsewhere; other reparse
            // points on folders (files kept in the cloud) are the folder.
            const bool link = (found.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) &&
                              (found.dwReserved0 == IO_REPARSE_TAG_SYMLINK ||
                               found.dwReserved0 == IO_REPARSE_TAG_MOUNT_POINT);
            entry.kind = link ? FolderEntry::LinkToFolder : FolderEntry::Folder;
        }
        entries.push_back(entry);
    } while (FindNextFileW(h, &found));
    const DWORD e = GetLastError();
    FindClose(h);
    return e == ERROR_NO_MORE_FILES ? 0 : errnoOf(e);
}

int makeFolder(const std::string& path) {
    if (CreateDirectoryW(native(path).c_str(), nullptr)) return 0;
    const DWORD e = GetLastError();
    return e == ERROR_ALREADY_EXISTS ? EEXIST : errnoOf(e);
}

int writeNewFile(const std::string& path, const std::string& bytes) {
    const std::wstring wide = native(path);
    const HANDLE h = CreateFileW(wide.c_str(), GENERIC_WRITE, FILE_SHARE_READ, nullptr, CREATE_ALWAYS,
                                 FILE_ATTRIBUTE_NORMAL, nullptr);
    if (h == INVALID_HANDLE_VALUE) return lastErrno();
    const char* data = bytes.data();
    std::size_t left = bytes.size();
    int error = 0;
    while (left > 0 && error == 0) {
        const DWORD want = static_cast<DWORD>(left < (1u << 30) ? left : (1u << 30));
        DWORD done = 0;
        if (!WriteFile(h, data, want, &done, nullptr) || done == 0) {
            error = lastErrno();
            break;
        }
        data += done;
        left -= done;
    }
    if (!CloseHandle(h) && error == 0) error = lastErrno();
    if (error != 0) DeleteFileW(wide.c_str());
    return error;
}

int replaceFile(const std::string& from, const std::string& to) {
    return MoveFileExW(native(from).c_str(), native(to).c_str(), MOVEFILE_REPLACE_EXISTING) ? 0 : lastErrno();
}

void removeFile(const std::string& path) { DeleteFileW(native(path).c_str()); }

bool writeAll(int fd, const std::string& bytes) {
    for (std::size_t at = 0; at < bytes.size();) {
        const unsigned piece = static_cast<unsigned>(std::min<std::size_t>(bytes.size() - at, 1u << 20));
        const int n = _write(fd, bytes.data() + at, piece);
        if (n <= 0) return false;
        at += static_cast<std::size_t>(n);
    }
    return true;
}

std::FILE* openOutputFile(const std::string& path) { return _wfopen(native(path).c_str(), L"wb"); }

// ERROR_DISK_FULL and ERROR_HANDLE_DISK_FULL come as ENOSPC; a quota that is
// full says ERROR_DISK_FULL as well.
bool isNoSpace(int error) { return error == ENOSPC; }

unsigned long processId() { return GetCurrentProcessId(); }

Terminal errorTerminal() {
    const HANDLE h = GetStdHandle(STD_ERROR_HANDLE);
    DWORD mode;
    if (h == nullptr || h == INVALID_HANDLE_VALUE || !GetConsoleMode(h, &mode)) return Terminal::None;
    if ((mode & ENABLE_VIRTUAL_TERMINAL_PROCESSING) ||
        SetConsoleMode(h, mode | ENABLE_VIRTUAL_TERMINAL_PROCESSING))
        return Terminal::Escapes;
    return Terminal::Plain;
}

int errorTerminalColumns() {
    CONSOLE_SCREEN_BUFFER_INFO info;
    if (GetConsoleScreenBufferInfo(GetStdHandle(STD_ERROR_HANDLE), &info))
        return info.srWindow.Right - info.srWindow.Left + 1;
    return 80;
}

std::string fullPath(const std::string& path) {
    const std::wstring wide = toWide(utf16Path(path));
    const DWORD n = GetFullPathNameW(wide.c_str(), 0, nullptr, nullptr);
    if (n == 0) return path;
    std::wstring full(n, L'\0');
    const DWORD written = GetFullPathNameW(wide.c_str(), n, &full[0], nullptr);
    if (written == 0 || written >= n) return path;
    return utf8Path(full.data(), written);
}

bool modificationTime(const std::string& path, long long& nanoseconds) {
    WIN32_FILE_ATTRIBUTE_DATA data;
    if (!GetFileAttributesExW(native(path).c_str(), GetFileExInfoStandard, &data)) return false;
    // A FILETIME counts 100 ns steps.
    const unsigned long long ticks =
        (static_cast<unsigned long long>(data.ftLastWriteTime.dwHighDateTime) << 32) |
        data.ftLastWriteTime.dwLowDateTime;
    nanoseconds = static_cast<long long>(ticks) * 100;
    return true;
}

}  // namespace platform
