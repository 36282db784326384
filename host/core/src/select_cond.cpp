#include "select_exp.hpp"
#include "string.hpp"
#include "value_text.hpp"

namespace orv::host::detail {

namespace {

// SelectCond ------------------------------------------------------------

CMPIStatus releaseCond(CMPISelectCond* cond) { return releaseAny(cond, &kSelectCondFT); }

CMPISelectCond* cloneCond(const CMPISelectCond* cond, CMPIStatus* rc) {
    SelectCondImpl* c = implOf<SelectCondImpl>(cond, &kSelectCondFT);
    setRc(rc, c != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return c != nullptr ? newSelectCond(*c, Owner::Caller) : nullptr;
}

CMPICount getCountAndType(const CMPISelectCond* cond, int* type, CMPIStatus* rc) {
    SelectCondImpl* c = implOf<SelectCondImpl>(cond, &kSelectCondFT);
    if (c == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return 0;
    }
    if (type != nullptr) {
        *type = c->type;
    }
    setRc(rc, CMPI_RC_OK);
    return static_cast<CMPICount>(c->groups.size());
}

CMPISubCond* getSubCondAt(const CMPISelectCond* cond, CMPICount index, CMPIStatus* rc) {
    SelectCondImpl* c = implOf<SelectCondImpl>(cond, &kSelectCondFT);
    if (c == nullptr || index >= c->groups.size()) {
        setRc(rc, c == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_NOT_FOUND);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newSubCond(c->groups[index], Owner::Arena);
}

// SubCond ---------------------------------------------------------------

CMPIStatus releaseSub(CMPISubCond* sub) { return releaseAny(sub, &kSubCondFT); }

CMPISubCond* cloneSub(const CMPISubCond* sub, CMPIStatus* rc) {
    Conjunction* s = implOf<Conjunction>(sub, &kSubCondFT);
    setRc(rc, s != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return s != nullptr ? newSubCond(*s, Owner::Caller) : nullptr;
}

CMPICount getCount(const CMPISubCond* sub, CMPIStatus* rc) {
    Conjunction* s = implOf<Conjunction>(sub, &kSubCondFT);
    setRc(rc, s != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return s != nullptr ? static_cast<CMPICount>(s->size()) : 0;
}

CMPIPredicate* getPredicateAt(const CMPISubCond* sub, CMPICount index, CMPIStatus* rc) {
    Conjunction* s = implOf<Conjunction>(sub, &kSubCondFT);
    if (s == nullptr || index >= s->size()) {
        setRc(rc, s == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_NOT_FOUND);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newPredicate((*s)[index], Owner::Arena);
}

// The first predicate on the named property.
CMPIPredicate* getPredicate(const CMPISubCond* sub, const char* name, CMPIStatus* rc) {
    Conjunction* s = implOf<Conjunction>(sub, &kSubCondFT);
    if (s == nullptr || name == nullptr) {
        setRc(rc, s == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return nullptr;
    }
    for (const Predicate& predicate : *s) {
        if (predicate.lhs == name) {
            setRc(rc, CMPI_RC_OK);
            return newPredicate(predicate, Owner::Arena);
        }
    }
    setRc(rc, CMPI_RC_ERR_NOT_FOUND);
    return nullptr;
}

// Predicate -------------------------------------------------------------

CMPIStatus releasePredicate(CMPIPredicate* predicate) { return releaseAny(predicate, &kPredicateFT); }

CMPIPredicate* clonePredicate(const CMPIPredicate* predicate, CMPIStatus* rc) {
    Predicate* p = implOf<Predicate>(predicate, &kPredicateFT);
    setRc(rc, p != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return p != nullptr ? newPredicate(*p, Owner::Caller) : nullptr;
}

CMPIStatus getData(const CMPIPredicate* predicate, CMPIType* type, CMPIPredOp* op, CMPIString** lhs,
                   CMPIString** rhs) {
    Predicate* p = implOf<Predicate>(predicate, &kPredicateFT);
    if (p == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    if (type != nullptr) *type = p->type;
    if (op != nullptr) *op = p->op;
    if (lhs != nullptr) *lhs = newString(p->lhs, Owner::Arena);
    if (rhs != nullptr) *rhs = newString(p->rhs, Owner::Arena);
    return okStatus();
}

CMPIBoolean predicateUsingAccessor(const CMPIPredicate* predicate, CMPIAccessor* accessor, void* parm,
                                   CMPIStatus* rc) {
    Predicate* p = implOf<Predicate>(predicate, &kPredicateFT);
    if (p == nullptr || accessor == nullptr) {
        setRc(rc, p == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return 0;
    }
    CMPIData data = accessor(p->lhs.c_str(), parm);
    bool isNull = (data.state & (CMPI_nullValue | CMPI_notFound)) != 0;
    setRc(rc, CMPI_RC_OK);
    return static_cast<CMPIBoolean>(predicateHolds(*p, isNull ? std::string() : valueText(data), isNull));
}

}  // namespace

const CMPISelectCondFT kSelectCondFT = {1, releaseCond, cloneCond, getCountAndType, getSubCondAt};
const CMPISubCondFT kSubCondFT = {1, releaseSub, cloneSub, getCount, getPredicateAt, getPredicate};
const CMPIPredicateFT kPredicateFT = {1, releasePredicate, clonePredicate, getData, predicateUsingAccessor};

CMPISelectCond* newSelectCond(SelectCondImpl cond, Owner owner) {
    return makeObject<CMPISelectCond, SelectCondImpl>(&kSelectCondFT, owner, std::move(cond));
}

CMPISubCond* newSubCond(Conjunction predicates, Owner owner) {
    return makeObject<CMPISubCond, Conjunction>(&kSubCondFT, owner, std::move(predicates));
}

CMPIPredicate* newPredicate(Predicate predicate, Owner owner) {
    return makeObject<CMPIPredicate, Predicate>(&kPredicateFT, owner, std::move(predicate));
}

}  // namespace orv::host::detail
