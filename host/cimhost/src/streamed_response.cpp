#include "streamed_response.hpp"

#include <utility>

namespace orv::cimhost::detail {

StreamedResponse::StreamedResponse(http::ResponseStream& stream, http::Response head)
    : stream_(stream), head_(std::move(head)) {}

bool StreamedResponse::sendIfLarge(cimxml::XmlWriter& out) {
    if (out.str().size() < kPieceBytes) {
        return true;
    }
    return send(out.drain());
}

bool StreamedResponse::sendRest(std::string rest) { return send(std::move(rest)); }

bool StreamedResponse::send(std::string piece) {
    bool first = false;
    {
        std::lock_guard lock(mutex_);
        if (abandoned_) {
            return false;
        }
        first = !begun_;
        begun_ = true;
        ++sending_;
    }
    bool sent = false;
    if (first) {
        http::Response head = head_;
        head.body = std::move(piece);
        sent = stream_.begin(std::move(head));
    } else {
        sent = stream_.write(std::move(piece));  // may wait for the client; abort() ends the wait
    }
    {
        std::lock_guard lock(mutex_);
        --sending_;
    }
    idle_.notify_all();
    return sent;
}

void StreamedResponse::fail() {
    std::lock_guard lock(mutex_);
    if (begun_ && !abandoned_) {
        stream_.abort();
    }
}

bool StreamedResponse::begun() const {
    std::lock_guard lock(mutex_);
    return begun_;
}

bool StreamedResponse::abandon() {
    std::unique_lock lock(mutex_);
    abandoned_ = true;
    if (begun_) {
        stream_.abort();
    }
    // The stream belongs to the connection, which may go once this returns.
    idle_.wait(lock, [this] { return sending_ == 0; });
    return begun_;
}

}  // namespace orv::cimhost::detail
