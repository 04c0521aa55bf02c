#pragma once
// A table view as a model: the rows of a data source in columns, a selection of rows, the
// edit of a cell, and rows dragged within the table and dropped between rows. No toolkit is
// involved: core code and its tests drive it through the user... entries; the adapter in qt/
// shows it in a table widget and calls the same entries for the user's clicks, edits and drags.
//
// The table caches nothing but the row count of the last reloadData: a data source that
// changes its rows calls reloadData, and the adapter shows the rows again then.
//
// Dragging rows. A drag starts when the data source writes the rows to the drag pasteboard
// (writeRows answering true); it can only land on a table that registered one of the types
// the pasteboard then holds. Over a row, validateDrop may retarget the drop (setDropRow) and
// answers the operation it would perform, none refusing it; acceptDrop performs it. A drag
// released outside any table ends with nothing performed.
//
// Everything runs on the main thread. The data source and delegate are not owned and must
// outlive the table, or clear themselves from it first; so must observers.

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "platform/ui/RWCell.h"
#include "platform/ui/RWControl.h"
#include "platform/ui/RWIndexSet.h"
#include "platform/ui/RWObserverList.h"
#include "platform/ui/RWOutlineView.h"
#include "platform/ui/RWServices.h"

class RWTableView;

// Where a drop lands: on a row, or in the gap above it (the row past the last for the end).
enum class RWTableViewDropOperation : int64_t { On = 0, Above = 1 };

// What a drag brings to the table under it.
class RWDraggingInfo {
public:
    RWDraggingInfo(RWPasteboard& pasteboard, RWTableView* source)
        : _pasteboard(pasteboard), _source(source) {}
    RWPasteboard& draggingPasteboard() const { return _pasteboard; }
    // The table the rows come from; null for a drag from elsewhere.
    RWTableView* draggingSource() const { return _source; }

private:
    RWPasteboard& _pasteboard;
    RWTableView* _source;
};

class RWTableViewDataSource {
public:
    virtual ~RWTableViewDataSource() = default;
    virtual int64_t numberOfRowsInTableView(RWTableView& table) = 0;
    virtual RWObjectValue objectValueForTableColumn(RWTableView& table, const RWTableColumn& column,
                                                    int64_t row) = 0;
    // The user changed a cell: the text typed into it, or a check box's new state.
    virtual void setObjectValue(RWTableView& table, const RWObjectValue& value,
                                const RWTableColumn& column, int64_t row) {
        (void)table, (void)value, (void)column, (void)row;
    }
    // The user began to drag the rows: true to let the drag go, after writing the pasteboard.
    virtual bool writeRows(RWTableView& table, const std::vector<int64_t>& rows,
                           RWPasteboard& pasteboard) {
        (void)table, (void)rows, (void)pasteboard;
        return false;
    }
    virtual uint64_t validateDrop(RWTableView& table, RWDraggingInfo& info, int64_t row,
                                  RWTableViewDropOperation operation) {
        (void)table, (void)info, (void)row, (void)operation;
        return RWDragOperationNone;
    }
    virtual bool acceptDrop(RWTableView& table, RWDraggingInfo& info, int64_t row,
                            RWTableViewDropOperation operation) {
        (void)table, (void)info, (void)row, (void)operation;
        return false;
    }
};

class RWTableViewDelegate {
public:
    virtual ~RWTableViewDelegate() = default;
    // The column's cell holds the row's object value; the delegate may set it up further.
    virtual void willDisplayCell(RWTableView& table, RWCell& cell, const RWTableColumn& column,
                                 int64_t row) {
        (void)table, (void)cell, (void)column, (void)row;
    }
    // After every change of the selected rows, the program's as well as the user's.
    virtual void selectionDidChange(RWTableView& table) { (void)table; }
};

// What the adapter hears, beside controlDidChange (columns and settings).
class RWTableViewObserver {
public:
    virtual ~RWTableViewObserver() = default;
    // Before a reload: an edit the adapter holds open is to end now (userEndEditing), so
    // that the reload sees its text, as a reload ends the toolkit's edits.
    virtual void tableWillReload(RWTableView&) {}
    virtual void tableDidReload(RWTableView&) {}
    virtual void tableDidChangeSelection(RWTableView&) {}
    virtual void tableScrollRowToVisible(RWTableView&, int64_t /*row*/) {}
    // The edit in progress is dropped: the adapter closes its editor without handing it over.
    virtual void tableDidAbortEditing(RWTableView&) {}
};

class RWTableView : public RWControl {
public:
    RWTableView() = default;
    ~RWTableView() override = default;

    // ---- Data source and delegate (not owned) ----
    RWTableViewDataSource* dataSource() const { return _dataSource; }
    void setDataSource(RWTableViewDataSource* dataSource) { _dataSource = dataSource; }
    RWTableViewDelegate* tableDelegate() const { return _delegate; }
    void setTableDelegate(RWTableViewDelegate* delegate) { _delegate = delegate; }

