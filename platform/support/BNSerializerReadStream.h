#pragma once
// A stream that reads an XML document into serializers, as it arrives: nothing but the open
// elements is held, so a document of any size is read in little memory. The XML itself is
// parsed by expat.
//
// Handlers. The serializer given to read() takes the root element. Every element is given to
// the parseElement of the current handler, the one pushed last whose element has not ended
// (see BNSerializer.h); a handler pushed from parseElement takes over the children of that
// element, and gives them back when the element ends.
//
// Elements. An element reaches its handler once its start tag and its content are known: at
// its first child element, or at its end if it has none. Its content is the text before its
// first child (text after a child is not kept), stripped of the white space at its ends
// unless the handler reads significant white space. The element (BNStreamElement) is valid
// during that one parseElement call.
//
// Names and ids. An element's name resolves to an id in the scopes the current handler has
// pushed, newest first; a handler that pushed none uses those of the handler below it. A name
// those scopes do not hold has id 0, and its element still reaches the handler, which is free
// to ignore it. An attribute resolves by (element id, attribute id) in every pushed scope,
// newest first.
//
// Failures. Malformed XML, a document type declaration (refused, so that no entity can
// expand: no billion laughs), nesting deeper than kMaxDepth, content longer than
// kMaxContentBytes, an attribute value that does not read as the type asked for, and any
// fail() of a handler stop the reading. read() then answers the first failure with the line
// and column where it was found.

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/media/CMTime.h"
#include "platform/support/BNScope.h"
#include "platform/support/BNSerializer.h"
#include "platform/support/BNString.h"

class BNSerializerReadStream;

class BNStreamElement {
public:
    uint32_t elementId() const { return _elementId; }
    std::string_view name() const { return _name; }
    // The place of the element's start tag, counting from 1.
    uint64_t line() const { return _line; }
    uint64_t column() const { return _column; }
    // The content as it stands (after stripping white space, see above).
    std::string_view content() const { return _content; }
    // How deep the element lies: 1 for the root element. A handler that checks the depth of
    // what it gets finds elements out of place (a child of an element that should have none
    // reaches the same handler, one level deeper).
    size_t depth() const { return _frame + 1; }
    // The name of the element that holds this one; empty for the root element.
    std::string_view parentName() const { return _parentName; }

    // The content as a bool; false when there is none. Content that is no bool fails the
    // stream (and answers false).
    bool getAsBool(bool& out) const;
    // The attribute with that id, if there; a value of another type fails the stream.
    bool getAttributeAsDouble(uint32_t attributeId, double& out) const;
    bool getAttributeAsTime(uint32_t attributeId, CMTime& out) const;

private:
    friend class BNSerializerReadStream;
    BNSerializerReadStream* _stream = nullptr;
    uint32_t _elementId = 0;
    std::string_view _name;
    std::string_view _content;
    std::string_view _parentName;
    uint64_t _line = 0;
    uint64_t _column = 0;
    size_t _frame = 0;  // the element's place on the stream's stack of open elements
};

class BNSerializerReadStream {
public:
    static constexpr size_t kMaxDepth = 256;
    static constexpr size_t kMaxContentBytes = size_t{1} << 20;

    BNSerializerReadStream();
    ~BNSerializerReadStream();
    BNSerializerReadStream(const BNSerializerReadStream&) = delete;
    BNSerializerReadStream& operator=(const BNSerializerReadStream&) = delete;

    // Reads one whole document; `handler` is pushed first (its parseBegin runs before the
    // first element, its parseEnd after the last). Answers the first failure, or nothing when
    // the document was read through. A stream can read again; scopes and handlers left from
    // an earlier read are dropped, the version and the frame duration stay.
    std::optional<BNSerializerError> read(std::string_view document, BNSerializer& handler);
    std::optional<BNSerializerError> readFile(const std::string& path, BNSerializer& handler);

    // Values of the document that a handler sets once it has read them and the handlers of
    // later elements read: the file format version (0 until set) and the frame duration
    // (invalid until set).
    int32_t version() const { return _version; }
    void setVersion(int32_t version) { _version = version; }
    const CMTime& frameDuration() const { return _frameDuration; }
    void setFrameDuration(const CMTime& duration) { _frameDuration = duration; }

    void pushScope(const BNScope& scope);
    // Pops a scope the current handler pushed; the scopes of handlers below stay.
    void popScope();
    // Makes `handler` the current handler for the children of the element being parsed. Not
    // owned. Answers its parseBegin.
    bool pushHandler(BNSerializer* handler);
    // The depth of the element being parsed, which a handler pushed now takes over (0 before
    // the root element).
    size_t handlerDepth() const { return _dispatchDepth; }
    // What the last handler to end answered from parseEnd.
    bool lastParseEndResult() const { return _lastParseEnd; }

    // The element's content as text; false when it has none.
    bool getAsString(const BNStreamElement& element, BNString& out);
    // An attribute by id: true when it is there and reads as the type; a value that is there
    // but does not read fails the stream.
    bool getAttributeAsBool(const BNStreamElement& element, uint32_t attributeId, bool& out);
    bool getAttributeAsString(const BNStreamElement& element, uint32_t attributeId, BNString& out);
    bool getAttributeAsUInt32(const BNStreamElement& element, uint32_t attributeId, uint32_t& out);
    bool getAttributeAsUInt64(const BNStreamElement& element, uint32_t attributeId, uint64_t& out);
    bool getAttributeAsInt64(const BNStreamElement& element, uint32_t attributeId, int64_t& out);
    bool getAttributeAsDouble(const BNStreamElement& element, uint32_t attributeId, double& out);
    bool getAttributeAsTime(const BNStreamElement& element, uint32_t attributeId, CMTime& out);
    // The raw text of an attribute, if there.
    std::optional<std::string_view> attributeText(const BNStreamElement& element,
                                                  uint32_t attributeId);

    // Stops the reading with an error at the element's place; the first failure is kept.
    void fail(const BNStreamElement& element, std::string message);
    bool failed() const { return _error.has_value(); }

    struct Impl;

private:
    struct HandlerFrame {
        BNSerializer* handler;
        size_t scopeDepth;    // scopes below this handler's own
        size_t elementDepth;  // the depth of the element it was pushed for (0: the document)
    };

    void begin(BNSerializer& handler);
    std::optional<BNSerializerError> end();
    uint32_t resolveElement(std::string_view name);
    const char* resolveAttribute(uint32_t elementId, uint32_t attributeId);
    // Fails the stream for a value that did not read; answers false.
    bool badValue(const BNStreamElement& element, std::string_view attributeName,
                  std::string_view text, int status);
    void failAt(uint64_t line, uint64_t column, std::string message);

    friend struct Impl;
    friend class BNStreamElement;
    Impl* _impl;

    std::vector<const BNScope*> _scopes;
    std::vector<HandlerFrame> _handlers;
    size_t _dispatchDepth = 0;  // depth of the element whose parseElement runs
    uint64_t _generation = 0;   // changes with the scopes and handlers, for the caches
    int32_t _version = 0;
    CMTime _frameDuration = kCMTimeInvalid;
    bool _lastParseEnd = false;
    std::optional<BNSerializerError> _error;

    // One-entry cache of the last element name resolved.
    std::string _cachedName;
    uint32_t _cachedNameId = 0;
    uint64_t _cachedNameGeneration = ~uint64_t{0};
};
