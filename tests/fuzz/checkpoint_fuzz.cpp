// The checkpoint reader on any bytes in a file of any length: it reads only the start of a long
// file, takes from it what it takes from that start cut off, and three numbers it finds read
// back the same from the line written for them.
#include "fuzz_check.hpp"
#include "generation/checkpoint_file.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    const tarn::CheckpointRead read = tarn::readCheckpoint(fileHolding(text, "primes.ini"));
    const auto start = tarn::parseCheckpoint(text.substr(0, tarn::kCheckpointReadLimit),
                                             size > tarn::kCheckpointReadLimit);
    FUZZ_CHECK(read.checkpoint == start);
    FUZZ_CHECK((read.status == tarn::CheckpointRead::Status::Read) == start.has_value());
    if (start) FUZZ_CHECK(tarn::parseCheckpoint(tarn::checkpointLine(*start)) == start);
    return 0;
}
