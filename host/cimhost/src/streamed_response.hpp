// A response document sent in pieces while the operation runs (EnumerateInstances: one
// instance after the other as the provider returns them), so that a large answer is never
// held whole and its first bytes leave early. Nothing is sent before the document passes
// kPieceBytes: a small answer, or a failure early on, still goes out whole (an ERROR
// element with the usual status). Once sent, a failure can no longer become an ERROR
// element: the body is aborted, and the client sees an incomplete answer.
//
// The operation runs on the request's worker; when the call overruns its limit the call
// limiter's watchdog gives the body up (abandon), after which the operation's pieces are
// dropped and it never touches the stream again.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <mutex>
#include <string>

#include "orv/cimxml/xml_writer.hpp"
#include "orv/http/http_server.hpp"

namespace orv::cimhost::detail {

class StreamedResponse {
public:
    static constexpr std::size_t kPieceBytes = 16U << 10U;

    // `head`: status and headers of the answer; its body is not used.
    StreamedResponse(http::ResponseStream& stream, http::Response head);

    // Operation's thread. Sends what `out` holds once it passes kPieceBytes (the head first);
    // false when the client is gone or the body was given up: the operation should stop.
    bool sendIfLarge(cimxml::XmlWriter& out);
    // Operation's thread, at the end of a body that began: sends the rest; false when the client
    // is gone or the body was given up.
    bool sendRest(std::string rest);
    // Operation's thread: it failed after the body began.
    void fail();
    bool begun() const;

    // Another thread: the call overran. Answers whether the body had begun (then it is aborted).
    bool abandon();

private:
    bool send(std::string piece);

    http::ResponseStream& stream_;
    http::Response head_;
    mutable std::mutex mutex_;
    std::condition_variable idle_;
    bool begun_ = false;
    bool abandoned_ = false;
    unsigned sending_ = 0;  // the operation's sends in progress
};

}  // namespace orv::cimhost::detail
