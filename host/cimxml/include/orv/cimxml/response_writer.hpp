// The envelope of a CIM-XML response: CIM, MESSAGE, SIMPLERSP and the method response.
#pragma once

#include <string>
#include <string_view>

#include "orv/cimxml/xml_writer.hpp"

namespace orv::cimxml {

// Writes the XML declaration and opens CIM, MESSAGE, SIMPLERSP and IMETHODRESPONSE
// (METHODRESPONSE when not intrinsic) named `method`.
void openResponse(XmlWriter& out, std::string_view messageId, std::string_view method, bool intrinsic);
// <ERROR CODE=... DESCRIPTION=...>; the description is left out when empty.
void writeError(XmlWriter& out, int code, std::string_view description);
// Closes every element still open and returns the document.
std::string finishResponse(XmlWriter& out);

// A whole response holding only an ERROR.
std::string errorResponse(std::string_view messageId, std::string_view method, bool intrinsic,
                          int code, std::string_view description);

}  // namespace orv::cimxml
