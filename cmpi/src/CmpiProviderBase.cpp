#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiProviderBase.h>

CmpiProviderBase::~CmpiProviderBase() { delete baseMI; }
