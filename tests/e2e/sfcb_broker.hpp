// The stock sfcb broker serving the project's provider library, for the
// two-broker tests. sfcb/sfcb_broker.sh does the work (build once, stage,
// start, stop); this class finds or starts an sfcbd and checks its health.
#pragma once

#include <string>
#include <vector>

namespace orv::e2e {

// What a private sfcbd stages beside the project's library: further provider
// libraries with their registration and class files, and the DMTF schema files
// (relative to sfcb's schema folder) of classes a provider serves itself, which
// sfcb keeps only when a staged file names them.
struct SfcbStaging {
    std::vector<std::string> libraries;
    std::vector<std::string> registrations;
    std::vector<std::string> mofs;
    std::vector<std::string> schemaMofs;
};

class SfcbBroker {
public:
    // The sfcbd the CTest fixture "sfcb" started (test SfcbBrokerStart) in
    // BUILD/sfcb/shared; it is stopped by the fixture's clean-up, not by this object.
    static SfcbBroker shared();
    // Starts a private sfcbd in runDir on a free port, serving the simulated
    // host `fixture` (empty: the shipped example host), with ORV_ROOT=`root` in its
    // environment (empty: tests/e2e/data/root), with `staging` beside the library;
    // stopped by the destructor.
    static SfcbBroker start(const std::string& runDir, const std::string& fixture = "", const std::string& root = "",
                            const SfcbStaging& staging = {});

    ~SfcbBroker();
    SfcbBroker(SfcbBroker&& other) noexcept;
    SfcbBroker& operator=(SfcbBroker&&) = delete;
    SfcbBroker(const SfcbBroker&) = delete;
    SfcbBroker& operator=(const SfcbBroker&) = delete;

    // False when sfcb could not be built or found outside CI; reason() says why.
    bool available() const { return port_ > 0; }
    const std::string& reason() const { return reason_; }
    int port() const { return port_; }
    std::string prefix() const { return runDir_ + "/prefix"; }

    // Empty while sfcbd runs with its provider processes and neither its syslog
    // nor its standard error reports a SIGSEGV; else what is wrong, with the logs.
    std::string healthProblem() const;
    // What the providers logged through syslog so far (one line per message,
    // each after a receive time stamp).
    std::string syslog() const;
    // Stops the broker (sfcb-run.sh stop); the exit status of the script.
    int stop();

private:
    SfcbBroker(std::string runDir, bool owned);

    std::string runDir_;
    bool owned_ = false;
    int port_ = -1;
    std::string reason_;
};

// The command line of sfcb/sfcb_broker.sh with its build and source folders.
std::string sfcbBrokerScript(const std::string& command);

}  // namespace orv::e2e
