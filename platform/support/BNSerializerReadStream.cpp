#include "platform/support/BNSerializerReadStream.h"

#include <expat.h>

#include <array>
#include <cstdio>
#include <cstring>
#include <memory>

#include "platform/support/internal/BNSerializerText.h"

using namespace bn_internal;

// ---- Open elements ----------------------------------------------------------------------

namespace {

struct AttributeSpan {
    uint32_t nameOffset;
    uint32_t nameLength;
    uint32_t valueOffset;
    uint32_t valueLength;
};

// One open element. Frames are kept and reused by depth so that their buffers are allocated
// once per depth, not once per element.
struct Frame {
    std::string name;
    std::string attributeText;  // names and values back to back
    std::vector<AttributeSpan> attributes;
    std::string content;
    uint64_t line = 0;
    uint64_t column = 0;
    bool dispatched = false;
    bool skipped = false;  // neither this element nor its children reach a handler

    std::string_view attributeName(const AttributeSpan& a) const {
        return std::string_view(attributeText).substr(a.nameOffset, a.nameLength);
    }
    std::string_view attributeValue(const AttributeSpan& a) const {
        return std::string_view(attributeText).substr(a.valueOffset, a.valueLength);
    }
};

// Where the name of an (element id, attribute id) pair was found last, and at which index of
// the element's attributes, since documents repeat the same elements with the same
// attributes in the same order.
struct AttributeCacheEntry {
    uint64_t generation = ~uint64_t{0};
    uint32_t elementId = 0;
    uint32_t attributeId = 0;
    const char* name = nullptr;
    size_t lastIndex = 0;
};

constexpr size_t kReadChunk = 64 * 1024;

}  // namespace

struct BNSerializerReadStream::Impl {
    explicit Impl(BNSerializerReadStream& owner) : stream(owner) {}
    ~Impl() {
        if (parser) XML_ParserFree(parser);
    }

    BNSerializerReadStream& stream;
    XML_Parser parser = nullptr;
    std::vector<Frame> frames;  // frames[0 .. depth) are open
    size_t depth = 0;
    std::array<AttributeCacheEntry, 64> attributeCache;

    void reset();
    uint64_t currentLine() const { return XML_GetCurrentLineNumber(parser); }
    uint64_t currentColumn() const { return XML_GetCurrentColumnNumber(parser) + 1; }

    void startElement(const char* name, const char** attributes);
    void endElement();
    void characters(const char* text, int length);
    void dispatch(size_t index);
    void popHandlersOf(size_t elementDepth);
    const AttributeSpan* findAttribute(const BNStreamElement& element, uint32_t attributeId);
    template <class T>
    bool readAttribute(const BNStreamElement& element, uint32_t attributeId, T& out,
                       TextValueStatus (*parse)(std::string_view, T&));

    static void onStart(void* data, const XML_Char* name, const XML_Char** attributes) {
        auto* self = static_cast<Impl*>(data);
        if (!self->stream.failed()) self->startElement(name, attributes);
    }
    static void onEnd(void* data, const XML_Char*) {
        auto* self = static_cast<Impl*>(data);
        if (!self->stream.failed()) self->endElement();
    }
    static void onText(void* data, const XML_Char* text, int length) {
        auto* self = static_cast<Impl*>(data);
        if (!self->stream.failed()) self->characters(text, length);
    }
    static void onDoctype(void* data, const XML_Char*, const XML_Char*, const XML_Char*, int) {
        auto* self = static_cast<Impl*>(data);
        self->stream.failAt(self->currentLine(), self->currentColumn(),
                            "document type declarations are not accepted");
    }
    static void onEntityDecl(void* data, const XML_Char*, int, const XML_Char*, int,
                             const XML_Char*, const XML_Char*, const XML_Char*, const XML_Char*) {
        auto* self = static_cast<Impl*>(data);
        self->stream.failAt(self->currentLine(), self->currentColumn(),
                            "entity declarations are not accepted");
    }
};

void BNSerializerReadStream::Impl::reset() {
    if (parser) XML_ParserFree(parser);
    // No encoding forced: the document's own declaration (or its byte order mark) counts, and
    // expat hands everything on in UTF-8.
    parser = XML_ParserCreate(nullptr);
    XML_SetUserData(parser, this);
    XML_SetElementHandler(parser, &Impl::onStart, &Impl::onEnd);
    XML_SetCharacterDataHandler(parser, &Impl::onText);
    XML_SetStartDoctypeDeclHandler(parser, &Impl::onDoctype);
    XML_SetEntityDeclHandler(parser, &Impl::onEntityDecl);
    XML_SetParamEntityParsing(parser, XML_PARAM_ENTITY_PARSING_NEVER);
    depth = 0;
    attributeCache.fill(AttributeCacheEntry{});
}

