// Interruptions on POSIX systems: signal handlers that only record the signal.
#include "platform/Interrupt.h"

#include <csignal>
#include <initializer_list>

namespace platform {

namespace {

volatile std::sig_atomic_t caught = 0;

extern "C" void onSignal(int signal) {
    if (caught == 0) caught = signal;
}

}  // namespace

void catchInterrupts() {
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        struct sigaction old;
        if (::sigaction(signal, nullptr, &old) != 0 || old.sa_handler == SIG_IGN) continue;
        struct sigaction action = {};
        action.sa_handler = onSignal;
        sigemptyset(&action.sa_mask);
        // Reads and writes go on after the handler; a wait that must notice
        // the signal polls the flag.
        action.sa_flags = SA_RESTART;
        ::sigaction(signal, &action, nullptr);
    }
}

int interruption() { return caught; }

}  // namespace platform
