// The host's fully qualified name on a host whose name is in no hosts file and
// whose DNS server never answers: a child process gets a host name, a hosts
// file, a resolver configuration and a network namespace of its own, where the
// name server's address lies behind a veth pair whose far end answers nothing.
#include "linux_backend.hpp"

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <cstdio>
#include <fstream>
#include <poll.h>
#include <sched.h>
#include <string>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

constexpr const char* kHostName = "i21-nowhere";

bool bindOver(const std::string& content, const std::string& target, const std::string& directory)
{
    const std::string source = directory + "/" + target.substr(target.rfind('/') + 1);
    std::ofstream(source) << content;
    return ::mount(source.c_str(), target.c_str(), nullptr, MS_BIND, nullptr) == 0;
}

// Leaves without running destructors: the lookup thread may still wait on the resolver.
[[noreturn]] void reportAndLeave(int fd, const std::string& text)
{
    (void)!::write(fd, text.data(), text.size());
    ::_exit(0);
}

// In the child: the isolated host, then 13 names asked as 13 instances would.
// Writes "<milliseconds> <name>" or "setup failed" to fd.
[[noreturn]] void askInIsolation(int fd, const std::string& directory)
{
    auto report = [fd](const std::string& text) { reportAndLeave(fd, text); };
    if (::unshare(CLONE_NEWUTS | CLONE_NEWNS | CLONE_NEWNET) != 0) report("setup failed: unshare");
    if (::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) report("setup failed: private mounts");
    if (::sethostname(kHostName, std::char_traits<char>::length(kHostName)) != 0) report("setup failed: host name");
    if (!bindOver("127.0.0.1 localhost\n", "/etc/hosts", directory)) report("setup failed: hosts");
    if (!bindOver("nameserver 10.79.99.2\n", "/etc/resolv.conf", directory)) report("setup failed: resolv.conf");
    // The peer has no address: nothing answers the name server's address.
    if (std::system("ip link add i21dead type veth peer name i21peer && ip addr add 10.79.99.1/24 dev i21dead && "
                    "ip link set i21dead up && ip link set i21peer up >/dev/null 2>&1") != 0) {
        report("setup failed: veth pair");
    }
    orv::linuxhost::LinuxHost host;
    std::string name;
    const auto start = std::chrono::steady_clock::now();
    for (int instance = 0; instance < 13; ++instance) {
        if (!host.fqdn(name)) report("no name");
    }
    const auto elapsed = std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - start);
    reportAndLeave(fd, std::to_string(elapsed.count()) + " " + name);
}

}  // namespace

TEST(DeadResolver, FullyQualifiedNameAnswersAtOnceWithThePlainHostName)
{
    ASSERT_EQ(::geteuid(), 0u) << "this test makes namespaces and mounts: run it as root";
    char directory[] = "/tmp/i21-resolverXXXXXX";
    ASSERT_NE(::mkdtemp(directory), nullptr);
    int pipeFds[2];
    ASSERT_EQ(::pipe(pipeFds), 0);
    pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        ::close(pipeFds[0]);
        askInIsolation(pipeFds[1], directory);
    }
    ::close(pipeFds[1]);
    pollfd ready{pipeFds[0], POLLIN, 0};
    std::string text;
    // Five seconds is far beyond the bound; a resolver wait would take longer.
    if (::poll(&ready, 1, 5000) == 1) {
        char buffer[256];
        ssize_t n = ::read(pipeFds[0], buffer, sizeof buffer);
        if (n > 0) text.assign(buffer, static_cast<std::size_t>(n));
    } else {
        ::kill(child, SIGKILL);
    }
    ::close(pipeFds[0]);
    ::waitpid(child, nullptr, 0);
    std::remove((std::string(directory) + "/hosts").c_str());
    std::remove((std::string(directory) + "/resolv.conf").c_str());
    ::rmdir(directory);
    ASSERT_FALSE(text.empty()) << "13 names were not answered within 5 s";
    ASSERT_EQ(text.rfind("setup failed", 0), std::string::npos) << text;
    const auto space = text.find(' ');
    ASSERT_NE(space, std::string::npos) << text;
    EXPECT_LT(std::stol(text.substr(0, space)), 100) << "milliseconds for 13 names";
    EXPECT_EQ(text.substr(space + 1), kHostName);
}
