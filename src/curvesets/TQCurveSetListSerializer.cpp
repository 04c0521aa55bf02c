#include "src/curvesets/TQCurveSetListSerializer.h"

#include "platform/support/BNSerializerReadStream.h"
#include "platform/support/BNSerializerWriteStream.h"

namespace {

const BNScopeEntry kItemTable[] = {
    {"channel", 400, 0},
    {"colorindex", 400, 2},
    {"channelref", 3, 0},
    {nullptr, 0, 0},
};

const BNScopeEntry kListTable[] = {
    {"curvesets", 600, 0}, {"selected", 600, 1}, {"curveset", 601, 0}, {"name", 601, 2},
    {"shortcut", 601, 3},  {"relative", 601, 4}, {nullptr, 0, 0},
};

const BNScopeEntry kSetTable[] = {
    {"curveset", 601, 0}, {"name", 601, 2},      {"shortcut", 601, 3},     {"relative", 601, 4},
    {"channel", 400, 0},  {"enabled", 400, 401}, {"colorindex", 400, 402}, {nullptr, 0, 0},
};

enum : uint32_t {
    kItemAttributeColorIndex = 2,  // as the item writes it
    kSetAttributeName = 2,
    kSetAttributeShortcut = 3,
    kSetAttributeRelative = 4,
    kSetAttributeEnabled = 401,  // as a set reads a channel
    kSetAttributeColorIndex = 402,
};

template <class T>
void deleteFromTheBack(std::vector<T*>& owned) {
    while (!owned.empty()) {
        delete owned.back();
        owned.pop_back();
    }
}

}  // namespace

const BNScope TQCurveEditorItemSerializerScope(kItemTable);
const BNScope TQCurveSetListSerializerScope(kListTable);
const BNScope TQCurveSetSerializerScope(kSetTable);

// ---- Item -------------------------------------------------------------------------------

void TQCurveEditorItemSerializer::writeHeader(BNSerializerWriteStream& stream, bool) {
    stream.pushScope(TQCurveEditorItemSerializerScope);
    stream.openElement(kElementChannel);
    stream.setAttributeUInt32(kItemAttributeColorIndex, _colorIndex);
    stream.popScope();
}

void TQCurveEditorItemSerializer::writeBody(BNSerializerWriteStream& stream, bool, bool, bool) {
    stream.pushScope(TQCurveEditorItemSerializerScope);
    stream.openElement(kElementChannelRef);
    stream.writeString(_channelRef);
    stream.closeElement();
    stream.popScope();
}

bool TQCurveEditorItemSerializer::parseBegin(BNSerializerReadStream& stream) {
    stream.pushScope(TQCurveEditorItemSerializerScope);
    return true;
}

bool TQCurveEditorItemSerializer::parseEnd(BNSerializerReadStream&) { return true; }

bool TQCurveEditorItemSerializer::parseElement(BNSerializerReadStream& stream,
                                               BNStreamElement& element) {
    if (element.elementId() == kElementChannelRef) stream.getAsString(element, _channelRef);
    return false;
}

// ---- Set --------------------------------------------------------------------------------

void TQCurveSetSerializer::clear() { deleteFromTheBack(_channels); }

void TQCurveSetSerializer::writeHeader(BNSerializerWriteStream& stream, bool) {
    stream.pushScope(TQCurveSetSerializerScope);
    stream.openElement(kElementCurveSet);
    stream.setAttributeString(kSetAttributeName, _name);
    stream.setAttributeString(kSetAttributeShortcut, _shortcut);
    stream.setAttributeBool(kSetAttributeRelative, _relative);
    stream.popScope();
}

void TQCurveSetSerializer::writeBody(BNSerializerWriteStream& stream, bool, bool, bool) {
    stream.pushScope(TQCurveSetSerializerScope);
    for (TQCurveEditorItemSerializer* item : _channels) {
        item->writeHeader(stream, false);
        item->writeBody(stream, false, true, true);
        stream.closeElement();
    }
    stream.popScope();
}

bool TQCurveSetSerializer::parseBegin(BNSerializerReadStream& stream) {
    stream.pushScope(TQCurveSetSerializerScope);
    return true;
}

bool TQCurveSetSerializer::parseEnd(BNSerializerReadStream&) { return true; }

bool TQCurveSetSerializer::parseElement(BNSerializerReadStream& stream, BNStreamElement& element) {
    if (element.elementId() != TQCurveEditorItemSerializer::kElementChannel) return false;
    auto* item = new TQCurveEditorItemSerializer;
    // One variable for both names: an old file's "enabled" stands in for the colour index,
    // and "colorindex" wins when both are there.
    uint32_t colorIndex = 0;
    stream.getAttributeAsUInt32(element, kSetAttributeEnabled, colorIndex);
    stream.getAttributeAsUInt32(element, kSetAttributeColorIndex, colorIndex);
    item->setColorIndex(colorIndex);
    stream.pushHandler(item);
    item->parseElement(stream, element);
    _channels.push_back(item);
    return false;
}

// ---- List -------------------------------------------------------------------------------

void TQCurveSetListSerializer::clear() { deleteFromTheBack(_curveSets); }

void TQCurveSetListSerializer::writeHeader(BNSerializerWriteStream& stream, bool) {
    stream.pushScope(TQCurveSetListSerializerScope);
    stream.openElement(kElementCurveSets);
    stream.setAttributeUInt32(kAttributeSelected, _selectedCurveSet);
    stream.popScope();
}

void TQCurveSetListSerializer::writeBody(BNSerializerWriteStream& stream, bool option1, bool,
                                         bool) {
    stream.pushScope(TQCurveSetListSerializerScope);
    for (TQCurveSetSerializer* set : _curveSets) {
        set->writeHeader(stream, option1);
        set->writeBody(stream, option1, true, true);
        stream.closeElement();
    }
    stream.popScope();
}

bool TQCurveSetListSerializer::parseBegin(BNSerializerReadStream& stream) {
    stream.pushScope(TQCurveSetListSerializerScope);
    return false;
}

bool TQCurveSetListSerializer::parseEnd(BNSerializerReadStream&) { return false; }

bool TQCurveSetListSerializer::parseElement(BNSerializerReadStream& stream,
                                            BNStreamElement& element) {
    if (element.elementId() != TQCurveSetSerializer::kElementCurveSet) return false;
    auto* set = new TQCurveSetSerializer;
    BNString text;
    if (stream.getAttributeAsString(element, kSetAttributeName, text)) set->_name = text;
    if (stream.getAttributeAsString(element, kSetAttributeShortcut, text)) set->_shortcut = text;
    bool relative = false;
    if (stream.getAttributeAsBool(element, kSetAttributeRelative, relative))
        set->_relative = relative;
    stream.pushHandler(set);
    _curveSets.push_back(set);
    return false;
}
