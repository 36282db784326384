#include "orv/cimxml/xml_tree.hpp"

#include "control_pictures.hpp"

#include <expat.h>

#include <algorithm>
#include <climits>
#include <cstring>
#include <new>
#include <random>
#include <vector>

namespace orv::cimxml {

// Blocks of memory that double in size up to a cap: a small request takes one
// allocation for all its elements and texts. What is placed here is never destroyed
// one by one: the elements below the root own nothing.
class XmlElement::Arena {
public:
    void* allocate(std::size_t bytes, std::size_t alignment) {
        std::size_t at = (used_ + alignment - 1) & ~(alignment - 1);
        if (blocks_.empty() || at + bytes > blockSize_) {
            std::size_t size = blocks_.empty() ? kFirstBlock : std::min(blockSize_ * 2, kLargestBlock);
            size = std::max(size, bytes);
            blocks_.push_back(
                std::make_unique_for_overwrite<std::max_align_t[]>((size + sizeof(std::max_align_t) - 1) / sizeof(std::max_align_t)));
            blockSize_ = size;
            at = 0;
        }
        used_ = at + bytes;
        return reinterpret_cast<char*>(blocks_.back().get()) + at;
    }

    std::string_view copy(std::string_view text) {
        if (text.empty()) {
            return {};
        }
        char* out = static_cast<char*>(allocate(text.size(), 1));
        std::memcpy(out, text.data(), text.size());
        return {out, text.size()};
    }

    template <typename T>
    T* array(std::size_t count) {
        return static_cast<T*>(allocate(count * sizeof(T), alignof(T)));
    }

private:
    static constexpr std::size_t kFirstBlock = 4096;
    static constexpr std::size_t kLargestBlock = 256U << 10U;
    std::vector<std::unique_ptr<std::max_align_t[]>> blocks_;
    std::size_t blockSize_ = 0;
    std::size_t used_ = 0;
};

XmlElement::XmlElement() = default;
XmlElement::~XmlElement() = default;

const std::string_view* XmlElement::attribute(std::string_view key) const noexcept {
    for (const XmlAttribute& attr : attributes) {
        if (attr.name == key) {
            return &attr.value;
        }
    }
    return nullptr;
}

const XmlElement* XmlElement::child(std::string_view childName) const noexcept {
    for (const XmlElement* element : children) {
        if (element->name == childName) {
            return element;
        }
    }
    return nullptr;
}

namespace {

// An element being read and where its children start among the pending ones.
struct OpenElement {
    XmlElement* element;
    std::size_t firstChild;
};

// State shared with expat's callbacks while one document is read.
class TreeBuilder {
public:
    TreeBuilder(XML_Parser parser, std::string_view document, const XmlLimits& limits)
        : parser_(parser), document_(document), limits_(limits) {
        // Room for a request's usual depth and width, so that these grow once at most.
        stack_.reserve(kUsualDepth);
        texts_.reserve(kUsualDepth);
        pending_.reserve(2 * kUsualDepth);
    }

    void start(const XML_Char* name, const XML_Char** attrs) {
        if (stack_.size() >= limits_.maxDepth) {
            fail("elements nested too deeply");
            return;
        }
        if (++elementCount_ > limits_.maxElements) {
            fail("too many elements");
            return;
        }
        XmlElement* element = newElement();
        XmlElement::Arena& arena = *root_->arena;
        element->name = arena.copy(name);
        element->line = lineHere();
        std::size_t count = 0;
        while (attrs[count] != nullptr) {
            count += 2;
        }
        if (count > 0) {
            auto* attributes = arena.array<XmlAttribute>(count / 2);
            for (std::size_t i = 0; i < count; i += 2) {
                new (&attributes[i / 2]) XmlAttribute{arena.copy(attrs[i]), copyValue(arena, attrs[i + 1])};
            }
            element->attributes = {attributes, count / 2};
        }
        if (texts_.size() <= stack_.size()) {
            texts_.resize(stack_.size() + 1);
        }
        texts_[stack_.size()].clear();
        stack_.push_back(OpenElement{element, pending_.size()});
    }

