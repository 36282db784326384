#include "ProviderLibrary.h"

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiProviderBase.h>

#include <dlfcn.h>

#include <stdexcept>

namespace orv::bindingtest {

ProviderLibrary& ProviderLibrary::instance() {
    static ProviderLibrary lib;
    return lib;
}

ProviderLibrary::ProviderLibrary() : handle_(dlopen(ORV_BINDING_TEST_PROVIDER, RTLD_NOW | RTLD_LOCAL)) {
    if (handle_ == nullptr) throw std::runtime_error(std::string("dlopen: ") + dlerror());
}

void* ProviderLibrary::symbol(const std::string& name) const {
    void* sym = dlsym(handle_, name.c_str());
    if (sym == nullptr) throw std::runtime_error("missing symbol " + name);
    return sym;
}

ProviderLibrary::InstanceFactory ProviderLibrary::instanceFactory(const std::string& provider) const {
    return reinterpret_cast<InstanceFactory>(symbol(provider + "_Create_InstanceMI"));
}

CMPIInstanceMI* ProviderLibrary::createInstanceMI(const std::string& provider) const {
    CMPIStatus rc{CMPI_RC_OK, nullptr};
    return instanceFactory(provider)(nullptr, nullptr, &rc);
}

CMPIAssociationMI* ProviderLibrary::createAssociationMI(const std::string& provider) const {
    CMPIStatus rc{CMPI_RC_OK, nullptr};
    auto factory = reinterpret_cast<AssociationFactory>(symbol(provider + "_Create_AssociationMI"));
    return factory(nullptr, nullptr, &rc);
}

void ProviderLibrary::cleanupAll(CMPIInstanceMI* mi) const {
    auto* provider = static_cast<CmpiBaseMI*>(mi->hdl);
    for (int uses = provider->getProviderBase()->getUseCount(); uses > 0; --uses) {
        mi->ft->cleanup(mi, nullptr, 1);
    }
}

unsigned ProviderLibrary::constructions() const {
    return reinterpret_cast<unsigned (*)()>(symbol("bindingTestConstructions"))();
}

unsigned ProviderLibrary::initializations() const {
    return reinterpret_cast<unsigned (*)()>(symbol("bindingTestInitializations"))();
}

}  // namespace orv::bindingtest
