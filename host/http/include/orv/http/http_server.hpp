// The HTTP side of the host: an event-driven server (one I/O thread for every connection,
// a pool of workers for the handler) with keep-alive, pipelining, request size and time
// limits, per-address connection limits and optional basic authentication, handing each
// POST to one handler.
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
#include "orv/http/pam_authentication.hpp"

namespace orv::http {

struct ServerOptions {
    std::string address = "127.0.0.1";
    bool http = true;                 // serve plain HTTP on `port`
    int port = 5988;                  // 0: any free port (see HttpServer::port())
    bool https = false;               // serve HTTPS (TLS 1.2 and later) on `httpsPort`
    int httpsPort = 5989;             // 0: any free port (see HttpServer::httpsPort())
    std::string certificateFile;      // PEM certificate chain of the HTTPS side
    std::string keyFile;              // PEM private key of that certificate
    std::string path = "/cimom";      // the one path that takes requests; empty: any path
    std::size_t threads = 8;                  // workers running the handler
    std::size_t maxRequestBytes = 4U << 20U;  // larger bodies answer 413, chunked ones too
    std::size_t maxHeaderBytes = 16U << 10U;  // a larger request head answers 431
    std::size_t maxHeaderCount = 100;         // more header fields answer 431
    std::size_t maxConnectionsPerClient = 64; // further connections of one address are closed
    std::chrono::seconds readTimeout{30};     // deadline of a request head, and of its body
    std::chrono::seconds writeTimeout{30};
    std::chrono::seconds keepAliveTimeout{5};
    std::size_t keepAliveMaxRequests = 100;
    std::size_t streamBufferBytes = 64U << 10U; // a streamed body's bytes waiting for the client
    std::optional<Credentials> credentials;   // basic authentication against this list when set
    // Basic authentication against the system's accounts when set (beside the list: a login
    // either of them accepts is in); the check runs on a worker.
    std::optional<PamAuthentication> pam;
    std::string realm = "orv-cimhost";
    std::string serverName;  // the Server header of every response ("product/version"), if set
};

struct Response;

// A response body sent while it is produced, with the chunked transfer coding. The handler
// calls begin() with the status and headers (a body given there is the first piece), then
// write() for each further piece, and returns; the server ends the body when the handler
// has returned (what the handler returns is then not used). write() blocks while the
// pieces waiting for the client pass the server's stream buffer, so a slow reader holds
// the producer back instead of letting memory grow. begin() and write() answer false once
// the client is gone (the connection closed or timed out) or after abort(): the handler
// should stop then. abort() says the body cannot be completed: the connection closes
// without the last chunk, so the client sees an incomplete answer, never a cut one taken
// for whole. All three may be called from any one thread at a time.
//
// A handler that goes on past a deadline of its own uses the last two, from any thread:
// answer() sends `whole` (status, headers and body) at once as the complete answer, when
// nothing was begun and the handler has not returned; what the handler sends or returns
// afterwards is dropped, and the connection goes on to its next request, so the handler
// must not read its Request any more. release() hands the handler's worker over: another
// worker takes its place at once, and this one ends when the handler returns.
class ResponseStream {
public:
    virtual ~ResponseStream() = default;
    virtual bool begin(Response head) = 0;
    virtual bool write(std::string piece) = 0;
    virtual void abort() = 0;
    virtual bool begun() const = 0;
    virtual bool answer(Response whole) = 0;
    virtual void release() = 0;
};

struct Request {
    std::string method;
    std::string path;
    std::vector<std::pair<std::string, std::string>> headers;
    std::string body;
    std::string user;  // the authenticated user, "" without authentication
    // Set for HTTP/1.1 requests, whose answer the handler may stream; null for HTTP/1.0.
    ResponseStream* stream = nullptr;

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
// Lines worth logging at the default level, such as failed logins (rate-limited).
using EventLog = std::function<void(const std::string&)>;

class HttpServer {
public:
    HttpServer(ServerOptions options, Handler handler, AccessLog accessLog = {}, EventLog eventLog = {});
    ~HttpServer();
    HttpServer(const HttpServer&) = delete;
    HttpServer& operator=(const HttpServer&) = delete;

    // Opens the listening sockets and reads the certificate and key; throws
    // std::runtime_error ("cannot listen on 127.0.0.1:5988: Address already in use").
    void bind();
    // The ports bound (the chosen ones when the options asked for 0); -1 when not served.
    int port() const noexcept;
    int httpsPort() const noexcept;
    // Serves until stop(); returns after the requests in flight have been answered.
    void run();
    // Stops accepting connections and closes the idle ones; callable from any thread,
    // also before run() (which then returns at once).
    void stop();
    // True while run() is listening.
    bool running() const noexcept;

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

}  // namespace orv::http
