// What an exception caught with `catch (...)` says, for a message: the engines end a failed
// command with a message instead of letting an exception end the program.
#pragma once

#include <string>

namespace tarn {

// To be called inside a catch block only.
std::string describeCurrentException();

// "The job stopped on an unexpected error: <what>."
std::string unexpectedFailure(const std::string& what);

}  // namespace tarn
