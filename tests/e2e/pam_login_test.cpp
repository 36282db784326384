// Basic authentication against the system's accounts through PAM: a throwaway account made
// with useradd and a service of pam_unix written into /etc/pam.d for the suite, both removed
// afterwards. Creating them needs root; as any other user the suite is skipped.
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <thread>
#include <vector>

#include "host_process.hpp"
#include "raw_connection.hpp"

namespace orv::e2e {
namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

const std::string kAccount = "orvpam" + std::to_string(getpid());
const std::string kPassword = "Pam-Test-9!";
const std::string kService = "orv-cimhost-test-" + std::to_string(getpid());

// useradd and userdel take a lock on /etc/passwd that another process may hold for a moment.
bool runWithRetries(const std::string& command) {
    for (int attempt = 0; attempt < 20; ++attempt) {
        if (std::system((command + " >/dev/null 2>&1").c_str()) == 0) {
            return true;
        }
        std::this_thread::sleep_for(250ms);
    }
    return false;
}

bool createAccount() {
    return runWithRetries("useradd --no-create-home --shell /usr/sbin/nologin " + kAccount) &&
           runWithRetries("echo '" + kAccount + ":" + kPassword + "' | chpasswd");
}

class PamLoginTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        startHostWithService(kService, "auth required pam_unix.so\naccount required pam_unix.so\n");
    }
    static void TearDownTestSuite() { stopHostAndRemoveService(kService); }

    // Writes the PAM service, makes the account and starts a host checking logins with both
    // the service and the credentials file (either one lets a client in); as root only.
    static void startHostWithService(const std::string& service, const std::string& text) {
        if (geteuid() != 0) {
            return;
        }
        std::ofstream("/etc/pam.d/" + service) << text;
        ASSERT_TRUE(createAccount());
        auto args = rawProviderArgs();
        args.insert(args.end(), {"--pam-service", service, "--credentials",
                                 sourceDir() + "/tests/e2e/data/credentials", "--threads", "2"});
        host_ = new HostProcess(args);
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void stopHostAndRemoveService(const std::string& service) {
        if (host_ != nullptr) {
            EXPECT_EQ(host_->stop(SIGTERM), 0);
            delete host_;
            host_ = nullptr;
        }
        if (geteuid() == 0) {
            runWithRetries("userdel " + kAccount);
            std::error_code ignored;
            std::filesystem::remove("/etc/pam.d/" + service, ignored);
        }
    }
    void SetUp() override {
        if (geteuid() != 0) {
            GTEST_SKIP() << "creating a system account and a PAM service needs root; run the suite as root";
        }
        ASSERT_NE(host_, nullptr);
    }

    static std::optional<RawResponse> login(const std::string& user, const std::string& password,
                                            const std::string& source = "127.0.0.1") {
        RawConnection client(host_->port(), source);
        client.send(cimPost(enumerateClassNamesBody(), "EnumerateClassNames", basicAuthorizationLine(user, password)));
        return client.readResponse(10000ms);
    }

    // How long a wrong password of the test account took to be answered (401 expected).
    static Clock::duration timedWrongLogin(const std::string& source) {
        const Clock::time_point start = Clock::now();
        auto response = login(kAccount, "wrong", source);
        EXPECT_TRUE(response && response->status == 401);
        return Clock::now() - start;
    }

    static HostProcess* host_;
};

HostProcess* PamLoginTest::host_ = nullptr;

TEST_F(PamLoginTest, SystemAccountWithTheRightPasswordIsAnswered200) {
    auto response = login(kAccount, kPassword);
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 200);
    EXPECT_NE(response->body.find("<IMETHODRESPONSE NAME=\"EnumerateClassNames\""), std::string::npos);
}

TEST_F(PamLoginTest, SystemAccountWithAWrongPasswordIsAnswered401) {
    auto response = login(kAccount, "wrong", "127.0.0.21");
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 401);
    EXPECT_EQ(response->headers["www-authenticate"], "Basic realm=\"orv-cimhost\"");
}

