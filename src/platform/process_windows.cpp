#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>
// shellapi.h needs windows.h first.
#include <fcntl.h>
#include <io.h>
#include <shellapi.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>

#include "platform/files.hpp"
#include "platform/process.hpp"
#include "platform/windows_read.hpp"
#include "platform/windows_text.hpp"

namespace tarn::platform {
namespace {

HANDLE handleOf(Stream stream) {
    switch (stream) {
        case Stream::Input:
            return GetStdHandle(STD_INPUT_HANDLE);
        case Stream::Output:
            return GetStdHandle(STD_OUTPUT_HANDLE);
        case Stream::Error:
            break;
    }
    return GetStdHandle(STD_ERROR_HANDLE);
}

bool isConsole(HANDLE h) {
    DWORD mode = 0;
    return h != nullptr && h != INVALID_HANDLE_VALUE && GetConsoleMode(h, &mode);
}

void (*g_onStop)() = nullptr;

BOOL WINAPI onConsoleEvent(DWORD event) {
    if (g_onStop) g_onStop();
    if (event == CTRL_C_EVENT || event == CTRL_BREAK_EVENT) return TRUE;
    // The console is closing or the session ending: the process ends when this returns, so
    // wait here while the program stops (it exits the process itself when it is done).
    Sleep(INFINITE);
    return TRUE;
}

}  // namespace

int writeAll(Stream stream, std::string_view text) {
    const HANDLE h = handleOf(stream);
    std::size_t written = 0;
    if (isConsole(h)) {
        // A console shows UTF-16; bytes would be taken in its code page.
        const std::wstring wide = widen(text);
        return writeAllWith(
            [h, &wide](const char* data, std::size_t size, int& error) -> std::ptrdiff_t {
                const auto* from = reinterpret_cast<const wchar_t*>(data);
                DWORD done = 0;
                const DWORD count = static_cast<DWORD>(std::min<std::size_t>(size / 2, 1 << 14));
                if (!WriteConsoleW(h, from, count, &done, nullptr)) {
                    error = lastErrno();
                    return -1;
                }
                error = 0;
                return static_cast<std::ptrdiff_t>(done) * 2;
            },
            reinterpret_cast<const char*>(wide.data()), wide.size() * 2, written);
    }
    return writeAllWith(
        [h](const char* data, std::size_t size, int& error) -> std::ptrdiff_t {
            DWORD done = 0;
            const DWORD count = static_cast<DWORD>(std::min<std::size_t>(size, 1u << 30));
            if (!WriteFile(h, data, count, &done, nullptr)) {
                error = lastErrno();
                return -1;
            }
            error = 0;
            return static_cast<std::ptrdiff_t>(done);
        },
        text.data(), text.size(), written);
}

std::ptrdiff_t readInput(char* data, std::size_t size, int& error) {
    return readHandle(handleOf(Stream::Input), data, size, error);
}

bool isTerminal(Stream stream) {
    const HANDLE h = handleOf(stream);
    DWORD mode = 0;
    if (!isConsole(h) || !GetConsoleMode(h, &mode)) return false;
    return (mode & ENABLE_VIRTUAL_TERMINAL_PROCESSING) ||
           SetConsoleMode(h, mode | ENABLE_VIRTUAL_TERMINAL_PROCESSING);
}

void onStopRequest(void (*onStop)()) {
    g_onStop = onStop;
    SetConsoleCtrlHandler(onConsoleEvent, TRUE);
}

void useBinaryStandardStreams() {
    for (FILE* stream : {stdin, stdout, stderr}) _setmode(_fileno(stream), _O_BINARY);
}

std::vector<std::string> utf8Arguments(int argc, char** argv) {
    int count = 0;
    LPWSTR* wide = CommandLineToArgvW(GetCommandLineW(), &count);
    if (!wide) return std::vector<std::string>(argv, argv + argc);
    std::vector<std::string> arguments;
    for (int i = 0; i < count; ++i) arguments.push_back(narrow(wide[i]));
    LocalFree(wide);
    return arguments;
}

}  // namespace tarn::platform
