#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>

#include "support/child_process.hpp"

extern char** environ;

namespace tarn::test {

ChildProcess::ChildProcess(const std::vector<std::string>& args, const std::string& outputFolder,
                           const std::string& inputPath, const std::string& stdoutPath)
    : outPath_(outputFolder + "cli.out"), errPath_(outputFolder + "cli.err") {
    std::vector<std::string> all{TARN_CLI_PATH};
    all.insert(all.end(), args.begin(), args.end());
    std::vector<char*> argv;
    for (std::string& a : all) argv.push_back(a.data());
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    if (!inputPath.empty())
        posix_spawn_file_actions_addopen(&actions, 0, inputPath.c_str(), O_RDONLY, 0);
    const std::string out = stdoutPath.empty() ? outPath_ : stdoutPath;
    for (const auto& [fd, path] : {std::pair{1, out.c_str()}, {2, errPath_.c_str()}})
        posix_spawn_file_actions_addopen(&actions, fd, path, O_WRONLY | O_CREAT | O_TRUNC, 0644);
    pid_t pid = -1;
    if (posix_spawn(&pid, argv[0], &actions, nullptr, argv.data(), environ) == 0) process_ = pid;
    posix_spawn_file_actions_destroy(&actions);
}

ChildProcess::~ChildProcess() {
    if (!finished()) kill(), wait();
}

bool ChildProcess::stop(Stop how) {
    const int signals[] = {SIGINT, SIGTERM, SIGHUP};
    return process_ > 0 && code_ < 0 &&
           ::kill(static_cast<pid_t>(process_), signals[static_cast<int>(how)]) == 0;
}

void ChildProcess::kill() {
    // Never the whole group (0), nor a number the system gave again after the child was reaped.
    if (process_ > 0 && code_ < 0) ::kill(static_cast<pid_t>(process_), SIGKILL);
}

bool ChildProcess::finished() {
    int status = 0;
    if (process_ <= 0 || code_ >= 0) return true;
    if (::waitpid(static_cast<pid_t>(process_), &status, WNOHANG) != process_) return false;
    code_ = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    return true;
}

}  // namespace tarn::test
