// Fuzz target for the CIM-XML request reader and the response writer: any input is
// either refused with ProtocolError / CimError or read; whatever was read, written
// back into a response, must parse again.
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/request_params.hpp"
#include "orv/cimxml/request_parser.hpp"
#include "orv/cimxml/response_writer.hpp"

namespace {

void exerciseParameters(const orv::cimxml::CimRequest& request) {
    using namespace orv::cimxml;
    for (const auto& [name, value] : request.params) {
        try {
            boolParam(request, name, false);
        } catch (const CimError&) {
        }
        try {
            propertyListParam(request, name);
        } catch (const CimError&) {
        }
        try {
            objectNameParam(request, name);
        } catch (const CimError&) {
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace orv::cimxml;
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    try {
        const CimRequest request = parseRequest(text);
        exerciseParameters(request);
        const std::string response = errorResponse(request.messageId, request.methodName, request.intrinsic, 4,
                                                   request.nameSpace);
        parseXmlDocument(response);  // throws, and so fails the run, if we wrote bad XML
    } catch (const ProtocolError&) {
    }
    return 0;
}
