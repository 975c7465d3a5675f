#include <signal.h>
#include <unistd.h>

#include <cerrno>

#include "platform/files.hpp"
#include "platform/process.hpp"

namespace tarn::platform {
namespace {

int descriptorOf(Stream stream) {
    switch (stream) {
        case Stream::Input:
            return STDIN_FILENO;
        case Stream::Output:
            return STDOUT_FILENO;
        case Stream::Error:
            break;
    }
    return STDERR_FILENO;
}

void (*g_onStop)() = nullptr;

extern "C" void onSignal(int) {
    // Only an atomic store behind it: safe inside a signal handler.
    if (g_onStop) g_onStop();
}

}  // namespace

int writeAll(Stream stream, std::string_view text) {
    const int fd = descriptorOf(stream);
    std::size_t written = 0;
    return writeAllWith(
        [fd](const char* data, std::size_t size, int& error) -> std::ptrdiff_t {
            const ssize_t done = ::write(fd, data, size);
            error = done < 0 ? errno : 0;
            return done;
        },
        text.data(), text.size(), written);
}

std::ptrdiff_t readInput(char* data, std::size_t size, int& error) {
    const ssize_t got = ::read(STDIN_FILENO, data, size);
    error = got < 0 ? errno : 0;
    return got;
}

bool isTerminal(Stream stream) { return ::isatty(descriptorOf(stream)) == 1; }

void onStopRequest(void (*onStop)()) {
    g_onStop = onStop;
    // No SA_RESTART: a read waiting on a pipe or a terminal returns EINTR, and its caller looks
    // at the stop request.
    struct sigaction action {};
    action.sa_handler = onSignal;
    sigemptyset(&action.sa_mask);
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) sigaction(signal, &action, nullptr);
}

void useBinaryStandardStreams() {}

std::vector<std::string> utf8Arguments(int argc, char** argv) {
    // The arguments are bytes, taken as the user typed them.
    return std::vector<std::string>(argv, argv + argc);
}

}  // namespace tarn::platform
