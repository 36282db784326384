// The Linux substitute's hardware health: each watched class answered by its
// own reader, reading only that class's source.
#pragma once

#include "orv/platform/backend/Backend.h"

#include <string>

namespace orv::linuxhost {

class LinuxHealth final : public orv::platform::HealthBackend {
public:
    // sysRoot stands for /sys, devRoot for /dev (the drives' SMART queries).
    LinuxHealth(std::string sysRoot, std::string devRoot);
    // Empty for a class this host has nothing for (the processors, which the
    // processor provider serves, and any class not watched).
    std::vector<orv::platform::HealthElement> elements(const std::string& watchedClass) override;

private:
    std::string sysRoot_;
    std::string devRoot_;
};

}  // namespace orv::linuxhost
