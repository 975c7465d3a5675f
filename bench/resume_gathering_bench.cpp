// The resume's read-back of the results file against the floor for reading it: the same 1 MiB
// reads with nothing but a memchr count of line ends. The counter `vs_line_count` is the time
// of the full check over the time of that count, measured in the same run on the same warm file.
#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "generation/results_scan.hpp"

namespace {

struct BenchFile {
    std::string path;
    std::int64_t lastPrime = 0;
    std::size_t bytes = 0;
    BenchFile(std::int64_t upTo, bool enumerated) {
        char pattern[] = "/tmp/tarn-bench-XXXXXX";
        const int fd = mkstemp(pattern);
        path = pattern;
        std::vector<bool> composite(upTo + 1);
        std::string text;
        std::int64_t serial = 0;
        for (std::int64_t n = 2; n <= upTo; ++n) {
            if (composite[n]) continue;
            for (std::int64_t m = n * n; m <= upTo; m += n) composite[m] = true;
            if (enumerated) text += std::to_string(++serial) + ";";
            text += std::to_string(n) + "\r\n";
            lastPrime = n;
        }
        if (::write(fd, text.data(), text.size()) != static_cast<ssize_t>(text.size()))
            std::abort();
        ::close(fd);
        bytes = text.size();
    }
    ~BenchFile() { std::remove(path.c_str()); }
};

std::int64_t countLines(const std::string& path) {
    const int fd = ::open(path.c_str(), O_RDONLY);
    const auto block = std::make_unique<char[]>(1 << 20);
    std::int64_t lines = 0;
    for (ssize_t got; (got = ::read(fd, block.get(), 1 << 20)) > 0;) {
        const char* p = block.get();
        const char* end = p + got;
        while ((p = static_cast<const char*>(std::memchr(p, '\n', end - p)))) {
            ++lines;
            ++p;
        }
    }
    ::close(fd);
    return lines;
}

void BM_ResumeGathering(benchmark::State& state) {
    const BenchFile file(100000000, state.range(0) != 0);  // 5.8 million records
    const std::int64_t resumePoint = 99999997;             // 30k + 7, above the last prime
    const tarn::StopSignal stop;
    double scanSeconds = 0, countSeconds = 0;
    for (auto _ : state) {
        auto t0 = std::chrono::steady_clock::now();
        const auto scan = tarn::scanResults(file.path, resumePoint, stop);
        auto t1 = std::chrono::steady_clock::now();
        benchmark::DoNotOptimize(countLines(file.path));
        auto t2 = std::chrono::steady_clock::now();
        if (scan.outcome != tarn::ResultsScan::Outcome::Sound) state.SkipWithError("unsound");
        scanSeconds += std::chrono::duration<double>(t1 - t0).count();
        countSeconds += std::chrono::duration<double>(t2 - t1).count();
        state.SetIterationTime(std::chrono::duration<double>(t1 - t0).count());
    }
    state.counters["vs_line_count"] = scanSeconds / countSeconds;
    state.counters["MB_per_s"] = static_cast<double>(file.bytes) / 1e6 *
                                 static_cast<double>(state.iterations()) / scanSeconds;
}
BENCHMARK(BM_ResumeGathering)->Arg(0)->Arg(1)->UseManualTime()->Unit(benchmark::kMillisecond);

}  // namespace