void BNSerializerReadStream::Impl::startElement(const char* name, const char** attributes) {
    if (depth > 0 && !frames[depth - 1].dispatched && !frames[depth - 1].skipped) {
        dispatch(depth - 1);
        if (stream.failed()) return;
    }
    if (depth >= kMaxDepth) {
        stream.failAt(currentLine(), currentColumn(),
                      "elements are nested deeper than " + std::to_string(kMaxDepth));
        return;
    }
    if (frames.size() <= depth) frames.emplace_back();
    Frame& frame = frames[depth];
    frame.name.assign(name);
    frame.attributeText.clear();
    frame.attributes.clear();
    frame.content.clear();
    frame.line = currentLine();
    frame.column = currentColumn();
    frame.dispatched = false;
    frame.skipped = depth > 0 && frames[depth - 1].skipped;
    if (!frame.skipped) {
        for (const char** a = attributes; a[0]; a += 2) {
            const size_t nameLength = std::strlen(a[0]);
            const size_t valueLength = std::strlen(a[1]);
            AttributeSpan span;
            span.nameOffset = static_cast<uint32_t>(frame.attributeText.size());
            span.nameLength = static_cast<uint32_t>(nameLength);
            frame.attributeText.append(a[0], nameLength);
            span.valueOffset = static_cast<uint32_t>(frame.attributeText.size());
            span.valueLength = static_cast<uint32_t>(valueLength);
            frame.attributeText.append(a[1], valueLength);
            frame.attributes.push_back(span);
        }
    }
    ++depth;
}

void BNSerializerReadStream::Impl::characters(const char* text, int length) {
    if (depth == 0) return;
    Frame& frame = frames[depth - 1];
    if (frame.dispatched || frame.skipped) return;
    if (frame.content.size() + static_cast<size_t>(length) > kMaxContentBytes) {
        stream.failAt(frame.line, frame.column,
                      "element \"" + frame.name + "\" holds more than " +
                          std::to_string(kMaxContentBytes) + " bytes of text");
        return;
    }
    frame.content.append(text, static_cast<size_t>(length));
}

void BNSerializerReadStream::Impl::endElement() {
    if (depth == 0) return;
    Frame& frame = frames[depth - 1];
    if (!frame.dispatched && !frame.skipped) dispatch(depth - 1);
    popHandlersOf(depth);
    --depth;
}

void BNSerializerReadStream::Impl::dispatch(size_t index) {
    Frame& frame = frames[index];
    frame.dispatched = true;
    if (stream._handlers.empty()) return;
    BNSerializer* handler = stream._handlers.back().handler;

    BNStreamElement element;
    element._stream = &stream;
    element._name = frame.name;
    element._line = frame.line;
    element._column = frame.column;
    element._frame = index;
    if (index > 0) element._parentName = frames[index - 1].name;
    element._content = handler->readSignificantWhiteSpace() ? std::string_view(frame.content)
                                                            : trimWhiteSpace(frame.content);
    element._elementId = stream.resolveElement(frame.name);

    const size_t outerDepth = stream._dispatchDepth;
    stream._dispatchDepth = index + 1;
    const bool skipChildren = handler->parseElement(stream, element);
    stream._dispatchDepth = outerDepth;
    if (skipChildren) frame.skipped = true;
}

void BNSerializerReadStream::Impl::popHandlersOf(size_t elementDepth) {
    auto& handlers = stream._handlers;
    while (!handlers.empty() && handlers.back().elementDepth == elementDepth) {
        const HandlerFrame ended = handlers.back();
        stream._lastParseEnd = ended.handler->parseEnd(stream);
        handlers.pop_back();
        if (stream._scopes.size() > ended.scopeDepth) stream._scopes.resize(ended.scopeDepth);
        ++stream._generation;
    }
}

const AttributeSpan* BNSerializerReadStream::Impl::findAttribute(const BNStreamElement& element,
                                                                 uint32_t attributeId) {
    if (element._stream != &stream || element._frame >= depth) return nullptr;
    const Frame& frame = frames[element._frame];
    const uint32_t elementId = element._elementId;
    AttributeCacheEntry& entry = attributeCache[(elementId * 31u + attributeId) & 63u];
    if (entry.generation != stream._generation || entry.elementId != elementId ||
        entry.attributeId != attributeId) {
        entry = AttributeCacheEntry{stream._generation, elementId, attributeId,
                                    stream.resolveAttribute(elementId, attributeId), 0};
    }
    if (!entry.name) return nullptr;
    const std::string_view name = entry.name;
    const size_t count = frame.attributes.size();
    if (entry.lastIndex < count && frame.attributeName(frame.attributes[entry.lastIndex]) == name)
        return &frame.attributes[entry.lastIndex];
    for (size_t i = 0; i < count; ++i) {
        if (frame.attributeName(frame.attributes[i]) == name) {
            entry.lastIndex = i;
            return &frame.attributes[i];
        }
    }
    return nullptr;
}

