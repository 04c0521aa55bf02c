#pragma once
// An outline view as a model: rows of a tree of items in columns, with the data-source and
// delegate protocols of a desktop toolkit's outline, expansion, selection by index sets, cell
// tracking, text editing, tracking areas, and dragging rows out. No toolkit is involved: core
// code and its tests drive it with RWEvents; the adapter in qt/ shows it in a tree view and
// hands it the user's mouse and keys (see RWControl.h for the pattern).
//
// Items. The data source hands out items as shared pointers of its own type, seen here as
// RWOutlineItem; the root is the null item. The view caches the tree it was given (as the
// toolkit's outline does) until the next reloadData: children are asked for once per item,
// when the item is first expanded or an adapter asks for them. Cached items are held, so an
// item the data source dropped meanwhile stays valid (its data may have gone; the data source
// answers for that).
//
// Rows. Rows are the visible items in order: the root's children, and below each expanded
// item its rows, at one level deeper. Row numbers change as items expand and collapse; the
// selection is a set of row numbers and moves with them.
//
// Geometry. Content coordinates: origin at the top left of the first row, y growing down; rows
// are rowHeight tall; columns follow each other left to right at their widths. In the outline
// column a row's cell starts after one indentation per level, plus one for the disclosure
// triangle, which sits just before it. visibleRect is the part the adapter shows (its scroll
// position and size). Events carry window locations (origin bottom left, y up); the view host,
// when set, converts them to its widget's points (y up), which the visible rectangle turns
// into content coordinates.
//
// Text editing. editColumn starts an edit of a cell's text; the adapter shows an editor and
// ends it with userEndEditing (the typed text and how the edit was left). The typed text
// reaches the data source as text: the data source knows how the row shows its value and reads
// it back the same way. A cell formatter that refuses the text stops it before that.
//
// Dragging. A press on selected rows and a drag of a few points starts a drag of those rows
// when canDragRowsWithIndexes allows; the release ends it with draggedImageEndedAt, the window
// point and the operation a destination accepted (none unless the host's drop provider says
// otherwise).
//
// Everything runs on the main thread. The data source and delegate are not owned and must
// outlive the view, or clear themselves from it first; so must observers.

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "platform/ui/RWCell.h"
#include "platform/ui/RWControl.h"
#include "platform/ui/RWIndexSet.h"
#include "platform/ui/RWObserverList.h"
#include "platform/ui/RWServices.h"

using RWOutlineItem = std::shared_ptr<void>;

class RWOutlineView;

class RWTableColumn {
public:
    explicit RWTableColumn(std::string identifier, double width = 100.0)
        : _identifier(std::move(identifier)), _width(width) {}
    virtual ~RWTableColumn() = default;

    const std::string& identifier() const { return _identifier; }
    const std::string& title() const { return _title; }
    void setTitle(const std::string& title) { _title = title; }
    double width() const { return _width; }
    double minWidth() const { return _minWidth; }
    void setMinWidth(double width) { _minWidth = width; }
    // Columns are edited through the view (it lays out again): RWOutlineView::setColumnWidth.
    bool isEditable() const { return _editable; }
    void setEditable(bool editable) { _editable = editable; }
    const RWCellPtr& dataCell() const { return _dataCell; }
    void setDataCell(RWCellPtr cell) { _dataCell = std::move(cell); }
    // The cell for a row; the column's one cell unless a subclass says otherwise.
    virtual RWCellPtr dataCellForRow(int64_t row) const {
        (void)row;
        return _dataCell;
    }

private:
    friend class RWOutlineView;
    std::string _identifier;
    std::string _title;
    double _width;
    double _minWidth = 10.0;
    bool _editable = true;
    RWCellPtr _dataCell;
};

using RWTableColumnPtr = std::shared_ptr<RWTableColumn>;

