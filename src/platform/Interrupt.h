#pragma once
// Ctrl-C and its kin set a flag instead of ending the process at once, so
// that a program can stop between two steps and leave nothing half done: on
// POSIX systems SIGINT, SIGTERM and SIGHUP; on Windows a console's Ctrl-C,
// Ctrl-Break and close.
namespace platform {

// Installs the handlers. A signal that was ignored when the process started
// (a background job's SIGINT, nohup's SIGHUP) stays ignored.
void catchInterrupts();

// The signal that interrupted the process, 0 while none did: SIGINT for
// Ctrl-C and Ctrl-Break, SIGHUP for a closed console or terminal, SIGTERM.
// A program that stops on it exits with 128 plus this number, as a shell
// reports a process that the signal ended.
int interruption();

}  // namespace platform
