// Mouse gestures through Qt itself: QTest presses, moves and releases on the widget (offscreen
// platform) must reach the view as one drag of the edit tool, change the channel under the
// pointer as one undo step of the host, and the host's undo must give the channel back exactly.
#include <gtest/gtest.h>

#include <QApplication>
#include <QTest>

#include <cmath>
#include <memory>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtCurveViewWidget.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// Past the view's 1/30 s gate for frames and drag steps.
constexpr double kStepSeconds = 0.05;
// How far a dragged keypoint must have gone, in pixels, to count as moved.
constexpr double kMovedPixels = 5.0;
// How close a dragged keypoint ends to the pointer (rounding of points and of the projection).
constexpr double kPointerPixels = 2.0;

// One animated channel of the sample scene's first object, alone in the view, so that a
// press on one of its keypoints cannot pick another curve's.
class CurveViewWidgetMouseTest : public ::testing::Test {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
        controller.init();
        controller.setAppDelegate(&host);
        view.setClock(&clock);
        view.setTimer(&timer);
        view.setController(&controller);
        controller.setView(&view);
        const CMTimeRange range = host.displayRange();
        view.setDisplayRange(&range.start, &range.duration);
        view.setCurrentViewVolume(CGRectMake(0.0, -150.0, 10.0, 300.0));
        view.setOriginalViewVolume(CGRectMake(0.0, -150.0, 10.0, 300.0));
        widget.resize(640, 320);
        widget.setView(&view);
        widget.show();
        // The offscreen platform exposes the window from the event loop: paint only after.
        for (int i = 0; i < 20; ++i) QCoreApplication::processEvents();

        set = std::make_shared<TQCurveSetMutable>();
        set->initWithName("Mouse", &host);
        controller.setSelectedCurveSet(set);
        channel = firstAnimatedChannel(host.scene().objects().front());
        ASSERT_NE(channel, nullptr) << "the first object has no channel of more than two keyframes";
        item = controller.appendChannel(channel, set);
        ASSERT_NE(item, nullptr);
        view.frameAll(1);
        drawFrame();
        ASSERT_GE(widget.framesDrawn(), 1) << "the widget drew no frame: picks would find nothing";
    }
    void TearDown() override {
        widget.setView(nullptr);
        view.setController(nullptr);
        controller.setView(nullptr);
    }

    static TQChannel* firstAnimatedChannel(TQChannelBase* node) {
        if (!node) return nullptr;
        if (auto* c = dynamic_cast<TQChannel*>(node); c && c->numberOfKeyframes() > 2) return c;
        if (const std::vector<TQChannelBase*>* children = node->getChildren())
            for (TQChannelBase* child : *children)
                if (TQChannel* found = firstAnimatedChannel(child)) return found;
        return nullptr;
    }

    // A frame now, so that picks test what the channel looks like now.
    void drawFrame() {
        clock.advance(kStepSeconds);
        widget.repaint();
    }

    // Where a keyframe lies in the widget's own coordinates (y down, logical pixels).
    QPoint widgetPointOf(TQKeyframeHandle handle) const {
        CMTime t = kCMTimeInvalid;
        double v = 0.0;
        if (!channel->getKeyframe(handle, &t, &v)) return QPoint(-1, -1);
        const double u = CMTimeGetSeconds(t) + CMTimeGetSeconds(channel->timeOffset());
        const CGPoint screen =
            view.getPointScreen(CGPointMake(u, controller.convertFromChannelCoords(item.get(), v)));
        const double ratio = widget.devicePixelRatioF();
        return QPoint(static_cast<int>(std::lround(screen.x / ratio)),
                      static_cast<int>(std::lround(widget.height() - screen.y / ratio)));
    }

    TQHostAppDelegate host;
    RWManualClock clock;
    RWManualTimer timer{clock};
    TQCurveEditorCtrlBase controller;
    TQCurveEditorViewBase view;
    TQQtCurveViewWidget widget;
    TQCurveSetMutablePtr set;
    TQChannel* channel = nullptr;
    TQCurveEditorItemPtr item;
};

