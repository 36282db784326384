#include "orv/http/http_server.hpp"

#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/post.hpp>
#include <boost/asio/steady_timer.hpp>

#include <atomic>
#include <stdexcept>
#include <vector>

#include "server_context.hpp"
#include "session.hpp"
#include "tls_context.hpp"

namespace orv::http {

namespace asio = boost::asio;
using asio::ip::tcp;

namespace {

// One listening socket, plain or TLS.
struct Listener {
    explicit Listener(asio::io_context& io, bool isTls) : acceptor(io), retry(io), tls(isTls) {}
    tcp::acceptor acceptor;
    asio::steady_timer retry;
    bool tls;
    int port = -1;
};

}  // namespace

struct HttpServer::Impl {
    detail::ServerContext context;
    Listener plain{context.io, false};
    Listener secure{context.io, true};
    std::unique_ptr<asio::ssl::context> tls;
    std::atomic<bool> running{false};

    void listen(Listener& listener, int port);
    void accept(Listener& listener);
    void admit(tcp::socket socket, bool isTls);
    void beginStop();
};

void HttpServer::Impl::accept(Listener& listener) {
    if (!listener.acceptor.is_open()) {
        return;
    }
    listener.acceptor.async_accept([this, &listener](boost::system::error_code ec, tcp::socket socket) {
        if (context.stopping || ec == asio::error::operation_aborted) {
            return;
        }
        if (ec) {
            // Out of descriptors or the like: try again a little later instead of spinning.
            listener.retry.expires_after(std::chrono::milliseconds(50));
            listener.retry.async_wait([this, &listener](boost::system::error_code waited) {
                if (!waited && !context.stopping) {
                    accept(listener);
                }
            });
            return;
        }
        admit(std::move(socket), listener.tls);
        accept(listener);
    });
}

void HttpServer::Impl::admit(tcp::socket socket, bool isTls) {
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
    if (isTls) {
        std::make_shared<detail::Session<detail::TlsStream>>(std::move(address), context, std::move(socket), *tls)
            ->start();
    } else {
        std::make_shared<detail::Session<detail::PlainStream>>(std::move(address), context, std::move(socket))
            ->start();
    }
}

void HttpServer::Impl::beginStop() {
    context.stopping = true;
    boost::system::error_code ignored;
    for (Listener* listener : {&plain, &secure}) {
        listener->acceptor.close(ignored);
        listener->retry.cancel();
    }
    const std::vector<detail::SessionBase*> sessions(context.sessions.begin(), context.sessions.end());
    for (detail::SessionBase* session : sessions) {
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

void HttpServer::Impl::listen(Listener& listener, int port) {
    const std::string where = context.options.address + ":" + std::to_string(port);
    boost::system::error_code ec;
    const asio::ip::address address = asio::ip::make_address(context.options.address, ec);
    if (ec) {
        throw std::runtime_error("cannot listen on " + where + ": not an IP address");
    }
    const tcp::endpoint endpoint(address, static_cast<unsigned short>(port));
    tcp::acceptor& acceptor = listener.acceptor;
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
    listener.port = acceptor.local_endpoint().port();
}

void HttpServer::bind() {
    const ServerOptions& options = impl_->context.options;
    if (!options.http && !options.https) {
        throw std::runtime_error("neither HTTP nor HTTPS is enabled");
    }
    if (options.https) {
        impl_->tls = detail::serverTlsContext(options.certificateFile, options.keyFile);
    }
    if (options.http) {
        impl_->listen(impl_->plain, options.port);
    }
    if (options.https) {
        impl_->listen(impl_->secure, options.httpsPort);
    }
}

int HttpServer::port() const noexcept {
    return impl_->plain.port;
}

int HttpServer::httpsPort() const noexcept {
    return impl_->secure.port;
}

void HttpServer::run() {
    const std::size_t threads = impl_->context.options.threads == 0 ? 1 : impl_->context.options.threads;
    detail::WorkerPool workers(threads);
    impl_->context.workers = &workers;
    impl_->running.store(true);
    impl_->accept(impl_->plain);
    impl_->accept(impl_->secure);
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
