// Delivery to an https listener: a TLS server in the test process with a certificate
// made for the test by the openssl command.
#include <httplib.h>
#include <stdlib.h>

#include <gtest/gtest.h>

#include <atomic>
#include <filesystem>
#include <mutex>
#include <thread>

#include "orv/exporter/export_message.hpp"
#include "orv/exporter/exporter.hpp"
#include "test_listener.hpp"

namespace orv::exporter {
namespace {

using namespace std::chrono_literals;

class HttpsListener {
public:
    HttpsListener() {
        char pattern[] = "/tmp/exporter-tls-XXXXXX";
        dir_ = mkdtemp(pattern);
        const std::string command = "openssl req -x509 -newkey rsa:2048 -nodes -days 1 -subj /CN=127.0.0.1"
                                    " -addext subjectAltName=IP:127.0.0.1 -keyout " + key() + " -out " + cert() +
                                    " 2>/dev/null";
        if (std::system(command.c_str()) != 0) {
            throw std::runtime_error("openssl could not make a certificate");
        }
        server_ = std::make_unique<httplib::SSLServer>(cert().c_str(), key().c_str());
        server_->Post("/.*", [this](const httplib::Request& request, httplib::Response& response) {
            const ExportRequest parsed = parseExportRequest(request.body);
            ++received_;
            response.set_header("CIMExport", "MethodResponse");
            response.set_content(buildExportResponse(parsed.messageId), "application/xml");
        });
        port_ = server_->bind_to_any_port("127.0.0.1");
        thread_ = std::thread([this] { server_->listen_after_bind(); });
        while (!server_->is_running()) {
            std::this_thread::sleep_for(1ms);
        }
    }
    ~HttpsListener() {
        server_->stop();
        thread_.join();
        std::filesystem::remove_all(dir_);
    }
    std::string url() const { return "https://127.0.0.1:" + std::to_string(port_) + "/"; }
    std::string cert() const { return dir_ + "/cert.pem"; }
    std::string key() const { return dir_ + "/key.pem"; }
    int received() const { return received_; }

private:
    std::string dir_;
    std::unique_ptr<httplib::SSLServer> server_;
    int port_ = -1;
    std::thread thread_;
    std::atomic<int> received_{0};
};

DeliveryPolicy once() {
    DeliveryPolicy policy;
    policy.retryAttempts = 0;
    return policy;
}

SubscriptionCounts settled(Exporter& exporter) {
    exporter.shutdown(10s);
    return exporter.counts("s");
}

TEST(ExporterHttps, DeliversToAnHttpsListenerWhoseCertificateVerifies) {
    HttpsListener listener;
    ExporterConfig config;
    config.caFile = listener.cert();
    Exporter exporter(config);
    exporter.submit("s", listener.url(), test::indicationXml("CIM_AlertIndication"), once());
    const SubscriptionCounts counts = settled(exporter);
    if (!tlsSupported()) {
        EXPECT_EQ(counts.dropped, 1U);  // this build refuses https destinations
        return;
    }
    EXPECT_EQ(counts.delivered, 1U);
    EXPECT_EQ(listener.received(), 1);
}

TEST(ExporterHttps, AnUntrustedCertificateIsAFailedDelivery) {
    HttpsListener listener;
    std::mutex mutex;
    std::vector<std::string> warnings;
    ExporterConfig config;
    config.log = [&](ExportLogLevel level, std::string_view line) {
        std::lock_guard lock(mutex);
        if (level == ExportLogLevel::Warning) {
            warnings.emplace_back(line);
        }
    };
    Exporter exporter(config);
    exporter.submit("s", listener.url(), test::indicationXml("CIM_AlertIndication"), once());
    const SubscriptionCounts counts = settled(exporter);
    EXPECT_EQ(counts.dropped, 1U);
    EXPECT_EQ(listener.received(), 0);
    if (tlsSupported()) {
        std::lock_guard lock(mutex);
        EXPECT_EQ(warnings, std::vector<std::string>{"cannot deliver indications to " + listener.url() +
                                                     ": the listener's certificate did not verify"});
    }
}

TEST(ExporterHttps, AcceptsAnyCertificateWhenVerificationIsOff) {
    HttpsListener listener;
    ExporterConfig config;
    config.verifyPeer = false;
    Exporter exporter(config);
    exporter.submit("s", listener.url(), test::indicationXml("CIM_AlertIndication"), once());
    EXPECT_EQ(settled(exporter).delivered, tlsSupported() ? 1U : 0U);
}

}  // namespace
}  // namespace orv::exporter
