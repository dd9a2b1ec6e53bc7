// Interruptions on Windows: a console control handler that records the event
// as the signal a POSIX system would send.
#include "platform/Interrupt.h"

#include <atomic>
#include <csignal>

#include <windows.h>

namespace platform {

namespace {

#ifndef SIGHUP
constexpr int SIGHUP = 1;
#endif

std::atomic<int> caught(0);

BOOL WINAPI onControl(DWORD event) {
    int signal = SIGINT;
    if (event == CTRL_CLOSE_EVENT)
        signal = SIGHUP;
    else if (event == CTRL_LOGOFF_EVENT || event == CTRL_SHUTDOWN_EVENT)
        signal = SIGTERM;
    int none = 0;
    caught.compare_exchange_strong(none, signal);
    // The system ends the process as soon as the handler of a close,
    // logoff or shutdown returns: this thread waits instead, and the
    // program's own exit ends it once the file in hand is done.
    if (event != CTRL_C_EVENT && event != CTRL_BREAK_EVENT) Sleep(INFINITE);
    return TRUE;
}

}  // namespace

void catchInterrupts() {
    // A process started with Ctrl-C ignored (CREATE_NEW_PROCESS_GROUP) keeps
    // ignoring it: handlers aren't called for it then.
    SetConsoleCtrlHandler(onControl, TRUE);
}

int interruption() { return caught.load(); }

}  // namespace platform
