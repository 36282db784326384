// Reads INSTANCE elements outside of an operation request (indications a listener
// receives, embedded instances): values keep their text form.
#pragma once

#include "orv/cimxml/request.hpp"
#include "orv/cimxml/xml_tree.hpp"

namespace orv::cimxml {

// The instance an INSTANCE element describes; throws ProtocolError(NotValid) for
// malformed content.
InstanceModel readInstanceElement(const XmlElement& element);

}  // namespace orv::cimxml
