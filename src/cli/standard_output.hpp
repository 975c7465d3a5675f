// Everything tarn-cli prints on standard output goes through here, so that a write that fails
// (a full disk, a broken device) ends the program with kIoFailure and the system's reason on
// standard error instead of being lost without a word.
#pragma once

#include <string_view>

namespace tarn::cli {

// Writes all of `text` to standard output. After the first failure nothing more is written
// and every call returns false.
bool writeStandardOutput(std::string_view text);

// `code`, or kIoFailure with "The file standard output could not be written: <reason>." on
// standard error when any write to standard output failed (the C streams are flushed first).
int finishStandardOutput(int code);

}  // namespace tarn::cli
