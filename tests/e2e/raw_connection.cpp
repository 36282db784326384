#include "raw_connection.hpp"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <fstream>

namespace orv::e2e {

namespace {

sockaddr_in loopback(const std::string& address, int port) {
    sockaddr_in out{};
    out.sin_family = AF_INET;
    out.sin_port = htons(static_cast<uint16_t>(port));
    inet_pton(AF_INET, address.c_str(), &out.sin_addr);
    return out;
}

std::string lowerCase(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(), [](unsigned char c) { return std::tolower(c); });
    return text;
}

std::string base64(const std::string& text) {
    static const char* kDigits = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string out;
    std::size_t i = 0;
    for (; i + 2 < text.size(); i += 3) {
        const unsigned n = (static_cast<unsigned char>(text[i]) << 16U) |
                           (static_cast<unsigned char>(text[i + 1]) << 8U) | static_cast<unsigned char>(text[i + 2]);
        out += {kDigits[n >> 18U], kDigits[(n >> 12U) & 63U], kDigits[(n >> 6U) & 63U], kDigits[n & 63U]};
    }
    if (i + 1 == text.size()) {
        const unsigned n = static_cast<unsigned char>(text[i]) << 16U;
        out += {kDigits[n >> 18U], kDigits[(n >> 12U) & 63U], '=', '='};
    } else if (i + 2 == text.size()) {
        const unsigned n = (static_cast<unsigned char>(text[i]) << 16U) | (static_cast<unsigned char>(text[i + 1]) << 8U);
        out += {kDigits[n >> 18U], kDigits[(n >> 12U) & 63U], kDigits[(n >> 6U) & 63U], '='};
    }
    return out;
}

// Parses one complete response off the front of `data`; nullopt while it is incomplete.
// A chunked body starting at `start`: the chunks joined, once the last chunk and the end of
// the (empty) trailer have arrived; nullopt while some are missing.
std::optional<RawResponse> takeChunkedBody(std::string& data, std::size_t start, RawResponse response) {
    std::size_t at = start;
    while (true) {
        const std::size_t lineEnd = data.find("\r\n", at);
        if (lineEnd == std::string::npos) {
            return std::nullopt;
        }
        const std::size_t size = std::stoul(data.substr(at, lineEnd - at), nullptr, 16);
        if (size == 0) {
            if (data.compare(lineEnd + 2, 2, "\r\n") != 0) {
                return std::nullopt;
            }
            response.chunked = true;
            data.erase(0, lineEnd + 4);
            return response;
        }
        if (data.size() < lineEnd + 2 + size + 2) {
            return std::nullopt;
        }
        response.body.append(data, lineEnd + 2, size);
        at = lineEnd + 2 + size + 2;
    }
}

std::optional<RawResponse> takeResponse(std::string& data) {
    const std::size_t headEnd = data.find("\r\n\r\n");
    if (headEnd == std::string::npos || data.compare(0, 5, "HTTP/") != 0) {
        return std::nullopt;
    }
    RawResponse response;
    response.status = std::atoi(data.c_str() + data.find(' ') + 1);
    std::size_t line = data.find("\r\n") + 2;
    while (line < headEnd) {
        const std::size_t end = data.find("\r\n", line);
        const std::size_t colon = data.find(':', line);
        if (colon < end) {
            std::size_t value = colon + 1;
            while (value < end && data[value] == ' ') {
                ++value;
            }
            response.headers[lowerCase(data.substr(line, colon - line))] = data.substr(value, end - value);
        }
        line = end + 2;
    }
    const auto coding = response.headers.find("transfer-encoding");
    if (coding != response.headers.end() && coding->second == "chunked") {
        return takeChunkedBody(data, headEnd + 4, std::move(response));
    }
    const auto length = response.headers.find("content-length");
    const std::size_t bodyLength = length == response.headers.end() ? 0 : std::stoul(length->second);
    if (data.size() < headEnd + 4 + bodyLength) {
        return std::nullopt;
    }
    response.body = data.substr(headEnd + 4, bodyLength);
    data.erase(0, headEnd + 4 + bodyLength);
    return response;
}

}  // namespace