TEST_F(CurveViewWidgetMouseTest,
       drag_on_a_keypoint__changes_the_channel_and_undo_restores_it_exactly) {
    const std::vector<TQKeyframeHandle> keys = channel->getKeyframes(false);
    const TQKeyframeHandle key = keys[keys.size() / 2];
    const QPoint start = widgetPointOf(key);
    ASSERT_TRUE(widget.rect().contains(start)) << "the keypoint must be on screen after framing";
    const std::unique_ptr<TQChannelBase> before(channel->cloneChannel());

    QTest::mousePress(&widget, Qt::LeftButton, Qt::NoModifier, start);
    // Three steps, each past the drag gate, up and a little to the right.
    for (int step = 1; step <= 3; ++step) {
        clock.advance(kStepSeconds);
        QTest::mouseMove(&widget, start + QPoint(2 * step, -10 * step));
    }
    const QPoint end = start + QPoint(6, -30);
    QTest::mouseRelease(&widget, Qt::LeftButton, Qt::NoModifier, end);

    EXPECT_FALSE(*channel == *before) << "the drag did not change the channel";
    ASSERT_TRUE(channel->getKeyframe(key, nullptr, nullptr))
        << "the dragged keyframe's handle went stale";
    const QPoint moved = widgetPointOf(key);
    EXPECT_LT(moved.y(), start.y() - kMovedPixels) << "the keypoint should have gone up on screen";
    ASSERT_TRUE(host.canUndo()) << "the drag left no undo step";
    EXPECT_EQ(host.undoDescription(), "Move Keypoint");
    EXPECT_EQ(host.undoStack().undoCount(), 1u) << "one drag must be one undo step";

    ASSERT_TRUE(host.undo());
    TQChannel* restored = item->channel();
    ASSERT_NE(restored, nullptr) << "the channel is gone after undo";
    EXPECT_TRUE(*restored == *before) << "undo must give back the channel exactly";
}

TEST_F(CurveViewWidgetMouseTest,
       drag_that_stops_after_a_dropped_move__still_ends_under_the_pointer) {
    const std::vector<TQKeyframeHandle> keys = channel->getKeyframes(false);
    const TQKeyframeHandle key = keys[keys.size() / 2];
    const QPoint start = widgetPointOf(key);
    QTest::mousePress(&widget, Qt::LeftButton, Qt::NoModifier, start);
    clock.advance(kStepSeconds);
    QTest::mouseMove(&widget, start + QPoint(0, -10));
    // Inside the gate: the view drops this move, and the pointer then rests.
    const QPoint rest = start + QPoint(0, -40);
    QTest::mouseMove(&widget, rest);
    clock.advance(kStepSeconds);
    QTest::qWait(100);  // the widget hands the last move over again
    QTest::mouseRelease(&widget, Qt::LeftButton, Qt::NoModifier, rest);
    drawFrame();
    EXPECT_NEAR(widgetPointOf(key).y(), rest.y(), kPointerPixels)
        << "the keypoint stopped short of the pointer";
}

TEST_F(CurveViewWidgetMouseTest, press_while_a_gesture_is_open__ends_it_first) {
    // The release of a drag can go astray (to a window that was modal meanwhile); the next
    // press must not find the view still dragging with its undo step open.
    const std::vector<TQKeyframeHandle> keys = channel->getKeyframes(false);
    const QPoint start = widgetPointOf(keys[keys.size() / 2]);
    QTest::mousePress(&widget, Qt::LeftButton, Qt::NoModifier, start);
    clock.advance(kStepSeconds);
    QTest::mouseMove(&widget, start + QPoint(0, -20));
    ASSERT_TRUE(host.undoStack().isStepOpen()) << "the drag should have opened its step";

    QMouseEvent press(QEvent::MouseButtonPress, QPointF(start), widget.mapToGlobal(QPointF(start)),
                      Qt::LeftButton, Qt::LeftButton, Qt::NoModifier);
    QCoreApplication::sendEvent(&widget, &press);
    EXPECT_FALSE(host.undoStack().isStepOpen())
        << "the lost release must be made up before the new press";
    EXPECT_EQ(host.undoStack().undoCount(), 1u) << "the first drag is one step";
    QTest::mouseRelease(&widget, Qt::LeftButton, Qt::NoModifier, start);
}

TEST_F(CurveViewWidgetMouseTest, space_bar__arms_on_the_first_press_and_ends_on_release) {
    // Shortcut overrides go to the focus object of the active window.
    widget.activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&widget))
        << "the offscreen window did not become active";
    widget.setFocus();
    QTest::keyPress(&widget, Qt::Key_Space);
    EXPECT_EQ(view.space(), 1) << "the first space press must reach the view as a key equivalent";
    QTest::keyRelease(&widget, Qt::Key_Space);
    EXPECT_EQ(view.space(), 0) << "the release must end the space-bar mode";
}

}  // namespace
