#include "golden_file.hpp"

#include <cstdlib>
#include <fstream>
#include <sstream>

namespace orv::e2e {

std::string readFile(const std::string& path) {
    std::ifstream in(path);
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
}

std::string goldenText(const std::string& path, const std::string& output) {
    if (std::getenv("ORV_UPDATE_GOLDEN") != nullptr) {
        std::ofstream(path) << output;
    }
    return readFile(path);
}

}  // namespace orv::e2e
