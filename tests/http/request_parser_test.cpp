#include "request_parser.hpp"

#include <gtest/gtest.h>

#include <boost/asio/buffer.hpp>
#include <boost/beast/http/error.hpp>

namespace orv::http::detail {
namespace {

namespace beasthttp = boost::beast::http;

struct Parsed {
    Request request;
    boost::beast::error_code ec;
    bool tooManyHeaders = false;
    bool done = false;
};

// Feeds `text` to a parser with a 1 KiB head limit, 10 fields and a 100-byte body limit.
Parsed parse(const std::string& text) {
    Parsed out;
    RequestParser parser(out.request, 1024, 10, 100);
    parser.eager(true);
    parser.put(boost::asio::buffer(text), out.ec);
    out.tooManyHeaders = parser.tooManyHeaders();
    out.done = parser.is_done();
    return out;
}

TEST(RequestParser, ReadsMethodPathHeadersAndBody) {
    Parsed parsed = parse("POST /cimom?x=1 HTTP/1.1\r\nCIMMethod: GetClass\r\nContent-Length: 3\r\n\r\nabc");
    ASSERT_FALSE(parsed.ec) << parsed.ec.message();
    EXPECT_TRUE(parsed.done);
    EXPECT_EQ(parsed.request.method, "POST");
    EXPECT_EQ(parsed.request.path, "/cimom");
    ASSERT_NE(parsed.request.header("cimmethod"), nullptr);
    EXPECT_EQ(*parsed.request.header("cimmethod"), "GetClass");
    EXPECT_EQ(parsed.request.body, "abc");
}

TEST(RequestParser, ChunkedBodyIsJoined) {
    Parsed parsed = parse("POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n3\r\nabc\r\n2\r\nde\r\n0\r\n\r\n");
    ASSERT_FALSE(parsed.ec) << parsed.ec.message();
    EXPECT_EQ(parsed.request.body, "abcde");
}

TEST(RequestParser, ChunkedBodyAboveTheLimitFailsAsTheChunkArrives) {
    Parsed parsed = parse("POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n60\r\n" + std::string(96, 'a') +
                          "\r\n10\r\n");
    EXPECT_EQ(parsed.ec, beasthttp::error::body_limit);
    EXPECT_LE(parsed.request.body.size(), 100U);
}

TEST(RequestParser, ContentLengthAboveTheLimitFailsWithTheHead) {
    Parsed parsed = parse("POST / HTTP/1.1\r\nContent-Length: 101\r\n\r\n");
    EXPECT_EQ(parsed.ec, beasthttp::error::body_limit);
}

TEST(RequestParser, NegativeContentLengthIsMalformed) {
    EXPECT_EQ(parse("POST / HTTP/1.1\r\nContent-Length: -1\r\n\r\n").ec, beasthttp::error::bad_content_length);
}

TEST(RequestParser, ElevenFieldsAreTooMany) {
    std::string head = "POST / HTTP/1.1\r\n";
    for (int i = 0; i < 11; ++i) {
        head += "F" + std::to_string(i) + ": v\r\n";
    }
    Parsed parsed = parse(head + "\r\n");
    EXPECT_EQ(parsed.ec, beasthttp::error::header_limit);
    EXPECT_TRUE(parsed.tooManyHeaders);
    EXPECT_EQ(parsed.request.headers.size(), 10U);
}

TEST(RequestParser, HeadAboveTheByteLimitFails) {
    Parsed parsed = parse("POST / HTTP/1.1\r\nBig: " + std::string(2000, 'b') + "\r\n\r\n");
    EXPECT_EQ(parsed.ec, beasthttp::error::header_limit);
    EXPECT_FALSE(parsed.tooManyHeaders);
    EXPECT_TRUE(parsed.request.headers.empty());
}

}  // namespace
}  // namespace orv::http::detail
