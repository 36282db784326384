#include "SystemHealth.h"

#include <algorithm>
#include <stdexcept>

#include <orv/platform/HealthElements.h>

#include "WatchedClasses.h"

namespace hwhealth {

namespace {

constexpr uint16_t kHealthDegraded = 10;
constexpr uint16_t kHealthMajorFailure = 20;
constexpr uint16_t kHealthNonRecoverable = 30;

constexpr uint16_t kStatusUnknown = 0;
constexpr uint16_t kStatusOk = 2;
constexpr uint16_t kStatusDegraded = 3;
constexpr uint16_t kStatusError = 6;
constexpr uint16_t kStatusNonRecoverable = 7;

}  // namespace

uint16_t rolledUpHealthState() {
    uint16_t worst = kHealthOk;
    bool unreadable = false;
    for (const WatchedClass& watched : watchedClasses()) {
        try {
            for (const orv::platform::HealthElement& element : orv::platform::healthElementsOf(watched.watched)) {
                if (element.healthState && *element.healthState) {
                    worst = std::max(worst, **element.healthState);
                }
            }
        } catch (const std::runtime_error&) {
            unreadable = true;
        }
    }
    return unreadable && worst == kHealthOk ? kHealthUnknown : worst;
}

uint16_t operationalStatusFor(uint16_t healthState) {
    if (healthState >= kHealthNonRecoverable) {
        return kStatusNonRecoverable;
    }
    if (healthState >= kHealthMajorFailure) {
        return kStatusError;
    }
    if (healthState >= kHealthDegraded) {
        return kStatusDegraded;
    }
    return healthState >= kHealthOk ? kStatusOk : kStatusUnknown;
}

}  // namespace hwhealth
