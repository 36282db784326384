// What a private sfcbd needs beside the two libraries to serve the fixture's
// elements of the watched hardware classes (the companion library serves them
// in both brokers; the fixtures load it).
#pragma once

#include "sfcb_broker.hpp"

namespace orv::e2e {

// The schema files of the four DMTF classes whose elements the fixture
// reports under their own class, which sfcb would otherwise leave out of its
// repository (an enumeration of a class missing there crashes sfcb's request
// handler and the monitor's up-call finds nothing).
SfcbStaging watchedClassesStaging();

}  // namespace orv::e2e
