#include "cli/job_report.hpp"

#include <CLI/CLI.hpp>
#include <iostream>
#include <string>

#include "cli/cli_context.hpp"
#include "cli/standard_output.hpp"
#include "generation/texts.hpp"

namespace tarn::cli {

// Prints the outcome of a job and turns it into the exit code.
int reportJob(const JobResult& result) {
    switch (result.status) {
        case JobResult::Status::Completed:
            writeStandardOutput(completionReport(result) + '\n');
            return kOk;
        case JobResult::Status::Stopped:
            std::cerr << kAllStoppedMessage << '\n';
            return kStopped;
        case JobResult::Status::Failed:
            break;
    }
    std::cerr << result.error << '\n';
    return kIoFailure;
}

void addThreadsOption(CLI::App& command, int& threads) {
    command.add_option("--threads", threads, "Sieving threads (default: one per core)")
        ->check(CLI::Range(1, 1024));
}

}  // namespace tarn::cli
