#include "orv/cimhost/cim_dispatcher.hpp"

#include <strings.h>

#include <array>
#include <utility>

#include "operation_context.hpp"
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/response_writer.hpp"

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
                             std::string hostName)
    : core_(core), classes_(classes), hostName_(std::move(hostName)) {}

std::string CimDispatcher::respond(const cimxml::CimRequest& request, const std::string& principal) const {
    const auto fail = [&request](int code, std::string_view description) {
        return cimxml::errorResponse(request.messageId, request.methodName, request.intrinsic, code, description);
    };
    detail::OperationHandler handler = detail::invokeMethod;
    if (request.intrinsic) {
        const Operation* operation = findOperation(request.methodName);
        if (operation == nullptr) {
            return fail(static_cast<int>(CimStatus::NotSupported),
                        "operation " + request.methodName + " is not supported");
        }
        handler = operation->handler;
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
        detail::OperationContext context{core_, classes_, request, principal,
                                         cimxml::PathDefaults{hostName_, request.nameSpace}, out};
        handler(context);
    } catch (const CimError& error) {
        return fail(error.code(), error.description());
    }
    return cimxml::finishResponse(out);
}

}  // namespace orv::cimhost
