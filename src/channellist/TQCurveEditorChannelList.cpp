#include "src/channellist/TQCurveEditorChannelList.h"

#include <utility>

#include "platform/ui/RWCommandsController.h"
#include "src/channellist/TQChannelListStatusCell.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/resources/TQStrings.h"

namespace {

using Ctrl = TQCurveEditorListController;

// Keys whose bound application command wins over the list: a character minus the first of
// them indexes this mask (left and right arrow, Page Up, Page Down).
constexpr uint32_t kFirstCommandKey = 63234;
constexpr uint32_t kCommandKeySpan = 44;
constexpr uint64_t kCommandKeyMask = 0xc0000000003;
// The drag operations that mean a destination took the rows.
constexpr uint64_t kTakenOperations = RWDragOperationCopy | RWDragOperationLink;
// Widths of the columns, in points.
constexpr double kNameWidth = 150.0;
constexpr double kValueWidth = 80.0;
constexpr double kShowWidth = 22.0;
constexpr double kKeyWidth = 3 * TQCurveEditorChannelList::kPartWidth;
constexpr double kMenuWidth = 22.0;

TQCurveEditorItemPtr editorItem(const RWOutlineItem& item) {
    return std::static_pointer_cast<TQCurveEditorItem>(item);
}

}  // namespace

TQCurveEditorChannelList::TQCurveEditorChannelList() { _pTrackingAreas.reserve(10); }

void TQCurveEditorChannelList::addStandardColumns() {
    const std::pair<const char*, double> columns[] = {{Ctrl::kNameColumn, kNameWidth},
                                                      {Ctrl::kValueColumn, kValueWidth},
                                                      {Ctrl::kShowColumn, kShowWidth},
                                                      {Ctrl::kKeyColumn, kKeyWidth},
                                                      {Ctrl::kMenuColumn, kMenuWidth}};
    for (const auto& [identifier, width] : columns) {
        auto column = std::make_shared<RWTableColumn>(identifier, width);
        column->setMinWidth(std::min(width, 18.0));
        addTableColumn(column);
    }
}

std::string TQCurveEditorChannelList::columnIdentifierAtPoint(const CGPoint& point) const {
    const int64_t column = columnAtPoint(point);
    return column < 0 ? std::string() : tableColumns()[static_cast<size_t>(column)]->identifier();
}

// ---- Presses --------------------------------------------------------------------------------

void TQCurveEditorChannelList::mouseDown(const RWEvent& event) {
    Ctrl* controller = _curveListController;
    TQCurveEditorCtrl* editor = controller ? controller->mainCurveEditorController() : nullptr;
    // The pointer's place now, which is where this press is: every move reaches the list.
    const CGPoint point = convertPointFromWindow(event.locationInWindow());
    const int64_t column = columnAtPoint(point);
    const std::string id = columnIdentifierAtPoint(point);
    if (id == Ctrl::kNameColumn && editor) editor->resetSelection();
    if (controller) controller->setMouseDown(true);
    const RWIndexSet rows = selectedRowIndexes();
    const int64_t row = rowAtPoint(point);
    const TQCurveEditorItemPtr item = editorItem(itemAtRow(row));
    if (!item && controller) controller->performAction("selectNone:", *this);
    const uint64_t flags = event.modifierFlags();
    const bool option = (flags & RWEventModifierFlagOption) != 0;
    const bool shift = (flags & RWEventModifierFlagShift) != 0;
    if (id == Ctrl::kKeyColumn) {
        statusCellPress(event, column, row, rows);
    } else if (id == Ctrl::kShowColumn && option) {
        selectRowIndexes(RWIndexSet{row}, false);
        if (editor) editor->soloItem(item.get());
        display();
    } else if (id == Ctrl::kShowColumn && rows.count() >= 2 && !shift) {
        groupToggle(row, rows);
    } else if (id == Ctrl::kNameColumn && (flags & RWEventModifierFlagControl)) {
        rightMouseDown(event);
    } else if (id == Ctrl::kMenuColumn) {
        rightMouseDown(event);
    } else if (id == Ctrl::kValueColumn && shift) {
        RWEvent plain = event;
        plain.setModifierFlags(flags & ~uint64_t{RWEventModifierFlagShift});
        RWOutlineView::mouseDown(plain);
    } else {
        RWOutlineView::mouseDown(event);
    }
}

void TQCurveEditorChannelList::statusCellPress(const RWEvent& event, int64_t column, int64_t row,
                                               RWIndexSet rows) {
    const TQCurveEditorItemPtr item = editorItem(itemAtRow(row));
    if (!item) return;
    if (!item->isSelected()) rows = RWIndexSet{row};
    selectRowIndexes(rows, false);
    display();
    const RWCellPtr cell = tableColumns()[static_cast<size_t>(column)]->dataCellForRow(row);
    auto* status = dynamic_cast<TQChannelListStatusCell*>(cell.get());
    if (!status) return;
    TQCurveEditorAppDelegate* delegate =
        _curveListController && _curveListController->mainCurveEditorController()
            ? _curveListController->mainCurveEditorController()->appDelegate()
            : nullptr;
    status->updateChannel(item->channelBase(), delegate ? delegate->currentTime() : kCMTimeZero);
    if (_curveListController) _curveListController->setCellClickedChannel(item);
    trackCell(cell, column, row, event, false);
}

