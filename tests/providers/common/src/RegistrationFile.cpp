#include "orv/providertest/RegistrationFile.h"

#include <fstream>
#include <stdexcept>

namespace orv::providertest {

void writeRegistrationFile(const std::filesystem::path& file, const std::vector<Registration>& entries) {
    std::ofstream out(file, std::ios::trunc);
    for (const Registration& entry : entries) {
        out << '[' << entry.className << "]\n"
            << "   provider: " << entry.provider << '\n'
            << "   location: orvprovider\n"
            << "   type: " << entry.type << '\n'
            << "   namespace: " << entry.nameSpace << "\n\n";
    }
    if (!out) {
        throw std::runtime_error("cannot write " + file.string());
    }
}

}  // namespace orv::providertest
