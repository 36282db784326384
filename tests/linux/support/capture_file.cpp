#include "capture_file.hpp"

#include <fstream>
#include <iomanip>

namespace orv::linuxtest {

void writeCapture(const std::string& path, int error, const std::uint8_t* bytes, std::size_t size)
{
    std::ofstream out(path);
    if (error) {
        out << "errno " << error << "\n";
        return;
    }
    for (std::size_t i = 0; i < size; ++i) {
        out << std::hex << std::setw(2) << std::setfill('0') << unsigned(bytes[i]) << ((i % 16 == 15) ? "\n" : " ");
    }
    out << "\n";
}

bool readCapture(const std::string& path, int& error, std::vector<std::uint8_t>& bytes)
{
    std::ifstream in(path);
    if (!in) return false;
    error = 0;
    bytes.clear();
    std::string first;
    in >> first;
    if (first == "errno") {
        in >> error;
        return true;
    }
    for (std::string word = first; !word.empty(); word.clear(), in >> word) {
        bytes.push_back(static_cast<std::uint8_t>(std::stoul(word, nullptr, 16)));
    }
    return true;
}

}  // namespace orv::linuxtest
