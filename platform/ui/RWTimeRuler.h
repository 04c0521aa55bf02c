#pragma once
// A time ruler: the strip over a timeline that shows which time lies under each place, with
// labels at the host's text step and a mark at the playhead; a press and a drag on it put the
// playhead where the pointer is.
//
// Geometry is in the ruler's points along its width: the display range fills the width, its
// start at x = 0. A time from the user is put on the frame grid (the frame it falls in) and
// kept within the display range, so that the playhead never leaves what the ruler shows.
//
// The label texts come from the formatter, with the label's time in seconds as a number. The
// formatter is not owned.

#include <vector>

#include "platform/media/CMTime.h"
#include "platform/ui/RWControl.h"
#include "platform/ui/RWFormatter.h"

class RWTimeRuler : public RWControl {
public:
    const CMTimeRange& displayRange() const { return _displayRange; }
    void setDisplayRange(const CMTimeRange& range);
    const CMTime& currentTime() const { return _currentTime; }
    void setCurrentTime(const CMTime& time);
    // The frame grid; one that is not a positive numeric time puts no time on a grid.
    const CMTime& frameDuration() const { return _frameDuration; }
    void setFrameDuration(const CMTime& duration);
    // Time between two labels; one that is not a positive numeric time gives no labels.
    const CMTime& labelStep() const { return _labelStep; }
    void setLabelStep(const CMTime& step);
    const RWFormatter* labelFormatter() const { return _labelFormatter; }
    void setLabelFormatter(const RWFormatter* formatter);

    // ---- Geometry, for a ruler `width` points wide ----
    // Where a time lies (outside [0, width] for a time outside the range). 0 for an empty
    // range or width.
    double xForTime(const CMTime& time, double width) const;
    // The time under x, unsnapped; the range's start for an empty range or width.
    CMTime timeForX(double x, double width) const;
    // The times of the labels: multiples of the label step within the range, the step
    // doubled, then five and ten times it and so on, until two labels are at least
    // minSpacing points apart.
    std::vector<CMTime> labelTimes(double width, double minSpacing) const;
    // The label's text, through the formatter (the plain seconds without one).
    std::string labelText(const CMTime& time) const;

    // ---- The user ----
    // A press starts tracking and puts the playhead under the pointer; each drag moves it;
    // the release ends tracking. The action goes at the press and at each drag that moved
    // the playhead to another frame, with the new time in currentTime.
    void userPress(double x, double width);
    void userDrag(double x, double width);
    void userRelease();
    bool isTracking() const { return _tracking; }

private:
    void userSetTime(double x, double width, bool always);

    CMTimeRange _displayRange = CMTimeRangeMake(kCMTimeZero, CMTimeMake(10, 1));
    CMTime _currentTime = kCMTimeZero;
    CMTime _frameDuration = CMTimeMake(1, 30);
    CMTime _labelStep = CMTimeMake(1, 1);
    const RWFormatter* _labelFormatter = nullptr;  // not owned
    bool _tracking = false;
};