void TQCurveEditorChannelList::groupToggle(int64_t row, RWIndexSet rows) {
    const TQCurveEditorItemPtr clicked = editorItem(itemAtRow(row));
    if (!clicked) return;
    const int32_t state = clicked->isEnabledItem();
    if (!rows.containsIndex(row)) rows = RWIndexSet{row};
    selectRowIndexes(rows, false);
    // Every row ends as the clicked one's opposite: a mixed folder counts as shown.
    for (int64_t r = 0; r < numberOfRows(); ++r) {
        const TQCurveEditorItemPtr item = editorItem(itemAtRow(r));
        if (item && item->channelBase() && rows.containsIndex(r)) item->enableItem(state ? 0 : 1);
    }
    if (_curveListController && _curveListController->mainCurveEditorController())
        _curveListController->mainCurveEditorController()->_refreshViewAndBrowser();
    display();
}

void TQCurveEditorChannelList::rightMouseDown(const RWEvent& event) {
    RWOutlineView::rightMouseDown(event);
    Ctrl* controller = _curveListController;
    const CGPoint point = convertPointFromWindow(event.locationInWindow());
    const std::string id = columnIdentifierAtPoint(point);
    if (id == Ctrl::kNameColumn && controller) controller->resetSelection();
    if (id != Ctrl::kMenuColumn) return;
    const int64_t row = rowAtPoint(point);
    const TQCurveEditorItemPtr item = editorItem(itemAtRow(row));
    if (!item) return;
    if (!item->isSelected()) selectRowIndexes(RWIndexSet{row}, false);
    display();
    const int64_t column = columnAtPoint(point);
    const RWTableColumn& menuColumn = *tableColumns()[static_cast<size_t>(column)];
    const RWCellPtr cell = menuColumn.dataCellForRow(row);
    auto* status = dynamic_cast<TQChannelListStatusCell*>(cell.get());
    if (!status) return;
    // The cell's channel fresh for this row.
    if (controller) controller->willDisplayCell(*this, *cell, menuColumn, item);
    status->rightMouseDown(event, *this);
}

void TQCurveEditorChannelList::mouseUp(const RWEvent& event) {
    if (_curveListController) _curveListController->setMouseDown(false);
    RWOutlineView::mouseUp(event);
}

// ---- Hover ----------------------------------------------------------------------------------

void TQCurveEditorChannelList::updateTrackingAreas() {
    removeTrackingAreas(std::exchange(_pTrackingAreas, {}));
    const int64_t key = columnWithIdentifier(Ctrl::kKeyColumn);
    const int64_t menu = columnWithIdentifier(Ctrl::kMenuColumn);
    if (key < 0 || menu < 0) return;
    const CGRect visible = visibleRect();
    const auto [first, count] = rowsInRect(visible);
    for (int64_t row = first; row < first + count; ++row) {
        const CGRect rowRect = rectOfRow(row);
        const CGRect keyRect = frameOfCellAtColumn(key, row);
        const double y = rowRect.origin.y, h = rowRect.size.height;
        auto add = [&](const CGRect& rect, int64_t location) {
            RWTrackingArea area;
            area.rect = rect;
            area.options = kTrackingOptions;
            area.userInfo = {{"index", row}, {"Location", location}};
            _pTrackingAreas.push_back(addTrackingArea(std::move(area)));
        };
        add(CGRectMake(rowRect.origin.x, y, keyRect.origin.x - rowRect.origin.x, h), kPartOutside);
        add(CGRectMake(CGRectGetMaxX(keyRect), y, CGRectGetMaxX(rowRect) - CGRectGetMaxX(keyRect),
                       h),
            kPartOutside);
        const CGRect shown = CGRectIntersection(keyRect, visible);
        if (CGRectIsNull(shown)) continue;
        const double x = shown.origin.x;
        for (const auto& [offset, location] : {std::pair{0.0, kPartPrevious},
                                               {2 * kPartWidth, kPartAddOrDelete},
                                               {kPartWidth, kPartNext}}) {
            const CGRect part = CGRectMake(x + offset, y, kPartWidth, h);
            if (!CGRectIsEmpty(part)) add(part, location);
        }
    }
    RWOutlineView::updateTrackingAreas();
}

