// Reading of kernel instance lists: absent, null or an array of items.
#pragma once

#include "HostModel.h"
#include "JsonFields.h"

namespace orv::platform::sim {

template <typename Item, typename Read>
InstanceList<Item> readInstanceList(JsonObject& object, const char* key, Read read)
{
    InstanceList<Item> list;
    std::optional<JsonNode> node = object.optional(key);
    if (!node) {
        return list;
    }
    if (node->isNull()) {
        list.state = ListState::Null;
        return list;
    }
    list.state = ListState::Present;
    for (const JsonNode& item : node->array()) {
        list.items.push_back(read(item));
    }
    return list;
}

} // namespace orv::platform::sim
