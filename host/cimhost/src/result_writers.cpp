#include "result_writers.hpp"

#include "cmpi_builder.hpp"

namespace orv::cimhost::detail {

namespace {

const CMPIObjectPath* pathOf(const CMPIInstance* instance) {
    return instance->ft->getObjectPath(instance, nullptr);
}

}  // namespace

void writeNamedInstance(OperationContext& context, const CMPIInstance* instance,
                        const cimxml::InstanceEncoding& encoding) {
    context.out.open("VALUE.NAMEDINSTANCE");
    cimxml::writeInstanceName(context.out, pathOf(instance));
    cimxml::writeInstance(context.out, instance, encoding);
    context.out.close();
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
        context.out.open("VALUE.OBJECTWITHPATH");
        cimxml::writeInstancePath(context.out, pathOf(instance), context.defaults);
        cimxml::writeInstance(context.out, instance, encoding);
        context.out.close();
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
