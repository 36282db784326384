#include "listener_process.hpp"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <sstream>
#include <stdexcept>

namespace orv::listener::test {

namespace {

using Clock = std::chrono::steady_clock;
constexpr std::chrono::seconds kWait{10};

std::string binary() {
    const char* dir = std::getenv("ORV_BUILD_DIR");
    return std::string(dir != nullptr ? dir : ".") + "/bin/orv-cimlistener";
}

}  // namespace

ListenerProcess::ListenerProcess(const std::vector<std::string>& args) {
    int out[2];
    int err[2];
    if (pipe2(out, O_CLOEXEC) != 0 || pipe2(err, O_CLOEXEC) != 0) {
        throw std::runtime_error("pipe failed");
    }
    const std::string program = binary();
    std::vector<char*> argv{const_cast<char*>(program.c_str())};
    for (const std::string& arg : args) {
        argv.push_back(const_cast<char*>(arg.c_str()));
    }
    argv.push_back(nullptr);
    pid_ = fork();
    if (pid_ == 0) {
        dup2(out[1], STDOUT_FILENO);
        dup2(err[1], STDERR_FILENO);
        execv(program.c_str(), argv.data());
        _exit(127);
    }
    close(out[1]);
    close(err[1]);
    outFd_ = out[0];
    errFd_ = err[0];
}

ListenerProcess::~ListenerProcess() {
    if (pid_ > 0) {
        kill(pid_, SIGKILL);
        waitpid(pid_, nullptr, 0);
    }
    close(outFd_);
    close(errFd_);
}

void ListenerProcess::pump(int timeoutMs) {
    pollfd fds[2] = {{outFd_, POLLIN, 0}, {errFd_, POLLIN, 0}};
    if (poll(fds, 2, timeoutMs) <= 0) {
        return;
    }
    std::string* targets[2] = {&out_, &err_};
    for (int i = 0; i < 2; ++i) {
        if ((fds[i].revents & (POLLIN | POLLHUP)) != 0) {
            char buffer[4096];
            const ssize_t got = read(fds[i].fd, buffer, sizeof buffer);
            if (got > 0) {
                targets[i]->append(buffer, static_cast<std::size_t>(got));
            }
        }
    }
}

int ListenerProcess::waitListening() {
    const auto until = Clock::now() + kWait;
    while (Clock::now() < until) {
        const std::size_t at = err_.find("listening on ");
        const std::size_t end = at == std::string::npos ? at : err_.find('\n', at);
        if (end != std::string::npos) {
            const std::size_t colon = err_.rfind(':', end);
            return std::stoi(err_.substr(colon + 1, end - colon - 1));
        }
        pump(50);
    }
    return -1;
}

std::vector<std::string> ListenerProcess::waitLines(std::size_t count, std::chrono::seconds wait) {
    const auto until = Clock::now() + wait;
    auto lines = [this] {
        std::vector<std::string> out;
        std::istringstream stream(out_);
        for (std::string line; std::getline(stream, line);) {
            out.push_back(line);
        }
        return out;
    };
    while (lines().size() < count && Clock::now() < until) {
        pump(50);
    }
    return lines();
}

void ListenerProcess::signal(int number) {
    kill(pid_, number);
}

int ListenerProcess::waitExit() {
    const auto until = Clock::now() + kWait;
    while (Clock::now() < until) {
        int status = 0;
        const pid_t done = waitpid(pid_, &status, WNOHANG);
        if (done == pid_) {
            pid_ = -1;
            for (int i = 0; i < 5; ++i) {
                pump(10);
            }
            return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
        }
        pump(20);
    }
    return -1;
}

}  // namespace orv::listener::test
