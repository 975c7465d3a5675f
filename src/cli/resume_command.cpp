// tarn-cli resume: continues a stopped or killed generation job from the checkpoint, with the
// same checks and texts as the window's "Resume" button. The completion report goes to stdout;
// progress notes, refusals and the stop notice go to stderr.
#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>
#include <optional>

#include "cli/cli_context.hpp"
#include "cli/job_report.hpp"
#include "cli/progress_line.hpp"
#include "cli/texts.hpp"
#include "generation/resume_job.hpp"
#include "generation/texts.hpp"

namespace tarn::cli {

void registerResumeCommand(CLI::App& app, Context& ctx) {
    auto* command =
        app.add_subcommand("resume", "Continue the stopped generation job recorded in primes.ini");
    auto options = std::make_shared<JobOptions>();
    addThreadsOption(*command, options->threads);
    command->callback([&ctx, options] {
        const auto lock = lockFolder(ctx);
        if (!lock) return;
        JobProgress progress;
        std::optional<ProgressLine> line;
        ResumeEvents events;
        events.onGathering = [] { std::cerr << kGatheringInfoLine << '\n'; };
        events.onContinuing = [&](const ResumeStart& start) {
            std::cerr << kDoingResumeInfoLine << '\n';
            line.emplace(jobSample(progress, start.resumePoint, start.limit));
        };
        const ResumeResult result = runResume(ctx.folder, ctx.stop, &progress, events, *options);
        line.reset();
        switch (result.status) {
            case ResumeResult::Status::NothingToResume:
                std::cerr << kNothingToResumeNote << '\n';
                ctx.exitCode = kRefused;
                break;
            case ResumeResult::Status::Refused:
                std::cerr << result.message << '\n';
                ctx.exitCode = kRefused;
                break;
            case ResumeResult::Status::Completed:
            case ResumeResult::Status::Stopped:
                ctx.exitCode = reportJob(result.job);
                break;
            case ResumeResult::Status::Failed:
                std::cerr << result.message << '\n';
                ctx.exitCode = kIoFailure;
                break;
        }
    });
}

}  // namespace tarn::cli
