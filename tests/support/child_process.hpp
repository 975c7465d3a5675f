// tarn-cli run as a child process with its standard streams in files, for tests that look at exit
// codes and texts, ask it to stop and kill it at any moment. One source per system starts, stops
// and reaps it; the rest is shared.
#pragma once

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <ostream>
#include <string>
#include <thread>
#include <vector>

#include "core/path_text.hpp"
#include "support/temp_folder.hpp"

namespace tarn::test {

// 128 + SIGKILL, as a POSIX shell shows it; a killed Windows child ends with the same code.
inline constexpr int kKilledExitCode = 137;

inline std::uintmax_t sizeOf(const std::string& path) {
    std::error_code error;
    const auto got = std::filesystem::file_size(pathFromUtf8(path), error);
    return error ? 0 : got;
}

// Waits (20 s at most) until the file holds more than `bytes` bytes.
inline void waitForGrowth(const std::string& path, std::uintmax_t bytes) {
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    while (sizeOf(path) <= bytes && std::chrono::steady_clock::now() < until)
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
}

// Records "1;1" .. "count;count", each ending in CR LF.
inline std::string enumeratedRecords(int count) {
    std::string text;
    for (int i = 1; i <= count; ++i) text += std::to_string(i) + ";" + std::to_string(i) + "\r\n";
    return text;
}

class ChildProcess {
public:
    // Ctrl-C, the system asking to end, the terminal going away; on Windows all three are the
    // Ctrl-Break event, which Wine cannot send between processes (stop() is then false).
    enum class Stop { Interrupt, Terminate, HangUp };

    // stdout and stderr go to files in `outputFolder`, stdout to `stdoutPath` (such as /dev/full)
    // when one is given; an empty `inputPath` leaves standard input alone.
    ChildProcess(const std::vector<std::string>& args, const std::string& outputFolder,
                 const std::string& inputPath = "", const std::string& stdoutPath = "");
    ~ChildProcess();  // kills a child still running
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    bool stop(Stop how);
    void kill();
    bool finished();  // without waiting; sets the exit code (128 + a signal that ended it)

    // Kills a child that writes more than a test ever reads: a program looping on its output
    // must fail the test, not fill the disk.
    int wait() {
        while (!finished()) {
            if (sizeOf(outPath_) > (8u << 20) || sizeOf(errPath_) > (8u << 20)) kill();
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return code_;
    }
    std::string out() const { return readFile(outPath_); }  // "" when stdout went elsewhere
    std::string err() const { return readFile(errPath_); }

private:
    std::string outPath_, errPath_;
    std::intptr_t process_ = 0;  // the pid, or the process handle
    int code_ = -1;
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
    ChildProcess child(args, outputFolder, outputFolder + "cli.in", stdoutPath);
    const int code = child.wait();
    return {code, child.out(), child.err()};
}

}  // namespace tarn::test
