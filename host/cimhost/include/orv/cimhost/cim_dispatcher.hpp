// Answers parsed CIM-XML requests: class operations from the class repository,
// instance and association operations through the broker core.
#pragma once

#include <chrono>
#include <memory>
#include <string>

#include "orv/cimxml/object_encoder.hpp"
#include "orv/cimxml/request.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/http/http_server.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimhost {

namespace detail {
class CallLimiter;
class EnumerationRegistry;
class StreamedResponse;
}

class CimDispatcher {
public:
    // `hostName` is the HOST of instance paths whose provider left it out. A non-zero
    // `callLimit` caps how long a request may wait for the providers (see respond).
    // `arrayNulls` says how NULL elements of array values are sent.
    CimDispatcher(host::BrokerCore& core, const repository::ClassRepository& classes, std::string hostName,
                  std::chrono::milliseconds callLimit = {},
                  cimxml::ArrayNullElements arrayNulls = cimxml::ArrayNullElements::Drop);
    ~CimDispatcher();
    CimDispatcher(const CimDispatcher&) = delete;
    CimDispatcher& operator=(const CimDispatcher&) = delete;

    // The whole CIM-XML response document. Failures of the operation become an ERROR
    // element: CIM_ERR_NOT_SUPPORTED for unknown methods, CIM_ERR_INVALID_NAMESPACE,
    // CIM_ERR_INVALID_PARAMETER for wrong parameters, the provider's code and message.
    // A request that overruns the call limit is answered CIM_ERR_FAILED; its provider
    // call cannot be stopped and goes on in the background, its result dropped.
    std::string respond(const cimxml::CimRequest& request, const std::string& principal) const;
    // The same, but a large answer (EnumerateInstances) may go out on `stream` in pieces
    // while the providers run, with the status and headers of `head`: the document is
    // then sent and the returned text is empty (see streamed_response.hpp). The call runs
    // on the calling thread; an overrun is answered through `stream` (answer, release).
    std::string respond(const cimxml::CimRequest& request, const std::string& principal,
                        http::ResponseStream& stream, const http::Response& head) const;
    // Waits for every provider call still running (overrunning ones included), then
    // closes the open enumerations of the pull operations and joins their producers;
    // the host calls it after the server stopped and before the providers are cleaned up.
    void drain();
    // How many enumerations of the pull operations are open now.
    std::size_t openEnumerations() const;

private:
    std::string respondNow(const cimxml::CimRequest& request, const std::string& principal,
                           detail::StreamedResponse* streamed) const;
    std::string respondWithin(const cimxml::CimRequest& request, const std::string& principal) const;
    // The ERROR document of a request that overran the call limit.
    std::string overrunAnswer(const cimxml::CimRequest& request) const;

    host::BrokerCore& core_;
    const repository::ClassRepository& classes_;
    std::string hostName_;
    cimxml::ArrayNullElements arrayNulls_;
    std::unique_ptr<detail::CallLimiter> limiter_;
    std::unique_ptr<detail::EnumerationRegistry> enumerations_;
};

}  // namespace orv::cimhost
