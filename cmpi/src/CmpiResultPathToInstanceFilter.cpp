#include <cmpi/CmpiResultPathToInstanceFilter.h>

#include <utility>
#include <vector>

namespace {

struct KeyBinding {
    CmpiString name;
    CmpiData value;
};

std::vector<KeyBinding> keyBindings(const CmpiObjectPath& path) {
    std::vector<KeyBinding> keys;
    const unsigned int count = path.getKeyCount();
    for (unsigned int i = 0; i < count; ++i) {
        KeyBinding key;
        key.value = path.getKey(static_cast<int>(i), &key.name);
        keys.push_back(std::move(key));
    }
    return keys;
}

// The key names, null-terminated, for setPropertyFilter.
std::vector<const char*> namesOf(const std::vector<KeyBinding>& keys) {
    std::vector<const char*> names;
    for (const KeyBinding& key : keys) {
        names.push_back(key.name.charPtr());
    }
    names.push_back(nullptr);
    return names;
}

}  // namespace

void CmpiResultPathToInstanceFilter::returnData(const CmpiData& data) {
    if (data.getType() == CMPI_ref && !data.isNullValue()) {
        returnData(static_cast<CmpiObjectPath>(data));
        return;
    }
    target_.returnData(data);
}

void CmpiResultPathToInstanceFilter::returnData(const CmpiInstance& inst) { target_.returnData(inst); }

void CmpiResultPathToInstanceFilter::returnData(const CmpiObjectPath& path) {
    CmpiInstance inst(path);
    const std::vector<KeyBinding> keys = keyBindings(path);
    if (properties_ != nullptr) {
        std::vector<const char*> names = namesOf(keys);
        inst.setPropertyFilter(properties_, names.data());
    }
    for (const KeyBinding& key : keys) {
        inst.setProperty(key.name.charPtr(), key.value);
    }
    target_.returnData(inst);
}

void CmpiResultPathToInstanceFilter::returnDone() { target_.returnDone(); }
