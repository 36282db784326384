#include "text_files.hpp"

#include "linux_call_error.hpp"

#include <cerrno>
#include <charconv>
#include <fcntl.h>
#include <unistd.h>

namespace orv::linuxhost {

namespace {

// Reads everything from the file; returns errno (0 on success).
int slurp(const std::string& path, std::string& out)
{
    int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return errno;
    char buffer[4096];
    int error = 0;
    for (;;) {
        ssize_t n = ::read(fd, buffer, sizeof buffer);
        if (n > 0) { out.append(buffer, static_cast<std::size_t>(n)); continue; }
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) error = errno;
        break;
    }
    ::close(fd);
    return error;
}

}  // namespace

std::string readFileOrThrow(const std::string& path)
{
    std::string text;
    if (int error = slurp(path, text)) throw LinuxCallError("read", path, error);
    return text;
}

std::optional<std::string> readFile(const std::string& path)
{
    std::string text;
    if (slurp(path, text) != 0) return std::nullopt;
    return text;
}

std::string_view trimmed(std::string_view text)
{
    const char* blanks = " \t\r\n";
    auto first = text.find_first_not_of(blanks);
    if (first == std::string_view::npos) return {};
    auto last = text.find_last_not_of(blanks);
    return text.substr(first, last - first + 1);
}

std::optional<std::string> readLine(const std::string& path)
{
    auto text = readFile(path);
    if (!text) return std::nullopt;
    std::string_view view(*text);
    view = view.substr(0, view.find('\n'));
    return std::string(trimmed(view));
}

std::optional<std::uint64_t> parseNumber(std::string_view text)
{
    text = trimmed(text);
    int base = 10;
    if (text.size() > 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X')) {
        base = 16;
        text.remove_prefix(2);
    }
    std::uint64_t value = 0;
    auto [end, ec] = std::from_chars(text.data(), text.data() + text.size(), value, base);
    if (ec != std::errc() || end != text.data() + text.size() || text.empty()) return std::nullopt;
    return value;
}

std::optional<std::uint64_t> readNumber(const std::string& path)
{
    auto line = readLine(path);
    if (!line) return std::nullopt;
    return parseNumber(*line);
}

std::optional<std::int64_t> readSignedNumber(const std::string& path)
{
    auto line = readLine(path);
    if (!line) return std::nullopt;
    std::string_view text = *line;
    bool negative = !text.empty() && text.front() == '-';
    if (negative) text.remove_prefix(1);
    auto magnitude = parseNumber(text);
    if (!magnitude) return std::nullopt;
    auto value = static_cast<std::int64_t>(*magnitude);
    return negative ? -value : value;
}

std::optional<std::uint64_t> readAttributeNumber(const std::string& path)
{
    int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return std::nullopt;
    char buffer[4096];
    ssize_t n;
    do {
        n = ::read(fd, buffer, sizeof buffer);
    } while (n < 0 && errno == EINTR);
    ::close(fd);
    if (n <= 0) return std::nullopt;
    std::string_view text(buffer, static_cast<std::size_t>(n));
    return parseNumber(text.substr(0, text.find('\n')));
}

}  // namespace orv::linuxhost
