// UTF-8, the program's own encoding, to and from the UTF-16 of the Windows wide APIs, and the
// Windows error codes as the errno numbers the rest of the program words.
#pragma once

#include <string>
#include <string_view>

namespace tarn::platform {

std::wstring widen(std::string_view text);
std::string narrow(std::wstring_view text);

// The errno number closest to a Windows error code (EIO for one without a counterpart).
int errnoOf(unsigned long windowsError);
// The same for the calling thread's last error.
int lastErrno();

}  // namespace tarn::platform
