#include "test_data.hpp"

#include "linux_call_error.hpp"

#include <cstdlib>
#include <stdexcept>
#include <sys/stat.h>

namespace orv::linuxtest {

std::string testData(const std::string& name)
{
    const char* source = std::getenv("ORV_SOURCE_DIR");
    const std::string directory = std::string(source ? source : ORV_TEST_SOURCE_DIR) + "/tests/linux/data/";
    struct stat status {};
    if (::stat(directory.c_str(), &status) != 0 || !S_ISDIR(status.st_mode)) {
        throw std::runtime_error("the captured answers are not in " + directory + " (ORV_SOURCE_DIR names the source tree)");
    }
    return directory + name;
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
