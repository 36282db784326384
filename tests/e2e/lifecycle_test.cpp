// Starting and stopping orv-cimhost: clean stops on SIGTERM / SIGINT with the providers
// cleaned up, and start failures that exit non-zero with one clear line.
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <thread>
#include <vector>

#include "golden_file.hpp"
#include "host_process.hpp"
#include "raw_connection.hpp"

namespace orv::e2e {
namespace {

std::string tempPath(const std::string& name) {
    return "/tmp/orv-e2e-" + std::to_string(getpid()) + "-" + name;
}

std::size_t lineCount(const std::string& text) {
    return static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
}

void enumerateOnce(int port) {
    const std::string out = runCommand("timeout 20 wbemcli ein 'http://localhost:" + std::to_string(port) +
                                       "/root/cimv2:Raw_Element'");
    ASSERT_NE(out.find("Raw_Element-0"), std::string::npos) << out;
}

TEST(CimHostLifecycle, SigtermStopsWithExitZeroAfterProviderCleanupWithTermination) {
    const std::string log = tempPath("provider.log");
    std::remove(log.c_str());
    setenv("RAW_PROVIDER_LOG", log.c_str(), 1);
    HostProcess host(rawProviderArgs());
    unsetenv("RAW_PROVIDER_LOG");
    ASSERT_TRUE(host.waitReady()) << host.output();
    enumerateOnce(host.port());
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
    EXPECT_NE(readFile(log).find("cleanup"), std::string::npos);
    EXPECT_NE(readFile(log).find("terminating=1"), std::string::npos) << readFile(log);
    std::remove(log.c_str());
}

TEST(CimHostLifecycle, SigintStopsWithExitZero) {
    HostProcess host(rawProviderArgs());
    ASSERT_TRUE(host.waitReady()) << host.output();
    enumerateOnce(host.port());
    EXPECT_EQ(host.stop(SIGINT), 0) << host.output();
    EXPECT_NE(host.output().find("stopped"), std::string::npos);
}

TEST(CimHostLifecycle, SigtermRightAfterStartStillStops) {
    HostProcess host(rawProviderArgs());
    ASSERT_TRUE(host.waitReady()) << host.output();
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

TEST(CimHostLifecycle, VersionOptionPrintsTheProjectVersion) {
    EXPECT_EQ(runCommand(buildDir() + "/bin/orv-cimhost --version; echo status $?"),
              std::string("orv-cimhost ") + ORV_VERSION + "\nstatus 0\n");
}

TEST(CimHostLifecycle, ResponsesCarryTheServerHeaderWithTheVersion) {
    HostProcess host(rawProviderArgs());
    ASSERT_TRUE(host.waitReady()) << host.output();
    const std::string head = runCommand("curl -s -o /dev/null -D - -X POST http://127.0.0.1:" +
                                        std::to_string(host.port()) + "/cimom");
    EXPECT_NE(head.find(std::string("\r\nServer: orv-cimhost/") + ORV_VERSION + "\r\n"), std::string::npos) << head;
    EXPECT_EQ(host.stop(SIGTERM), 0);
}

TEST(CimHostLifecycle, PortTakenFailsWithOneLine) {
    HostProcess first(rawProviderArgs());
    ASSERT_TRUE(first.waitReady()) << first.output();
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--port", std::to_string(first.port())});
    HostProcess second(args, false);
    EXPECT_EQ(second.waitExit(), 1);
    EXPECT_NE(second.output().find("cannot listen on 127.0.0.1:" + std::to_string(first.port())), std::string::npos)
        << second.output();
    EXPECT_EQ(lineCount(second.output()), 1U) << second.output();
    EXPECT_EQ(first.stop(SIGTERM), 0);
}

TEST(CimHostLifecycle, MissingRegistrationFileFailsWithOneLine) {
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--registration", "/nonexistent/orvprovider.reg"});
    HostProcess host(args);
    EXPECT_EQ(host.waitExit(), 1);
    EXPECT_EQ(host.output(), "orv-cimhost: cannot start: registration file /nonexistent/orvprovider.reg does not exist\n");
}

TEST(CimHostLifecycle, MissingProviderLibraryFailsWithOneLineFromTheDynamicLoader) {
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--registration", sourceDir() + "/tests/rawprovider/rawprovider.reg"});
    HostProcess host(args);
    EXPECT_EQ(host.waitExit(), 1);
    EXPECT_EQ(host.output(), "orv-cimhost: cannot start: cannot load provider library librawmissing.so: "
                             "librawmissing.so: cannot open shared object file: No such file or directory\n");
}

TEST(CimHostLifecycle, BrokenProviderLibraryFailsWithOneLineFromTheDynamicLoader) {
    const std::string dir = tempPath("providers");
    std::filesystem::create_directories(dir);
    std::ofstream(dir + "/libbroken.so") << std::string(256, 'x');  // long enough to be read as a header
    const std::string reg = tempPath("broken.reg");
    std::ofstream(reg) << "[Raw_Element]\n   provider: Broken\n   location: broken\n   type: instance\n"
                          "   namespace: root/cimv2\n";
    HostProcess host({"--provider-dir", dir, "--registration", reg, "--mof",
                      sourceDir() + "/tests/rawprovider/rawprovider.mof"});
    EXPECT_EQ(host.waitExit(), 1);
    EXPECT_EQ(host.output(), "orv-cimhost: cannot start: cannot load provider library " + dir + "/libbroken.so: " +
                                 dir + "/libbroken.so: invalid ELF header\n");
    std::filesystem::remove_all(dir);
    std::remove(reg.c_str());
}

TEST(CimHostLifecycle, RequestOverrunningTheProviderCallLimitAnswersCimErrFailedAndStopWaitsForTheCall) {
    setenv("SLOW_PROVIDER_MS", "3000", 1);
    HostProcess host({"--provider-dir", buildDir() + "/lib", "--registration",
                      sourceDir() + "/tests/e2e/data/slowhost.reg", "--mof",
                      sourceDir() + "/tests/rawprovider/rawprovider.mof", "--provider-call-limit", "1"});
    unsetenv("SLOW_PROVIDER_MS");
    ASSERT_TRUE(host.waitReady()) << host.output();
    const auto start = std::chrono::steady_clock::now();
    const std::string out = runCommand("timeout 20 wbemcli ein 'http://localhost:" + std::to_string(host.port()) +
                                       "/root/cimv2:Raw_Element'");
    const auto waited = std::chrono::steady_clock::now() - start;
    EXPECT_EQ(out, "*\n* wbemcli: Cim: (1) CIM_ERR_FAILED: the request did not finish within the provider call "
                   "limit of 1 s; the provider call goes on in the background and its result is dropped\n*\n");
    EXPECT_LT(waited, std::chrono::milliseconds(2500)) << "the answer came when the limit ran out";
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
    EXPECT_GT(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(2900))
        << "the stop waited for the provider call still running";
}

TEST(CimHostLifecycle, OverrunAfterTheAnswerBeganClosesTheConnectionWithoutTheLastChunk) {
    setenv("SLOW_PROVIDER_MS", "3000", 1);
    setenv("SLOW_PROVIDER_INSTANCES", "100", 1);  // about 50 KB of answer before the provider waits
    HostProcess host({"--provider-dir", buildDir() + "/lib", "--registration",
                      sourceDir() + "/tests/e2e/data/slowhost.reg", "--mof",
                      sourceDir() + "/tests/rawprovider/rawprovider.mof", "--provider-call-limit", "1"});
    unsetenv("SLOW_PROVIDER_MS");
    unsetenv("SLOW_PROVIDER_INSTANCES");
    ASSERT_TRUE(host.waitReady()) << host.output();
    const std::string enumerate =
        "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
        "<MESSAGE ID=\"4\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"EnumerateInstances\">"
        "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
        "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"Raw_Element\"/></IPARAMVALUE>"
        "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
    const auto start = std::chrono::steady_clock::now();
    RawConnection connection(host.port());
    ASSERT_TRUE(connection.send(cimPost(enumerate, "EnumerateInstances")));
    // The head and the first pieces went out; the rest can never come: no complete answer,
    // and the connection is closed when the limit runs out, not when the provider returns.
    EXPECT_FALSE(connection.readResponse(std::chrono::milliseconds(2500)));
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(2500));
    RawConnection next(host.port());
    ASSERT_TRUE(next.send(cimPost(enumerateClassNamesBody(2), "EnumerateClassNames")));
    auto answer = next.readResponse(std::chrono::seconds(10));
    ASSERT_TRUE(answer);
    EXPECT_EQ(answer->status, 200);
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

// The arguments of a host serving the slow provider with a provider call limit of 1 s and
// `threads` workers.
std::vector<std::string> slowHostArgs(const char* threads) {
    return {"--provider-dir", buildDir() + "/lib", "--registration", sourceDir() + "/tests/e2e/data/slowhost.reg",
            "--mof", sourceDir() + "/tests/rawprovider/rawprovider.mof", "--provider-call-limit", "1",
            "--threads", threads};
}

// EnumerateInstanceNames of Raw_Element in root/cimv2 with the given MESSAGE ID.
std::string enumerateRawElementNames(int messageId) {
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
           "<MESSAGE ID=\"" + std::to_string(messageId) +
           "\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"EnumerateInstanceNames\">"
           "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
           "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"Raw_Element\"/></IPARAMVALUE>"
           "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

// The call runs on the request's worker; when it overruns, the answer goes out at the limit
// and another worker takes that one's place: with a single worker, the same connection and
// a new one are both served while the provider still sleeps.
TEST(CimHostLifecycle, OverrunningCallHandsItsWorkerOverSoTheNextRequestsAreServed) {
    setenv("SLOW_PROVIDER_MS", "4000", 1);
    HostProcess host(slowHostArgs("1"));
    unsetenv("SLOW_PROVIDER_MS");
    ASSERT_TRUE(host.waitReady()) << host.output();
    const std::string enumerateNames = enumerateRawElementNames(7);
    const auto start = std::chrono::steady_clock::now();
    RawConnection connection(host.port());
    ASSERT_TRUE(connection.send(cimPost(enumerateNames, "EnumerateInstanceNames")));
    auto overrun = connection.readResponse(std::chrono::milliseconds(3000));
    ASSERT_TRUE(overrun) << "answered at the limit";
    EXPECT_EQ(overrun->status, 200);
    EXPECT_NE(overrun->body.find("<ERROR CODE=\"1\" DESCRIPTION=\"the request did not finish within the provider "
                                 "call limit of 1 s"),
              std::string::npos)
        << overrun->body;
    EXPECT_NE(overrun->body.find("<MESSAGE ID=\"7\""), std::string::npos) << overrun->body;

    ASSERT_TRUE(connection.send(cimPost(enumerateClassNamesBody(8), "EnumerateClassNames")));
    auto sameConnection = connection.readResponse(std::chrono::milliseconds(1500));
    ASSERT_TRUE(sameConnection) << "the connection goes on after the early answer";
    EXPECT_EQ(sameConnection->status, 200);
    EXPECT_NE(sameConnection->body.find("<MESSAGE ID=\"8\""), std::string::npos);

    RawConnection other(host.port());
    ASSERT_TRUE(other.send(cimPost(enumerateClassNamesBody(9), "EnumerateClassNames")));
    auto otherConnection = other.readResponse(std::chrono::milliseconds(1500));
    ASSERT_TRUE(otherConnection) << "the only worker is busy with the provider: another took its place";
    EXPECT_EQ(otherConnection->status, 200);
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(3800))
        << "all of it while the provider still sleeps";
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
    EXPECT_GT(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(3900))
        << "the stop waited for the provider call still running";
}

// Calls that overrun and calls that do not, from several clients at once: each overrun is
// answered at the limit and every quick request in full, on two workers (under the thread
// sanitizer this drives the early answer, the watchdog and the worker hand-over together).
TEST(CimHostLifecycle, ConcurrentClientsAreServedWhileCallsOverrun) {
    setenv("SLOW_PROVIDER_MS", "1500", 1);
    HostProcess host(slowHostArgs("2"));
    unsetenv("SLOW_PROVIDER_MS");
    ASSERT_TRUE(host.waitReady()) << host.output();
    const std::string enumerateNames = enumerateRawElementNames(5);
    std::atomic<int> overruns{0};
    std::atomic<int> quick{0};
    std::vector<std::thread> clients;
    for (int c = 0; c < 2; ++c) {
        clients.emplace_back([&] {
            RawConnection connection(host.port());
            for (int i = 0; i < 2; ++i) {
                if (!connection.send(cimPost(enumerateNames, "EnumerateInstanceNames"))) {
                    return;
                }
                auto answer = connection.readResponse(std::chrono::seconds(10));
                if (answer && answer->body.find("provider call limit of 1 s") != std::string::npos) {
                    ++overruns;
                }
            }
        });
    }
    for (int c = 0; c < 4; ++c) {
        clients.emplace_back([&, c] {
            RawConnection connection(host.port());
            for (int i = 0; i < 20; ++i) {
                if (!connection.send(cimPost(enumerateClassNamesBody(100 + c), "EnumerateClassNames"))) {
                    return;
                }
                auto answer = connection.readResponse(std::chrono::seconds(10));
                if (answer && answer->status == 200 &&
                    answer->body.find("<MESSAGE ID=\"" + std::to_string(100 + c) + "\"") != std::string::npos &&
                    answer->body.find("<ERROR") == std::string::npos) {
                    ++quick;
                }
            }
        });
    }
    for (auto& client : clients) {
        client.join();
    }
    EXPECT_EQ(overruns.load(), 4);
    EXPECT_EQ(quick.load(), 80);
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

TEST(CimHostLifecycle, BadMofFailsWithOneLine) {
    const std::string mof = tempPath("bad.mof");
    std::ofstream(mof) << "class Broken {\n  uint32 ;\n";
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--mof", mof});
    HostProcess host(args);
    EXPECT_EQ(host.waitExit(), 1);
    EXPECT_NE(host.output().find(mof + ":"), std::string::npos) << host.output();
    EXPECT_EQ(lineCount(host.output()), 1U) << host.output();
    std::remove(mof.c_str());
}

TEST(CimHostLifecycle, BadOptionValueExitsTwoWithOneLine) {
    HostProcess host({"--port", "seventy"}, false);
    EXPECT_EQ(host.waitExit(), 2);
    EXPECT_EQ(host.output(), "orv-cimhost: httpPort: 'seventy' is not a number from 0 to 65535\n");
}

TEST(CimHostLifecycle, UnknownConfigKeyNamesFileAndLine) {
    const std::string config = tempPath("host.cfg");
    std::ofstream(config) << "# test\nhttpPort: 0\ncolour: red\n";
    HostProcess host({"--config", config}, false);
    EXPECT_EQ(host.waitExit(), 2);
    EXPECT_EQ(host.output(), "orv-cimhost: " + config + ":3: unknown key 'colour'\n");
    std::remove(config.c_str());
}

TEST(CimHostLifecycle, ConfigFileKeysConfigureTheHost) {
    const std::string config = tempPath("serve.cfg");
    const std::string dir = sourceDir();
    std::ofstream(config) << "httpPort: 0\nproviderDirs: " << buildDir() << "/lib\nregistrationFile: " << dir
                          << "/tests/e2e/data/rawhost.reg\nmofFiles: " << dir
                          << "/tests/rawprovider/rawprovider.mof\nlogLevel: debug\nthreads: 2\n";
    HostProcess host({"--config", config}, false);
    ASSERT_TRUE(host.waitReady()) << host.output();
    enumerateOnce(host.port());
    EXPECT_EQ(host.stop(SIGTERM), 0);
    EXPECT_NE(host.output().find("debug: POST /cimom EnumerateInstanceNames -> 200"), std::string::npos)
        << host.output();
    std::remove(config.c_str());
}

}  // namespace
}  // namespace orv::e2e
