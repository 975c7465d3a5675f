// tarn-cli resume: continues a stopped or killed generation job from the checkpoint, with the
// same checks and texts as the window's "Resume" button. The completion report goes to stdout;
// progress notes, refusals and the stop notice go to stderr.
#include <CLI/CLI.hpp>
#include <iostream>

#include "cli/cli_context.hpp"
#include "generation/resume_job.hpp"
#include "generation/resume_texts.hpp"

namespace tarn::cli {

void registerResumeCommand(CLI::App& app, Context& ctx) {
    auto* command =
        app.add_subcommand("resume", "Continue the stopped generation job recorded in primes.ini");
    command->callback([&ctx] {
        ResumeEvents events;
        events.onGathering = [] { std::cerr << kGatheringInfoLine << '\n'; };
        events.onContinuing = [](const ResumeStart&) { std::cerr << kDoingResumeInfoLine << '\n'; };
        const ResumeResult result = runResume(ctx.folder, ctx.stop, nullptr, events);
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
                std::cout << completionReport(result.job) << '\n';
                ctx.exitCode = kOk;
                break;
            case ResumeResult::Status::Stopped:
                std::cerr << kResumeStoppedNotice << '\n';
                ctx.exitCode = kStopped;
                break;
            case ResumeResult::Status::Failed:
                std::cerr << result.message << '\n';
                ctx.exitCode = kIoFailure;
                break;
        }
    });
}

}  // namespace tarn::cli
