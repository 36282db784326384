#include "test_data.hpp"

#include "linux_call_error.hpp"

#include <cstdlib>

namespace orv::linuxtest {

std::string testData(const std::string& name)
{
    const char* source = std::getenv("ORV_SOURCE_DIR");
    return std::string(source ? source : ".") + "/tests/linux/data/" + name;
}

int errorOf(const std::function<void()>& call)
{
    try {
        call();
    } catch (const orv::linuxhost::LinuxCallError& error) {
        return error.error();
    }
    return 0;
}

}  // namespace orv::linuxtest
