// The curve widget's keys, context menu and pointer through Qt: the key map's arrows and
// Delete act on the selection one undo step each, a right click shows the menu of what it hit
// validated as it opens (marks and all) and runs the chosen item, and the pointer takes the
// editor's own images over what a click would touch.
#include <gtest/gtest.h>

#include <QContextMenuEvent>
#include <QMenu>
#include <QTest>

#include "qt/TQQtMenu.h"
#include "qt/TQQtServices.h"
#include "qt/tests/QtViewFixture.h"
#include "src/resources/TQStrings.h"

namespace qt_test {
namespace {

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
