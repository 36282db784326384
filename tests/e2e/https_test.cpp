// HTTPS beside HTTP: a self-signed certificate made for the test, wbemcli over https with
// the certificate as its CA, TLS 1.1 refused by the host, HTTP switched off, a bad
// certificate file refused at start.
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <filesystem>
#include <regex>
#include <thread>

#include "host_process.hpp"

namespace orv::e2e {
namespace {

namespace fs = std::filesystem;

class HttpsTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        dir_ = new fs::path(fs::temp_directory_path() / ("orv-https-" + std::to_string(getpid())));
        fs::create_directories(*dir_);
        runCommand("openssl req -x509 -newkey rsa:2048 -nodes -keyout " + key() + " -out " + certificate() +
                   " -subj /CN=localhost -days 2 -addext subjectAltName=DNS:localhost,IP:127.0.0.1 2>&1");
    }
    static void TearDownTestSuite() {
        fs::remove_all(*dir_);
        delete dir_;
    }
    static std::string certificate() { return (*dir_ / "cert.pem").string(); }
    static std::string key() { return (*dir_ / "key.pem").string(); }

    static std::vector<std::string> httpsArgs(std::vector<std::string> more = {}) {
        auto args = rawProviderArgs();
        args.insert(args.end(), {"--enable-https", "true", "--https-port", "0", "--ssl-certificate", certificate(),
                                 "--ssl-key", key()});
        args.insert(args.end(), more.begin(), more.end());
        return args;
    }
    // The port of the "listening on ... (HTTPS, POST /cimom)" line, waiting up to 5 s for it.
    static int httpsPort(HostProcess& host) {
        static const std::regex kHttps("listening on [^ ]*:([0-9]+) \\(HTTPS");
        for (int i = 0; i < 100; ++i) {
            std::smatch match;
            const std::string& output = host.output();
            if (std::regex_search(output, match, kHttps)) {
                return std::stoi(match[1]);
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
        }
        return -1;
    }

    static fs::path* dir_;
};

fs::path* HttpsTest::dir_ = nullptr;

TEST_F(HttpsTest, WbemcliOverHttpsWithTheCertificateAsItsCaIsAnswered) {
    HostProcess host(httpsArgs());
    ASSERT_TRUE(host.waitReady()) << host.output();
    const int port = httpsPort(host);
    ASSERT_GT(port, 0) << host.output();
    const std::string out = runCommand("timeout 20 wbemcli ecn -cacert " + certificate() + " 'https://localhost:" +
                                       std::to_string(port) + "/root/cimv2'");
    EXPECT_NE(out.find("localhost:" + std::to_string(port) + "/root/cimv2:Raw_Element"), std::string::npos) << out;
    const std::string plain =
        runCommand("timeout 20 wbemcli ecn 'http://localhost:" + std::to_string(host.port()) + "/root/cimv2'");
    EXPECT_NE(plain.find("/root/cimv2:Raw_Element"), std::string::npos) << "HTTP is served beside HTTPS: " << plain;
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

TEST_F(HttpsTest, Tls11IsRefusedAndTls12Accepted) {
    HostProcess host(httpsArgs());
    ASSERT_TRUE(host.waitReady()) << host.output();
    const std::string target = "127.0.0.1:" + std::to_string(httpsPort(host));
    // The client's own configuration is left out so that it offers TLS 1.1 at all.
    const std::string old = runCommand("echo | OPENSSL_CONF=/dev/null timeout 10 openssl s_client -connect " + target +
                                       " -tls1_1 -cipher DEFAULT@SECLEVEL=0 2>&1");
    EXPECT_NE(old.find("alert protocol version"), std::string::npos) << old;
    const std::string current = runCommand("echo | timeout 10 openssl s_client -connect " + target + " -tls1_2 2>&1");
    EXPECT_NE(current.find("Protocol  : TLSv1.2"), std::string::npos) << current;
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

TEST_F(HttpsTest, HttpCanBeSwitchedOff) {
    HostProcess host(httpsArgs({"--enable-http", "false"}));
    ASSERT_TRUE(host.waitReady()) << host.output();
    EXPECT_EQ(host.output().find("(POST /cimom)"), std::string::npos) << host.output();
    const std::string out = runCommand("timeout 20 wbemcli ecn -noverify 'https://127.0.0.1:" +
                                       std::to_string(httpsPort(host)) + "/root/cimv2'");
    EXPECT_NE(out.find("/root/cimv2:Raw_Element"), std::string::npos) << out;
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

TEST_F(HttpsTest, UnreadableCertificateFailsWithOneLine) {
    auto args = rawProviderArgs();
    args.insert(args.end(), {"--enable-https", "true", "--https-port", "0", "--ssl-certificate",
                             (*dir_ / "missing.pem").string(), "--ssl-key", key()});
    HostProcess host(args);
    EXPECT_EQ(host.waitExit(), 1);
    EXPECT_NE(host.output().find("orv-cimhost: cannot start: " + (*dir_ / "missing.pem").string() +
                                 ": cannot use the certificate: "),
              std::string::npos)
        << host.output();
}

}  // namespace
}  // namespace orv::e2e
