// The two ends of a streamed response body: the handler's thread produces (begin, write,
// abort, end) and the connection's I/O thread consumes (take, written, close). The
// producer is held back while `limit` bytes wait; every change the consumer must see
// calls `wake`, at most once until the consumer takes what is there.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <functional>
#include <mutex>
#include <optional>
#include <string>

#include "orv/http/http_server.hpp"

namespace orv::http::detail {

class StreamChannel final : public ResponseStream {
public:
    StreamChannel(std::size_t limit, std::function<void()> wake);

    // Producer side.
    bool begin(Response head) override;
    bool write(std::string_view piece) override;
    void abort() override;
    bool begun() const override;
    // The handler returned: the body is complete.
    void end();

    // Consumer side.
    struct Batch {
        std::optional<Response> head;  // the first batch of a begun stream
        std::string data;
        bool last = false;     // the body is complete after `data`
        bool aborted = false;  // close the connection without the last chunk
    };
    // What is waiting; the next change calls `wake` again.
    Batch take();
    // The connection is gone: the producer's writes fail from now on.
    void close();

private:
    void wakeLocked();

    const std::size_t limit_;
    const std::function<void()> wake_;
    mutable std::mutex mutex_;
    std::condition_variable space_;
    std::optional<Response> head_;
    std::string pending_;
    bool begun_ = false;
    bool ended_ = false;
    bool aborted_ = false;
    bool closed_ = false;
    bool wakePending_ = false;
};

}  // namespace orv::http::detail
