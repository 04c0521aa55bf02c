#pragma once
// The engine fixture's controller and view on a shown Qt widget (offscreen platform), with the
// reference host behind the recorder: gestures go in through Qt, and undo is real.

#include <QCoreApplication>
#include <QPoint>

#include <cmath>

#include "qt/TQQtCurveViewWidget.h"
#include "src/engine/tests/EngineFixture.h"

namespace qt_test {

using namespace engine_test;

// Past the view's 1/30 s gate for frames and drag steps.
inline constexpr double kStepSeconds = 0.05;

class QtViewFixture : public WithReferenceHost<EngineFixture> {
protected:
    void SetUp() override {
        WithReferenceHost::SetUp();
        const CMTime start = seconds(0.0), duration = seconds(10.0);
        view.setDisplayRange(&start, &duration);  // a drag keeps times inside it
        widget.resize(800, 400);
        widget.setView(&view);
        widget.show();
        settle();  // the offscreen platform exposes the window from the event loop
    }
    void TearDown() override {
        widget.setView(nullptr);
        WithReferenceHost::TearDown();
    }
    // Runs posted updates and zero-delay calls; bounded, it never waits on the clock.
    static void settle() {
        for (int i = 0; i < 20; ++i) QCoreApplication::processEvents();
    }
    // A frame now, past the gate.
    void drawFrame() {
        clock.advance(kStepSeconds);
        widget.repaint();
    }
    // A world point in the widget's coordinates (y down, logical pixels).
    QPoint widgetPoint(double u, double v) const {
        const CGPoint screen = view.getPointScreen(CGPointMake(u, v));
        const double ratio = widget.devicePixelRatioF();
        return QPoint(static_cast<int>(std::lround(screen.x / ratio)),
                      static_cast<int>(std::lround(widget.height() - screen.y / ratio)));
    }

    TQQtCurveViewWidget widget;
};

// The catalogue's "bump" (0 at 2 s, 0.5 at 5 s, 0 at 8 s) as channel A, its item at scale 1,
// drawn once.
class QtBumpFixture : public QtViewFixture {
protected:
    void SetUp() override {
        QtViewFixture::SetUp();
        channel = addCurve("A", "bump");
        item = addItem(channel);
        item->setScaleY(1.0);
        item->setOffsetY(0.0);
        drawFrame();
        ASSERT_GE(widget.framesDrawn(), 1) << "the widget drew no frame: picks would find nothing";
    }
    TQChannel* channel = nullptr;
    TQCurveEditorChannelItemPtr item;
};

}  // namespace qt_test
