#include "sysfs_dir.hpp"

#include "../pci_address.hpp"

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <system_error>

namespace fs = std::filesystem;

namespace orv::linuxhost::health {

namespace {

bool isDigit(char c) { return std::isdigit(static_cast<unsigned char>(c)) != 0; }

// The run of digits starting at i, without leading zeros.
std::string_view digitRun(const std::string& text, std::size_t& i)
{
    std::size_t start = i;
    while (i < text.size() && isDigit(text[i])) ++i;
    std::string_view run(text.data() + start, i - start);
    while (run.size() > 1 && run.front() == '0') run.remove_prefix(1);
    return run;
}

}  // namespace

bool naturalLess(const std::string& a, const std::string& b)
{
    std::size_t i = 0, j = 0;
    while (i < a.size() && j < b.size()) {
        if (isDigit(a[i]) && isDigit(b[j])) {
            std::string_view x = digitRun(a, i), y = digitRun(b, j);
            if (x.size() != y.size()) return x.size() < y.size();
            if (x != y) return x < y;
            continue;
        }
        if (a[i] != b[j]) return a[i] < b[j];
        ++i;
        ++j;
    }
    if ((i < a.size()) != (j < b.size())) return j < b.size();
    return a < b;  // equal by value ("01" and "1"): any fixed order
}

std::vector<std::string> directoryEntries(const std::string& dir)
{
    std::vector<std::string> names;
    std::error_code ec;
    for (fs::directory_iterator it(dir, ec), end; !ec && it != end; it.increment(ec)) {
        names.push_back(it->path().filename().string());
    }
    std::sort(names.begin(), names.end(), naturalLess);
    return names;
}

std::vector<std::string> entriesStartingWith(const std::string& dir, const std::string& prefix)
{
    std::vector<std::string> names = directoryEntries(dir);
    names.erase(std::remove_if(names.begin(), names.end(),
                               [&](const std::string& name) { return name.rfind(prefix, 0) != 0; }),
                names.end());
    return names;
}

std::optional<std::string> devicePath(const std::string& sysRoot, const std::string& path)
{
    std::error_code ec;
    const fs::path devices = fs::canonical(fs::path(sysRoot) / "devices", ec);
    if (ec) return std::nullopt;
    const fs::path target = fs::canonical(path, ec);
    if (ec) return std::nullopt;
    const std::string base = devices.string() + "/";
    const std::string full = target.string();
    if (full.rfind(base, 0) != 0) return std::nullopt;
    return full.substr(base.size());
}

std::optional<std::string> pciAddressIn(const std::string& devicePath)
{
    std::optional<std::string> found;
    std::size_t start = 0;
    while (start <= devicePath.size()) {
        std::size_t end = devicePath.find('/', start);
        if (end == std::string::npos) end = devicePath.size();
        std::string part = devicePath.substr(start, end - start);
        if (parsePciAddress(part)) found = part;
        start = end + 1;
    }
    return found;
}

std::string subsystemOf(const std::string& deviceDir)
{
    std::error_code ec;
    fs::path target = fs::read_symlink(deviceDir + "/subsystem", ec);
    return ec ? std::string() : target.filename().string();
}

bool exists(const std::string& path)
{
    std::error_code ec;
    return fs::exists(path, ec);
}

}  // namespace orv::linuxhost::health
