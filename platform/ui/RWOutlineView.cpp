#include "platform/ui/RWOutlineView.h"

#include <algorithm>
#include <cmath>

#include "platform/ui/RWCommandsController.h"

namespace {

// Characters of the keys the outline moves by.
constexpr uint32_t kUpArrow = 0xF700;
constexpr uint32_t kDownArrow = 0xF701;
constexpr uint32_t kLeftArrow = 0xF702;
constexpr uint32_t kRightArrow = 0xF703;

}  // namespace

RWOutlineView::RWOutlineView() = default;

RWOutlineView::~RWOutlineView() = default;

// ---- Columns --------------------------------------------------------------------------------

void RWOutlineView::addTableColumn(const RWTableColumnPtr& column) {
    if (!column) return;
    _columns.push_back(column);
    if (!_outlineColumn) _outlineColumn = column.get();
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidChangeColumns(*this); });
    updateTrackingAreas();
}

void RWOutlineView::removeTableColumn(const RWTableColumn* column) {
    std::erase_if(_columns, [&](const RWTableColumnPtr& c) { return c.get() == column; });
    if (_outlineColumn == column) _outlineColumn = _columns.empty() ? nullptr : _columns[0].get();
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidChangeColumns(*this); });
    updateTrackingAreas();
}

int64_t RWOutlineView::columnWithIdentifier(const std::string& identifier) const {
    for (size_t i = 0; i < _columns.size(); ++i)
        if (_columns[i]->identifier() == identifier) return static_cast<int64_t>(i);
    return -1;
}

RWTableColumnPtr RWOutlineView::tableColumnWithIdentifier(const std::string& identifier) const {
    const int64_t i = columnWithIdentifier(identifier);
    return i < 0 ? nullptr : _columns[static_cast<size_t>(i)];
}

void RWOutlineView::setOutlineTableColumn(RWTableColumn* column) { _outlineColumn = column; }

int64_t RWOutlineView::outlineColumnIndex() const {
    for (size_t i = 0; i < _columns.size(); ++i)
        if (_columns[i].get() == _outlineColumn) return static_cast<int64_t>(i);
    return -1;
}

void RWOutlineView::setColumnWidth(int64_t column, double width) {
    if (column < 0 || column >= numberOfColumns()) return;
    RWTableColumn& c = *_columns[static_cast<size_t>(column)];
    c._width = std::max(width, c._minWidth);
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidChangeColumns(*this); });
    updateTrackingAreas();
}

void RWOutlineView::setRowHeight(double height) {
    _rowHeight = std::max(1.0, height);
    setNeedsDisplay();
    updateTrackingAreas();
}

void RWOutlineView::setIndentationPerLevel(double indentation) {
    _indentationPerLevel = std::max(0.0, indentation);
    setNeedsDisplay();
}

// ---- The cached tree ------------------------------------------------------------------------

void RWOutlineView::clearTree() {
    _root._children.clear();
    _root._loaded = false;
    _root._expanded = true;
    _rows.clear();
    _nodes.clear();
}

void RWOutlineView::loadChildren(RWOutlineNode& node) {
    if (node._loaded) return;
    node._loaded = true;
    if (!_dataSource) return;
    const int64_t count =
        std::max<int64_t>(0, _dataSource->numberOfChildrenOfItem(*this, node._item));
    node._children.reserve(static_cast<size_t>(count));
    for (int64_t i = 0; i < count; ++i) {
        auto child = std::make_unique<RWOutlineNode>();
        child->_item = _dataSource->childOfItem(*this, i, node._item);
        child->_parent = &node;
        child->_index = i;
        child->_level = node._level + 1;
        child->_expandable = child->_item && _dataSource->isItemExpandable(*this, child->_item);
        // The first node of an item answers for it, as the first row of it is the one found.
        if (child->_item) _nodes.try_emplace(child->_item.get(), child.get());
        node._children.push_back(std::move(child));
    }
}

void RWOutlineView::appendVisibleRows(RWOutlineNode& node, std::vector<RWOutlineNode*>& out) {
    if (!node._expanded) return;
    loadChildren(node);
    for (const std::unique_ptr<RWOutlineNode>& child : node._children) {
        out.push_back(child.get());
        appendVisibleRows(*child, out);
    }
}