// Where the rows come from. The column is null for a question about the whole row.
class RWOutlineViewDataSource {
public:
    virtual ~RWOutlineViewDataSource() = default;
    virtual int64_t numberOfChildrenOfItem(RWOutlineView& view, const RWOutlineItem& item) = 0;
    virtual bool isItemExpandable(RWOutlineView& view, const RWOutlineItem& item) = 0;
    virtual RWOutlineItem childOfItem(RWOutlineView& view, int64_t index,
                                      const RWOutlineItem& item) = 0;
    virtual RWObjectValue objectValueForTableColumn(RWOutlineView& view,
                                                    const RWTableColumn& column,
                                                    const RWOutlineItem& item) = 0;
    // The user changed a cell: a check box's new state, or the text typed into a cell.
    virtual void setObjectValue(RWOutlineView& view, const RWObjectValue& value,
                                const RWTableColumn& column, const RWOutlineItem& item) {
        (void)view;
        (void)value;
        (void)column;
        (void)item;
    }
};

// What the view asks and tells as it shows rows and the user works them. Every answer has
// the toolkit's default.
class RWOutlineViewDelegate {
public:
    virtual ~RWOutlineViewDelegate() = default;
    // The column's cell holds the row's object value; the delegate may set it up further.
    virtual void willDisplayCell(RWOutlineView& view, RWCell& cell, const RWTableColumn& column,
                                 const RWOutlineItem& item) {
        (void)view, (void)cell, (void)column, (void)item;
    }
    virtual bool shouldEditTableColumn(RWOutlineView& view, const RWTableColumn& column,
                                       const RWOutlineItem& item) {
        (void)view, (void)column, (void)item;
        return true;
    }
    virtual bool shouldSelectItem(RWOutlineView& view, const RWOutlineItem& item) {
        (void)view, (void)item;
        return true;
    }
    // Whether a cell too narrow for its text shows it whole on hover.
    virtual bool shouldShowCellExpansion(RWOutlineView& view, const RWTableColumn& column,
                                         const RWOutlineItem& item) {
        (void)view, (void)column, (void)item;
        return true;
    }
    virtual std::optional<std::string> toolTipForCell(RWOutlineView& view, RWCell& cell,
                                                      const CGRect& rect,
                                                      const RWTableColumn& column,
                                                      const RWOutlineItem& item,
                                                      const CGPoint& mouseLocation) {
        (void)view, (void)cell, (void)rect, (void)column, (void)item, (void)mouseLocation;
        return std::nullopt;
    }
    // Posted after every expansion and collapse, the program's as well as the user's.
    virtual void itemDidExpand(RWOutlineView& view, const RWOutlineItem& item) {
        (void)view, (void)item;
    }
    virtual void itemDidCollapse(RWOutlineView& view, const RWOutlineItem& item) {
        (void)view, (void)item;
    }
    // Posted after every change of the selected rows, the program's as well as the user's.
    virtual void selectionDidChange(RWOutlineView& view) { (void)view; }
};

// One item of the cached tree, as an adapter walks it.
class RWOutlineNode {
public:
    const RWOutlineItem& item() const { return _item; }
    const RWOutlineNode* parent() const { return _parent; }
    int64_t indexInParent() const { return _index; }
    // -1 for the root.
    int32_t level() const { return _level; }
    // The row, or -1 when the node is not shown (a collapsed ancestor, or the root).
    int64_t row() const { return _row; }
    bool isExpandable() const { return _expandable; }
    bool isExpanded() const { return _expanded; }

private:
    friend class RWOutlineView;
    RWOutlineItem _item;
    RWOutlineNode* _parent = nullptr;
    int64_t _index = 0;
    int32_t _level = -1;
    int64_t _row = -1;
    bool _expandable = false;
    bool _expanded = false;
    bool _loaded = false;
    std::vector<std::unique_ptr<RWOutlineNode>> _children;
};

