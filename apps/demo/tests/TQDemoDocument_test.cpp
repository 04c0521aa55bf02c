// The demo's File menu and its box tool as a user meets them: saving the untitled sample,
// New, opening it again with its curve sets and settings, the modified mark that follows the
// history, the question before changes are lost, a damaged file that loses nothing, and a box
// drag whose undo gives back the channels and the box as it stood.
#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QListWidget>
#include <QTemporaryDir>

#include <array>
#include <map>
#include <string>
#include <utility>

#include "apps/demo/tests/DemoWindowFixture.h"
#include "qt/TQQtSegmentedControl.h"

namespace demo_test {
namespace {

using Channels = std::map<std::string, std::unique_ptr<TQChannelBase>>;

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

    // Every channel of the scene, by its path from the scene root.
    Channels sceneChannels() {
        Channels out;
        TQChannelBase* root = window.host().sceneChannelRoot();
        for (TQChannelObjectRootBase* object : window.host().scene().objects()) {
            std::vector<TQChannelBase*> flat;
            object->getAllDescendantsFlattened(flat, 0, true);
            for (TQChannelBase* c : flat)
                if (dynamic_cast<TQChannel*>(c))
                    out.emplace(TQChannelRef(c, root).getText(), c->cloneChannel());
        }
        return out;
    }
    static bool same(const Channels& a, const Channels& b) {
        if (a.size() != b.size()) return false;
        for (const auto& [path, channel] : a) {
            const auto found = b.find(path);
            if (found == b.end() || !(*found->second == *channel)) return false;
        }
        return true;
    }
    // The custom sets as the pop-up and the list show them: names with channel paths.
    std::vector<std::string> customSets() {
        std::vector<std::string> out;
        for (const TQCurveSetPtr& set : window.controller().curveSets()) {
            std::string text = set->curveSetName() + ":";
            for (const TQCurveEditorItemPtr& item : set->allItems())
                text += " " + item->channelRef()->getText();
            out.push_back(text);
        }
        return out;
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
            QTest::mouseMove(window.curveWidget(), from + (to - from) * step / 5);
        }
        QTest::mouseRelease(window.curveWidget(), Qt::LeftButton, mods, to);
        drawFrame();
    }
    std::string title() { return window.windowTitle().toStdString(); }

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
    EXPECT_TRUE(window.isWindowModified()) << "a drag is a change";

    TQDemoCurveEditorCtrl& controller = window.controller();
    const TQCurveSetPtr bounce = controller.createCurveSetWithName("Bounce");
    controller.setSelectedCurveSet(bounce);
    const std::vector<TQChannel*> shown = {
        dynamic_cast<TQChannel*>(TQChannelRef("./1/200/202")
                                     .getChannel(window.host().scene().objectNamed("Title"))),
        dynamic_cast<TQChannel*>(TQChannelRef("./1/100/101/2")
                                     .getChannel(window.host().scene().objectNamed("Logo")))};
    for (TQChannel* c : shown) controller.appendChannelToCurveSet(c);
    window.autoZoomAction()->trigger();
    const Channels before = sceneChannels();
    const std::vector<std::string> setsBefore = customSets();
    ASSERT_EQ(setsBefore.size(), 1u);

    fileToSave = directory.filePath("piece.vceproj");
    ASSERT_TRUE(window.save()) << "Save of an untitled document asks where, as Save As does";
    EXPECT_EQ(errors, std::vector<std::string>{});
    EXPECT_EQ(title(), "piece.vceproj[*] - Bounce - VantaCurveEditor Demo");
    EXPECT_FALSE(window.isWindowModified());
    {
        SCOPED_TRACE("undo away from the saved point and back");
        window.editMenu()->undoAction()->trigger();
        EXPECT_TRUE(window.isWindowModified());
        window.editMenu()->redoAction()->trigger();
        EXPECT_FALSE(window.isWindowModified()) << "back where it was saved";
    }

    ASSERT_TRUE(window.newDocument());
    EXPECT_EQ(questions, 0) << "nothing to save, nothing asked";
    EXPECT_TRUE(window.host().scene().objects().empty());
    EXPECT_TRUE(controller.curveSets().empty()) << "the sets of the closed document are gone";
    EXPECT_EQ(title(), "Untitled[*] - Animated - VantaCurveEditor Demo");
    EXPECT_TRUE(window.curveView().autoZoom()) << "a new document takes the preference";
    window.autoZoomAction()->trigger();

