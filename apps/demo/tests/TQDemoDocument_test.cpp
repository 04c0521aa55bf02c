// The demo's File menu and its box tool as a user meets them: saving the untitled sample,
// New, opening it again with its curve sets and settings, the modified mark, the question
// before changes are lost, a damaged file that loses nothing, and a box drag whose undo gives
// back the channels and the box as it stood.
#include <gtest/gtest.h>

#include <QApplication>
#include <QFile>
#include <QListWidget>
#include <QMouseEvent>
#include <QTemporaryDir>

#include <string>
#include <utility>

#include "apps/demo/tests/DemoWindowFixture.h"
#include "qt/TQQtSegmentedControl.h"

namespace demo_test {
namespace {

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
