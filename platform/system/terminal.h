// How a command-line program meets its terminal: closed pipes, whether somebody watches, and how much room there is.
// Any thread may call; the first function is for the main thread, early.
#pragma once

#include <cstdio>

namespace platform {

// From now on writing to a pipe that nobody reads any more, or beyond the size that files may have, fails, where it
// would otherwise end the process.
void failOnWritesInVain();

// Whether the latest failed write of this thread failed because nobody reads the pipe any more.
bool wasPipeClosed();

// Whether the stream goes to a terminal.
bool isTerminal(std::FILE* stream);

// The columns of the stream's terminal; 80 where they are not known.
int terminalColumns(std::FILE* stream);

}  // namespace platform
