#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>
// windows.h first: the shell headers build on its types.
#include <knownfolders.h>
#include <shellapi.h>
#include <shlobj.h>

#include "platform/desktop_windows.hpp"
#include "platform/windows_text.hpp"

namespace tarn::platform {
namespace {

// The system's own text for an error code (a Win32 error or an HRESULT), without the line end.
std::string systemMessage(DWORD code) {
    wchar_t* buffer = nullptr;
    const DWORD n = FormatMessageW(
        FORMAT_MESSAGE_ALLOCATE_BUFFER | FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS,
        nullptr, code, 0, reinterpret_cast<wchar_t*>(&buffer), 0, nullptr);
    std::wstring text = n ? std::wstring(buffer, n) : std::wstring();
    if (buffer) LocalFree(buffer);
    while (!text.empty() && (text.back() == L'\n' || text.back() == L'\r' || text.back() == L' '))
        text.pop_back();
    if (text.empty()) {
        char code_text[16];
        wsprintfA(code_text, "0x%08lX", static_cast<unsigned long>(code));
        return std::string("error ") + code_text;
    }
    return narrow(text);
}

// The command line that starts Notepad with the file: NOTEPAD.EXE "<path>".
std::wstring notepadCommandLine(const std::wstring& path) {
    return L"NOTEPAD.EXE \"" + path + L"\"";
}

}  // namespace

std::string startNotepad(const std::string& path) {
    // CreateProcessW may write into the command line: hand it a buffer of its own.
    std::wstring commandLine = notepadCommandLine(widen(path));
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESHOWWINDOW;
    startup.wShowWindow = SW_SHOWNORMAL;
    PROCESS_INFORMATION process{};
    if (!CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr,
                        &startup, &process))
        return "Notepad could not be started for " + path + ": " + systemMessage(GetLastError());
    // Not waited for: the handles are only closed.
    CloseHandle(process.hThread);
    CloseHandle(process.hProcess);
    return {};
}

std::string showOpenWithDialog(const std::string& path, void* owner) {
    const std::wstring file = widen(path);
    OPENASINFO info{};
    info.pcszFile = file.c_str();
    info.oaifInFlags = OAIF_EXEC;
    const HRESULT result = SHOpenWithDialog(static_cast<HWND>(owner), &info);
    // Closing the dialog without a choice is the user's answer, not a failure.
    if (SUCCEEDED(result) || result == HRESULT_FROM_WIN32(ERROR_CANCELLED)) return {};
    return "The Open With dialog could not be shown for " + path + ": " +
           systemMessage(static_cast<DWORD>(result));
}

std::string openInBrowser(const std::string& url) {
    const std::wstring address = widen(url);
    const HINSTANCE result =
        ShellExecuteW(nullptr, L"open", address.c_str(), nullptr, nullptr, SW_SHOWMAXIMIZED);
    // Values above 32 mean success; the reason of a failure is left in GetLastError.
    if (reinterpret_cast<INT_PTR>(result) > 32) return {};
    return "The web browser could not be started for " + url + ": " + systemMessage(GetLastError());
}

std::string documentsFolder() {
    PWSTR folder = nullptr;
    const HRESULT result =
        SHGetKnownFolderPath(FOLDERID_Documents, KF_FLAG_DEFAULT, nullptr, &folder);
    std::wstring path = SUCCEEDED(result) && folder ? std::wstring(folder) : std::wstring();
    CoTaskMemFree(folder);
    if (path.empty()) {
        // No Documents folder (a service account, a broken profile): the profile folder serves.
        wchar_t profile[MAX_PATH];
        const DWORD n = GetEnvironmentVariableW(L"USERPROFILE", profile, MAX_PATH);
        path = n > 0 && n < MAX_PATH ? std::wstring(profile, n) : std::wstring(L"C:\\");
    }
    if (path.size() > 3 && path.back() == L'\\') path.pop_back();
    return narrow(path);
}

}  // namespace tarn::platform
