// The curve view through Qt itself: a lost release, the space bar, the frame gate and the
// folding of wheel bursts; the key map's arrows and Delete act on the selection one undo step
// each, a right click shows the menu of what it hit validated as it opens (marks and all) and
// runs the chosen item, and the pointer takes the editor's own images over what a click would
// touch. The demo's window test drags a keypoint through Qt and undoes it.
#include <gtest/gtest.h>

#include <QContextMenuEvent>
#include <QMenu>
#include <QTest>
#include <QWheelEvent>

#include "qt/TQQtMenu.h"
#include "qt/TQQtServices.h"
#include "qt/tests/QtViewFixture.h"
#include "src/resources/TQStrings.h"

namespace qt_test {
namespace {

using QtCurveViewWidget = QtBumpFixture;

TEST_F(QtCurveViewWidget, press_while_a_gesture_is_open__ends_it_first) {
    // The release of a drag can go astray (to a window that was modal meanwhile); the next
    // press must not find the view still dragging with its undo step open.
    const QPoint start = widgetPoint(5, 0.5);
    QTest::mousePress(&widget, Qt::LeftButton, Qt::NoModifier, start);
    clock.advance(kStepSeconds);
    QTest::mouseMove(&widget, start + QPoint(0, -20));
    ASSERT_TRUE(host.undoStack().isStepOpen()) << "the drag should have opened its step";
    QMouseEvent press(QEvent::MouseButtonPress, QPointF(start), widget.mapToGlobal(QPointF(start)),
                      Qt::LeftButton, Qt::LeftButton, Qt::NoModifier);
    QCoreApplication::sendEvent(&widget, &press);
    EXPECT_FALSE(host.undoStack().isStepOpen());
    EXPECT_EQ(host.undoStack().undoCount(), 1u) << "the first drag is one step";
    QTest::mouseRelease(&widget, Qt::LeftButton, Qt::NoModifier, start);
}

TEST_F(QtCurveViewWidget, space_bar__arms_on_the_first_press_and_ends_on_release) {
    // Shortcut overrides go to the focus object of the active window.
    widget.activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&widget));
    widget.setFocus();
    QTest::keyPress(&widget, Qt::Key_Space);
    EXPECT_EQ(view.space(), 1) << "the first space press must reach the view as a key equivalent";
    QTest::keyRelease(&widget, Qt::Key_Space);
    EXPECT_EQ(view.space(), 0);
}

TEST_F(QtCurveViewWidget, repaints_inside_the_gate__one_frame_and_one_delayed_redraw) {
    timer.advance(1.0);
    widget.repaint();
    const int before = widget.framesDrawn();
    const qreal ratio = widget.devicePixelRatioF();
    EXPECT_EQ(widget.encoder().image().size(), QSize(qRound(800 * ratio), qRound(400 * ratio)));
    const size_t pending = timer.pendingCount();
    widget.repaint();
    widget.repaint();
    EXPECT_EQ(widget.framesDrawn(), before) << "repaints inside 1/30 s must show the last frame";
    EXPECT_EQ(timer.pendingCount(), pending + 1) << "exactly one delayed redraw is scheduled";
    timer.advance(0.034);
    settle();
    EXPECT_EQ(widget.framesDrawn(), before + 1) << "the delayed redraw must draw once";
}

TEST_F(QtCurveViewWidget, wheel__a_burst_is_folded_into_one_delivery) {
    const QPointF at(100.0, 80.0);
    for (int i = 0; i < 3; ++i) {
        QWheelEvent e(at, widget.mapToGlobal(at), QPoint(), QPoint(120, 0), Qt::NoButton,
                      Qt::NoModifier, Qt::NoScrollPhase, false);
        QCoreApplication::sendEvent(&widget, &e);
    }
    EXPECT_EQ(widget.viewHost().pendingEventCount(), 3u) << "wheel events wait for one delivery";
    settle();
    EXPECT_EQ(widget.viewHost().pendingEventCount(), 0u);
}

class QtViewKeysMenu : public QtBumpFixture {
protected:
    void SetUp() override {
        QtBumpFixture::SetUp();
        channel->setInterpolation(kTQInterpolationLinear);
        item->select(1);
        drawFrame();
    }
};

