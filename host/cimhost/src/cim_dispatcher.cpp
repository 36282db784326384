#include "orv/cimhost/cim_dispatcher.hpp"

#include <strings.h>

#include <array>
#include <utility>

#include "call_limiter.hpp"
#include "enumeration_registry.hpp"
#include "operation_context.hpp"
#include "operation_errors.hpp"
#include "streamed_response.hpp"
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/response_writer.hpp"
#include "pull_operations.hpp"

namespace orv::cimhost {

using cimxml::CimError;
using cimxml::CimStatus;

namespace {

struct Operation {
    std::string_view name;
    detail::OperationHandler handler;
};

constexpr std::array kOperations = {
    Operation{"GetClass", detail::getClass},
    Operation{"EnumerateClasses", detail::enumerateClasses},
    Operation{"EnumerateClassNames", detail::enumerateClassNames},
    Operation{"GetInstance", detail::getInstance},
    Operation{"EnumerateInstances", detail::enumerateInstances},
    Operation{"EnumerateInstanceNames", detail::enumerateInstanceNames},
    Operation{"CreateInstance", detail::createInstance},
    Operation{"ModifyInstance", detail::modifyInstance},
    Operation{"DeleteInstance", detail::deleteInstance},
    Operation{"ExecQuery", detail::execQuery},
    Operation{"Associators", detail::associators},
    Operation{"AssociatorNames", detail::associatorNames},
    Operation{"References", detail::references},
    Operation{"ReferenceNames", detail::referenceNames},
    Operation{"OpenEnumerateInstances", detail::openEnumerateInstances},
    Operation{"OpenEnumerateInstancePaths", detail::openEnumerateInstancePaths},
    Operation{"OpenAssociatorInstances", detail::openAssociatorInstances},
    Operation{"OpenAssociatorInstancePaths", detail::openAssociatorInstancePaths},
    Operation{"OpenReferenceInstances", detail::openReferenceInstances},
    Operation{"OpenReferenceInstancePaths", detail::openReferenceInstancePaths},
    Operation{"OpenQueryInstances", detail::openQueryInstances},
    Operation{"PullInstancesWithPath", detail::pullInstancesWithPath},
    Operation{"PullInstancePaths", detail::pullInstancePaths},
    Operation{"PullInstances", detail::pullInstances},
    Operation{"CloseEnumeration", detail::closeEnumeration},
    Operation{"EnumerationCount", detail::enumerationCount},
};

const Operation* findOperation(const std::string& name) {
    for (const auto& operation : kOperations) {
        if (operation.name.size() == name.size() &&
            strncasecmp(operation.name.data(), name.data(), name.size()) == 0) {
            return &operation;
        }
    }
    return nullptr;
}

}  // namespace

CimDispatcher::CimDispatcher(host::BrokerCore& core, const repository::ClassRepository& classes,
                             std::string hostName, std::chrono::milliseconds callLimit,
                             cimxml::ArrayNullElements arrayNulls)
    : core_(core),
      classes_(classes),
      hostName_(std::move(hostName)),
      arrayNulls_(arrayNulls),
      limiter_(std::make_unique<detail::CallLimiter>(callLimit)),
      enumerations_(std::make_unique<detail::EnumerationRegistry>()) {}

CimDispatcher::~CimDispatcher() = default;

void CimDispatcher::drain() {
    limiter_->drain();
    enumerations_->shutdown();
}

std::size_t CimDispatcher::openEnumerations() const { return enumerations_->openCount(); }

std::string CimDispatcher::respond(const cimxml::CimRequest& request, const std::string& principal) const {
    return respondWithin(request, principal);
}

// With a stream the call runs on this thread: at the limit the watchdog answers the client
// through the stream (or aborts a body that began) and hands this worker's place over.
std::string CimDispatcher::respond(const cimxml::CimRequest& request, const std::string& principal,
                                   http::ResponseStream& stream, const http::Response& head) const {
    auto streamed = std::make_shared<detail::StreamedResponse>(stream, head);
    const std::string owner = principal;  // the connection's request may be reused after an early answer
    return limiter_->runHere([&] { return respondNow(request, owner, streamed.get()); },
                             [&]() noexcept {
                                 try {
                                     if (!streamed->abandon()) {
                                         http::Response whole = head;
                                         whole.body = overrunAnswer(request);
                                         stream.answer(std::move(whole));
                                     }
                                 } catch (...) {
                                     stream.abort();  // no memory for the answer: the connection closes
                                 }
                                 stream.release();
                             });
}

// Without a stream the call runs on a call thread while this one waits up to the limit.
std::string CimDispatcher::respondWithin(const cimxml::CimRequest& request, const std::string& principal) const {
    std::optional<std::string> answer =
        limiter_->run([this, request, principal] { return respondNow(request, principal, nullptr); });
    if (answer) {
        return std::move(*answer);
    }
    return overrunAnswer(request);
}

std::string CimDispatcher::overrunAnswer(const cimxml::CimRequest& request) const {
    const auto limit = std::chrono::duration_cast<std::chrono::seconds>(limiter_->limit());
    return cimxml::errorResponse(request.messageId, request.methodName, request.intrinsic,
                                 static_cast<int>(CimStatus::Failed),
                                 "the request did not finish within the provider call limit of " +
                                     std::to_string(limit.count()) +
                                     " s; the provider call goes on in the background and its result is dropped");
}

std::string CimDispatcher::respondNow(const cimxml::CimRequest& request, const std::string& principal,
                                      detail::StreamedResponse* streamed) const {
    const auto fail = [&request](int code, std::string_view description) {
        return cimxml::errorResponse(request.messageId, request.methodName, request.intrinsic, code, description);
    };
    detail::OperationHandler handler = detail::invokeMethod;
    std::string_view operationName = detail::kMethodCall;
    if (request.intrinsic) {
        const Operation* operation = findOperation(request.methodName);
        if (operation == nullptr) {
            return fail(static_cast<int>(CimStatus::NotSupported),
                        "operation " + request.methodName + " is not supported");
        }
        handler = operation->handler;
        operationName = operation->name;
    }
    if (!classes_.hasNamespace(request.nameSpace)) {
        return fail(static_cast<int>(CimStatus::InvalidNamespace),
                    "namespace " + request.nameSpace + " does not exist");
    }
    cimxml::XmlWriter out;
    cimxml::openResponse(out, request.messageId, request.methodName, request.intrinsic);
    if (request.intrinsic) {
        out.open("IRETURNVALUE");
    }
    try {
        host::ObjectScope scope;
        detail::OperationContext context{core_,    classes_,    request, principal,
                                         cimxml::PathDefaults{hostName_, request.nameSpace},
                                         out,      arrayNulls_, streamed, enumerations_.get()};
        handler(context);
    } catch (const CimError& error) {
        if (streamed != nullptr && streamed->begun()) {
            streamed->fail();  // too late for an ERROR element
            return {};
        }
        return fail(detail::answeredCode(operationName, error.code()), error.description());
    } catch (...) {
        if (streamed != nullptr) {
            streamed->fail();
        }
        throw;
    }
    std::string rest = cimxml::finishResponse(out);
    if (streamed != nullptr && streamed->begun()) {
        streamed->sendRest(std::move(rest));
        return {};
    }
    return rest;
}

}  // namespace orv::cimhost