    void end() {
        // After a stop expat may still report the end of the element whose start was refused.
        if (error_.empty() && !stack_.empty()) {
            const OpenElement open = stack_.back();
            XmlElement::Arena& arena = *root_->arena;
            if (const std::size_t count = pending_.size() - open.firstChild; count > 0) {
                auto* children = arena.array<const XmlElement*>(count);
                std::copy(pending_.begin() + static_cast<std::ptrdiff_t>(open.firstChild), pending_.end(), children);
                open.element->children = {children, count};
                pending_.resize(open.firstChild);
            }
            open.element->text = copyValue(arena, texts_[stack_.size() - 1]);
            stack_.pop_back();
        }
    }

    void characters(const XML_Char* text, int length) {
        if (error_.empty() && !stack_.empty()) {
            texts_[stack_.size() - 1].append(text, static_cast<std::size_t>(length));
        }
    }

    void fail(const char* why) {
        error_ = why;
        XML_StopParser(parser_, XML_FALSE);
    }

    // The line of the element starting now. Expat's own line count re-reads the text
    // since its last answer token by token; the newlines are counted here instead.
    int lineHere() {
        const XML_Index at = XML_GetCurrentByteIndex(parser_);
        const auto offset = at < 0 ? lineCountedTo_ : std::min(static_cast<std::size_t>(at), document_.size());
        if (offset > lineCountedTo_) {
            line_ += lineBreaks(document_.substr(lineCountedTo_, offset - lineCountedTo_));
            lineCountedTo_ = offset;
        }
        return line_;
    }

    // Line breaks as XML counts them: LF, CR LF and a CR alone. A piece ends before the
    // '<' of an element, so a CR at its end stands alone.
    static int lineBreaks(std::string_view text) {
        int breaks = 0;
        for (std::size_t at = text.find('\n'); at != std::string_view::npos; at = text.find('\n', at + 1)) {
            ++breaks;
        }
        for (std::size_t at = text.find('\r'); at != std::string_view::npos; at = text.find('\r', at + 1)) {
            if (at + 1 >= text.size() || text[at + 1] != '\n') {
                ++breaks;
            }
        }
        return breaks;
    }

    const std::string& error() const noexcept { return error_; }
    std::unique_ptr<XmlElement> takeRoot() { return std::move(root_); }

private:
    // The root holds the arena the elements below it live in.
    XmlElement* newElement() {
        if (stack_.empty()) {
            root_ = std::make_unique<XmlElement>();
            root_->arena = std::make_unique<XmlElement::Arena>();
            return root_.get();
        }
        XmlElement* element = new (root_->arena->array<XmlElement>(1)) XmlElement();
        pending_.push_back(element);
        return element;
    }

    // Text or an attribute value in the arena, control pictures turned back into the
    // characters they stand for.
    static std::string_view copyValue(XmlElement::Arena& arena, std::string_view value) {
        if (value.find('\xE2') == std::string_view::npos) {
            return arena.copy(value);
        }
        return arena.copy(fromControlPictures(value));
    }

    static constexpr std::size_t kUsualDepth = 16;