TEST_F(QtViewKeysMenu, keys__nudgeAFrameAndDeleteEachAsAStepOfItsOwn) {
    selectInView({keypointEntry(item, 5)});
    widget.setFocus();
    recorder.clearCalls();
    QTest::keyPress(&widget, Qt::Key_Right);
    QTest::keyRelease(&widget, Qt::Key_Right);
    const std::vector<double> nudged = keyTimes(channel);
    ASSERT_EQ(nudged.size(), 3u);
    EXPECT_NEAR(nudged[1], 5.0 + 1.0 / 30.0, 1e-6) << "one frame of the host";
    EXPECT_EQ(recorder.count("postNotification"), 2u) << "the nudge's word and the release's";
    EXPECT_EQ(host.undoStack().undoCount(), 1u);

    QTest::keyClick(&widget, Qt::Key_Delete);
    EXPECT_EQ(keyTimes(channel), (std::vector<double>{2.0, 8.0}));
    EXPECT_EQ(host.undoStack().undoCount(), 2u);
    EXPECT_TRUE(view.getSelection()->empty());
}

TEST_F(QtViewKeysMenu, rightClick__showsTheHitsMenuValidatedAsItOpensAndRunsTheChoice) {
    // The segment into the keypoint at 5 is Bezier, the one leaving it Linear: both marked.
    channel->setKeyframeInterpolation(channel->getKeyframe(seconds(2)), kTQInterpolationBezier);
    selectInView({});
    RWMenuPtr shown;
    widget.setContextMenuRunner([&](const RWMenuPtr& menu, const QPoint&) {
        shown = menu;
        QMenu qmenu;
        TQQtFillMenu(qmenu, menu, [](RWMenu& holder, int64_t index) {
            holder.performActionForItemAtIndex(index);
        });
        QMenu* kinds = qmenu.actions()[8]->menu();
        if (!kinds) return false;
        // The submenu in the order of the kinds: Constant, Linear, ...
        QAction* constant = kinds->actions().value(0);
        QAction* linear = kinds->actions().value(1);
        if (!linear || !constant) return false;
        EXPECT_FALSE(linear->isCheckable());
        EXPECT_FALSE(linear->icon().isNull()) << "a mixed item shows the dash";
        EXPECT_TRUE(constant->icon().isNull());
        EXPECT_TRUE(constant->isEnabled());
        constant->trigger();  // the user's choice: the keypoint at 5 becomes Constant
        return true;
    });
    QContextMenuEvent click(QContextMenuEvent::Mouse, widgetPoint(5, .5),
                            widget.mapToGlobal(widgetPoint(5, .5)));
    QCoreApplication::sendEvent(&widget, &click);

    EXPECT_EQ(shown, ctrl().getKeyframeMenu());
    EXPECT_EQ(channel->getKeyframeInterpolation(channel->getKeyframe(seconds(5))),
              kTQInterpolationConstant);
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Set Interpolation"));
}

TEST_F(QtViewKeysMenu, pointer__takesTheEditorsImagesOverWhatAClickWouldTouch) {
    struct Case {
        const char* what;
        TQTool tool;
        double u, v;
        GDCursorImage want;
    };
    const Case cases[] = {
        {"over a keypoint", TQTool::kEdit, 5, .5, GDCursorMove},
        {"over nothing", TQTool::kEdit, 3.5, .9, GDCursorEditPoints},
        {"the sketch tool", TQTool::kSketch, 5, .5, GDCursorSketch},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        ctrl().setCurrentTool(c.tool);
        drawFrame();
        QTest::mouseMove(&widget, widgetPoint(c.u, c.v));
        const QCursor shownCursor = widget.cursor();
        ASSERT_EQ(shownCursor.shape(), Qt::BitmapCursor);
        EXPECT_EQ(shownCursor.hotSpot(), QPoint(qRound(c.want.hotSpotX), qRound(c.want.hotSpotY)));
        const RWCursor asked = widget.viewHost().cursor();
        EXPECT_EQ(TQQtViewHost::resourceCursor(asked)->name, std::string(c.want.name));
    }
}

}  // namespace
}  // namespace qt_test
