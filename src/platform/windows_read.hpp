// One read of a Windows handle, a file's or standard input's, in the words of the POSIX read:
// the bytes read, 0 at the end (a closed pipe too), -1 with an errno number in `error`.
#pragma once

#include <cstddef>

namespace tarn::platform {

std::ptrdiff_t readHandle(void* handle, char* data, std::size_t size, int& error);

}  // namespace tarn::platform
