#include "CompactJson.h"

#include <vector>

namespace orv::platform::simgen {
namespace {

using json = nlohmann::ordered_json;

void write(const json& value, size_t indent, size_t width, std::string& out);

// One member or element as it would sit on a line: "key": value.
std::string itemText(const json* key, const json& value)
{
    return (key != nullptr ? key->dump() + ": " : std::string()) + value.dump(-1, ' ', false);
}

// Writes the items of a container, packing short ones onto shared lines.
void writeItems(const json& container, size_t indent, size_t width, std::string& out)
{
    const std::string pad(indent + 2, ' ');
    std::string line;
    size_t remaining = container.size();
    auto flush = [&] {
        if (!line.empty()) {
            out += pad + line + "\n";
            line.clear();
        }
    };
    for (auto it = container.begin(); it != container.end(); ++it, --remaining) {
        const json key = container.is_object() ? json(it.key()) : json();
        const std::string text = itemText(container.is_object() ? &key : nullptr, *it) + (remaining > 1 ? "," : "");
        if (pad.size() + text.size() <= width) {
            if (!line.empty() && pad.size() + line.size() + 1 + text.size() > width) {
                flush();
            }
            line += (line.empty() ? "" : " ") + text;
            continue;
        }
        flush();
        out += pad + (container.is_object() ? key.dump() + ": " : std::string());
        write(*it, indent + 2, width, out);
        out += remaining > 1 ? ",\n" : "\n";
    }
    flush();
}

void write(const json& value, size_t indent, size_t width, std::string& out)
{
    const std::string oneLine = value.dump(-1, ' ', false);
    if (!value.is_structured() || indent + oneLine.size() <= width || value.empty()) {
        out += oneLine;
        return;
    }
    out += value.is_object() ? "{\n" : "[\n";
    writeItems(value, indent, width, out);
    out += std::string(indent, ' ') + (value.is_object() ? "}" : "]");
}

} // namespace

std::string compactJson(const nlohmann::ordered_json& value, size_t width)
{
    std::string out;
    write(value, 0, width, out);
    return out + "\n";
}

} // namespace orv::platform::simgen
