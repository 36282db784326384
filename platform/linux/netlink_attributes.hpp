// Walking netlink attributes from C++ (libmnl's iteration macros assign from
// void*, which C++ refuses). Each walk stops at the first attribute that runs
// past the end, and when `visit` answers false; it answers whether it got to the end.
#pragma once

#include <cstddef>
#include <libmnl/libmnl.h>

namespace orv::linuxhost {

template <typename Visit>
bool forEachAttributeIn(const void* start, std::size_t length, Visit&& visit)
{
    const auto* end = static_cast<const char*>(start) + length;
    for (const auto* attribute = static_cast<const nlattr*>(start);
         mnl_attr_ok(attribute, static_cast<int>(end - reinterpret_cast<const char*>(attribute)));
         attribute = mnl_attr_next(attribute)) {
        if (!visit(attribute)) return false;
    }
    return true;
}

template <typename Visit>
bool forEachNested(const nlattr* nest, Visit&& visit)
{
    return forEachAttributeIn(mnl_attr_get_payload(nest), mnl_attr_get_payload_len(nest), visit);
}

}  // namespace orv::linuxhost
