// Handlers of the pull operations (DSP0200 1.3).
#pragma once

#include "operation_context.hpp"

namespace orv::cimhost::detail {

void openEnumerateInstances(OperationContext& context);
void openEnumerateInstancePaths(OperationContext& context);
void openAssociatorInstances(OperationContext& context);
void openAssociatorInstancePaths(OperationContext& context);
void openReferenceInstances(OperationContext& context);
void openReferenceInstancePaths(OperationContext& context);
void openQueryInstances(OperationContext& context);
void pullInstancesWithPath(OperationContext& context);
void pullInstancePaths(OperationContext& context);
void pullInstances(OperationContext& context);
void closeEnumeration(OperationContext& context);
void enumerationCount(OperationContext& context);

}  // namespace orv::cimhost::detail
