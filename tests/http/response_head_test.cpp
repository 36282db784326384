// The head of a whole response: byte for byte what Boost.Beast writes for the same message
// (status line, field order, Connection for each version, Content-Length), for the
// answers the server gives.
#include <gtest/gtest.h>

#include <boost/beast/core/buffers_to_string.hpp>
#include <boost/beast/http/message.hpp>
#include <boost/beast/http/serializer.hpp>
#include <boost/beast/http/string_body.hpp>
#include <boost/beast/http/write.hpp>

#include <sstream>

#include "response_head.hpp"

namespace orv::http::detail {
namespace {

namespace beasthttp = boost::beast::http;

// What Beast writes for the response: head and body.
std::string beastWrites(unsigned version, const Response& response, bool keepAlive, const std::string& server) {
    beasthttp::response<beasthttp::string_body> message;
    message.version(version);
    message.result(static_cast<unsigned>(response.status));
    if (!server.empty()) {
        message.set(beasthttp::field::server, server);
    }
    for (const auto& [name, value] : response.headers) {
        message.insert(name, value);
    }
    if (!response.contentType.empty()) {
        message.set(beasthttp::field::content_type, response.contentType);
    }
    message.keep_alive(keepAlive);
    message.body() = response.body;
    message.prepare_payload();
    std::ostringstream out;
    out << message;
    return out.str();
}

Response answer(int status, std::string body, std::vector<std::pair<std::string, std::string>> headers = {},
                std::string contentType = {}) {
    Response response;
    response.status = status;
    response.body = std::move(body);
    response.headers = std::move(headers);
    response.contentType = std::move(contentType);
    return response;
}

TEST(ResponseHead, IsWhatBeastWritesForEveryKindOfAnswer) {
    const Response answers[] = {
        answer(200, "<CIM/>", {{"CIMOperation", "MethodResponse"}, {"CIMProtocolVersion", "1.0"}},
               "application/xml; charset=\"utf-8\""),
        answer(400, "", {{"CIMError", "request-not-well-formed"}}),
        answer(401, "", {{"WWW-Authenticate", "Basic realm=\"orv-cimhost\""}}),
        answer(404, ""),
        answer(405, "", {{"Allow", "POST"}}),
        answer(413, ""),
        answer(431, ""),
        answer(500, ""),
        answer(501, "", {{"CIMError", "unsupported-protocol-version"}}),
        answer(200, std::string(100000, 'x')),
    };
    for (const Response& response : answers) {
        for (const unsigned version : {10U, 11U}) {
            for (const bool keepAlive : {false, true}) {
                for (const std::string server : {"", "orv-cimhost/0.1.0"}) {
                    EXPECT_EQ(responseHead(version, response, keepAlive, server) + response.body,
                              beastWrites(version, response, keepAlive, server))
                        << response.status << " HTTP/" << version << " keep-alive " << keepAlive;
                }
            }
        }
    }
}

TEST(ResponseHead, EndsWithTheBlankLine) {
    const std::string head = responseHead(11, answer(200, "abc"), true, "");
    EXPECT_EQ(head, "HTTP/1.1 200 OK\r\nContent-Length: 3\r\n\r\n");
}

}  // namespace
}  // namespace orv::http::detail
