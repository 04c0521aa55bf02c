#pragma once
// The channel list beside the full editor of the editor fixture, wired as a host wires it:
// the list with its controller and every column, as the editor's channel outlets.
// Helpers find rows by name and press at the middle of a cell, as a user does.

#include <string>
#include <vector>

#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/tests/EditorFixture.h"

namespace channellist_test {

using Ctrl = TQCurveEditorListController;

class ChannelListTest : public editor_test::EditorFixture {
protected:
    void connect(TQCurveEditorOutlets& outlets) override {
        list.addStandardColumns();
        controller.setMainCurveEditorController(&ctrl);
        controller.setOutlineView(&list);
        list.setCurveListController(&controller);
        controller.awakeFromNib();
        outlets.channels = &list;
        outlets.channelsList = &controller;
    }
    void SetUp() override {
        EditorFixture::SetUp();
        list.setVisibleRect(CGRectMake(0, 0, list.bounds().size.width, 400));
        ctrl.updateUI();
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

    TQCurveEditorChannelList list;
    Ctrl controller;
};

}  // namespace channellist_test
