// The HTTP side of the host: a thread-pooled server with keep-alive, request size and
// time limits and optional basic authentication, handing each POST to one handler.
#pragma once

#include <chrono>
#include <cstddef>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "orv/http/credentials.hpp"

namespace orv::http {

struct ServerOptions {
    std::string address = "127.0.0.1";
    int port = 5988;                  // 0: any free port (see HttpServer::port())
    std::string path = "/cimom";      // the one path that takes requests
    std::size_t threads = 8;
    std::size_t maxRequestBytes = 4U << 20U;  // larger bodies answer 413
    std::chrono::seconds readTimeout{30};     // a client silent this long is dropped
    std::chrono::seconds writeTimeout{30};
    std::chrono::seconds keepAliveTimeout{5};
    std::size_t keepAliveMaxRequests = 100;
    std::optional<Credentials> credentials;   // basic authentication when set
    std::string realm = "orv-cimhost";
};

struct Request {
    std::string method;
    std::string path;
    std::vector<std::pair<std::string, std::string>> headers;
    std::string body;
    std::string user;  // the authenticated user, "" without authentication

    // The first header of this name (any case), or nullptr.
    const std::string* header(std::string_view name) const noexcept;
    // True when that header is present and its value, without surrounding blanks, is
    // `expected` in any case.
    bool headerIs(std::string_view name, std::string_view expected) const noexcept;
};

// A header value without the spaces and tabs around it.
std::string_view trimBlanks(std::string_view text) noexcept;

struct Response {
    int status = 200;
    std::vector<std::pair<std::string, std::string>> headers;
    std::string contentType;
    std::string body;
};

using Handler = std::function<Response(const Request&)>;
// One line per request served, when set.
using AccessLog = std::function<void(const Request&, const Response&)>;

class HttpServer {
public:
    HttpServer(ServerOptions options, Handler handler, AccessLog accessLog = {});
    ~HttpServer();
    HttpServer(const HttpServer&) = delete;
    HttpServer& operator=(const HttpServer&) = delete;

    // Opens the listening socket; throws std::runtime_error
    // ("cannot listen on 127.0.0.1:5988: Address already in use").
    void bind();
    // The port bound (the chosen one when the options asked for 0).
    int port() const noexcept;
    // Serves until stop(); returns after the requests in flight have been answered.
    void run();
    // Stops accepting connections; callable from any thread. Has no effect before
    // run() has started listening (see running()).
    void stop();
    // True while run() is listening.
    bool running() const noexcept;

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

}  // namespace orv::http
