#include "select_exp.hpp"

#include "instance.hpp"
#include "names.hpp"
#include "string.hpp"
#include "value_text.hpp"

namespace orv::host::detail {

namespace {

SelectExpImpl* impl(const CMPISelectExp* exp) { return selectExpImpl(exp); }

bool classMatches(const InstanceImpl& inst, const std::string& fromClass) {
    if (equalsNoCase(inst.className, fromClass)) {
        return true;
    }
    return inst.classes != nullptr && inst.classes->isA(inst.nameSpace, inst.className, fromClass);
}

// "prop ISA Class": the property holds an embedded instance of the class or a subclass.
bool isaHolds(const Predicate& predicate, const NamedValue* property, const InstanceImpl& owner) {
    if (property == nullptr || (property->data.state & CMPI_nullValue) != 0 || property->data.type != CMPI_instance) {
        return false;
    }
    const InstanceImpl* embedded = instanceImpl(property->data.value.inst);
    if (embedded == nullptr) {
        return false;
    }
    bool isa = classMatches(*embedded, predicate.rhs) ||
               (owner.classes != nullptr && owner.classes->isA(owner.nameSpace, embedded->className, predicate.rhs));
    return predicate.op == CMPI_PredOp_Isa ? isa : !isa;
}

bool conjunctionHolds(const Conjunction& group, const InstanceImpl& inst) {
    for (const Predicate& predicate : group) {
        const NamedValue* property = inst.properties.find(predicate.lhs);
        if (predicate.op == CMPI_PredOp_Isa || predicate.op == CMPI_PredOp_NotIsa) {
            if (!isaHolds(predicate, property, inst)) {
                return false;
            }
            continue;
        }
        bool isNull = property == nullptr || (property->data.state & CMPI_nullValue) != 0;
        if (!predicateHolds(predicate, isNull ? std::string() : valueText(property->data), isNull)) {
            return false;
        }
    }
    return true;
}

CMPIStatus release(CMPISelectExp* exp) { return releaseAny(exp, &kSelectExpFT); }

CMPISelectExp* clone(const CMPISelectExp* exp, CMPIStatus* rc) {
    CMPISelectExp* copy = cloneSelectExp(exp, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

CMPIBoolean evaluate(const CMPISelectExp* exp, const CMPIInstance* instance, CMPIStatus* rc) {
    SelectExpImpl* e = impl(exp);
    if (e == nullptr || instanceImpl(instance) == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return 0;
    }
    setRc(rc, CMPI_RC_OK);
    return static_cast<CMPIBoolean>(selectExpMatches(*e, instance));
}

CMPIString* getString(const CMPISelectExp* exp, CMPIStatus* rc) {
    SelectExpImpl* e = impl(exp);
    if (e == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newString(e->text, Owner::Arena);
}

CMPISelectCond* getDOC(const CMPISelectExp* exp, CMPIStatus* rc) {
    SelectExpImpl* e = impl(exp);
    if (e == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newSelectCond(SelectCondImpl{e->query.where, CMPI_COND_DOC}, Owner::Arena);
}

// The conjunction of disjunctions, available when the condition is a single
// AND-group or only single-predicate OR-groups (then it is exact).
CMPISelectCond* getCOD(const CMPISelectExp* exp, CMPIStatus* rc) {
    SelectExpImpl* e = impl(exp);
    if (e == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    const std::vector<Conjunction>& where = e->query.where;
    SelectCondImpl cod{{}, CMPI_COND_COD};
    if (where.size() == 1) {
        for (const Predicate& predicate : where.front()) {
            cod.groups.push_back(Conjunction{predicate});
        }
    } else {
        cod.groups.emplace_back();
        for (const Conjunction& group : where) {
            if (group.size() != 1) {
                setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
                return nullptr;
            }
            cod.groups.back().push_back(group.front());
        }
    }
    setRc(rc, CMPI_RC_OK);
    return newSelectCond(std::move(cod), Owner::Arena);
}

// Evaluation through an accessor function: each predicate's property is read
// through the accessor instead of an instance.
CMPIBoolean evaluateUsingAccessor(const CMPISelectExp* exp, CMPIAccessor* accessor, void* parm,
                                  CMPIStatus* rc) {
    SelectExpImpl* e = impl(exp);
    if (e == nullptr || accessor == nullptr) {
        setRc(rc, e == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return 0;
    }
    setRc(rc, CMPI_RC_OK);
    if (e->query.where.empty()) {
        return 1;
    }
    for (const Conjunction& group : e->query.where) {
        bool holds = true;
        for (const Predicate& predicate : group) {
            CMPIData data = accessor(predicate.lhs.c_str(), parm);
            bool isNull = (data.state & (CMPI_nullValue | CMPI_notFound)) != 0;
            holds = holds && predicateHolds(predicate, isNull ? std::string() : valueText(data), isNull);
        }
        if (holds) {
            return 1;
        }
    }
    return 0;
}

}  // namespace

const CMPISelectExpFT kSelectExpFT = {1, release, clone, evaluate, getString, getDOC, getCOD, evaluateUsingAccessor};

CMPISelectExp* newSelectExp(const char* text, const char* language, Owner owner, CMPIStatus* rc) {
    if (text == nullptr || language == nullptr || !(equalsNoCase(language, "WQL") || equalsNoCase(language, "CQL") ||
                                                    equalsNoCase(language, "DMTF:CQL"))) {
        setRc(rc, CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED);
        return nullptr;
    }
    std::string error;
    std::optional<Query> query = parseQuery(text, &error);
    if (!query) {
        setRc(rc, makeStatus(CMPI_RC_ERR_INVALID_QUERY, error.c_str()));
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return makeObject<CMPISelectExp, SelectExpImpl>(&kSelectExpFT, owner,
                                                    SelectExpImpl{text, language, std::move(*query)});
}

SelectExpImpl* selectExpImpl(const CMPISelectExp* exp) noexcept { return implOf<SelectExpImpl>(exp, &kSelectExpFT); }

CMPISelectExp* cloneSelectExp(const CMPISelectExp* exp, Owner owner) {
    SelectExpImpl* e = selectExpImpl(exp);
    return e != nullptr ? makeObject<CMPISelectExp, SelectExpImpl>(&kSelectExpFT, owner, *e) : nullptr;
}

bool selectExpMatches(const SelectExpImpl& exp, const CMPIInstance* instance) {
    return queryMatches(exp.query, instance);
}

bool queryMatches(const Query& query, const CMPIInstance* instance) {
    InstanceImpl* inst = instanceImpl(instance);
    if (inst == nullptr || !classMatches(*inst, query.fromClass)) {
        return false;
    }
    if (query.where.empty()) {
        return true;
    }
    for (const Conjunction& group : query.where) {
        if (conjunctionHolds(group, *inst)) {
            return true;
        }
    }
    return false;
}

}  // namespace orv::host::detail
