#include "tool_output.hpp"

#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <sys/wait.h>

namespace orv::linuxtest {

std::optional<std::string> toolOutput(const std::string& command)
{
    FILE* pipe = ::popen((command + " 2>/dev/null").c_str(), "r");
    if (!pipe) return std::nullopt;
    std::string out;
    char buffer[4096];
    for (std::size_t n; (n = std::fread(buffer, 1, sizeof buffer, pipe)) > 0;) out.append(buffer, n);
    int status = ::pclose(pipe);
    if (status == -1 || !WIFEXITED(status) || WEXITSTATUS(status) != 0) return std::nullopt;
    return out;
}

bool runTool(const std::string& command)
{
    int status = std::system((command + " >/dev/null 2>&1").c_str());
    return status != -1 && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

std::string fieldAfter(const std::string& text, const std::string& key, int occurrence)
{
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        auto start = line.find_first_not_of(" \t");
        if (start == std::string::npos || line.compare(start, key.size(), key) != 0) continue;
        auto colon = line.find(':', start + key.size());
        if (colon == std::string::npos || line.find_first_not_of(" \t", start + key.size()) != colon) continue;
        if (occurrence-- > 0) continue;
        auto value = line.find_first_not_of(" \t", colon + 1);
        return value == std::string::npos ? std::string() : line.substr(value);
    }
    return {};
}

}  // namespace orv::linuxtest
