// A six-byte Ethernet address returned by value from a pnic.
#pragma once

#include <array>
#include <cstring>

namespace NodeMgr {
namespace Network {

class MacAddress {
public:
    MacAddress() : bytes_{} {}
    explicit MacAddress(const unsigned char (&bytes)[6]) { std::memcpy(bytes_.data(), bytes, 6); }
    explicit MacAddress(const std::array<unsigned char, 6>& bytes) : bytes_(bytes) {}

    // Writes the six bytes, most significant first, into out[0..5].
    void GetBinaryAddress(unsigned char* out) const { std::memcpy(out, bytes_.data(), bytes_.size()); }

    bool operator==(const MacAddress& other) const { return bytes_ == other.bytes_; }

private:
    std::array<unsigned char, 6> bytes_;
};

} // namespace Network
} // namespace NodeMgr