// What the adapter hears, beside controlDidChange.
class RWOutlineViewObserver {
public:
    virtual ~RWOutlineViewObserver() = default;
    // The cached tree is about to be dropped (nodes die), and has been built anew.
    virtual void outlineWillReload(RWOutlineView&) {}
    virtual void outlineDidReload(RWOutlineView&) {}
    virtual void outlineDidChangeExpansion(RWOutlineView&, const RWOutlineNode&) {}
    virtual void outlineDidChangeSelection(RWOutlineView&) {}
    // Content coordinates; the bounds for the whole view.
    virtual void outlineNeedsDisplay(RWOutlineView&, const CGRect&) {}
    virtual void outlineDidBeginEditing(RWOutlineView&, int64_t /*column*/, int64_t /*row*/) {}
    virtual void outlineDidEndEditing(RWOutlineView&) {}
    virtual void outlineWantsKeyboardFocus(RWOutlineView&) {}
    virtual void outlineScrollRowToVisible(RWOutlineView&, int64_t /*row*/) {}
    // A drag of rows started or ended (isDragging tells which).
    virtual void outlineDidChangeDrag(RWOutlineView&) {}
    // The effect of a thing vanishing, at a window point.
    virtual void outlineShowAnimationEffect(RWOutlineView&, const CGPoint&) {}
    virtual void outlineDidChangeColumns(RWOutlineView&) {}
    // A cell asked for its menu at a window point: the adapter shows it, validated as it
    // opens, and performs the chosen item through the menu.
    virtual void outlinePopUpContextMenu(RWOutlineView&, const RWMenuPtr&, const CGPoint&) {}
};

// How an edit was left, as the text system reports it.
enum : int64_t {
    RWOtherTextMovement = 0,
    RWReturnTextMovement = 0x10,
    RWTabTextMovement = 0x11,
    RWBacktabTextMovement = 0x12,
    RWCancelTextMovement = 0x17,
};

// Drag operations.
enum : uint64_t {
    RWDragOperationNone = 0,
    RWDragOperationCopy = 1,
    RWDragOperationLink = 2,
    RWDragOperationGeneric = 4,
    RWDragOperationPrivate = 8,
    RWDragOperationMove = 16,
    RWDragOperationDelete = 32,
};

class RWOutlineView : public RWControl {
public:
    // Travel of a press, in points, that starts a drag of rows.
    static constexpr double kDragThreshold = 4.0;

    RWOutlineView();
    ~RWOutlineView() override;

    // ---- Data source and delegate (not owned) ----
    RWOutlineViewDataSource* dataSource() const { return _dataSource; }
    void setDataSource(RWOutlineViewDataSource* dataSource) { _dataSource = dataSource; }
    RWOutlineViewDelegate* delegate() const { return _delegate; }
    void setDelegate(RWOutlineViewDelegate* delegate) { _delegate = delegate; }

    // ---- Columns ----
    void addTableColumn(const RWTableColumnPtr& column);
    void removeTableColumn(const RWTableColumn* column);
    const std::vector<RWTableColumnPtr>& tableColumns() const { return _columns; }
    int64_t numberOfColumns() const { return static_cast<int64_t>(_columns.size()); }
    // -1 when no column has that identifier.
    int64_t columnWithIdentifier(const std::string& identifier) const;
    RWTableColumnPtr tableColumnWithIdentifier(const std::string& identifier) const;
    RWTableColumn* outlineTableColumn() const { return _outlineColumn; }
    void setOutlineTableColumn(RWTableColumn* column);
    int64_t outlineColumnIndex() const;
    void setColumnWidth(int64_t column, double width);
    bool autoresizesOutlineColumn() const { return _autoresizesOutlineColumn; }
    void setAutoresizesOutlineColumn(bool autoresizes) { _autoresizesOutlineColumn = autoresizes; }
    int64_t columnAutoresizingStyle() const { return _columnAutoresizingStyle; }
    void setColumnAutoresizingStyle(int64_t style) { _columnAutoresizingStyle = style; }

    // ---- Layout settings ----
    double rowHeight() const { return _rowHeight; }
    void setRowHeight(double height);
    double indentationPerLevel() const { return _indentationPerLevel; }
    void setIndentationPerLevel(double indentation);

