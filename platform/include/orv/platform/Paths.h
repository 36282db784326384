// Root-directory override for the fixed file paths the providers read
// ("/etc/sfcb/sfcb.cfg", "/altbootbank/boot.cfg"). ORV_ROOT names a directory
// that stands in for "/"; unset, empty or "/" leaves paths unchanged.
#pragma once

#include <cstdlib>
#include <string>

// absolutePath under the root directory named by ORV_ROOT.
inline std::string orvRootPath(const char* absolutePath)
{
    const char* root = std::getenv("ORV_ROOT");
    std::string prefix = root != nullptr ? root : "";
    while (!prefix.empty() && prefix.back() == '/') {
        prefix.pop_back();
    }
    std::string path = absolutePath != nullptr ? absolutePath : "";
    if (prefix.empty()) {
        return path;
    }
    if (path.empty() || path.front() != '/') {
        path.insert(path.begin(), '/');
    }
    return prefix + path;
}
