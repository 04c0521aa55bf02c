#include "qt/TQQtTimeRuler.h"

#include <QMouseEvent>
#include <QPainter>
#include <QPainterPath>

#include <algorithm>
#include <cmath>

namespace {

// Room around a label, in points.
constexpr int kLabelPadding = 12;
constexpr QColor kPlayheadColor(232, 92, 64);

}  // namespace

TQQtTimeRuler::TQQtTimeRuler(QWidget* parent) : QWidget(parent) {
    setAttribute(Qt::WA_OpaquePaintEvent);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    setMinimumHeight(24);
    syncFromModel();
}

void TQQtTimeRuler::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.fillRect(rect(), palette().color(QPalette::Base));
    const RWTimeRuler* m = model().get();
    if (!m) return;
    const double w = width();
    const int h = height();
    painter.setPen(palette().color(QPalette::Mid));
    painter.drawLine(0, h - 1, width(), h - 1);

    // Frames, where they are far enough apart to tell.
    const double frame = CMTimeGetSeconds(m->frameDuration());
    const double duration = CMTimeGetSeconds(m->displayRange().duration);
    const QColor ticks = palette().color(QPalette::Text);
    if (frame > 0.0 && duration > 0.0 && frame * w / duration >= kMinimumFrameSpacing) {
        painter.setPen(ticks.darker(160));
        const double start = CMTimeGetSeconds(m->displayRange().start);
        for (double k = std::ceil(start / frame); k * frame <= start + duration; k += 1.0) {
            const double x = (k * frame - start) * w / duration;
            painter.drawLine(QPointF(x, h - 5), QPointF(x, h - 1));
        }
    }

    // Labels, spaced so that the widest of them fits between two.
    const QFontMetrics metrics = painter.fontMetrics();
    const int widest = std::max(
        metrics.horizontalAdvance(QString::fromStdString(m->labelText(m->displayRange().start))),
        metrics.horizontalAdvance(
            QString::fromStdString(m->labelText(CMTimeRangeGetEnd(m->displayRange())))));
    painter.setPen(ticks);
    for (const CMTime& t : m->labelTimes(w, widest + kLabelPadding)) {
        const double x = m->xForTime(t, w);
        painter.drawLine(QPointF(x, h - 10), QPointF(x, h - 1));
        painter.drawText(QPointF(x + 3, h - 10), QString::fromStdString(m->labelText(t)));
    }

    // The playhead: a marker on a line.
    const double x = m->xForTime(m->currentTime(), w);
    if (x >= -6.0 && x <= w + 6.0) {
        painter.setRenderHint(QPainter::Antialiasing);
        painter.setPen(QPen(kPlayheadColor, 1.0));
        painter.drawLine(QPointF(x, 0), QPointF(x, h));
        QPainterPath marker;
        marker.moveTo(x - 5, 0);
        marker.lineTo(x + 5, 0);
        marker.lineTo(x + 5, h - 12);
        marker.lineTo(x, h - 7);
        marker.lineTo(x - 5, h - 12);
        marker.closeSubpath();
        painter.fillPath(marker, kPlayheadColor);
    }
}

void TQQtTimeRuler::mousePressEvent(QMouseEvent* event) {
    if (!deliverLeft(event, event->button() == Qt::LeftButton, &RWTimeRuler::userPress))
        QWidget::mousePressEvent(event);
}

void TQQtTimeRuler::mouseMoveEvent(QMouseEvent* event) {
    if (!deliverLeft(event, (event->buttons() & Qt::LeftButton) != 0, &RWTimeRuler::userDrag))
        QWidget::mouseMoveEvent(event);
}

void TQQtTimeRuler::mouseReleaseEvent(QMouseEvent* event) {
    const std::shared_ptr<RWTimeRuler> m = model();
    if (!m || event->button() != Qt::LeftButton) {
        QWidget::mouseReleaseEvent(event);
        return;
    }
    event->accept();
    m->userRelease();
}

bool TQQtTimeRuler::deliverLeft(QMouseEvent* event, bool isLeft,
                                void (RWTimeRuler::*gesture)(double, double)) {
    const std::shared_ptr<RWTimeRuler> m = model();
    if (!m || !isLeft) return false;
    event->accept();
    ((*m).*gesture)(event->position().x(), width());
    return true;
}