void RWOutlineView::renumberRowsFrom(size_t first) {
    for (size_t i = first; i < _rows.size(); ++i) _rows[i]->_row = static_cast<int64_t>(i);
}

RWOutlineNode* RWOutlineView::findNode(const void* item) const {
    if (!item) return nullptr;
    const auto it = _nodes.find(item);
    return it == _nodes.end() ? nullptr : it->second;
}

void RWOutlineView::reloadData() {
    abortEditing();
    _deferredSelectRow = -1;
    _dragArmed = false;
    // Held through the rebuild, so that no new item can take an old one's address.
    std::vector<RWOutlineItem> expanded;
    for (const auto& [item, node] : _nodes)
        if (node->_expanded) expanded.push_back(node->_item);
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineWillReload(*this); });
    clearTree();
    _hoveredArea = 0;
    // Rows first at the top level, then each item that was expanded and is given again opens
    // (an item deeper down once its parent has).
    appendVisibleRows(_root, _rows);
    for (bool opened = true; opened;) {
        opened = false;
        for (const RWOutlineItem& item : expanded)
            if (RWOutlineNode* node = findNode(item.get());
                node && !node->_expanded && node->_expandable) {
                loadChildren(*node);
                node->_expanded = true;
                opened = true;
            }
    }
    _rows.clear();
    appendVisibleRows(_root, _rows);
    renumberRowsFrom(0);
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidReload(*this); });
    RWIndexSet kept = _selection;
    kept.removeIndexesFrom(numberOfRows());
    setSelection(kept);
    setNeedsDisplay();
    updateTrackingAreas();
}

int64_t RWOutlineView::childCount(const RWOutlineNode& node) {
    auto& n = const_cast<RWOutlineNode&>(node);
    loadChildren(n);
    return static_cast<int64_t>(n._children.size());
}

const RWOutlineNode* RWOutlineView::childNode(const RWOutlineNode& node, int64_t index) {
    auto& n = const_cast<RWOutlineNode&>(node);
    loadChildren(n);
    if (index < 0 || index >= static_cast<int64_t>(n._children.size())) return nullptr;
    return n._children[static_cast<size_t>(index)].get();
}

const RWOutlineNode* RWOutlineView::nodeAtRow(int64_t row) const {
    return row >= 0 && row < numberOfRows() ? _rows[static_cast<size_t>(row)] : nullptr;
}

const RWOutlineNode* RWOutlineView::nodeForItem(const void* item) const { return findNode(item); }

RWOutlineItem RWOutlineView::itemAtRow(int64_t row) const {
    const RWOutlineNode* node = nodeAtRow(row);
    return node ? node->_item : nullptr;
}

int64_t RWOutlineView::rowForItem(const void* item) const {
    const RWOutlineNode* node = findNode(item);
    return node ? node->_row : -1;
}

int64_t RWOutlineView::levelForRow(int64_t row) const {
    const RWOutlineNode* node = nodeAtRow(row);
    return node ? node->_level : -1;
}

int64_t RWOutlineView::levelForItem(const void* item) const {
    const RWOutlineNode* node = findNode(item);
    return node ? node->_level : -1;
}

RWOutlineItem RWOutlineView::parentForItem(const void* item) const {
    const RWOutlineNode* node = findNode(item);
    return node && node->_parent ? node->_parent->_item : nullptr;
}

bool RWOutlineView::isExpandable(const void* item) const {
    const RWOutlineNode* node = findNode(item);
    return node && node->_expandable;
}

bool RWOutlineView::isItemExpanded(const void* item) const {
    const RWOutlineNode* node = findNode(item);
    return node && node->_expanded;
}

