// Runs one number command over a batch of entries: the numbers given on the command line, or
// else one per line of standard input. Each entry passes the entry rule; a refused entry's
// message goes to standard error and the batch goes on. Output is gathered in a large buffer
// and written in big blocks, so piping in a hundred thousand numbers costs little beyond the
// work itself.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "cli/cli_context.hpp"

namespace tarn::cli {

// Appends the output for one accepted whole number (with its newline) to `out`; returns
// false when the work was stopped.
using EntryWork = std::function<bool(std::int64_t number, std::string& out)>;

// kOk, kRefused when any entry was refused, kStopped when ctx.stop ended the batch, kIoFailure
// when standard output could not be written (the batch ends at that block).
int runEntryBatch(Context& ctx, const std::vector<std::string>& arguments, const EntryWork& work);

}  // namespace tarn::cli