void TQCurveEditorChannelList::mouseEntered(const RWEvent& event, const RWTrackingArea& area) {
    Ctrl* controller = _curveListController;
    if (!controller) return;
    const int64_t row = area.value("index");
    const int64_t location = area.value("Location");
    if (row == controller->mouseInRow() && location == controller->mouseInPartIndex()) return;
    const TQCurveEditorItemPtr item = editorItem(itemAtRow(row));
    if (dynamic_cast<TQCurveEditorChannelItem*>(item.get())) {
        controller->setMouseInRow(row, location, item);
        if (TQChannel* channel = item->channel()) {
            if (location == kPartPrevious) {
                setToolTip(TQLocalizedString("Anim Tool Tip Previous Keyframe"));
            } else if (location == kPartNext) {
                setToolTip(TQLocalizedString("Anim Tool Tip Next Keyframe"));
            } else if (location == kPartAddOrDelete) {
                TQCurveEditorCtrl* editor = controller->mainCurveEditorController();
                TQCurveEditorAppDelegate* delegate = editor ? editor->appDelegate() : nullptr;
                CMTime now = delegate ? delegate->currentTime() : kCMTimeZero;
                setToolTip(TQLocalizedString(channel->hasKeyframeAtTime(&now, 0)
                                                 ? "Anim Tool Tip Delete Keyframe"
                                                 : "Anim Tool Tip Add Keyframe"));
            }
        }
    } else {
        controller->setMouseInRow(row, location, nullptr);
    }
    setNeedsDisplayInRect(rectOfRow(row));
    RWOutlineView::mouseEntered(event, area);
}

void TQCurveEditorChannelList::mouseExited(const RWEvent& event, const RWTrackingArea& area) {
    Ctrl* controller = _curveListController;
    if (!controller || controller->mouseInRow() == Ctrl::kNone) return;
    const int64_t row = area.value("index");
    controller->setMouseInRow(Ctrl::kNone, Ctrl::kNone, nullptr);
    setToolTip(std::nullopt);
    setNeedsDisplayInRect(rectOfRow(row));
    RWOutlineView::mouseExited(event, area);
}

// ---- Keys and editing -----------------------------------------------------------------------

void TQCurveEditorChannelList::keyDown(const RWEvent& event) {
    const uint32_t c = RWCommandsController::firstCharacter(event.characters());
    const uint32_t d = c - kFirstCommandKey;
    if (c >= kFirstCommandKey && d < kCommandKeySpan && ((kCommandKeyMask >> d) & 1)) {
        const std::shared_ptr<RWCommand> command =
            RWCommandsController::sharedController().commandWithCharacter(
                c, event.modifierFlags() & RWEventModifierFlagDeviceIndependentFlagsMask);
        if (command && command->performCommand()) return;
    }
    RWOutlineView::keyDown(event);
}

void TQCurveEditorChannelList::textDidEndEditing(int64_t movement, const std::string& text) {
    if (movement != RWReturnTextMovement) {
        RWOutlineView::textDidEndEditing(movement, text);
        return;
    }
    RWOutlineView::textDidEndEditing(RWOtherTextMovement, text);
    makeFirstResponder();
}

// ---- Dragging a row out ---------------------------------------------------------------------

bool TQCurveEditorChannelList::canDragRowsWithIndexes(const RWIndexSet&, const CGPoint& point) {
    auto* source = dynamic_cast<Ctrl*>(dataSource());
    const int64_t column = columnAtPoint(point);
    if (!source || column < 0) return false;
    return source->canBeginDragInColumn(*this, *tableColumns()[static_cast<size_t>(column)]);
}

uint64_t TQCurveEditorChannelList::draggingSourceOperationMaskForLocal(bool) {
    return RWDragOperationDelete;
}

void TQCurveEditorChannelList::dragImage(const RWIndexSet& rows, const RWEvent& event, bool) {
    RWOutlineView::dragImage(rows, event, false);
}

void TQCurveEditorChannelList::draggedImageEndedAt(const CGPoint& pointInWindow,
                                                   uint64_t operation) {
    const CGPoint point = convertPointFromWindow(pointInWindow);
    // Inside: over the rows or the empty part of the list below them.
    const CGRect inside = CGRectUnion(bounds(), visibleRect());
    if ((operation & kTakenOperations) || mouseInRect(point, inside)) return;
    Ctrl* controller = _curveListController;
    TQCurveEditorCtrl* editor = controller ? controller->mainCurveEditorController() : nullptr;
    if (!editor || !editor->canModifySelectedCurveSet() ||
        !editor->removeSelectedChannelFromSelectedCurveSet())
        return;
    showAnimationEffect(mouseLocationInWindow());
    controller->update();
}

// ---- Redraw ---------------------------------------------------------------------------------

void TQCurveEditorChannelList::setNeedsDisplay() {
    if (!_ignoreSetNeedsDisplay) RWOutlineView::setNeedsDisplay();
}

void TQCurveEditorChannelList::setNeedsDisplayInRect(const CGRect& rect) {
    if (!_ignoreSetNeedsDisplay) RWOutlineView::setNeedsDisplayInRect(rect);
}
