#include "tls_context.hpp"

#include <openssl/err.h>
#include <openssl/ssl.h>

#include <stdexcept>

namespace orv::http::detail {

namespace ssl = boost::asio::ssl;

namespace {

std::string openSslReason(const boost::system::error_code& ec) {
    const unsigned long error = ERR_get_error();
    if (error != 0) {
        const char* reason = ERR_reason_error_string(error);
        ERR_clear_error();
        if (reason != nullptr) {
            return reason;
        }
    }
    return ec.message();
}

}  // namespace

std::unique_ptr<ssl::context> serverTlsContext(const std::string& certificateFile, const std::string& keyFile) {
    if (certificateFile.empty() || keyFile.empty()) {
        throw std::runtime_error("HTTPS needs a certificate file and a key file");
    }
    auto context = std::make_unique<ssl::context>(ssl::context::tls_server);
    context->set_options(ssl::context::default_workarounds | ssl::context::no_sslv2 | ssl::context::no_sslv3 |
                         ssl::context::no_tlsv1 | ssl::context::no_tlsv1_1 | ssl::context::single_dh_use);
    SSL_CTX_set_min_proto_version(context->native_handle(), TLS1_2_VERSION);
    boost::system::error_code ec;
    context->use_certificate_chain_file(certificateFile, ec);
    if (ec) {
        throw std::runtime_error(certificateFile + ": cannot use the certificate: " + openSslReason(ec));
    }
    context->use_private_key_file(keyFile, ssl::context::pem, ec);
    if (ec) {
        throw std::runtime_error(keyFile + ": cannot use the private key: " + openSslReason(ec));
    }
    if (SSL_CTX_check_private_key(context->native_handle()) != 1) {
        ERR_clear_error();
        throw std::runtime_error(keyFile + ": the private key does not match the certificate " + certificateFile);
    }
    return context;
}

}  // namespace orv::http::detail
