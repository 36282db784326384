// Extrinsic method calls (METHODCALL): the method is looked up in the class of the
// target, its input parameters converted to the declared types, and the call sent
// through the broker core to the method provider. The response carries RETURNVALUE
// and one PARAMVALUE per output argument.
#include "cmpi_builder.hpp"
#include "operation_context.hpp"
#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/method_encoder.hpp"

namespace orv::cimhost::detail {

using cimxml::CimError;
using cimxml::CimStatus;

namespace {

const repository::MethodDecl& requireMethod(const repository::ClassDecl& cls, const std::string& name) {
    const repository::MethodDecl* method = cls.findMethod(name);
    if (method == nullptr) {
        throw CimError(CimStatus::MethodNotFound, "class " + cls.name + " has no method " + name);
    }
    return *method;
}

// The return value a provider gave (the first data item), if any.
const CMPIData* returnedValue(const host::Reply& reply) {
    for (const host::ReturnedItem& item : reply.items()) {
        if (item.kind == host::ReturnedItem::Kind::Data) {
            return &item.data;
        }
    }
    return nullptr;
}

}  // namespace

void invokeMethod(OperationContext& context) {
    const cimxml::CimRequest& request = context.request;
    const repository::ClassDecl& cls = requireClass(context, request.target.className);
    const repository::MethodDecl& method = requireMethod(cls, request.methodName);
    const CMPIBroker* broker = context.core.broker();
    CMPIObjectPath* target = buildObjectPath(broker, context.classes, request.nameSpace, request.target);
    CMPIArgs* in = buildArgs(broker, context.classes, request.nameSpace, method, request.params);
    host::Reply reply = context.core.invokeMethod(target, method.name.c_str(), in,
                                                  callOptions(context, false, false, false, {}));
    throwIfFailed(reply);
    if (const CMPIData* value = returnedValue(reply)) {
        cimxml::writeReturnValue(context.out, *value, context.arrayNulls);
    }
    cimxml::writeOutArguments(context.out, reply.outArgs(), context.arrayNulls);
}

}  // namespace orv::cimhost::detail
