#include "orv/http/credentials.hpp"

#include <openssl/crypto.h>
#include <openssl/evp.h>
#include <strings.h>

#include <fstream>
#include <sstream>
#include <stdexcept>

namespace orv::http {

Credentials Credentials::loadFile(const std::filesystem::path& file) {
    std::ifstream in(file);
    if (!in) {
        throw std::runtime_error(file.string() + ": cannot read the credentials file");
    }
    std::stringstream text;
    text << in.rdbuf();
    return parse(text.str(), file.string());
}

Credentials Credentials::parse(std::string_view text, std::string_view fileName) {
    Credentials result;
    int lineNumber = 0;
    std::size_t start = 0;
    while (start < text.size()) {
        std::size_t end = text.find('\n', start);
        if (end == std::string_view::npos) {
            end = text.size();
        }
        std::string_view line = text.substr(start, end - start);
        start = end + 1;
        ++lineNumber;
        if (!line.empty() && line.back() == '\r') {
            line.remove_suffix(1);
        }
        if (line.empty() || line.front() == '#') {
            continue;
        }
        const std::size_t colon = line.find(':');
        if (colon == std::string_view::npos || colon == 0) {
            throw std::runtime_error(std::string(fileName) + ":" + std::to_string(lineNumber) +
                                     ": expected user:password");
        }
        result.users_[std::string(line.substr(0, colon))] = std::string(line.substr(colon + 1));
    }
    return result;
}

bool Credentials::check(std::string_view user, std::string_view password) const noexcept {
    auto found = users_.find(user);
    if (found == users_.end() || found->second.size() != password.size()) {
        return false;
    }
    return CRYPTO_memcmp(found->second.data(), password.data(), password.size()) == 0;
}

std::optional<std::string> Credentials::authenticate(std::string_view header) const {
    auto claimed = basicAuthorization(header);
    if (!claimed || !check(claimed->first, claimed->second)) {
        return std::nullopt;
    }
    return std::move(claimed->first);
}

std::optional<std::pair<std::string, std::string>> basicAuthorization(std::string_view header) {
    // The scheme is a token compared without regard to case (RFC 7235 2.1).
    constexpr std::string_view kScheme = "basic";
    if (header.size() <= kScheme.size() || strncasecmp(header.data(), kScheme.data(), kScheme.size()) != 0 ||
        header[kScheme.size()] != ' ') {
        return std::nullopt;
    }
    std::string_view credentials = header.substr(kScheme.size());
    while (!credentials.empty() && credentials.front() == ' ') {
        credentials.remove_prefix(1);
    }
    std::optional<std::string> decoded = decodeBase64(credentials);
    if (!decoded) {
        return std::nullopt;
    }
    const std::size_t colon = decoded->find(':');
    if (colon == std::string::npos) {
        return std::nullopt;
    }
    return std::make_pair(decoded->substr(0, colon), decoded->substr(colon + 1));
}

std::optional<std::string> decodeBase64(std::string_view text) {
    while (!text.empty() && text.back() == ' ') {
        text.remove_suffix(1);
    }
    if (text.size() % 4 != 0 || text.size() > 8192) {
        return std::nullopt;
    }
    std::string out(text.size() / 4 * 3, '\0');
    const int length = EVP_DecodeBlock(reinterpret_cast<unsigned char*>(out.data()),
                                       reinterpret_cast<const unsigned char*>(text.data()),
                                       static_cast<int>(text.size()));
    if (length < 0) {
        return std::nullopt;
    }
    // EVP_DecodeBlock counts the padding as decoded zero bytes; drop them.
    std::size_t padding = 0;
    for (std::size_t i = text.size(); i > 0 && text[i - 1] == '=' && padding < 2; --i) {
        ++padding;
    }
    out.resize(static_cast<std::size_t>(length) - padding);
    return out;
}

}  // namespace orv::http
