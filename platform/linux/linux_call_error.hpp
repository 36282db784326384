// The one failure type of the Linux readers: which kernel call failed, on
// which object (a NIC name, a file, a CPU), and the errno it answered.
#pragma once

#include <stdexcept>
#include <string>

namespace orv::linuxhost {

class LinuxCallError : public std::runtime_error {
public:
    LinuxCallError(std::string call, std::string object, int error);

    const std::string& call() const noexcept { return call_; }
    const std::string& object() const noexcept { return object_; }
    int error() const noexcept { return error_; }
    // The kernel refused the operation as not implemented by the driver.
    bool unsupported() const noexcept;
    // The object is gone (device removed, file vanished).
    bool vanished() const noexcept;

private:
    std::string call_;
    std::string object_;
    int error_;
};

}  // namespace orv::linuxhost
