#pragma once
// The automatic curve sets: the built-in sets of the editor's pop-up. None holds channels that
// a user picked; each decides at every refresh what it shows.
//
//   by channel state   TQCurveSetAll        every keyframable channel of the selected objects
//                      TQCurveSetAnimated   channels with a curve (two keypoints or more) or a
//                                           behaviour
//                      TQCurveSetModified   as Animated, and also one keypoint, a value away
//                                           from the default, a component of an animated
//                                           compound (both on TQCurveSetByChannelState)
//   active             TQCurveSetCurrent    the channels the host reports as modified
//   by property        TQCurveSetPosition, TQCurveSetScale, TQCurveSetRotation,
//                      TQCurveSetShear, TQCurveSetPivot, TQCurveSetOpacity,
//                      TQCurveSetRetiming   relative sets with a fixed table of channel paths
//
// Construct, then initWithName with the localised text of the class's kNameKey and the host.
// The sets by property read the host's isKestrel once, in initWithName, to pick their table.
// A set shows what it found at its last refresh (refresh, with the number of samples of the
// view's width): only the selected set is refreshed, the others keep stale items meanwhile.
// With no delegate every set refreshes to empty.
//
// The controller owns one of each. Copies (copy()) keep the class, the shortcut and the paths.

#include "src/curvesets/TQCurveSet.h"

// --- Sets by channel state ---------------------------------------------------------------------

// The keyframable channels of every selected object. Items come back enabled at each refresh:
// this set carries no enable state over.
class TQCurveSetAll : public TQCurveSet {
public:
    static constexpr const char* kNameKey = "Curve Editor Curve Set All";

    // Opens each root and drops the children that take no keypoints. Roots without children
    // at the start of the pass go; a root that loses its last child here stays, empty (kept on
    // purpose: the next pass, at the next root added, removes it).
    void filterList() override;
    // One root per selected object, each with its own run of curve colours.
    void refresh(uint32_t numberOfSamples, bool snapshot) override;

protected:
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<TQCurveSetAll>(); }
};

// What Animated and Modified share. A refresh rebuilds the set from the selected objects in a
// temporary set, carrying the enable states of the present items over (they survive a
// refresh), and calls addObjectsAffectedByBehavior once per object; then the set takes the
// temporary set's roots. The filter keeps, under each root, the channels its rule accepts.
class TQCurveSetByChannelState : public TQCurveSet {
public:
    void filterList() override;
    void refresh(uint32_t numberOfSamples, bool snapshot) override;
    // Called once per selected object during a refresh, with the temporary set being built.
    // Adds nothing here; it is the hook for a subclass that brings in objects that behaviours
    // of this one affect.
    virtual void addObjectsAffectedByBehavior(TQChannelBase* objectRoot, TQCurveSet& curveSet,
                                              uint32_t numberOfSamples);

protected:
    // Whether the set shows a channel, knowing whether the channel's object is selected.
    virtual bool keepsChannel(const TQChannel& channel, bool objectSelected) const = 0;
    // The uninitialised set a refresh builds in.
    virtual TQCurveSetPtr makeTemporarySet() const = 0;
};

// Channels of the selected objects that move: a curve of two keypoints or more, or a
// behaviour (unless the channel is rigged); and channels moved by a selected behaviour on an
// object that is not selected. Shortcut "u".
class TQCurveSetAnimated : public TQCurveSetByChannelState {
public:
    static constexpr const char* kNameKey = "Curve Editor Curve Set Animated";

    void initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) override;

protected:
    bool keepsChannel(const TQChannel& channel, bool objectSelected) const override;
    // Of the receiver's own class, so that a subclass's filter decides alone.
    TQCurveSetPtr makeTemporarySet() const override { return makeEmpty(); }
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<TQCurveSetAnimated>(); }
};

// What Animated shows, and also: a channel with a single keypoint, a channel without keypoints
// whose value at time zero is off its default by 1e-7 or more, and a component of an animated
// compound. Shortcut "y".
class TQCurveSetModified : public TQCurveSetByChannelState {
public:
    static constexpr const char* kNameKey = "Curve Editor Curve Set Modified";

    void initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) override;

