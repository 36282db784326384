#include "operation_errors.hpp"

#include <strings.h>

#include <array>
#include <cstdint>
#include <initializer_list>

#include "orv/cimxml/cim_status.hpp"

namespace orv::cimhost::detail {

namespace {

using cimxml::CimStatus;

using CodeSet = std::uint32_t;

constexpr CodeSet bit(CimStatus status) { return CodeSet{1} << static_cast<unsigned>(status); }

constexpr CodeSet codes(std::initializer_list<CimStatus> list) {
    CodeSet set = 0;
    for (CimStatus status : list) {
        set |= bit(status);
    }
    return set;
}

// Every operation may answer these.
constexpr CodeSet kAlways = codes({CimStatus::AccessDenied, CimStatus::InvalidNamespace, CimStatus::InvalidParameter,
                                   CimStatus::Failed});
constexpr CodeSet kNotSupported = bit(CimStatus::NotSupported);

struct OperationCodes {
    std::string_view operation;
    CodeSet allowed;  // besides kAlways
};

// DSP0200 1.3, the "error codes" of each operation. CreateInstance also keeps the
// two query codes the Indications profile (DSP1054) names for a filter whose query
// is refused.
constexpr std::array kTable = {
    OperationCodes{"GetClass", codes({CimStatus::NotFound})},
    OperationCodes{"EnumerateClasses", codes({CimStatus::InvalidClass})},
    OperationCodes{"EnumerateClassNames", codes({CimStatus::InvalidClass})},
    OperationCodes{"CreateClass", kNotSupported | codes({CimStatus::AlreadyExists, CimStatus::InvalidSuperclass})},
    OperationCodes{"ModifyClass", kNotSupported | codes({CimStatus::NotFound, CimStatus::InvalidSuperclass,
                                                         CimStatus::ClassHasChildren, CimStatus::ClassHasInstances})},
    OperationCodes{"DeleteClass", kNotSupported | codes({CimStatus::NotFound, CimStatus::ClassHasChildren,
                                                         CimStatus::ClassHasInstances})},
    OperationCodes{"GetInstance", codes({CimStatus::InvalidClass, CimStatus::NotFound})},
    OperationCodes{"EnumerateInstances", kNotSupported | codes({CimStatus::InvalidClass})},
    OperationCodes{"EnumerateInstanceNames", kNotSupported | codes({CimStatus::InvalidClass})},
    OperationCodes{"CreateInstance", kNotSupported | codes({CimStatus::InvalidClass, CimStatus::AlreadyExists,
                                                            CimStatus::QueryLanguageNotSupported,
                                                            CimStatus::InvalidQuery})},
    OperationCodes{"ModifyInstance", kNotSupported | codes({CimStatus::InvalidClass, CimStatus::NotFound})},
    OperationCodes{"DeleteInstance", kNotSupported | codes({CimStatus::InvalidClass, CimStatus::NotFound})},
    OperationCodes{"ExecQuery", kNotSupported | codes({CimStatus::QueryLanguageNotSupported, CimStatus::InvalidQuery})},
    OperationCodes{"Associators", kNotSupported},
    OperationCodes{"AssociatorNames", kNotSupported},
    OperationCodes{"References", kNotSupported},
    OperationCodes{"ReferenceNames", kNotSupported},
    OperationCodes{"GetProperty", codes({CimStatus::InvalidClass, CimStatus::NotFound, CimStatus::NoSuchProperty})},
    OperationCodes{"SetProperty", kNotSupported | codes({CimStatus::InvalidClass, CimStatus::NotFound,
                                                         CimStatus::NoSuchProperty, CimStatus::TypeMismatch})},
    OperationCodes{"GetQualifier", codes({CimStatus::NotFound})},
    OperationCodes{"SetQualifier", kNotSupported},
    OperationCodes{"DeleteQualifier", kNotSupported | codes({CimStatus::NotFound})},
    OperationCodes{"EnumerateQualifiers", kNotSupported},
    OperationCodes{kMethodCall, kNotSupported | codes({CimStatus::NotFound, CimStatus::MethodNotAvailable,
                                                       CimStatus::MethodNotFound})},
};

const OperationCodes* find(std::string_view operation) {
    for (const OperationCodes& entry : kTable) {
        if (entry.operation.size() == operation.size() &&
            strncasecmp(entry.operation.data(), operation.data(), operation.size()) == 0) {
            return &entry;
        }
    }
    return nullptr;
}

// For a code an operation may not answer, the codes that say the most of the same,
// best first. A class that does not exist is an object not found (GetClass, method
// calls), a query naming no class (ExecQuery) or a wrong parameter (associations);
// a missing or mistyped property of a request is a wrong parameter.
struct Nearest {
    CimStatus code;
    std::array<CimStatus, 3> candidates;  // Ok ends a shorter list
};

constexpr std::array kNearest = {
    Nearest{CimStatus::InvalidClass, {CimStatus::NotFound, CimStatus::InvalidQuery, CimStatus::InvalidParameter}},
    Nearest{CimStatus::NotFound, {CimStatus::InvalidParameter}},
    Nearest{CimStatus::NoSuchProperty, {CimStatus::InvalidParameter}},
    Nearest{CimStatus::TypeMismatch, {CimStatus::InvalidParameter}},
    Nearest{CimStatus::InvalidSuperclass, {CimStatus::InvalidParameter}},
    Nearest{CimStatus::QueryLanguageNotSupported, {CimStatus::NotSupported, CimStatus::InvalidParameter}},
    Nearest{CimStatus::InvalidQuery, {CimStatus::InvalidParameter}},
    Nearest{CimStatus::MethodNotAvailable, {CimStatus::NotSupported}},
    Nearest{CimStatus::MethodNotFound, {CimStatus::NotSupported, CimStatus::NotFound}},
};

bool inSet(CodeSet set, int code) { return code >= 0 && code < 32 && (set & (CodeSet{1} << code)) != 0; }

}  // namespace

bool mayAnswer(std::string_view operation, int code) {
    const OperationCodes* entry = find(operation);
    return entry == nullptr || inSet(kAlways | entry->allowed, code);
}

int answeredCode(std::string_view operation, int code) {
    if (mayAnswer(operation, code)) {
        return code;
    }
    for (const Nearest& entry : kNearest) {
        if (static_cast<int>(entry.code) != code) {
            continue;
        }
        for (CimStatus candidate : entry.candidates) {
            if (candidate != CimStatus::Ok && mayAnswer(operation, static_cast<int>(candidate))) {
                return static_cast<int>(candidate);
            }
        }
    }
    return static_cast<int>(CimStatus::Failed);
}

}  // namespace orv::cimhost::detail
