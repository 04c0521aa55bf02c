#pragma once
// The curve view of the full editor: a timeline. Its horizontal position and zoom follow the
// display range that the controller (and through it the host's time scroller) decides; the
// reference width that a horizontal zoom factor of 1 stands for is the range given at
// setInitialTime. Vertical position and zoom are the view's own (TQCurveEditorViewBase).
//
// Every change of the display range comes back here through setDisplayRange, which puts the
// range into the view volume (displayRangeModified) and tells the controller.
//
// Created with the reference volume of the timeline: 100 seconds wide from time 0, 125 units
// high about 0, with a value step of 25 (five steps over the height) and a time step of 1 s.

#include <memory>

#include "platform/ui/RWTimecodeFormatter.h"
#include "src/view/TQCurveEditorViewBase.h"

class TQCurveEditorView : public TQCurveEditorViewBase {
public:
    static constexpr CGRect kInitialViewVolume = {{0.0, -62.5}, {100.0, 125.0}};
    // Value steps over the reference height.
    static constexpr double kValueStepsPerHeight = 5.0;

    TQCurveEditorView();

    // The view covers its whole frame.
    bool isOpaque() const { return true; }
    uint32_t numberOfTickMarks() const override { return 4; }

    // Stored and answered; nothing in this view draws it yet.
    void setShowAudio(char show);
    char showAudio() const { return _showAudio; }
    const RWTimecodeFormatter& timecodeFormatter() const { return *_timecodeFormatter; }

    // The reference width: x and width of the original view volume become the range's start
    // and duration in seconds. A null range changes nothing.
    void setInitialTime(const CMTimeRange* range);

    // Each tells the controller the horizontal part it reset, so that the display range
    // follows.
    void resetZoomX() override;
    void resetPanX() override;

    // The range (a null part keeps the present one), then displayRangeModified.
    void setDisplayRange(const CMTime* start, const CMTime* duration) override;
    // Puts the range into the view volume: stored, x and width from it, the horizontal zoom
    // in view points per second, the time grid from the host's text step; forgets a rubber
    // band, marks every curve for sampling again, redraws, and tells the controller.
    void displayRangeModified(CMTimeRange range);

    // The sketch tool starts only on selected channels.
    void mouseDownSketch(const RWEvent& event) override;

private:
    std::unique_ptr<RWTimecodeFormatter> _timecodeFormatter;
    char _showAudio = 0;
};
