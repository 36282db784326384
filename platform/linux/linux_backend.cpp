#include "linux_backend.hpp"

#include "orv/platform/Paths.h"
#include "orv/platform/backend/Selector.h"

#include <cstdlib>

namespace orv::linuxhost {

LinuxBackend::LinuxBackend(LinuxRoots roots, std::string fileRoot, bool hypervisorKernel)
    : network_(roots.sys, std::make_shared<IoctlEthtoolChannel>(), std::make_shared<GenlEthtoolChannel>()),
      ksi_(roots),
      version_(fileRoot, hypervisorKernel)
{
    host_.setFileRoot(std::move(fileRoot));
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
        return std::make_unique<linuxhost::LinuxBackend>(roots, fileRoot, hypervisor);
    } catch (const std::exception& failure) {
        error = std::string("the linux platform substitute cannot start: ") + failure.what();
        return nullptr;
    }
}

}  // namespace orv::platform
