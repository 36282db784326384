#include "response_head.hpp"

#include <boost/beast/http/status.hpp>

#include <charconv>

namespace orv::http::detail {

namespace {

void appendNumber(std::string& out, std::size_t value) {
    char digits[24];
    const auto end = std::to_chars(digits, digits + sizeof digits, value).ptr;
    out.append(digits, end);
}

void appendField(std::string& out, std::string_view name, std::string_view value) {
    out.append(name);
    out.append(": ");
    out.append(value);
    out.append("\r\n");
}

}  // namespace

std::string responseHead(unsigned version, const Response& response, bool keepAlive, std::string_view serverName) {
    const auto reason = boost::beast::http::obsolete_reason(static_cast<boost::beast::http::status>(response.status));
    std::string head;
    head.reserve(256);
    head.append(version == 10 ? "HTTP/1.0 " : "HTTP/1.1 ");
    appendNumber(head, static_cast<std::size_t>(response.status));
    head += ' ';
    head.append(reason.data(), reason.size());
    head.append("\r\n");
    if (!serverName.empty()) {
        appendField(head, "Server", serverName);
    }
    for (const auto& [name, value] : response.headers) {
        appendField(head, name, value);
    }
    if (!response.contentType.empty()) {
        appendField(head, "Content-Type", response.contentType);
    }
    if (version == 10 && keepAlive) {
        appendField(head, "Connection", "keep-alive");
    } else if (version != 10 && !keepAlive) {
        appendField(head, "Connection", "close");
    }
    head.append("Content-Length: ");
    appendNumber(head, response.body.size());
    head.append("\r\n\r\n");
    return head;
}

}  // namespace orv::http::detail
