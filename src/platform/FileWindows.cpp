// Files on Windows: opened by their UTF-16 path through CreateFileW, with
// read and write sharing, so a file that another program holds open still
// reads. Paths too long for the classic limit take the "\\?\" form.
#include "platform/File.h"

#include <cerrno>

#include <algorithm>

#include <windows.h>

#include "platform/Windows.h"

namespace platform {

std::wstring extendedPath(const std::u16string& path) {
    std::wstring wide = toWide(path);
    // Below MAX_PATH less room for a file name (CreateDirectoryW's limit) the
    // path stays as it is, device names ("NUL") and relative forms included.
    if (wide.size() < 248 || wide.compare(0, 4, L"\\\\?\\") == 0 || wide.compare(0, 4, L"\\\\.\\") == 0)
        return wide;
    const DWORD n = GetFullPathNameW(wide.c_str(), 0, nullptr, nullptr);
    if (n == 0) return wide;
    std::wstring full(n, L'\0');
    const DWORD written = GetFullPathNameW(wide.c_str(), n, &full[0], nullptr);
    if (written == 0 || written >= n) return wide;
    full.resize(written);
    if (full.compare(0, 2, L"\\\\") == 0) return L"\\\\?\\UNC\\" + full.substr(2);
    return L"\\\\?\\" + full;
}

int errnoOf(unsigned long windowsError) {
    switch (windowsError) {
    case ERROR_FILE_NOT_FOUND:
    case ERROR_PATH_NOT_FOUND:
    case ERROR_INVALID_DRIVE:
    case ERROR_BAD_NETPATH:
    case ERROR_BAD_NET_NAME: return ENOENT;
    case ERROR_ACCESS_DENIED:
    case ERROR_SHARING_VIOLATION:
    case ERROR_LOCK_VIOLATION:
    case ERROR_WRITE_PROTECT: return EACCES;
    case ERROR_FILENAME_EXCED_RANGE: return ENAMETOOLONG;
    case ERROR_INVALID_NAME:
    case ERROR_DIRECTORY:
    case ERROR_INVALID_PARAMETER: return EINVAL;
    case ERROR_TOO_MANY_OPEN_FILES: return EMFILE;
    case ERROR_NOT_ENOUGH_MEMORY:
    case ERROR_OUTOFMEMORY: return ENOMEM;
    case ERROR_DISK_FULL:
    case ERROR_HANDLE_DISK_FULL: return ENOSPC;
    case ERROR_ALREADY_EXISTS:
    case ERROR_FILE_EXISTS: return EEXIST;
    case ERROR_DIR_NOT_EMPTY: return ENOTEMPTY;
    default: return EIO;
    }
}

std::filesystem::path nativePath(const std::u16string& path) { return std::filesystem::path(extendedPath(path)); }

void RegularFile::close() {
    if (handle_ != kClosed) CloseHandle(reinterpret_cast<HANDLE>(handle_));
    handle_ = kClosed;
}

bool RegularFile::openNative(const std::u16string& path) {
    if (path.empty()) {
        error_ = ENOENT;
        return false;
    }
    // FILE_FLAG_BACKUP_SEMANTICS lets a folder open too, so that it is told
    // apart from a file that can't be opened; its kind is checked on the handle.
    const HANDLE h = CreateFileW(extendedPath(path).c_str(), GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                 nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL | FILE_FLAG_BACKUP_SEMANTICS,
                                 nullptr);
    if (h == INVALID_HANDLE_VALUE) {
        error_ = errnoOf(GetLastError());
        return false;
    }
    BY_HANDLE_FILE_INFORMATION info;
    LARGE_INTEGER size;
    if (GetFileType(h) != FILE_TYPE_DISK || !GetFileInformationByHandle(h, &info) ||
        (info.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) || !GetFileSizeEx(h, &size) || size.QuadPart < 0) {
        notRegular_ = true;
        CloseHandle(h);
        return false;
    }
    handle_ = reinterpret_cast<std::intptr_t>(h);
    size_ = static_cast<std::uint64_t>(size.QuadPart);
    return true;
}

std::size_t RegularFile::readAt(std::uint64_t offset, void* dst, std::size_t n) const {
    char* p = static_cast<char*>(dst);
    std::size_t done = 0;
    if (offset > static_cast<std::uint64_t>(INT64_MAX) - n) return 0;
    while (handle_ != kClosed && done < n) {
        // A positioned read: the offset travels in the OVERLAPPED structure
        // of this synchronous handle.
        const std::uint64_t at = offset + done;
        OVERLAPPED where = {};
        where.Offset = static_cast<DWORD>(at);
        where.OffsetHigh = static_cast<DWORD>(at >> 32);
        const DWORD want = static_cast<DWORD>(std::min<std::size_t>(n - done, 1u << 30));
        DWORD got = 0;
        if (!ReadFile(reinterpret_cast<HANDLE>(handle_), p + done, want, &got, &where) || got == 0) break;
        done += got;
    }
    return done;
}

}  // namespace platform