    // ---- Rows ----
    // Drops the cached tree and asks the data source again. Items that were expanded and
    // are given again stay expanded; selected row numbers past the new last row are dropped.
    void reloadData();
    int64_t numberOfRows() const { return static_cast<int64_t>(_rows.size()); }
    // Null for a row out of range.
    RWOutlineItem itemAtRow(int64_t row) const;
    // -1 when the item is not shown.
    int64_t rowForItem(const void* item) const;
    int64_t rowForItem(const RWOutlineItem& item) const { return rowForItem(item.get()); }
    // -1 for a row out of range.
    int64_t levelForRow(int64_t row) const;
    int64_t levelForItem(const void* item) const;
    // Null for a root child or an unknown item.
    RWOutlineItem parentForItem(const void* item) const;
    bool isExpandable(const void* item) const;
    bool isItemExpanded(const void* item) const;
    // Each tells the delegate (itemDidExpand, itemDidCollapse) when it changed something. An
    // item not in the cached tree, or not expandable, is left alone.
    void expandItem(const void* item, bool expandChildren = false);
    void collapseItem(const void* item, bool collapseChildren = false);

    // ---- The cached tree, for adapters ----
    const RWOutlineNode& rootNode() const { return _root; }
    // Loads the node's children from the data source on first use.
    int64_t childCount(const RWOutlineNode& node);
    const RWOutlineNode* childNode(const RWOutlineNode& node, int64_t index);
    const RWOutlineNode* nodeAtRow(int64_t row) const;
    const RWOutlineNode* nodeForItem(const void* item) const;

    // ---- Selection ----
    const RWIndexSet& selectedRowIndexes() const { return _selection; }
    // Rows out of range are left out. Tells the delegate and observers when it changed.
    void selectRowIndexes(const RWIndexSet& rows, bool byExtendingSelection);
    void deselectRow(int64_t row);
    virtual void deselectAll();
    void selectAll();
    bool isRowSelected(int64_t row) const { return _selection.containsIndex(row); }
    int64_t numberOfSelectedRows() const { return static_cast<int64_t>(_selection.count()); }
    // The last row the user or the program selected alone or added; -1 without a selection.
    int64_t selectedRow() const;
    bool allowsEmptySelection() const { return _allowsEmptySelection; }
    void setAllowsEmptySelection(bool allows) { _allowsEmptySelection = allows; }
    bool allowsMultipleSelection() const { return _allowsMultipleSelection; }
    void setAllowsMultipleSelection(bool allows) { _allowsMultipleSelection = allows; }

    // ---- Geometry (content coordinates) ----
    CGRect bounds() const;
    const CGRect& visibleRect() const { return _visibleRect; }
    // Set by the adapter as the user scrolls or resizes; the tracking areas follow.
    void setVisibleRect(const CGRect& rect);
    CGRect rectOfRow(int64_t row) const;
    CGRect rectOfColumn(int64_t column) const;
    CGRect frameOfCellAtColumn(int64_t column, int64_t row) const;
    // The disclosure triangle's place; zero for a row whose item does not expand.
    CGRect frameOfOutlineCellAtRow(int64_t row) const;
    int64_t columnAtPoint(const CGPoint& point) const;
    int64_t rowAtPoint(const CGPoint& point) const;
    // The rows that meet the rectangle: first row and count.
    std::pair<int64_t, int64_t> rowsInRect(const CGRect& rect) const;
    bool mouseInRect(const CGPoint& point, const CGRect& rect) const {
        return CGRectContainsPoint(rect, point);
    }

    // ---- Window coordinates ----
    RWViewHost* viewHost() const { return _viewHost; }
    void setViewHost(RWViewHost* host) { _viewHost = host; }
    CGPoint convertPointFromWindow(const CGPoint& pointInWindow) const;
    CGPoint convertPointToWindow(const CGPoint& point) const;
    // Where the pointer is now, in window coordinates: the adapter hands the view every move
    // of the pointer over it, so the latest event's location is the pointer's.
    CGPoint mouseLocationInWindow() const { return _mouseLocation; }

    // ---- Cells ----
    // The column's cell for the row with the row's object value, after willDisplayCell of the
    // delegate; null when the column has no cell. The cell is the column's own: the next call
    // sets it up for another row.
    RWCell* preparedCellAtColumn(int64_t column, int64_t row);

