#include "orv/http/http_server.hpp"

#include <httplib.h>
#include <strings.h>
#include <sys/socket.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>

namespace orv::http {

const std::string* Request::header(std::string_view name) const noexcept {
    for (const auto& [key, value] : headers) {
        if (key.size() == name.size() && strncasecmp(key.data(), name.data(), name.size()) == 0) {
            return &value;
        }
    }
    return nullptr;
}

bool Request::headerIs(std::string_view name, std::string_view expected) const noexcept {
    const std::string* value = header(name);
    if (value == nullptr) {
        return false;
    }
    const std::string_view text = trimBlanks(*value);
    return text.size() == expected.size() && strncasecmp(text.data(), expected.data(), text.size()) == 0;
}

std::string_view trimBlanks(std::string_view text) noexcept {
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) {
        text.remove_prefix(1);
    }
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t')) {
        text.remove_suffix(1);
    }
    return text;
}

struct HttpServer::Impl {
    ServerOptions options;
    Handler handler;
    AccessLog accessLog;
    httplib::Server server;
    int boundPort = -1;

    void serve(const httplib::Request& in, httplib::Response& out) const;
    static void fill(const Response& response, httplib::Response& out);
    Response unauthorized() const;
    void configure();
};

namespace {

Request convert(const httplib::Request& in) {
    Request request;
    request.method = in.method;
    request.path = in.path;
    request.body = in.body;
    for (const auto& [key, value] : in.headers) {
        request.headers.emplace_back(key, value);
    }
    return request;
}

// Only SO_REUSEADDR: a port another process listens on must make bind() fail.
void listeningSocketOptions(socket_t sock) {
    int yes = 1;
    setsockopt(sock, SOL_SOCKET, SO_REUSEADDR, &yes, sizeof yes);
}

}  // namespace

void HttpServer::Impl::fill(const Response& response, httplib::Response& out) {
    out.status = response.status;
    for (const auto& [key, value] : response.headers) {
        out.set_header(key, value);
    }
    if (!response.contentType.empty() || !response.body.empty()) {
        out.set_content(response.body, response.contentType.c_str());
    }
}

Response HttpServer::Impl::unauthorized() const {
    Response response;
    response.status = 401;
    response.headers.emplace_back("WWW-Authenticate", "Basic realm=\"" + options.realm + "\"");
    return response;
}

void HttpServer::Impl::serve(const httplib::Request& in, httplib::Response& out) const {
    Request request = convert(in);
    Response response;
    if (options.credentials) {
        const std::string* authorization = request.header("Authorization");
        std::optional<std::string> user =
            authorization == nullptr ? std::nullopt : options.credentials->authenticate(*authorization);
        if (!user) {
            response = unauthorized();
            fill(response, out);
            if (accessLog) {
                accessLog(request, response);
            }
            return;
        }
        request.user = *user;
    }
    response = handler(request);
    fill(response, out);
    if (accessLog) {
        accessLog(request, response);
    }
}

void HttpServer::Impl::configure() {
    const std::size_t threads = options.threads == 0 ? 1 : options.threads;
    server.new_task_queue = [threads] { return new httplib::ThreadPool(threads); };
    server.set_socket_options(listeningSocketOptions);
    // Responses go out as headers then body; without this Nagle holds the body back.
    server.set_tcp_nodelay(true);
    server.set_payload_max_length(options.maxRequestBytes);
    server.set_read_timeout(options.readTimeout);
    server.set_write_timeout(options.writeTimeout);
    server.set_keep_alive_timeout(static_cast<time_t>(options.keepAliveTimeout.count()));
    server.set_keep_alive_max_count(options.keepAliveMaxRequests);
    server.Post(options.path, [this](const httplib::Request& in, httplib::Response& out) { serve(in, out); });
    auto notAllowed = [](const httplib::Request&, httplib::Response& out) {
        out.status = 405;
        out.set_header("Allow", "POST");
    };
    server.Get(options.path, notAllowed);
    server.Put(options.path, notAllowed);
    server.Delete(options.path, notAllowed);
    server.Patch(options.path, notAllowed);
    server.Options(options.path, notAllowed);
    server.set_exception_handler([](const httplib::Request&, httplib::Response& out, std::exception_ptr) {
        out.status = 500;
    });
}

HttpServer::HttpServer(ServerOptions options, Handler handler, AccessLog accessLog)
    : impl_(std::make_unique<Impl>()) {
    impl_->options = std::move(options);
    impl_->handler = std::move(handler);
    impl_->accessLog = std::move(accessLog);
    impl_->configure();
}

HttpServer::~HttpServer() {
    stop();
}

void HttpServer::bind() {
    const ServerOptions& options = impl_->options;
    errno = 0;
    if (options.port == 0) {
        impl_->boundPort = impl_->server.bind_to_any_port(options.address);
    } else if (impl_->server.bind_to_port(options.address, options.port)) {
        impl_->boundPort = options.port;
    }
    if (impl_->boundPort < 0) {
        const int error = errno;
        throw std::runtime_error("cannot listen on " + options.address + ":" +
                                 std::to_string(options.port) + ": " +
                                 (error != 0 ? std::strerror(error) : "address not usable"));
    }
}

int HttpServer::port() const noexcept {
    return impl_->boundPort;
}

void HttpServer::run() {
    impl_->server.listen_after_bind();
}

void HttpServer::stop() {
    impl_->server.stop();
}

bool HttpServer::running() const noexcept {
    return impl_->server.is_running();
}

}  // namespace orv::http
