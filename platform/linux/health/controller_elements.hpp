// PCI storage controllers as "Orvane_Controller" and PCI network controllers
// as "Orvane_PortController" elements.
#pragma once

#include "orv/platform/HealthElements.h"
#include "pci_functions.hpp"

#include <vector>

namespace orv::linuxhost::health {

inline constexpr const char* kControllerClass = "Orvane_Controller";
inline constexpr const char* kPortControllerClass = "Orvane_PortController";

// DeviceID "pci:<address>"; ElementName names the vendor and device ids and the driver.
orv::platform::HealthElement controllerElement(const char* className, const PciFunctionHealth& function);
std::vector<orv::platform::HealthElement> storageControllerElements(const std::string& sysRoot);
std::vector<orv::platform::HealthElement> networkControllerElements(const std::string& sysRoot);

}  // namespace orv::linuxhost::health
