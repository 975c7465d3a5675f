// The split on any bytes, with a count and a read size that the first two bytes pick: the files
// it leaves join back to the input with every line end made CR LF, each but the last holds the
// count of records and the last from one to the count. Bytes after the last line end are a
// record cut short: left out, and counted.
#include <algorithm>

#include "fuzz_check.hpp"
#include "tools/split_results.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size < 2) return 0;
    const std::int64_t perFile = 1 + data[0] % 8;
    tarn::SplitOptions options;
    options.blockSize = 1 + data[1];
    const std::string_view text(reinterpret_cast<const char*>(data) + 2, size - 2);
    const std::string path = fileHolding(text, "primes.txt");
    const std::string prefix = path.substr(0, path.size() - 4);
    const tarn::SplitResult result =
        tarn::splitResultsFile(path, prefix, perFile, tarn::StopSignal{}, options);
    FUZZ_CHECK(result.status == tarn::SplitStatus::Completed && result.files >= 1);
    std::string joined, mended;  // mended: the whole lines, with a CR put before every bare LF
    for (std::int64_t n = 1; n <= result.files; ++n) {
        const std::string file = tarn::test::readFile(tarn::splitFileName(prefix, n));
        const auto records = std::count(file.begin(), file.end(), '\n');
        FUZZ_CHECK(file.empty() || file.back() == '\n');
        FUZZ_CHECK(n < result.files ? records == perFile : records <= perFile);
        FUZZ_CHECK(records > 0 || result.files == 1);
        joined += file;
    }
    const std::size_t whole = text.rfind('\n') + 1;
    for (std::size_t start = 0, end; start < whole; start = end + 1) {
        end = text.find('\n', start);
        mended.append(text.substr(start, end - start));
        if (mended.empty() || mended.back() != '\r') mended += '\r';
        mended += '\n';
    }
    FUZZ_CHECK(joined == mended && result.cutBytes == text.size() - whole);
    return 0;
}
