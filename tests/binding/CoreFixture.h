// A broker core serving the binding's test providers, and helpers to build
// request paths and read what came back.
#ifndef ORV_TESTS_BINDING_COREFIXTURE_H
#define ORV_TESTS_BINDING_COREFIXTURE_H

#include <orv/host/broker_core.hpp>

#include <cmpi/CmpiBaseMI.h>

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace orv::bindingtest {

class CoreFixture : public ::testing::Test {
protected:
    CoreFixture();
    ~CoreFixture() override;

    // A path in root/cimv2 of class cls with the key Name = name (no key when name is null).
    CMPIObjectPath* path(const char* cls, const char* name = nullptr);

    static std::string text(const CMPIData& d);
    // The string value of the property, or "<missing>" when it is not there.
    static std::string property(const CMPIInstance* inst, const char* name);
    static std::string key(const CMPIObjectPath* op, const char* name);
    static std::string className(const CMPIObjectPath* op);
    // The Name keys of the returned paths, or of the instances' paths.
    static std::vector<std::string> names(const orv::host::Reply& reply);

    std::unique_ptr<orv::host::BrokerCore> core;
    std::unique_ptr<orv::host::ObjectScope> scope;
    // Makes the core's broker the one the binding's constructors in this test process use.
    std::unique_ptr<CmpiBaseMI> brokerHolder;
};

}  // namespace orv::bindingtest

#endif
