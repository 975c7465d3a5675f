// tarn-cli: the command-line front end over the same engine as the desktop program.
#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>
#include <iostream>
#include <sstream>

#include "cli/cli_context.hpp"
#include "cli/standard_output.hpp"
#include "cli/texts.hpp"
#include "core/app_folder.hpp"
#include "core/data_folder.hpp"
#include "core/exception_text.hpp"
#include "core/path_text.hpp"
#include "platform/process.hpp"

namespace {

// CLI11's own check reads the name in the local code page on Windows; names are UTF-8 here.
const CLI::Validator kExistingFolder(
    [](std::string& name) {
        std::error_code ec;
        const std::filesystem::path path = tarn::pathFromUtf8(name);
        if (std::filesystem::is_directory(path, ec)) return std::string();
        if (std::filesystem::exists(path, ec)) return tarn::cli::folderIsAFile(name);
        return tarn::cli::folderMissing(name);
    },
    "DIR", "DIR");

int run(int argc, char** argv) {
    tarn::StopSignal stop;
    tarn::cli::Context ctx{{}, stop};
    const std::string programFolder = tarn::AppFolder();

    CLI::App app{"Tarn: generate, test, factorize and split prime numbers.", "tarn-cli"};
    app.set_version_flag("--version", std::string("tarn-cli ") + TARN_VERSION);
    // Also the source of the manual page, which lists every subcommand with its options.
    app.set_help_all_flag("--help-all", "Print the help of every subcommand and exit");
    app.require_subcommand(0, 1);
    std::string folder;
    app.add_option("--folder", folder,
                   "Folder of primes.txt and primes.ini (default: the program's folder, or the "
                   "user's data folder for an installed copy)")
        ->check(kExistingFolder)
        ->default_str(tarn::chooseDataFolder(programFolder, tarn::currentSurroundings()));
    app.parse_complete_callback([&] {
        ctx.folder =
            folder.empty() ? tarn::dataFolder(programFolder) : tarn::withTrailingSeparator(folder);
    });

    tarn::cli::registerNumberCommands(app, ctx);
    tarn::cli::registerGenerationCommands(app, ctx);
    tarn::cli::registerSplitCommand(app, ctx);
    tarn::cli::registerResumeCommand(app, ctx);

    tarn::cli::installInterruptHandler(stop);
    try {
        // CLI11 takes the arguments last first, without the program's name.
        std::vector<std::string> arguments = tarn::platform::utf8Arguments(argc, argv);
        if (!arguments.empty()) arguments.erase(arguments.begin());
        std::reverse(arguments.begin(), arguments.end());
        app.parse(arguments);
    } catch (const CLI::ParseError& e) {
        // --help and --version: their text goes out like every other, so a failed write shows.
        std::ostringstream out;
        const int code = app.exit(e, out, std::cerr);
        tarn::cli::writeStandardOutput(out.str());
        return code == 0 ? 0 : tarn::cli::kRefused;
    } catch (...) {
        // The engines report their own failures; this is the last line for anything else.
        std::cerr << tarn::unexpectedFailure(tarn::describeCurrentException()) << '\n';
        return tarn::cli::kIoFailure;
    }
    if (argc == 1) {
        tarn::cli::writeStandardOutput(app.help());
        return 0;
    }
    return ctx.exitCode;
}

}  // namespace

int main(int argc, char** argv) {
    tarn::platform::useBinaryStandardStreams();
    return tarn::cli::finishStandardOutput(run(argc, argv));
}
