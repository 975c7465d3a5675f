// The split on any bytes, with a count and a read size that the first two bytes pick: the files
// it leaves join back to the input with every line end made CR LF, each but the last holds the
// count of records and the last from one to the count. Bytes after the last line end are a
// record cut short: left out, and counted.
#include <algorithm>
#include <cstdint>
#include <string>
#include <string_view>

#include "fuzz_check.hpp"
#include "support/temp_folder.hpp"
#include "tools/split_results.hpp"

namespace {

// Whole lines, with a CR put before every bare LF.
std::string mended(std::string_view lines) {
    std::string out;
    for (std::size_t start = 0; start < lines.size();) {
        const std::size_t end = lines.find('\n', start);
        out.append(lines.substr(start, end - start));
        if (out.empty() || out.back() != '\r') out += '\r';
        out += '\n';
        start = end + 1;
    }
    return out;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const tarn::test::TempFolder folder;
    if (size < 2) return 0;
    const std::int64_t perFile = 1 + data[0] % 8;
    tarn::SplitOptions options;
    options.blockSize = 1 + data[1];
    const std::string_view text(reinterpret_cast<const char*>(data) + 2, size - 2);
    tarn::test::writeFile(folder.path() + "primes.txt", std::string(text));

    const std::string prefix = folder.path() + "primes";
    const tarn::SplitResult result = tarn::splitResultsFile(folder.path() + "primes.txt", prefix,
                                                            perFile, tarn::StopSignal{}, options);
    FUZZ_CHECK(result.status == tarn::SplitStatus::Completed && result.files >= 1);
    std::string joined;
    for (std::int64_t n = 1; n <= result.files; ++n) {
        const std::string file = tarn::test::readFile(tarn::splitFileName(prefix, n));
        const auto records = std::count(file.begin(), file.end(), '\n');
        FUZZ_CHECK(file.empty() || file.back() == '\n');
        FUZZ_CHECK(n < result.files ? records == perFile : records <= perFile);
        FUZZ_CHECK(records > 0 || result.files == 1);
        joined += file;
    }
    const std::string_view whole = text.substr(0, text.rfind('\n') + 1);
    FUZZ_CHECK(joined == mended(whole) && result.cutBytes == text.size() - whole.size());
    return 0;
}