bool RWOutlineView::setExpanded(RWOutlineNode& node, bool expanded) {
    if (!node._expandable || node._expanded == expanded) return false;
    const bool shown = node._row >= 0;
    const size_t at = shown ? static_cast<size_t>(node._row) + 1 : 0;
    if (expanded) {
        node._expanded = true;
        if (shown) {
            std::vector<RWOutlineNode*> added;
            appendVisibleRows(node, added);
            _rows.insert(_rows.begin() + static_cast<std::ptrdiff_t>(at), added.begin(),
                         added.end());
            renumberRowsFrom(at);
            RWIndexSet moved = _selection;
            moved.shiftIndexesStartingAtIndex(static_cast<int64_t>(at),
                                              static_cast<int64_t>(added.size()));
            _selection = moved;
            if (_anchorRow >= static_cast<int64_t>(at))
                _anchorRow += static_cast<int64_t>(added.size());
        } else {
            loadChildren(node);
        }
    } else {
        if (shown) {
            size_t end = at;
            while (end < _rows.size() && _rows[end]->_level > node._level) ++end;
            for (size_t i = at; i < end; ++i) _rows[i]->_row = -1;
            const auto removed = static_cast<int64_t>(end - at);
            _rows.erase(_rows.begin() + static_cast<std::ptrdiff_t>(at),
                        _rows.begin() + static_cast<std::ptrdiff_t>(end));
            renumberRowsFrom(at);
            RWIndexSet moved = _selection;
            moved.removeIndexesInRange(static_cast<int64_t>(at), removed);
            moved.shiftIndexesStartingAtIndex(static_cast<int64_t>(at), -removed);
            if (_anchorRow >= static_cast<int64_t>(at))
                _anchorRow = _anchorRow < static_cast<int64_t>(end) ? -1 : _anchorRow - removed;
            node._expanded = false;
            // Rows hidden by the collapse leave the selection: that is a change of it.
            setSelection(moved);
        } else {
            node._expanded = false;
        }
    }
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidChangeExpansion(*this, node); });
    if (_delegate) {
        if (expanded)
            _delegate->itemDidExpand(*this, node._item);
        else
            _delegate->itemDidCollapse(*this, node._item);
    }
    return true;
}

void RWOutlineView::expandItem(const void* item, bool expandChildren) {
    RWOutlineNode* node = findNode(item);
    if (!node) return;
    const RWOutlineItem held = node->_item;
    setExpanded(*node, true);
    if (expandChildren) {
        for (size_t i = 0; i < node->_children.size(); ++i)
            if (node->_children[i]->_expandable) expandItem(node->_children[i]->_item.get(), true);
    }
    setNeedsDisplay();
    updateTrackingAreas();
}

void RWOutlineView::collapseItem(const void* item, bool collapseChildren) {
    RWOutlineNode* node = findNode(item);
    if (!node) return;
    const RWOutlineItem held = node->_item;
    if (collapseChildren)
        for (size_t i = 0; i < node->_children.size(); ++i)
            if (node->_children[i]->_expanded) collapseItem(node->_children[i]->_item.get(), true);
    setExpanded(*node, false);
    setNeedsDisplay();
    updateTrackingAreas();
}

// ---- Selection ------------------------------------------------------------------------------

void RWOutlineView::setSelection(RWIndexSet rows) {
    if (rows == _selection) return;
    _selection = std::move(rows);
    if (_anchorRow >= 0 && !_selection.containsIndex(_anchorRow))
        _anchorRow = _selection.lastIndex();
    setNeedsDisplay();
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidChangeSelection(*this); });
    if (_delegate) _delegate->selectionDidChange(*this);
}

void RWOutlineView::selectRowIndexes(const RWIndexSet& rows, bool byExtendingSelection) {
    RWIndexSet next = byExtendingSelection ? _selection : RWIndexSet();
    for (int64_t row : rows)
        if (row >= 0 && row < numberOfRows()) next.addIndex(row);
    const int64_t last = rows.lastIndex();
    if (last >= 0 && last < numberOfRows()) _anchorRow = last;
    setSelection(std::move(next));
}

void RWOutlineView::deselectRow(int64_t row) {
    RWIndexSet next = _selection;
    next.removeIndex(row);
    setSelection(std::move(next));
}

void RWOutlineView::deselectAll() { setSelection(RWIndexSet()); }

void RWOutlineView::selectAll() {
    if (!_allowsMultipleSelection && numberOfRows() > 1) return;
    setSelection(RWIndexSet::range(0, numberOfRows()));
}

int64_t RWOutlineView::selectedRow() const {
    if (_selection.empty()) return -1;
    return _anchorRow >= 0 ? _anchorRow : _selection.lastIndex();
}

// ---- Geometry -------------------------------------------------------------------------------

double RWOutlineView::columnX(int64_t column) const {
    double x = 0.0;
    for (int64_t i = 0; i < column && i < numberOfColumns(); ++i)
        x += _columns[static_cast<size_t>(i)]->width();
    return x;
}

CGRect RWOutlineView::bounds() const {
    return CGRectMake(0.0, 0.0, columnX(numberOfColumns()),
                      _rowHeight * static_cast<double>(numberOfRows()));
}

