#include "pci_functions.hpp"

#include "../text_files.hpp"
#include "health_state.hpp"
#include "sysfs_dir.hpp"

#include <filesystem>

namespace orv::linuxhost::health {

namespace {

// "<name> <count>": the count, when the line ends in one.
std::optional<std::uint64_t> countOfLine(std::string_view line, std::string_view& name)
{
    line = trimmed(line);
    const std::size_t space = line.find_last_of(" \t");
    if (space == std::string_view::npos) return std::nullopt;
    name = trimmed(line.substr(0, space));
    return parseNumber(line.substr(space + 1));
}

std::optional<std::uint64_t> readAer(const std::string& dir, const char* file, std::string_view totalName)
{
    std::optional<std::string> text = readFile(dir + "/" + file);
    if (!text) return std::nullopt;
    return aerTotal(*text, totalName);
}

std::optional<std::string> driverOf(const std::string& dir)
{
    std::error_code ec;
    std::filesystem::path target = std::filesystem::read_symlink(dir + "/driver", ec);
    if (ec) return std::nullopt;
    return target.filename().string();
}

}  // namespace

std::optional<std::uint64_t> aerTotal(std::string_view text, std::string_view totalName)
{
    std::optional<std::uint64_t> sum;
    while (!text.empty()) {
        const std::size_t end = text.find('\n');
        std::string_view line = text.substr(0, end);
        text = end == std::string_view::npos ? std::string_view() : text.substr(end + 1);
        std::string_view name;
        std::optional<std::uint64_t> count = countOfLine(line, name);
        if (!count) continue;
        if (name == totalName) return count;
        sum = sum.value_or(0) + *count;
    }
    return sum;
}

std::vector<PciFunctionHealth> readPciFunctions(const std::string& sysRoot, std::uint8_t baseClass)
{
    std::vector<PciFunctionHealth> functions;
    const std::string base = sysRoot + "/bus/pci/devices";
    for (const std::string& address : directoryEntries(base)) {
        const std::string dir = base + "/" + address;
        std::optional<std::uint64_t> classCode = readNumber(dir + "/class");
        if (!classCode || ((*classCode >> 16) & 0xff) != baseClass) continue;
        PciFunctionHealth function;
        function.address = address;
        function.classCode = static_cast<std::uint32_t>(*classCode & 0xffffff);
        function.vendorId = static_cast<std::uint16_t>(readNumber(dir + "/vendor").value_or(0));
        function.deviceId = static_cast<std::uint16_t>(readNumber(dir + "/device").value_or(0));
        function.driver = driverOf(dir);
        function.correctable = readAer(dir, "aer_dev_correctable", "TOTAL_ERR_COR");
        function.nonFatal = readAer(dir, "aer_dev_nonfatal", "TOTAL_ERR_NONFATAL");
        function.fatal = readAer(dir, "aer_dev_fatal", "TOTAL_ERR_FATAL");
        functions.push_back(std::move(function));
    }
    return functions;
}

std::optional<std::uint16_t> pciFunctionHealth(const PciFunctionHealth& function)
{
    if (function.fatal.value_or(0) > 0) return kCriticalFailure;
    if (function.nonFatal.value_or(0) > 0) return kMajorFailure;
    if (function.correctable.value_or(0) > 0) return kDegraded;
    if (function.fatal || function.nonFatal || function.correctable) return kOk;
    return std::nullopt;
}

}  // namespace orv::linuxhost::health
