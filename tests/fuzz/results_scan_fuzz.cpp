// The results scan differentially: read from a file in blocks of a size the first byte picks,
// with its fast path, against the plain line check applied to one whole line after another.
// Both must keep the same records, last prime, form and length, and damage must give the same
// message. The next two bytes pick the checkpoint's candidate (all ones: above every record).
#include "fuzz_check.hpp"
#include "generation/scan/line_check.hpp"
#include "generation/scan/results_scan.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size < 3) return 0;
    const unsigned pick = data[1] << 8 | data[2];
    const std::int64_t resumePoint = pick == 0xffff ? std::int64_t{1} << 62 : pick;
    const std::string_view text(reinterpret_cast<const char*>(data) + 3, size - 3);

    using Outcome = tarn::ResultsScan::Outcome;
    tarn::ResultsScan plain;
    plain.outcome = Outcome::Sound;
    tarn::scan::LineCheck check(resumePoint, plain);
    for (std::size_t start = 0, end; (end = text.find('\n', start)) != text.npos; start = end + 1)
        if (!check.line(text.substr(start, end + 1 - start), start)) break;

    const tarn::ResultsScan fast = tarn::scanResults(fileHolding(text, "primes.txt"), resumePoint,
                                                     tarn::StopSignal{}, 1 + data[0]);
    FUZZ_CHECK(fast.records == plain.records && fast.lastPrime == plain.lastPrime);
    FUZZ_CHECK(fast.keptBytes == plain.keptBytes && fast.fileBytes == text.size());
    FUZZ_CHECK(fast.records == 0 || fast.enumerated == plain.enumerated);
    if (plain.outcome == Outcome::Damaged)
        FUZZ_CHECK(fast.outcome == Outcome::Damaged && fast.problem == plain.problem);
    else  // only the checks after the last line may find damage
        FUZZ_CHECK(fast.outcome == Outcome::Sound || fast.problem.starts_with("holds no records") ||
                   fast.problem.starts_with("ends with "));
    return 0;
}
