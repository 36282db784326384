#include "orv/indication/records.hpp"

#include <charconv>
#include <map>

#include "names.hpp"

namespace orv::indication {

namespace {

using detail::lowerCase;

std::string escaped(std::string_view value) {
    std::string out;
    for (char c : value) {
        if (c == '\\') {
            out += "\\\\";
        } else if (c == '\n') {
            out += "\\n";
        } else if (c == '\r') {
            out += "\\r";
        } else {
            out += c;
        }
    }
    return out;
}

std::string unescaped(std::string_view value) {
    std::string out;
    for (std::size_t i = 0; i < value.size(); ++i) {
        if (value[i] == '\\' && i + 1 < value.size()) {
            char next = value[++i];
            out += next == 'n' ? '\n' : (next == 'r' ? '\r' : next);
        } else {
            out += value[i];
        }
    }
    return out;
}

class Writer {
public:
    explicit Writer(std::string_view kind) : text_(std::string(kind) + "\n") {}
    Writer& add(std::string_view name, std::string_view value) {
        text_ += std::string(name) + "=" + escaped(value) + "\n";
        return *this;
    }
    Writer& add(std::string_view name, std::uint16_t value) { return add(name, std::to_string(value)); }
    std::string take() { return std::move(text_); }

private:
    std::string text_;
};

using Fields = std::map<std::string, std::string>;

bool number(const Fields& fields, const char* name, std::uint16_t& out, std::string* error) {
    auto found = fields.find(name);
    if (found == fields.end()) {
        return true;  // keeps the default
    }
    const std::string& text = found->second;
    auto [end, rc] = std::from_chars(text.data(), text.data() + text.size(), out);
    if (rc != std::errc() || end != text.data() + text.size()) {
        *error = std::string(name) + " is not a number: " + text;
        return false;
    }
    return true;
}

bool required(const Fields& fields, const char* name, std::string& out, std::string* error) {
    auto found = fields.find(name);
    if (found == fields.end() || found->second.empty()) {
        *error = std::string("missing ") + name;
        return false;
    }
    out = found->second;
    return true;
}

void optional(const Fields& fields, const char* name, std::string& out) {
    if (auto found = fields.find(name); found != fields.end()) {
        out = found->second;
    }
}

}  // namespace

std::string storedText(const FilterRecord& f) {
    return Writer("filter")
        .add("Name", f.name)
        .add("CreationClassName", f.creationClassName)
        .add("SystemCreationClassName", f.systemCreationClassName)
        .add("SystemName", f.systemName)
        .add("Query", f.query)
        .add("QueryLanguage", f.queryLanguage)
        .add("SourceNamespace", f.sourceNamespace)
        .take();
}

std::string storedText(const DestinationRecord& d) {
    return Writer("destination")
        .add("Name", d.name)
        .add("CreationClassName", d.creationClassName)
        .add("SystemCreationClassName", d.systemCreationClassName)
        .add("SystemName", d.systemName)
        .add("Destination", d.destination)
        .add("PersistenceType", d.persistenceType)
        .add("Protocol", d.protocol)
        .take();
}

std::string storedText(const SubscriptionRecord& s) {
    return Writer("subscription")
        .add("Filter", s.filterName)
        .add("Handler", s.handlerName)
        .add("HandlerClass", s.handlerClass)
        .add("SubscriptionState", s.state)
        .add("OnFatalErrorPolicy", s.onFatalErrorPolicy)
        .add("SubscriptionStartTime", s.startTime)
        .take();
}

std::string storeId(const FilterRecord& filter) { return "filter:" + lowerCase(filter.name); }
std::string storeId(const DestinationRecord& destination) { return "destination:" + lowerCase(destination.name); }
std::string storeId(const SubscriptionRecord& s) {
    // The filter name's length keeps the pair unambiguous whatever the names hold.
    return "subscription:" + std::to_string(s.filterName.size()) + ":" + lowerCase(s.filterName) + lowerCase(s.handlerName);
}

ParsedRecord parseStored(std::string_view text, std::string* error) {
    std::size_t end = text.find('\n');
    std::string kind(text.substr(0, end));
    Fields fields;
    while (end != std::string_view::npos && end + 1 < text.size()) {
        std::size_t start = end + 1;
        end = text.find('\n', start);
        std::string_view line = text.substr(start, end == std::string_view::npos ? std::string_view::npos : end - start);
        std::size_t equals = line.find('=');
        if (equals != std::string_view::npos) {
            fields[std::string(line.substr(0, equals))] = unescaped(line.substr(equals + 1));
        }
    }
    ParsedRecord parsed;
    std::string ignored;
    std::string* why = error != nullptr ? error : &ignored;
    if (kind == "filter") {
        FilterRecord f;
        if (required(fields, "Name", f.name, why) && required(fields, "Query", f.query, why)) {
            optional(fields, "CreationClassName", f.creationClassName);
            optional(fields, "SystemCreationClassName", f.systemCreationClassName);
            optional(fields, "SystemName", f.systemName);
            optional(fields, "QueryLanguage", f.queryLanguage);
            optional(fields, "SourceNamespace", f.sourceNamespace);
            parsed.filter = std::move(f);
        }
    } else if (kind == "destination") {
        DestinationRecord d;
        if (required(fields, "Name", d.name, why) && required(fields, "Destination", d.destination, why) &&
            number(fields, "PersistenceType", d.persistenceType, why) && number(fields, "Protocol", d.protocol, why)) {
            optional(fields, "CreationClassName", d.creationClassName);
            optional(fields, "SystemCreationClassName", d.systemCreationClassName);
            optional(fields, "SystemName", d.systemName);
            parsed.destination = std::move(d);
        }
    } else if (kind == "subscription") {
        SubscriptionRecord s;
        if (required(fields, "Filter", s.filterName, why) && required(fields, "Handler", s.handlerName, why) &&
            number(fields, "SubscriptionState", s.state, why) &&
            number(fields, "OnFatalErrorPolicy", s.onFatalErrorPolicy, why)) {
            optional(fields, "HandlerClass", s.handlerClass);
            optional(fields, "SubscriptionStartTime", s.startTime);
            parsed.subscription = std::move(s);
        }
    } else {
        *why = "unknown kind '" + kind + "'";
    }
    return parsed;
}

}  // namespace orv::indication
