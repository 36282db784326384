// The binding's test provider library, loaded once per test process the way
// a broker loads a provider library.
#ifndef ORV_TESTS_BINDING_PROVIDERLIBRARY_H
#define ORV_TESTS_BINDING_PROVIDERLIBRARY_H

#include <cmpift.h>

#include <string>

namespace orv::bindingtest {

class ProviderLibrary {
public:
    using InstanceFactory = CMPIInstanceMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
    using AssociationFactory = CMPIAssociationMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

    static ProviderLibrary& instance();

    InstanceFactory instanceFactory(const std::string& provider) const;
    // Calls <provider>_Create_InstanceMI / _AssociationMI with no broker and no context.
    CMPIInstanceMI* createInstanceMI(const std::string& provider) const;
    CMPIAssociationMI* createAssociationMI(const std::string& provider) const;
    // Releases every use of the object behind mi with terminating cleanups.
    void cleanupAll(CMPIInstanceMI* mi) const;

    // ElementProvider objects built and initialize calls made so far.
    unsigned constructions() const;
    unsigned initializations() const;

private:
    ProviderLibrary();
    void* symbol(const std::string& name) const;
    void* handle_;
};

}  // namespace orv::bindingtest

#endif