    fileToOpen = directory.filePath("piece.vceproj");
    ASSERT_TRUE(window.open());
    EXPECT_TRUE(same(sceneChannels(), before)) << "every channel as it was saved";
    EXPECT_EQ(customSets(), setsBefore);
    EXPECT_EQ(controller.selectedCurveSet()->curveSetName(), "Bounce");
    EXPECT_TRUE(window.curveView().autoZoom()) << "the document's setting, not the preference";
    EXPECT_TRUE(window.autoZoomAction()->isChecked());
    EXPECT_EQ(window.objectList()->count(), 4);
    EXPECT_EQ(title(), "piece.vceproj[*] - Bounce - VantaCurveEditor Demo");
    EXPECT_FALSE(window.isWindowModified());
    EXPECT_FALSE(window.host().canUndo()) << "an open starts a history of its own";
}

TEST_F(DemoDocumentTest, unsaved_changes__asked_about_before_they_are_lost) {
    {
        SCOPED_TRACE("what the editor shows is no change");
        window.host().setSelectedObjects({window.host().scene().objects().back()});
        window.controller().showPosition();
        window.frameAll();
        EXPECT_FALSE(window.isWindowModified());
    }
    drawFrame();
    dragKeypoint();
    const Channels edited = sceneChannels();
    {
        SCOPED_TRACE("Cancel keeps everything");
        answer = QMessageBox::Cancel;
        EXPECT_FALSE(window.newDocument());
        EXPECT_FALSE(window.open());
        window.close();
        EXPECT_EQ(questions, 3);
        EXPECT_TRUE(window.isVisible());
        EXPECT_TRUE(same(sceneChannels(), edited));
        EXPECT_TRUE(window.isWindowModified());
    }
    {
        SCOPED_TRACE("Save with no file chosen saves nothing and closes nothing");
        answer = QMessageBox::Save;
        window.close();
        EXPECT_TRUE(window.isVisible());
        EXPECT_TRUE(window.isWindowModified());
    }
    {
        SCOPED_TRACE("Don't Save, and the sample is gone");
        answer = QMessageBox::Discard;
        ASSERT_TRUE(window.newDocument());
        EXPECT_TRUE(window.host().scene().objects().empty());
        EXPECT_FALSE(window.isWindowModified());
    }
    {
        SCOPED_TRACE("an object added is a change the history does not hold");
        window.host().addObject("Card");
        EXPECT_TRUE(window.isWindowModified());
        answer = QMessageBox::Save;
        fileToSave = directory.filePath("card.vceproj");
        window.close();
        EXPECT_FALSE(window.isVisible()) << "saved, then closed";
        EXPECT_TRUE(QFile::exists(directory.filePath("card.vceproj")));
    }
}

TEST_F(DemoDocumentTest, damaged_file__named_in_an_error_and_nothing_is_lost) {
    std::string text;
    BNStringSink sink(text);
    ASSERT_FALSE(window.document().project().write(sink));
    QFile damaged(directory.filePath("damaged.vceproj"));
    ASSERT_TRUE(damaged.open(QIODevice::WriteOnly));
    damaged.write(text.substr(0, text.size() / 2).c_str());
    damaged.close();

    dragKeypoint();
    const Channels edited = sceneChannels();
    window.controller().createCurveSetWithName("Mine");
    const std::vector<std::string> sets = customSets();
    const std::string titleBefore = title();

    answer = QMessageBox::Discard;
    fileToOpen = damaged.fileName();
    EXPECT_FALSE(window.open());
    ASSERT_EQ(errors.size(), 1u);
    EXPECT_NE(errors[0].find("damaged.vceproj"), std::string::npos) << errors[0];
    EXPECT_NE(errors[0].find("line "), std::string::npos) << "where the file is broken";
    EXPECT_TRUE(same(sceneChannels(), edited));
    EXPECT_EQ(customSets(), sets);
    EXPECT_EQ(title(), titleBefore);
    EXPECT_TRUE(window.isWindowModified()) << "the changes are still there to save";
    EXPECT_TRUE(window.document().isUntitled());
    EXPECT_TRUE(window.editMenu()->undoAction()->isEnabled()) << "and the history with them";
}