// ---- The stream -------------------------------------------------------------------------

BNSerializerReadStream::BNSerializerReadStream() : _impl(new Impl(*this)) {}

BNSerializerReadStream::~BNSerializerReadStream() { delete _impl; }

void BNSerializerReadStream::begin(BNSerializer& handler) {
    _impl->reset();
    _scopes.clear();
    _handlers.clear();
    _dispatchDepth = 0;
    _error.reset();
    ++_generation;
    pushHandler(&handler);
}

std::optional<BNSerializerError> BNSerializerReadStream::end() {
    if (!_error) _impl->popHandlersOf(0);
    _handlers.clear();
    _scopes.clear();
    ++_generation;
    return _error;
}

std::optional<BNSerializerError> BNSerializerReadStream::read(std::string_view document,
                                                              BNSerializer& handler) {
    begin(handler);
    XML_Parser parser = _impl->parser;
    // Fed in pieces: expat takes an int length, and a piece keeps its buffer small.
    size_t offset = 0;
    do {
        const size_t piece = std::min(document.size() - offset, kReadChunk);
        const bool last = offset + piece == document.size();
        if (XML_Parse(parser, document.data() + offset, static_cast<int>(piece), last) ==
                XML_STATUS_ERROR &&
            !_error) {
            failAt(XML_GetCurrentLineNumber(parser), XML_GetCurrentColumnNumber(parser) + 1,
                   XML_ErrorString(XML_GetErrorCode(parser)));
        }
        offset += piece;
    } while (offset < document.size() && !_error);
    return end();
}

std::optional<BNSerializerError> BNSerializerReadStream::readFile(const std::string& path,
                                                                  BNSerializer& handler) {
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(path.c_str(), "rb"),
                                                         &std::fclose);
    if (!file) return BNSerializerError{0, 0, "the file \"" + path + "\" cannot be opened"};
    begin(handler);
    XML_Parser parser = _impl->parser;
    for (bool last = false; !last && !_error;) {
        void* buffer = XML_GetBuffer(parser, static_cast<int>(kReadChunk));
        if (!buffer) {
            failAt(0, 0, "out of memory while reading \"" + path + "\"");
            break;
        }
        const size_t got = std::fread(buffer, 1, kReadChunk, file.get());
        if (std::ferror(file.get())) {
            failAt(0, 0, "the file \"" + path + "\" cannot be read");
            break;
        }
        last = got < kReadChunk;
        if (XML_ParseBuffer(parser, static_cast<int>(got), last) == XML_STATUS_ERROR && !_error) {
            failAt(XML_GetCurrentLineNumber(parser), XML_GetCurrentColumnNumber(parser) + 1,
                   XML_ErrorString(XML_GetErrorCode(parser)));
        }
    }
    return end();
}

void BNSerializerReadStream::pushScope(const BNScope& scope) {
    _scopes.push_back(&scope);
    ++_generation;
}

void BNSerializerReadStream::popScope() {
    const size_t floor = _handlers.empty() ? 0 : _handlers.back().scopeDepth;
    if (_scopes.size() <= floor) return;
    _scopes.pop_back();
    ++_generation;
}

bool BNSerializerReadStream::pushHandler(BNSerializer* handler) {
    if (!handler) return false;
    _handlers.push_back({handler, _scopes.size(), _dispatchDepth});
    ++_generation;
    return handler->parseBegin(*this);
}

uint32_t BNSerializerReadStream::resolveElement(std::string_view name) {
    if (_cachedNameGeneration == _generation && _cachedName == name) return _cachedNameId;
    uint32_t id = 0;
    // The scopes of the newest handler that pushed any.
    size_t top = _scopes.size();
    for (auto h = _handlers.rbegin(); h != _handlers.rend(); ++h) {
        if (h->scopeDepth < top) {
            for (size_t i = top; i-- > h->scopeDepth && id == 0;) id = _scopes[i]->elementId(name);
            break;
        }
        top = h->scopeDepth;
    }
    _cachedName.assign(name);
    _cachedNameId = id;
    _cachedNameGeneration = _generation;
    return id;
}

const char* BNSerializerReadStream::resolveAttribute(uint32_t elementId, uint32_t attributeId) {
    for (auto it = _scopes.rbegin(); it != _scopes.rend(); ++it)
        if (const char* name = (*it)->attributeName(elementId, attributeId)) return name;
    return nullptr;
}

