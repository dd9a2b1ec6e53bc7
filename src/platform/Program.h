#pragma once
// The entry point of a command: each system's own (main on POSIX systems,
// wmain on Windows, in ProgramPosix.cpp and ProgramWindows.cpp) hands the
// command its arguments as UTF-8 and runs the program that the command named
// with setProgram. Standard input, output and error pass bytes as they are,
// with no line end translation.
#include <string>
#include <vector>

namespace platform {

// A command's body: runs it with the arguments behind the program's name and
// returns its exit status.
using Program = int (*)(const std::vector<std::string>& args);

// Names the program that the entry point runs. A command calls it from the
// initializer of a variable at namespace scope, so that it is named before
// the entry point starts; returns true, for that initializer.
bool setProgram(Program program);

// Runs the named program with `args`: what the entry points call.
int runProgram(const std::vector<std::string>& args);

}  // namespace platform
