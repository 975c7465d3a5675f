#include <CLI/CLI.hpp>

#include "cli/cli_context.hpp"

namespace tarn::cli {

void registerSplitCommand(CLI::App&, Context&) {}

}  // namespace tarn::cli
