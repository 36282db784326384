// Reads one HTTP request (head, then body) into an orv::http::Request while the bytes
// arrive, with the limits checked before anything is stored: total head bytes, number of
// header fields and body bytes, the last for Content-Length and chunked bodies alike.
#pragma once

#include <boost/beast/http/basic_parser.hpp>

#include <cstddef>
#include <cstdint>

#include "orv/http/http_server.hpp"

namespace orv::http::detail {

class RequestParser final : public boost::beast::http::basic_parser<true> {
public:
    // Fills `request` (which must outlive the parser) as the bytes arrive.
    RequestParser(Request& request, std::size_t maxHeaderBytes, std::size_t maxHeaderCount,
                  std::size_t maxBodyBytes);

    int version() const noexcept { return version_; }
    // True when the head was refused for its number of fields.
    bool tooManyHeaders() const noexcept { return tooManyHeaders_; }

private:
    using error_code = boost::beast::error_code;
    using string_view = boost::beast::string_view;

    void on_request_impl(boost::beast::http::verb method, string_view methodText, string_view target,
                         int version, error_code& ec) override;
    void on_response_impl(int code, string_view reason, int version, error_code& ec) override;
    void on_field_impl(boost::beast::http::field name, string_view nameText, string_view value,
                       error_code& ec) override;
    void on_header_impl(error_code& ec) override;
    void on_body_init_impl(const boost::optional<std::uint64_t>& contentLength, error_code& ec) override;
    std::size_t on_body_impl(string_view body, error_code& ec) override;
    void on_chunk_header_impl(std::uint64_t size, string_view extensions, error_code& ec) override;
    std::size_t on_chunk_body_impl(std::uint64_t remain, string_view body, error_code& ec) override;
    void on_finish_impl(error_code& ec) override;

    Request& request_;
    int version_ = 11;
    std::size_t maxHeaderCount_;
    std::size_t maxBodyBytes_;
    bool tooManyHeaders_ = false;
};

}  // namespace orv::http::detail