    // ---- Display ----
    virtual void setNeedsDisplay();
    virtual void setNeedsDisplayInRect(const CGRect& rect);
    // Draws at once: here, a redraw of everything.
    void display() { setNeedsDisplay(); }
    // The part waiting for a redraw (null when none).
    const CGRect& needsDisplayRect() const { return _dirty; }
    // Prepares every cell of the visible rows that wait for a redraw and hands each to
    // `draw` with its frame, then forgets the wait: a headless drawing pass.
    using CellVisitor =
        std::function<void(RWCell& cell, const CGRect& frame, int64_t column, int64_t row)>;
    void displayIfNeeded(const CellVisitor& draw);

    // ---- Text editing ----
    // Starts an edit of the cell's text (the row selected alone first when asked). Nothing
    // for a cell out of range or without a cell.
    void editColumn(int64_t column, int64_t row, bool select);
    bool isEditing() const { return _editing.has_value(); }
    int64_t editedColumn() const { return _editing ? _editing->column : -1; }
    int64_t editedRow() const { return _editing ? _editing->row : -1; }
    // The text the editor starts with.
    const std::string& editingText() const;
    // The user left the editor with this text; RWCancelTextMovement drops it.
    void userEndEditing(const std::string& text, int64_t movement);
    // Ends an edit without keeping its text.
    void abortEditing();
    // Whether the user may edit that cell's text: an editable column and cell, and the
    // delegate agrees.
    bool canEditCell(int64_t column, int64_t row);

    // ---- Tool tips ----
    const std::optional<std::string>& toolTip() const { return _toolTip; }
    void setToolTip(const std::optional<std::string>& tip) { _toolTip = tip; }
    // The view's own tip when it has one, else the delegate's for the cell at the point.
    std::optional<std::string> toolTipAtPoint(const CGPoint& point);

    // ---- Tracking areas ----
    uint64_t addTrackingArea(RWTrackingArea area);
    void removeTrackingArea(uint64_t identifier);
    // Removes every listed area in one pass over the view's areas (a layout drops all of its
    // own at once).
    void removeTrackingAreas(std::vector<uint64_t> identifiers);
    const std::vector<RWTrackingArea>& trackingAreas() const { return _trackingAreas; }
    // Called when rows, columns or the visible part change; subclasses lay their areas out.
    virtual void updateTrackingAreas() {}
    // Lays the areas out again (the toolkit's cursor rectangles).
    void resetCursorRects() { updateTrackingAreas(); }

    // ---- Events ----
    virtual void mouseDown(const RWEvent& event);
    virtual void mouseDragged(const RWEvent& event);
    virtual void mouseUp(const RWEvent& event);
    virtual void rightMouseDown(const RWEvent& event);
    virtual void mouseMoved(const RWEvent& event);
    // The pointer left the whole view.
    void mouseLeftView(const RWEvent& event);
    virtual void mouseEntered(const RWEvent& event, const RWTrackingArea& area);
    virtual void mouseExited(const RWEvent& event, const RWTrackingArea& area);
    virtual void keyDown(const RWEvent& event);
    // Ends the edit: the text goes to the data source unless the movement cancels or the
    // cell's formatter refuses it, then Return edits the same column of the next row and Tab
    // (Backtab) the next (previous) editable cell of the row.
    virtual void textDidEndEditing(int64_t movement, const std::string& text);
    bool isTrackingCell() const { return _tracking.has_value(); }
    // Hands a press to a cell for tracking (trackMouse:inRect:ofView:untilMouseUp:); the drags
    // and the release go to the cell until the tracking ends. False when the cell does not
    // track it.
    bool trackCell(const RWCellPtr& cell, int64_t column, int64_t row, const RWEvent& event,
                   bool untilMouseUp);
    // Asks for the keyboard (the toolkit's makeFirstResponder).
    void makeFirstResponder();
    // Shows the menu where the event happened (popUpContextMenu:withEvent:forView:); nothing
    // for a null menu.
    void popUpContextMenu(const RWMenuPtr& menu, const RWEvent& event);

