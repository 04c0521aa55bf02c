#pragma once
// The table of the curve set manager panel: one row for each custom set of its controller,
// which is the table's data source and delegate. Rows are reordered by dragging them within
// the table (the private drag type of the controller) and removed by the delete key.
//
// The controller is not owned; it outlives the table or clears itself (setController with
// null) first.

#include <cstdint>

#include "platform/ui/RWTableView.h"

class TQCurveEditorCtrl;

class TQCurveSetManagerList : public RWTableView {
public:
    TQCurveSetManagerList() = default;

    TQCurveEditorCtrl* controller() const { return _mainCurveEditorController; }
    void setController(TQCurveEditorCtrl* controller) { _mainCurveEditorController = controller; }
    // The controller as data source and delegate both.
    void setDelegate(TQCurveEditorCtrl* delegate);

    bool acceptsFirstResponder() const override { return true; }
    // Drags offer a copy, and a drag over the table is taken as one: the rows only move.
    uint64_t draggingSourceOperationMaskForLocal(bool) const override {
        return RWDragOperationCopy;
    }
    uint64_t draggingEntered(const RWDraggingInfo&) override { return RWDragOperationCopy; }

    // The delete key: the selected row's set leaves the controller's list straight away. The
    // row above is selected then; deleting row 0 asks for one far past the end, which selects
    // nothing. Unlike the panel's remove button, an emptied list leaves the shown set alone.
    void delete_(RWActionSender* sender = nullptr) override;

private:
    TQCurveEditorCtrl* _mainCurveEditorController = nullptr;  // not owned
};
