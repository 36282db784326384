#include "cimxml_exchange.hpp"

#include <unistd.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "orv/cimxml/request_parser.hpp"

namespace orv::cimhost::test {

namespace fs = std::filesystem;

std::string sourcePath(const std::string& relative) { return std::string(std::getenv("ORV_SOURCE_DIR")) + "/" + relative; }

std::string readText(const std::string& path) {
    std::ifstream in(path);
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
}

std::string dtdErrors(const std::string& document) {
    const fs::path file = fs::temp_directory_path() / ("cimxml-" + std::to_string(::getpid()) + ".xml");
    std::ofstream(file) << document;
    const std::string command = "xmllint --noout --dtdvalid '" + sourcePath("tests/cimhost/dtd/cim-xml.dtd") + "' '" +
                                file.string() + "' 2>&1";
    std::string output;
    FILE* pipe = ::popen(command.c_str(), "r");
    if (pipe == nullptr) {
        return "cannot run xmllint";
    }
    std::array<char, 512> buffer{};
    while (std::fgets(buffer.data(), buffer.size(), pipe) != nullptr) {
        output += buffer.data();
    }
    const int status = ::pclose(pipe);
    fs::remove(file);
    if (status != 0 && output.empty()) {
        output = "xmllint failed with status " + std::to_string(status);
    }
    return output;
}

namespace {

host::CoreConfig rawConfig() {
    const fs::path build = std::getenv("ORV_BUILD_DIR");
    host::CoreConfig config;
    config.providerDirs = {build / "lib"};
    config.registrationFiles = {sourcePath("tests/rawprovider/rawprovider.reg")};
    config.mofPaths = {sourcePath("tests/rawprovider/rawprovider.mof")};
    return config;
}

}  // namespace

Exchange::Exchange()
    : core_(std::make_unique<host::BrokerCore>(rawConfig())),
      dispatcher_(std::make_unique<CimDispatcher>(*core_, core_->classes(), "testhost")) {}

Exchange::~Exchange() {
    dispatcher_->drain();
    dispatcher_.reset();
    core_.reset();
}

std::string Exchange::answer(const std::string& request, const std::string& principal) const {
    try {
        return dispatcher_->respond(cimxml::parseRequest(request), principal);
    } catch (const cimxml::ProtocolError& error) {
        const cimxml::HttpFailure failure = cimxml::httpFailure(error.kind());
        return "HTTP " + std::to_string(failure.status) + " " + std::string(failure.cimError) + ": " + error.what() +
               "\n";
    }
}

}  // namespace orv::cimhost::test
