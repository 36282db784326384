// What every operation handler gets, and the handlers of the three operation families.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "orv/cimxml/object_encoder.hpp"
#include "orv/cimxml/request.hpp"
#include "orv/cimxml/xml_writer.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimhost::detail {

class EnumerationRegistry;
class StreamedResponse;

struct OperationContext {
    host::BrokerCore& core;
    const repository::ClassRepository& classes;
    const cimxml::CimRequest& request;
    const std::string& principal;
    cimxml::PathDefaults defaults;  // host and request namespace
    cimxml::XmlWriter& out;         // inside IRETURNVALUE (intrinsic) or METHODRESPONSE
    cimxml::ArrayNullElements arrayNulls;  // how NULL array elements are sent
    // Set when the answer may go out in pieces while the operation runs.
    StreamedResponse* streamed = nullptr;
    EnumerationRegistry* enumerations = nullptr;  // open enumerations of the pull operations
};

using OperationHandler = void (*)(OperationContext& context);

// Class operations (repository).
void getClass(OperationContext& context);
void enumerateClasses(OperationContext& context);
void enumerateClassNames(OperationContext& context);

// Instance operations (broker core).
void getInstance(OperationContext& context);
void enumerateInstances(OperationContext& context);
void enumerateInstanceNames(OperationContext& context);
void createInstance(OperationContext& context);
void modifyInstance(OperationContext& context);
void deleteInstance(OperationContext& context);
void execQuery(OperationContext& context);

// Association operations (broker core).
void associators(OperationContext& context);
void associatorNames(OperationContext& context);
void references(OperationContext& context);
void referenceNames(OperationContext& context);

// Extrinsic method calls (broker core).
void invokeMethod(OperationContext& context);

// Shared helpers.
// Throws CIM_ERR_INVALID_CLASS when the request namespace has no such class.
const repository::ClassDecl& requireClass(const OperationContext& context, const std::string& className);
// Throws CimError with the reply's code and message unless it is OK.
void throwIfFailed(const host::Reply& reply);
// CMPI invocation flags and property list of a request (never LocalOnly: see instance_operations.cpp).
host::CallOptions callOptions(const OperationContext& context, bool deepInheritance,
                              bool includeQualifiers, bool includeClassOrigin,
                              const std::optional<std::vector<std::string>>& propertyList);
// The flags every instance read takes. LocalOnly is deprecated for instances by
// DSP0200 1.3 because servers applied it inconsistently; this host treats it as
// false whatever the client sends: the value is checked to be a boolean, every
// property (inherited ones too) is returned, subject to PropertyList and
// DeepInheritance, and providers never see CMPI_FLAG_LocalOnly.
struct ReadFlags {
    bool includeQualifiers;
    bool includeClassOrigin;
    std::optional<std::vector<std::string>> propertyList;
};
ReadFlags readFlags(const cimxml::CimRequest& request);
// Without deep inheritance only the requested class's own properties are returned.
std::optional<std::vector<std::string>> shallowPropertyList(const repository::ClassDecl& cls,
                                                            const std::optional<std::vector<std::string>>& requested);
// Encoding of returned instances: class origins and property list from the request; the
// declarations of `expectedClass` (the class most answers are instances of) looked up once.
cimxml::InstanceEncoding instanceEncoding(const OperationContext& context, bool includeClassOrigin,
                                          std::optional<std::vector<std::string>> propertyList,
                                          std::string_view expectedClass = {});

}  // namespace orv::cimhost::detail
