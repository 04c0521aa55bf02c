#pragma once
// The root of the channel class tree. A channel is one node of an object's tree: an animated
// value (TQChannel) or a group (TQChannelFolder and its kinds). Nodes own their children; a
// node's parent pointer is not owning.
//
// Lifetime: the framework never holds a channel pointer across user actions. It keeps a
// TQChannelRef (ids from a root down) and resolves it again at each use, so a channel may be
// destroyed at any time between two user actions.

#include <cstdint>
#include <memory>
#include <vector>

#include "platform/media/CMTime.h"
#include "platform/support/BNString.h"
#include "platform/support/BNTimeRange.h"

class TQChannelBase;
class TQChannelFolder;
class TQChannelRef;
class TQFactory;

// A keyframe as the framework sees it: opaque, valid only for the channel that issued it and
// only until that keyframe is deleted (getKeyframe on it is the liveness test).
using TQKeyframeHandle = void*;

// Identifier of a channel among its siblings; paths of TQChannelRef are chains of these.
using TQChannelId = uint32_t;
// Process-wide serial number of a node (see getSerial).
using TQChannelSerial = uint64_t;

// Channel flags (64-bit words, tested with any-bit semantics).
enum : uint64_t {
    kTQChannelFlagHidden = 0x2,
    kTQChannelFlagHiddenInCurveEditor = 0x10000,
    kTQChannelFlagNoInterpolationChange = 0x800000,
    kTQChannelFlagEnabledInCurveEditor = 0x1000000,
    kTQChannelFlagShowFlattened = 0x2000000,
    kTQChannelFlagNameInDisplayName = 0x4000000,
};

// Display and editing hints of a channel.
struct TQChannelInfo {
    double sliderMinimum = 0.0;  // lower bound of a value slider
    double valueStep = 1.0;      // multiplier of a vertical nudge
    double tickStep = 0.0;       // spacing of vertical tick marks; 0 lets the view choose
    double displayScale = 1.0;   // what a user reads is value * displayScale

    friend bool operator==(const TQChannelInfo&, const TQChannelInfo&) = default;
};

// The value range of a channel, read through pointers as the framework does.
class TQChannelRange {
public:
    TQChannelRange() = default;
    TQChannelRange(double minimum, double maximum) : _min(minimum), _max(maximum) {}
    void getRangeMin(double* out) const {
        if (out) *out = _min;
    }
    void getRangeMax(double* out) const {
        if (out) *out = _max;
    }
    void setRange(double minimum, double maximum) {
        _min = minimum;
        _max = maximum;
    }

    friend bool operator==(const TQChannelRange&, const TQChannelRange&) = default;

private:
    double _min = -1.0e9;
    double _max = 1.0e9;
};

// The part of a channel behind its public face that the framework reaches: its range.
class TQChannelImpl {
public:
    TQChannelRange& range() { return _range; }
    const TQChannelRange& range() const { return _range; }
    void getRangeMin(double* out) const { _range.getRangeMin(out); }
    void getRangeMax(double* out) const { _range.getRangeMax(out); }

private:
    TQChannelRange _range;
};

// Told before any channel below the node it is attached to changes (see noteWillChange).
// A host attaches one to its scene root to track modified channels.
class TQChannelChangeObserver {
public:
    virtual ~TQChannelChangeObserver() = default;
    virtual void channelWillChange(TQChannelBase& channel) = 0;
};

// An object manipulator attached to a channel (an on-canvas editing handle of the host).
class TQObjectManipulator {
public:
    virtual ~TQObjectManipulator() = default;
    // A value edit of `channel` opens (beginValueEdit); a manipulator that groups edits into
    // undo steps names the step with `undoText`. Manipulators that don't care keep this.
    virtual void beginValueEdit(TQChannelBase& channel, const BNString& undoText) {
        (void)channel;
        (void)undoText;
    }
};

class TQChannelBase {
public:
    TQChannelBase(const BNString& name, TQChannelId channelId);
    virtual ~TQChannelBase();

    TQChannelBase(const TQChannelBase&) = delete;

    // Identity: not part of the animation state, never copied by operator= or cloneChannel's
    // assignment of state (a clone keeps the source's name and id, but has no parent).
    const BNString& getName() const { return _name; }
    void setName(const BNString& name) { _name = name; }
    TQChannelId getChannelId() const { return _channelId; }
    TQChannelFolder* getParent() const { return _parent; }
    // Unique to this node for the life of the process, never copied and never reused: a node
    // made at the address of a destroyed one has another serial. Hosts key per-node records
    // by it where an address could outlive its node.
    TQChannelSerial getSerial() const { return _serial; }

