#include "host_process.hpp"

#include <gtest/gtest.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <regex>
#include <sstream>
#include <thread>

namespace orv::e2e {

std::string buildDir() {
    const char* dir = std::getenv("ORV_BUILD_DIR");
    return dir != nullptr ? dir : ".";
}

std::string sourceDir() {
    const char* dir = std::getenv("ORV_SOURCE_DIR");
    return dir != nullptr ? dir : "..";
}

std::vector<std::string> rawProviderArgs() {
    return {"--provider-dir", buildDir() + "/lib", "--registration", sourceDir() + "/tests/e2e/data/rawhost.reg",
            "--mof", sourceDir() + "/tests/rawprovider/rawprovider.mof", "--host-name", "testhost"};
}

HostProcess* SharedRawHost::host = nullptr;

void SharedRawHost::start() {
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--credentials", sourceDir() + "/tests/e2e/data/credentials"});
    host = new HostProcess(args);
    ASSERT_TRUE(host->waitReady()) << host->output();
}

void SharedRawHost::stop() {
    EXPECT_EQ(host->stop(SIGTERM), 0);
    delete host;
    host = nullptr;
}

HostProcess::HostProcess(std::vector<std::string> args, bool choosePort) {
    if (choosePort) {
        args.insert(args.begin(), {"--port", "0"});
    }
    const std::string binary = buildDir() + "/bin/orv-cimhost";
    std::array<int, 2> pipeFds{};
    if (pipe(pipeFds.data()) != 0) {
        return;
    }
    pid_ = fork();
    if (pid_ == 0) {
        dup2(pipeFds[1], STDERR_FILENO);
        close(pipeFds[0]);
        close(pipeFds[1]);
        std::vector<char*> argv;
        // ORV_HOST_WRAPPER runs the host under a tool, e.g. "valgrind --log-file=/tmp/vg.%p".
        std::vector<std::string> wrapper;
        if (const char* tool = std::getenv("ORV_HOST_WRAPPER")) {
            std::istringstream words(tool);
            for (std::string word; words >> word;) {
                wrapper.push_back(word);
            }
        }
        for (auto& word : wrapper) {
            argv.push_back(word.data());
        }
        argv.push_back(const_cast<char*>(binary.c_str()));
        for (auto& arg : args) {
            argv.push_back(arg.data());
        }
        argv.push_back(nullptr);
        execvp(argv[0], argv.data());
        _exit(127);
    }
    close(pipeFds[1]);
    errFd_ = pipeFds[0];
}

HostProcess::~HostProcess() {
    if (pid_ > 0) {
        kill(pid_, SIGKILL);
        waitpid(pid_, nullptr, 0);
    }
    if (errFd_ >= 0) {
        close(errFd_);
    }
}

void HostProcess::readAvailable(int timeoutMs) {
    pollfd fd{errFd_, POLLIN, 0};
    if (errFd_ < 0 || poll(&fd, 1, timeoutMs) <= 0) {
        return;
    }
    char buffer[4096];
    const ssize_t n = read(errFd_, buffer, sizeof buffer);
    if (n > 0) {
        output_.append(buffer, static_cast<std::size_t>(n));
    }
}

bool HostProcess::waitReady() {
    static const std::regex kListening("listening on [^ ]*:([0-9]+)");
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (std::chrono::steady_clock::now() < deadline) {
        std::smatch match;
        if (std::regex_search(output_, match, kListening)) {
            port_ = std::stoi(match[1]);
            return true;
        }
        if (pid_ > 0 && waitpid(pid_, nullptr, WNOHANG) == pid_) {
            readAvailable(100);
            pid_ = -1;
            return false;
        }
        readAvailable(50);
    }
    return false;
}

int HostProcess::waitExit() {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (pid_ > 0 && std::chrono::steady_clock::now() < deadline) {
        int status = 0;
        readAvailable(20);
        if (waitpid(pid_, &status, WNOHANG) == pid_) {
            pid_ = -1;
            readAvailable(100);
            return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
        }
    }
    return -1;
}

int HostProcess::stop(int signal) {
    if (pid_ <= 0) {
        return -1;
    }
    kill(pid_, signal);
    return waitExit();
}

const std::string& HostProcess::output() {
    readAvailable(0);
    return output_;
}

std::string runCommand(const std::string& command) {
    std::string output;
    FILE* pipe = popen((command + " 2>&1").c_str(), "r");
    if (pipe == nullptr) {
        return "popen failed";
    }
    char buffer[4096];
    std::size_t n = 0;
    while ((n = fread(buffer, 1, sizeof buffer, pipe)) > 0) {
        output.append(buffer, n);
    }
    pclose(pipe);
    return output;
}

std::vector<std::string> registeredClasses(const std::string& registrationFile) {
    std::ifstream reg(registrationFile);
    const std::regex kSection("^\\[([A-Za-z0-9_]+)\\]");
    std::vector<std::string> classes;
    for (std::string line; std::getline(reg, line);) {
        std::smatch match;
        if (std::regex_search(line, match, kSection)) {
            classes.push_back(match[1]);
        }
    }
    return classes;
}

}  // namespace orv::e2e
