// The demo window end to end: the object list drives the automatic curve sets, the pop-up
// chooses among every set, the tool switch and the vertical scroller work through their
// models, a drag through the curve widget changes one channel as one named step that the Edit
// menu offers, and the menu's Undo gives every channel back exactly. Its File menu and box tool
// as a user meets them: saving the untitled sample, New, opening it again with its curve sets
// and settings, the modified mark, the question before changes are lost, a damaged file that
// loses nothing, and a box drag whose undo gives back the channels and the box as it stood.
#include <gtest/gtest.h>

#include <QApplication>
#include <QElapsedTimer>
#include <QFile>
#include <QLineEdit>
#include <QListWidget>
#include <QMenu>
#include <QMouseEvent>
#include <QTemporaryDir>
#include <QToolButton>

#include <set>
#include <string>
#include <utility>

#include "apps/demo/TQDemoScenePreview.h"
#include "apps/demo/TQDemoTransport.h"
#include "apps/demo/tests/DemoWindowFixture.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelRef.h"
#include "qt/TQQtPopUpButton.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtTableView.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtTimeRuler.h"
#include "qt/TQQtZoomScroller.h"

namespace demo_test {
namespace {

TEST_F(DemoWindowTest, object_list__drives_the_scene_selection_and_loses_a_removed_objects_row) {
    const std::vector<TQChannelObjectRootBase*> objects = window.host().scene().objects();
    ASSERT_EQ(window.objectList()->count(), static_cast<int>(objects.size()))
        << "one row per object";
    EXPECT_EQ(window.controller().selectedCurveSet(), window.controller().curveSetAnimated());
    window.objectList()->clearSelection();
    window.objectList()->item(1)->setSelected(true);
    window.objectList()->item(3)->setSelected(true);
    EXPECT_EQ(window.host().selectedObjectsRootChannels(),
              (std::vector<TQChannelBase*>{objects[1], objects[3]}));
    std::set<const TQChannelBase*> roots;
    for (TQChannel* channel : shownChannels()) roots.insert(channel->getChannelRoot());
    EXPECT_EQ(roots, (std::set<const TQChannelBase*>{objects[1], objects[3]}))
        << "the Animated set must follow the scene's selection";

    // And the other way: the scene selects, the list follows.
    TQChannelObjectRootBase* title = window.host().scene().objectNamed(kTQHostSampleTitleObject);
    window.host().selectObject(title);
    ASSERT_TRUE(window.objectList()->item(0)->isSelected());
    EXPECT_FALSE(window.objectList()->item(1)->isSelected());

    // A keypoint of the shown object is selected when it goes.
    drawFrame();
    QTest::mouseClick(window.curveWidget(), Qt::LeftButton, Qt::NoModifier, keypointInWidget());
    ASSERT_FALSE(window.curveView().getSelection()->empty()) << "the click selected no keypoint";
    ASSERT_TRUE(window.host().removeObject(title));
    for (TQChannel* channel : shownChannels())
        EXPECT_NE(channel->getChannelRoot(), title) << "a curve of a removed object is shown";
    EXPECT_EQ(window.objectList()->count(), static_cast<int>(objects.size()) - 1)
        << "the list must lose the removed object's row";
    const int frames = window.curveWidget()->framesDrawn();
    drawFrame();
    EXPECT_GT(window.curveWidget()->framesDrawn(), frames) << "the view must still draw";
    EXPECT_FALSE(window.host().canUndo());
}

// Choosing a set from the pop-up, and its title, are the curve set tests' first steps.
TEST_F(DemoWindowTest, pop_up_tools_and_scroller__work_through_their_models) {
    choose("Position");
    EXPECT_EQ(window.windowTitle(), "Untitled[*] - Position - VantaCurveEditor Demo");
    window.toolSwitch()->button(1)->click();
    EXPECT_EQ(window.controller().getCurrentTool(), TQTool::kSketch);

    // Zoomed in, the knob is shorter than the scroller and a page click pans the view.
    TQQtZoomScroller* scroller = window.verticalScroller();
    ASSERT_TRUE(scroller->isEnabled());
    window.curveView().zoomWithFactor(1.0, 4.0);
    EXPECT_LT(scroller->pageStep(), TQQtZoomScroller::kResolution);
    const double y = window.curveView().getCurrentViewVolume().origin.y;
    scroller->triggerAction(QAbstractSlider::SliderPageStepAdd);
    EXPECT_GT(window.curveView().getCurrentViewVolume().origin.y, y);

    window.autoZoomAction()->trigger();
    EXPECT_TRUE(window.curveView().autoZoom());
    EXPECT_FALSE(scroller->isEnabled()) << "the view fits itself; the scroller waits";
}

TEST_F(DemoWindowTest, drag_then_menu_undo__one_named_step_that_restores_every_channel_exactly) {
    const auto before = sceneCopy();
    const QPoint start = keypointInWidget();
    ASSERT_TRUE(window.curveWidget()->rect().contains(start)) << "the keypoint is off screen";
    const TQCurveEditorItemPtr item = window.controller().selectedCurveSet()->channeItemAtIndex(0);
    TQChannel* channel = item->channel();
    const TQKeyframeHandle key = channel->getKeyframes(false)[channel->numberOfKeyframes() / 2];
    const std::vector<std::string> dragged{
        TQChannelRef(channel, window.host().sceneChannelRoot()).getText()};
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

    EXPECT_EQ(changedSince(*before), dragged) << "the drag must change the dragged channel alone";
    QAction* undo = window.editMenu()->undoAction();
    EXPECT_TRUE(undo->isEnabled())
        << "the Edit menu must follow the host's history without being opened";
    EXPECT_EQ(undo->text().toStdString(), "Undo Move Keypoint");
    EXPECT_EQ(window.host().undoStack().undoCount(), 1u) << "ten drag steps are one undo step";

    // The curves are drawn clean; the undo must leave the restored one to be sampled again.
    drawFrame();
    undo->trigger();
    EXPECT_TRUE(*window.host().sceneChannelRoot() == *before)
        << "Undo must give back every channel exactly";
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
    ASSERT_NE(channelItem, nullptr);
    EXPECT_TRUE(channelItem->originalCurveDirty())
        << "the restored curve would be drawn from stale samples";
    EXPECT_EQ(window.editMenu()->redoAction()->text().toStdString(), "Redo Move Keypoint");
    window.editMenu()->redoAction()->trigger();
    EXPECT_EQ(changedSince(*before), dragged) << "Redo must apply the drag again";
}

TEST_F(DemoWindowTest, double_click_on_a_keypoint__types_its_value_in_the_panel_as_one_step) {
    const auto before = sceneCopy();
    const QPoint at = keypointInWidget();
    ASSERT_TRUE(window.curveWidget()->rect().contains(at)) << "the keypoint is off screen";
    TQChannel* channel = shownChannels()[0];
    const TQKeyframeHandle key = channel->getKeyframes(false)[channel->numberOfKeyframes() / 2];
    inDialog(
        [&] {
            QTest::mouseDClick(window.curveWidget(), Qt::LeftButton, Qt::NoModifier, at);
            QTest::mouseRelease(window.curveWidget(), Qt::LeftButton, Qt::NoModifier, at);
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
    EXPECT_EQ(changedSince(*before),
              std::vector<std::string>{
                  TQChannelRef(channel, window.host().sceneChannelRoot()).getText()});
    EXPECT_EQ(window.editMenu()->undoAction()->text().toStdString(), "Undo Move Keypoint");
    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(*window.host().sceneChannelRoot() == *before) << "Undo takes the value back";
}

TEST_F(DemoWindowTest, transport_and_ruler__play_step_and_scrub_on_the_hosts_clock) {
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
    EXPECT_FALSE(host.isPlaying()) << "the transport's moves pause playback";
    EXPECT_FALSE(transport.playbackTimer().isActive());
    transport.buttons()->userClickSegment(TQDemoTransport::kNextFrame);
    EXPECT_EQ(host.currentTime(), CMTimeMake(1, 30));
    transport.buttons()->userClickSegment(TQDemoTransport::kGoToEnd);
    EXPECT_EQ(host.currentTime(), CMTimeMake(179, 30));
    EXPECT_EQ(transport.timeField()->stringValue(), "00:00:05:29");

    // A press on the ruler puts the playhead on the frame under it.
    TQQtTimeRuler* ruler = window.timeRuler();
    const CMTime target = CMTimeMake(45, 30);
    const int x =
        static_cast<int>(std::lround(transport.ruler()->xForTime(target, ruler->width()) + 0.5));
    QTest::mouseClick(ruler, Qt::LeftButton, Qt::NoModifier, QPoint(x, ruler->height() / 2));
    EXPECT_EQ(host.currentTime(), target);
}

TEST_F(DemoWindowTest, preview__poses_come_from_the_channels_at_the_playhead) {
    TQHostAppDelegate& host = window.host();
    host.movePlayhead(CMTimeMake(24, 30));  // the title at rest
    TQChannelObjectRootBase* title = host.scene().objectNamed(kTQHostSampleTitleObject);
    TQDemoScenePreview::Pose pose = window.scenePreview()->poseOf(*title);
    EXPECT_NEAR(pose.x, 0.0, 1e-6);
    EXPECT_NEAR(pose.y, 110.0, 1e-6);
    EXPECT_NEAR(pose.scaleX, 0.95, 1e-6);
    EXPECT_NEAR(pose.opacity, 1.0, 1e-6);
    // The lower third's keys are in its own time, a second later.
    host.movePlayhead(CMTimeMake(30 + 30, 30));
    pose = window.scenePreview()->poseOf(*host.scene().objectNamed(kTQHostSampleOffsetObject));
    EXPECT_NEAR(pose.x, -560.0, 1e-6);

    // An edit of the curve moves the picture.
    auto* x = dynamic_cast<TQChannel*>(
        TQChannelRef(TQHostPropertyPaths(TQHostObjectFamily::Kestrel, TQHostProperty::Position)[0])
            .getChannel(static_cast<TQChannelBase*>(title)));
    const CMTime now = CMTimeMake(60, 30);
    x->offsetCurve(&now, 250.0);
    EXPECT_NEAR(window.scenePreview()->poseOf(*title).x, 250.0, 1e-6);
}

// A new set made from the pop-up's entry, undone and redone, then renamed and joined by another
// in the manager's dialog. The document test saves and opens sets.
TEST_F(DemoWindowTest, new_and_managed_sets__are_saved_and_opened_with_the_project) {
    choose("Position");
    const std::vector<TQChannel*> position = shownChannels();
    ASSERT_FALSE(position.empty());
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
    EXPECT_EQ(shownChannels(), position) << "the new set holds what showed";
    window.host().setSelectedObjects({window.host().scene().objects().back()});
    EXPECT_EQ(shownChannels(), position) << "and does not follow the selection";
    EXPECT_EQ(window.curveSetPopUp()->text(), "Slides");
    emit window.editMenu()->menu()->aboutToShow();
    EXPECT_EQ(window.editMenu()->undoAction()->text(), "Undo New Curve Set");
    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(window.controller().curveSets().empty());
    EXPECT_EQ(window.curveSetPopUp()->text(), "Position");
    emit window.editMenu()->menu()->aboutToShow();
    window.editMenu()->redoAction()->trigger();
    EXPECT_EQ(window.curveSetPopUp()->text(), "Slides");
    EXPECT_EQ(shownChannels(), position);

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
    const std::vector<std::string> sets = customSets();
    ASSERT_EQ(sets.size(), 2u);
    EXPECT_EQ(sets[0].rfind("Glides ./", 0), 0u) << sets[0];
    EXPECT_EQ(sets[1], "Untitled Set");
    EXPECT_TRUE(window.isWindowModified()) << "the sets are the document's";
}

class DemoDocumentTest : public DemoWindowTest {
protected:
    void SetUp() override {
        DemoWindowTest::SetUp();
        ASSERT_TRUE(directory.isValid());
        // A question nobody expected fails the test; each test answers the ones it expects.
        TQDemoPrompts& prompts = window.prompts();
        prompts.askToSaveChanges = [this](const QString&) {
            ++questions;
            return answer;
        };
        prompts.chooseFileToOpen = [this] { return std::exchange(fileToOpen, QString()); };
        prompts.chooseFileToSave = [this](const QString&) {
            return std::exchange(fileToSave, QString());
        };
        prompts.showError = [this](const QString& text, const QString& detail) {
            errors.push_back((text + " " + detail).toStdString());
        };
    }

    TQChannel* channel(const char* objectName, const char* path) {
        return dynamic_cast<TQChannel*>(
            TQChannelRef(path).getChannel(window.host().scene().objectNamed(objectName)));
    }
    // A drag of a keypoint of the first shown curve: one undo step.
    void dragKeypoint() {
        const QPoint start = keypointInWidget();
        ASSERT_TRUE(window.curveWidget()->rect().contains(start)) << "the keypoint is off screen";
        drag(start, start + QPoint(0, -30));
    }
    void drag(QPoint from, QPoint to, Qt::KeyboardModifiers mods = Qt::NoModifier) {
        QTest::mousePress(window.curveWidget(), Qt::LeftButton, mods, from);
        for (int step = 1; step <= 5; ++step) {
            clock.advance(kStepSeconds);
            // QTest moves carry no modifiers: the event is made here.
            const QPointF at = from + (to - from) * step / 5;
            QMouseEvent move(QEvent::MouseMove, at, window.curveWidget()->mapToGlobal(at),
                             Qt::NoButton, Qt::LeftButton, mods);
            QApplication::sendEvent(window.curveWidget(), &move);
        }
        QTest::mouseRelease(window.curveWidget(), Qt::LeftButton, mods, to);
        drawFrame();
    }
    std::string title() { return window.windowTitle().toStdString(); }
    void write(const QString& name, const std::string& text) {
        QFile file(directory.filePath(name));
        ASSERT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(text.data(), static_cast<qint64>(text.size()));
    }

    QTemporaryDir directory;
    QMessageBox::StandardButton answer = QMessageBox::Cancel;
    int questions = 0;
    QString fileToOpen;
    QString fileToSave;
    std::vector<std::string> errors;
};

TEST_F(DemoDocumentTest, save_new_and_open__the_project_comes_back_with_its_sets_and_settings) {
    EXPECT_EQ(title(), "Untitled[*] - Animated - VantaCurveEditor Demo");
    EXPECT_FALSE(window.isWindowModified()) << "the sample starts unmodified";
    dragKeypoint();
    TQDemoCurveEditorCtrl& controller = window.controller();
    controller.setSelectedCurveSet(controller.createCurveSetWithName("Bounce"));
    for (TQChannel* c : {channel("Title", "./1/200/202"), channel("Logo", "./1/100/101/2")})
        controller.appendChannelToCurveSet(c);
    window.autoZoomAction()->trigger();
    const auto before = sceneCopy();
    const std::vector<std::string> sets = customSets();
    ASSERT_EQ(sets, std::vector<std::string>{"Bounce ./1/1/200/202 ./2/1/100/101/2"});

    fileToSave = directory.filePath("piece.vceproj");
    ASSERT_TRUE(window.save()) << "Save of an untitled document asks where, as Save As does";
    EXPECT_EQ(title(), "piece.vceproj[*] - Bounce - VantaCurveEditor Demo");
    EXPECT_FALSE(window.isWindowModified());
    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(window.isWindowModified()) << "undone away from the saved point";
    window.editMenu()->redoAction()->trigger();
    EXPECT_FALSE(window.isWindowModified()) << "back where it was saved";

    ASSERT_TRUE(window.newDocument());
    EXPECT_TRUE(window.host().scene().objects().empty());
    EXPECT_TRUE(controller.curveSets().empty()) << "the sets of the closed document are gone";
    EXPECT_TRUE(window.curveView().autoZoom()) << "a new document takes the preference";
    window.autoZoomAction()->trigger();

    fileToOpen = directory.filePath("piece.vceproj");
    ASSERT_TRUE(window.open());
    EXPECT_EQ(questions, 0) << "nothing was unsaved, nothing asked";
    EXPECT_TRUE(*window.host().sceneChannelRoot() == *before) << "every channel as it was saved";
    EXPECT_EQ(customSets(), sets);
    EXPECT_EQ(controller.selectedCurveSet()->curveSetName(), "Bounce");
    EXPECT_TRUE(window.autoZoomAction()->isChecked()) << "the document's setting";
    EXPECT_EQ(window.objectList()->count(), 4);
    EXPECT_FALSE(window.isWindowModified());
}

TEST_F(DemoDocumentTest, unsaved_changes__asked_about_and_never_lost_to_a_damaged_file) {
    std::string text;
    BNStringSink sink(text);
    ASSERT_FALSE(window.document().project().write(sink));
    write("damaged.vceproj", text.substr(0, text.size() / 2));
    window.host().setSelectedObjects({window.host().scene().objects().back()});
    window.controller().showPosition();
    EXPECT_FALSE(window.isWindowModified()) << "what the editor shows is no change";
    window.frameAll();
    drawFrame();
    dragKeypoint();
    const auto edited = sceneCopy();

    answer = QMessageBox::Cancel;
    EXPECT_FALSE(window.newDocument());
    window.close();
    answer = QMessageBox::Save;  // and then no file chosen
    window.close();
    answer = QMessageBox::Discard;
    fileToOpen = directory.filePath("damaged.vceproj");
    EXPECT_FALSE(window.open());
    EXPECT_EQ(questions, 4);
    ASSERT_EQ(errors.size(), 1u);
    EXPECT_NE(errors[0].find("damaged.vceproj"), std::string::npos) << errors[0];
    EXPECT_NE(errors[0].find("line "), std::string::npos) << "where the file is broken";
    EXPECT_TRUE(window.isVisible());
    EXPECT_FALSE(shownChannels().empty()) << "a cancelled close leaves the editor's sets";
    EXPECT_TRUE(*window.host().sceneChannelRoot() == *edited) << "nothing lost";
    EXPECT_TRUE(window.isWindowModified());
    EXPECT_TRUE(window.editMenu()->undoAction()->isEnabled()) << "the history neither";

    ASSERT_TRUE(window.newDocument());
    EXPECT_FALSE(window.isWindowModified());
    window.host().addObject("Card");
    EXPECT_TRUE(window.isWindowModified()) << "a change the history does not hold";
    answer = QMessageBox::Save;
    fileToSave = directory.filePath("card.vceproj");
    window.close();
    EXPECT_FALSE(window.isVisible()) << "saved, then closed";
    EXPECT_TRUE(QFile::exists(directory.filePath("card.vceproj")));
}

TEST_F(DemoDocumentTest, box_tool__a_drag_undoes_with_its_box_and_delete_forgets_the_box) {
    // One curve alone: the title's fade, whose first two keypoints a band takes.
    TQDemoCurveEditorCtrl& controller = window.controller();
    controller.setSelectedCurveSet(controller.createCurveSetWithName("Fade"));
    controller.appendChannelToCurveSet(channel("Title", "./1/200/202"));
    window.frameAll();
    drawFrame();
    window.toolSwitch()->button(2)->click();
    ASSERT_EQ(controller.getCurrentTool(), TQTool::kBox);
    TQChannel* fade = channel("Title", "./1/200/202");
    const CGRect volume = window.curveView().getCurrentViewVolume();
    CMTime t0 = kCMTimeInvalid, t1 = kCMTimeInvalid;
    const std::vector<TQKeyframeHandle> keys = fade->getKeyframes(false);
    fade->getKeyframe(keys[0], &t0, nullptr);
    fade->getKeyframe(keys[1], &t1, nullptr);
    const CGFloat offset = CMTimeGetSeconds(fade->timeOffset());
    drag(toWidget(CGPointMake(CMTimeGetSeconds(t0) + offset - 0.1, CGRectGetMaxY(volume))),
         toWidget(CGPointMake(CMTimeGetSeconds(t1) + offset + 0.1, volume.origin.y)));
    ASSERT_TRUE(window.curveView().fourCornerBoxInitialized()) << "the band leaves a box";

    auto corners = [&] {
        const TQDemoCurveEditorView& v = window.curveView();
        std::vector<double> out;
        for (const CGPoint& p : {v.fourCornersBottomLeft(), v.fourCornersBottomRight(),
                                 v.fourCornersTopRight(), v.fourCornersTopLeft()})
            for (const double coordinate : {p.x, p.y}) out.push_back(coordinate);
        return out;
    };
    // A free corner drag distorts the box; a second drag moves it on.
    const std::unique_ptr<TQChannelBase> original(fade->cloneChannel());
    auto dragTopRight = [&] {
        const QPoint corner = toWidget(window.curveView().fourCornersTopRight());
        drag(corner, corner + QPoint(12, 20), Qt::ControlModifier);
        return corners();
    };
    const std::vector<double> distorted = dragTopRight();
    EXPECT_NE(distorted[4], distorted[2]) << "the right side leans: no rectangle gives it back";
    const std::vector<double> moved = dragTopRight();
    window.editMenu()->undoAction()->trigger();
    EXPECT_EQ(corners(), distorted) << "the box as it stood, exactly";
    window.editMenu()->redoAction()->trigger();
    EXPECT_EQ(corners(), moved);
    window.editMenu()->undoAction()->trigger();
    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(*fade == *original) << "each drag one step that gives the channel back";

    window.deleteAction()->trigger();
    EXPECT_FALSE(window.curveView().fourCornerBoxInitialized()) << "Delete forgets the box";
    EXPECT_TRUE(window.curveView().getSelection()->empty());
    EXPECT_TRUE(*fade == *original) << "and deletes no keypoint";
}

}  // namespace
}  // namespace demo_test
