#pragma once
// The full editor on the sample project, as a host sets it up: the reference host with the
// motion-graphics piece, a recording delegate in front of it, the controller with a timeline
// view on a stub view host (800 x 400 points), a vertical scroller in a superview, a tool
// switch and a curve set pop-up; setupController and viewDidLoad have run, and the controller
// hears the host's words. A scripted modal service plays the user in panels, and a pasteboard
// of the test's own takes what is copied.
//
// One log takes, in order, what the tests of the update cycle watch: the controller's
// refreshes, the view's tool and zoom calls, a few calls of the delegate, and what the
// recording channel list is asked.

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/ui/RWButton.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"
#include "tests/support/SceneText.h"
#include "tests/support/TQRecordingAppDelegate.h"

namespace editor_test {

using Log = std::vector<std::string>;
using Copy = std::unique_ptr<TQChannelBase>;
inline Copy copyOf(const TQChannelBase* c) { return Copy(c->cloneChannel()); }
inline CMTime sec(double s) { return CMTimeMakeWithSeconds(s, 600); }
// The user presses the panel's button of that action.
inline void press(const RWPanel& panel, const std::string& action) {
    const auto button = panel.contentView()->subview<RWButton>(
        [&](const RWButton& b) { return b.action() == action; });
    ASSERT_NE(button, nullptr) << action;
    button->userClick();
}

class LoggingRecorder : public TQRecordingAppDelegate {
public:
    using TQRecordingAppDelegate::TQRecordingAppDelegate;
    bool objectsSelectedInScene() override {
        log->push_back("objectsSelectedInScene");
        return TQRecordingAppDelegate::objectsSelectedInScene();
    }
    std::vector<TQChannelRef> modifiedChannels() override {
        log->push_back("modifiedChannels");
        return TQRecordingAppDelegate::modifiedChannels();
    }
    void resetModifiedChannels() override {
        log->push_back("resetModifiedChannels");
        TQRecordingAppDelegate::resetModifiedChannels();
    }
    Log* log = nullptr;
};

class LoggingView : public TQCurveEditorView {
public:
    void currentToolChanged() override {
        log->push_back("currentToolChanged");
        TQCurveEditorView::currentToolChanged();
    }
    void performAutoZoom(bool force) override {
        if (force) log->push_back("performAutoZoom");
        TQCurveEditorView::performAutoZoom(force);
    }
    Log* log = nullptr;
};

class LoggingCtrl : public TQCurveEditorCtrl {
public:
    void refreshSelectedCurveSet() override {
        log->push_back("refreshSelectedCurveSet");
        TQCurveEditorCtrl::refreshSelectedCurveSet();
    }
    void updateIfModifiedByBehaviors() override { log->push_back("updateIfModifiedByBehaviors"); }
    void refreshPopUp() override {
        log->push_back("refreshPopUp");
        TQCurveEditorCtrl::refreshPopUp();
    }
    // The ranges the view reports, unlogged.
    void displayRangeChangedTo(CMTimeRange range) override { ranges.push_back(range); }
    // With followsZoom, as a host does: a horizontal zoom of the view becomes the display
    // range, which comes back to the view.
    void didSetViewContentsHorizontalOrigin(double origin, double duration) override {
        if (!followsZoom || !_view) return;
        const CMTime start = TQTarnTimeForChannelSeconds(origin, kTQCurveEditorTimescale);
        const CMTime length = TQTarnTimeForChannelSeconds(duration, kTQCurveEditorTimescale);
        _view->setDisplayRange(&start, &length);
    }
    Log* log = nullptr;
    std::vector<CMTimeRange> ranges;
    bool followsZoom = false;
};

// A channel list that shows every channel item of the selected set, one row each in order.
class RecordingList : public TQEditorChannelListView, public TQEditorChannelListController {
public:
    explicit RecordingList(const TQCurveEditorCtrl& ctrl, Log& log) : _ctrl(ctrl), _log(log) {}
    void setAllowsEmptySelection(bool) override {}
    void setAllowsMultipleSelection(bool) override {}
    void deselectAll() override { _log.push_back("deselectAll"); }
    int64_t rowForItem(const TQCurveEditorItem* item) const override {
        const TQCurveSetPtr& set = _ctrl.selectedCurveSet();
        for (uint32_t i = 0; set && i < set->numberOfChannelItems(); ++i)
            if (set->channeItemAtIndex(i).get() == item) return i;
        return -1;
    }
    CGRect rectOfRow(int64_t row) const override { return CGRectMake(0, 20.0 * row, 300, 20); }
    CGRect frameOfCellAtColumn(int64_t column, int64_t row) const override {
        return CGRectMake(100.0 * column, 20.0 * row, 100, 20);
    }
    void selectRowIndexes(const std::vector<int64_t>& rows, bool extend) override {
        for (int64_t row : rows)
            _log.push_back("select row " + std::to_string(row) + (extend ? "+" : ""));
    }
    void setNeedsDisplay() override {}
    void setNeedsDisplayInRect(const CGRect& rect) override {
        _log.push_back("redraw row " + std::to_string(static_cast<int>(rect.origin.y / 20)));
    }
    void resetCursorRects() override {}
    void update() override {}
    void refreshRowWithoutTitle(int64_t row) override {
        _log.push_back("refreshRowWithoutTitle " + std::to_string(row));
    }

private:
    const TQCurveEditorCtrl& _ctrl;
    Log& _log;
};

// Where the host shows the scroller; it records the replacement.
class Superview : public RWControlSuperview {
public:
    void replaceSubview(RWControl& control,
                        const std::shared_ptr<RWControl>& replacement) override {
        control.setSuperview(nullptr);
        replacement->setSuperview(this);
        shown = replacement;
    }
    RWControlPtr shown;
};

class EditorFixture : public ::testing::Test {
protected:
    // Override to leave controls out or connect a list before setupController.
    virtual void connect(TQCurveEditorOutlets& outlets) { (void)outlets; }

