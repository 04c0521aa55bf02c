#pragma once
// The animation status cell of a parameter row: whether the row's channel has a keyframe at
// the current time, and three parts that step between keyframes and add or delete one.
//
//   | previous | next | keyframe |     parts 1, 3, 2, each kPartWidth wide from the left
//
// A press that is released in the part it began in acts: previous and next move the current
// time to the channel's keyframe before or after it (setCurrentTimeAndNotify, for a subclass
// to carry out), the keyframe part sends the cell's own action addKeyframeForCell: or
// deleteKeyframeForCell: to itself (performAction). A right press opens the cell's menu
// (newMenuUseImages) in the view. A folder counts the keyframes of its shown channels.
//
// One cell serves every row of a column: each use starts with updateChannel, and nothing is
// assumed from an earlier row. The channel is not owned and is held only until the next
// updateChannel; the owner of the cell updates it before a channel can go.

#include <cstdint>
#include <string>

#include "platform/channels/TQChannelBase.h"
#include "platform/media/CMTime.h"
#include "platform/ui/RWCell.h"
#include "platform/ui/RWMenu.h"

class TQAnimStatusCell : public RWCell, public RWActionTarget {
public:
    // Parts of the cell; kPartNone outside the three.
    static constexpr int64_t kPartNone = 0;
    static constexpr int64_t kPartPrevious = 1;
    static constexpr int64_t kPartAddOrDelete = 2;
    static constexpr int64_t kPartNext = 3;
    static constexpr double kPartWidth = 18.0;
    // The images of the parts, by name in the framework's resources.
    static constexpr const char* kPreviousImage = "AnimStatusPrevious";
    static constexpr const char* kNextImage = "AnimStatusNext";
    static constexpr const char* kKeyframeImage = "AnimStatusKeyframe";
    static constexpr const char* kNoKeyframeImage = "AnimStatusNoKeyframe";

    TQAnimStatusCell();
    ~TQAnimStatusCell() override;

    // ---- The row ----
    // The row's channel (null: none) and the current time; then updateState.
    virtual void updateChannel(TQChannelBase* channel, CMTime time);
    // What the cell shows, from its channel and time.
    virtual void updateState();
    TQChannelBase* channel() const { return _pChan; }
    CMTime time() const { return _time; }
    // A keyframe at the cell's time, as updateState found it.
    bool keyframeAtTime() const { return _keyframeAtTime; }
    // The channel, or for a folder any of its channels, is animated.
    bool isAnimated(const TQChannelBase* channel) const;
    // A keyframe of the channel (of a folder's shown channels) at the time; with
    // ignoreCurveType false a channel that takes no keyframes counts as having none.
    virtual bool hasKeypointAtTime(CMTime time, const TQChannelBase* channel,
                                   bool ignoreCurveType) const;

    // ---- Hover and press, set by the view for the row being drawn ----
    bool isMouseOverRow() const { return _isMouseOverRow; }
    void setMouseOverRow(bool over) { _isMouseOverRow = over; }
    int64_t hoveredPart() const { return _hoveredPart; }
    void setHoveredPart(int64_t part) { _hoveredPart = part; }
    int64_t pressedPart() const { return _pressedPart; }
    void setPressedPart(int64_t part) { _pressedPart = part; }

    // ---- Geometry ----
    static int64_t partAtPoint(const CGRect& frame, const CGPoint& point);
    static CGRect rectOfPart(const CGRect& frame, int64_t part);

    // ---- Drawing ----
    // The keyframe part always (filled with a keyframe at the time, hollow on an animated
    // channel without one, nothing on a channel that is not animated); the arrows only while
    // the pointer is over the row. The part under the pointer is drawn full, a pressed one
    // dimmed, the others at rest.
    void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const override;

    // ---- Tracking ----
    bool trackMouse(const RWEvent& event, const CGPoint& point, const CGRect& frame,
                    RWOutlineView& view, bool untilMouseUp) override;
    void continueTracking(const RWEvent& event, const CGPoint& point, RWOutlineView& view) override;
    void stopTracking(const CGPoint& point, RWOutlineView& view, bool mouseIsUp) override;
    // The cell's menu at the press, when it has one.
    virtual void rightMouseDown(const RWEvent& event, RWOutlineView& view);

    // ---- For subclasses ----
    // The current time moved to a keyframe of the channel.
    virtual void setCurrentTimeAndNotify(CMTime time, TQChannelBase* channel) = 0;
    // A new menu of the cell's commands, owned by the caller; null for none.
    virtual RWMenuPtr newMenuUseImages(bool useImages);
    // The cell knows no action of its own.
    bool performAction(const std::string& action, RWActionSender& sender) override;

    // Opacities of a part: under the pointer, pressed, at rest.
    static constexpr double kHoveredOpacity = 1.0;
    static constexpr double kPressedOpacity = 0.45;
    static constexpr double kRestingOpacity = 0.7;

protected:
    TQChannelBase* _pChan = nullptr;  // not owned; valid until the next updateChannel
    CMTime _time = kCMTimeZero;
    bool _isMouseOverRow = false;

private:
    // The keyframe time beyond `time` on the channel (a folder: the nearest on its shown
    // channels), forward or back; false when there is none.
    static bool keyframeBeyond(const TQChannelBase* channel, bool forward, CMTime& time);
    void act(int64_t part);

    bool _keyframeAtTime = false;
    int64_t _hoveredPart = kPartNone;
    int64_t _pressedPart = kPartNone;
    // The press being tracked: its part and the frame it began in.
    int64_t _trackingPart = kPartNone;
    CGRect _trackingFrame = CGRectZero;
};