void RWOutlineView::setVisibleRect(const CGRect& rect) {
    _visibleRect = rect;
    _visibleRectSet = true;
    updateTrackingAreas();
}

CGRect RWOutlineView::rectOfRow(int64_t row) const {
    if (row < 0 || row >= numberOfRows()) return CGRectZero;
    return CGRectMake(0.0, _rowHeight * static_cast<double>(row), columnX(numberOfColumns()),
                      _rowHeight);
}

CGRect RWOutlineView::rectOfColumn(int64_t column) const {
    if (column < 0 || column >= numberOfColumns()) return CGRectZero;
    return CGRectMake(columnX(column), 0.0, _columns[static_cast<size_t>(column)]->width(),
                      _rowHeight * static_cast<double>(numberOfRows()));
}

CGRect RWOutlineView::frameOfCellAtColumn(int64_t column, int64_t row) const {
    if (column < 0 || column >= numberOfColumns() || row < 0 || row >= numberOfRows())
        return CGRectZero;
    CGRect frame = CGRectMake(columnX(column), _rowHeight * static_cast<double>(row),
                              _columns[static_cast<size_t>(column)]->width(), _rowHeight);
    if (column == outlineColumnIndex()) {
        const double indent =
            std::min(frame.size.width, _indentationPerLevel * (levelForRow(row) + 1.0));
        frame.origin.x += indent;
        frame.size.width -= indent;
    }
    return frame;
}

CGRect RWOutlineView::frameOfOutlineCellAtRow(int64_t row) const {
    const RWOutlineNode* node = nodeAtRow(row);
    const int64_t column = outlineColumnIndex();
    if (!node || !node->_expandable || column < 0) return CGRectZero;
    return CGRectMake(columnX(column) + _indentationPerLevel * node->_level,
                      _rowHeight * static_cast<double>(row), _indentationPerLevel, _rowHeight);
}

int64_t RWOutlineView::columnAtPoint(const CGPoint& point) const {
    if (point.x < 0.0) return -1;
    double x = 0.0;
    for (size_t i = 0; i < _columns.size(); ++i) {
        x += _columns[i]->width();
        if (point.x < x) return static_cast<int64_t>(i);
    }
    return -1;
}

int64_t RWOutlineView::rowAtPoint(const CGPoint& point) const {
    if (point.y < 0.0 || point.x < 0.0 || point.x >= columnX(numberOfColumns())) return -1;
    const auto row = static_cast<int64_t>(std::floor(point.y / _rowHeight));
    return row < numberOfRows() ? row : -1;
}

std::pair<int64_t, int64_t> RWOutlineView::rowsInRect(const CGRect& rect) const {
    if (CGRectIsEmpty(rect) || numberOfRows() == 0) return {0, 0};
    const CGRect r = CGRectStandardize(rect);
    const int64_t first = std::clamp<int64_t>(
        static_cast<int64_t>(std::floor(r.origin.y / _rowHeight)), 0, numberOfRows());
    const int64_t end = std::clamp<int64_t>(
        static_cast<int64_t>(std::ceil((r.origin.y + r.size.height) / _rowHeight)), 0,
        numberOfRows());
    return {first, std::max<int64_t>(0, end - first)};
}

// ---- Window coordinates ---------------------------------------------------------------------

CGPoint RWOutlineView::convertPointFromWindow(const CGPoint& pointInWindow) const {
    const CGPoint local =
        _viewHost ? _viewHost->convertPointFromWindow(pointInWindow) : pointInWindow;
    const CGRect visible = _visibleRectSet ? _visibleRect : bounds();
    return CGPointMake(local.x + visible.origin.x,
                       visible.size.height - local.y + visible.origin.y);
}

CGPoint RWOutlineView::convertPointToWindow(const CGPoint& point) const {
    const CGRect visible = _visibleRectSet ? _visibleRect : bounds();
    const CGPoint local =
        CGPointMake(point.x - visible.origin.x, visible.size.height - (point.y - visible.origin.y));
    if (!_viewHost) return local;
    // The host converts window points to its own; its origin's window point gives the way back.
    const CGPoint origin = _viewHost->convertPointFromWindow(CGPointZero);
    return local - origin;
}

// ---- Cells and display ----------------------------------------------------------------------

