// Posts export requests to one listener over one kept-alive connection.
#pragma once

#include <chrono>
#include <memory>
#include <optional>
#include <string>

#include "orv/exporter/destination_url.hpp"

namespace orv::exporter {

struct SenderOptions {
    std::chrono::milliseconds connectTimeout{5000};
    std::chrono::milliseconds readTimeout{10000};
    bool verifyPeer = true;
    std::string caFile;
};

class HttpSender {
public:
    HttpSender(const DestinationUrl& url, const SenderOptions& options);
    ~HttpSender();
    HttpSender(const HttpSender&) = delete;
    HttpSender& operator=(const HttpSender&) = delete;

    // Sends one export request body; nullopt when the listener accepted it,
    // otherwise why it failed.
    std::optional<std::string> post(const std::string& body);
    // Breaks off a post() in progress on another thread.
    void interrupt();

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

}  // namespace orv::exporter
