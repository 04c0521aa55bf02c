// The demo window end to end: the object list drives the automatic curve sets, the pop-up
// chooses among every set, the tool switch and the vertical scroller work through their
// models, a drag through the curve widget changes one channel as one named step that the Edit
// menu offers, and the menu's Undo gives every channel back exactly. Its File menu and box tool
// as a user meets them: saving the untitled sample, New, opening it again with its curve sets
// and settings, the modified mark, the question before changes are lost, a damaged file that
// loses nothing, and a box drag whose undo gives back the channels and the box as it stood.
#include <gtest/gtest.h>

#include <QElapsedTimer>
#include <QFile>
#include <QLineEdit>
#include <QToolButton>

#include <string>

#include "apps/demo/tests/DemoWindowFixture.h"
#include "host/TQHostSampleScene.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtTableView.h"

namespace demo_test {
namespace {

TEST_F(DemoWindowTest, object_list__drives_the_scene_selection_and_loses_a_removed_objects_row) {
    step("opened");
    window.objectList()->clearSelection();
    window.objectList()->item(1)->setSelected(true);
    window.objectList()->item(3)->setSelected(true);
    step("the list's second and fourth rows chosen: the Animated set follows");
    // And the other way: the scene selects, the list follows.
    TQChannelObjectRootBase* title = window.host().scene().objectNamed(kTQHostSampleTitleObject);
    window.host().selectObject(title);
    step("the scene selects the title");

    // A keypoint of the shown object is selected when it goes.
    drawFrame();
    QTest::mouseClick(window.curveWidget(), Qt::LeftButton, Qt::NoModifier, keypointInWidget());
    ASSERT_FALSE(window.curveView().getSelection()->empty()) << "the click selected no keypoint";
    ASSERT_TRUE(window.host().removeObject(title));
    step("the title removed: its row and curves go, nothing to undo");
    const int frames = window.curveWidget()->framesDrawn();
    drawFrame();
    EXPECT_GT(window.curveWidget()->framesDrawn(), frames) << "the view must still draw";
}

// Choosing a set from the pop-up, and its title, are the curve set tests' first steps.
TEST_F(DemoWindowTest, pop_up_tools_and_scroller__work_through_their_models) {
    choose("Position");
    window.toolSwitch()->button(1)->click();
    step("Position chosen, the sketch tool");

    // Zoomed in, the knob is shorter than the scroller and a page click pans the view.
    TQQtZoomScroller* scroller = window.verticalScroller();
    window.curveView().zoomWithFactor(1.0, 4.0);
    EXPECT_LT(scroller->pageStep(), TQQtZoomScroller::kResolution);
    const double y = window.curveView().getCurrentViewVolume().origin.y;
    scroller->triggerAction(QAbstractSlider::SliderPageStepAdd);
    EXPECT_GT(window.curveView().getCurrentViewVolume().origin.y, y);

    window.autoZoomAction()->trigger();
    step("auto zoom: the view fits itself, the scroller waits");
}

// A double click types a keypoint's value in the panel, a drag moves it: each one named step that
// the menu's Undo takes back exactly.
TEST_F(DemoWindowTest, double_click_and_drag__each_one_named_step_that_undo_restores_exactly) {
    markScene();
    const QPoint start = keypointInWidget();
    ASSERT_TRUE(window.curveWidget()->rect().contains(start)) << "the keypoint is off screen";
    const TQCurveEditorItemPtr item = window.controller().selectedCurveSet()->channeItemAtIndex(0);
    TQChannel* channel = item->channel();
    const TQKeyframeHandle key = channel->getKeyframes(false)[channel->numberOfKeyframes() / 2];
    inDialog(
        [&] {
            QTest::mouseDClick(window.curveWidget(), Qt::LeftButton, Qt::NoModifier, start);
            QTest::mouseRelease(window.curveWidget(), Qt::LeftButton, Qt::NoModifier, start);
        },
        [](QDialog& dialog) {
            // Typed over the selected value, then OK.
            QTest::keyClicks(dialog.findChild<QLineEdit*>(), "12.5");
            click(dialog, "OK");
        });
    double value = 0.0;
    ASSERT_TRUE(channel->getKeyframe(key, nullptr, &value));
    EXPECT_NEAR(value * channel->getInfo()->displayScale, 12.5, 1e-9)
        << "the clicked keypoint must show the typed value";
    step("typed 12.5 in the panel");
    window.editMenu()->undoAction()->trigger();
    step("Undo takes the value back");

    TQQtCurveViewWidget* widget = window.curveWidget();
    QTest::mousePress(widget, Qt::LeftButton, Qt::NoModifier, start);
    for (int step = 1; step <= 10; ++step) {
        clock.advance(kStepSeconds);
        QTest::mouseMove(widget, start + QPoint(0, -3 * step));
    }
    // Inside the gate: the view drops this move, and the pointer then rests there.
    const QPoint rest = start + QPoint(6, -40);
    QTest::mouseMove(widget, rest);
    clock.advance(kStepSeconds);
    QTest::qWait(100);  // the widget hands the last move over again
    QTest::mouseRelease(widget, Qt::LeftButton, Qt::NoModifier, rest);
    ASSERT_TRUE(channel->getKeyframe(key, nullptr, nullptr))
        << "the dragged keyframe's handle went stale";
    const QPoint landed = keypointInWidget(key);
    EXPECT_NEAR(landed.x(), rest.x(), 2) << "the keypoint stopped short of the pointer";
    EXPECT_NEAR(landed.y(), rest.y(), 2);

    // The dragged channel alone changed, ten drag steps are one undo step, and the Edit menu
    // follows the host's history without being opened.
    step("dragged");

    // The curves are drawn clean; the undo must leave the restored one to be sampled again.
    drawFrame();
    window.editMenu()->undoAction()->trigger();
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
    ASSERT_NE(channelItem, nullptr);
    EXPECT_TRUE(channelItem->originalCurveDirty())
        << "the restored curve would be drawn from stale samples";
    step("undone: every channel exactly");
    window.editMenu()->redoAction()->trigger();
    step("redone");
}

// The transport plays, steps and scrubs on the host's clock, the ruler and the time field
// follow, and the preview poses the objects from their channels at the playhead.
TEST_F(DemoWindowTest, transport_ruler_and_preview__follow_the_hosts_playhead) {
    TQDemoTransport& transport = window.transport();
    TQHostAppDelegate& host = window.host();
    transport.buttons()->userClickSegment(TQDemoTransport::kPlay);
    ASSERT_TRUE(host.isPlaying());
    EXPECT_EQ(transport.buttons()->labelForSegment(TQDemoTransport::kPlay), "Pause");
    QElapsedTimer waited;
    waited.start();
    while (transport.ticks() < 3 && waited.elapsed() < 2000) QCoreApplication::processEvents();
    ASSERT_GE(transport.ticks(), 3) << "the playback timer must tick the host";
    EXPECT_GT(CMTimeGetSeconds(host.currentTime()), 0.0);
    EXPECT_EQ(transport.ruler()->currentTime(), host.currentTime()) << "the ruler follows";
    EXPECT_EQ(transport.timeField()->stringValue(), host.timeText(host.currentTime()));

    transport.buttons()->userClickSegment(TQDemoTransport::kGoToStart);
    step("to the start: the transport's moves pause playback");
    transport.buttons()->userClickSegment(TQDemoTransport::kNextFrame);
    step("the next frame");
    transport.buttons()->userClickSegment(TQDemoTransport::kGoToEnd);
    step("the end");

    // A press on the ruler puts the playhead on the frame under it.
    TQQtTimeRuler* ruler = window.timeRuler();
    const int x = static_cast<int>(
        std::lround(transport.ruler()->xForTime(CMTimeMake(45, 30), ruler->width()) + 0.5));
    QTest::mouseClick(ruler, Qt::LeftButton, Qt::NoModifier, QPoint(x, ruler->height() / 2));
    step("the ruler pressed at frame 45");
    host.movePlayhead(CMTimeMake(24, 30));
    step("frame 24: the title at rest");
    host.movePlayhead(CMTimeMake(30 + 30, 30));
    step("frame 60: the lower third's keys are in its own time, a second later");

    // An edit of the curve moves the picture.
    const CMTime now = CMTimeMake(60, 30);
    channel(kTQHostSampleTitleObject, "./1/100/101/1")->offsetCurve(&now, 250.0);
    step("the title's x curve moved to 250 there");
}

// A new set made from the pop-up's entry, undone and redone, then renamed and joined by another
// in the manager's dialog. The document test saves and opens sets.
TEST_F(DemoWindowTest, new_and_managed_sets__are_saved_and_opened_with_the_project) {
    choose("Position");
    step("Position chosen");
    inDialog([this] { choose("New Curve Set…"); },
             [](QDialog& dialog) {
                 TQQtTextField* name = nullptr;
                 for (TQQtTextField* field : dialog.findChildren<TQQtTextField*>())
                     if (!field->isReadOnly()) name = field;
                 ASSERT_NE(name, nullptr);
                 EXPECT_EQ(name->text(), "Untitled Set");
                 QTest::keyClicks(name, "Slides");
                 click(dialog, "OK");
             });
    // The new set holds what showed, and does not follow the selection.
    window.host().setSelectedObjects({window.host().scene().objects().back()});
    emit window.editMenu()->menu()->aboutToShow();
    step("Slides made, the last object selected, the Edit menu opened");
    window.editMenu()->undoAction()->trigger();
    emit window.editMenu()->menu()->aboutToShow();
    step("undone");
    window.editMenu()->redoAction()->trigger();
    step("redone");

    inDialog([this] { choose("Manage Curve Sets…"); },
             [](QDialog& dialog) {
                 auto* table = dialog.findChild<TQQtTableView*>();
                 ASSERT_NE(table, nullptr);
                 ASSERT_EQ(table->tableModel()->rowCount(), 1);
                 table->edit(table->tableModel()->index(0, 0));
                 auto* editor = qobject_cast<QLineEdit*>(table->editor());
                 ASSERT_NE(editor, nullptr);
                 editor->setText("Glides");
                 // The add and remove pair's buttons are the panel's only tool buttons.
                 const QList<QToolButton*> pair = dialog.findChildren<QToolButton*>();
                 ASSERT_EQ(pair.size(), 2);
                 pair[0]->click();
                 click(dialog, "Done");
             });
    step("renamed Glides and another added: the sets are the document's");
}

TEST_F(DemoDocumentTest, save_new_and_open__the_project_comes_back_with_its_sets_and_settings) {
    step("the sample, unmodified");
    dragKeypoint();
    TQDemoCurveEditorCtrl& controller = window.controller();
    controller.setSelectedCurveSet(controller.createCurveSetWithName("Bounce"));
    for (TQChannel* c : {channel("Title", "./1/200/202"), channel("Logo", "./1/100/101/2")})
        controller.appendChannelToCurveSet(c);
    window.autoZoomAction()->trigger();
    markScene();
    step("dragged, Bounce made, auto zoom");

    // Save of an untitled document asks where, as Save As does.
    fileToSave = directory.filePath("piece.vceproj");
    ASSERT_TRUE(window.save());
    step("saved");
    window.editMenu()->undoAction()->trigger();
    step("undone away from the saved point");
    window.editMenu()->redoAction()->trigger();
    step("redone to where it was saved");

    // The sets of the closed document go; a new document takes the preference.
    ASSERT_TRUE(window.newDocument());
    step("new");
    window.autoZoomAction()->trigger();

    fileToOpen = directory.filePath("piece.vceproj");
    ASSERT_TRUE(window.open());
    step("opened: its channels, sets and settings");
}

TEST_F(DemoDocumentTest, unsaved_changes__asked_about_and_never_lost_to_a_damaged_file) {
    std::string text;
    BNStringSink sink(text);
    QFile damaged(directory.filePath("damaged.vceproj"));
    ASSERT_TRUE(!window.document().project().write(sink) && damaged.open(QIODevice::WriteOnly));
    damaged.write(text.data(), static_cast<qint64>(text.size() / 2));
    damaged.close();
    window.host().setSelectedObjects({window.host().scene().objects().back()});
    window.controller().showPosition();
    step("the last object's Position shown: no change");
    window.frameAll();
    drawFrame();
    dragKeypoint();
    markScene();

    answer = QMessageBox::Cancel;
    EXPECT_FALSE(window.newDocument());
    window.close();
    answer = QMessageBox::Save;  // and then no file chosen
    window.close();
    answer = QMessageBox::Discard;
    fileToOpen = directory.filePath("damaged.vceproj");
    EXPECT_FALSE(window.open());
    step("four questions, an error that says where the file is broken: nothing lost");

    ASSERT_TRUE(window.newDocument());
    step("new");
    window.host().addObject("Card");
    step("a change the history does not hold");
    answer = QMessageBox::Save;
    fileToSave = directory.filePath("card.vceproj");
    window.close();
    step("saved, then closed");
    EXPECT_TRUE(QFile::exists(directory.filePath("card.vceproj")));
}

TEST_F(DemoDocumentTest, box_tool__a_drag_undoes_with_its_box_and_delete_forgets_the_box) {
    // One curve alone: the title's fade, whose first two keypoints a band takes.
    TQDemoCurveEditorCtrl& controller = window.controller();
    TQChannel* fade = channel("Title", "./1/200/202");
    controller.setSelectedCurveSet(controller.createCurveSetWithName("Fade"));
    controller.appendChannelToCurveSet(fade);
    window.frameAll();
    drawFrame();
    window.toolSwitch()->button(2)->click();
    const std::vector<TQKeyframeHandle> keys = fade->getKeyframes(false);
    drag(QPoint(keypointInWidget(keys[0]).x() - 8, 0),
         QPoint(keypointInWidget(keys[1]).x() + 8, window.curveWidget()->height() - 1));
    markScene();
    step("the band leaves a box");

    // A free corner drag distorts the box: its right side leans, no rectangle gives it back. A
    // second drag moves it on.
    for (const char* name : {"the top right corner dragged freely", "and again"}) {
        const QPoint corner = toWidget(window.curveView().fourCornersTopRight());
        drag(corner, corner + QPoint(12, 20), Qt::ControlModifier);
        step(name);
    }
    window.editMenu()->undoAction()->trigger();
    step("undone: the box as it stood, exactly");
    window.editMenu()->redoAction()->trigger();
    step("redone");
    window.editMenu()->undoAction()->trigger();
    window.editMenu()->undoAction()->trigger();
    step("both undone: each drag one step that gives the channel back");
    window.deleteAction()->trigger();
    step("Delete forgets the box and deletes no keypoint");
}

}  // namespace
}  // namespace demo_test
