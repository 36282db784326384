// One client connection, plain or TLS: reads requests one after the other (pipelined ones
// too, answered in order), checks the head and the login before reading the body, hands the
// request to the worker pool and writes the answer. Every read and write runs under a
// deadline, so a slow or silent client only costs a socket, never a worker.
#pragma once

#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/http/empty_body.hpp>
#include <boost/beast/http/message.hpp>
#include <boost/beast/http/serializer.hpp>
#include <boost/beast/ssl/ssl_stream.hpp>

#include <array>
#include <chrono>
#include <memory>
#include <optional>
#include <string>
#include <type_traits>

#include "request_parser.hpp"
#include "server_context.hpp"
#include "stream_channel.hpp"

namespace orv::http::detail {

// What the server knows of every connection: it is counted for its client address and
// listed for stop().
class SessionBase {
public:
    SessionBase(std::string address, ServerContext& context);
    virtual ~SessionBase();
    SessionBase(const SessionBase&) = delete;
    SessionBase& operator=(const SessionBase&) = delete;

    // The server stops: a connection waiting for or reading a request head is closed; a
    // request already read is answered, and the connection closed after it.
    virtual void stopServing() = 0;

protected:
    std::string address_;
    ServerContext& context_;
};

using PlainStream = boost::beast::tcp_stream;
using TlsStream = boost::beast::ssl_stream<boost::beast::tcp_stream>;

template <class Stream>
class Session final : public SessionBase, public std::enable_shared_from_this<Session<Stream>> {
public:
    template <class... StreamArgs>
    Session(std::string address, ServerContext& context, StreamArgs&&... streamArgs)
        : SessionBase(std::move(address), context),
          stream_(std::forward<StreamArgs>(streamArgs)...),
          buffer_(context.options.maxHeaderBytes + 65536),
          delay_(context.io),
          deadlineTimer_(context.io) {}

    void start();
    void stopServing() override;

private:
    using error_code = boost::beast::error_code;
    using std::enable_shared_from_this<Session<Stream>>::shared_from_this;
    enum class State { Handshake, Idle, Head, LoginCheck, Body, Working, Delaying, Writing, Closing };
    static constexpr bool kTls = std::is_same_v<Stream, TlsStream>;

    boost::beast::tcp_stream& transport() { return boost::beast::get_lowest_layer(stream_); }
    void setDeadline(std::chrono::steady_clock::duration timeout);
    void clearDeadline();
    void armDeadline();

    void awaitRequest();
    void readHead();
    void onHead(error_code ec);
    void checkLogin();
    void checkSystemLogin(std::string user, std::string password);
    void onSystemLogin(std::string& user, bool accepted);
    void loginSucceeded(std::string user);
    void loginFailed(const std::string& claimedUser);
    void challenge();
    void answerLater(Response response, std::chrono::milliseconds delay);
    void acceptBody();
    void readBody();
    void onBody(error_code ec);
    void work();
    void finish(Response response);
    void refuse(int status);
    void countServed(const Response& response);
    template <class Message>
    void prepareHead(Message& message, Response& response, bool keepAlive);
    void reply(Response response, bool keepAlive);
    // A streamed body: the head, then one chunk per batch the handler's pieces make.
    std::shared_ptr<StreamChannel> openStream();
    void pumpStream();
    void startStream(Response head, std::string data, bool last);
    void writeChunk(std::string data, bool last);
    void writeLastChunk();
    void streamFailed();
    void onWritten(error_code ec, bool keepAlive);
    void closeGracefully();
    void drain();
    bool keepAliveAfterThis() const;

    Stream stream_;
    boost::beast::flat_buffer buffer_;
    Request request_;
    std::optional<RequestParser> parser_;
    std::string responseHead_;  // the whole answer being written: head, then body
    std::string responseBody_;
    std::shared_ptr<StreamChannel> channel_;  // the streamed body in progress, if any
    boost::beast::http::response<boost::beast::http::empty_body> streamHead_;
    std::optional<boost::beast::http::response_serializer<boost::beast::http::empty_body>> headWriter_;
    std::string chunk_;
    bool chunkInFlight_ = false;
    bool streamKeepAlive_ = false;
    boost::asio::steady_timer delay_;
    boost::asio::steady_timer deadlineTimer_;
    std::chrono::steady_clock::time_point deadline_ = std::chrono::steady_clock::time_point::max();
    bool deadlineArmed_ = false;
    std::array<char, 4096> scratch_{};
    std::size_t drained_ = 0;
    std::size_t served_ = 0;
    State state_ = State::Handshake;
};

// session.cpp holds the members and instantiates both kinds of connection.

}  // namespace orv::http::detail
