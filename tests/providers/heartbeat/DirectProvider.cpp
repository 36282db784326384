#include "DirectProvider.h"

#include <dlfcn.h>

#include <stdexcept>
#include <string>

namespace heartbeat {
namespace {

using IndicationFactory = CMPIIndicationMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

// The one DirectProvider of the process, for the static deliver slot.
DirectProvider* current = nullptr;

}  // namespace

DirectProvider::DirectProvider(const CMPIBroker* core, HeartbeatLog& log, std::set<std::uint32_t> failing)
    : log_(log), failing_(std::move(failing)) {
    table_ = *core->bft;
    table_.deliverIndication = &DirectProvider::deliver;
    table_.prepareAttachThread = &DirectProvider::prepare;
    contextTable_.ftVersion = CMPICurrentVersion;
    contextTable_.release = &DirectProvider::releaseContext;
    threadContext_.ft = &contextTable_;
    broker_ = *core;
    broker_.bft = &table_;
    current = this;
    const std::filesystem::path file = orv::providertest::ProviderCore::providerDir() / "liborvprovider.so";
    library_ = ::dlopen(file.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (library_ == nullptr) {
        throw std::runtime_error(std::string("cannot load the provider library: ") + ::dlerror());
    }
}

DirectProvider::~DirectProvider() {
    if (mi_ != nullptr && !terminated_) {
        (void)cleanup(true);
    }
    ::dlclose(library_);
    current = nullptr;
}

CMPIIndicationMI* DirectProvider::create() {
    auto factory = reinterpret_cast<IndicationFactory>(::dlsym(library_, "Orvane_CIMHeartbeat_Create_IndicationMI"));
    if (factory == nullptr) {
        throw std::runtime_error("no heartbeat factory");
    }
    CMPIStatus status{CMPI_RC_OK, nullptr};
    mi_ = factory(&broker_, nullptr, &status);
    return mi_;
}

CMPIStatus DirectProvider::cleanup(bool terminating) {
    terminated_ = terminated_ || terminating;
    return mi_->ft->cleanup(mi_, nullptr, terminating ? 1 : 0);
}

bool DirectProvider::threadFinished() const { return contextReleased_.load(); }

CMPIContext* DirectProvider::prepare(const CMPIBroker* /*mb*/, const CMPIContext* /*ctx*/) {
    return &current->threadContext_;
}

CMPIStatus DirectProvider::releaseContext(CMPIContext* /*ctx*/) {
    current->contextReleased_.store(true);
    return CMPIStatus{CMPI_RC_OK, nullptr};
}

CMPIStatus DirectProvider::deliver(const CMPIBroker* /*mb*/, const CMPIContext* /*ctx*/, const char* ns,
                                   const CMPIInstance* indication) {
    ReceivedHeartbeat heartbeat = readHeartbeat(ns, indication);
    const bool fail = heartbeat.stamp && current->failing_.count(*heartbeat.stamp) != 0;
    current->log_.add(heartbeat);
    return CMPIStatus{fail ? CMPI_RC_ERR_FAILED : CMPI_RC_OK, nullptr};
}

}  // namespace heartbeat
