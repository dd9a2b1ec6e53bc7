// The program that the entry points run, as the command named it.
#include "platform/Program.h"

#include <cstdlib>

namespace platform {

namespace {

// Zero before any initializer runs, so the command may name its program
// from any of its files.
Program namedProgram = nullptr;

}  // namespace

bool setProgram(Program program) {
    namedProgram = program;
    return true;
}

int runProgram(const std::vector<std::string>& args) { return namedProgram ? namedProgram(args) : EXIT_FAILURE; }

}  // namespace platform
