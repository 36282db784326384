#include "orv/exporter/destination_url.hpp"

#include <charconv>

namespace orv::exporter {

namespace {

std::optional<DestinationUrl> fail(std::string* why, std::string reason) {
    if (why != nullptr) {
        *why = std::move(reason);
    }
    return std::nullopt;
}

bool startsWithNoCase(std::string_view text, std::string_view prefix) {
    if (text.size() < prefix.size()) {
        return false;
    }
    for (std::size_t i = 0; i < prefix.size(); ++i) {
        const char c = text[i] >= 'A' && text[i] <= 'Z' ? static_cast<char>(text[i] - 'A' + 'a') : text[i];
        if (c != prefix[i]) {
            return false;
        }
    }
    return true;
}

}  // namespace

std::optional<DestinationUrl> parseDestinationUrl(std::string_view url, std::string* why) {
    DestinationUrl out;
    if (startsWithNoCase(url, "https://")) {
        out.https = true;
        url.remove_prefix(8);
    } else if (startsWithNoCase(url, "http://")) {
        url.remove_prefix(7);
    } else {
        return fail(why, "the URL does not start with http:// or https://");
    }
    const std::size_t slash = url.find('/');
    std::string_view authority = url.substr(0, slash);
    out.path = slash == std::string_view::npos ? "/" : std::string(url.substr(slash));
    if (authority.find('@') != std::string_view::npos) {
        return fail(why, "user information in the URL is not supported");
    }
    std::string_view portText;
    if (!authority.empty() && authority.front() == '[') {
        const std::size_t close = authority.find(']');
        if (close == std::string_view::npos) {
            return fail(why, "unterminated IPv6 address");
        }
        out.host = std::string(authority.substr(1, close - 1));
        std::string_view rest = authority.substr(close + 1);
        if (!rest.empty() && rest.front() != ':') {
            return fail(why, "unexpected text after the IPv6 address");
        }
        portText = rest.empty() ? rest : rest.substr(1);
    } else {
        const std::size_t colon = authority.rfind(':');
        out.host = std::string(authority.substr(0, colon));
        portText = colon == std::string_view::npos ? std::string_view() : authority.substr(colon + 1);
        if (colon != std::string_view::npos && portText.empty()) {
            return fail(why, "empty port");
        }
    }
    if (out.host.empty()) {
        return fail(why, "the URL has no host");
    }
    out.port = out.https ? 443 : 80;
    if (!portText.empty()) {
        int port = 0;
        auto [end, error] = std::from_chars(portText.data(), portText.data() + portText.size(), port);
        if (error != std::errc() || end != portText.data() + portText.size() || port < 1 || port > 65535) {
            return fail(why, "bad port '" + std::string(portText) + "'");
        }
        out.port = port;
    }
    return out;
}

}  // namespace orv::exporter
