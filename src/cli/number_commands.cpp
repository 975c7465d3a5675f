// The Test and Factorize commands on the command line: `tarn-cli test N...` prints the
// verdict of each number, `tarn-cli factorize N...` its factorization line. Without numbers
// both read one number per line from standard input.
#include <CLI/CLI.hpp>
#include <memory>

#include "cli/cli_context.hpp"
#include "cli/entry_batch.hpp"
#include "core/factorization.hpp"
#include "core/miller_rabin.hpp"
#include "core/texts.hpp"

namespace tarn::cli {

void registerNumberCommands(CLI::App& app, Context& ctx) {
    auto testNumbers = std::make_shared<std::vector<std::string>>();
    CLI::App* test = app.add_subcommand(
        "test", "Tell whether each number is prime (numbers from standard input when none given)");
    test->add_option("numbers", *testNumbers, "Whole numbers from 2 to 922337203685277");
    test->callback([&ctx, testNumbers] {
        // isPrime gives the Test command's verdict for every entry (2 included, which the
        // window answers before its trial division) at a small fraction of the trial
        // division's cost, and leaves the stop request alone so that Ctrl-C ends the batch.
        ctx.exitCode = runEntryBatch(ctx, *testNumbers, [](std::int64_t n, std::string& out) {
            out += testVerdictMessage(n, isPrime(static_cast<std::uint64_t>(n)));
            out += '\n';
            return true;
        });
    });

    auto factorNumbers = std::make_shared<std::vector<std::string>>();
    CLI::App* factorize = app.add_subcommand(
        "factorize",
        "Split each number into prime powers (numbers from standard input when none given)");
    factorize->add_option("numbers", *factorNumbers, "Whole numbers from 2 to 922337203685277");
    factorize->callback([&ctx, factorNumbers] {
        ctx.exitCode = runEntryBatch(ctx, *factorNumbers, [&ctx](std::int64_t n, std::string& out) {
            const std::optional<FactorList> factors = FactorizeNumber(n, ctx.stop);
            if (!factors) return false;
            appendFactorizationLine(out, n, *factors);
            out += '\n';
            return true;
        });
    });
}

}  // namespace tarn::cli