    // Null for a node that is not a folder, or a folder without children. Order is display
    // order; an element may be null.
    virtual const std::vector<TQChannelBase*>* getChildren() const { return nullptr; }
    // The child with that id; none here (a leaf), folders look theirs up. One virtual call per
    // step of a reference's walk, which runs at every access of an item to its channel.
    virtual TQChannelBase* findChild(TQChannelId channelId) const {
        (void)channelId;
        return nullptr;
    }

    TQChannelInfo* getInfo() { return &_info; }
    const TQChannelInfo* getInfo() const { return &_info; }
    TQChannelImpl* getImpl() { return &_impl; }
    const TQChannelImpl* getImpl() const { return &_impl; }

    // Flags: unsigned 64-bit words; testFlag is true when any bit of the word is set.
    virtual bool testFlag(uint64_t flag) const;
    virtual void setFlag(uint64_t flag, bool notify = false);
    virtual void resetFlag(uint64_t flag, bool notify = false);
    // The whole flag word, for saving.
    uint64_t getFlags() const { return _flags; }

    // The whole animation state (keyframes, interpolation, extrapolation, initial value,
    // behaviours, flags of the state, and the same of every descendant by position) is
    // copied from another node of the same shape. Identity and parent stay.
    TQChannelBase& operator=(const TQChannelBase& other);
    // Deep comparison of the animation state, descendants included.
    bool operator==(const TQChannelBase& other) const;

    // Nearest object root at or above this node; null when detached from any.
    virtual TQChannelBase* getChannelRoot() const;
    virtual bool isLocked(bool checkAncestors = true) const;
    virtual bool isAnyAncestorLocked() const;
    virtual void setLocked(bool locked, bool notify = true);
    // Reference relative to this node's object root (relative to the top of its tree when it
    // has none).
    virtual TQChannelRef getRef(bool relativeToObjectRoot = true) const;
    virtual TQObjectManipulator* getObjectManipulator() const { return _manipulator; }
    void setObjectManipulator(TQObjectManipulator* manipulator) { _manipulator = manipulator; }

    // Deep copy owned by the caller, destroyed through the virtual destructor.
    virtual TQChannelBase* cloneChannel() const = 0;
    // The factory of this node's class, whose identifier names the class in saved data. The
    // base answers the plain channel's factory for a TQChannel and null for a class of the
    // host that has none; every class of this library overrides it.
    virtual const TQFactory* getFactory() const;

    // Announces a change: the nearest change observer at or above this node is told.
    virtual void noteWillChange(bool notify = true);
    void setChangeObserver(TQChannelChangeObserver* observer) { _observer = observer; }
    TQChannelChangeObserver* getChangeObserver() const { return _observer; }

    virtual bool isAnimated(bool checkChildren = false) const = 0;
    // Back to the default state.
    virtual void reset(bool notify = false) = 0;
    // Opens a value edit on an object manipulator's channel; the host's manipulator hears it.
    virtual void beginValueEdit(const BNString& undoText);
    virtual BNString getXAxisLabel() const { return _xAxisLabel; }
    void setXAxisLabel(const BNString& label) { _xAxisLabel = label; }

    // Offset from channel time to curve editor axis time: the sum of the offsets set on this
    // node and its ancestors.
    virtual CMTime timeOffset() const;
    void setTimeOffset(const CMTime& offset) { _ownTimeOffset = offset; }
    const CMTime& ownTimeOffset() const { return _ownTimeOffset; }
    // On an object root: the span of its object in time.
    virtual BNTimeRange timeExtent() const { return _timeExtent; }
    void setTimeExtent(const BNTimeRange& extent) { _timeExtent = extent; }

protected:
    // Subclasses copy and compare their own state and chain to their base. The base's state
    // is the flags, the lock, the info and the value range.
    virtual void assignState(const TQChannelBase& other);
    virtual bool equalState(const TQChannelBase& other) const;
    // Used by the copy operations of subclasses: name, id, own time offset, time extent and
    // X axis label. The change observer and the object manipulator belong to the host's
    // attachment of this very node and, like the serial, are never copied.
    void copyIdentityFrom(const TQChannelBase& other);

private:
    friend class TQChannelFolder;

    BNString _name;
    TQChannelId _channelId = 0;
    TQChannelSerial _serial;
    TQChannelFolder* _parent = nullptr;  // not owned
    uint64_t _flags = 0;
    bool _locked = false;
    TQChannelInfo _info;
    TQChannelImpl _impl;
    CMTime _ownTimeOffset = kCMTimeZero;
    BNTimeRange _timeExtent;
    BNString _xAxisLabel;
    TQChannelChangeObserver* _observer = nullptr;  // not owned
    TQObjectManipulator* _manipulator = nullptr;   // not owned
};
