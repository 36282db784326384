// The table of configuration keys: each key's command-line option and how its value is read.
#pragma once

#include <filesystem>
#include <span>
#include <string_view>

#include "orv/cimhost/host_config.hpp"

namespace orv::cimhost::detail {

struct ConfigKey {
    std::string_view key;     // as written in the configuration file
    std::string_view option;  // long command-line option without "--"
    std::string_view help;
    void (*apply)(HostConfig& config, std::string_view value, const std::filesystem::path& baseDir);
};

std::span<const ConfigKey> configKeys() noexcept;
// The entry whose key (any case) or option matches; nullptr when none.
const ConfigKey* findByKey(std::string_view key) noexcept;
const ConfigKey* findByOption(std::string_view option) noexcept;

}  // namespace orv::cimhost::detail
