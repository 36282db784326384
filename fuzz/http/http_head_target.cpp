// Fuzz target for the HTTP request reader: any bytes, arriving in two pieces as a socket may
// deliver them, are either refused with a parse error or read into a request whose limits
// hold (fields, body); its Authorization header, if any, goes through the basic-scheme reader.
#include <boost/asio/buffer.hpp>
#include <boost/beast/http/error.hpp>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

#include "orv/http/credentials.hpp"
#include "request_parser.hpp"

namespace {

constexpr std::size_t kHeadBytes = 4096;
constexpr std::size_t kFields = 16;
constexpr std::size_t kBodyBytes = 1024;

// Adds `piece` to what the parser has not taken yet and lets it read; false on a parse error.
bool arrive(orv::http::detail::RequestParser& parser, std::string& pending, std::string_view piece) {
    pending.append(piece);
    while (!pending.empty() && !parser.is_done()) {
        boost::beast::error_code ec;
        const std::size_t used = parser.put(boost::asio::buffer(pending.data(), pending.size()), ec);
        pending.erase(0, used);
        if (ec == boost::beast::http::error::need_more) {
            return true;
        }
        if (ec) {
            return false;
        }
        if (used == 0) {
            return true;
        }
    }
    return true;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
    const std::string_view input(reinterpret_cast<const char*>(bytes), size);
    const std::size_t split = size == 0 ? 0 : bytes[0] % (size + 1);
    orv::http::Request request;
    orv::http::detail::RequestParser parser(request, kHeadBytes, kFields, kBodyBytes);
    std::string pending;
    if (arrive(parser, pending, input.substr(0, split))) {
        arrive(parser, pending, input.substr(split));
    }
    if (request.headers.size() > kFields || request.body.size() > kBodyBytes) {
        std::abort();
    }
    if (const std::string* authorization = request.header("Authorization")) {
        orv::http::basicAuthorization(*authorization);
    }
    return 0;
}
