#include "platform/ui/RWTableView.h"

#include <algorithm>

void RWTableView::addTableColumn(const RWTableColumnPtr& column) {
    if (!column) return;
    _columns.push_back(column);
    changed();
}

int64_t RWTableView::columnWithIdentifier(const std::string& identifier) const {
    for (size_t i = 0; i < _columns.size(); ++i)
        if (_columns[i]->identifier() == identifier) return static_cast<int64_t>(i);
    return -1;
}

RWTableColumn* RWTableView::tableColumnAt(int64_t column) const {
    if (column < 0 || column >= numberOfColumns()) return nullptr;
    return _columns[static_cast<size_t>(column)].get();
}

// ---- Rows ------------------------------------------------------------------------------------

void RWTableView::reloadData() {
    _observers.forEach([&](RWTableViewObserver& o) { o.tableWillReload(*this); });
    // An edit the adapter did not end has nothing to hand over: it is dropped.
    _edited.reset();
    _rows = _dataSource ? std::max<int64_t>(0, _dataSource->numberOfRowsInTableView(*this)) : 0;
    RWIndexSet kept = _selection;
    kept.removeIndexesFrom(_rows);
    const bool selectionMoved = !(kept == _selection);
    _selection = kept;
    _observers.forEach([&](RWTableViewObserver& o) { o.tableDidReload(*this); });
    if (selectionMoved) selectionChanged();
}

RWCell* RWTableView::preparedCellAtColumn(int64_t column, int64_t row) {
    RWTableColumn* tableColumn = tableColumnAt(column);
    if (!tableColumn || row < 0 || row >= _rows || !_dataSource) return nullptr;
    const RWCellPtr cell = tableColumn->dataCellForRow(row);
    if (!cell) return nullptr;
    cell->setObjectValue(_dataSource->objectValueForTableColumn(*this, *tableColumn, row));
    if (_delegate) _delegate->willDisplayCell(*this, *cell, *tableColumn, row);
    return cell.get();
}

// ---- Selection -------------------------------------------------------------------------------

int64_t RWTableView::selectedRow() const { return _selection.lastIndex(); }

void RWTableView::selectRowIndexes(const RWIndexSet& rows, bool byExtendingSelection) {
    RWIndexSet next = byExtendingSelection ? _selection : RWIndexSet();
    for (int64_t row : rows)
        if (row < _rows) next.addIndex(row);
    if (!_allowsMultipleSelection && next.count() > 1) next = RWIndexSet{next.lastIndex()};
    if (next == _selection) return;
    _selection = next;
    selectionChanged();
}

void RWTableView::deselectAll() {
    if (_selection.empty()) return;
    _selection = RWIndexSet();
    selectionChanged();
}

void RWTableView::scrollRowToVisible(int64_t row) {
    if (row < 0 || row >= _rows) return;
    _observers.forEach([&](RWTableViewObserver& o) { o.tableScrollRowToVisible(*this, row); });
}

void RWTableView::selectionChanged() {
    _observers.forEach([&](RWTableViewObserver& o) { o.tableDidChangeSelection(*this); });
    if (_delegate) _delegate->selectionDidChange(*this);
}

// ---- Dragging --------------------------------------------------------------------------------

void RWTableView::setDropRow(int64_t row, RWTableViewDropOperation operation) {
    _dropRow = row;
    _dropOperation = operation;
}

std::vector<std::string> RWTableView::draggedTypes() const {
    return _dragging ? _dragPasteboard.types() : std::vector<std::string>{};
}

bool RWTableView::acceptsDraggedTypes() const {
    for (const std::string& type : _dragPasteboard.types())
        if (std::find(_dragTypes.begin(), _dragTypes.end(), type) != _dragTypes.end()) return true;
    return false;
}

// ---- The user --------------------------------------------------------------------------------

void RWTableView::userSelectRows(const RWIndexSet& rows) {
    if (rows.empty() && !_allowsEmptySelection) return;
    selectRowIndexes(rows, false);
}

bool RWTableView::editColumn(int64_t column, int64_t row) {
    const RWTableColumn* tableColumn = tableColumnAt(column);
    if (!tableColumn || !tableColumn->isEditable() || row < 0 || row >= _rows) return false;
    _edited = std::make_pair(column, row);
    return true;
}

void RWTableView::userEndEditing(const std::string& text, bool cancelled) {
    if (!_edited) return;
    const auto [column, row] = *_edited;
    _edited.reset();
    if (!cancelled) userSetObjectValue(column, row, RWObjectValue(text));
}

void RWTableView::abortEditing() {
    if (!_edited) return;
    _edited.reset();
    _observers.forEach([&](RWTableViewObserver& o) { o.tableDidAbortEditing(*this); });
}

void RWTableView::userSetObjectValue(int64_t column, int64_t row, const RWObjectValue& value) {
    const RWTableColumn* tableColumn = tableColumnAt(column);
    if (!tableColumn || !tableColumn->isEditable() || !_dataSource || row < 0 || row >= _rows)
        return;
    _dataSource->setObjectValue(*this, value, *tableColumn, row);
}

bool RWTableView::userBeginDragRows(const RWIndexSet& rows) {
    _dragging = false;
    if (!_dataSource || rows.empty() ||
        draggingSourceOperationMaskForLocal(true) == RWDragOperationNone)
        return false;
    _dragPasteboard.clearContents();
    _dragging = _dataSource->writeRows(*this, rows.indexes(), _dragPasteboard);
    return _dragging;
}

bool RWTableView::userDropAtRow(int64_t row) {
    if (!_dragging) return false;
    _dragging = false;
    if (!_dataSource || !acceptsDraggedTypes()) return false;
    RWDraggingInfo info(_dragPasteboard, this);
    if (draggingEntered(info) == RWDragOperationNone) return false;
    const int64_t proposed = std::clamp<int64_t>(row, 0, _rows);
    setDropRow(proposed, RWTableViewDropOperation::Above);
    if (_dataSource->validateDrop(*this, info, proposed, RWTableViewDropOperation::Above) ==
        RWDragOperationNone)
        return false;
    return _dataSource->acceptDrop(*this, info, _dropRow, _dropOperation);
}

void RWTableView::userEndDrag() { _dragging = false; }
