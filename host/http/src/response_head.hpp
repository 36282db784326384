// The head of a response whose whole body is known: status line, the header fields in the
// order the connection sends them (Server, the handler's own, Content-Type, Connection,
// Content-Length), then the blank line. Written straight into one string, so that the
// head and the body leave in one write without building a header table first.
#pragma once

#include <string>
#include <string_view>

#include "orv/http/http_server.hpp"

namespace orv::http::detail {

// `version` 10 or 11. Connection: "close" for HTTP/1.1 without keep-alive, "keep-alive"
// for HTTP/1.0 with it, nothing otherwise (each version's default).
std::string responseHead(unsigned version, const Response& response, bool keepAlive, std::string_view serverName);

}  // namespace orv::http::detail