TEST_F(DemoDocumentTest, box_tool__a_drag_undoes_with_its_box_and_delete_forgets_the_box) {
    // One curve alone: the title's fade, whose first two keypoints the band takes.
    TQDemoCurveEditorCtrl& controller = window.controller();
    controller.setSelectedCurveSet(controller.createCurveSetWithName("Fade"));
    controller.appendChannelToCurveSet(dynamic_cast<TQChannel*>(
        TQChannelRef("./1/200/202").getChannel(window.host().scene().objectNamed("Title"))));
    window.frameAll();
    drawFrame();
    window.toolSwitch()->button(2)->click();
    ASSERT_EQ(controller.getCurrentTool(), TQTool::kBox);

    const TQCurveEditorItemPtr item = controller.selectedCurveSet()->channeItemAtIndex(0);
    TQChannel* fade = item->channel();
    const std::vector<TQKeyframeHandle> keys = fade->getKeyframes(false);
    ASSERT_GE(keys.size(), 3u);
    auto keyInWidget = [&](size_t i) {
        CMTime t = kCMTimeInvalid;
        double v = 0.0;
        fade->getKeyframe(keys[i], &t, &v);
        return toWidget(CGPointMake(CMTimeGetSeconds(t) + CMTimeGetSeconds(fade->timeOffset()),
                                    controller.convertFromChannelCoords(item.get(), v)));
    };
    const QPoint k0 = keyInWidget(0), k1 = keyInWidget(1);
    drag(QPoint(k0.x() - 8, 2), QPoint(k1.x() + 8, window.curveWidget()->height() - 2));
    ASSERT_TRUE(window.curveView().fourCornerBoxInitialized()) << "the band leaves a box";

    using Corners = std::array<CGPoint, 4>;
    auto corners = [&] {
        const TQDemoCurveEditorView& v = window.curveView();
        return Corners{v.fourCornersBottomLeft(), v.fourCornersBottomRight(),
                       v.fourCornersTopRight(), v.fourCornersTopLeft()};
    };
    auto sameCorners = [](const Corners& a, const Corners& b) {
        for (size_t i = 0; i < 4; ++i)
            if (!(a[i] == b[i])) return false;
        return true;
    };
    const std::unique_ptr<TQChannelBase> original(fade->cloneChannel());
    // A free corner drag distorts the box; a side drag then moves it on.
    const QPoint topRight = toWidget(window.curveView().fourCornersTopRight());
    drag(topRight, topRight + QPoint(12, 20), Qt::ControlModifier);
    const Corners distorted = corners();
    const std::unique_ptr<TQChannelBase> afterFirst(fade->cloneChannel());
    ASSERT_FALSE(*afterFirst == *original);
    const CGPoint l = window.curveView().fourCornersTopLeft();
    const CGPoint b = window.curveView().fourCornersBottomLeft();
    const QPoint leftSide = toWidget(CGPointMake((l.x + b.x) / 2, (l.y + b.y) / 2));
    drag(leftSide, leftSide + QPoint(-10, 0));
    const Corners moved = corners();
    EXPECT_EQ(window.editMenu()->undoAction()->text().toStdString(), "Undo Transform Keypoints");

    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(*fade == *afterFirst) << "undo gives the channel back exactly";
    EXPECT_TRUE(sameCorners(corners(), distorted)) << "and the distorted box with it";
    window.editMenu()->redoAction()->trigger();
    EXPECT_TRUE(sameCorners(corners(), moved));
    window.editMenu()->undoAction()->trigger();
    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(*fade == *original);

    const std::unique_ptr<TQChannelBase> kept(fade->cloneChannel());
    window.deleteAction()->trigger();
    EXPECT_FALSE(window.curveView().fourCornerBoxInitialized()) << "Delete forgets the box";
    EXPECT_TRUE(window.curveView().getSelection()->empty());
    EXPECT_TRUE(*fade == *kept) << "and deletes no keypoint";

    window.toolSwitch()->button(0)->click();
    drawFrame();  // picking sees what was drawn last
    QTest::mouseClick(window.curveWidget(), Qt::LeftButton, Qt::NoModifier, keyInWidget(1));
    window.deleteAction()->trigger();
    EXPECT_EQ(fade->numberOfKeyframes(), keys.size() - 1) << "the edit tool's Delete deletes";
    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(*fade == *kept);
}

}  // namespace
}  // namespace demo_test
