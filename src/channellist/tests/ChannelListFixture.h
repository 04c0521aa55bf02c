#pragma once
// The channel list beside the full editor on the sample project, wired as a host wires it:
// the reference host, the editor with its view, the list with its controller, every column.
// Helpers find rows by name and press at the middle of a cell, as a user does.

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

namespace channellist_test {

using Ctrl = TQCurveEditorListController;

class ChannelListTest : public ::testing::Test {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
        view.setViewHost(&viewHost);
        const CMTimeRange range = host.displayRange();
        view.setTotalRange(&range.start, &range.duration);
        list.addStandardColumns();
        controller.setMainCurveEditorController(&ctrl);
        controller.setOutlineView(&list);
        list.setCurveListController(&controller);
        controller.awakeFromNib();
        ctrl.init();
        ctrl.setAppDelegate(&host);
        ctrl.setView(&view);
        TQCurveEditorOutlets outlets;
        outlets.curveSetsPopUp = std::make_shared<RWPopUpButton>();
        outlets.channels = &list;
        outlets.channelsList = &controller;
        ctrl.connectOutlets(outlets);
        ctrl.setupController();
        ctrl.viewDidLoad();
        host.addNotificationReceiver(&ctrl);
        list.setVisibleRect(CGRectMake(0, 0, list.bounds().size.width, 400));
        ctrl.updateUI();
    }
    void TearDown() override {
        host.removeNotificationReceiver(&ctrl);
        view.setViewHost(nullptr);
    }

    // The row of the first channel item whose name holds `name`, -1 when the list shows none.
    int64_t rowOf(const std::string& name) {
        for (int64_t row = 0; row < list.numberOfRows(); ++row) {
            auto* item = Ctrl::editorItem(list.itemAtRow(row));
            if (item && dynamic_cast<TQCurveEditorChannelItem*>(item) &&
                item->simpleName().find(name) != std::string::npos)
                return row;
        }
        return -1;
    }
    TQCurveEditorItem* itemAt(int64_t row) { return Ctrl::editorItem(list.itemAtRow(row)); }
    // A window point in the middle of a cell (a little right of its left edge for Name).
    CGPoint at(const char* column, int64_t row) {
        const CGRect f = list.frameOfCellAtColumn(list.columnWithIdentifier(column), row);
        return list.convertPointToWindow(
            CGPointMake(f.origin.x + f.size.width / 2, f.origin.y + f.size.height / 2));
    }
    // A press at `from`, dragged through `via`, released at `to`.
    void press(CGPoint from, CGPoint to, std::initializer_list<CGPoint> via = {},
               uint64_t flags = 0) {
        list.mouseDown(RWEvent::mouseEvent(RWEventType::LeftMouseDown, from, flags));
        for (const CGPoint& p : via)
            list.mouseDragged(RWEvent::mouseEvent(RWEventType::LeftMouseDragged, p));
        list.mouseUp(RWEvent::mouseEvent(RWEventType::LeftMouseUp, to, flags));
    }
    void click(const char* column, int64_t row, uint64_t flags = 0) {
        press(at(column, row), at(column, row), {}, flags);
    }
    void moveTo(const CGPoint& point) {
        list.mouseMoved(RWEvent::mouseEvent(RWEventType::MouseMoved, point));
    }
    std::vector<std::string> selectedNames() const {
        std::vector<std::string> names;
        for (const TQCurveEditorItemPtr& item : ctrl.selectedCurveSet()->selectedItems())
            names.push_back(item->simpleName());
        return names;
    }

    TQHostAppDelegate host;
    RWStubViewHost viewHost{800.0, 400.0, 1.0};
    TQCurveEditorView view;
    TQCurveEditorCtrl ctrl;
    TQCurveEditorChannelList list;
    Ctrl controller;
};

}  // namespace channellist_test
