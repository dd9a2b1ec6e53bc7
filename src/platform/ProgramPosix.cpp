// The entry point on POSIX systems: the arguments are bytes already.
#include "platform/Program.h"

int main(int argc, char** argv) { return platform::runProgram(std::vector<std::string>(argv + 1, argv + argc)); }
