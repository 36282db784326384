#include "os_version.hpp"

#include "linux_call_error.hpp"
#include "text_files.hpp"

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <cctype>
#include <cerrno>
#include <sstream>
#include <sys/utsname.h>
#include <vector>

namespace orv::linuxhost {

namespace {

constexpr std::array<const char*, 12> kMonths = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                                 "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};

std::string unquote(std::string_view value)
{
    if (value.size() >= 2 && (value.front() == '"' || value.front() == '\'') && value.back() == value.front()) {
        value = value.substr(1, value.size() - 2);
    }
    std::string out;
    for (std::size_t i = 0; i < value.size(); ++i) {
        if (value[i] == '\\' && i + 1 < value.size()) ++i;
        out += value[i];
    }
    return out;
}

std::vector<std::string> words(std::string_view text)
{
    std::istringstream in{std::string(text)};
    std::vector<std::string> out;
    for (std::string word; in >> word;) out.push_back(word);
    return out;
}

bool isNumber(const std::string& word)
{
    return !word.empty() && word.size() <= 4 && std::all_of(word.begin(), word.end(), [](unsigned char c) { return std::isdigit(c); });
}

bool isYear(const std::string& word) { return word.size() == 4 && isNumber(word); }

// "(YYYY-MM-DD)" as some distribution kernels write their date.
std::string isoDate(const std::string& word)
{
    unsigned year = 0, month = 0, day = 0;
    char close = 0;
    if (std::sscanf(word.c_str(), "(%4u-%2u-%2u%c", &year, &month, &day, &close) != 4 || close != ')') return {};
    if (month < 1 || month > 12 || day < 1 || day > 31) return {};
    return std::string(kMonths[month - 1]) + " " + std::to_string(day) + " " + std::to_string(year);
}

}  // namespace

std::map<std::string, std::string> parseOsRelease(std::string_view text)
{
    std::map<std::string, std::string> fields;
    std::istringstream lines{std::string(text)};
    for (std::string line; std::getline(lines, line);) {
        std::string_view view = trimmed(line);
        auto equals = view.find('=');
        if (view.empty() || view.front() == '#' || equals == std::string_view::npos) continue;
        fields[std::string(view.substr(0, equals))] = unquote(view.substr(equals + 1));
    }
    return fields;
}

std::string buildDateOf(std::string_view kernelVersion)
{
    auto list = words(kernelVersion);
    for (std::size_t i = 0; i < list.size(); ++i) {
        if (auto iso = isoDate(list[i]); !iso.empty()) return iso;
        bool month = std::find(kMonths.begin(), kMonths.end(), list[i]) != kMonths.end();
        if (!month || i + 1 >= list.size() || !isNumber(list[i + 1])) continue;
        for (std::size_t j = i + 2; j < list.size(); ++j) {
            if (isYear(list[j])) return list[i] + " " + std::to_string(std::stoul(list[i + 1])) + " " + list[j];
        }
    }
    return {};
}

std::string buildTimeOf(std::string_view kernelVersion)
{
    for (const auto& word : words(kernelVersion)) {
        unsigned h = 0, m = 0, s = 0;
        char extra = 0;
        if (word.size() == 8 && std::sscanf(word.c_str(), "%2u:%2u:%2u%c", &h, &m, &s, &extra) == 3) return word;
    }
    return {};
}

SystemVersion describeSystem(const std::map<std::string, std::string>& osRelease, const KernelIdentity& kernel)
{
    auto field = [&](const char* key, const char* fallback) {
        auto it = osRelease.find(key);
        return it != osRelease.end() ? it->second : std::string(fallback);
    };
    SystemVersion version;
    version.product = field("NAME", "Linux");
    version.productVersion = field("VERSION_ID", "");
    version.buildVersion = kernel.release;
    version.buildDate = buildDateOf(kernel.version);
    version.buildTime = buildTimeOf(kernel.version);
    if (kernel.version.size() > 1 && kernel.version.front() == '#') {
        version.build = static_cast<std::uint32_t>(std::strtoul(kernel.version.c_str() + 1, nullptr, 10));
    }
    return version;
}

SystemVersion readSystemVersion(const std::string& root)
{
    auto text = readFile(root + "/etc/os-release");
    if (!text) text = readFile(root + "/usr/lib/os-release");
    if (!text) throw LinuxCallError("read", root + "/etc/os-release", ENOENT);
    utsname names{};
    if (::uname(&names) != 0) throw LinuxCallError("uname", "kernel", errno);
    return describeSystem(parseOsRelease(*text), KernelIdentity{names.release, names.version});
}

}  // namespace orv::linuxhost
