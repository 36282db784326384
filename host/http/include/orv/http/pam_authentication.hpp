// Checks a user name and password against the system's accounts through PAM: one
// transaction of the configured service per check (authenticate, then the account's
// validity). A check blocks for as long as the service's modules take, so the server runs
// it on a worker, never on its I/O thread. Thread-safe: every check has its own handle.
#pragma once

#include <string>
#include <string_view>

namespace orv::http {

class PamAuthentication {
public:
    // Throws std::runtime_error when the service has no file in /etc/pam.d (or in
    // /usr/lib/pam.d), which would silently fall back to the "other" service.
    explicit PamAuthentication(std::string service);

    const std::string& service() const noexcept { return service_; }
    // True when the service's auth and account modules accept the user with this password.
    bool check(std::string_view user, std::string_view password) const;

private:
    std::string service_;
};

}  // namespace orv::http
