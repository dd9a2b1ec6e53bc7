#pragma once
// The entry point of a command: each system's own (main on POSIX systems,
// wmain on Windows, in ProgramPosix.cpp and ProgramWindows.cpp) hands the
// command its arguments as UTF-8 and calls runProgram. Standard input,
// output and error pass bytes as they are, with no line end translation.
#include <string>
#include <vector>

// Defined by the command: runs it with the arguments behind the program's
// name and returns its exit status.
int runProgram(const std::vector<std::string>& args);
