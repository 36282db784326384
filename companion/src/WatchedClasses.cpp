#include "WatchedClasses.h"

#include <strings.h>

#include <functional>

namespace hwhealth {

namespace {

using orv::platform::HealthElement;

bool sameName(const char* left, const char* right) { return ::strcasecmp(left, right) == 0; }

// True when the class named `className` is `ancestor` or derives from it, as
// the broker's class repository tells.
bool isA(const CmpiString& nameSpace, const char* className, const char* ancestor) {
    return sameName(className, ancestor) || CmpiObjectPath(nameSpace, className).classPathIsA(ancestor);
}

bool hasOwnClass(const WatchedClass& watched) { return !sameName(watched.watched, watched.served); }

using Keep = std::function<bool(const HealthElement&)>;

Selection select(const WatchedClass& watched, const Keep& keep) {
    Selection selection;
    selection.watched = &watched;
    for (HealthElement& element : orv::platform::healthElementsOf(watched.watched)) {
        if (keep(element)) {
            selection.elements.push_back(std::move(element));
        }
    }
    return selection;
}

}  // namespace

const std::vector<WatchedClass>& watchedClasses() {
    static const std::vector<WatchedClass> kClasses = {
        {"CIM_Sensor", "Orvane_NumericSensor", true},
        {"CIM_PhysicalMemory", "Orvane_PhysicalMemory", false},
        {"CIM_Processor", "CIM_Processor", true},
        {"CIM_PowerSupply", "Orvane_PowerSupply", true},
        {"Orvane_PortController", "Orvane_PortController", true},
        {"Orvane_Controller", "Orvane_Controller", true},
        {"Orvane_Battery", "Orvane_Battery", true},
        {"Orvane_StorageVolume", "Orvane_StorageVolume", true},
        {"Orvane_StorageExtent", "Orvane_StorageExtent", true},
        {"Orvane_DiskDrive", "Orvane_DiskDrive", true},
        {"Orvane_SASSATAPort", "Orvane_SASSATAPort", true},
        {"Orvane_StoragePool", "Orvane_StoragePool", false},
    };
    return kClasses;
}

Selection elementsFor(const CmpiObjectPath& request) {
    const CmpiString nameSpace = request.getNameSpace();
    const CmpiString requested = request.getClassName();
    const char* name = requested.charPtr();
    auto isOwn = [&](const WatchedClass& watched) {
        return [&nameSpace, &watched](const HealthElement& element) {
            return isA(nameSpace, element.className.c_str(), watched.served);
        };
    };
    // The registered classes first: a request with one of their names.
    for (const WatchedClass& watched : watchedClasses()) {
        if (!hasOwnClass(watched) && sameName(name, watched.watched)) {
            return select(watched, [](const HealthElement&) { return true; });
        }
        if (sameName(name, watched.served)) {
            return select(watched, isOwn(watched));
        }
        if (sameName(name, watched.watched)) {
            return select(watched, [&](const HealthElement& element) { return !isOwn(watched)(element); });
        }
    }
    // A class below one of them that this library does not register, reached
    // through the registration of its nearest registered superclass.
    for (const WatchedClass& watched : watchedClasses()) {
        if (request.classPathIsA(watched.served)) {
            return select(watched, [&](const HealthElement& element) {
                return isA(nameSpace, element.className.c_str(), name);
            });
        }
        if (hasOwnClass(watched) && request.classPathIsA(watched.watched)) {
            return select(watched, [&](const HealthElement& element) {
                return isA(nameSpace, element.className.c_str(), name) && !isOwn(watched)(element);
            });
        }
    }
    return {};
}

}  // namespace hwhealth
