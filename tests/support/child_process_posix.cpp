#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>

#include "support/child_process.hpp"

extern char** environ;

namespace tarn::test {

struct ChildProcess::State {
    pid_t pid = -1;
    int code = -1;

    bool reap(int flags) {
        int status = 0;
        if (pid <= 0 || code >= 0) return true;
        if (::waitpid(pid, &status, flags) != pid) return false;
        code = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
        return true;
    }
};

ChildProcess::ChildProcess(const std::string& program, const std::vector<std::string>& args,
                           const std::string& inputPath, const std::string& outputPath,
                           const std::string& errorPath)
    : state_(std::make_unique<State>()) {
    std::vector<std::string> all{program};
    all.insert(all.end(), args.begin(), args.end());
    std::vector<char*> argv;
    for (std::string& a : all) argv.push_back(a.data());
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    if (!inputPath.empty())
        posix_spawn_file_actions_addopen(&actions, 0, inputPath.c_str(), O_RDONLY, 0);
    for (const auto& [fd, path] : {std::pair{1, outputPath.c_str()}, {2, errorPath.c_str()}})
        posix_spawn_file_actions_addopen(&actions, fd, path, O_WRONLY | O_CREAT | O_TRUNC, 0644);
    if (posix_spawn(&state_->pid, argv[0], &actions, nullptr, argv.data(), environ) != 0)
        state_->pid = -1;
    posix_spawn_file_actions_destroy(&actions);
}

ChildProcess::~ChildProcess() {
    if (!finished() && ::kill(state_->pid, SIGKILL) == 0) wait();
}

bool ChildProcess::started() const { return state_->pid > 0; }
bool ChildProcess::interrupt() { return ::kill(state_->pid, SIGINT) == 0; }
bool ChildProcess::terminate() { return ::kill(state_->pid, SIGTERM) == 0; }
bool ChildProcess::hangUp() { return ::kill(state_->pid, SIGHUP) == 0; }
void ChildProcess::kill() { ::kill(state_->pid, SIGKILL); }

int ChildProcess::wait() {
    while (!state_->reap(0)) continue;
    return state_->code;
}

bool ChildProcess::finished() { return state_->reap(WNOHANG); }

}  // namespace tarn::test
