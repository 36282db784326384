#include "orv/cimhost/host_config.hpp"

#include <fstream>
#include <map>

#include "config_keys.hpp"

namespace orv::cimhost {

namespace fs = std::filesystem;

std::string_view logLevelName(LogLevel level) noexcept {
    switch (level) {
        case LogLevel::Error: return "error";
        case LogLevel::Warning: return "warning";
        case LogLevel::Info: return "info";
        case LogLevel::Debug: return "debug";
    }
    return "info";
}

namespace {

// True when this program is the one built into the build tree's bin folder, false for an
// installed copy.
bool runsFromBuildTree() {
    std::error_code ec;
    const fs::path program = fs::read_symlink("/proc/self/exe", ec);
    return !ec && fs::weakly_canonical(program.parent_path(), ec) == fs::weakly_canonical(ORV_BUILD_BIN_DIR, ec);
}

}  // namespace

HostConfig defaultConfig() {
    const bool buildTree = runsFromBuildTree();
    const fs::path mofDir = buildTree ? ORV_DEFAULT_MOF_DIR : ORV_INSTALLED_DATA_DIR;
    // The companion library (the computer system and the watched hardware classes) is
    // served beside the project's: without it the latched health state has nothing to watch.
    const fs::path companionDir = buildTree ? ORV_DEFAULT_COMPANION_MOF_DIR : ORV_INSTALLED_DATA_DIR;
    HostConfig config;
    config.providerDirs = {fs::path(buildTree ? ORV_DEFAULT_PROVIDER_DIR : ORV_INSTALLED_PROVIDER_DIR)};
    config.registrationFiles = {mofDir / "orvprovider.reg", companionDir / "orvhwhealth.reg"};
    // The companion's classes derive from the project's: read after them.
    config.mofFiles = {mofDir / "orvprovider.mof", companionDir / "orvhwhealth.mof"};
    config.interopMof = mofDir / "interop" / "interop.mof";
    config.stateDir = fs::path(buildTree ? ORV_DEFAULT_STATE_DIR : ORV_INSTALLED_STATE_DIR);
    return config;
}

void applyConfigValue(HostConfig& config, std::string_view key, std::string_view value,
                      const fs::path& baseDir) {
    const detail::ConfigKey* entry = detail::findByKey(key);
    if (entry == nullptr) {
        throw ConfigError("unknown key '" + std::string(key) + "'");
    }
    try {
        entry->apply(config, value, baseDir);
    } catch (const ConfigError& error) {
        throw ConfigError(std::string(entry->key) + ": " + error.what());
    }
}

namespace {

std::string_view trim(std::string_view text) {
    const auto first = text.find_first_not_of(" \t\r");
    if (first == std::string_view::npos) {
        return {};
    }
    const auto last = text.find_last_not_of(" \t\r");
    return text.substr(first, last - first + 1);
}

void applyConfigLine(HostConfig& config, std::string_view line, const fs::path& baseDir) {
    const auto colon = line.find(':');
    if (colon == std::string_view::npos) {
        throw ConfigError("expected 'key: value'");
    }
    applyConfigValue(config, trim(line.substr(0, colon)), trim(line.substr(colon + 1)), baseDir);
}

bool isListKey(std::string_view key) {
    return key == "providerDirs" || key == "registrationFile" || key == "mofFiles";
}

// "--name=value" or "--name value"; advances `index` past what it used.
std::pair<std::string, std::string> optionAndValue(int argc, const char* const* argv, int& index) {
    std::string arg = argv[index];
    const auto equals = arg.find('=');
    if (equals != std::string::npos) {
        return {arg.substr(2, equals - 2), arg.substr(equals + 1)};
    }
    if (index + 1 >= argc) {
        throw ConfigError("option " + arg + " needs a value");
    }
    ++index;
    return {arg.substr(2), argv[index]};
}

}  // namespace

void loadConfigFile(HostConfig& config, const fs::path& file) {
    std::ifstream in(file);
    if (!in) {
        throw ConfigError(file.string() + ": cannot read the configuration file");
    }
    const fs::path baseDir = fs::absolute(file).parent_path();
    std::string line;
    int lineNumber = 0;
    while (std::getline(in, line)) {
        ++lineNumber;
        std::string_view content = trim(line);
        if (content.empty() || content.front() == '#') {
            continue;
        }
        try {
            applyConfigLine(config, content, baseDir);
        } catch (const ConfigError& error) {
            throw ConfigError(file.string() + ":" + std::to_string(lineNumber) + ": " + error.what());
        }
    }
}

CommandLine parseCommandLine(int argc, const char* const* argv) {
    CommandLine result{defaultConfig(), false};
    std::vector<std::pair<std::string, std::string>> options;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--help" || arg == "-h") {
            result.showHelp = true;
            continue;
        }
        if (arg == "--version") {
            result.showVersion = true;
            continue;
        }
        if (arg == "--preload") {
            options.emplace_back("preload", "true");  // a switch: the value may be left out
            continue;
        }
        if (arg.rfind("--", 0) != 0) {
            throw ConfigError("unexpected argument '" + arg + "' (see --help)");
        }
        options.push_back(optionAndValue(argc, argv, i));
    }
    for (const auto& [option, value] : options) {
        if (option == "config") {
            loadConfigFile(result.config, value);
        }
    }
    const fs::path cwd = fs::current_path();
    std::map<std::string, std::string> lists;  // repeated list options add up
    for (const auto& [option, value] : options) {
        if (option == "config") {
            continue;
        }
        const detail::ConfigKey* entry = detail::findByOption(option);
        if (entry == nullptr) {
            throw ConfigError("unknown option --" + option + " (see --help)");
        }
        if (isListKey(entry->key)) {
            lists[std::string(entry->key)] += value + " ";
            continue;
        }
        applyConfigValue(result.config, entry->key, value, cwd);
    }
    for (const auto& [key, value] : lists) {
        applyConfigValue(result.config, key, value, cwd);
    }
    return result;
}

std::string usageText() {
    std::string text =
        "usage: orv-cimhost [--config FILE] [--option VALUE ...]\n"
        "Serves the registered CMPI providers over CIM-XML at POST /cimom.\n\n"
        "  --config FILE                 read 'key: value' lines first (options below win)\n";
    for (const auto& entry : detail::configKeys()) {
        std::string left = "  --" + std::string(entry.option) + " V";
        left.resize(32, ' ');
        text += left + std::string(entry.help) + "  [key " + std::string(entry.key) + "]\n";
    }
    text += "  --version                     the version\n";
    text += "  --help                        this text\n";
    return text;
}

std::string versionText() {
    return std::string("orv-cimhost ") + ORV_VERSION;
}

}  // namespace orv::cimhost
