// A CIM-XML listener inside the test process, on a free loopback port, whose answers
// the test chooses: accept, fail with an HTTP status or a CIM error, or hold every
// request until released.
#pragma once

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "orv/http/http_server.hpp"

namespace orv::exporter::test {

class TestListener {
public:
    enum class Answer { Accept, HttpError, CimError, Garbage };

    // keepAlive: how long the listener keeps an idle connection open.
    explicit TestListener(std::chrono::seconds keepAlive = std::chrono::seconds(5));
    ~TestListener();

    std::string url() const;
    // How the next requests are answered.
    void answer(Answer answer);
    // Requests wait (inside the listener) until release().
    void hold();
    void release();
    // Waits up to 10 s until `count` requests were received (accepted or not).
    bool waitForRequests(std::size_t count);
    // Waits up to 10 s until a request is being held.
    bool waitForHeld();

    // Class name of the NewIndication of every accepted request, in arrival order.
    std::vector<std::string> accepted() const;
    std::size_t requests() const;
    std::vector<http::Request> rawRequests() const;

private:
    http::Response serve(const http::Request& request);

    mutable std::mutex mutex_;
    std::condition_variable changed_;
    Answer answer_ = Answer::Accept;
    bool holding_ = false;
    std::size_t held_ = 0;
    std::vector<std::string> accepted_;
    std::vector<http::Request> raw_;
    std::unique_ptr<http::HttpServer> server_;
    std::thread thread_;
};

// An INSTANCE element of an indication class, with one string property.
std::string indicationXml(const std::string& className, const std::string& text = "x");

}  // namespace orv::exporter::test
