// Users allowed in by HTTP basic authentication, read from a credentials file:
//
//   # comment
//   user:password
//
// one user per line; the password is everything after the first colon.
#pragma once

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace orv::http {

class Credentials {
public:
    // Throws std::runtime_error ("file:line: message") for unreadable or malformed files.
    static Credentials loadFile(const std::filesystem::path& file);
    static Credentials parse(std::string_view text, std::string_view fileName);

    std::size_t size() const noexcept { return users_.size(); }
    bool check(std::string_view user, std::string_view password) const noexcept;
    // The user an "Authorization: Basic ..." header value names when its password is
    // right; nullopt for a missing, malformed or wrong header.
    std::optional<std::string> authenticate(std::string_view authorizationHeader) const;

private:
    std::map<std::string, std::string, std::less<>> users_;
};

// The user and password of an "Authorization: Basic ..." header value (the scheme in any
// case); nullopt when the header is not well-formed basic authorization.
std::optional<std::pair<std::string, std::string>> basicAuthorization(std::string_view header);

// Decodes base64 text; nullopt when it is not valid base64.
std::optional<std::string> decodeBase64(std::string_view text);

}  // namespace orv::http