RWCell* RWOutlineView::preparedCellAtColumn(int64_t column, int64_t row) {
    if (column < 0 || column >= numberOfColumns() || row < 0 || row >= numberOfRows())
        return nullptr;
    const RWTableColumn& c = *_columns[static_cast<size_t>(column)];
    const RWCellPtr cell = c.dataCellForRow(row);
    if (!cell) return nullptr;
    const RWOutlineItem item = itemAtRow(row);
    cell->setObjectValue(_dataSource ? _dataSource->objectValueForTableColumn(*this, c, item)
                                     : RWObjectValue());
    cell->setHighlighted(false);
    if (_delegate) _delegate->willDisplayCell(*this, *cell, c, item);
    return cell.get();
}

void RWOutlineView::setNeedsDisplay() { setNeedsDisplayInRect(bounds()); }

void RWOutlineView::setNeedsDisplayInRect(const CGRect& rect) {
    if (CGRectIsEmpty(rect)) return;
    _dirty = CGRectUnion(_dirty, rect);
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineNeedsDisplay(*this, rect); });
}

void RWOutlineView::displayIfNeeded(const CellVisitor& draw) {
    const CGRect visible = _visibleRectSet ? _visibleRect : bounds();
    const CGRect dirty = CGRectIntersection(_dirty, visible);
    _dirty = CGRectNull;
    if (CGRectIsNull(dirty) || !draw) return;
    const auto [first, count] = rowsInRect(dirty);
    for (int64_t row = first; row < first + count; ++row)
        for (int64_t column = 0; column < numberOfColumns(); ++column) {
            const CGRect frame = frameOfCellAtColumn(column, row);
            if (!CGRectIntersectsRect(frame, dirty)) continue;
            if (RWCell* cell = preparedCellAtColumn(column, row)) draw(*cell, frame, column, row);
        }
}

// ---- Editing --------------------------------------------------------------------------------

bool RWOutlineView::canEditCell(int64_t column, int64_t row) {
    if (column < 0 || column >= numberOfColumns() || row < 0 || row >= numberOfRows()) return false;
    const RWTableColumn& c = *_columns[static_cast<size_t>(column)];
    const RWCellPtr cell = c.dataCellForRow(row);
    if (!c.isEditable() || !cell || !cell->isEditable()) return false;
    return !_delegate || _delegate->shouldEditTableColumn(*this, c, itemAtRow(row));
}

void RWOutlineView::editColumn(int64_t column, int64_t row, bool select) {
    if (column < 0 || column >= numberOfColumns() || row < 0 || row >= numberOfRows()) return;
    abortEditing();
    if (select) selectRowIndexes({row}, false);
    RWCell* cell = preparedCellAtColumn(column, row);
    if (!cell) return;
    _editing = Editing{column, row, itemAtRow(row), cell->stringValue()};
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidBeginEditing(*this, column, row); });
}

const std::string& RWOutlineView::editingText() const {
    static const std::string none;
    return _editing ? _editing->text : none;
}

void RWOutlineView::userEndEditing(const std::string& text, int64_t movement) {
    if (!_editing) return;
    textDidEndEditing(movement, text);
}

void RWOutlineView::abortEditing() {
    if (!_editing) return;
    _editing.reset();
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidEndEditing(*this); });
}

void RWOutlineView::textDidEndEditing(int64_t movement, const std::string& text) {
    if (!_editing) return;
    const Editing edit = *_editing;
    _editing.reset();
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidEndEditing(*this); });
    if (movement == RWCancelTextMovement) return;
    if (edit.column >= numberOfColumns()) return;
    const RWTableColumnPtr column = _columns[static_cast<size_t>(edit.column)];
    const RWCellPtr cell = column->dataCellForRow(edit.row);
    const RWFormatter* formatter = cell ? cell->formatter() : nullptr;
    if (_dataSource && (!formatter || formatter->getObjectValue(nullptr, text, nullptr)))
        _dataSource->setObjectValue(*this, RWObjectValue(text), *column, edit.item);
    // The row the edit was in, as it is now (the change may have reloaded the rows).
    const int64_t row = rowForItem(edit.item);
    if (row >= 0) setNeedsDisplayInRect(rectOfRow(row));
    if (row < 0) return;
    if (movement == RWReturnTextMovement) {
        if (canEditCell(edit.column, row + 1)) editColumn(edit.column, row + 1, true);
    } else if (movement == RWTabTextMovement || movement == RWBacktabTextMovement) {
        const int64_t step = movement == RWTabTextMovement ? 1 : -1;
        for (int64_t c = edit.column + step; c >= 0 && c < numberOfColumns(); c += step)
            if (canEditCell(c, row)) {
                editColumn(c, row, false);
                return;
            }
    }
}

