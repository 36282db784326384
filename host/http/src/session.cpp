#include "session.hpp"

#include "response_head.hpp"

#include <boost/asio/post.hpp>
#include <boost/asio/ssl/stream_base.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/http/error.hpp>
#include <boost/beast/http/read.hpp>
#include <boost/beast/http/write.hpp>
#include <strings.h>

#include <utility>

namespace orv::http::detail {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace beasthttp = boost::beast::http;

namespace {

// Bytes of a refused request read and thrown away before the socket closes, so that the
// client reads the answer instead of a reset.
constexpr std::size_t kMaxDrainBytes = 1U << 20U;
constexpr std::chrono::seconds kDrainTime{2};
constexpr std::string_view kContinue = "HTTP/1.1 100 Continue\r\n\r\n";

bool isParseError(const beast::error_code& ec) {
    return ec.category() == beasthttp::make_error_code(beasthttp::error::bad_method).category() &&
           ec != beasthttp::error::end_of_stream && ec != beasthttp::error::partial_message;
}

bool sameText(std::string_view a, std::string_view b) {
    return a.size() == b.size() && strncasecmp(a.data(), b.data(), a.size()) == 0;
}

// The status that answers a head the parser refused.
int refusalStatus(const beast::error_code& ec, bool tooManyHeaders) {
    if (ec == beasthttp::error::body_limit) {
        return 413;
    }
    if (ec == beasthttp::error::header_limit || tooManyHeaders) {
        return 431;
    }
    return 400;
}

Response status(int code) {
    Response response;
    response.status = code;
    return response;
}

Response unauthorized(const std::string& realm) {
    Response response = status(401);
    response.headers.emplace_back("WWW-Authenticate", "Basic realm=\"" + realm + "\"");
    return response;
}

// `channel` is the request's stream: after an early answer the connection reads its next
// request into the same place, so the request's own pointer is not looked at again.
Response callHandler(const Handler& handler, const Request& request, StreamChannel* channel) {
    try {
        return handler(request);
    } catch (...) {
        if (channel != nullptr) {
            channel->abort();  // a body already begun cannot be completed
        }
        return status(500);
    }
}

}  // namespace

SessionBase::SessionBase(std::string address, ServerContext& context)
    : address_(std::move(address)), context_(context) {
    context_.sessions.insert(this);
}

SessionBase::~SessionBase() {
    context_.sessions.erase(this);
    auto count = context_.connectionsPerAddress.find(address_);
    if (count != context_.connectionsPerAddress.end() && --count->second == 0) {
        context_.connectionsPerAddress.erase(count);
    }
}

template <class Stream>
void Session<Stream>::start() {
    if constexpr (kTls) {
        setDeadline(context_.options.readTimeout);
        stream_.async_handshake(asio::ssl::stream_base::server, [self = shared_from_this()](error_code ec) {
            if (!ec) {
                self->awaitRequest();
            }
        });
    } else {
        awaitRequest();
    }
}

template <class Stream>
void Session<Stream>::stopServing() {
    if (state_ == State::Handshake || state_ == State::Idle || state_ == State::Head ||
        state_ == State::Delaying) {
        delay_.cancel();
        transport().close();
    }
}

// The connection's deadline: one timer, moved only when a deadline comes before the time
// it is armed for (about once a request: the keep-alive wait after an answer). When it
// fires it closes the connection if the deadline has passed, or waits again for the later
// one. (The stream's own timeouts arm and cancel a timer around every read and write.)
template <class Stream>
void Session<Stream>::setDeadline(std::chrono::steady_clock::duration timeout) {
    deadline_ = std::chrono::steady_clock::now() + timeout;
    if (!deadlineArmed_ || deadline_ < deadlineTimer_.expiry()) {
        armDeadline();
    }
}

template <class Stream>
void Session<Stream>::clearDeadline() {
    deadline_ = std::chrono::steady_clock::time_point::max();
}

template <class Stream>
void Session<Stream>::armDeadline() {
    deadlineArmed_ = true;
    deadlineTimer_.expires_at(deadline_);
    deadlineTimer_.async_wait([weak = this->weak_from_this()](error_code ec) {
        auto self = weak.lock();
        if (!self || ec) {
            return;  // the connection is gone, or the timer was moved
        }
        self->deadlineArmed_ = false;
        if (self->deadline_ == std::chrono::steady_clock::time_point::max()) {
            return;  // nothing to wait for now; the next deadline arms the timer again
        }
        if (std::chrono::steady_clock::now() < self->deadline_) {
            self->armDeadline();
            return;
        }
        self->transport().close();  // what was waiting ends with an error
    });
}

template <class Stream>
bool Session<Stream>::keepAliveAfterThis() const {
    return parser_ && parser_->is_done() && parser_->keep_alive() && !context_.stopping &&
           served_ + 1 < context_.options.keepAliveMaxRequests;
}

template <class Stream>
void Session<Stream>::awaitRequest() {
    state_ = State::Idle;
    request_ = Request{};
    parser_.emplace(request_, context_.options.maxHeaderBytes, context_.options.maxHeaderCount,
                    context_.options.maxRequestBytes);
    if (served_ == 0 || buffer_.size() > 0) {
        readHead();
        return;
    }
    // Between requests a connection may stay silent for the keep-alive time only.
    setDeadline(context_.options.keepAliveTimeout);
    stream_.async_read_some(buffer_.prepare(4096), [self = shared_from_this()](error_code ec, std::size_t n) {
        if (ec) {
            return;  // closed, timed out or the server stopped
        }
        self->buffer_.commit(n);
        self->readHead();
    });
}

template <class Stream>
void Session<Stream>::readHead() {
    state_ = State::Head;
    // One deadline for the whole head, however slowly its bytes arrive.
    setDeadline(context_.options.readTimeout);
    beasthttp::async_read_header(stream_, buffer_, *parser_,
                                 [self = shared_from_this()](error_code ec, std::size_t) { self->onHead(ec); });
}

template <class Stream>
void Session<Stream>::onHead(error_code ec) {
    if (ec) {
        if (isParseError(ec)) {
            refuse(refusalStatus(ec, parser_->tooManyHeaders()));
        }
        return;  // the client left, the deadline passed or the server stopped
    }
    if (!context_.options.path.empty() && request_.path != context_.options.path) {
        refuse(404);
        return;
    }
    if (request_.method != "POST") {
        Response response = status(405);
        response.headers.emplace_back("Allow", "POST");
        reply(std::move(response), keepAliveAfterThis());
        return;
    }
    checkLogin();
}

// Decided from the head alone, before any of the body is read: the credentials list on
// this thread, the system's accounts on a worker.
template <class Stream>
void Session<Stream>::checkLogin() {
    const ServerOptions& options = context_.options;
    if (!options.credentials && !options.pam) {
        acceptBody();
        return;
    }
    const std::string* authorization = request_.header("Authorization");
    if (authorization == nullptr) {
        challenge();  // the first step of the challenge, not a failed login
        return;
    }
    auto claimed = basicAuthorization(*authorization);
    if (!claimed) {
        loginFailed(std::string());
        return;
    }
    if (options.credentials && options.credentials->check(claimed->first, claimed->second)) {
        loginSucceeded(std::move(claimed->first));
        return;
    }
    if (options.pam) {
        checkSystemLogin(std::move(claimed->first), std::move(claimed->second));
        return;
    }
    loginFailed(claimed->first);
}

// At most half the workers check logins at a time (the password hash of pam_unix costs
// milliseconds of processor), so guessed passwords cannot keep the CIM requests from the
// workers; the checks beyond wait, in order, without holding a worker.
template <class Stream>
void Session<Stream>::checkSystemLogin(std::string user, std::string password) {
    state_ = State::LoginCheck;
    clearDeadline();
    auto check = [self = shared_from_this(), user = std::move(user), password = std::move(password)]() mutable {
        self->context_.workers->post([self, guard = asio::make_work_guard(self->context_.io),
                                      user = std::move(user), password = std::move(password)]() mutable {
            const bool accepted = self->context_.options.pam->check(user, password);
            asio::io_context& io = self->context_.io;
            asio::post(io, [self = std::move(self), guard = std::move(guard), user = std::move(user),
                            accepted]() mutable { self->onSystemLogin(user, accepted); });
        });
    };
    if (context_.loginChecksRunning < context_.loginCheckLimit()) {
        ++context_.loginChecksRunning;
        check();
    } else {
        context_.loginChecksWaiting.emplace_back(std::move(check));
    }
}

template <class Stream>
void Session<Stream>::onSystemLogin(std::string& user, bool accepted) {
    if (context_.loginChecksWaiting.empty()) {
        --context_.loginChecksRunning;
    } else {
        auto next = std::move(context_.loginChecksWaiting.front());
        context_.loginChecksWaiting.pop_front();
        next();
    }
    if (context_.stopping) {
        transport().close();  // the body was never read: nothing to answer
    } else if (accepted) {
        loginSucceeded(std::move(user));
    } else {
        loginFailed(user);
    }
}

template <class Stream>
void Session<Stream>::loginSucceeded(std::string user) {
    context_.logins.succeeded(address_);
    request_.user = std::move(user);
    acceptBody();
}

template <class Stream>
void Session<Stream>::challenge() {
    reply(unauthorized(context_.options.realm), keepAliveAfterThis());
}

template <class Stream>
void Session<Stream>::loginFailed(const std::string& claimedUser) {
    auto verdict = context_.logins.failed(address_, claimedUser, LoginThrottle::Clock::now());
    if (verdict.logLine) {
        context_.event(*verdict.logLine);
    }
    if (verdict.delay.count() == 0) {
        challenge();
        return;
    }
    answerLater(unauthorized(context_.options.realm), verdict.delay);
}

// The delay holds this connection only; the I/O thread goes on serving the others.
template <class Stream>
void Session<Stream>::answerLater(Response response, std::chrono::milliseconds delay) {
    state_ = State::Delaying;
    delay_.expires_after(delay);
    delay_.async_wait([self = shared_from_this(), response = std::move(response)](error_code ec) mutable {
        if (!ec) {
            const bool keepAlive = self->keepAliveAfterThis();
            self->reply(std::move(response), keepAlive);
        }
    });
}

template <class Stream>
void Session<Stream>::acceptBody() {
    const std::string* expect = request_.header("Expect");
    if (expect != nullptr && sameText(*expect, "100-continue") && !parser_->is_done()) {
        setDeadline(context_.options.writeTimeout);
        asio::async_write(stream_, asio::buffer(kContinue.data(), kContinue.size()),
                          [self = shared_from_this()](error_code written, std::size_t) {
                              if (!written) {
                                  self->readBody();
                              }
                          });
        return;
    }
    readBody();
}

template <class Stream>
void Session<Stream>::readBody() {
    state_ = State::Body;
    setDeadline(context_.options.readTimeout);
    beasthttp::async_read(stream_, buffer_, *parser_,
                          [self = shared_from_this()](error_code ec, std::size_t) { self->onBody(ec); });
}

template <class Stream>
void Session<Stream>::onBody(error_code ec) {
    if (ec) {
        if (isParseError(ec)) {
            refuse(refusalStatus(ec, false));
        }
        return;
    }
    work();
}

template <class Stream>
void Session<Stream>::work() {
    state_ = State::Working;
    clearDeadline();
    std::shared_ptr<StreamChannel> channel = parser_->version() == 11 ? openStream() : nullptr;
    request_.stream = channel.get();
    // The worker reads request_ while this connection waits; nothing else touches it (until
    // an early answer, after which the handler no longer reads it).
    context_.workers->post([self = shared_from_this(), channel = std::move(channel),
                            guard = asio::make_work_guard(context_.io)]() mutable {
        if (channel) {
            channel->runOn(*self->context_.workers, WorkerPool::current());
        }
        Response response = callHandler(self->context_.handler, self->request_, channel.get());
        if (channel && !channel->settle()) {
            return;  // answered early: what the handler returned is dropped
        }
        asio::io_context& io = self->context_.io;
        if (channel && channel->begun()) {
            // The I/O thread writes what is left and the last chunk; this post keeps the
            // connection alive until then (the channel's own wakes do not own it).
            channel->end();
            asio::post(io, [self = std::move(self), guard = std::move(guard)] { self->pumpStream(); });
            return;
        }
        // The session goes back to the I/O thread with the answer; it is never released here.
        asio::post(io, [self = std::move(self), guard = std::move(guard), response = std::move(response)]() mutable {
            self->finish(std::move(response));
        });
    });
}

template <class Stream>
void Session<Stream>::finish(Response response) {
    channel_.reset();  // the handler answered without streaming
    reply(std::move(response), keepAliveAfterThis());
}

template <class Stream>
void Session<Stream>::refuse(int code) {
    reply(status(code), false);
}

template <class Stream>
void Session<Stream>::countServed(const Response& response) {
    ++served_;
    if (context_.accessLog) {
        context_.accessLog(request_, response);
    }
}

template <class Stream>
template <class Message>
void Session<Stream>::prepareHead(Message& message, Response& response, bool keepAlive) {
    countServed(response);
    // Named, not "= {}": clang 14 leaves the destructor of a temporary made from an empty
    // braced list undefined inside an explicitly instantiated template (a link error).
    message = Message{};
    message.version(parser_ && parser_->version() == 10 ? 10 : 11);
    message.result(static_cast<unsigned>(response.status));
    if (!context_.options.serverName.empty()) {
        message.set(beasthttp::field::server, context_.options.serverName);
    }
    for (auto& [name, value] : response.headers) {
        message.insert(name, value);
    }
    if (!response.contentType.empty()) {
        message.set(beasthttp::field::content_type, response.contentType);
    }
    message.keep_alive(keepAlive);
}

// Head and body leave in one write.
template <class Stream>
void Session<Stream>::reply(Response response, bool keepAlive) {
    countServed(response);
    const unsigned version = parser_ && parser_->version() == 10 ? 10 : 11;
    responseHead_ = responseHead(version, response, keepAlive, context_.options.serverName);
    responseBody_ = std::move(response.body);
    state_ = State::Writing;
    setDeadline(context_.options.writeTimeout);
    const std::array<asio::const_buffer, 2> pieces{asio::buffer(responseHead_), asio::buffer(responseBody_)};
    asio::async_write(stream_, pieces, [self = shared_from_this(), keepAlive](error_code ec, std::size_t) {
        self->onWritten(ec, keepAlive);
    });
}

template <class Stream>
std::shared_ptr<StreamChannel> Session<Stream>::openStream() {
    // The producer's changes come back to the I/O thread; a wake that arrives after this
    // body ended (or the connection went) finds another channel or none and does nothing.
    std::weak_ptr<Session> weak = shared_from_this();
    channel_ = std::make_shared<StreamChannel>(
        context_.options.streamBufferBytes, [weak, &io = context_.io] {
            asio::post(io, [weak] {
                if (auto self = weak.lock()) {
                    self->pumpStream();
                }
            });
        });
    return channel_;
}

template <class Stream>
void Session<Stream>::pumpStream() {
    if (!channel_ || chunkInFlight_) {
        return;  // no body streamed now, or the write in flight pumps again when done
    }
    StreamChannel::Batch batch = channel_->take();
    if (batch.whole) {
        finish(std::move(*batch.whole));  // answered early, while the handler goes on
        return;
    }
    if (batch.aborted) {
        streamFailed();
        return;
    }
    if (batch.head) {
        startStream(std::move(*batch.head), std::move(batch.data), batch.last);
        return;
    }
    writeChunk(std::move(batch.data), batch.last);
}

template <class Stream>
void Session<Stream>::startStream(Response head, std::string data, bool last) {
    streamKeepAlive_ = keepAliveAfterThis();
    prepareHead(streamHead_, head, streamKeepAlive_);
    streamHead_.chunked(true);
    headWriter_.emplace(streamHead_);
    state_ = State::Writing;
    chunkInFlight_ = true;
    setDeadline(context_.options.writeTimeout);
    beasthttp::async_write_header(stream_, *headWriter_,
                                  [self = shared_from_this(), data = std::move(data), last](error_code ec,
                                                                                           std::size_t) mutable {
                                      self->chunkInFlight_ = false;
                                      if (ec) {
                                          self->streamFailed();
                                          return;
                                      }
                                      self->writeChunk(std::move(data), last);
                                  });
}

template <class Stream>
void Session<Stream>::writeChunk(std::string data, bool last) {
    if (data.empty()) {
        if (last) {
            writeLastChunk();
        }
        return;  // nothing yet: the producer's next piece wakes the pump
    }
    chunk_ = std::move(data);
    chunkInFlight_ = true;
    setDeadline(context_.options.writeTimeout);
    asio::async_write(stream_, beasthttp::make_chunk(asio::buffer(chunk_)),
                      [self = shared_from_this(), last](error_code ec, std::size_t) {
                          self->chunkInFlight_ = false;
                          self->chunk_.clear();
                          if (ec) {
                              self->streamFailed();
                          } else if (last) {
                              self->writeLastChunk();
                          } else {
                              self->pumpStream();
                          }
                      });
}

template <class Stream>
void Session<Stream>::writeLastChunk() {
    chunkInFlight_ = true;
    setDeadline(context_.options.writeTimeout);
    asio::async_write(stream_, beasthttp::make_chunk_last(), [self = shared_from_this()](error_code ec, std::size_t) {
        self->chunkInFlight_ = false;
        self->channel_.reset();
        self->headWriter_.reset();
        self->onWritten(ec, self->streamKeepAlive_);
    });
}

// The client is gone or the body cannot be completed: the connection closes without the
// last chunk, and the producer's further writes fail.
template <class Stream>
void Session<Stream>::streamFailed() {
    if (channel_) {
        channel_->close();
        channel_.reset();
    }
    headWriter_.reset();
    state_ = State::Closing;
    transport().close();
}

template <class Stream>
void Session<Stream>::onWritten(error_code ec, bool keepAlive) {
    if (ec) {
        return;
    }
    if (keepAlive && !context_.stopping) {
        awaitRequest();
        return;
    }
    closeGracefully();
}

template <class Stream>
void Session<Stream>::closeGracefully() {
    state_ = State::Closing;
    setDeadline(kDrainTime);
    if constexpr (kTls) {
        stream_.async_shutdown([self = shared_from_this()](error_code) { self->transport().close(); });
    } else {
        error_code ignored;
        stream_.socket().shutdown(asio::ip::tcp::socket::shutdown_send, ignored);
        drain();
    }
}

template <class Stream>
void Session<Stream>::drain() {
    stream_.async_read_some(asio::buffer(scratch_), [self = shared_from_this()](error_code ec, std::size_t n) {
        self->drained_ += n;
        if (ec || self->drained_ > kMaxDrainBytes) {
            self->transport().close();
            return;
        }
        self->drain();
    });
}

template class Session<PlainStream>;
template class Session<TlsStream>;

}  // namespace orv::http::detail
