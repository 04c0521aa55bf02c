#include "qt/TQQtZoomScroller.h"

#include <QMouseEvent>
#include <QSignalBlocker>
#include <QStyle>
#include <QStyleOptionSlider>

#include <algorithm>
#include <cmath>

TQQtZoomScroller::TQQtZoomScroller(QWidget* parent) : QScrollBar(Qt::Vertical, parent) {
    setMouseTracking(true);
    connect(this, &QAbstractSlider::actionTriggered, this, [this](int a) { actionTriggered(a); });
    syncFromModel();
}

void TQQtZoomScroller::syncFromModel() {
    const QSignalBlocker blocker(this);
    const RWZoomScroller* m = model().get();
    setEnabled(m && m->isEnabled());
    if (!m) return;
    setOrientation(m->isVertical() ? Qt::Vertical : Qt::Horizontal);
    const double knob = m->displayedKnobProportion();
    const int page = static_cast<int>(std::lround(knob * kResolution));
    setPageStep(std::max(1, page));
    setSingleStep(std::max(1, page / 5));
    setRange(0, kResolution - page);
    setValue(static_cast<int>(std::lround(m->floatValue() * (kResolution - page))));
}

void TQQtZoomScroller::actionTriggered(int action) {
    const std::shared_ptr<RWZoomScroller> m = model();
    if (!m) return;
    RWScrollerPart part = kRWScrollerNoPart;
    switch (action) {
        case SliderSingleStepAdd: part = kRWScrollerIncrementLine; break;
        case SliderSingleStepSub: part = kRWScrollerDecrementLine; break;
        case SliderPageStepAdd: part = kRWScrollerIncrementPage; break;
        case SliderPageStepSub: part = kRWScrollerDecrementPage; break;
        case SliderToMinimum: m->userMoveKnob(0.0, kRWScrollerKnobSlot); return;
        case SliderToMaximum: m->userMoveKnob(1.0, kRWScrollerKnobSlot); return;
        case SliderMove:
            m->userMoveKnob(maximum() > 0 ? double(sliderPosition()) / maximum() : 0.0);
            return;
        default: return;
    }
    // The knob stays where the model has it; the action's target decides the move.
    {
        const QSignalBlocker blocker(this);
        setSliderPosition(static_cast<int>(std::lround(m->floatValue() * maximum())));
    }
    m->userClickPart(part);
}

TQQtZoomScroller::KnobSpan TQQtZoomScroller::knobSpan() const {
    QStyleOptionSlider option;
    initStyleOption(&option);
    const QRect groove =
        style()->subControlRect(QStyle::CC_ScrollBar, &option, QStyle::SC_ScrollBarGroove, this);
    const QRect knob =
        style()->subControlRect(QStyle::CC_ScrollBar, &option, QStyle::SC_ScrollBarSlider, this);
    if (orientation() == Qt::Vertical)
        return {double(knob.top() - groove.top()), double(knob.height()), double(groove.height()),
                double(groove.top())};
    return {double(knob.left() - groove.left()), double(knob.width()), double(groove.width()),
            double(groove.left())};
}

double TQQtZoomScroller::alongGroove(const QPointF& point) const {
    return (orientation() == Qt::Vertical ? point.y() : point.x()) - knobSpan().grooveStart;
}

RWScrollerPart TQQtZoomScroller::edgeAt(const QPointF& point) const {
    if (!model() || !model()->isEnabled()) return kRWScrollerNoPart;
    const KnobSpan k = knobSpan();
    const double at = alongGroove(point);
    if (std::fabs(at - k.start) <= kEdgeGrip) return kRWScrollerKnobStartEdge;
    if (std::fabs(at - (k.start + k.length)) <= kEdgeGrip) return kRWScrollerKnobEndEdge;
    return kRWScrollerNoPart;
}

void TQQtZoomScroller::mousePressEvent(QMouseEvent* event) {
    const RWScrollerPart edge =
        event->button() == Qt::LeftButton ? edgeAt(event->position()) : kRWScrollerNoPart;
    if (edge == kRWScrollerNoPart) {
        QScrollBar::mousePressEvent(event);
        return;
    }
    _resizing = edge;
    _resizeStart = knobSpan();
    event->accept();
}

void TQQtZoomScroller::mouseMoveEvent(QMouseEvent* event) {
    if (_resizing == kRWScrollerNoPart) {
        const bool nearEdge = edgeAt(event->position()) != kRWScrollerNoPart;
        setCursor(nearEdge ? (orientation() == Qt::Vertical ? Qt::SizeVerCursor : Qt::SizeHorCursor)
                           : Qt::ArrowCursor);
        QScrollBar::mouseMoveEvent(event);
        return;
    }
    const std::shared_ptr<RWZoomScroller> m = model();
    const KnobSpan k = _resizeStart;
    if (!m || k.groove <= 0.0) return;
    const double minimum = std::max(m->minimumKnobProportion(), 1.0 / k.groove) * k.groove;
    const double at = std::clamp(alongGroove(event->position()), 0.0, k.groove);
    // The other end stays where it was when the press began.
    double start = k.start;
    double end = k.start + k.length;
    if (_resizing == kRWScrollerKnobStartEdge)
        start = std::min(at, end - minimum);
    else
        end = std::max(at, start + minimum);
    const double length = end - start;
    const double slack = k.groove - length;
    m->userResizeKnob(_resizing, length / k.groove, slack > 0.0 ? start / slack : 0.0);
    event->accept();
}

void TQQtZoomScroller::mouseReleaseEvent(QMouseEvent* event) {
    if (_resizing == kRWScrollerNoPart) {
        QScrollBar::mouseReleaseEvent(event);
        return;
    }
    _resizing = kRWScrollerNoPart;
    event->accept();
}