// ---- Tool tips and tracking areas -------------------------------------------------------

std::optional<std::string> RWOutlineView::toolTipAtPoint(const CGPoint& point) {
    if (_toolTip) return _toolTip;
    const int64_t row = rowAtPoint(point);
    const int64_t column = columnAtPoint(point);
    if (!_delegate || row < 0 || column < 0) return std::nullopt;
    RWCell* cell = preparedCellAtColumn(column, row);
    if (!cell) return std::nullopt;
    return _delegate->toolTipForCell(*this, *cell, frameOfCellAtColumn(column, row),
                                     *_columns[static_cast<size_t>(column)], itemAtRow(row), point);
}

uint64_t RWOutlineView::addTrackingArea(RWTrackingArea area) {
    area.identifier = _nextAreaId++;
    _trackingAreas.push_back(std::move(area));
    return _trackingAreas.back().identifier;
}

void RWOutlineView::removeTrackingArea(uint64_t identifier) {
    std::erase_if(_trackingAreas,
                  [&](const RWTrackingArea& a) { return a.identifier == identifier; });
    // The area under the pointer went with its layout: the next move enters what is there now.
    if (_hoveredArea == identifier) _hoveredArea = 0;
}

void RWOutlineView::removeTrackingAreas(std::vector<uint64_t> identifiers) {
    std::sort(identifiers.begin(), identifiers.end());
    const auto listed = [&](uint64_t identifier) {
        return std::binary_search(identifiers.begin(), identifiers.end(), identifier);
    };
    std::erase_if(_trackingAreas, [&](const RWTrackingArea& a) { return listed(a.identifier); });
    if (listed(_hoveredArea)) _hoveredArea = 0;
}

// ---- Events ---------------------------------------------------------------------------------

void RWOutlineView::makeFirstResponder() {
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineWantsKeyboardFocus(*this); });
}

void RWOutlineView::popUpContextMenu(const RWMenuPtr& menu, const RWEvent& event) {
    if (!menu) return;
    const CGPoint point = event.locationInWindow();
    tellObservers([&](RWOutlineViewObserver& o) { o.outlinePopUpContextMenu(*this, menu, point); });
}

void RWOutlineView::mouseDown(const RWEvent& event) {
    _mouseLocation = event.locationInWindow();
    makeFirstResponder();
    // A press elsewhere ends an edit and keeps what was typed.
    if (_editing) textDidEndEditing(RWOtherTextMovement, _editing->text);
    _deferredSelectRow = -1;
    _dragArmed = false;
    const CGPoint point = convertPointFromWindow(event.locationInWindow());
    _pressPoint = point;
    const int64_t row = rowAtPoint(point);
    const int64_t column = columnAtPoint(point);
    if (row < 0) {
        if (_allowsEmptySelection) deselectAll();
        return;
    }
    const RWOutlineNode* node = nodeAtRow(row);
    if (node->_expandable && CGRectContainsPoint(frameOfOutlineCellAtRow(row), point)) {
        const bool all = (event.modifierFlags() & RWEventModifierFlagOption) != 0;
        if (node->_expanded)
            collapseItem(node->_item.get(), all);
        else
            expandItem(node->_item.get(), all);
        return;
    }
    const uint64_t flags = event.modifierFlags();
    const bool multiple = _allowsMultipleSelection;
    if (!_delegate || _delegate->shouldSelectItem(*this, node->_item)) {
        if ((flags & RWEventModifierFlagCommand) && multiple) {
            if (isRowSelected(row)) {
                if (numberOfSelectedRows() > 1 || _allowsEmptySelection) deselectRow(row);
            } else {
                selectRowIndexes({row}, true);
            }
        } else if ((flags & RWEventModifierFlagShift) && multiple && selectedRow() >= 0) {
            const int64_t anchor = selectedRow();
            const int64_t lo = std::min(anchor, row), hi = std::max(anchor, row);
            RWIndexSet range = RWIndexSet::range(lo, hi - lo + 1);
            RWIndexSet next = _selection;
            for (int64_t r : range) next.addIndex(r);
            setSelection(std::move(next));
        } else if (isRowSelected(row) && numberOfSelectedRows() > 1) {
            // The rows may be dragged together: the click selects its row alone at the release.
            _deferredSelectRow = row;
        } else {
            selectRowIndexes({row}, false);
        }
    }
    if (column >= 0) {
        const RWTableColumn& c = *_columns[static_cast<size_t>(column)];
        if (RWCell* shared = preparedCellAtColumn(column, row); shared && shared->isEnabled()) {
            RWCellPtr cell = shared->copyForTracking();
            if (!cell) cell = c.dataCellForRow(row);
            if (cell && trackCell(cell, column, row, event, cell->prefersTrackingUntilMouseUp()))
                return;
        }
        if (event.clickCount() >= 2 && canEditCell(column, row)) {
            editColumn(column, row, false);
            return;
        }
    }
    _dragArmed = true;
}