    XML_Parser parser_;
    std::string_view document_;
    const XmlLimits& limits_;
    std::size_t lineCountedTo_ = 0;
    int line_ = 1;
    std::unique_ptr<XmlElement> root_;
    std::vector<OpenElement> stack_;
    std::vector<const XmlElement*> pending_;  // children of the open elements, in order
    std::vector<std::string> texts_;          // the open elements' text so far, by depth
    std::size_t elementCount_ = 0;
    std::string error_;
};

void XMLCALL onStart(void* data, const XML_Char* name, const XML_Char** attrs) {
    static_cast<TreeBuilder*>(data)->start(name, attrs);
}

void XMLCALL onEnd(void* data, const XML_Char* /*name*/) {
    static_cast<TreeBuilder*>(data)->end();
}

void XMLCALL onCharacters(void* data, const XML_Char* text, int length) {
    static_cast<TreeBuilder*>(data)->characters(text, length);
}

// Entity declarations are how XML bombs are built; requests never need them.
void XMLCALL onEntityDecl(void* data, const XML_Char*, int, const XML_Char*, int, const XML_Char*,
                          const XML_Char*, const XML_Char*, const XML_Char*) {
    static_cast<TreeBuilder*>(data)->fail("entity declarations are not accepted");
}

struct ParserDeleter {
    void operator()(XML_ParserStruct* parser) const noexcept { XML_ParserFree(parser); }
};
using ParserHandle = std::unique_ptr<XML_ParserStruct, ParserDeleter>;

// Documents up to this size leave their parser to the thread's next document; a larger
// one frees it, so that no thread keeps what a large document made expat allocate.
constexpr std::size_t kKeptParserDocumentBytes = 64U << 10U;

// Each thread keeps one parser and resets it for the next document (making one costs
// more than reading a small request). The hash salt comes from a generator seeded once
// per thread instead of the system's random source at every document.
class ThreadParser {
public:
    explicit ThreadParser(std::size_t documentBytes) {
        Kept& kept = keptParser();
        if (!kept.busy && documentBytes <= kKeptParserDocumentBytes) {
            if (kept.parser && XML_ParserReset(kept.parser.get(), "UTF-8") == XML_TRUE) {
                parser_ = kept.parser.get();
            } else {
                kept.parser.reset(XML_ParserCreate("UTF-8"));
                parser_ = kept.parser.get();
            }
            kept_ = &kept;
        } else {
            own_.reset(XML_ParserCreate("UTF-8"));
            parser_ = own_.get();
        }
        if (parser_ == nullptr) {
            throw std::bad_alloc();
        }
        if (kept_ != nullptr) {
            kept_->busy = true;
        }
        XML_SetHashSalt(parser_, kept.salt());
    }
    ~ThreadParser() {
        if (kept_ != nullptr) {
            kept_->busy = false;
        }
    }
    ThreadParser(const ThreadParser&) = delete;
    ThreadParser& operator=(const ThreadParser&) = delete;

    XML_Parser get() const noexcept { return parser_; }

private:
    struct Kept {
        ParserHandle parser;
        std::mt19937_64 salts{std::random_device{}()};
        bool busy = false;  // a document of this thread is being read with it
        unsigned long salt() {
            unsigned long value = 0;
            while (value == 0) {  // expat takes 0 as "not set"
                value = static_cast<unsigned long>(salts());
            }
            return value;
        }
    };
    static Kept& keptParser() {
        thread_local Kept kept;
        return kept;
    }

    XML_Parser parser_ = nullptr;
    Kept* kept_ = nullptr;
    ParserHandle own_;
};

}  // namespace

std::unique_ptr<XmlElement> parseXmlDocument(std::string_view document, const XmlLimits& limits) {
    if (document.size() > static_cast<std::size_t>(INT_MAX)) {
        throw XmlSyntaxError("document too large");
    }
    ThreadParser handle(document.size());
    XML_Parser parser = handle.get();
    TreeBuilder builder(parser, document, limits);
    XML_SetUserData(parser, &builder);
    XML_SetElementHandler(parser, onStart, onEnd);
    XML_SetCharacterDataHandler(parser, onCharacters);
    XML_SetEntityDeclHandler(parser, onEntityDecl);
    XML_SetParamEntityParsing(parser, XML_PARAM_ENTITY_PARSING_NEVER);

    const XML_Status status = XML_Parse(parser, document.data(), static_cast<int>(document.size()), XML_TRUE);
    if (!builder.error().empty()) {
        throw XmlSyntaxError(builder.error());
    }
    if (status != XML_STATUS_OK) {
        throw XmlSyntaxError("line " + std::to_string(XML_GetCurrentLineNumber(parser)) + ": " +
                             XML_ErrorString(XML_GetErrorCode(parser)));
    }
    auto root = builder.takeRoot();
    if (!root) {
        throw XmlSyntaxError("no root element");
    }
    return root;
}

}  // namespace orv::cimxml
