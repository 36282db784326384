#include "http_sender.hpp"

#include <httplib.h>
#include <strings.h>

#include "orv/exporter/export_message.hpp"

namespace orv::exporter {

namespace {

std::string errorText(httplib::Error error) {
    switch (error) {
        case httplib::Error::Connection: return "cannot connect";
        case httplib::Error::Read: return "no answer (read failed or timed out)";
        case httplib::Error::Write: return "write failed";
        case httplib::Error::ConnectionTimeout: return "connection timed out";
        case httplib::Error::SSLConnection: return "TLS connection failed";
        case httplib::Error::SSLServerVerification: return "the listener's certificate did not verify";
        case httplib::Error::Canceled: return "canceled";
        default: return "HTTP error " + std::to_string(static_cast<int>(error));
    }
}

bool headerIs(const httplib::Response& response, const char* name, std::string_view expected) {
    if (!response.has_header(name)) {
        return false;
    }
    const std::string value = response.get_header_value(name);
    return value.size() == expected.size() && strncasecmp(value.data(), expected.data(), expected.size()) == 0;
}

template <typename Duration>
void setTimeouts(httplib::ClientImpl& client, Duration connect, Duration read) {
    client.set_connection_timeout(connect);
    client.set_read_timeout(read);
    client.set_write_timeout(read);
}

}  // namespace

struct HttpSender::Impl {
    std::unique_ptr<httplib::ClientImpl> client;
    std::string path;
};

HttpSender::HttpSender(const DestinationUrl& url, const SenderOptions& options) : impl_(std::make_unique<Impl>()) {
    impl_->path = url.path;
    if (url.https) {
        auto client = std::make_unique<httplib::SSLClient>(url.host, url.port);
        client->enable_server_certificate_verification(options.verifyPeer);
        if (!options.caFile.empty()) {
            client->set_ca_cert_path(options.caFile.c_str());
        }
        impl_->client = std::move(client);
    } else {
        impl_->client = std::make_unique<httplib::ClientImpl>(url.host, url.port);
    }
    impl_->client->set_keep_alive(true);
    impl_->client->set_tcp_nodelay(true);
    setTimeouts(*impl_->client, options.connectTimeout, options.readTimeout);
}

HttpSender::~HttpSender() = default;

std::optional<std::string> HttpSender::post(const std::string& body) {
    const httplib::Headers headers{
        {std::string(kExportHeader), "MethodRequest"},
        {std::string(kExportMethodHeader), std::string(kExportMethod)},
        {std::string(kProtocolVersionHeader), "1.0"},
    };
    httplib::Result result = impl_->client->Post(impl_->path.c_str(), headers, body,
                                                 std::string(kExportContentType).c_str());
    if (!result) {
        return errorText(result.error());
    }
    if (result->status != 200) {
        std::string why = "HTTP status " + std::to_string(result->status);
        if (result->has_header("CIMError")) {
            why += " (" + result->get_header_value("CIMError") + ")";
        }
        return why;
    }
    if (!headerIs(*result, "CIMExport", "MethodResponse")) {
        return std::string("the answer is not a CIM export response");
    }
    return exportResponseError(result->body);
}

void HttpSender::interrupt() {
    impl_->client->stop();
}

}  // namespace orv::exporter
