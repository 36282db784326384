// The URL of a listener destination: http://host[:port][/path] or https://...
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace orv::exporter {

struct DestinationUrl {
    bool https = false;
    std::string host;  // without the brackets of an IPv6 literal
    int port = 0;      // 80 or 443 when the URL names none
    std::string path;  // "/" when the URL names none
};

// Parses a destination URL; nullopt with *why set when it is not one.
std::optional<DestinationUrl> parseDestinationUrl(std::string_view url, std::string* why = nullptr);

}  // namespace orv::exporter
