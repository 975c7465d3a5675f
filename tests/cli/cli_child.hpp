// Runs tarn-cli as a child process, with its output captured in files, so that tests can look
// at exit codes and texts, send it signals and kill it at any moment.
#pragma once

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>

#include <chrono>
#include <filesystem>
#include <ostream>
#include <string>
#include <thread>
#include <vector>

#include "support/temp_folder.hpp"

extern char** environ;

namespace tarn::test {

// Waits (20 s at most) until the file at `path` holds more than `bytes` bytes; a file that is
// not there yet holds none.
inline void waitForGrowth(const std::string& path, std::uintmax_t bytes) {
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    const auto size = [&] {
        std::error_code error;
        const auto got = std::filesystem::file_size(path, error);
        return error ? 0 : got;
    };
    while (size() <= bytes && std::chrono::steady_clock::now() < until)
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
}

class CliChild {
public:
    // Starts TARN_CLI_PATH with `args`; stdout and stderr go to files in `outputFolder`, and
    // standard input comes from `inputPath` when one is given. Standard output goes to
    // `stdoutPath` instead (such as /dev/full) when one is given.
    CliChild(std::vector<std::string> args, const std::string& outputFolder,
             const std::string& inputPath = "", const std::string& stdoutPath = "")
        : outPath_(outputFolder + "cli.out"), errPath_(outputFolder + "cli.err") {
        args.insert(args.begin(), TARN_CLI_PATH);
        std::vector<char*> argv;
        for (std::string& a : args) argv.push_back(a.data());
        argv.push_back(nullptr);
        posix_spawn_file_actions_t actions;
        posix_spawn_file_actions_init(&actions);
        if (!inputPath.empty())
            posix_spawn_file_actions_addopen(&actions, 0, inputPath.c_str(), O_RDONLY, 0);
        const std::string& stdoutTarget = stdoutPath.empty() ? outPath_ : stdoutPath;
        for (const auto& [fd, path] : {std::pair{1, stdoutTarget.c_str()}, {2, errPath_.c_str()}})
            posix_spawn_file_actions_addopen(&actions, fd, path, O_WRONLY | O_CREAT | O_TRUNC,
                                             0644);
        if (posix_spawn(&pid_, argv[0], &actions, nullptr, argv.data(), environ) != 0) pid_ = -1;
        posix_spawn_file_actions_destroy(&actions);
    }
    ~CliChild() {
        if (!finished() && ::kill(pid_, SIGKILL) == 0) wait();
    }
    CliChild(const CliChild&) = delete;
    CliChild& operator=(const CliChild&) = delete;

    void signal(int number) { ::kill(pid_, number); }

    // Waits until the child has written something to standard output, so that a signal lands
    // inside its work however slowly the program starts (sanitizer builds on a busy machine).
    void waitForOutput() const { waitForGrowth(outPath_, 0); }

    // The exit code, or 128 + the signal that ended it; -1 when the program did not start.
    int wait() {
        while (!reap(0)) continue;
        return code_;
    }
    // Whether it has ended, without waiting for it.
    bool finished() { return reap(WNOHANG); }
    std::string out() const { return readFile(outPath_); }  // "" when stdout went elsewhere
    std::string err() const { return readFile(errPath_); }

private:
    bool reap(int flags) {
        int status = 0;
        if (pid_ <= 0 || code_ >= 0) return true;
        if (::waitpid(pid_, &status, flags) != pid_) return false;
        code_ = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
        return true;
    }

    std::string outPath_, errPath_;
    pid_t pid_ = -1;
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
    CliChild child(args, outputFolder, outputFolder + "cli.in", stdoutPath);
    const int code = child.wait();
    return {code, child.out(), child.err()};
}

}  // namespace tarn::test
