// Runs tarn-cli as a child process, with its output captured in files, so that tests can look
// at exit codes and texts, send it signals and kill it at any moment.
#pragma once

#include <chrono>
#include <filesystem>
#include <ostream>
#include <string>
#include <thread>
#include <vector>

#include "core/path_text.hpp"
#include "support/child_process.hpp"
#include "support/temp_folder.hpp"

namespace tarn::test {

// The bytes in a file; a file that is not there yet holds none.
inline std::uintmax_t sizeOf(const std::string& path) {
    std::error_code error;
    const auto got = std::filesystem::file_size(pathFromUtf8(path), error);
    return error ? 0 : got;
}

// Waits (20 s at most) until the file at `path` holds more than `bytes` bytes.
inline void waitForGrowth(const std::string& path, std::uintmax_t bytes) {
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    while (sizeOf(path) <= bytes && std::chrono::steady_clock::now() < until)
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
}

// `count` enumerated records "1;1" .. "count;count", each ending in CR LF.
inline std::string enumeratedRecords(int count) {
    std::string text;
    for (int i = 1; i <= count; ++i) text += std::to_string(i) + ";" + std::to_string(i) + "\r\n";
    return text;
}

class CliChild : public ChildProcess {
public:
    // Starts TARN_CLI_PATH with `args`; stdout and stderr go to files in `outputFolder`, and
    // standard input comes from `inputPath` when one is given. Standard output goes to
    // `stdoutPath` instead (such as /dev/full) when one is given.
    CliChild(const std::vector<std::string>& args, const std::string& outputFolder,
             const std::string& inputPath = "", const std::string& stdoutPath = "")
        : ChildProcess(TARN_CLI_PATH, args, inputPath,
                       stdoutPath.empty() ? outputFolder + "cli.out" : stdoutPath,
                       outputFolder + "cli.err"),
          outPath_(outputFolder + "cli.out"),
          errPath_(outputFolder + "cli.err") {}

    // Waits for the end, killing a child that writes more than a test ever reads: a program that
    // loops on its output must fail the test, not fill the disk.
    int wait() {
        constexpr std::uintmax_t kCaptureLimit = 8u << 20;
        while (!finished()) {
            if (sizeOf(outPath_) > kCaptureLimit || sizeOf(errPath_) > kCaptureLimit) kill();
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return ChildProcess::wait();
    }

    // Waits until the child has written something to standard output, so that a signal lands
    // inside its work however slowly the program starts (sanitizer builds on a busy machine).
    void waitForOutput() const { waitForGrowth(outPath_, 0); }

    std::string out() const { return readFile(outPath_); }  // "" when stdout went elsewhere
    std::string err() const { return readFile(errPath_); }

private:
    std::string outPath_, errPath_;
};

struct CliRun {
    int code;
    std::string out, err;
    bool operator==(const CliRun&) const = default;
};
inline void PrintTo(const CliRun& run, std::ostream* os) {
    *os << "exit code " << run.code << ", stdout \"" << run.out << "\", stderr \"" << run.err
        << '"';
}

// Runs the program to its end, with `input` on standard input.
inline CliRun runCli(const std::vector<std::string>& args, const std::string& outputFolder,
                     const std::string& input = "", const std::string& stdoutPath = "") {
    writeFile(outputFolder + "cli.in", input);
    CliChild child(args, outputFolder, outputFolder + "cli.in", stdoutPath);
    const int code = child.wait();
    return {code, child.out(), child.err()};
}

}  // namespace tarn::test
