// orv-simgen: writes a simulated-host fixture of the requested size.
//
//   orv-simgen [--nics N] [--nics-without-pci K] [--packages P] [--cores C]
//              [--threads T] [--vnics V] [--addresses A] [--no-ipv4] [-o FILE]
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>
#include <string>

#include "orv/platform/simgen/HostGenerator.h"

namespace {

void usage()
{
    std::fprintf(stderr,
                 "usage: orv-simgen [--nics N] [--nics-without-pci K] [--packages P] [--cores C] [--threads T]\n"
                 "                  [--vnics V] [--addresses A] [--no-ipv4] [-o FILE]\n");
}

bool parseCount(const char* text, unsigned& out)
{
    char* end = nullptr;
    const unsigned long value = std::strtoul(text, &end, 10);
    if (end == text || *end != '\0' || value > 1000000 || text[0] == '-') {
        return false;
    }
    out = static_cast<unsigned>(value);
    return true;
}

unsigned* countOption(orv::platform::simgen::HostShape& shape, const std::string& name)
{
    if (name == "--nics") return &shape.nics;
    if (name == "--nics-without-pci") return &shape.nicsWithoutPci;
    if (name == "--packages") return &shape.packages;
    if (name == "--cores") return &shape.coresPerPackage;
    if (name == "--threads") return &shape.threadsPerCore;
    if (name == "--vnics") return &shape.vnics;
    if (name == "--addresses") return &shape.ipv6PerVnic;
    return nullptr;
}

} // namespace

int main(int argc, char** argv)
{
    orv::platform::simgen::HostShape shape;
    std::string output;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--no-ipv4") {
            shape.ipv4 = false;
        } else if (arg == "-o" && i + 1 < argc) {
            output = argv[++i];
        } else if (unsigned* count = countOption(shape, arg); count != nullptr && i + 1 < argc) {
            if (!parseCount(argv[++i], *count)) {
                std::fprintf(stderr, "orv-simgen: %s needs a count, got \"%s\"\n", arg.c_str(), argv[i]);
                return 2;
            }
        } else {
            usage();
            return 2;
        }
    }
    if (shape.nicsWithoutPci > shape.nics) {
        std::fprintf(stderr, "orv-simgen: --nics-without-pci is larger than --nics\n");
        return 2;
    }
    const std::string text = orv::platform::simgen::generateHostText(shape);
    if (output.empty()) {
        std::cout << text;
        return std::cout ? 0 : 1;
    }
    std::ofstream out(output, std::ios::binary);
    out << text;
    if (!out) {
        std::fprintf(stderr, "orv-simgen: cannot write %s: %s\n", output.c_str(), std::strerror(errno));
        return 1;
    }
    return 0;
}
