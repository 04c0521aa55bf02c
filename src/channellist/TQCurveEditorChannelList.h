#pragma once
// The outline of channels beside the curves. Its own logic is how a press is routed by column
// and modifier, how the parts of a status cell are tracked while the pointer hovers, and how a
// channel dragged out of the list leaves the curve set. Its rows, values and the selection's
// meaning come from its controller (TQCurveEditorListController), its data source and
// delegate.
//
// A press, by the column under the pointer:
//   "Key"    the status cell tracks it (its row selected first, unless already selected)
//   "Show"   with Option: that row alone is shown (solo) and selected; among two or more
//            selected rows without Shift: every selected row takes the opposite of the
//            clicked row's state; otherwise the check box of that row
//   "Name"   with Control: as a right press; any press forgets the keypoint selection
//   "Menu"   as a right press: the menu cell opens its menu
//   "Value"  Shift is ignored (the row is selected alone); the cell scrubs or is typed into
//   other    the outline's own handling
//
// Hover. Each visible row has tracking areas: part 0 outside the "Key" cell, parts 1, 2, 3 the
// thirds of the "Key" cell (previous, the right third add or delete, the middle next). The
// controller keeps the row and part under the pointer for the status cells, and the list
// shows the part's tip.
//
// The list implements what the editor asks of its channel list (TQEditorChannelListView). The
// controller is not owned.

#include <cstdint>
#include <vector>

#include "platform/ui/RWOutlineView.h"
#include "src/editor/TQCurveEditorListOutlets.h"

class TQCurveEditorListController;

class TQCurveEditorChannelList : public RWOutlineView, public TQEditorChannelListView {
public:
    // The parts of a row that hovering distinguishes, and the width of one third of the "Key"
    // cell.
    static constexpr int64_t kPartOutside = 0;
    static constexpr int64_t kPartPrevious = 1;
    static constexpr int64_t kPartAddOrDelete = 2;
    static constexpr int64_t kPartNext = 3;
    static constexpr double kPartWidth = 18.0;
    // Options of the tracking areas: entry and exit, while the application is active.
    static constexpr uint64_t kTrackingOptions = 0x41;

    TQCurveEditorChannelList();

    // The five columns of the editor's list, at their widths: "Name" (the outline column),
    // "Value", "Show", "Key", "Menu". What the list's interface file holds.
    void addStandardColumns();

    TQCurveEditorListController* curveListController() const { return _curveListController; }
    void setCurveListController(TQCurveEditorListController* controller) {
        _curveListController = controller;
    }

    // While set, redraw requests are dropped (a cell updated while the list draws).
    bool ignoreSetNeedsDisplay() const { return _ignoreSetNeedsDisplay; }
    void setIgnoreSetNeedsDisplay(bool ignore) { _ignoreSetNeedsDisplay = ignore; }
    // Raises the flag for a scope and puts back what was there; nothing for a null list.
    class IgnoreNeedsDisplay {
    public:
        explicit IgnoreNeedsDisplay(TQCurveEditorChannelList* list)
            : _list(list), _was(list && list->ignoreSetNeedsDisplay()) {
            if (_list) _list->setIgnoreSetNeedsDisplay(true);
        }
        ~IgnoreNeedsDisplay() {
            if (_list) _list->setIgnoreSetNeedsDisplay(_was);
        }
        IgnoreNeedsDisplay(const IgnoreNeedsDisplay&) = delete;
        IgnoreNeedsDisplay& operator=(const IgnoreNeedsDisplay&) = delete;

    private:
        TQCurveEditorChannelList* _list;
        bool _was;
    };

    // ---- Events ----
    void mouseDown(const RWEvent& event) override;
    void rightMouseDown(const RWEvent& event) override;
    void mouseUp(const RWEvent& event) override;
    void updateTrackingAreas() override;
    void mouseEntered(const RWEvent& event, const RWTrackingArea& area) override;
    void mouseExited(const RWEvent& event, const RWTrackingArea& area) override;
    // The left and right arrows and Page Up and Down run the application's command for the
    // key when one is bound; the list does not consume them then.
    void keyDown(const RWEvent& event) override;
    // Return ends the edit without moving to the next row, and the list keeps the keyboard.
    void textDidEndEditing(int64_t movement, const std::string& text) override;

    // ---- Dragging a row out ----
    bool canDragRowsWithIndexes(const RWIndexSet& rows, const CGPoint& point) override;
    // The rows can only be dropped away (deleted), wherever they go.
    uint64_t draggingSourceOperationMaskForLocal(bool isLocal) override;
    // Nothing slides back: a row dropped outside is gone.
    void dragImage(const RWIndexSet& rows, const RWEvent& event, bool slideBack) override;
    // Dropped outside the list where nothing took it: the selected channels leave a set that
    // takes changes by hand, with the vanishing effect at the pointer.
    void draggedImageEndedAt(const CGPoint& pointInWindow, uint64_t operation) override;

    // ---- TQEditorChannelListView, and the outline's own forms ----
    using RWOutlineView::rowForItem;
    using RWOutlineView::selectRowIndexes;
    void setAllowsEmptySelection(bool allows) override {
        RWOutlineView::setAllowsEmptySelection(allows);
    }
    void setAllowsMultipleSelection(bool allows) override {
        RWOutlineView::setAllowsMultipleSelection(allows);
    }
    void deselectAll() override { RWOutlineView::deselectAll(); }
    int64_t rowForItem(const TQCurveEditorItem* item) const override {
        return RWOutlineView::rowForItem(static_cast<const void*>(item));
    }
    CGRect rectOfRow(int64_t row) const override { return RWOutlineView::rectOfRow(row); }
    CGRect frameOfCellAtColumn(int64_t column, int64_t row) const override {
        return RWOutlineView::frameOfCellAtColumn(column, row);
    }
    void selectRowIndexes(const std::vector<int64_t>& rows, bool byExtendingSelection) override {
        RWOutlineView::selectRowIndexes(RWIndexSet::fromVector(rows), byExtendingSelection);
    }
    void setNeedsDisplay() override;
    void setNeedsDisplayInRect(const CGRect& rect) override;
    void resetCursorRects() override { updateTrackingAreas(); }

private:
    // The "Key" column's press: the status cell tracks it.
    void statusCellPress(const RWEvent& event, int64_t column, int64_t row, RWIndexSet rows);
    // The "Show" column's press among several selected rows.
    void groupToggle(int64_t row, RWIndexSet rows);
    // The identifier of the column at a point ("" for none).
    std::string columnIdentifierAtPoint(const CGPoint& point) const;

    TQCurveEditorListController* _curveListController = nullptr;  // not owned
    std::vector<uint64_t> _pTrackingAreas;
    bool _ignoreSetNeedsDisplay = false;
};
