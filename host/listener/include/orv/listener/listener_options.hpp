// Command line of orv-cimlistener.
#pragma once

#include <chrono>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace orv::listener {

struct ListenerOptions {
    std::string address = "127.0.0.1";
    int port = 5990;  // 0: any free port, printed on the "listening on" line
    bool json = false;
    std::optional<unsigned long> count;           // exit after this many indications
    std::optional<std::chrono::seconds> timeout;  // exit after this long
    bool help = false;
};

class UsageError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// Parses the arguments after the program name; throws UsageError.
ListenerOptions parseListenerArguments(const std::vector<std::string>& arguments);

extern const char* const kListenerUsage;

}  // namespace orv::listener
