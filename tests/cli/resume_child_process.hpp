// Runs tarn-cli as a child process, with its output captured in files, so that tests can look
// at exit codes and texts, send it signals and kill it at any moment.
#pragma once

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <string>
#include <vector>

#include "support/temp_folder.hpp"

extern char** environ;

namespace tarn::test {

class CliChild {
public:
    // Starts TARN_CLI_PATH with `args`; stdout and stderr go to files in `outputFolder`.
    CliChild(const std::vector<std::string>& args, const std::string& outputFolder)
        : outPath_(outputFolder + "cli.out"), errPath_(outputFolder + "cli.err") {
        std::vector<std::string> all{TARN_CLI_PATH};
        all.insert(all.end(), args.begin(), args.end());
        std::vector<char*> argv;
        for (std::string& a : all) argv.push_back(a.data());
        argv.push_back(nullptr);
        posix_spawn_file_actions_t actions;
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_addopen(&actions, 1, outPath_.c_str(),
                                         O_WRONLY | O_CREAT | O_TRUNC, 0644);
        posix_spawn_file_actions_addopen(&actions, 2, errPath_.c_str(),
                                         O_WRONLY | O_CREAT | O_TRUNC, 0644);
        if (posix_spawn(&pid_, argv[0], &actions, nullptr, argv.data(), environ) != 0) pid_ = -1;
        posix_spawn_file_actions_destroy(&actions);
    }
    ~CliChild() {
        if (pid_ > 0 && !reaped_) {
            ::kill(pid_, SIGKILL);
            wait();
        }
    }
    CliChild(const CliChild&) = delete;
    CliChild& operator=(const CliChild&) = delete;

    bool started() const { return pid_ > 0; }
    void signal(int number) { ::kill(pid_, number); }

    // The exit code, or 128 + the signal that ended it.
    int wait() {
        if (!reaped_) {
            int status = 0;
            while (::waitpid(pid_, &status, 0) < 0) {
            }
            reaped_ = true;
            code_ = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
        }
        return code_;
    }
    std::string out() const { return readFile(outPath_); }
    std::string err() const { return readFile(errPath_); }

private:
    std::string outPath_, errPath_;
    pid_t pid_ = -1;
    bool reaped_ = false;
    int code_ = -1;
};

struct CliRun {
    int code;
    std::string out, err;
};

inline CliRun runCli(const std::vector<std::string>& args, const std::string& outputFolder) {
    CliChild child(args, outputFolder);
    const int code = child.wait();
    return {code, child.out(), child.err()};
}

}  // namespace tarn::test
