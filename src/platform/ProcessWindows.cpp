// Child processes on Windows: CreateProcessW on the program's own path, with
// anonymous pipes for standard input and output.
#include "platform/Process.h"

#include <mutex>

#include <windows.h>

#include "platform/Windows.h"

namespace platform {

namespace {

HANDLE handleOf(std::intptr_t h) { return reinterpret_cast<HANDLE>(h); }

void closeHandle(std::intptr_t& h) {
    if (h) CloseHandle(handleOf(h));
    h = 0;
}

// The path of this program's executable, as long as it is.
std::wstring ownPath() {
    std::wstring path(MAX_PATH, L'\0');
    for (;;) {
        const DWORD n = GetModuleFileNameW(nullptr, &path[0], static_cast<DWORD>(path.size()));
        if (n == 0) return std::wstring();
        if (n < path.size()) {
            path.resize(n);
            return path;
        }
        path.resize(path.size() * 2);
    }
}

// One argument as CommandLineToArgvW and the C runtime read it back:
// quotes around it, a quote escaped, backslashes doubled before a quote.
std::wstring quoted(const std::wstring& arg) {
    if (!arg.empty() && arg.find_first_of(L" \t\n\v\"") == std::wstring::npos) return arg;
    std::wstring out = L"\"";
    std::size_t backslashes = 0;
    for (const wchar_t c : arg) {
        if (c == L'\\') {
            ++backslashes;
            continue;
        }
        out.append(c == L'"' ? 2 * backslashes + 1 : backslashes, L'\\');
        backslashes = 0;
        out += c;
    }
    out.append(2 * backslashes, L'\\');
    return out + L"\"";
}

// Children are started one at a time: the ends of the pipes that a child
// inherits are inheritable only while it starts, so no other child takes a
// copy that would keep its pipe open.
std::mutex starting;

}  // namespace

ChildProcess::~ChildProcess() {
    closeHandle(input_);
    closeHandle(output_);
    closeHandle(process_);
}

bool ChildProcess::startSelf(const std::vector<std::string>& args) {
    const std::wstring exe = ownPath();
    if (exe.empty() || process_) return false;
    std::wstring line = quoted(exe);
    for (const std::string& arg : args) line += L' ' + quoted(toWide(utf16Path(arg)));

    std::lock_guard<std::mutex> lock(starting);
    SECURITY_ATTRIBUTES inherit = {sizeof inherit, nullptr, TRUE};
    HANDLE inRead = nullptr, inWrite = nullptr, outRead = nullptr, outWrite = nullptr, error = nullptr;
    if (!CreatePipe(&inRead, &inWrite, &inherit, 0)) return false;
    if (!CreatePipe(&outRead, &outWrite, &inherit, 0)) {
        CloseHandle(inRead);
        CloseHandle(inWrite);
        return false;
    }
    SetHandleInformation(inWrite, HANDLE_FLAG_INHERIT, 0);
    SetHandleInformation(outRead, HANDLE_FLAG_INHERIT, 0);
    const HANDLE ownError = GetStdHandle(STD_ERROR_HANDLE);
    if (ownError && ownError != INVALID_HANDLE_VALUE)
        DuplicateHandle(GetCurrentProcess(), ownError, GetCurrentProcess(), &error, 0, TRUE,
                        DUPLICATE_SAME_ACCESS);

    STARTUPINFOW startup = {};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput = inRead;
    startup.hStdOutput = outWrite;
    startup.hStdError = error;
    PROCESS_INFORMATION info = {};
    // The child shares this process's console, and so its Ctrl-C; without
    // one, it opens no window of its own.
    const DWORD flags = GetConsoleWindow() ? 0 : CREATE_NO_WINDOW;
    const BOOL started =
        CreateProcessW(exe.c_str(), &line[0], nullptr, nullptr, TRUE, flags, nullptr, nullptr, &startup, &info);
    CloseHandle(inRead);
    CloseHandle(outWrite);
    if (error) CloseHandle(error);
    if (!started) {
        CloseHandle(inWrite);
        CloseHandle(outRead);
        return false;
    }
    CloseHandle(info.hThread);
    process_ = reinterpret_cast<std::intptr_t>(info.hProcess);
    input_ = reinterpret_cast<std::intptr_t>(inWrite);
    output_ = reinterpret_cast<std::intptr_t>(outRead);
    id_ = info.dwProcessId;
    return true;
}

bool ChildProcess::write(const std::string& bytes) {
    const char* data = bytes.data();
    std::size_t left = bytes.size();
    while (left > 0) {
        DWORD done = 0;
        const DWORD want = static_cast<DWORD>(left < (1u << 30) ? left : (1u << 30));
        if (!input_ || !WriteFile(handleOf(input_), data, want, &done, nullptr) || done == 0) return false;
        data += done;
        left -= done;
    }
    return true;
}

std::size_t ChildProcess::read(char* into, std::size_t size) {
    DWORD got = 0;
    const DWORD want = static_cast<DWORD>(size < (1u << 30) ? size : (1u << 30));
    if (!output_ || !ReadFile(handleOf(output_), into, want, &got, nullptr)) return 0;
    return got;
}

void ChildProcess::closeInput() { closeHandle(input_); }

unsigned long ChildProcess::wait() {
    DWORD status = 0;
    if (!process_) return 0;
    WaitForSingleObject(handleOf(process_), INFINITE);
    GetExitCodeProcess(handleOf(process_), &status);
    return status;
}

}  // namespace platform
