// The same stub provider compiled as C++: the stub macros and the export
// macro must give identical, C-linkage factories from either language.
#include "abi_stub_provider.c"
