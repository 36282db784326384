#include "orv/repository/registration.hpp"

#include <algorithm>
#include <array>
#include <fstream>
#include <sstream>

#include "text.hpp"

namespace orv::repository {
namespace {

struct KindWord {
    std::string_view word;
    ProviderKind kind;
};

constexpr std::array<KindWord, 7> kKindWords{{
    {"instance", ProviderKind::Instance},
    {"association", ProviderKind::Association},
    {"method", ProviderKind::Method},
    {"indication", ProviderKind::Indication},
    {"property", ProviderKind::Property},
    {"class", ProviderKind::Class},
    {"qualifier", ProviderKind::Qualifier},
}};

std::vector<std::string> words(std::string_view s) {
    std::vector<std::string> out;
    std::size_t pos = 0;
    while (pos < s.size()) {
        const auto start = s.find_first_not_of(" \t", pos);
        if (start == std::string_view::npos) {
            break;
        }
        const auto end = std::min(s.find_first_of(" \t", start), s.size());
        out.emplace_back(s.substr(start, end - start));
        pos = end;
    }
    return out;
}

class RegistrationReader {
public:
    explicit RegistrationReader(std::string fileName) : file_(std::move(fileName)) {}

    std::vector<ProviderRegistration> read(std::string_view source) {
        std::size_t pos = 0;
        while (pos < source.size()) {
            const auto end = std::min(source.find('\n', pos), source.size());
            ++line_;
            handleLine(text::trim(source.substr(pos, end - pos)));
            pos = end + 1;
        }
        finishBlock();
        return std::move(entries_);
    }

private:
    [[noreturn]] void fail(int line, const std::string& message) const {
        throw RegistrationError(file_, line, message);
    }

    void handleLine(std::string_view line) {
        if (line.empty() || line.front() == '#') {
            return;
        }
        if (line.front() == '[') {
            startBlock(line);
            return;
        }
        const auto colon = line.find(':');
        if (colon == std::string_view::npos) {
            fail(line_, "expected 'key: value' or '[ClassName]'");
        }
        if (!inBlock_) {
            fail(line_, "expected '[ClassName]' before '" + std::string(line.substr(0, colon)) + "'");
        }
        setKey(text::toLower(text::trim(line.substr(0, colon))), text::trim(line.substr(colon + 1)));
    }

    void startBlock(std::string_view line) {
        finishBlock();
        if (line.back() != ']') {
            fail(line_, "expected ']' after class name");
        }
        const auto name = text::trim(line.substr(1, line.size() - 2));
        if (name.empty() || name.find_first_of(" \t[]") != std::string_view::npos) {
            fail(line_, "expected a class name between '[' and ']'");
        }
        current_ = ProviderRegistration{};
        current_.className = std::string(name);
        current_.file = file_;
        current_.line = line_;
        seen_.clear();
        inBlock_ = true;
    }

    void setKey(const std::string& key, std::string_view value) {
        for (const auto& s : seen_) {
            if (s == key) {
                fail(line_, "duplicate key '" + key + "' in block [" + current_.className + "]");
            }
        }
        seen_.push_back(key);
        if (key == "provider") {
            current_.provider = requireValue(key, value);
        } else if (key == "location") {
            current_.location = requireValue(key, value);
        } else if (key == "type") {
            current_.kinds = kinds(value);
        } else if (key == "namespace") {
            current_.namespaces = words(requireValue(key, value));
        } else if (key == "group") {
            current_.group = std::string(value);
        } else if (key == "unload") {
            if (!text::iequals(value, "never")) {
                fail(line_, "expected 'never' as unload value, not '" + std::string(value) + "'");
            }
            current_.unloadNever = true;
        } else if (key == "parameters") {
            current_.parameters = std::string(value);
        } else if (key == "user") {
            current_.user = std::string(value);
        } else {
            fail(line_, "unknown key '" + key +
                            "' (expected provider, location, type, namespace, group, unload, "
                            "parameters or user)");
        }
    }

    std::string requireValue(const std::string& key, std::string_view value) const {
        if (value.empty()) {
            fail(line_, "expected a value after '" + key + ":'");
        }
        return std::string(value);
    }

    std::uint8_t kinds(std::string_view value) const {
        std::uint8_t bits = 0;
        for (const std::string& w : words(requireValue("type", value))) {
            bits |= kindBit(w);
        }
        return bits;
    }

    std::uint8_t kindBit(const std::string& word) const {
        for (const auto& [spelled, kind] : kKindWords) {
            if (text::iequals(word, spelled)) {
                return static_cast<std::uint8_t>(kind);
            }
        }
        fail(line_, "unknown provider type '" + word +
                        "' (expected instance, association, method, indication, property, "
                        "class or qualifier)");
    }

    void finishBlock() {
        if (!inBlock_) {
            return;
        }
        inBlock_ = false;
        for (const char* required : {"provider", "location", "type"}) {
            if (std::find(seen_.begin(), seen_.end(), required) == seen_.end()) {
                fail(current_.line, std::string("expected '") + required + ":' in block [" +
                                        current_.className + "]");
            }
        }
        if (current_.namespaces.empty()) {
            current_.namespaces.emplace_back("root/cimv2");
        }
        entries_.push_back(std::move(current_));
    }

    std::string file_;
    int line_ = 0;
    bool inBlock_ = false;
    ProviderRegistration current_;
    std::vector<std::string> seen_;
    std::vector<ProviderRegistration> entries_;
};

}  // namespace

RegistrationSet RegistrationSet::parseText(std::string_view text, std::string_view fileName) {
    RegistrationSet set;
    set.entries_ = RegistrationReader(std::string(fileName)).read(text);
    return set;
}

RegistrationSet RegistrationSet::parseFile(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    if (!in) {
        throw RegistrationError(file.string(), 0, "cannot open file");
    }
    std::ostringstream buf;
    buf << in.rdbuf();
    return parseText(buf.str(), file.string());
}

std::vector<const ProviderRegistration*> RegistrationSet::forClass(
    std::string_view className) const {
    std::vector<const ProviderRegistration*> out;
    for (const auto& r : entries_) {
        if (text::iequals(r.className, className)) {
            out.push_back(&r);
        }
    }
    return out;
}

}  // namespace orv::repository
