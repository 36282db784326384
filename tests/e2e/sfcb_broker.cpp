#include "sfcb_broker.hpp"

#include <signal.h>

#include <cstdlib>
#include <filesystem>
#include <utility>

#include "golden_file.hpp"
#include "host_process.hpp"

namespace orv::e2e {

namespace {

std::string trimmed(std::string text) {
    while (!text.empty() && (text.back() == '\n' || text.back() == ' ')) {
        text.pop_back();
    }
    return text;
}

// `name`='the words' for the script's environment; nothing for an empty list.
std::string environmentList(const char* name, const std::vector<std::string>& words) {
    if (words.empty()) {
        return "";
    }
    std::string value;
    for (const std::string& word : words) {
        value += (value.empty() ? "" : " ") + word;
    }
    return std::string(name) + "='" + value + "' ";
}

bool processAlive(const std::string& pidText) {
    const int pid = std::atoi(pidText.c_str());
    return pid > 0 && kill(pid, 0) == 0;
}

}  // namespace

std::string sfcbBrokerScript(const std::string& command) {
    return sourceDir() + "/tests/e2e/sfcb/sfcb_broker.sh " + command + " '" + buildDir() + "' '" + sourceDir() + "'";
}

SfcbBroker::SfcbBroker(std::string runDir, bool owned) : runDir_(std::move(runDir)), owned_(owned) {
    const std::string port = trimmed(readFile(runDir_ + "/port"));
    if (!port.empty()) {
        port_ = std::stoi(port);
        return;
    }
    reason_ = trimmed(readFile(buildDir() + "/sfcb/unavailable"));
    if (reason_.empty()) {
        reason_ = "no sfcbd is running in " + runDir_;
    }
}

SfcbBroker SfcbBroker::shared() { return SfcbBroker(buildDir() + "/sfcb/shared", false); }

SfcbBroker SfcbBroker::start(const std::string& runDir, const std::string& fixture, const std::string& root,
                              const SfcbStaging& staging) {
    const std::string environment = (root.empty() ? "" : "ORV_SFCB_ROOT='" + root + "' ") +
                                    environmentList("ORV_SFCB_EXTRA_LIBRARIES", staging.libraries) +
                                    environmentList("ORV_SFCB_EXTRA_REGISTRATIONS", staging.registrations) +
                                    environmentList("ORV_SFCB_EXTRA_MOFS", staging.mofs) +
                                    environmentList("ORV_SFCB_SCHEMA_MOFS", staging.schemaMofs);
    const std::string output = runCommand(environment + sfcbBrokerScript("start") + " '" + runDir + "' " +
                                          (fixture.empty() ? "" : "'" + fixture + "'"));
    SfcbBroker broker(runDir, true);
    if (!broker.available()) {
        broker.reason_ += "\n" + output;
    }
    return broker;
}

SfcbBroker::SfcbBroker(SfcbBroker&& other) noexcept
    : runDir_(std::move(other.runDir_)), owned_(other.owned_), port_(other.port_), reason_(std::move(other.reason_)) {
    other.owned_ = false;
}

SfcbBroker::~SfcbBroker() {
    if (owned_) {
        stop();
    }
}

int SfcbBroker::stop() {
    owned_ = false;
    return std::system((sfcbBrokerScript("stop") + " '" + runDir_ + "' >/dev/null 2>&1").c_str());
}

std::string SfcbBroker::syslog() const { return readFile(prefix() + "/log/syslog.log"); }

std::string SfcbBroker::healthProblem() const {
    const std::string pid = trimmed(readFile(prefix() + "/log/sfcbd.pid"));
    const std::string standardError = readFile(prefix() + "/log/sfcbd.out");
    const std::string logs = "\n--- syslog:\n" + syslog() + "--- standard error:\n" + standardError;
    if (!processAlive(pid)) {
        return "sfcbd (" + pid + ") is not running" + logs;
    }
    // sfcbd, its syslog collector's namespace shell, and the request handler and provider
    // processes it forks all share one session.
    const std::string processes = runCommand("ps -o pid=,comm= -s " + pid);
    if (processes.find("sfcbd") == std::string::npos) {
        return "no sfcbd process left in session " + pid + logs;
    }
    if (syslog().find("SIGSEGV") != std::string::npos || standardError.find("SIGSEGV") != std::string::npos) {
        return "sfcb reports a SIGSEGV" + logs;
    }
    return "";
}

}  // namespace orv::e2e