    // ---- Columns ----
    void addTableColumn(const RWTableColumnPtr& column);
    const std::vector<RWTableColumnPtr>& tableColumns() const { return _columns; }
    int64_t numberOfColumns() const { return static_cast<int64_t>(_columns.size()); }
    // -1 when no column has that identifier.
    int64_t columnWithIdentifier(const std::string& identifier) const;
    // Null out of range.
    RWTableColumn* tableColumnAt(int64_t column) const;

    // ---- Rows ----
    // The row count of the last reload.
    int64_t numberOfRows() const { return _rows; }
    // Ends an edit in progress, asks the row count again, drops selected rows past the end.
    void reloadData();
    // The column's cell holding the row's value as the delegate set it up; null for a cell
    // out of range or a column without a cell. Valid until the next call.
    RWCell* preparedCellAtColumn(int64_t column, int64_t row);

    // ---- Selection ----
    bool allowsEmptySelection() const { return _allowsEmptySelection; }
    void setAllowsEmptySelection(bool allows) { _allowsEmptySelection = allows; }
    // Off at first: a selection of several rows keeps the last.
    bool allowsMultipleSelection() const { return _allowsMultipleSelection; }
    void setAllowsMultipleSelection(bool allows) { _allowsMultipleSelection = allows; }
    const RWIndexSet& selectedRowIndexes() const { return _selection; }
    // The last selected row, -1 when none.
    int64_t selectedRow() const;
    // Rows out of range are left out.
    void selectRowIndexes(const RWIndexSet& rows, bool byExtendingSelection);
    void deselectAll();
    void scrollRowToVisible(int64_t row);
    int64_t focusRingType() const { return _focusRingType; }
    void setFocusRingType(int64_t type) { _focusRingType = type; }

    // ---- Dragging ----
    void registerForDraggedTypes(const std::vector<std::string>& types) { _dragTypes = types; }
    const std::vector<std::string>& registeredDraggedTypes() const { return _dragTypes; }
    // What a drag from this table offers a destination in the same application.
    virtual uint64_t draggingSourceOperationMaskForLocal(bool local) const {
        return local ? RWDragOperationMove : RWDragOperationNone;
    }
    // What this table answers a drag entering it before any row is asked.
    virtual uint64_t draggingEntered(const RWDraggingInfo& info) {
        (void)info;
        return RWDragOperationGeneric;
    }
    // Called by validateDrop of the data source: where the drop goes instead.
    void setDropRow(int64_t row, RWTableViewDropOperation operation);
    bool isDragging() const { return _dragging; }
    // The types on the pasteboard of the drag in progress (empty when none).
    std::vector<std::string> draggedTypes() const;

    // ---- First responder ----
    virtual bool acceptsFirstResponder() const { return true; }
    // The delete key on the table (not in an edit); nothing unless a subclass says otherwise.
    virtual void delete_(RWActionSender* sender) { (void)sender; }

    // ---- The user ----
    void userSelectRows(const RWIndexSet& rows);
    // Starts the edit of a cell, for the adapter to show an editor. False for a cell out of
    // range or a column that is not editable.
    bool editColumn(int64_t column, int64_t row);
    std::optional<std::pair<int64_t, int64_t>> editedCell() const { return _edited; }
    // The user ended the edit with this text: the data source takes it, unless cancelled.
    // Nothing without an edit in progress.
    void userEndEditing(const std::string& text, bool cancelled = false);
    // Drops the edit in progress, whatever its editor holds.
    void abortEditing();
    // A check box clicked, or any value the adapter's editor produced, for a cell.
    void userSetObjectValue(int64_t column, int64_t row, const RWObjectValue& value);
    // Begins a drag of the rows; answers whether one started.
    bool userBeginDragRows(const RWIndexSet& rows);
    // The dragged rows released over this table at `row` (the gap above it; the count for
    // the end). Answers whether a drop was performed. Ends the drag.
    bool userDropAtRow(int64_t row);
    // The drag released where no table takes it.
    void userEndDrag();

    void addTableObserver(RWTableViewObserver* observer) { _observers.add(observer); }
    void removeTableObserver(RWTableViewObserver* observer) { _observers.remove(observer); }

private:
    void selectionChanged();
    bool acceptsDraggedTypes() const;

    RWTableViewDataSource* _dataSource = nullptr;  // not owned
    RWTableViewDelegate* _delegate = nullptr;      // not owned
    std::vector<RWTableColumnPtr> _columns;
    int64_t _rows = 0;
    RWIndexSet _selection;
    bool _allowsEmptySelection = true;
    bool _allowsMultipleSelection = false;
    int64_t _focusRingType = 0;
    std::optional<std::pair<int64_t, int64_t>> _edited;
    std::vector<std::string> _dragTypes;
    RWMemoryPasteboard _dragPasteboard;
    bool _dragging = false;
    int64_t _dropRow = -1;
    RWTableViewDropOperation _dropOperation = RWTableViewDropOperation::Above;
    RWObserverList<RWTableViewObserver> _observers;
};
