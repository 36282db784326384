#include <cmpi/CmpiFactory.h>

#include <cstdio>
#include <typeinfo>

namespace CmpiFactory {

void writeInstanceTrace() { std::fprintf(stderr, "--- _Create_InstanceMI() %s\n", typeid(CmpiBaseMI*).name()); }

}  // namespace CmpiFactory