bool RWOutlineView::trackCell(const RWCellPtr& cell, int64_t column, int64_t row,
                              const RWEvent& event, bool untilMouseUp) {
    if (!cell || row < 0 || row >= numberOfRows()) return false;
    const CGPoint point = convertPointFromWindow(event.locationInWindow());
    const CGRect frame = frameOfCellAtColumn(column, row);
    if (!cell->trackMouse(event, point, frame, *this, untilMouseUp)) return false;
    _tracking = Tracking{cell, column, row, itemAtRow(row), frame, untilMouseUp};
    setNeedsDisplayInRect(frame);
    return true;
}

void RWOutlineView::endTracking(const CGPoint& point, bool mouseIsUp) {
    if (!_tracking || _tracking->stopped) return;
    _tracking->stopped = true;
    const Tracking t = *_tracking;
    t.cell->stopTracking(point, *this, mouseIsUp);
    if (mouseIsUp && t.cell->commitsTrackedValue() && _dataSource && t.column < numberOfColumns() &&
        _columns[static_cast<size_t>(t.column)]->isEditable())
        _dataSource->setObjectValue(*this, t.cell->objectValue(),
                                    *_columns[static_cast<size_t>(t.column)], t.item);
    const int64_t row = rowForItem(t.item);
    if (row >= 0) setNeedsDisplayInRect(rectOfRow(row));
    if (mouseIsUp && t.cell->wantsEditingAfterTracking() && row >= 0 && canEditCell(t.column, row))
        editColumn(t.column, row, false);
}

void RWOutlineView::mouseDragged(const RWEvent& event) {
    _mouseLocation = event.locationInWindow();
    const CGPoint point = convertPointFromWindow(event.locationInWindow());
    if (_tracking) {
        if (_tracking->stopped) return;
        if (!_tracking->untilMouseUp && !CGRectContainsPoint(_tracking->frame, point)) {
            // Left the cell: a press not tracked until the release ends here.
            endTracking(point, false);
            return;
        }
        _tracking->cell->continueTracking(event, point, *this);
        setNeedsDisplayInRect(_tracking->frame);
        return;
    }
    if (_dragging || !_dragArmed) return;
    const CGPoint d = point - _pressPoint;
    if (std::hypot(d.x, d.y) < kDragThreshold) return;
    _dragArmed = false;
    const int64_t row = rowAtPoint(_pressPoint);
    if (row < 0 || !isRowSelected(row) || !canDragRowsWithIndexes(_selection, _pressPoint)) return;
    _deferredSelectRow = -1;
    dragImage(_selection, event, true);
}

void RWOutlineView::mouseUp(const RWEvent& event) {
    _mouseLocation = event.locationInWindow();
    const CGPoint point = convertPointFromWindow(event.locationInWindow());
    if (_tracking) {
        endTracking(point, true);
        _tracking.reset();
        return;
    }
    _dragArmed = false;
    if (_dragging) {
        _dragging = false;
        const uint64_t offered = draggingSourceOperationMaskForLocal(false);
        const uint64_t operation = _dropProvider
                                       ? _dropProvider(event.locationInWindow(), offered) & offered
                                       : RWDragOperationNone;
        tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidChangeDrag(*this); });
        draggedImageEndedAt(event.locationInWindow(), operation);
        _draggedRows.removeAllIndexes();
        return;
    }
    if (_deferredSelectRow >= 0) {
        const int64_t row = _deferredSelectRow;
        _deferredSelectRow = -1;
        if (row < numberOfRows()) selectRowIndexes({row}, false);
    }
}

