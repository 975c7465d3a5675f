// A program run as a child process with its standard streams in files, for tests that look at
// exit codes and texts, ask it to stop and kill it at any moment. One source per system.
#pragma once

#include <memory>
#include <string>
#include <vector>

namespace tarn::test {

// The exit code a killed child reports: 128 + SIGKILL, as a POSIX shell shows it (a Windows
// child is ended with the same code).
inline constexpr int kKilledExitCode = 137;

class ChildProcess {
public:
    // Starts `program` with `args`; an empty `inputPath` leaves standard input alone.
    ChildProcess(const std::string& program, const std::vector<std::string>& args,
                 const std::string& inputPath, const std::string& outputPath,
                 const std::string& errorPath);
    ~ChildProcess();  // kills a child still running
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    bool started() const;
    // Ctrl-C (SIGINT; on Windows Ctrl-Break, the event a process group can be sent). False when
    // it cannot be sent: Wine has no console events between Windows processes.
    bool interrupt();
    // The system asking the program to end (SIGTERM; on Windows the same console event).
    bool terminate();
    // The terminal going away (SIGHUP; on Windows the same console event).
    bool hangUp();
    void kill();
    // The exit code, or 128 + the signal that ended it; -1 when the program did not start.
    int wait();
    // Whether it has ended, without waiting for it.
    bool finished();

private:
    struct State;
    std::unique_ptr<State> state_;
};

}  // namespace tarn::test
