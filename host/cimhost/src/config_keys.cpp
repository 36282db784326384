#include "config_keys.hpp"

#include <strings.h>

#include <array>
#include <charconv>
#include <sstream>

namespace orv::cimhost::detail {

namespace {

namespace fs = std::filesystem;

template <typename Number>
Number parseNumber(std::string_view value, Number low, Number high) {
    Number number{};
    auto [end, error] = std::from_chars(value.data(), value.data() + value.size(), number);
    if (error != std::errc() || end != value.data() + value.size() || number < low || number > high) {
        throw ConfigError("'" + std::string(value) + "' is not a number from " + std::to_string(low) +
                          " to " + std::to_string(high));
    }
    return number;
}

fs::path resolve(std::string_view value, const fs::path& baseDir) {
    fs::path path(value);
    return path.is_relative() ? (baseDir / path).lexically_normal() : path;
}

std::vector<fs::path> pathList(std::string_view value, const fs::path& baseDir) {
    std::vector<fs::path> paths;
    std::istringstream words{std::string(value)};
    std::string word;
    while (words >> word) {
        paths.push_back(resolve(word, baseDir));
    }
    return paths;
}

std::chrono::seconds seconds(std::string_view value) {
    return std::chrono::seconds(parseNumber<long>(value, 1, 3600));
}

LogLevel parseLogLevel(std::string_view value) {
    for (LogLevel level : {LogLevel::Error, LogLevel::Warning, LogLevel::Info, LogLevel::Debug}) {
        if (strncasecmp(std::string(value).c_str(), std::string(logLevelName(level)).c_str(), 16) == 0) {
            return level;
        }
    }
    throw ConfigError("'" + std::string(value) + "' is not one of error, warning, info, debug");
}

cimxml::ArrayNullElements arrayNullElements(std::string_view value) {
    if (value == "drop") {
        return cimxml::ArrayNullElements::Drop;
    }
    if (value == "value-null") {
        return cimxml::ArrayNullElements::ValueNull;
    }
    throw ConfigError("'" + std::string(value) + "' is not drop or value-null");
}

// sfcb.cfg writes switches as true/false in any case; yes/no and 1/0 are taken too.
bool parseSwitch(std::string_view value) {
    auto is = [value](std::string_view word) {
        return value.size() == word.size() && strncasecmp(value.data(), word.data(), word.size()) == 0;
    };
    if (is("true") || is("yes") || value == "1") {
        return true;
    }
    if (is("false") || is("no") || value == "0") {
        return false;
    }
    throw ConfigError("'" + std::string(value) + "' is not true or false");
}

std::string platformName(std::string_view value) {
    if (value != "sim" && value != "linux") {
        throw ConfigError("'" + std::string(value) + "' is not sim or linux");
    }
    return std::string(value);
}

using Base = const fs::path&;

constexpr std::array kKeys = {
    ConfigKey{"listenAddress", "address", "address to listen on (127.0.0.1; 0.0.0.0 for every interface)",
              [](HostConfig& c, std::string_view v, Base) { c.listenAddress = std::string(v); }},
    ConfigKey{"httpPort", "port", "HTTP port (5988; 0 picks a free port)",
              [](HostConfig& c, std::string_view v, Base) { c.httpPort = parseNumber<int>(v, 0, 65535); }},
    ConfigKey{"enableHttp", "enable-http", "serve HTTP on httpPort: true or false (true)",
              [](HostConfig& c, std::string_view v, Base) { c.enableHttp = parseSwitch(v); }},
    ConfigKey{"enableHttps", "enable-https", "serve HTTPS (TLS 1.2 and later) on httpsPort: true or false (false)",
              [](HostConfig& c, std::string_view v, Base) { c.enableHttps = parseSwitch(v); }},
    ConfigKey{"httpsPort", "https-port", "HTTPS port (5989; 0 picks a free port)",
              [](HostConfig& c, std::string_view v, Base) { c.httpsPort = parseNumber<int>(v, 0, 65535); }},
    ConfigKey{"sslCertificateFilePath", "ssl-certificate", "PEM certificate (chain) of the HTTPS side",
              [](HostConfig& c, std::string_view v, Base b) { c.sslCertificateFile = resolve(v, b); }},
    ConfigKey{"sslKeyFilePath", "ssl-key", "PEM private key of that certificate",
              [](HostConfig& c, std::string_view v, Base b) { c.sslKeyFile = resolve(v, b); }},
    ConfigKey{"providerDirs", "provider-dir", "folders searched for lib<location>.so",
              [](HostConfig& c, std::string_view v, Base b) { c.providerDirs = pathList(v, b); }},
    ConfigKey{"registrationFile", "registration", "provider registration file(s)",
              [](HostConfig& c, std::string_view v, Base b) { c.registrationFiles = pathList(v, b); }},
    ConfigKey{"mofFiles", "mof", "MOF file(s), or folders of *.mof files",
              [](HostConfig& c, std::string_view v, Base b) { c.mofFiles = pathList(v, b); }},
    ConfigKey{"mofNamespace", "namespace", "namespace the MOF is read into (root/cimv2)",
              [](HostConfig& c, std::string_view v, Base) { c.mofNamespace = std::string(v); }},
    ConfigKey{"platform", "platform", "platform substitute: sim or linux (sets ORV_PLATFORM)",
              [](HostConfig& c, std::string_view v, Base) { c.platform = platformName(v); }},
    ConfigKey{"fixture", "fixture", "simulated host fixture file (sets ORV_SIM_FIXTURE)",
              [](HostConfig& c, std::string_view v, Base b) { c.fixture = resolve(v, b); }},
    ConfigKey{"logLevel", "log-level", "error, warning, info or debug (info)",
              [](HostConfig& c, std::string_view v, Base) { c.logLevel = parseLogLevel(v); }},
    ConfigKey{"credentialsFile", "credentials", "file of user:password lines; enables basic authentication",
              [](HostConfig& c, std::string_view v, Base b) { c.credentialsFile = resolve(v, b); }},
    ConfigKey{"pamService", "pam-service",
              "PAM service (a file of /etc/pam.d) checking logins against the system's accounts; "
              "enables basic authentication",
              [](HostConfig& c, std::string_view v, Base) { c.pamService = std::string(v); }},
    ConfigKey{"maxRequestBytes", "max-request-bytes", "largest request body accepted (4194304)",
              [](HostConfig& c, std::string_view v, Base) {
                  c.maxRequestBytes = parseNumber<std::size_t>(v, 1024, std::size_t{1} << 30U);
              }},
    ConfigKey{"readTimeout", "read-timeout", "seconds a client may stay silent mid-request (30)",
              [](HostConfig& c, std::string_view v, Base) { c.readTimeout = seconds(v); }},
    ConfigKey{"writeTimeout", "write-timeout", "seconds a response may take to be sent (30)",
              [](HostConfig& c, std::string_view v, Base) { c.writeTimeout = seconds(v); }},
    ConfigKey{"keepaliveTimeout", "keepalive-timeout", "seconds an idle connection is kept (5)",
              [](HostConfig& c, std::string_view v, Base) { c.keepAliveTimeout = seconds(v); }},
    ConfigKey{"keepaliveMaxRequest", "keepalive-max-requests", "requests served on one connection (100)",
              [](HostConfig& c, std::string_view v, Base) {
                  c.keepAliveMaxRequests = parseNumber<std::size_t>(v, 1, 1000000);
              }},
    ConfigKey{"threads", "threads", "worker threads serving requests (8)",
              [](HostConfig& c, std::string_view v, Base) { c.threads = parseNumber<std::size_t>(v, 1, 256); }},
    ConfigKey{"maxClientConnections", "max-client-connections",
              "connections one client address may hold open; more are closed at once (64)",
              [](HostConfig& c, std::string_view v, Base) {
                  c.maxConnectionsPerClient = parseNumber<std::size_t>(v, 1, 100000);
              }},
    ConfigKey{"providerCallLimit", "provider-call-limit",
              "seconds a request may wait for its providers before CIM_ERR_FAILED (60; 0: no limit)",
              [](HostConfig& c, std::string_view v, Base) {
                  c.providerCallLimit = std::chrono::seconds(parseNumber<long>(v, 0, 3600));
              }},
    ConfigKey{"hostName", "host-name", "HOST written in instance paths (this machine's name)",
              [](HostConfig& c, std::string_view v, Base) { c.hostName = std::string(v); }},
    ConfigKey{"arrayNullElements", "array-null-elements",
              "NULL array elements: drop (left out, as sfcb) or value-null (DSP0201 VALUE.NULL) (drop)",
              [](HostConfig& c, std::string_view v, Base) { c.arrayNullElements = arrayNullElements(v); }},
    ConfigKey{"stateDir", "state-dir", "folder keeping indication subscriptions across restarts (<build>/state)",
              [](HostConfig& c, std::string_view v, Base b) { c.stateDir = resolve(v, b); }},
    ConfigKey{"interopMof", "interop-mof", "MOF of the root/interop classes (cim/mof/interop/interop.mof)",
              [](HostConfig& c, std::string_view v, Base b) { c.interopMof = resolve(v, b); }},
    ConfigKey{"preload", "preload", "load and initialize every registered provider at start (false)",
              [](HostConfig& c, std::string_view v, Base) { c.preload = parseSwitch(v); }},
    ConfigKey{"deliveryRetryAttempts", "delivery-retry-attempts",
              "further attempts to deliver an indication after a failed one (3)",
              [](HostConfig& c, std::string_view v, Base) { c.deliveryRetryAttempts = parseNumber<unsigned>(v, 0, 100); }},
    ConfigKey{"deliveryRetryInterval", "delivery-retry-interval", "seconds between two delivery attempts (20)",
              [](HostConfig& c, std::string_view v, Base) { c.deliveryRetryInterval = seconds(v); }},
    ConfigKey{"indicationQueueLimit", "indication-queue-limit",
              "indications waiting per destination before more are dropped (1000)",
              [](HostConfig& c, std::string_view v, Base) {
                  c.indicationQueueLimit = parseNumber<std::size_t>(v, 1, 1000000);
              }},
    ConfigKey{"indicationFlushTimeout", "indication-flush-timeout",
              "seconds the queued indications get at shutdown before they are dropped (5)",
              [](HostConfig& c, std::string_view v, Base) {
                  c.indicationFlushTimeout = std::chrono::seconds(parseNumber<long>(v, 0, 3600));
              }},
};

}  // namespace

std::span<const ConfigKey> configKeys() noexcept {
    return kKeys;
}

const ConfigKey* findByKey(std::string_view key) noexcept {
    for (const auto& entry : kKeys) {
        if (entry.key.size() == key.size() && strncasecmp(entry.key.data(), key.data(), key.size()) == 0) {
            return &entry;
        }
    }
    return nullptr;
}

const ConfigKey* findByOption(std::string_view option) noexcept {
    for (const auto& entry : kKeys) {
        if (entry.option == option) {
            return &entry;
        }
    }
    return nullptr;
}

}  // namespace orv::cimhost::detail
