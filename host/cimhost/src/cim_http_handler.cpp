#include "orv/cimhost/cim_http_handler.hpp"

#include <strings.h>

#include "orv/cimxml/request_parser.hpp"

namespace orv::cimhost {

namespace {

using cimxml::ProtocolError;

bool sameText(std::string_view a, std::string_view b) {
    return a.size() == b.size() && strncasecmp(a.data(), b.data(), a.size()) == 0;
}

http::Response cimFailure(int status, std::string_view cimError) {
    http::Response response;
    response.status = status;
    response.headers.emplace_back("CIMError", std::string(cimError));
    return response;
}

int hexDigit(char c) {
    if (c >= '0' && c <= '9') {
        return c - '0';
    }
    if (c >= 'a' && c <= 'f') {
        return c - 'a' + 10;
    }
    if (c >= 'A' && c <= 'F') {
        return c - 'A' + 10;
    }
    return -1;
}

// The CIMObject header of an intrinsic call names the namespace.
bool objectHeaderMatches(const http::Request& request, const cimxml::CimRequest& cim) {
    const std::string* header = request.header("CIMObject");
    if (header == nullptr) {
        return false;
    }
    if (!cim.intrinsic) {
        return true;  // an object path; its namespace was checked by the parser
    }
    std::string decoded = percentDecode(http::trimBlanks(*header));
    while (!decoded.empty() && decoded.front() == '/') {
        decoded.erase(0, 1);
    }
    return sameText(decoded, cim.nameSpace);
}

http::Response success(std::string body) {
    http::Response response;
    response.headers.emplace_back("CIMOperation", "MethodResponse");
    response.headers.emplace_back("CIMProtocolVersion", "1.0");
    response.contentType = "application/xml; charset=\"utf-8\"";
    response.body = std::move(body);
    return response;
}

// The answer, sent in pieces on the request's stream when the operation makes a large one
// (the connection ignores what is returned then).
std::string answer(const http::Request& request, const cimxml::CimRequest& cim, const CimDispatcher& dispatcher) {
    if (request.stream == nullptr) {
        return dispatcher.respond(cim, request.user);
    }
    return dispatcher.respond(cim, request.user, *request.stream, success({}));
}

}  // namespace

std::string percentDecode(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '%' && i + 2 < text.size()) {
            const int high = hexDigit(text[i + 1]);
            const int low = hexDigit(text[i + 2]);
            if (high >= 0 && low >= 0) {
                out += static_cast<char>(high * 16 + low);
                i += 2;
                continue;
            }
        }
        out += text[i];
    }
    return out;
}

http::Response handleCimRequest(const http::Request& request, const CimDispatcher& dispatcher,
                                const cimxml::XmlLimits& limits) {
    if (!request.headerIs("CIMOperation", "MethodCall")) {
        return cimFailure(400, "unsupported-operation");
    }
    const std::string* version = request.header("CIMProtocolVersion");
    if (version != nullptr && http::trimBlanks(*version).substr(0, 2) != "1.") {
        return cimFailure(501, "unsupported-protocol-version");
    }
    cimxml::CimRequest cim;
    try {
        cim = cimxml::parseRequest(request.body, limits);
    } catch (const ProtocolError& error) {
        const cimxml::HttpFailure failure = cimxml::httpFailure(error.kind());
        return cimFailure(failure.status, failure.cimError);
    }
    if (!request.headerIs("CIMMethod", cim.methodName) || !objectHeaderMatches(request, cim)) {
        return cimFailure(400, "header-mismatch");
    }
    return success(answer(request, cim, dispatcher));
}

}  // namespace orv::cimhost
