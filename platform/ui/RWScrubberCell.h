#pragma once
// A number cell that the user scrubs: a press and a horizontal drag in the cell change its
// value by steps, as a scrubber field does, and a click without a drag asks to edit the text.
//
// A scrub tells the target three things, the cell as sender each time: the start
// ("startScrubberAction:") at the first step, the cell's action at each step with the new
// value, and the end ("endScrubberAction:") at the release. The target may change the cell's
// range, increments and formatter at the start; the value the scrub starts from is read
// after that, through the formatter when the cell holds text. A step is the normal increment
// per kPointsPerStep points of travel, the coarse one with Shift, the fine one with Option;
// the value stays within the range.

#include <limits>

#include "platform/ui/RWTextField.h"

class RWScrubberCell : public RWTextFieldCell {
public:
    static constexpr double kPointsPerStep = 4.0;
    // Travel below this is a click, not a scrub.
    static constexpr double kDragThreshold = 3.0;
    static constexpr const char* kStartAction = "startScrubberAction:";
    static constexpr const char* kEndAction = "endScrubberAction:";

    explicit RWScrubberCell(const std::string& text = {}) : RWTextFieldCell(text) {}

    double minValue() const { return _minValue; }
    void setMinValue(double value) { _minValue = value; }
    double maxValue() const { return _maxValue; }
    void setMaxValue(double value) { _maxValue = value; }
    double coarseIncrement() const { return _coarseIncrement; }
    void setCoarseIncrement(double increment) { _coarseIncrement = increment; }
    double normalIncrement() const { return _normalIncrement; }
    void setNormalIncrement(double increment) { _normalIncrement = increment; }
    double fineIncrement() const { return _fineIncrement; }
    void setFineIncrement(double increment) { _fineIncrement = increment; }
    // Whether a scrub is running (between its start and its end).
    bool isScrubbing() const { return _scrubbing; }

    bool trackMouse(const RWEvent& event, const CGPoint& point, const CGRect& frame,
                    RWOutlineView& view, bool untilMouseUp) override;
    void continueTracking(const RWEvent& event, const CGPoint& point, RWOutlineView& view) override;
    void stopTracking(const CGPoint& point, RWOutlineView& view, bool mouseIsUp) override;
    bool wantsEditingAfterTracking() const override { return _clickedWithoutScrub; }
    bool prefersTrackingUntilMouseUp() const override { return true; }
    std::shared_ptr<RWTextFieldCell> copy() const override;
    std::shared_ptr<RWCell> copyForTracking() const override { return copy(); }

protected:
    // The cell's settings, range and increments onto another scrubber cell.
    void copyScrubberSettingsTo(RWScrubberCell& copy) const;

private:
    // The value the cell shows, as a number: through the formatter when it holds text.
    double shownValue() const;

    double _minValue = -std::numeric_limits<double>::max();
    double _maxValue = std::numeric_limits<double>::max();
    double _coarseIncrement = 10.0;
    double _normalIncrement = 1.0;
    double _fineIncrement = 0.1;
    CGPoint _pressPoint = CGPointZero;
    double _startValue = 0.0;
    bool _tracking = false;
    bool _scrubbing = false;
    bool _clickedWithoutScrub = false;
};