std::optional<std::string_view> BNSerializerReadStream::attributeText(
    const BNStreamElement& element, uint32_t attributeId) {
    const AttributeSpan* span = _impl->findAttribute(element, attributeId);
    if (!span) return std::nullopt;
    return _impl->frames[element._frame].attributeValue(*span);
}

bool BNSerializerReadStream::getAsString(const BNStreamElement& element, BNString& out) {
    if (element._content.empty()) return false;
    out.assign(element._content);
    return true;
}

bool BNSerializerReadStream::badValue(const BNStreamElement& element,
                                      std::string_view attributeName, std::string_view text,
                                      int status) {
    std::string message = attributeName.empty() ? "the content" : "attribute \"";
    message += attributeName;
    if (!attributeName.empty()) message += '"';
    message += " of element \"";
    message += element._name;
    message += "\", \"";
    message += text.substr(0, 40);
    message += text.size() > 40 ? "...\", " : "\", ";
    message += describe(static_cast<TextValueStatus>(status));
    fail(element, std::move(message));
    return false;
}

// Every typed read: find the attribute, read its text, fail the stream on a bad value.
template <class T>
bool BNSerializerReadStream::Impl::readAttribute(const BNStreamElement& element,
                                                 uint32_t attributeId, T& out,
                                                 TextValueStatus (*parse)(std::string_view, T&)) {
    const AttributeSpan* span = findAttribute(element, attributeId);
    if (!span) return false;
    const Frame& frame = frames[element._frame];
    const std::string_view text = frame.attributeValue(*span);
    const TextValueStatus status = parse(text, out);
    if (status == TextValueStatus::Ok) return true;
    stream.badValue(element, frame.attributeName(*span), text, static_cast<int>(status));
    return false;
}

namespace {
TextValueStatus copyText(std::string_view text, BNString& out) {
    out.assign(text);
    return TextValueStatus::Ok;
}
}  // namespace

bool BNSerializerReadStream::getAttributeAsBool(const BNStreamElement& element,
                                                uint32_t attributeId, bool& out) {
    return _impl->readAttribute(element, attributeId, out, &parseBool);
}

bool BNSerializerReadStream::getAttributeAsString(const BNStreamElement& element,
                                                  uint32_t attributeId, BNString& out) {
    return _impl->readAttribute(element, attributeId, out, &copyText);
}

bool BNSerializerReadStream::getAttributeAsUInt32(const BNStreamElement& element,
                                                  uint32_t attributeId, uint32_t& out) {
    return _impl->readAttribute(element, attributeId, out, &parseUInt32);
}

bool BNSerializerReadStream::getAttributeAsUInt64(const BNStreamElement& element,
                                                  uint32_t attributeId, uint64_t& out) {
    return _impl->readAttribute(element, attributeId, out, &parseUInt64);
}

bool BNSerializerReadStream::getAttributeAsInt64(const BNStreamElement& element,
                                                 uint32_t attributeId, int64_t& out) {
    return _impl->readAttribute(element, attributeId, out, &parseInt64);
}

bool BNSerializerReadStream::getAttributeAsDouble(const BNStreamElement& element,
                                                  uint32_t attributeId, double& out) {
    return _impl->readAttribute(element, attributeId, out, &parseDouble);
}

bool BNSerializerReadStream::getAttributeAsTime(const BNStreamElement& element,
                                                uint32_t attributeId, CMTime& out) {
    return _impl->readAttribute(element, attributeId, out, &parseTime);
}

void BNSerializerReadStream::fail(const BNStreamElement& element, std::string message) {
    failAt(element._line, element._column, std::move(message));
}

void BNSerializerReadStream::failAt(uint64_t line, uint64_t column, std::string message) {
    if (_error) return;
    _error = BNSerializerError{line, column, std::move(message)};
    if (_impl->parser) XML_StopParser(_impl->parser, XML_FALSE);
}

// ---- Elements ---------------------------------------------------------------------------

bool BNStreamElement::getAsBool(bool& out) const {
    if (!_stream || _content.empty()) return false;
    const TextValueStatus status = parseBool(_content, out);
    if (status == TextValueStatus::Ok) return true;
    _stream->badValue(*this, {}, _content, static_cast<int>(status));
    return false;
}

bool BNStreamElement::getAttributeAsDouble(uint32_t attributeId, double& out) const {
    return _stream && _stream->getAttributeAsDouble(*this, attributeId, out);
}

bool BNStreamElement::getAttributeAsTime(uint32_t attributeId, CMTime& out) const {
    return _stream && _stream->getAttributeAsTime(*this, attributeId, out);
}

std::string BNSerializerError::text() const {
    if (line == 0) return message;
    return "line " + std::to_string(line) + ", column " + std::to_string(column) + ": " + message;
}
