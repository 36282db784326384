// The whole host: the platform selection, the broker core with its providers, the
// class repository and the HTTP server, started and stopped as one.
#pragma once

#include <atomic>
#include <memory>

#include "orv/cimhost/host_config.hpp"

namespace orv::cimhost {

class CimHost {
public:
    // Sets ORV_PLATFORM / ORV_SIM_FIXTURE as configured, reads the MOF and the
    // registrations, loads the credentials and binds the listening socket. Throws
    // std::runtime_error with one line saying what could not be started.
    explicit CimHost(const HostConfig& config);
    ~CimHost();
    CimHost(const CimHost&) = delete;
    CimHost& operator=(const CimHost&) = delete;

    // The HTTP and HTTPS ports listened on; -1 for a side that is off.
    int port() const noexcept;
    int httpsPort() const noexcept;
    // Serves until stop(); then lets the requests in flight finish and shuts the
    // providers down (cleanup with terminating = true).
    void run();
    // Asks run() to return; callable from any thread, also before run() started.
    void stop();

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

}  // namespace orv::cimhost
