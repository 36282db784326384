// The TLS side of the server: TLS 1.2 and later only, with the certificate chain and the
// private key read from PEM files.
#pragma once

#include <boost/asio/ssl/context.hpp>

#include <memory>
#include <string>

namespace orv::http::detail {

// Throws std::runtime_error naming the file that cannot be used and why.
std::unique_ptr<boost::asio::ssl::context> serverTlsContext(const std::string& certificateFile,
                                                            const std::string& keyFile);

}  // namespace orv::http::detail
