#include "tools/split_entry.hpp"

#include <string>

namespace tarn {

EntryResult parseRecordsPerFile(std::string_view text, char decimalSeparator) {
    EntryResult r = readWholeEntry(text, decimalSeparator);
    if (!r.accepted()) {
        // The conversion leaves the wording of an overflow to us.
        if (r.message.empty()) r.message = std::string(kRecordsOutOfRangeMessage);
        return r;
    }
    if (r.number->whole() < kMinimumRecordsPerFile)
        return {std::nullopt, std::string(kMinimumRecordsMessage)};
    return r;
}

}  // namespace tarn
