#include "orv/cimxml/instance_reader.hpp"

#include "path_reader.hpp"

namespace orv::cimxml {

InstanceModel readInstanceElement(const XmlElement& element) {
    return detail::readInstance(element);
}

}  // namespace orv::cimxml
