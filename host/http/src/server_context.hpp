// What every connection of the server shares: the options, the handler, the worker pool,
// the per-address counts and the failed-login throttle. Touched from the I/O thread only,
// except the handler, which runs on the workers.
#pragma once

#include <boost/asio/io_context.hpp>

#include <cstddef>
#include <deque>
#include <functional>
#include <string>
#include <unordered_map>
#include <unordered_set>

#include "login_throttle.hpp"
#include "orv/http/http_server.hpp"
#include "worker_pool.hpp"

namespace orv::http::detail {

class SessionBase;

struct ServerContext {
    ServerOptions options;
    Handler handler;
    AccessLog accessLog;
    EventLog eventLog;
    boost::asio::io_context io{1};
    WorkerPool* workers = nullptr;  // set while run() serves
    LoginThrottle logins;
    std::unordered_map<std::string, std::size_t> connectionsPerAddress;
    std::unordered_set<SessionBase*> sessions;
    bool stopping = false;
    // PAM checks on the workers, and the ones waiting for a turn (see Session::checkSystemLogin).
    std::size_t loginChecksRunning = 0;
    std::deque<std::function<void()>> loginChecksWaiting;

    std::size_t loginCheckLimit() const { return options.threads < 2 ? 1 : options.threads / 2; }

    void event(const std::string& line) const {
        if (eventLog) {
            eventLog(line);
        }
    }
};

}  // namespace orv::http::detail
