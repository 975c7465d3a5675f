#include "cli/standard_output.hpp"

#include <cerrno>
#include <cstdio>
#include <string>

#include "cli/cli_context.hpp"
#include "core/texts.hpp"
#include "platform/process.hpp"

namespace tarn::cli {
namespace {
// The first failure's error number: later writes would only repeat it, or garble the output.
int g_failure = 0;
}  // namespace

bool writeStandardOutput(std::string_view text) {
    if (g_failure == 0) g_failure = platform::writeAll(platform::Stream::Output, text);
    return g_failure == 0;
}

int finishStandardOutput(int code) {
    // Nothing of tarn-cli's own goes through stdout's buffer; a library might have written there.
    errno = 0;
    if (g_failure == 0 && (std::fflush(stdout) != 0 || std::ferror(stdout)))
        g_failure = errno != 0 ? errno : EIO;
    if (g_failure == 0) return code;
    const std::string message = fileWriteFailure("standard output", systemReason(g_failure)) + '\n';
    platform::writeAll(platform::Stream::Error, message);
    return kIoFailure;
}

}  // namespace tarn::cli
