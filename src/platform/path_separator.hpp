// The separator the system puts between the parts of a path.
#pragma once

namespace tarn::platform {

#ifdef _WIN32
inline constexpr char kPathSeparator = '\\';
#else
inline constexpr char kPathSeparator = '/';
#endif

}  // namespace tarn::platform
