// The element forms operation responses wrap returned objects in.
#pragma once

#include "operation_context.hpp"

namespace orv::cimhost::detail {

// VALUE.NAMEDINSTANCE (INSTANCENAME + INSTANCE) of one instance.
void writeNamedInstance(OperationContext& context, const CMPIInstance* instance,
                        const cimxml::InstanceEncoding& encoding);
// VALUE.NAMEDINSTANCE (INSTANCENAME + INSTANCE) per returned instance.
void writeNamedInstances(OperationContext& context, const host::Reply& reply,
                         const cimxml::InstanceEncoding& encoding);
// VALUE.OBJECTWITHPATH (INSTANCEPATH + INSTANCE) per returned instance.
void writeObjectsWithPath(OperationContext& context, const host::Reply& reply,
                          const cimxml::InstanceEncoding& encoding);
// INSTANCENAME per returned object path.
void writeInstanceNames(OperationContext& context, const host::Reply& reply);
// OBJECTPATH (INSTANCEPATH) per returned object path.
void writeObjectPaths(OperationContext& context, const host::Reply& reply);
// The request's class as an object path in the request namespace.
CMPIObjectPath* classPath(const OperationContext& context, const std::string& className);

}  // namespace orv::cimhost::detail
