// The process's side of the system: the standard streams, the requests to stop (Ctrl-C, the
// system terminating the program, the terminal or console going away) and the arguments in UTF-8.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace tarn::platform {

enum class Stream { Input, Output, Error };

// Every byte of `text` to the stream; the error number, or 0 once all is written.
int writeAll(Stream stream, std::string_view text);
// One read from standard input: the bytes read (0 at the end), or -1 with the error number
// (EINTR when a stop request broke the wait).
std::ptrdiff_t readInput(char* data, std::size_t size, int& error);
// Whether the stream is a terminal that takes the VT control sequences of a progress line (a
// Windows console is switched to take them; an old one that cannot does not count).
bool isTerminal(Stream stream);

// Calls `onStop` when the user or the system asks the program to stop: Ctrl-C, termination,
// the terminal hanging up or the console closing. `onStop` runs in a signal handler or on a
// thread of the system's, so it may only store to atomics. When the console closes, Windows
// ends the process once the handler returns: the handler waits there so that the program can
// finish its stop path (the system gives it a few seconds).
void onStopRequest(void (*onStop)());

// Standard input, output and error pass bytes as they are, so that the program's output is the
// same on every system (Windows' C runtime would otherwise write "\n" as CR LF).
void useBinaryStandardStreams();

// The command line's arguments in UTF-8 (Windows passes them to main in the local code page).
std::vector<std::string> utf8Arguments(int argc, char** argv);

}  // namespace tarn::platform
