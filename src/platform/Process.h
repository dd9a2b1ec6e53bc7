#pragma once
// A second copy of this program, run as a child process that this one talks
// to through its standard input and output. Windows has no fork(), so the
// orvxml command starts its workers this way there; POSIX systems fork them
// (see module/cli/WorkersPosix.cpp) and have no face of this class.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace platform {

class ChildProcess {
public:
    ChildProcess() = default;
    // Closes this side's pipes; the child, if still running, reads the end
    // of its input.
    ~ChildProcess();
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    // Starts this program's own executable with `args` (UTF-8), its standard
    // input and output on pipes to this process, its standard error this
    // process's. Several threads may start children at the same time.
    bool startSelf(const std::vector<std::string>& args);

    // Writes all of `bytes` to the child's standard input; false if the child
    // is gone.
    bool write(const std::string& bytes);
    // Reads what the child wrote to its standard output, up to `size` bytes;
    // 0 once the child has closed it (or ended).
    std::size_t read(char* into, std::size_t size);
    // Ends the child's standard input.
    void closeInput();
    // Waits until the child ends; returns its exit status.
    unsigned long wait();
    unsigned long id() const { return id_; }

private:
    std::intptr_t process_ = 0, input_ = 0, output_ = 0;  // HANDLEs; 0 for none
    unsigned long id_ = 0;
};

}  // namespace platform
