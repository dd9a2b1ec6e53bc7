// The entry point on Windows: the arguments come as UTF-16 (file names
// outside the ANSI code page included) and go on as UTF-8; the standard
// streams are switched to binary, so that "\n" stays one byte.
#include "platform/Program.h"

#include <cstdio>
#include <cwchar>

#include <fcntl.h>
#include <io.h>
#include <windows.h>

#include "platform/Windows.h"

int wmain(int argc, wchar_t** argv) {
    _setmode(_fileno(stdin), _O_BINARY);
    _setmode(_fileno(stdout), _O_BINARY);
    _setmode(_fileno(stderr), _O_BINARY);
    // A console shows the UTF-8 bytes as text while the program runs.
    DWORD mode;
    const bool console = GetConsoleMode(GetStdHandle(STD_OUTPUT_HANDLE), &mode) ||
                         GetConsoleMode(GetStdHandle(STD_ERROR_HANDLE), &mode);
    const UINT codePage = GetConsoleOutputCP();
    if (console) SetConsoleOutputCP(CP_UTF8);

    std::vector<std::string> args;
    for (int i = 1; i < argc; ++i) args.push_back(platform::utf8Path(argv[i], std::wcslen(argv[i])));
    const int status = platform::runProgram(args);

    std::fflush(nullptr);
    if (console) SetConsoleOutputCP(codePage);
    return status;
}
