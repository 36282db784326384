#include "CoreFixture.h"

#include <cmpimacs.h>

namespace orv::bindingtest {

namespace {

orv::host::CoreConfig testConfig() {
    orv::host::CoreConfig config;
    config.providerDirs = {ORV_BINDING_TEST_PROVIDER_DIR};
    config.registrationFiles = {ORV_BINDING_TEST_DATA_DIR "/BindingTest.reg"};
    config.mofPaths = {ORV_QUALIFIERS_MOF, ORV_BINDING_TEST_DATA_DIR "/BindingTest.mof"};
    return config;
}

}  // namespace

CoreFixture::CoreFixture()
    : core(std::make_unique<orv::host::BrokerCore>(testConfig())),
      scope(std::make_unique<orv::host::ObjectScope>()) {
    brokerHolder = std::make_unique<CmpiBaseMI>(CmpiBroker(core->broker()), CmpiContext(nullptr));
    brokerHolder->setProviderBase(nullptr);
}

CoreFixture::~CoreFixture() {
    scope.reset();
    core->shutdown();
}

CMPIObjectPath* CoreFixture::path(const char* cls, const char* name) {
    const CMPIBroker* b = core->broker();
    CMPIObjectPath* op = b->eft->newObjectPath(b, "root/cimv2", cls, nullptr);
    if (name != nullptr) op->ft->addKey(op, "Name", reinterpret_cast<const CMPIValue*>(name), CMPI_chars);
    return op;
}

std::string CoreFixture::text(const CMPIData& d) {
    if (d.type == CMPI_string && d.value.string != nullptr) return CMGetCharPtr(d.value.string);
    return "<missing>";
}

std::string CoreFixture::property(const CMPIInstance* inst, const char* name) {
    CMPIStatus st{CMPI_RC_OK, nullptr};
    CMPIData d = inst->ft->getProperty(inst, name, &st);
    return st.rc == CMPI_RC_OK ? text(d) : "<missing>";
}

std::string CoreFixture::key(const CMPIObjectPath* op, const char* name) {
    CMPIStatus st{CMPI_RC_OK, nullptr};
    CMPIData d = op->ft->getKey(op, name, &st);
    return st.rc == CMPI_RC_OK ? text(d) : "<missing>";
}

std::string CoreFixture::className(const CMPIObjectPath* op) {
    return CMGetCharPtr(op->ft->getClassName(op, nullptr));
}

std::vector<std::string> CoreFixture::names(const orv::host::Reply& reply) {
    std::vector<std::string> result;
    for (const CMPIObjectPath* op : reply.objectPaths()) result.push_back(key(op, "Name"));
    for (const CMPIInstance* inst : reply.instances()) {
        result.push_back(key(inst->ft->getObjectPath(inst, nullptr), "Name"));
    }
    return result;
}

}  // namespace orv::bindingtest
