#pragma once
// The demo window, shown on the offscreen platform with a manual clock and timer for its curve
// view, and what its tests ask of it: the channels shown, a point of the curve view in the
// widget's coordinates.
#include <gtest/gtest.h>

#include <QApplication>
#include <QListWidget>
#include <QMenu>
#include <QMouseEvent>
#include <QPoint>
#include <QPushButton>
#include <QTemporaryDir>
#include <QTest>
#include <QTimer>

#include <cmath>
#include <functional>
#include <memory>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "apps/demo/TQDemoScenePreview.h"
#include "apps/demo/TQDemoTransport.h"
#include "apps/demo/TQDemoWindow.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/ui/RWServices.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtCurveViewWidget.h"
#include "qt/TQQtModal.h"
#include "qt/TQQtPopUpButton.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtTimeRuler.h"
#include "qt/TQQtZoomScroller.h"
#include "tests/support/TextBaseline.h"

namespace demo_test {

inline constexpr double kStepSeconds = 0.05;  // past the view's 1/30 s gate

// User defaults of the test's own, in place before the window reads them: a preference one
// test sets must not reach the next window.
class TestDefaults {
public:
    TestDefaults() : _previous(RWApplicationServices().userDefaults) { install(&defaults); }
    ~TestDefaults() { install(_previous); }
    TestDefaults(const TestDefaults&) = delete;
    TestDefaults& operator=(const TestDefaults&) = delete;
    RWMemoryUserDefaults defaults;

private:
    static void install(RWUserDefaults* userDefaults) {
        RWServiceSet services;
        services.userDefaults = userDefaults;
        RWInstallServices(services);
    }
    RWUserDefaults* _previous;
};

class DemoWindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        modal.install();
        window.curveView().setClock(&clock);
        window.curveView().setTimer(&timer);
        window.show();
        for (int i = 0; i < 20; ++i) QCoreApplication::processEvents();
        drawFrame();
        ASSERT_GE(window.curveWidget()->framesDrawn(), 1) << "the window drew no frame";
        ASSERT_TRUE(directory.isValid());
        // The File menu's questions are answered and counted here, its errors collected.
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
            errors.append(" ").append(
                QString(text + " " + detail).replace(directory.path(), "<dir>").toStdString());
        };
    }
    void TearDown() override {
        window.curveView().setClock(nullptr);
        window.curveView().setTimer(nullptr);
        if (_record.empty()) return;
        EXPECT_TRUE(tests_support::matchesBaselineBlock(
            "window_steps", ::testing::UnitTest::GetInstance()->current_test_info()->name(),
            _record, "apps/demo/tests/baselines"));
    }
    void drawFrame() {
        clock.advance(kStepSeconds);
        window.curveWidget()->repaint();
    }

    // Records what the window shows after `name`; the test's steps are compared with their
    // recorded block when it ends.
    void step(const std::string& name) { _record += "-- " + name + "\n" + shows(); }
    // From here on, the recorded steps name the channels that differ from the scene as it is now,
    // and say when the whole scene equals it again.
    void markScene() { mark.reset(window.host().sceneChannelRoot()->cloneChannel()); }
    // The title with its modified mark, the pop-up, the tool, the Edit menu's titles as they
    // stand (unopened), the history, auto zoom, the playhead and the preview's poses, the object
    // list and the host's selection, the shown channels, the custom sets, the keypoints
    // selected and the box, the changed channels, the questions asked and the errors shown.
    std::string shows() {
        auto on = [](bool b) { return b ? "on" : "off"; };
        TQHostAppDelegate& host = window.host();
        TQChannelBase* root = host.sceneChannelRoot();
        std::ostringstream out;
        out.precision(12);
        // Rounded, so that the last bits of a compiler's arithmetic do not show.
        auto r = [](double v) { return std::round(v * 1e9) / 1e9 + 0.0; };
        out << "title: " << window.windowTitle().toStdString()
            << (window.isWindowModified() ? " (modified)" : "")
            << (window.isVisible() ? "\n" : " (hidden)\n");
        out << "pop-up: " << window.curveSetPopUp()->text().toStdString() << ", tool "
            << static_cast<int>(window.controller().getCurrentTool()) << "\n";
        for (QAction* action : {window.editMenu()->undoAction(), window.editMenu()->redoAction()})
            out << action->text().toStdString() << " (" << on(action->isEnabled()) << ")\n";
        out << "history: " << host.undoStack().undoCount() << ", auto zoom: view "
            << on(window.curveView().autoZoom()) << ", menu "
            << on(window.autoZoomAction()->isChecked()) << ", scroller "
            << on(window.verticalScroller()->isEnabled()) << "\n";
        TQDemoTransport& transport = window.transport();
        out << "playhead: " << r(CMTimeGetSeconds(host.currentTime())) << " s, field "
            << transport.timeField()->stringValue() << ", ruler "
            << r(CMTimeGetSeconds(transport.ruler()->currentTime())) << " s, playing "
            << on(host.isPlaying()) << ", timer " << on(transport.playbackTimer().isActive())
            << "\npreview:";
        for (TQChannelObjectRootBase* object : host.scene().objects()) {
            const TQDemoScenePreview::Pose pose = window.scenePreview()->poseOf(*object);
            out << " " << object->getName() << " " << r(pose.x) << "," << r(pose.y) << " x"
                << r(pose.scaleX) << " a" << r(pose.opacity) << ";";
        }
        out << "\nlist:";
        for (int i = 0; i < window.objectList()->count(); ++i)
            out << " " << window.objectList()->item(i)->text().toStdString()
                << (window.objectList()->item(i)->isSelected() ? "*" : "");
        out << "\nselected:";
        for (TQChannelBase* object : host.selectedObjectsRootChannels())
            out << " " << object->getName();
        out << "\nshown:";
        TQDemoCurveEditorCtrl& controller = window.controller();
        for (uint32_t i = 0; i < controller.numberOfChannelItems(); ++i)
            if (TQChannel* c = controller.selectedCurveSet()->channeItemAtIndex(i)->channel())
                out << " " << TQChannelRef(c, root).getText();
        out << "\nsets:";
        for (const TQCurveSetPtr& set : controller.curveSets()) {
            out << " " << set->curveSetName();
            for (const TQCurveEditorItemPtr& item : set->allItems())
                out << " " << TQChannelRef(item->channelBase(), root).getText();
            out << ";";
        }
        TQDemoCurveEditorView& view = window.curveView();
        out << "\nkeypoints selected: " << view.getSelection()->size() << ", box:";
        if (view.fourCornerBoxInitialized())
            for (const CGPoint& p : {view.fourCornersBottomLeft(), view.fourCornersBottomRight(),
                                     view.fourCornersTopRight(), view.fourCornersTopLeft()})
                out << " " << r(p.x) << "," << r(p.y);
        if (mark) {
            // The channels that differ from their copies in the mark.
            out << "\nchanged:";
            std::vector<TQChannelBase*> all;
            static_cast<TQChannelFolder*>(root)->getAllDescendantsFlattened(all, 0, false);
            for (TQChannelBase* c : all) {
                const TQChannelRef ref(c, root);
                const TQChannelBase* was = ref.getChannel(mark.get());
                if (dynamic_cast<TQChannel*>(c) && !(was && *was == *c))
                    out << " " << ref.getText();
            }
            if (*root == *mark) out << " (every channel as marked)";
        }
        out << "\nasked: " << questions << ", errors:" << errors << "\n";
        return out.str();
    }
    // Works the dialog of the modal run that `open` starts, once it is up; a dialog left open
    // is aborted.
    void inDialog(const std::function<void()>& open, const std::function<void(QDialog&)>& user) {
        bool shown = false;
        QTimer::singleShot(0, [&] {
            if (QDialog* dialog = modal.activeDialog()) {
                shown = true;
                user(*dialog);
            }
            if (modal.activeDialog()) modal.abortModal();
        });
        open();
        EXPECT_TRUE(shown) << "no dialog showed";
    }
    static void click(QDialog& dialog, const char* title) {
        for (QPushButton* button : dialog.findChildren<QPushButton*>())
            if (button->text() == QLatin1String(title)) return button->click();
        ADD_FAILURE() << "no button " << title;
    }
    // A world point of the curve view in the curve widget's coordinates.
    QPoint toWidget(const CGPoint& world) {
        const CGPoint s = window.curveView().getPointScreen(world);
        const double ratio = window.curveWidget()->devicePixelRatioF();
        return QPoint(static_cast<int>(std::lround(s.x / ratio)),
                      static_cast<int>(std::lround(window.curveWidget()->height() - s.y / ratio)));
    }
    // Chooses the curve set pop-up's item titled `title`.
    void choose(const QString& title) {
        QMenu* menu = window.curveSetPopUp()->popUpMenu();
        emit menu->aboutToShow();
        for (QAction* action : menu->actions())
            if (action->text() == title) return action->trigger();
        ADD_FAILURE() << "no item " << title.toStdString();
    }
    // A keyframe of the first shown channel (its middle one unless named), in the curve
    // widget's coordinates.
    QPoint keypointInWidget(TQKeyframeHandle key = nullptr) {
        TQDemoCurveEditorCtrl& controller = window.controller();
        const TQCurveEditorItemPtr item = controller.selectedCurveSet()->channeItemAtIndex(0);
        TQChannel* channel = item ? item->channel() : nullptr;
        if (!channel || channel->numberOfKeyframes() == 0) return QPoint(-1, -1);
        if (!key) key = channel->getKeyframes(false)[channel->numberOfKeyframes() / 2];
        CMTime t = kCMTimeInvalid;
        double v = 0.0;
        if (!channel->getKeyframe(key, &t, &v)) return QPoint(-1, -1);
        const double u = CMTimeGetSeconds(t) + CMTimeGetSeconds(channel->timeOffset());
        return toWidget(CGPointMake(u, controller.convertFromChannelCoords(item.get(), v)));
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

    TestDefaults preferences;
    RWManualClock clock;
    RWManualTimer timer{clock};
    TQDemoWindow window;
    TQQtModalService modal;
    QTemporaryDir directory;
    QMessageBox::StandardButton answer = QMessageBox::Cancel;
    int questions = 0;
    QString fileToOpen;
    QString fileToSave;
    std::string errors;

    std::unique_ptr<TQChannelBase> mark;

private:
    std::string _record;
};
using DemoDocumentTest = DemoWindowTest;

}  // namespace demo_test
