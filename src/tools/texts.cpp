#include "tools/texts.hpp"

#include "core/number.hpp"

namespace tarn {

std::string resultsNotFoundMessage(const std::string& resultsPath) {
    return "The results file " + resultsPath + " was not found.";
}

std::string splitDoneMessage(std::int64_t files) {
    return "Done!!!" + signedText(Number::fromWhole(files)) + " files were created.";
}

std::string cutRecordNote(const std::string& resultsPath, std::uint64_t bytes) {
    return "The last " + std::to_string(bytes) + " bytes of " + resultsPath +
           " were left out: they end without CR LF, so they are part of a record cut short.";
}

std::string megabyteText(double figure) { return doubleText(figure); }

std::string largeFileQuestion(double figure) {
    return "The file is bigger than 10 MB (" + megabyteText(figure) +
           " MB). Do you still want to open it with Notepad? If you cancel, you may choose the "
           "program to open it.";
}

}  // namespace tarn
