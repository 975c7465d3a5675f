// The checkpoint reader on any bytes in a file of any length: it reads only the start of a long
// file, takes from it what it takes from that start cut off, and three numbers it finds read
// back the same from the line written for them.
#include <cstdint>
#include <string>
#include <string_view>

#include "fuzz_check.hpp"
#include "generation/checkpoint_file.hpp"
#include "support/temp_folder.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const tarn::test::TempFolder folder;
    const std::string path = folder.path() + "primes.ini";
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    tarn::test::writeFile(path, std::string(text));

    const tarn::CheckpointRead read = tarn::readCheckpoint(path);
    const bool cut = size > tarn::kCheckpointReadLimit;
    const auto start = tarn::parseCheckpoint(text.substr(0, tarn::kCheckpointReadLimit), cut);
    FUZZ_CHECK(read.checkpoint == start);
    FUZZ_CHECK((read.status == tarn::CheckpointRead::Status::Read) == start.has_value());
    if (start) FUZZ_CHECK(tarn::parseCheckpoint(tarn::checkpointLine(*start)) == start);
    return 0;
}
