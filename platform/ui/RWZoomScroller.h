#pragma once
// A scroller whose knob can also be resized: its position is the value (0 at the top or left
// end, 1 at the other), its length the knob proportion, the visible part of the whole. The
// user pages and steps with clicks beside the knob and on the arrows, moves the knob, and
// drags either end of the knob to zoom. After each gesture the action is sent, and hitPart
// says which part the user worked.
//
// Values are kept within 0 and 1. The knob is never drawn shorter than the minimum knob
// proportion, whatever the proportion says.

#include <cstdint>

#include "platform/ui/RWControl.h"

// The parts of a scroller a gesture works, as hitPart answers them.
enum RWScrollerPart : int32_t {
    kRWScrollerNoPart = 0,
    kRWScrollerDecrementPage = 1,  // a click in the slot before the knob
    kRWScrollerKnob = 2,           // the knob, dragged
    kRWScrollerIncrementPage = 3,  // a click in the slot after the knob
    kRWScrollerDecrementLine = 4,  // the arrow at the start
    kRWScrollerIncrementLine = 5,  // the arrow at the end
    kRWScrollerKnobSlot = 6,       // a click in the slot that moves the knob there
    kRWScrollerKnobStartEdge = 7,  // the knob's start end, dragged: it zooms
    kRWScrollerKnobEndEdge = 8,    // the knob's far end, dragged: it zooms
};

class RWZoomScroller : public RWControl {
public:
    // Room a window's resize corner takes at the end of a scroller that ends there.
    static constexpr double kGrowBoxSize = 15.0;

    double floatValue() const { return _value; }
    // Kept within 0 and 1.
    void setFloatValue(double value);
    double knobProportion() const { return _knobProportion; }
    // Kept within 0 and 1.
    void setKnobProportion(double proportion);
    double minimumKnobProportion() const { return _minimumKnobProportion; }
    void setMinimumKnobProportion(double proportion);
    // What the knob shows: the proportion, at least the minimum.
    double displayedKnobProportion() const;
    // The part of the last gesture; kRWScrollerNoPart before any.
    RWScrollerPart hitPart() const { return _hitPart; }
    // Vertical unless set otherwise: value 0 at the top.
    bool isVertical() const { return _vertical; }
    void setVertical(bool vertical);

    // Whether the scroller ends in the window's resize corner; a frame set then leaves room
    // for the corner (_adjustForGrowBox).
    bool endsAtWindowCorner() const { return _endsAtWindowCorner; }
    void setEndsAtWindowCorner(bool ends) { _endsAtWindowCorner = ends; }
    void setFrame(const CGRect& frame) override;

    // ---- The user ----
    // A click on a page or line part (1, 3, 4, 5): the action decides the move.
    void userClickPart(RWScrollerPart part);
    // The knob dragged to a value, or the slot clicked at one (kRWScrollerKnobSlot).
    void userMoveKnob(double value, RWScrollerPart part = kRWScrollerKnob);
    // An end of the knob dragged: the knob takes the new proportion and value.
    void userResizeKnob(RWScrollerPart edge, double knobProportion, double value);

protected:
    // Shortens the frame at its end by kGrowBoxSize when the scroller ends in the window's
    // corner, so that the corner stays free.
    virtual void _adjustForGrowBox();

private:
    // Records the part and sends the action, unless the scroller is disabled.
    void act(RWScrollerPart part);

    double _value = 0.0;
    double _knobProportion = 0.0;
    double _minimumKnobProportion = 0.0;
    RWScrollerPart _hitPart = kRWScrollerNoPart;
    bool _vertical = true;
    bool _endsAtWindowCorner = false;
};
