#include "orv/http/http_server.hpp"

#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/post.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/asio/thread_pool.hpp>
#include <strings.h>

#include <atomic>
#include <stdexcept>
#include <vector>

#include "server_context.hpp"
#include "session.hpp"

namespace orv::http {

namespace asio = boost::asio;
using asio::ip::tcp;

const std::string* Request::header(std::string_view name) const noexcept {
    for (const auto& [key, value] : headers) {
        if (key.size() == name.size() && strncasecmp(key.data(), name.data(), name.size()) == 0) {
            return &value;
        }
    }
    return nullptr;
}

struct HttpServer::Impl {
    detail::ServerContext context;
    tcp::acceptor acceptor{context.io};
    asio::steady_timer acceptRetry{context.io};
    int boundPort = -1;
    std::atomic<bool> running{false};

    void accept();
    void admit(tcp::socket socket);
    void beginStop();
};

void HttpServer::Impl::accept() {
    acceptor.async_accept([this](boost::system::error_code ec, tcp::socket socket) {
        if (context.stopping || ec == asio::error::operation_aborted) {
            return;
        }
        if (ec) {
            // Out of descriptors or the like: try again a little later instead of spinning.
            acceptRetry.expires_after(std::chrono::milliseconds(50));
            acceptRetry.async_wait([this](boost::system::error_code waited) {
                if (!waited && !context.stopping) {
                    accept();
                }
            });
            return;
        }
        admit(std::move(socket));
        accept();
    });
}

void HttpServer::Impl::admit(tcp::socket socket) {
    boost::system::error_code ec;
    const tcp::endpoint peer = socket.remote_endpoint(ec);
    if (ec) {
        return;
    }
    std::string address = peer.address().to_string();
    std::size_t& count = context.connectionsPerAddress[address];
    if (count >= context.options.maxConnectionsPerClient) {
        if (count == 0) {
            context.connectionsPerAddress.erase(address);
        }
        socket.close(ec);
        return;
    }
    ++count;
    // Responses go out as head then body; without this Nagle holds the body back.
    socket.set_option(tcp::no_delay(true), ec);
    std::make_shared<detail::Session>(std::move(socket), std::move(address), context)->start();
}

void HttpServer::Impl::beginStop() {
    context.stopping = true;
    boost::system::error_code ignored;
    acceptor.close(ignored);
    acceptRetry.cancel();
    const std::vector<detail::Session*> sessions(context.sessions.begin(), context.sessions.end());
    for (detail::Session* session : sessions) {
        session->stopServing();
    }
}

HttpServer::HttpServer(ServerOptions options, Handler handler, AccessLog accessLog, EventLog eventLog)
    : impl_(std::make_unique<Impl>()) {
    impl_->context.options = std::move(options);
    impl_->context.handler = std::move(handler);
    impl_->context.accessLog = std::move(accessLog);
    impl_->context.eventLog = std::move(eventLog);
}

HttpServer::~HttpServer() {
    stop();
}

void HttpServer::bind() {
    const ServerOptions& options = impl_->context.options;
    const std::string where = options.address + ":" + std::to_string(options.port);
    boost::system::error_code ec;
    const asio::ip::address address = asio::ip::make_address(options.address, ec);
    if (ec) {
        throw std::runtime_error("cannot listen on " + where + ": not an IP address");
    }
    const tcp::endpoint endpoint(address, static_cast<unsigned short>(options.port));
    tcp::acceptor& acceptor = impl_->acceptor;
    acceptor.open(endpoint.protocol(), ec);
    if (!ec) {
        // Only SO_REUSEADDR: a port another process listens on must make bind() fail.
        acceptor.set_option(tcp::acceptor::reuse_address(true), ec);
    }
    if (!ec) {
        acceptor.bind(endpoint, ec);
    }
    if (!ec) {
        acceptor.listen(asio::socket_base::max_listen_connections, ec);
    }
    if (ec) {
        boost::system::error_code ignored;
        acceptor.close(ignored);
        throw std::runtime_error("cannot listen on " + where + ": " + ec.message());
    }
    impl_->boundPort = acceptor.local_endpoint().port();
}

int HttpServer::port() const noexcept {
    return impl_->boundPort;
}

void HttpServer::run() {
    const std::size_t threads = impl_->context.options.threads == 0 ? 1 : impl_->context.options.threads;
    asio::thread_pool workers(threads);
    impl_->context.workers = &workers;
    impl_->running.store(true);
    impl_->accept();
    impl_->context.io.run();
    impl_->running.store(false);
    workers.join();
    impl_->context.workers = nullptr;
}

void HttpServer::stop() {
    asio::post(impl_->context.io, [impl = impl_.get()] { impl->beginStop(); });
}

bool HttpServer::running() const noexcept {
    return impl_->running.load();
}

}  // namespace orv::http
