#include <cmpi/CmpiSelectExp.h>

#include "Check.h"

CmpiString CmpiSelectExp::getString() const {
    CMPISelectExp* se = getEnc();
    return CmpiString(cmpibinding::checked([&](CMPIStatus* st) { return se->ft->getString(se, st); }));
}
