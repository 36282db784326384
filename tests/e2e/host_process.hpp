// Starts orv-cimhost as a child process on a free loopback port and stops it again.
#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

namespace orv::e2e {

std::string buildDir();
std::string sourceDir();
// The raw test provider's host arguments: its MOF, the loadable registrations and the build's lib folder.
std::vector<std::string> rawProviderArgs();

class HostProcess {
public:
    // Runs orv-cimhost with `args` (plus --port 0 unless `args` names a port).
    explicit HostProcess(std::vector<std::string> args, bool choosePort = true);
    ~HostProcess();
    HostProcess(const HostProcess&) = delete;
    HostProcess& operator=(const HostProcess&) = delete;

    // Waits up to 10 s for the "listening on" line; false when the host exited first.
    bool waitReady();
    int port() const noexcept { return port_; }
    pid_t pid() const noexcept { return pid_; }
    // Sends `signal` and waits up to 10 s; the exit status, or -1 on a timeout / a signal death.
    int stop(int signal);
    // Waits up to 10 s for the process to end on its own; its exit status or -1.
    int waitExit();
    // Everything the host wrote to standard error so far.
    const std::string& output();

private:
    void readAvailable(int timeoutMs);

    pid_t pid_ = -1;
    int errFd_ = -1;
    int port_ = -1;
    std::string output_;
};

// The classes a provider registration file names (its "[Class]" sections), in its order.
std::vector<std::string> registeredClasses(const std::string& registrationFile);

// One orv-cimhost over the raw test provider with the users of
// tests/e2e/data/credentials, shared by the tests of a suite: start() in
// SetUpTestSuite, stop() in TearDownTestSuite (expects a clean exit).
struct SharedRawHost {
    static HostProcess* host;
    static void start();
    static void stop();
};

// Runs a shell command; its standard output and error, in that order.
std::string runCommand(const std::string& command);

}  // namespace orv::e2e
