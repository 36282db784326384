// The twelve watched hardware classes and the class of this library that
// serves the elements reported under each, and which of those elements a
// request for a given class reaches.
//
// Both brokers route an enumeration of a class to the provider registered for
// it (or for its nearest registered superclass) and to the provider of every
// registered subclass, each called with its own class name. The library is
// registered for the watched class and for its own subclass of it (for
// example CIM_Sensor and Orvane_NumericSensor), so an element goes to exactly
// one of those calls: the own class takes the elements of its class and
// below, the watched class the others (elements of the watched class itself
// or of classes this library does not register).
#pragma once

#include <string>
#include <vector>

#include <cmpi/CmpiObjectPath.h>
#include <orv/platform/HealthElements.h>

namespace hwhealth {

struct WatchedClass {
    const char* watched;  // the class the platform reports the elements under
    const char* served;   // this library's class of them (the watched class itself for Orvane_ classes)
    bool systemScoped;    // keyed by SystemCreationClassName and SystemName (a CIM_LogicalDevice)
};

const std::vector<WatchedClass>& watchedClasses();

// The watched class whose elements a request for the class of `request`
// reaches, and the elements of it that the request takes, in the platform's
// order. Nothing for a class outside the watched ones. Throws
// std::runtime_error when the platform cannot report them.
struct Selection {
    const WatchedClass* watched = nullptr;
    std::vector<orv::platform::HealthElement> elements;
};
Selection elementsFor(const CmpiObjectPath& request);

}  // namespace hwhealth
