// UTF-8 <-> UTF-16 for the Windows API: the program keeps its texts in UTF-8, Windows' wide
// functions take and give UTF-16.
#pragma once

#include <string>

namespace tarn::ui {

// Invalid sequences become U+FFFD rather than failing: a path shown in a message is still useful.
std::wstring widen(const std::string& utf8);
std::string narrow(const std::wstring& utf16);

}  // namespace tarn::ui
