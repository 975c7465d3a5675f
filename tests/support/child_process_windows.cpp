#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

#include "platform/windows_text.hpp"
#include "support/child_process.hpp"

namespace tarn::test {
namespace {

// The arguments hold no quotes; backslashes before the closing quote are doubled, as the child's
// C runtime reads them.
std::wstring quoted(const std::string& argument) {
    const std::wstring wide = platform::widen(argument);
    const std::size_t trailing = wide.size() - (wide.find_last_not_of(L'\\') + 1);
    return L"\"" + wide + std::wstring(trailing, L'\\') + L"\"";
}

HANDLE inheritable(const std::string& path, bool write) {
    SECURITY_ATTRIBUTES inherit{sizeof inherit, nullptr, TRUE};
    return CreateFileW(platform::widen(path).c_str(), write ? GENERIC_WRITE : GENERIC_READ,
                       FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, &inherit,
                       write ? CREATE_ALWAYS : OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
}

}  // namespace

ChildProcess::ChildProcess(const std::vector<std::string>& args, const std::string& outputFolder,
                           const std::string& inputPath, const std::string& stdoutPath)
    : outPath_(outputFolder + "cli.out"), errPath_(outputFolder + "cli.err") {
    std::wstring commandLine = quoted(TARN_CLI_PATH);
    for (const std::string& a : args) commandLine += L" " + quoted(a);
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput =
        inputPath.empty() ? GetStdHandle(STD_INPUT_HANDLE) : inheritable(inputPath, false);
    startup.hStdOutput = inheritable(stdoutPath.empty() ? outPath_ : stdoutPath, true);
    startup.hStdError = inheritable(errPath_, true);
    PROCESS_INFORMATION process{};
    // Its own process group, so that a console event sent to it reaches it alone.
    if (CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, TRUE,
                       CREATE_NEW_PROCESS_GROUP, nullptr, nullptr, &startup, &process)) {
        process_ = reinterpret_cast<std::intptr_t>(process.hProcess);
        CloseHandle(process.hThread);
    }
    if (!inputPath.empty()) CloseHandle(startup.hStdInput);
    CloseHandle(startup.hStdOutput);
    CloseHandle(startup.hStdError);
}

ChildProcess::~ChildProcess() {
    if (!finished()) kill(), wait();
    if (process_) CloseHandle(reinterpret_cast<HANDLE>(process_));
}

bool ChildProcess::stop(Stop) {
    return GenerateConsoleCtrlEvent(CTRL_BREAK_EVENT,
                                    GetProcessId(reinterpret_cast<HANDLE>(process_)));
}

void ChildProcess::kill() { TerminateProcess(reinterpret_cast<HANDLE>(process_), kKilledExitCode); }

bool ChildProcess::finished() {
    const auto handle = reinterpret_cast<HANDLE>(process_);
    if (!handle || code_ >= 0) return true;
    if (WaitForSingleObject(handle, 0) != WAIT_OBJECT_0) return false;
    DWORD code = 0;
    GetExitCodeProcess(handle, &code);
    code_ = static_cast<int>(code);
    return true;
}

}  // namespace tarn::test
