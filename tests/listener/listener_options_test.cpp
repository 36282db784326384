#include "orv/listener/listener_options.hpp"

#include <gtest/gtest.h>

namespace orv::listener {
namespace {

TEST(ListenerOptions, DefaultsToTheLoopbackPort5990) {
    const ListenerOptions options = parseListenerArguments({});
    EXPECT_EQ(options.address, "127.0.0.1");
    EXPECT_EQ(options.port, 5990);
    EXPECT_FALSE(options.json);
    EXPECT_FALSE(options.count);
    EXPECT_FALSE(options.timeout);
}

TEST(ListenerOptions, ReadsEveryOption) {
    const ListenerOptions options =
        parseListenerArguments({"--address", "0.0.0.0", "--port", "0", "--json", "--count", "4", "--timeout", "9"});
    EXPECT_EQ(options.address, "0.0.0.0");
    EXPECT_EQ(options.port, 0);
    EXPECT_TRUE(options.json);
    EXPECT_EQ(options.count, 4UL);
    EXPECT_EQ(options.timeout, std::chrono::seconds(9));
}

TEST(ListenerOptions, RejectsBadArguments) {
    const std::pair<std::vector<std::string>, std::string> cases[] = {
        {{"--port"}, "--port needs a value"},
        {{"--port", "65536"}, "--port: '65536' is not a number from 0 to 65535"},
        {{"--count", "0"}, "--count must be at least 1"},
        {{"--timeout", "-1"}, "--timeout: '-1' is not a number from 0 to 2147483648"},
        {{"--verbose"}, "unknown argument '--verbose'"},
    };
    for (const auto& [arguments, message] : cases) {
        try {
            parseListenerArguments(arguments);
            ADD_FAILURE() << message;
        } catch (const UsageError& error) {
            EXPECT_EQ(error.what(), message);
        }
    }
}

}  // namespace
}  // namespace orv::listener
