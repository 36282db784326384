// Small text files of sysfs and procfs: read whole, first line, numbers.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace orv::linuxhost {

// The whole file; throws LinuxCallError("read", path, errno) when it cannot be read.
std::string readFileOrThrow(const std::string& path);
// The whole file, or nothing when it cannot be opened or read.
std::optional<std::string> readFile(const std::string& path);
// The first line without its trailing white space, or nothing.
std::optional<std::string> readLine(const std::string& path);
// A decimal or 0x-prefixed hexadecimal number on the first line, or nothing.
std::optional<std::uint64_t> readNumber(const std::string& path);
std::optional<std::int64_t> readSignedNumber(const std::string& path);
// A number in a sysfs attribute file, which the kernel answers whole in its
// first read (a page at most): one open, one read, one close. Nothing when
// the file cannot be read or holds no number.
std::optional<std::uint64_t> readAttributeNumber(const std::string& path);

// Parses a whole unsigned number (decimal, or hexadecimal with 0x); nothing on junk.
std::optional<std::uint64_t> parseNumber(std::string_view text);
std::string_view trimmed(std::string_view text);

}  // namespace orv::linuxhost