    void SetUp() override {
        RWInstallServices({.modal = &modal, .pasteboard = &board});
        TQHostLoadSampleScene(host, family());
        recorder.forwardTo(&host);
        recorder.log = &log;
        view.log = &log;
        ctrl.log = &log;
        view.setViewHost(&viewHost);
        view.setClock(&clock);
        view.setTimer(&timer);
        const CMTimeRange range = host.displayRange();
        view.setTotalRange(&range.start, &range.duration);

        ctrl.init();
        ctrl.setAppDelegate(&recorder);
        ctrl.setView(&view);
        TQCurveEditorOutlets outlets;
        outlets.verticalScroller = wired<RWZoomScroller>(ctrl, "verticalZoomScroll:");
        outlets.verticalScroller->setSuperview(&superview);
        outlets.tools = wired<RWSegmentedControl>(ctrl, "setCurrentTool:");
        outlets.curveSetsPopUp = std::make_shared<RWPopUpButton>();
        connect(outlets);
        ctrl.connectOutlets(outlets);
        ctrl.setupController();
        ctrl.viewDidLoad();
        host.addNotificationReceiver(&ctrl);
        view.drawProjection();
        recorder.clearCalls();
        log.clear();
    }
    void TearDown() override {
        host.removeNotificationReceiver(&ctrl);
        view.setViewHost(nullptr);
        RWResetServices();
    }
    virtual TQHostObjectFamily family() const { return TQHostObjectFamily::Kestrel; }

    TQChannelObjectRootBase* object(const char* name) { return host.scene().objectNamed(name); }
    // An object's channel by its path, or by the family's path of a property.
    TQChannel* channel(const char* objectName, const std::string& path) {
        return dynamic_cast<TQChannel*>(TQChannelRef(path).getChannel(object(objectName)));
    }
    TQChannel* channel(const char* objectName, TQHostProperty property, size_t axis = 0) {
        return channel(objectName, TQHostPropertyPaths(family(), property)[axis]);
    }
    // The channels a set shows, in order; those of the selected set.
    static std::vector<const TQChannelBase*> channelsOf(const TQCurveSet& set) {
        std::vector<const TQChannelBase*> out;
        for (const TQCurveEditorItemPtr& item : set.allItems()) out.push_back(item->channelBase());
        return out;
    }
    std::vector<const TQChannelBase*> shownChannels() const {
        const TQCurveSetPtr& set = ctrl.selectedCurveSet();
        return set ? channelsOf(*set) : std::vector<const TQChannelBase*>{};
    }
    // The keypoints of the channel at those times (every one when none are given), selected in
    // the view alone.
    void selectKeypoints(TQChannel* c, std::initializer_list<double> times = {}) {
        std::vector<TQKeyframeHandle> keys;
        for (double t : times) keys.push_back(c->getKeyframe(sec(t)));
        selectHandles(c, times.size() ? keys : c->getKeyframes(false));
    }
    void selectHandles(TQChannel* c, const std::vector<TQKeyframeHandle>& keys) {
        const TQCurveEditorItemPtr item = ctrl.selectedCurveSet()->itemWithChannel(c);
        ASSERT_TRUE(item) << c->getName() << " is not shown";
        view.getSelection()->reset();
        for (TQKeyframeHandle h : keys) {
            auto entry = std::make_shared<TQCurveSelection>();
            entry->setHandle(h);
            entry->setFlags(TQSelectionKeypoint);
            entry->setCurveId(item->channelId());
            view.getSelection()->addSelection(entry);
        }
    }
    // The pop-up's item of that title, chosen as the user chooses it.
    void choose(const std::string& title) {
        ctrl.curveSetsPopUp()->userWillPopUp();
        const int64_t index = ctrl.curveSetsPopUp()->menu()->indexOfItemWithTitle(title);
        ASSERT_GE(index, 0) << "no item " << title;
        ctrl.curveSetsPopUp()->userSelectItemAtIndex(index);
    }

    RWScriptedModal modal;
    RWMemoryPasteboard board;
    TQHostAppDelegate host;
    Log log;
    LoggingRecorder recorder;
    RWStubViewHost viewHost{800.0, 400.0, 1.0};
    RWManualClock clock;
    RWManualTimer timer{clock};
    Superview superview;
    // Declared after the host and the view host, so that it goes first.
    LoggingView view;
    LoggingCtrl ctrl;
};

}  // namespace editor_test
