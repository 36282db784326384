// An indication subscription on the stock sfcb, for the end-to-end indication
// tests: the filter and the listener destination made with wbemcli in
// root/interop, the subscription with a CIM-XML CreateInstance request posted
// with curl (wbemcli cannot write the reference keys of a subscription in a
// form sfcb takes).
#pragma once

#include <string>

namespace orv::e2e {

// Subscribes the CIM-XML listener at `destination` (an http URL) to `query`
// (WQL, source namespace root/cimv2) on the sfcbd at `port`; the filter, the
// destination and the subscription are all named `name`, and `scratchDir`
// receives the request body. Empty when all three were made; otherwise the
// answer of the step that failed.
std::string subscribeOnSfcb(int port, const std::string& name, const std::string& query,
                            const std::string& destination, const std::string& scratchDir);

// The same for a listener on this machine's loopback at `listenerPort` (as a
// started listener answers it: not positive when it did not start).
std::string subscribeLocalListenerOnSfcb(int port, int listenerPort, const std::string& name,
                                         const std::string& query, const std::string& scratchDir);

}  // namespace orv::e2e
