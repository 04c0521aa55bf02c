#pragma once
// The demo window, shown on the offscreen platform with a manual clock and timer for its curve
// view, and what its tests ask of it: the channels shown, a point of the curve view in the
// widget's coordinates.
#include <gtest/gtest.h>

#include <QMenu>
#include <QPoint>
#include <QPushButton>
#include <QTest>
#include <QTimer>

#include <cmath>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "apps/demo/TQDemoWindow.h"
#include "platform/ui/RWServices.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtCurveViewWidget.h"
#include "qt/TQQtModal.h"
#include "qt/TQQtPopUpButton.h"

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
        settle();
        drawFrame();
        ASSERT_GE(window.curveWidget()->framesDrawn(), 1) << "the window drew no frame";
    }
    void TearDown() override {
        window.curveView().setClock(nullptr);
        window.curveView().setTimer(nullptr);
    }
    static void settle() {
        for (int i = 0; i < 20; ++i) QCoreApplication::processEvents();
    }
    void drawFrame() {
        clock.advance(kStepSeconds);
        window.curveWidget()->repaint();
    }

    // A copy of the whole scene, to compare with operator== later.
    std::unique_ptr<TQChannelBase> sceneCopy() {
        return std::unique_ptr<TQChannelBase>(window.host().sceneChannelRoot()->cloneChannel());
    }
    // The paths of the scene's channels that differ from their copies in `before`.
    std::vector<std::string> changedSince(TQChannelBase& before) {
        TQChannelBase* root = window.host().sceneChannelRoot();
        std::vector<TQChannelBase*> all;
        static_cast<TQChannelFolder*>(root)->getAllDescendantsFlattened(all, 0, false);
        std::vector<std::string> out;
        for (TQChannelBase* c : all) {
            const TQChannelRef ref(c, root);
            const TQChannelBase* was = ref.getChannel(&before);
            if (dynamic_cast<TQChannel*>(c) && !(was && *was == *c)) out.push_back(ref.getText());
        }
        return out;
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
    std::vector<TQChannel*> shownChannels() {
        std::vector<TQChannel*> out;
        TQDemoCurveEditorCtrl& controller = window.controller();
        for (uint32_t i = 0; i < controller.numberOfChannelItems(); ++i)
            if (TQChannel* c = controller.selectedCurveSet()->channeItemAtIndex(i)->channel())
                out.push_back(c);
        return out;
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
    // Each custom set as its name and its channels' paths.
    std::vector<std::string> customSets() {
        std::vector<std::string> out;
        for (const TQCurveSetPtr& set : window.controller().curveSets()) {
            out.push_back(set->curveSetName());
            for (const TQCurveEditorItemPtr& item : set->allItems())
                out.back().append(" ").append(
                    TQChannelRef(item->channelBase(), window.host().sceneChannelRoot()).getText());
        }
        return out;
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

    TestDefaults preferences;
    RWManualClock clock;
    RWManualTimer timer{clock};
    TQDemoWindow window;
    TQQtModalService modal;
};

}  // namespace demo_test
