// One client connection: reads requests one after the other (pipelined ones too, answered
// in order), checks the head and the login before reading the body, hands the request to
// the worker pool and writes the answer. Every read and write runs under a deadline, so a
// slow or silent client only costs a socket, never a worker.
#pragma once

#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/http/message.hpp>
#include <boost/beast/http/string_body.hpp>

#include <array>
#include <memory>
#include <optional>
#include <string>

#include "request_parser.hpp"
#include "server_context.hpp"

namespace orv::http::detail {

class Session : public std::enable_shared_from_this<Session> {
public:
    Session(boost::asio::ip::tcp::socket socket, std::string address, ServerContext& context);
    ~Session();
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    void start();
    // The server stops: a connection waiting for or reading a request head is closed; a
    // request already read is answered, and the connection closed after it.
    void stopServing();

private:
    using error_code = boost::beast::error_code;
    enum class State { Idle, Head, Body, Working, Delaying, Writing, Closing };

    void awaitRequest();
    void readHead();
    void onHead(error_code ec);
    bool loginAccepted();
    void refuseLogin();
    void readBody();
    void onBody(error_code ec);
    void work();
    void finish(Response response);
    void refuse(int status);
    void reply(Response response, bool keepAlive);
    void onWritten(error_code ec, bool keepAlive);
    void closeGracefully();
    void drain();
    bool keepAliveAfterThis() const;

    boost::beast::tcp_stream stream_;
    boost::beast::flat_buffer buffer_;
    std::string address_;
    ServerContext& context_;
    Request request_;
    std::optional<RequestParser> parser_;
    boost::beast::http::response<boost::beast::http::string_body> response_;
    boost::asio::steady_timer delay_;
    std::array<char, 4096> scratch_{};
    std::size_t drained_ = 0;
    std::size_t served_ = 0;
    State state_ = State::Idle;
};

}  // namespace orv::http::detail