void RWOutlineView::rightMouseDown(const RWEvent& event) {
    _mouseLocation = event.locationInWindow();
}

void RWOutlineView::mouseMoved(const RWEvent& event) {
    _mouseLocation = event.locationInWindow();
    const CGPoint point = convertPointFromWindow(event.locationInWindow());
    const RWTrackingArea* now = nullptr;
    for (const RWTrackingArea& area : _trackingAreas)
        if (CGRectContainsPoint(area.rect, point)) {
            now = &area;
            break;
        }
    const uint64_t nowId = now ? now->identifier : 0;
    if (nowId == _hoveredArea) return;
    // Exit first, then entry: a view that keeps "the part under the pointer" ends on the new one.
    const uint64_t before = _hoveredArea;
    _hoveredArea = nowId;
    for (const RWTrackingArea& area : std::vector<RWTrackingArea>(_trackingAreas)) {
        if (area.identifier == before) mouseExited(event, area);
    }
    for (const RWTrackingArea& area : std::vector<RWTrackingArea>(_trackingAreas))
        if (area.identifier == nowId) {
            mouseEntered(event, area);
            break;
        }
}

void RWOutlineView::mouseLeftView(const RWEvent& event) {
    _mouseLocation = event.locationInWindow();
    const uint64_t before = _hoveredArea;
    _hoveredArea = 0;
    for (const RWTrackingArea& area : std::vector<RWTrackingArea>(_trackingAreas))
        if (area.identifier == before) {
            mouseExited(event, area);
            break;
        }
}

void RWOutlineView::mouseEntered(const RWEvent&, const RWTrackingArea&) {}

void RWOutlineView::mouseExited(const RWEvent&, const RWTrackingArea&) {}

void RWOutlineView::moveSelection(int64_t delta, bool extend) {
    if (numberOfRows() == 0) return;
    int64_t row = selectedRow();
    if (row < 0)
        row = delta > 0 ? 0 : numberOfRows() - 1;
    else
        row = std::clamp<int64_t>(row + delta, 0, numberOfRows() - 1);
    selectRowIndexes({row}, extend && _allowsMultipleSelection);
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineScrollRowToVisible(*this, row); });
}

void RWOutlineView::keyDown(const RWEvent& event) {
    const uint32_t c = RWCommandsController::firstCharacter(event.characters());
    const bool shift = (event.modifierFlags() & RWEventModifierFlagShift) != 0;
    switch (c) {
        case kUpArrow: moveSelection(-1, shift); return;
        case kDownArrow: moveSelection(1, shift); return;
        case kLeftArrow:
        case kRightArrow: {
            const RWIndexSet rows = _selection;
            std::vector<RWOutlineItem> items;
            for (int64_t row : rows) items.push_back(itemAtRow(row));
            for (const RWOutlineItem& item : items) {
                if (c == kRightArrow)
                    expandItem(item.get());
                else
                    collapseItem(item.get());
            }
            return;
        }
        default: break;
    }
    if ((event.modifierFlags() & RWEventModifierFlagCommand) &&
        event.charactersIgnoringModifiers() == "a")
        selectAll();
}

// ---- Dragging -------------------------------------------------------------------------------

bool RWOutlineView::canDragRowsWithIndexes(const RWIndexSet&, const CGPoint&) { return false; }

uint64_t RWOutlineView::draggingSourceOperationMaskForLocal(bool isLocal) {
    return isLocal ? RWDragOperationMove | RWDragOperationCopy : RWDragOperationCopy;
}

void RWOutlineView::dragImage(const RWIndexSet& rows, const RWEvent&, bool slideBack) {
    _dragging = true;
    _draggedRows = rows;
    _slideBack = slideBack;
    tellObservers([&](RWOutlineViewObserver& o) { o.outlineDidChangeDrag(*this); });
}

void RWOutlineView::draggedImageEndedAt(const CGPoint&, uint64_t) {}

void RWOutlineView::showAnimationEffect(const CGPoint& pointInWindow) {
    tellObservers(
        [&](RWOutlineViewObserver& o) { o.outlineShowAnimationEffect(*this, pointInWindow); });
}
