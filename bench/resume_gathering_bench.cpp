// The resume's read-back of the results file, over files of about 1 GB in each form written by the
// generation job itself. The files are made once per run in a temporary folder (they stay in the
// page cache after the writes, and a first read makes sure of it) and removed at exit. Counters:
// MB_per_s of the full check; MB_per_cpu_s, the same over the thread's CPU time (steadier on a busy
// machine); read_MB_per_s, the floor set by the same file read with no check at all.
#include <benchmark/benchmark.h>
#include <time.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <string>

#include "core/file_names.hpp"
#include "generation/generation_job.hpp"
#include "generation/scan/results_scan.hpp"
#include "platform/files.hpp"

namespace {

double threadCpuSeconds() {
    timespec t{};
    ::clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
    return static_cast<double>(t.tv_sec) + static_cast<double>(t.tv_nsec) * 1e-9;
}

// Reads the whole file in blocks of the scan's size and does nothing with the bytes.
std::uint64_t readAll(const std::string& path,
                      std::size_t blockBytes = tarn::kResultsScanBlockBytes) {
    int error = 0;
    tarn::platform::File file =
        tarn::platform::File::open(path, tarn::platform::File::Mode::Read, error);
    const auto block = std::make_unique<char[]>(blockBytes);
    std::uint64_t total = 0;
    for (std::ptrdiff_t got; (got = file.read(block.get(), blockBytes, error)) > 0;) total += got;
    return total;
}

struct JobFile {
    std::string folder;
    std::string path;
    std::int64_t limit;
    std::uint64_t bytes = 0;
    JobFile(std::int64_t upTo, bool enumerated) : limit(upTo) {
        const char* tmp = std::getenv("TMPDIR");
        std::string pattern = std::string(tmp && *tmp ? tmp : "/tmp") + "/tarn-bench-XXXXXX";
        if (!::mkdtemp(pattern.data())) std::abort();
        folder = pattern + "/";
        path = tarn::resultsFilePath(folder);
        tarn::JobSpec spec;
        spec.folder = folder;
        spec.limit = upTo;
        spec.enumerated = enumerated;
        const auto result = tarn::runJob(spec, tarn::StopSignal{}, nullptr);
        if (result.status != tarn::JobResult::Status::Completed) std::abort();
        bytes = readAll(path);
    }
    ~JobFile() { std::filesystem::remove_all(folder); }
};

// 1 900 000 027 and 999 999 997 are checkpoint candidates (30k + 7); the plain file holds 93
// million records in 1.1 GB, the enumerated one 51 million in 1.1 GB.
const JobFile& jobFile(bool enumerated) {
    if (enumerated) {
        static const JobFile file(999'999'997, true);
        return file;
    }
    static const JobFile file(1'900'000'027, false);
    return file;
}

void BM_ResumeGathering(benchmark::State& state) {
    const JobFile& file = jobFile(state.range(0) != 0);
    const tarn::StopSignal stop;
    double scanSeconds = 0, scanCpuSeconds = 0, readSeconds = 0;
    for (auto _ : state) {
        const double cpu0 = threadCpuSeconds();
        const auto t0 = std::chrono::steady_clock::now();
        const auto scan = tarn::scanResults(file.path, file.limit, stop);
        const auto t1 = std::chrono::steady_clock::now();
        scanCpuSeconds += threadCpuSeconds() - cpu0;
        benchmark::DoNotOptimize(readAll(file.path));
        const auto t2 = std::chrono::steady_clock::now();
        if (scan.outcome != tarn::ResultsScan::Outcome::Sound || scan.keptBytes != file.bytes)
            state.SkipWithError("the job's own file did not pass");
        scanSeconds += std::chrono::duration<double>(t1 - t0).count();
        readSeconds += std::chrono::duration<double>(t2 - t1).count();
        state.SetIterationTime(std::chrono::duration<double>(t1 - t0).count());
    }
    const double megabytes = static_cast<double>(file.bytes) / 1e6 * state.iterations();
    state.counters["MB_per_s"] = megabytes / scanSeconds;
    state.counters["MB_per_cpu_s"] = megabytes / scanCpuSeconds;
    state.counters["read_MB_per_s"] = megabytes / readSeconds;
}
// 0: plain records, 1: enumerated.
BENCHMARK(BM_ResumeGathering)
    ->Arg(0)
    ->Arg(1)
    ->Iterations(5)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);

}  // namespace
