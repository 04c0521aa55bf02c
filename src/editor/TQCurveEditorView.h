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
//
// What a frame adds to the base view's: a stippled vertical line at each whole second the
// host's text step reaches, from time 0; value labels at the left edge while one channel is
// shown; a line at the start and at the last frame of the extent of each object whose
// channels are selected; and keypoint labels with the time in frames or timecode, as the host
// says.
//
// Keys: a digit, "+" or "-" opens the timing move panel at the top of the view, with that key
// typed into it. A number typed after "+" or "-" moves the selected keypoints by that many
// frames; a number alone moves them so that the earliest lands on that frame. Every other key
// goes to the next responder (keyDown answers false).

#include <memory>
#include <vector>

#include "platform/support/BNTimeRange.h"
#include "platform/ui/RWTimecodeFormatter.h"
#include "src/view/TQCurveEditorViewBase.h"

class TQCurveEditorCtrl;

class TQCurveEditorView : public TQCurveEditorViewBase {
public:
    static constexpr CGRect kInitialViewVolume = {{0.0, -62.5}, {100.0, 125.0}};
    // Value steps over the reference height.
    static constexpr double kValueStepsPerHeight = 5.0;
    // Left margin of the value labels, in points.
    static constexpr double kUnitsMargin = 3.0;
    // The place where the top label stops, from the left edge, in drawable pixels.
    static constexpr double kUnitsTopInset = 40.0;

    TQCurveEditorView();

    // The view covers its whole frame.
    bool isOpaque() const { return true; }
    uint32_t numberOfTickMarks() const override { return 4; }

    // Stored and answered; nothing in this view draws it.
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

    // The base's zoom operations leave a ratio of widths in the horizontal zoom factor; here
    // it is put back to points per second (see displayRangeModified) when they are done.
    void zoom(double dx, double y) override;
    void zoomWithFactor(double fx, double y) override;
    void frameAll(char includeTime) override;

    // The range (a null part keeps the present one), then displayRangeModified.
    void setDisplayRange(const CMTime* start, const CMTime* duration) override;
    // Puts the range into the view volume: stored, x and width from it, the horizontal zoom
    // in view points per second, the time grid from the host's text step; forgets a rubber
    // band, marks every curve for sampling again, redraws, and tells the controller.
    void displayRangeModified(CMTimeRange range);

    // ---- Drawing ----

    // Keypoint label: "(time,value)" with the time in frames ("%4.1f" after the host's first
    // frame number) or in timecode (from the host's start timecode), the value in decibels for
    // an amplitude channel. Without a frame grid from the host the base view's text stands.
    BNString getCoordinates(const TQCurveEditorItem* item, const CMTime& time,
                            double value) const override;
    // Stippled lines at whole seconds, from time 0 to the right edge.
    void drawGrid() override;
    // Value labels down the left edge at the value step, for a single shown channel.
    void drawCurveUnits() override;
    // The extent lines, the markers while the cursor snaps, then the base's overlays.
    void drawOverlays(const CGRect& bounds) override;
    // A line at the start and one at the last frame of each distinct extent of the objects of
    // the selected channels (of the only object when no channel is selected).
    virtual void drawEndpoints();
    // Nothing: no markers are drawn here.
    virtual void drawMarkers(const CGRect& bounds) { (void)bounds; }
    // Fetches the item's samples over the display range at its sample count; used by nothing
    // in the framework.
    void getCurveSnapshot(TQCurveEditorItem* item);
    // The playhead moved: the column of its old time and of its new one are redrawn.
    virtual void currentFrameChanged();
    const CGRect& lastTimeRect() const { return _lastTimeRect; }

    // ---- Keys and numeric entry ----

    // Digits, "+" and "-": the timing move panel (see above); swallowed without a selected
    // keypoint. Anything else answers false.
    bool keyDown(const RWEvent& event) override;
    // The timing move panel at a rectangle of the screen (TQTimingMoveController).
    virtual bool openTimingMoveWithEvent(const RWEvent* event, const CGRect& parentRect,
                                         double* timeValue, char* timeIsDelta);
    // Whether the selection, once repaired, holds a keypoint.
    bool hasSelectedKeypoint();
    // The rectangle of the screen that the timing move panel hangs from, centred: the view's
    // top edge (zero while the view is in no window).
    CGRect timingMoveParentRect() const;
    // Moves the selected keypoints by (isDelta) or to a number of frames, as one undo step
    // ("Undo Move Keypoint"), and posts kTQNotifyChannelsChanged. What a typed number does;
    // a host's own command may call it too. Nothing without the full editor's controller.
    void moveSelectedKeypointsInTime(double frames, bool isDelta);

    // The sketch tool starts only on selected channels.
    void mouseDownSketch(const RWEvent& event) override;

private:
    // The host's frame duration; zero without a controller or a delegate.
    CMTime frameDuration() const;
    // _zoomFactorX as this view means it: view points per second of the current volume.
    void takePointsPerSecond();
    TQCurveEditorCtrl* editorController() const;

    std::unique_ptr<RWTimecodeFormatter> _timecodeFormatter;
    char _showAudio = 0;
    CGRect _lastTimeRect = CGRectZero;
    // Scratch of drawEndpoints, kept between frames.
    std::vector<BNTimeRange> _endpointRanges;
};
