// orv-cimlistener as a child process, with its standard output and error read back.
#pragma once

#include <sys/types.h>

#include <chrono>
#include <string>
#include <vector>

namespace orv::listener::test {

class ListenerProcess {
public:
    // Runs build/bin/orv-cimlistener with `args`.
    explicit ListenerProcess(const std::vector<std::string>& args);
    ~ListenerProcess();
    ListenerProcess(const ListenerProcess&) = delete;
    ListenerProcess& operator=(const ListenerProcess&) = delete;

    // Waits up to 10 s for the "listening on" line; the port it names, or -1.
    int waitListening();
    // Waits up to 10 s (or `wait`) for `count` lines on standard output.
    std::vector<std::string> waitLines(std::size_t count, std::chrono::seconds wait = std::chrono::seconds(10));
    void signal(int number);
    // Waits up to 10 s for the exit; the exit status, or -1 (timeout or killed by a signal).
    int waitExit();
    const std::string& errorText() const noexcept { return err_; }
    const std::string& outputText() const noexcept { return out_; }

private:
    void pump(int timeoutMs);

    pid_t pid_ = -1;
    int outFd_ = -1;
    int errFd_ = -1;
    std::string out_;
    std::string err_;
};

}  // namespace orv::listener::test
