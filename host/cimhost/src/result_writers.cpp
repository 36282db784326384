#include "result_writers.hpp"

#include "cmpi_builder.hpp"

namespace orv::cimhost::detail {

void writeNamedInstance(OperationContext& context, const CMPIInstance* instance,
                        const cimxml::InstanceEncoding& encoding) {
    cimxml::writeNamedInstance(context.out, instance, encoding);
}

void writeNamedInstances(OperationContext& context, const host::Reply& reply,
                         const cimxml::InstanceEncoding& encoding) {
    for (const CMPIInstance* instance : reply.instances()) {
        writeNamedInstance(context, instance, encoding);
    }
}

void writeObjectsWithPath(OperationContext& context, const host::Reply& reply,
                          const cimxml::InstanceEncoding& encoding) {
    for (const CMPIInstance* instance : reply.instances()) {
        cimxml::writeInstanceWithPath(context.out, "VALUE.OBJECTWITHPATH", instance, context.defaults, encoding);
    }
}

void writeInstanceNames(OperationContext& context, const host::Reply& reply) {
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        cimxml::writeInstanceName(context.out, path);
    }
}

void writeObjectPaths(OperationContext& context, const host::Reply& reply) {
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        context.out.open("OBJECTPATH");
        cimxml::writeInstancePath(context.out, path, context.defaults);
        context.out.close();
    }
}

CMPIObjectPath* classPath(const OperationContext& context, const std::string& className) {
    cimxml::ObjectPathModel model;
    model.className = className;
    return buildObjectPath(context.core.broker(), context.classes, context.request.nameSpace, model);
}

}  // namespace orv::cimhost::detail