    // ---- Dragging rows ----
    virtual bool canDragRowsWithIndexes(const RWIndexSet& rows, const CGPoint& point);
    virtual uint64_t draggingSourceOperationMaskForLocal(bool isLocal);
    // Starts the drag of the rows; slideBack: an image dropped nowhere slides back.
    virtual void dragImage(const RWIndexSet& rows, const RWEvent& event, bool slideBack);
    // The drag ended at a window point with the operation a destination took.
    virtual void draggedImageEndedAt(const CGPoint& pointInWindow, uint64_t operation);
    bool isDragging() const { return _dragging; }
    const RWIndexSet& draggedRows() const { return _draggedRows; }
    bool dragSlidesBack() const { return _slideBack; }
    // What a destination at a window point takes of the offered operations; none without it.
    using DropOperationProvider =
        std::function<uint64_t(const CGPoint& pointInWindow, uint64_t offered)>;
    void setDropOperationProvider(DropOperationProvider provider) {
        _dropProvider = std::move(provider);
    }
    // The effect of a thing vanishing (a row dragged away), shown by the adapter.
    void showAnimationEffect(const CGPoint& pointInWindow);

    // ---- Observers (not owned) ----
    void addOutlineObserver(RWOutlineViewObserver* observer) { _outlineObservers.add(observer); }
    void removeOutlineObserver(RWOutlineViewObserver* observer) {
        _outlineObservers.remove(observer);
    }

protected:
    template <class Call>
    void tellObservers(Call&& call) {
        _outlineObservers.forEach(call);
    }
    // The selection became `rows`: observers and delegate are told when it changed.
    void setSelection(RWIndexSet rows);

private:
    struct Editing {
        int64_t column;
        int64_t row;
        RWOutlineItem item;
        std::string text;
    };
    struct Tracking {
        RWCellPtr cell;
        int64_t column;
        int64_t row;
        RWOutlineItem item;
        CGRect frame;
        bool untilMouseUp;
        bool stopped = false;
    };

    void clearTree();
    void loadChildren(RWOutlineNode& node);
    // The visible rows of the node's subtree (not the node itself), in order.
    void appendVisibleRows(RWOutlineNode& node, std::vector<RWOutlineNode*>& out);
    void renumberRowsFrom(size_t first);
    RWOutlineNode* findNode(const void* item) const;
    bool setExpanded(RWOutlineNode& node, bool expanded);
    double columnX(int64_t column) const;
    void endTracking(const CGPoint& point, bool mouseIsUp);
    void moveSelection(int64_t delta, bool extend);

    RWOutlineViewDataSource* _dataSource = nullptr;  // not owned
    RWOutlineViewDelegate* _delegate = nullptr;      // not owned
    std::vector<RWTableColumnPtr> _columns;
    RWTableColumn* _outlineColumn = nullptr;
    bool _autoresizesOutlineColumn = true;
    int64_t _columnAutoresizingStyle = 0;
    double _rowHeight = 20.0;
    double _indentationPerLevel = 16.0;

    RWOutlineNode _root;
    std::vector<RWOutlineNode*> _rows;
    std::unordered_map<const void*, RWOutlineNode*> _nodes;

    RWIndexSet _selection;
    int64_t _anchorRow = -1;
    bool _allowsEmptySelection = true;
    bool _allowsMultipleSelection = false;

    CGRect _visibleRect = CGRectZero;
    bool _visibleRectSet = false;
    RWViewHost* _viewHost = nullptr;  // not owned
    CGPoint _mouseLocation = CGPointZero;
    CGRect _dirty = CGRectNull;

    std::optional<Editing> _editing;
    std::optional<Tracking> _tracking;
    std::optional<std::string> _toolTip;
    std::vector<RWTrackingArea> _trackingAreas;
    uint64_t _nextAreaId = 1;
    uint64_t _hoveredArea = 0;

    // The press that may become a drag, or a click that selects its row alone at the release.
    CGPoint _pressPoint = CGPointZero;
    bool _dragArmed = false;
    int64_t _deferredSelectRow = -1;
    bool _dragging = false;
    bool _slideBack = true;
    RWIndexSet _draggedRows;
    DropOperationProvider _dropProvider;

    RWObserverList<RWOutlineViewObserver> _outlineObservers;
};
