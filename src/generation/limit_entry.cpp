#include "generation/limit_entry.hpp"

#include "generation/texts.hpp"

namespace tarn {

EntryResult readLimitEntry(std::string_view text, char decimalSeparator) {
    EntryResult entry = ReadNumberEntry(text, decimalSeparator);
    if (entry.accepted() && entry.number->whole() < kGenerationMinimum)
        return {std::nullopt, std::string(kMinimumMessage)};
    return entry;
}

}  // namespace tarn
