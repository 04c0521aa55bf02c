#pragma once
// The zoom scroller of platform/ui (RWZoomScroller) as a QScrollBar: the knob's length is the
// page step, its place the value, over a fixed resolution. Clicks beside the knob and on the
// arrows are the page and line parts; they leave the knob where it is and let the action
// decide (the action's target moves the model, and the knob follows the model). Dragging the
// knob moves it; pressing within a few pixels of either end of the knob and dragging resizes
// it (the knob edge parts), the other end staying put.

#include <QScrollBar>

#include "platform/ui/RWZoomScroller.h"
#include "qt/TQQtControlBinding.h"

class TQQtZoomScroller final : public QScrollBar, public TQQtControlBinding<RWZoomScroller> {
public:
    // Steps of the Qt range from one end to the other.
    static constexpr int kResolution = 10000;
    // How near an end of the knob a press starts a resize, in pixels.
    static constexpr int kEdgeGrip = 4;

    explicit TQQtZoomScroller(QWidget* parent = nullptr);

    // Where the knob lies along the groove, in pixels from the groove's start, which lies at
    // `grooveStart` of the widget.
    struct KnobSpan {
        double start = 0.0;
        double length = 0.0;
        double groove = 0.0;
        double grooveStart = 0.0;
    };
    KnobSpan knobSpan() const;

protected:
    void syncFromModel() override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;

private:
    void actionTriggered(int action);
    // Position along the groove of a point of the widget, in pixels from its start.
    double alongGroove(const QPointF& point) const;
    // The knob edge near a point, or kRWScrollerNoPart.
    RWScrollerPart edgeAt(const QPointF& point) const;

    RWScrollerPart _resizing = kRWScrollerNoPart;
    KnobSpan _resizeStart;
};
