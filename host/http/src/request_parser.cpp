#include "request_parser.hpp"

#include <boost/beast/http/error.hpp>

#include <algorithm>

namespace orv::http::detail {

namespace beasthttp = boost::beast::http;

RequestParser::RequestParser(Request& request, std::size_t maxHeaderBytes, std::size_t maxHeaderCount,
                             std::size_t maxBodyBytes)
    : request_(request), maxHeaderCount_(maxHeaderCount), maxBodyBytes_(maxBodyBytes) {
    header_limit(static_cast<std::uint32_t>(std::min<std::size_t>(maxHeaderBytes, UINT32_MAX)));
    body_limit(static_cast<std::uint64_t>(maxBodyBytes));
}

void RequestParser::on_request_impl(beasthttp::verb, string_view methodText, string_view target, int version,
                                    error_code&) {
    request_.method = std::string(methodText);
    const std::size_t query = target.find('?');
    request_.path = std::string(target.substr(0, query));
    version_ = version;
}

void RequestParser::on_response_impl(int, string_view, int, error_code& ec) {
    ec = beasthttp::error::bad_method;  // never called for requests
}

void RequestParser::on_field_impl(beasthttp::field, string_view nameText, string_view value, error_code& ec) {
    if (request_.headers.size() >= maxHeaderCount_) {
        tooManyHeaders_ = true;
        ec = beasthttp::error::header_limit;
        return;
    }
    request_.headers.emplace_back(std::string(nameText), std::string(value));
}

void RequestParser::on_header_impl(error_code&) {}

void RequestParser::on_body_init_impl(const boost::optional<std::uint64_t>& contentLength, error_code&) {
    // The parser has already refused a length above the body limit.
    if (contentLength) {
        request_.body.reserve(static_cast<std::size_t>(std::min<std::uint64_t>(*contentLength, maxBodyBytes_)));
    }
}

std::size_t RequestParser::on_body_impl(string_view body, error_code&) {
    request_.body.append(body.data(), body.size());
    return body.size();
}

void RequestParser::on_chunk_header_impl(std::uint64_t, string_view, error_code&) {}

std::size_t RequestParser::on_chunk_body_impl(std::uint64_t, string_view body, error_code&) {
    request_.body.append(body.data(), body.size());
    return body.size();
}

void RequestParser::on_finish_impl(error_code&) {}

}  // namespace orv::http::detail
