// Every text the generation layer shows, word for word, once; other tests use the constants.
#include "generation/texts.hpp"

#include <gtest/gtest.h>

#include <cerrno>

#include "core/texts.hpp"
#include "generation/generation_job.hpp"

namespace tarn {
namespace {

TEST(GenerationTexts, WordForWord) {
    JobResult done;
    done.resultsPath = "/d/primes.txt";
    done.primeCount = 25;
    done.limit = 100;
    done.candidate = 101;  // above the limit after a complete run: the report names the limit
    const std::string c = "/d/primes.ini", r = "/d/primes.txt", no = " Nothing was changed.";
    const std::pair<std::string, std::string> texts[] = {
        {std::string(kMinimumMessage), "Minimum value is 100"},
        {std::string(kAllStoppedMessage), "All calculations were stopped!"},
        {completionReport(done),
         "Done!!! The results were saved in the file /d/primes.txt. 25 primes found up to number "
         "100... Save the file to other location."},
        {completionInfoLine(done), "INFO: 25 primes found up to number 100..."},
        {misplacedStartFailure(12),
         "The job cannot start at 12, which is not the start of a wheel turn."},
        {memoryFailure(1000), "There is not enough memory to generate the primes up to 1000."},
        {resultsChangeMessage(r, {FileCheck::Change::Gone}, 0),
         "The file /d/primes.txt was deleted while the job was writing it. The job stopped; "
         "generate the primes again."},
        {resultsChangeMessage(r, {FileCheck::Change::Replaced}, 0),
         "The file /d/primes.txt was replaced by another file while the job was writing it. The "
         "job stopped; generate the primes again."},
        {resultsChangeMessage(r, {FileCheck::Change::Resized, 10}, 12),
         "The file /d/primes.txt holds 10 bytes, but the job had written 12: it was cut or "
         "changed while the job was writing it. The job stopped and kept the records it could "
         "vouch for."},
        {resultsChangeMessage(r, {FileCheck::Change::None, 0, 0, EACCES}, 0),
         fileReadFailure(r, systemReason(EACCES))},
        {std::string(kImpossibleToResumeMessage),
         "Impossible to resume! Some error must have ocuured. To Resume you must Cancel the "
         "Calculations."},
        {std::string(kInterruptedPrompt),
         "You've interrupted the calculations the last time you used the program. If you wish, "
         "you can continue by pressing Resume."},
        {std::string(kGatheringInfoLine), "INFO: Gathering information..."},
        {std::string(kDoingResumeInfoLine), "INFO: Doing resume..."},
        {unreadableCheckpointRefusal(c),
         "Impossible to resume: the checkpoint file /d/primes.ini does not hold three readable "
         "numbers." +
             no},
        {checkpointReadRefusal(c, "why"),
         "Impossible to resume: the checkpoint file /d/primes.ini cannot be read (why)." + no},
        {misalignedCheckpointRefusal(c, 38),
         "Impossible to resume: the checkpoint file /d/primes.ini names 38 as the last candidate "
         "of a wheel turn, but that is not a number of the form 30k + 7." +
             no},
        {limitOutOfRangeRefusal(c, 922337203685477),
         "Impossible to resume: the checkpoint file /d/primes.ini holds the limit "
         "922337203685477, which is above 922337203685277." +
             no},
        {unreadableResultsRefusal(r, "why"),
         "Impossible to resume: the results file /d/primes.txt cannot be read (why)." + no},
        {damagedResultsRefusal(r, "holds no records"),
         "Impossible to resume: the results file /d/primes.txt holds no records." + no},
        {truncationFailure(r, "why"),
         "Impossible to resume: the results file /d/primes.txt cannot be cut back to its last "
         "complete record (why)."},
    };
    for (const auto& [got, expected] : texts) EXPECT_EQ(got, expected);
}

}  // namespace
}  // namespace tarn
