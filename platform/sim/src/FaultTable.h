// Injected failures of a simulated host. A rule names a call and optionally a
// kernel node, a parameter, a NIC and which matching invocation fails (the
// Nth, counted from 1); without nth every matching invocation fails.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orv::platform::sim {

struct FaultRule {
    std::string call;
    std::optional<std::string> node;
    std::optional<std::string> param;
    std::optional<std::string> nic;
    std::optional<uint64_t> nth;
    std::optional<int64_t> status;
    std::string message;
    // getifaddrs only: instead of failing the call, the rule adds an entry for
    // interface `nic` to the list, with an address of family `entryFamily`, or
    // without an address when that is unset.
    bool addsEntry = false;
    std::optional<uint16_t> entryFamily;
};

// What an invocation is, for matching against the rules.
struct CallSite {
    std::string_view call;
    std::string_view node;                   // empty when the call reads no node
    const std::vector<std::string>* params;  // parameters of the invocation, may be null
    std::string_view nic;                    // empty when not a NIC operation
    bool entrySite = false;                  // asks for the rules that add entries
};

class FaultTable {
public:
    FaultTable() = default;
    explicit FaultTable(std::vector<FaultRule> rules);
    FaultTable(FaultTable&& other) noexcept = default;
    FaultTable& operator=(FaultTable&& other) noexcept = default;

    // The first rule that fires for this invocation, or null. Every matching
    // rule counts the invocation, fired or not. A table without rules answers
    // at once: every simulated call asks it.
    const FaultRule* fire(const CallSite& site) const { return rules_.empty() ? nullptr : firstFired(site); }
    // Every rule that fires for this invocation, in rule order.
    std::vector<const FaultRule*> fireEach(const CallSite& site) const;

    const std::vector<FaultRule>& rules() const { return rules_; }
    bool empty() const { return rules_.empty(); }

private:
    // Counts the invocation on rule index when it matches; whether the rule fires.
    bool counts(std::size_t index, const CallSite& site) const;
    const FaultRule* firstFired(const CallSite& site) const;

    std::vector<FaultRule> rules_;
    std::unique_ptr<std::atomic<uint64_t>[]> hits_;
};

// Every call name a rule may give.
bool isKnownCall(std::string_view call);
// True for the KSI calls that read a node (a rule for them may name one).
bool callReadsNode(std::string_view call);

} // namespace orv::platform::sim
