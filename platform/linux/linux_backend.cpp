#include "linux_backend.hpp"

#include "orv/platform/Paths.h"
#include "orv/platform/backend/Selector.h"

#include <cstdlib>

namespace orv::linuxhost {

LinuxBackend::LinuxBackend(LinuxRoots roots, std::string fileRoot, bool hypervisorKernel, bool ethtoolNetlink)
    : network_(roots.sys, std::make_shared<IoctlEthtoolChannel>(),
               ethtoolNetlink ? std::make_shared<GenlEthtoolChannel>() : nullptr),
      health_(roots.sys, roots.dev),
      ksi_(roots),
      version_(std::move(fileRoot), hypervisorKernel)
{
}

namespace {

std::chrono::milliseconds loadWindowFromEnvironment()
{
    const char* text = std::getenv("ORV_LINUX_LOAD_WINDOW_MS");
    long value = text ? std::strtol(text, nullptr, 10) : 50;
    return std::chrono::milliseconds(value > 0 && value <= 10000 ? value : 50);
}

}  // namespace

}  // namespace orv::linuxhost

namespace orv::platform {

std::unique_ptr<Backend> makeLinuxBackend(std::string& error)
{
    try {
        linuxhost::LinuxRoots roots;
        roots.loadWindow = linuxhost::loadWindowFromEnvironment();
        std::string fileRoot = orvRootPath("/");
        if (!fileRoot.empty() && fileRoot.back() == '/') fileRoot.pop_back();
        const bool hypervisor = linuxhost::parseHostTypeSetting(std::getenv("ORV_LINUX_HYPERVISOR_KERNEL"));
        const bool netlink = linuxhost::parseHostTypeSetting(std::getenv("ORV_LINUX_ETHTOOL_NETLINK"));
        return std::make_unique<linuxhost::LinuxBackend>(roots, fileRoot, hypervisor, netlink);
    } catch (const std::exception& failure) {
        error = std::string("the linux platform substitute cannot start: ") + failure.what();
        return nullptr;
    }
}

}  // namespace orv::platform
