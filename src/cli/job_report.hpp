// What the job commands of tarn-cli share: the report of a job's outcome with its exit code,
// and their options.
#pragma once

#include "generation/generation_job.hpp"

namespace CLI {
class App;
}

namespace tarn::cli {

// Prints the outcome of a job (report on stdout, stop notice or failure on stderr) and turns
// it into the exit code.
int reportJob(const JobResult& result);

// --threads N of the job commands.
void addThreadsOption(CLI::App& command, int& threads);

}  // namespace tarn::cli
