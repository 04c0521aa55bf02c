#pragma once
// The user's custom curve sets as the host saves them in its project file: the "curvesets"
// tree. These are plain holders between the live sets and the file: the editor controller
// fills a list from its sets (saveCurveSets) and builds sets from a list the host has read
// (constructCurveSets). Channels are kept as TQChannelRef path text.
//
// Ownership: the list owns its sets, a set owns its items; each holder deletes what it owns.
//
// The scope tables are used as they stand: "colorindex" is attribute 2 of "channel" when an
// item writes it, and attribute 402 when a set reads it; an old file's "enabled" (401) is read
// into the colour index too, and "colorindex" wins when both are there. Writing never sets a
// shortcut (the editor does not pass it on), reading takes the one a file holds.

#include <cstdint>
#include <vector>

#include "platform/channels/TQChannelRef.h"
#include "platform/support/BNScope.h"
#include "platform/support/BNSerializer.h"
#include "platform/support/BNString.h"

extern const BNScope TQCurveEditorItemSerializerScope;
extern const BNScope TQCurveSetListSerializerScope;
extern const BNScope TQCurveSetSerializerScope;

// One channel of a saved set: its path and its colour.
class TQCurveEditorItemSerializer : public BNSerializer {
public:
    enum : uint32_t { kElementChannel = 400, kElementChannelRef = 3 };

    TQCurveEditorItemSerializer() = default;

    void setChannelRef(const TQChannelRef& ref) { _channelRef = ref.getText(); }
    const BNString& getChannelRef() const { return _channelRef; }
    void setColorIndex(uint32_t index) { _colorIndex = index; }
    uint32_t getColorIndex() const { return _colorIndex; }

    void writeHeader(BNSerializerWriteStream& stream, bool option) override;
    void writeBody(BNSerializerWriteStream& stream, bool option1, bool option2,
                   bool option3) override;
    bool parseBegin(BNSerializerReadStream& stream) override;
    bool parseEnd(BNSerializerReadStream& stream) override;
    // Reads the path from element 3; ignores everything else, element 400 included.
    bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override;

private:
    BNString _channelRef;
    uint32_t _colorIndex = 0;
};

// One saved custom set.
class TQCurveSetSerializer : public BNSerializer {
public:
    enum : uint32_t { kElementCurveSet = 601 };

    TQCurveSetSerializer() = default;
    explicit TQCurveSetSerializer(const BNString& name) : _name(name) {}
    ~TQCurveSetSerializer() override { clear(); }
    TQCurveSetSerializer(const TQCurveSetSerializer&) = delete;
    TQCurveSetSerializer& operator=(const TQCurveSetSerializer&) = delete;

    void setName(const BNString& name) { _name = name; }
    void setShortcut(BNString shortcut) { _shortcut = std::move(shortcut); }
    void setRelative(bool relative) { _relative = relative; }
    // Takes ownership.
    void addChannel(TQCurveEditorItemSerializer* item) { _channels.push_back(item); }
    // Deletes the items, last first.
    void clear();

    void writeHeader(BNSerializerWriteStream& stream, bool option) override;
    void writeBody(BNSerializerWriteStream& stream, bool option1, bool option2,
                   bool option3) override;
    bool parseBegin(BNSerializerReadStream& stream) override;
    bool parseEnd(BNSerializerReadStream& stream) override;
    bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override;

    // Read directly by the editor's constructCurveSets.
    std::vector<TQCurveEditorItemSerializer*> _channels;  // owned
    BNString _name;
    BNString _shortcut;
    bool _relative = false;
};

// The saved custom sets and the number of the selected set.
class TQCurveSetListSerializer : public BNSerializer {
public:
    enum : uint32_t { kElementCurveSets = 600, kAttributeSelected = 1 };

    TQCurveSetListSerializer() = default;
    ~TQCurveSetListSerializer() override { clear(); }
    TQCurveSetListSerializer(const TQCurveSetListSerializer&) = delete;
    TQCurveSetListSerializer& operator=(const TQCurveSetListSerializer&) = delete;

    // Takes ownership.
    void addCurveSet(TQCurveSetSerializer* set) { _curveSets.push_back(set); }
    // Deletes the sets, last first; the selected number stays.
    void clear();
    const std::vector<TQCurveSetSerializer*>& curveSets() const { return _curveSets; }
    void setSelectedCurveSet(uint32_t number) { _selectedCurveSet = number; }
    uint32_t getSelectedCurveSet() const { return _selectedCurveSet; }

    void writeHeader(BNSerializerWriteStream& stream, bool option) override;
    void writeBody(BNSerializerWriteStream& stream, bool option1, bool option2,
                   bool option3) override;
    // Both answer false, unlike the other serializers of the editor.
    bool parseBegin(BNSerializerReadStream& stream) override;
    bool parseEnd(BNSerializerReadStream& stream) override;
    // Takes the "curveset" children. Element 600 itself, with "selected", is the host's to
    // read: it sees the element open and calls setSelectedCurveSet.
    bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override;

private:
    std::vector<TQCurveSetSerializer*> _curveSets;  // owned
    uint32_t _selectedCurveSet = 1;
};
