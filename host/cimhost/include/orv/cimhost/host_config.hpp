// Configuration of orv-cimhost: defaults for the build tree, a configuration file of
// "key: value" lines in the style of sfcb.cfg, and command-line overrides.
#pragma once

#include <chrono>
#include <cstddef>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "orv/cimxml/object_encoder.hpp"

namespace orv::cimhost {

enum class LogLevel { Error, Warning, Info, Debug };

struct HostConfig {
    std::string listenAddress = "127.0.0.1";
    int httpPort = 5988;
    bool enableHttp = true;
    bool enableHttps = false;
    int httpsPort = 5989;
    std::filesystem::path sslCertificateFile;  // PEM, for HTTPS
    std::filesystem::path sslKeyFile;          // PEM, for HTTPS
    std::vector<std::filesystem::path> providerDirs;
    std::vector<std::filesystem::path> registrationFiles;
    std::vector<std::filesystem::path> mofFiles;  // files, or folders of *.mof files
    std::string mofNamespace = "root/cimv2";
    std::string platform;                // sim | linux; empty: the environment decides
    std::filesystem::path fixture;       // simulated host description (sim)
    LogLevel logLevel = LogLevel::Info;
    std::filesystem::path credentialsFile;  // basic authentication when set
    std::string pamService;                 // basic authentication against the system's accounts when set
    std::size_t maxRequestBytes = 4U << 20U;
    std::chrono::seconds readTimeout{30};
    std::chrono::seconds writeTimeout{30};
    std::chrono::seconds keepAliveTimeout{5};
    std::size_t keepAliveMaxRequests = 100;
    std::size_t threads = 8;
    std::size_t maxConnectionsPerClient = 64;  // open connections of one client address
    // Longest a request may wait for its providers (0: no limit); see CimDispatcher.
    std::chrono::seconds providerCallLimit{60};
    std::string hostName;  // HOST of instance paths in responses; empty: this machine's name
    // NULL elements of array values: left out as sfcb does (what wbemcli and pywbem
    // read), or sent as DSP0201's VALUE.NULL.
    cimxml::ArrayNullElements arrayNullElements = cimxml::ArrayNullElements::Drop;

    // Indications.
    std::filesystem::path stateDir;    // where subscriptions are kept across restarts
    std::filesystem::path interopMof;  // classes of root/interop
    bool preload = false;              // load (and initialize) every registered provider at start
    unsigned deliveryRetryAttempts = 3;
    std::chrono::seconds deliveryRetryInterval{20};
    std::size_t indicationQueueLimit = 1000;       // per destination
    std::chrono::seconds indicationFlushTimeout{5};  // at shutdown, for what is queued
};

// Bad configuration input; what() is one line naming the file and line or the option.
class ConfigError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// Defaults of a build tree when this program runs from one: provider libraries from its lib
// folder, the project's registration file and MOF from the source tree. An installed program
// takes them from where `cmake --install` put them: <libdir>/cmpi, <datadir>/orvprovider, and
// keeps its state in <localstatedir>/lib/orv-cimhost.
HostConfig defaultConfig();

// Sets one key ("httpPort", "providerDirs", ...) from its text; relative paths are
// taken from `baseDir`. List keys take whitespace-separated items and replace the list.
void applyConfigValue(HostConfig& config, std::string_view key, std::string_view value,
                      const std::filesystem::path& baseDir);
// Reads a configuration file into `config`; throws ConfigError ("file:line: message").
void loadConfigFile(HostConfig& config, const std::filesystem::path& file);

struct CommandLine {
    HostConfig config;
    bool showHelp = false;
    bool showVersion = false;
};
// Defaults, then --config FILE, then the other options in order; throws ConfigError.
CommandLine parseCommandLine(int argc, const char* const* argv);
// The usage text listing every option and its configuration key.
std::string usageText();
// "orv-cimhost VERSION": the project's version, also sent in the Server header.
std::string versionText();

std::string_view logLevelName(LogLevel level) noexcept;

}  // namespace orv::cimhost
