// How a command-line program meets its terminal and its user: interrupts, closed pipes, and whether somebody watches.
// The first three functions are for the main thread, early; the rest may be called from any thread.
#pragma once

#include <cstdio>

namespace platform {

// From now on the first interrupt (Ctrl-C, or a request to terminate) only sets a flag; a second one ends the process.
void catchInterrupts();

// Whether an interrupt has come since.
bool wasInterrupted();

// From now on writing to a pipe that nobody reads any more fails, where it would otherwise end the process.
void ignoreClosedPipes();

// Whether the latest failed write of this thread failed because nobody reads the pipe any more.
bool wasPipeClosed();

// Whether the stream goes to a terminal.
bool isTerminal(std::FILE* stream);

}  // namespace platform
