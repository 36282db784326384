// Instance names and the path elements around them.
#include "orv/cimxml/cmpi_value.hpp"
#include "orv/cimxml/object_encoder.hpp"
#include "value_encoding.hpp"

namespace orv::cimxml {

namespace {

std::string pathNamespace(const CMPIObjectPath* path) {
    return cmpiString(path->ft->getNameSpace(path, nullptr));
}

std::string pathHost(const CMPIObjectPath* path) {
    return cmpiString(path->ft->getHostname(path, nullptr));
}

void writeLocalNamespacePath(XmlWriter& out, std::string_view nameSpace) {
    out.open("LOCALNAMESPACEPATH");
    std::size_t start = 0;
    while (start <= nameSpace.size()) {
        std::size_t slash = nameSpace.find('/', start);
        if (slash == std::string_view::npos) {
            slash = nameSpace.size();
        }
        if (slash > start) {
            out.open("NAMESPACE").attr("NAME", nameSpace.substr(start, slash - start)).close();
        }
        start = slash + 1;
    }
    out.close();
}

void writeNamespacePath(XmlWriter& out, std::string_view host, std::string_view nameSpace) {
    out.open("NAMESPACEPATH");
    out.leaf("HOST", host);
    writeLocalNamespacePath(out, nameSpace);
    out.close();
}

void writeKeyBinding(XmlWriter& out, std::string_view name, const CMPIData& key) {
    out.raw("<KEYBINDING NAME=\"").text(name).raw("\">");
    if (key.type == CMPI_ref && !isNullData(key) && key.value.ref != nullptr) {
        writeValueReference(out, key.value.ref);
    } else {
        // TYPE names the key's CIM type beside the coarse VALUETYPE, so that a
        // client can tell a uint16 key from a sint64 one.
        out.raw("<KEYVALUE VALUETYPE=\"").raw(keyValueType(key.type)).raw("\"");
        if (const std::string_view type = xmlTypeName(key.type); !type.empty()) {
            out.raw(" TYPE=\"").raw(type).raw("\"");
        }
        out.raw(">");
        writeScalarText(out, key);
        out.raw("</KEYVALUE>");
    }
    out.raw("</KEYBINDING>");
}

}  // namespace

std::string_view pathClassChars(const CMPIObjectPath* path) {
    return path == nullptr ? std::string_view() : cmpiChars(path->ft->getClassName(path, nullptr));
}

std::string pathClassName(const CMPIObjectPath* path) {
    return std::string(pathClassChars(path));
}

std::string instanceClassName(const CMPIInstance* instance) {
    if (instance == nullptr) {
        return {};
    }
    return pathClassName(instance->ft->getObjectPath(instance, nullptr));
}

void writeClassPath(XmlWriter& out, std::string_view host, std::string_view nameSpace,
                    std::string_view className) {
    out.open("CLASSPATH");
    writeNamespacePath(out, host, nameSpace);
    out.open("CLASSNAME").attr("NAME", className).close();
    out.close();
}

void writeInstanceName(XmlWriter& out, const CMPIObjectPath* path) {
    out.raw("<INSTANCENAME CLASSNAME=\"").text(pathClassChars(path)).raw("\">");
    const CMPICount count = path->ft->getKeyCount(path, nullptr);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIString* name = nullptr;
        const CMPIData key = path->ft->getKeyAt(path, i, &name, nullptr);
        writeKeyBinding(out, cmpiChars(name), key);
    }
    out.raw("</INSTANCENAME>");
}

void writeInstancePath(XmlWriter& out, const CMPIObjectPath* path, const PathDefaults& defaults) {
    std::string host = pathHost(path);
    std::string nameSpace = pathNamespace(path);
    out.open("INSTANCEPATH");
    writeNamespacePath(out, host.empty() ? defaults.host : host,
                       nameSpace.empty() ? defaults.nameSpace : nameSpace);
    writeInstanceName(out, path);
    out.close();
}

void writeValueReference(XmlWriter& out, const CMPIObjectPath* path) {
    const std::string host = pathHost(path);
    const std::string nameSpace = pathNamespace(path);
    out.open("VALUE.REFERENCE");
    if (!host.empty() && !nameSpace.empty()) {
        writeInstancePath(out, path, PathDefaults{host, nameSpace});
    } else if (!nameSpace.empty()) {
        out.open("LOCALINSTANCEPATH");
        writeLocalNamespacePath(out, nameSpace);
        writeInstanceName(out, path);
        out.close();
    } else {
        writeInstanceName(out, path);
    }
    out.close();
}

}  // namespace orv::cimxml
