#include "platform/support/BNSerializerWriteStream.h"

#include "platform/support/internal/BNSerializerText.h"

using namespace bn_internal;

namespace {
constexpr size_t kFlushSize = 64 * 1024;
}

bool BNFileSink::write(std::string_view bytes) {
    return std::fwrite(bytes.data(), 1, bytes.size(), _file) == bytes.size();
}

BNSerializerWriteStream::BNSerializerWriteStream(BNOutputSink& sink) : _sink(sink) {
    _buffer.reserve(kFlushSize + 4096);
    _buffer += "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";
}

void BNSerializerWriteStream::pushScope(const BNScope& scope) { _scopes.push_back(&scope); }

void BNSerializerWriteStream::popScope() {
    if (_scopes.empty()) return fail("a scope was popped that was never pushed");
    _scopes.pop_back();
}

const char* BNSerializerWriteStream::lookupElementName(uint32_t elementId) const {
    for (auto it = _scopes.rbegin(); it != _scopes.rend(); ++it)
        if (const char* name = (*it)->elementName(elementId)) return name;
    return nullptr;
}

void BNSerializerWriteStream::openElement(uint32_t elementId) {
    if (_error || _finished) return;
    const char* name = lookupElementName(elementId);
    if (!name)
        return fail("element id " + std::to_string(elementId) + " has no name in the scopes");
    if (_open.empty()) {
        if (_rootWritten) return fail("a document has one root element");
        _rootWritten = true;
    } else {
        OpenElement& parent = _open.back();
        if (parent.hasContent) return fail("an element cannot hold both content and children");
        closeStartTag();
        parent.hasChildren = true;
        newLineAndIndent(_open.size());
    }
    _buffer += '<';
    _buffer += name;
    _open.push_back({name, elementId});
    _startTagOpen = true;
}

void BNSerializerWriteStream::closeElement() {
    if (_error || _finished) return;
    if (_open.empty()) return fail("an element was closed that was never opened");
    const OpenElement element = _open.back();
    _open.pop_back();
    if (_startTagOpen) {
        _buffer += "/>";
        _startTagOpen = false;
    } else {
        if (element.hasChildren) newLineAndIndent(_open.size());
        _buffer += "</";
        _buffer += element.name;
        _buffer += '>';
    }
    flushIfFull();
}

void BNSerializerWriteStream::writeBool(bool value) { writeString(value ? "true" : "false"); }

void BNSerializerWriteStream::writeString(std::string_view text) {
    if (_error || _finished) return;
    if (_open.empty()) return fail("content was written outside any element");
    OpenElement& element = _open.back();
    if (element.hasChildren) return fail("an element cannot hold both content and children");
    closeStartTag();
    element.hasContent = true;
    appendEscaped(_buffer, text, false);
    flushIfFull();
}

bool BNSerializerWriteStream::beginAttribute(uint32_t attributeId) {
    if (_error || _finished) return false;
    if (_open.empty() || !_startTagOpen) {
        fail("an attribute was set after its element's content or children");
        return false;
    }
    const uint32_t elementId = _open.back().elementId;
    const char* name = nullptr;
    for (auto it = _scopes.rbegin(); it != _scopes.rend() && !name; ++it)
        name = (*it)->attributeName(elementId, attributeId);
    if (!name) {
        fail("attribute id " + std::to_string(attributeId) + " of element id " +
             std::to_string(elementId) + " has no name in the scopes");
        return false;
    }
    _buffer += ' ';
    _buffer += name;
    _buffer += "=\"";
    return true;
}

void BNSerializerWriteStream::setAttributeUInt32(uint32_t attributeId, uint32_t value) {
    setAttributeUInt64(attributeId, value);
}

void BNSerializerWriteStream::setAttributeUInt64(uint32_t attributeId, uint64_t value) {
    if (!beginAttribute(attributeId)) return;
    appendUInt64(_buffer, value);
    endAttribute();
}

void BNSerializerWriteStream::setAttributeInt64(uint32_t attributeId, int64_t value) {
    if (!beginAttribute(attributeId)) return;
    appendInt64(_buffer, value);
    endAttribute();
}

void BNSerializerWriteStream::setAttributeBool(uint32_t attributeId, bool value) {
    if (!beginAttribute(attributeId)) return;
    appendBool(_buffer, value);
    endAttribute();
}

void BNSerializerWriteStream::setAttributeDouble(uint32_t attributeId, double value) {
    if (!beginAttribute(attributeId)) return;
    appendDouble(_buffer, value);
    endAttribute();
}

void BNSerializerWriteStream::setAttributeString(uint32_t attributeId, std::string_view value) {
    if (!beginAttribute(attributeId)) return;
    appendEscaped(_buffer, value, true);
    endAttribute();
}

void BNSerializerWriteStream::setAttributeTime(uint32_t attributeId, const CMTime& value) {
    if (!beginAttribute(attributeId)) return;
    appendTime(_buffer, value);
    endAttribute();
}

void BNSerializerWriteStream::closeStartTag() {
    if (!_startTagOpen) return;
    _buffer += '>';
    _startTagOpen = false;
}

void BNSerializerWriteStream::newLineAndIndent(size_t depth) {
    _buffer += '\n';
    _buffer.append(2 * depth, ' ');
}

void BNSerializerWriteStream::fail(std::string message) {
    if (!_error) _error = BNSerializerError{0, 0, std::move(message)};
    _buffer.clear();
}

void BNSerializerWriteStream::flushIfFull() {
    if (_buffer.size() < kFlushSize) return;
    if (!_sink.write(_buffer)) fail("the output could not be written");
    _buffer.clear();
}

std::optional<BNSerializerError> BNSerializerWriteStream::finish() {
    if (_finished) return _error;
    while (!_open.empty() && !_error) closeElement();
    if (!_error && !_rootWritten) fail("the document has no root element");
    if (!_error) {
        _buffer += '\n';
        if (!_sink.write(_buffer)) fail("the output could not be written");
    }
    _buffer.clear();
    _buffer.shrink_to_fit();
    _finished = true;
    return _error;
}
