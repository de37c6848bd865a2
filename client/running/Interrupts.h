#pragma once

namespace lumora::client {

/// Notes SIGINT, SIGTERM and SIGHUP from now on, except those that the caller of the program had ignored.
void catchInterrupts();
/// The first signal that came; 0 when none has.
int interruptingSignal();
/// Throws an Interruption when a signal has come.
void throwIfInterrupted();
/// Ends the program by the signal, so that a shell sees 128 and its number and stops its own loop too.
[[noreturn]] void endBySignal(int signal);

} // namespace lumora::client
