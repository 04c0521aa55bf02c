#pragma once
// The time ruler of platform/ui as a QWidget: the display range across the widget's width, a
// short tick at each frame where frames are far enough apart to tell, a long tick and a label
// at each label time (thinned so labels never overlap), and the playhead as a marker with a
// line down to the bottom edge. A left press, a drag and the release are the model's
// userPress, userDrag and userRelease at the pointer's x.

#include <QWidget>

#include "platform/ui/RWTimeRuler.h"
#include "qt/TQQtControlBinding.h"

class TQQtTimeRuler final : public QWidget, public TQQtControlBinding<RWTimeRuler> {
public:
    // Frames closer than this many points get no tick of their own.
    static constexpr double kMinimumFrameSpacing = 4.0;

    explicit TQQtTimeRuler(QWidget* parent = nullptr);

    QSize sizeHint() const override { return QSize(640, 24); }
    QSize minimumSizeHint() const override { return QSize(80, 24); }

protected:
    void syncFromModel() override { update(); }
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;

private:
    // A gesture of the left button at the event's x, to the model; false when it is not one.
    bool deliverLeft(QMouseEvent* event, bool isLeft, void (RWTimeRuler::*gesture)(double, double));
};
