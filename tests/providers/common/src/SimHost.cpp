#include "orv/providertest/SimHost.h"

#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <stdexcept>
#include <string>

namespace orv::providertest {
namespace {

std::filesystem::path processFolder() {
    return std::filesystem::temp_directory_path() / ("orv-provider-test-" + std::to_string(::getpid()));
}

}  // namespace

SimHost::SimHost() : folder_(processFolder()), file_(folder_ / "host.json") {
    std::filesystem::create_directories(folder_);
    ::setenv("ORV_PLATFORM", "sim", 1);
    ::setenv("ORV_SIM_FIXTURE", file_.c_str(), 1);
}

SimHost::~SimHost() {
    std::error_code ignored;
    std::filesystem::remove_all(folder_, ignored);
}

void SimHost::write(const nlohmann::ordered_json& fixture) const {
    const std::filesystem::path staging = folder_ / "host.json.new";
    {
        std::ofstream out(staging, std::ios::trunc);
        out << fixture.dump(1) << '\n';
        if (!out) {
            throw std::runtime_error("cannot write the sim fixture " + staging.string());
        }
    }
    std::filesystem::rename(staging, file_);
}

nlohmann::ordered_json SimHost::withHost(const nlohmann::ordered_json& sections) {
    nlohmann::ordered_json fixture = {
        {"host", {{"name", kHostName}, {"fqdn", kFqdn}, {"osIsTmk", true}}},
    };
    for (const auto& [key, value] : sections.items()) {
        fixture[key] = value;
    }
    return fixture;
}

}  // namespace orv::providertest
