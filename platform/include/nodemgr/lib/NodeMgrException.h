// The exception every operation of the host-management NIC library throws on failure.
#pragma once

#include <exception>
#include <string>

namespace NodeMgr {
namespace Lib {

class NodeMgrException : public std::exception {
public:
    explicit NodeMgrException(std::string message) : message_(std::move(message)) {}

    const char* what() const noexcept override { return message_.c_str(); }
    const std::string& GetMessage() const noexcept { return message_; }

private:
    std::string message_;
};

} // namespace Lib
} // namespace NodeMgr