protected:
    bool keepsChannel(const TQChannel& channel, bool objectSelected) const override;
    // Of this class whatever the receiver's: a subclass's filter runs after this one's.
    TQCurveSetPtr makeTemporarySet() const override {
        return std::make_shared<TQCurveSetModified>();
    }
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<TQCurveSetModified>(); }
};

// --- The active set ----------------------------------------------------------------------------

// Follows the channels the host reports as modified (modifiedChannels, wasChannelModified).
// Unlike the others it keeps its items from one refresh to the next and changes them by
// difference: a channel stays while the host still reports it modified and it takes keypoints.
class TQCurveSetCurrent : public TQCurveSetMutable {
public:
    static constexpr const char* kNameKey = "Curve Editor Curve Set Active";

    void refresh(uint32_t numberOfSamples, bool snapshot) override;
    // Whether the set holds as many items as `items` and each is in `items` (same channel).
    // True for two empty lists. Deliberately the answer for the last item alone: an earlier
    // item missing from `items` does not make it false.
    bool containsOnlyChannels(const std::vector<TQCurveEditorItemPtr>& items) const;

protected:
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<TQCurveSetCurrent>(); }
};

// --- Sets by property --------------------------------------------------------------------------

enum class TQCurveSetProperty { Position, Scale, Rotation, Shear, Pivot, Opacity, Retiming };

// A relative set over a fixed table of channel paths below each object's root. Which table
// (there is one per object model of the host) is chosen by the delegate's isKestrel at
// initWithName; without a delegate the second table. On a host of the second model the Shear
// set has no path and so never shows a channel. The paths never change afterwards: nothing but
// initWithName writes them (copies take the source's).
class TQCurveSetByProperty : public TQCurveSet {
public:
    TQCurveSetProperty property() const { return _property; }
    // The strings-table key of the set's name.
    static constexpr const char* nameKey(TQCurveSetProperty property) {
        switch (property) {
            case TQCurveSetProperty::Position: return "Curve Editor Curve Set Position";
            case TQCurveSetProperty::Scale: return "Curve Editor Curve Set Scale";
            case TQCurveSetProperty::Rotation: return "Curve Editor Curve Set Rotation";
            case TQCurveSetProperty::Shear: return "Curve Editor Curve Set Shear";
            case TQCurveSetProperty::Pivot: return "Curve Editor Curve Set Pivot";
            case TQCurveSetProperty::Opacity: return "Curve Editor Curve Set Opacity";
            case TQCurveSetProperty::Retiming: return "Curve Editor Curve Set Retiming";
        }
        return "";
    }
    // The path table of a property, in the order the set keeps it, for one of the models.
    static std::vector<TQChannelRef> paths(TQCurveSetProperty property, bool kestrel);

    // Base initialisation, the property's shortcut, relative, and the paths of the table.
    void initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) override;

protected:
    explicit TQCurveSetByProperty(TQCurveSetProperty property) : _property(property) {}

private:
    TQCurveSetProperty _property;
};

// One class per property, so that each set has a type of its own.
template <TQCurveSetProperty P>
class TQCurveSetOfProperty final : public TQCurveSetByProperty {
public:
    static constexpr const char* kNameKey = nameKey(P);

    TQCurveSetOfProperty() : TQCurveSetByProperty(P) {}

protected:
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<TQCurveSetOfProperty>(); }
};

using TQCurveSetPosition = TQCurveSetOfProperty<TQCurveSetProperty::Position>;  // "p"
using TQCurveSetScale = TQCurveSetOfProperty<TQCurveSetProperty::Scale>;        // "s"
using TQCurveSetRotation = TQCurveSetOfProperty<TQCurveSetProperty::Rotation>;  // "r"
using TQCurveSetShear = TQCurveSetOfProperty<TQCurveSetProperty::Shear>;        // "h"
using TQCurveSetPivot = TQCurveSetOfProperty<TQCurveSetProperty::Pivot>;        // "a"
using TQCurveSetOpacity = TQCurveSetOfProperty<TQCurveSetProperty::Opacity>;    // "o"
using TQCurveSetRetiming = TQCurveSetOfProperty<TQCurveSetProperty::Retiming>;  // "t"
