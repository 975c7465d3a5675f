// What every subcommand of tarn-cli shares: the folder of the results and checkpoint files,
// the stop request raised by Ctrl-C or termination, and the exit code the command leaves.
#pragma once

#include <optional>
#include <string>

#include "core/folder_lock.hpp"
#include "core/stop_signal.hpp"

namespace CLI {
class App;
}

namespace tarn::cli {

// Exit codes common to the subcommands.
enum ExitCode : int { kOk = 0, kIoFailure = 1, kRefused = 2, kStopped = 3 };

struct Context {
    std::string folder;  // with one trailing separator once parsed
    StopSignal& stop;
    int exitCode = kOk;
};

// Each subcommand family registers itself here; the callbacks set ctx.exitCode.
void registerNumberCommands(CLI::App& app, Context& ctx);
void registerGenerationCommands(CLI::App& app, Context& ctx);
void registerSplitCommand(CLI::App& app, Context& ctx);
void registerResumeCommand(CLI::App& app, Context& ctx);

// The folder's lock, taken before a job, resume or split and held until it has ended. Nothing
// when another job holds it: the refusal is on stderr and the exit code is kRefused. A folder
// that cannot be locked at all is left to the command, which reports its own file errors.
std::optional<FolderLock> lockFolder(Context& ctx);

// Raises `stop` on Ctrl-C, termination and hang-up (on Windows: the console closing).
void installInterruptHandler(StopSignal& stop);

}  // namespace tarn::cli
