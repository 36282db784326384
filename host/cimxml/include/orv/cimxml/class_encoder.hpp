// DSP0201 encoding of class declarations from the class repository.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "orv/cimxml/xml_writer.hpp"
#include "orv/repository/class_decl.hpp"

namespace orv::cimxml {

struct ClassEncoding {
    bool localOnly = true;           // only what the class itself declares or overrides
    bool includeQualifiers = true;
    bool includeClassOrigin = false;
    // Properties to keep (any case); nullopt keeps every property. Methods are kept.
    std::optional<std::vector<std::string>> propertyList;
};

// <CLASS NAME=... SUPERCLASS=...> with qualifiers, properties and methods.
void writeClass(XmlWriter& out, const repository::ClassDecl& cls, const ClassEncoding& encoding);

// A repository value as VALUE text: booleans "TRUE"/"FALSE", the rest as the repository writes it.
std::string repositoryScalarText(const repository::Scalar& value);

}  // namespace orv::cimxml