TEST_F(PamLoginTest, UnknownUserIsAnswered401) {
    auto response = login("orvnosuchuser", kPassword, "127.0.0.22");
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 401);
}

TEST_F(PamLoginTest, UserOfTheCredentialsFileIsStillAccepted) {
    auto response = login("user", "secret");
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 200);
}

TEST_F(PamLoginTest, WrongSystemPasswordIsAnsweredWithoutTheModulesOwnDelay) {
    // pam_unix asks for two seconds after a failure; the host's own delay per address
    // replaces it, and the first failures of an address are not delayed.
    EXPECT_LT(timedWrongLogin("127.0.0.23"), 1500ms);
}

TEST_F(PamLoginTest, FailedSystemLoginIsLoggedWithTheClientAddress) {
    ASSERT_TRUE(login(kAccount, "wrong", "127.0.0.24"));
    std::this_thread::sleep_for(100ms);
    EXPECT_NE(host_->output().find("orv-cimhost: warning: failed login from 127.0.0.24 as user \"" + kAccount +
                                   "\"\n"),
              std::string::npos)
        << host_->output();
}

TEST_F(PamLoginTest, RepeatedFailedSystemLoginsAreDelayed) {
    for (int i = 0; i < 5; ++i) {
        ASSERT_TRUE(login(kAccount, "wrong", "127.0.0.25"));
    }
    // The sixth failure in a row waits 400 ms before its 401.
    EXPECT_GE(timedWrongLogin("127.0.0.25"), 350ms);
}

// A service whose auth step takes two seconds (pam_exec running sleep) before pam_unix.
class SlowPamLoginTest : public PamLoginTest {
protected:
    static void SetUpTestSuite() {
        startHostWithService(kSlowService, "auth requisite pam_exec.so quiet /bin/sleep 2\n"
                                           "auth required pam_unix.so\naccount required pam_unix.so\n");
    }
    static void TearDownTestSuite() { stopHostAndRemoveService(kSlowService); }

    static inline const std::string kSlowService = kService + "-slow";
};

TEST_F(SlowPamLoginTest, SlowSystemLoginsLeaveWorkersToOtherRequests) {
    // Three slow checks at once on a host of two workers: one check runs at a time, so a
    // user of the credentials file is still served at once.
    std::vector<std::thread> guessers;
    for (int i = 0; i < 3; ++i) {
        guessers.emplace_back([i] { login("orvnosuchuser", "x", "127.0.0." + std::to_string(31 + i)); });
    }
    std::this_thread::sleep_for(300ms);
    const Clock::time_point start = Clock::now();
    auto response = login("user", "secret");
    const Clock::duration took = Clock::now() - start;
    for (auto& guesser : guessers) {
        guesser.join();
    }
    ASSERT_TRUE(response);
    EXPECT_EQ(response->status, 200);
    EXPECT_LT(took, 1000ms);
}

TEST_F(SlowPamLoginTest, WaitingSystemLoginsAreAllAnswered) {
    std::vector<std::thread> logins;
    std::atomic<int> answered{0};
    for (int i = 0; i < 3; ++i) {
        logins.emplace_back([&, i] {
            auto response = login(i == 0 ? kAccount : "orvnosuchuser", i == 0 ? kPassword : "x",
                                  "127.0.0." + std::to_string(41 + i));
            if (response && response->status == (i == 0 ? 200 : 401)) {
                ++answered;
            }
        });
    }
    for (auto& thread : logins) {
        thread.join();
    }
    EXPECT_EQ(answered.load(), 3);
}

TEST(PamLoginStart, ServiceWithoutAFileStopsTheStartWithOneLine) {
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--pam-service", "orv-no-such-service"});
    HostProcess host(args);
    EXPECT_EQ(host.waitExit(), 1);
    EXPECT_EQ(host.output(), "orv-cimhost: cannot start: PAM service 'orv-no-such-service' has no file in /etc/pam.d\n");
}

}  // namespace
}  // namespace orv::e2e