RawConnection::RawConnection(int port, const std::string& source) {
    fd_ = socket(AF_INET, SOCK_STREAM, 0);
    const sockaddr_in local = loopback(source, 0);
    const sockaddr_in remote = loopback("127.0.0.1", port);
    if (bind(fd_, reinterpret_cast<const sockaddr*>(&local), sizeof local) != 0 ||
        connect(fd_, reinterpret_cast<const sockaddr*>(&remote), sizeof remote) != 0) {
        close(fd_);
        fd_ = -1;
    }
}

RawConnection::~RawConnection() {
    if (fd_ >= 0) {
        close(fd_);
    }
}

bool RawConnection::send(std::string_view data) {
    while (!data.empty()) {
        const ssize_t n = ::send(fd_, data.data(), data.size(), MSG_NOSIGNAL);
        if (n <= 0) {
            return false;
        }
        data.remove_prefix(static_cast<std::size_t>(n));
    }
    return true;
}

bool RawConnection::receive(std::chrono::steady_clock::time_point deadline) {
    const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now());
    pollfd wait{fd_, POLLIN, 0};
    if (left.count() <= 0 || poll(&wait, 1, static_cast<int>(left.count())) <= 0) {
        return false;
    }
    char buffer[65536];
    const ssize_t n = recv(fd_, buffer, sizeof buffer, 0);
    if (n <= 0) {
        return false;
    }
    pending_.append(buffer, static_cast<std::size_t>(n));
    return true;
}

std::optional<RawResponse> RawConnection::readResponse(std::chrono::milliseconds timeout) {
    const auto deadline = std::chrono::steady_clock::now() + timeout;
    while (true) {
        if (auto response = takeResponse(pending_)) {
            return response;
        }
        if (!receive(deadline)) {
            return takeResponse(pending_);
        }
    }
}

bool RawConnection::closedWithin(std::chrono::milliseconds timeout) {
    const auto deadline = std::chrono::steady_clock::now() + timeout;
    while (std::chrono::steady_clock::now() < deadline) {
        pollfd wait{fd_, POLLIN, 0};
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now());
        if (poll(&wait, 1, static_cast<int>(std::max<long>(left.count(), 0))) <= 0) {
            return false;
        }
        char buffer[4096];
        if (recv(fd_, buffer, sizeof buffer, 0) <= 0) {
            return true;
        }
    }
    return false;
}

std::string cimPost(const std::string& body, const std::string& method, const std::string& extraHeaders) {
    return "POST /cimom HTTP/1.1\r\nHost: 127.0.0.1\r\nContent-Type: application/xml; charset=\"utf-8\"\r\n"
           "CIMOperation: MethodCall\r\nCIMMethod: " + method + "\r\nCIMObject: root%2Fcimv2\r\n" + extraHeaders +
           "Content-Length: " + std::to_string(body.size()) + "\r\n\r\n" + body;
}

std::string enumerateClassNamesBody(int messageId) {
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"" +
           std::to_string(messageId) +
           "\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"EnumerateClassNames\"><LOCALNAMESPACEPATH>"
           "<NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH></IMETHODCALL></SIMPLEREQ>"
           "</MESSAGE></CIM>";
}

std::string basicAuthorizationLine(const std::string& user, const std::string& password, const std::string& scheme) {
    return "Authorization: " + scheme + " " + base64(user + ":" + password) + "\r\n";
}

long peakResidentKib(int pid) {
    std::ifstream status("/proc/" + std::to_string(pid) + "/status");
    std::string line;
    while (std::getline(status, line)) {
        if (line.rfind("VmHWM:", 0) == 0) {
            return std::atol(line.c_str() + 6);
        }
    }
    return -1;
}

}  // namespace orv::e2e
