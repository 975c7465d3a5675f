// tarn-cli split: the split of the results file from the command line, with the window's
// rules and texts. The count goes through the same entry as the window's box.
#include <CLI/CLI.hpp>
#include <iostream>

#include "cli/cli_context.hpp"
#include "cli/progress_line.hpp"
#include "cli/standard_output.hpp"
#include "core/file_names.hpp"
#include "tools/results_size.hpp"
#include "tools/split_entry.hpp"
#include "tools/split_results.hpp"

namespace tarn::cli {
namespace {

struct SplitArguments {
    std::string records;
    std::string into;
};

// The share of the results file read so far (its size taken at the start; a pipe has none, and
// its share stays at naught), and the files written.
std::function<ProgressSample()> splitSample(const SplitProgress& progress,
                                            const std::string& input) {
    const double size = static_cast<double>(fileLength(input).value_or(0));
    return [&progress, size] {
        const std::int64_t files = progress.files.load(std::memory_order_relaxed);
        const auto read = static_cast<double>(progress.bytesRead.load(std::memory_order_relaxed));
        return ProgressSample{size > 0 ? read / size : 0,
                              std::to_string(files) + (files == 1 ? " file" : " files")};
    };
}

int runSplit(const SplitArguments& args, Context& ctx) {
    const EntryResult count = parseRecordsPerFile(args.records);
    if (!count.accepted()) {
        std::cerr << count.message << '\n';
        return kRefused;
    }
    const auto lock = lockFolder(ctx);
    if (!lock) return kRefused;
    const std::string input = resultsFilePath(ctx.folder);
    SplitProgress progress;
    SplitOptions options;
    options.progress = &progress;
    SplitResult r;
    {
        ProgressLine line(splitSample(progress, input));
        r = splitResultsFile(input, splitNamePrefix(args.into), count.number->whole(), ctx.stop,
                             options);
    }
    if (r.status == SplitStatus::Failed) {
        std::cerr << r.message << '\n';
        return kIoFailure;
    }
    if (r.cutBytes > 0) std::cerr << cutRecordNote(input, r.cutBytes) << '\n';
    writeStandardOutput(splitDoneMessage(r.files) + '\n');
    return r.status == SplitStatus::Stopped ? kStopped : kOk;
}

}  // namespace

void registerSplitCommand(CLI::App& app, Context& ctx) {
    auto args = std::make_shared<SplitArguments>();
    CLI::App* split = app.add_subcommand(
        "split", "Copy the records of primes.txt into primes1.txt, primes2.txt ... in a folder");
    split->add_option("--records", args->records, "Records in each file (at least 1000)")
        ->required();
    split->add_option("--into", args->into, "Folder that receives the files")->required();
    split->callback([args, &ctx] { ctx.exitCode = runSplit(*args, ctx); });
}

}  // namespace tarn::cli
