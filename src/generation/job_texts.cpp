// The job's minimum and completion texts, built from the job's result alone so that the window
// and the command line word them the same.
#include "generation/job_texts.hpp"

#include <algorithm>

#include "generation/generation_job.hpp"

namespace tarn {

namespace {
// After a complete run the candidate stands above the limit; the report names the limit.
std::int64_t reportedBound(const JobResult& r) { return std::min(r.candidate, r.limit); }
}  // namespace

std::string completionReport(const JobResult& r) {
    return "Done!!! The results were saved in the file " + r.resultsPath + ". " +
           std::to_string(r.primeCount) + " primes found up to number " +
           std::to_string(reportedBound(r)) + "... Save the file to other location.";
}

std::string completionInfoLine(const JobResult& r) {
    return "INFO: " + std::to_string(r.primeCount) + " primes found up to number " +
           std::to_string(reportedBound(r)) + "...";
}

}  // namespace tarn
