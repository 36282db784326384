#include "orv/listener/listener_options.hpp"

#include <charconv>

namespace orv::listener {

const char* const kListenerUsage =
    "usage: orv-cimlistener [--address ADDR] [--port N] [--json] [--count N] [--timeout S]\n"
    "  Receives CIM-XML export requests (indications) and prints one line per indication.\n"
    "  --address ADDR  address to listen on (default 127.0.0.1)\n"
    "  --port N        port to listen on (default 5990; 0 picks a free one)\n"
    "  --json          print each indication as a JSON object\n"
    "  --count N       exit after N indications\n"
    "  --timeout S     exit after S seconds (status 1 when --count was not reached)\n";

namespace {

unsigned long number(const std::string& option, const std::string& text, unsigned long max) {
    unsigned long value = 0;
    const char* end = text.data() + text.size();
    auto [ptr, error] = std::from_chars(text.data(), end, value);
    if (text.empty() || error != std::errc() || ptr != end || value > max) {
        throw UsageError(option + ": '" + text + "' is not a number from 0 to " + std::to_string(max));
    }
    return value;
}

}  // namespace

ListenerOptions parseListenerArguments(const std::vector<std::string>& arguments) {
    ListenerOptions options;
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        const std::string& option = arguments[i];
        auto value = [&]() -> const std::string& {
            if (i + 1 >= arguments.size()) {
                throw UsageError(option + " needs a value");
            }
            return arguments[++i];
        };
        if (option == "--help" || option == "-h") {
            options.help = true;
        } else if (option == "--json") {
            options.json = true;
        } else if (option == "--address") {
            options.address = value();
        } else if (option == "--port") {
            options.port = static_cast<int>(number(option, value(), 65535));
        } else if (option == "--count") {
            options.count = number(option, value(), 1UL << 40U);
            if (*options.count == 0) {
                throw UsageError("--count must be at least 1");
            }
        } else if (option == "--timeout") {
            options.timeout = std::chrono::seconds(number(option, value(), 1UL << 31U));
        } else {
            throw UsageError("unknown argument '" + option + "'");
        }
    }
    return options;
}

}  // namespace orv::listener
