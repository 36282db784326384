#include "orv/cimxml/response_writer.hpp"

namespace orv::cimxml {

void openResponse(XmlWriter& out, std::string_view messageId, std::string_view method, bool intrinsic) {
    out.raw("<?xml version=\"1.0\" encoding=\"utf-8\" ?>\n");
    out.open("CIM").attr("CIMVERSION", "2.0").attr("DTDVERSION", "2.0");
    out.open("MESSAGE").attr("ID", messageId).attr("PROTOCOLVERSION", "1.0");
    out.open("SIMPLERSP");
    out.open(intrinsic ? "IMETHODRESPONSE" : "METHODRESPONSE").attr("NAME", method);
}

void writeError(XmlWriter& out, int code, std::string_view description) {
    out.open("ERROR").attr("CODE", std::to_string(code));
    if (!description.empty()) {
        out.attr("DESCRIPTION", description);
    }
    out.close();
}

std::string finishResponse(XmlWriter& out) {
    while (out.depth() > 0) {
        out.close();
    }
    out.raw("\n");
    return out.take();
}

std::string errorResponse(std::string_view messageId, std::string_view method, bool intrinsic,
                          int code, std::string_view description) {
    XmlWriter out;
    openResponse(out, messageId, method, intrinsic);
    writeError(out, code, description);
    return finishResponse(out);
}

}  // namespace orv::cimxml
