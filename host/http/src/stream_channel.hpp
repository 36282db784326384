// The two ends of a streamed response body: the handler's thread produces (begin, write,
// abort, end) and the connection's I/O thread consumes (take, written, close). The
// producer is held back while `limit` bytes wait; every change the consumer must see
// calls `wake`, at most once until the consumer takes what is there. A whole answer given
// early (answer) reaches the consumer the same way, and the handler's own answer is then
// dropped (settle).
#pragma once

#include <condition_variable>
#include <cstddef>
#include <functional>
#include <mutex>
#include <optional>
#include <string>

#include "orv/http/http_server.hpp"
#include "worker_pool.hpp"

namespace orv::http::detail {

class StreamChannel final : public ResponseStream {
public:
    StreamChannel(std::size_t limit, std::function<void()> wake);

    // Producer side.
    bool begin(Response head) override;
    bool write(std::string piece) override;
    void abort() override;
    bool begun() const override;
    bool answer(Response whole) override;
    void release() override;
    // The worker running the handler (for release); set when the handler starts.
    void runOn(WorkerPool& pool, WorkerPool::Worker* worker);
    // The handler returned: false when its answer was given early (drop what it returned).
    bool settle();
    // The handler returned: the body is complete.
    void end();

    // Consumer side.
    struct Batch {
        std::optional<Response> head;  // the first batch of a begun stream
        std::optional<Response> whole; // an answer given early: the complete response
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
    std::optional<Response> whole_;
    WorkerPool* pool_ = nullptr;
    WorkerPool::Worker* worker_ = nullptr;
    std::string pending_;
    bool begun_ = false;
    bool ended_ = false;
    bool aborted_ = false;
    bool closed_ = false;
    bool answered_ = false;  // answer() took the place of the handler's answer
    bool settled_ = false;   // the handler returned
    bool wakePending_ = false;
};

}  // namespace orv::http::detail
