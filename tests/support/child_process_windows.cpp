#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

#include "platform/windows_text.hpp"
#include "support/child_process.hpp"

namespace tarn::test {
namespace {

// One argument as the C runtime of the child splits the command line: quotes around it, and
// backslashes doubled where a quote follows them.
std::wstring quoted(const std::string& argument) {
    const std::wstring wide = platform::widen(argument);
    std::wstring text = L"\"";
    std::size_t backslashes = 0;
    for (const wchar_t c : wide) {
        if (c == L'\\') {
            ++backslashes;
            continue;
        }
        text.append(c == L'"' ? backslashes * 2 + 1 : backslashes, L'\\');
        backslashes = 0;
        text += c;
    }
    text.append(backslashes * 2, L'\\');
    return text + L"\"";
}

HANDLE inheritable(const std::string& path, bool write) {
    SECURITY_ATTRIBUTES inherit{sizeof inherit, nullptr, TRUE};
    return CreateFileW(platform::widen(path).c_str(), write ? GENERIC_WRITE : GENERIC_READ,
                       FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, &inherit,
                       write ? CREATE_ALWAYS : OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
}

}  // namespace

struct ChildProcess::State {
    PROCESS_INFORMATION process{};
    int code = -1;
};

ChildProcess::ChildProcess(const std::string& program, const std::vector<std::string>& args,
                           const std::string& inputPath, const std::string& outputPath,
                           const std::string& errorPath)
    : state_(std::make_unique<State>()) {
    std::wstring commandLine = quoted(program);
    for (const std::string& a : args) commandLine += L" " + quoted(a);
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput =
        inputPath.empty() ? GetStdHandle(STD_INPUT_HANDLE) : inheritable(inputPath, false);
    startup.hStdOutput = inheritable(outputPath, true);
    startup.hStdError = inheritable(errorPath, true);
    // Its own process group, so that a console event sent to it reaches it alone.
    if (!CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, TRUE,
                        CREATE_NEW_PROCESS_GROUP, nullptr, nullptr, &startup, &state_->process))
        state_->process = {};
    if (!inputPath.empty()) CloseHandle(startup.hStdInput);
    CloseHandle(startup.hStdOutput);
    CloseHandle(startup.hStdError);
}

ChildProcess::~ChildProcess() {
    if (!finished()) {
        kill();
        wait();
    }
    if (state_->process.hProcess) {
        CloseHandle(state_->process.hProcess);
        CloseHandle(state_->process.hThread);
    }
}

bool ChildProcess::started() const { return state_->process.hProcess != nullptr; }

bool ChildProcess::interrupt() {
    return GenerateConsoleCtrlEvent(CTRL_BREAK_EVENT, state_->process.dwProcessId);
}

bool ChildProcess::terminate() { return interrupt(); }

bool ChildProcess::hangUp() { return interrupt(); }

void ChildProcess::kill() { TerminateProcess(state_->process.hProcess, kKilledExitCode); }

int ChildProcess::wait() {
    if (!started() || state_->code >= 0) return state_->code;
    WaitForSingleObject(state_->process.hProcess, INFINITE);
    DWORD code = 0;
    GetExitCodeProcess(state_->process.hProcess, &code);
    state_->code = static_cast<int>(code);
    return state_->code;
}

bool ChildProcess::finished() {
    if (!started() || state_->code >= 0) return true;
    if (WaitForSingleObject(state_->process.hProcess, 0) != WAIT_OBJECT_0) return false;
    return wait() >= 0;
}

}  // namespace tarn::test
