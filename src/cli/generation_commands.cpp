// The generation commands of tarn-cli: `generate LIMIT [--enumerate]` writes every prime up to
// LIMIT into primes.txt of the folder and the checkpoint into primes.ini, with the same entry
// rule, minimum, messages and stop path as the window.
#include <CLI/CLI.hpp>
#include <iostream>

#include "cli/cli_context.hpp"
#include "cli/job_report.hpp"
#include "cli/progress_line.hpp"
#include "generation/generation_job.hpp"
#include "generation/limit_entry.hpp"
#include "generation/texts.hpp"

namespace tarn::cli {

void registerGenerationCommands(CLI::App& app, Context& ctx) {
    struct Options {
        std::string limit;
        bool enumerate = false;
        JobOptions job;
    };
    auto options = std::make_shared<Options>();

    CLI::App* generate = app.add_subcommand(
        "generate", "Write every prime up to LIMIT into primes.txt and the checkpoint primes.ini");
    generate->add_option("LIMIT", options->limit, "Largest number to test (at least 100)")
        ->required();
    generate->add_flag("--enumerate", options->enumerate,
                       "Write records as serial number;prime (5;11)");
    addThreadsOption(*generate, options->job.threads);
    generate->callback([&ctx, options] {
        const EntryResult entry = readLimitEntry(options->limit);
        if (!entry.accepted()) {
            std::cerr << entry.message << '\n';
            ctx.exitCode = kRefused;
            return;
        }
        const auto lock = lockFolder(ctx);
        if (!lock) return;
        JobSpec spec;
        spec.folder = ctx.folder;
        spec.limit = entry.number->whole();
        spec.enumerated = options->enumerate;
        JobProgress progress;
        ctx.stop.clear();
        JobResult result;
        {
            ProgressLine line(jobSample(progress, 11, spec.limit));
            result = runJob(spec, ctx.stop, &progress, options->job);
        }
        ctx.exitCode = reportJob(result);
    });
}

}  // namespace tarn::cli
