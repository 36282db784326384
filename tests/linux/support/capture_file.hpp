// One captured kernel answer in a file: either "errno <number>" or the answer
// bytes in hexadecimal, sixteen to a line.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace orv::linuxtest {

void writeCapture(const std::string& path, int error, const std::uint8_t* bytes, std::size_t size);
// False when there is no such file; else the captured errno (0 for an answer) and the bytes.
bool readCapture(const std::string& path, int& error, std::vector<std::uint8_t>& bytes);

}  // namespace orv::linuxtest
