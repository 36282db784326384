// Root of the host-management library's object model. Its seven virtual
// operations come first in every derived class's virtual table, in this order.
#pragma once

#include <ostream>
#include <string>
#include <vector>

namespace NodeMgr {
namespace Lib {

class NodeMgrObject {
public:
    virtual ~NodeMgrObject() = default;                              // slot 0 (and the deleting variant)
    virtual void Refresh() = 0;                                      // re-reads the object's state
    virtual void SaveConfig() = 0;                                   // persists the configuration
    virtual void LoadConfig() = 0;                                   // restores the persisted configuration
    virtual void Print(std::ostream& out) const = 0;                 // human-readable dump
    virtual std::string GetName() const = 0;                         // identity of the object
    virtual std::vector<NodeMgrObject*> GetChildren() const = 0;     // owned by the caller

protected:
    NodeMgrObject() = default;
    NodeMgrObject(const NodeMgrObject&) = default;
    NodeMgrObject& operator=(const NodeMgrObject&) = default;
};

} // namespace Lib
} // namespace NodeMgr
