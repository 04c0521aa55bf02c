#pragma once
// A stream that writes serializers as an XML document in UTF-8. Serializers speak in numeric
// ids; the stream writes the names that the pushed scopes give them (the newest scope that
// names an id wins). Values are written in the text forms of BNSerializerText.h: doubles
// read back to the same bits, times keep their value and timescale.
//
// An element is opened, given its attributes, then either content or child elements, and
// closed. The start tag is held back until content or a child comes, so attributes can be
// set until then. Children are indented by two spaces per level; content stays on the line
// of its element.
//
// Misuse (an id no pushed scope names, an attribute after content or a child, content
// beside children, a close with nothing open) and failures of the output are recorded: the
// first failure is kept, everything written after it is dropped, and finish() reports it.
//
// Output goes to a sink in pieces of about 64 KiB, so that a large document is never held
// whole in memory.

#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/media/CMTime.h"
#include "platform/support/BNScope.h"
#include "platform/support/BNSerializer.h"
#include "platform/support/BNString.h"

// Where the bytes of a stream go.
class BNOutputSink {
public:
    virtual ~BNOutputSink() = default;
    // False when the bytes could not be written.
    virtual bool write(std::string_view bytes) = 0;
};

class BNStringSink final : public BNOutputSink {
public:
    explicit BNStringSink(std::string& out) : _out(out) {}
    bool write(std::string_view bytes) override {
        _out.append(bytes);
        return true;
    }

private:
    std::string& _out;
};

// Writes to an open C file; the file stays the caller's.
class BNFileSink final : public BNOutputSink {
public:
    explicit BNFileSink(std::FILE* file) : _file(file) {}
    bool write(std::string_view bytes) override;

private:
    std::FILE* _file;
};

class BNSerializerWriteStream {
public:
    // Writes the XML declaration at once. The sink is not owned and must outlive the stream.
    explicit BNSerializerWriteStream(BNOutputSink& sink);
    BNSerializerWriteStream(const BNSerializerWriteStream&) = delete;
    BNSerializerWriteStream& operator=(const BNSerializerWriteStream&) = delete;

    void pushScope(const BNScope& scope);
    void popScope();

    // Opens a child of the open element (or the document's root element).
    void openElement(uint32_t elementId);
    // Closes the element opened last.
    void closeElement();

    // Content of the open element.
    void writeBool(bool value);
    void writeString(std::string_view text);

    // Attributes of the open element, by attribute id; an attribute set twice is written
    // twice, which the reader refuses, so don't.
    void setAttributeUInt32(uint32_t attributeId, uint32_t value);
    void setAttributeUInt64(uint32_t attributeId, uint64_t value);
    void setAttributeInt64(uint32_t attributeId, int64_t value);
    void setAttributeBool(uint32_t attributeId, bool value);
    void setAttributeDouble(uint32_t attributeId, double value);
    void setAttributeString(uint32_t attributeId, std::string_view value);
    void setAttributeTime(uint32_t attributeId, const CMTime& value);

    // Stops the writing with a failure of the caller's own (a value it cannot write).
    void fail(std::string message);

    // Closes every open element, writes out what is held and answers the first failure, if
    // any. Nothing can be written afterwards.
    std::optional<BNSerializerError> finish();
    bool failed() const { return _error.has_value(); }

private:
    struct OpenElement {
        const char* name;
        uint32_t elementId;
        bool hasChildren = false;
        bool hasContent = false;
    };

    const char* lookupElementName(uint32_t elementId) const;
    // Starts an attribute; false when it cannot be set now (the failure is recorded).
    bool beginAttribute(uint32_t attributeId);
    void endAttribute() { _buffer += '"'; }
    // Completes a start tag that is still being given attributes.
    void closeStartTag();
    void newLineAndIndent(size_t depth);
    void flushIfFull();

    BNOutputSink& _sink;
    std::vector<const BNScope*> _scopes;
    std::vector<OpenElement> _open;
    bool _startTagOpen = false;
    bool _finished = false;
    bool _rootWritten = false;
    std::string _buffer;
    std::optional<BNSerializerError> _error;
};
