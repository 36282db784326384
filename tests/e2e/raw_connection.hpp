// A plain TCP connection to the host for requests no HTTP client library would send:
// partial heads, pipelined requests, lying Content-Length, endless chunked bodies. It can
// connect from any loopback address (127.0.0.0/8), so a test can play several clients.
#pragma once

#include <chrono>
#include <map>
#include <optional>
#include <string>
#include <string_view>

namespace orv::e2e {

struct RawResponse {
    int status = 0;
    std::map<std::string, std::string> headers;  // names in lower case
    std::string body;      // a chunked body joined
    bool chunked = false;  // the body came with the chunked transfer coding
};

class RawConnection {
public:
    // Connects to 127.0.0.1:port from `source` (port chosen by the system).
    RawConnection(int port, const std::string& source = "127.0.0.1");
    ~RawConnection();
    RawConnection(const RawConnection&) = delete;
    RawConnection& operator=(const RawConnection&) = delete;

    bool connected() const noexcept { return fd_ >= 0; }
    // Sends everything; false once the host has closed or reset the connection.
    bool send(std::string_view data);
    // The next response, waiting at most `timeout` in all; nullopt on a timeout or a close.
    std::optional<RawResponse> readResponse(std::chrono::milliseconds timeout);
    // True when the host closes the connection within `timeout` (pending bytes are skipped).
    bool closedWithin(std::chrono::milliseconds timeout);

private:
    // Reads what arrives within the deadline; false on a close, an error or the deadline.
    bool receive(std::chrono::steady_clock::time_point deadline);

    int fd_ = -1;
    std::string pending_;
};

// The head and body of a CIM-XML POST to /cimom; `extraHeaders` are "Name: value\r\n" lines.
std::string cimPost(const std::string& body, const std::string& method, const std::string& extraHeaders = "");
// The body of an EnumerateClassNames request of root/cimv2 with the given MESSAGE ID.
std::string enumerateClassNamesBody(int messageId = 1);
// "Authorization: Basic ..." for the user and password.
std::string basicAuthorizationLine(const std::string& user, const std::string& password,
                                   const std::string& scheme = "Basic");
// The peak resident size of a process so far, in KiB (VmHWM of /proc/PID/status).
long peakResidentKib(int pid);

}  // namespace orv::e2e
