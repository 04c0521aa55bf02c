#pragma once
// What the full editor's controller asks of the channel list beside its curves and of the
// list's controller. Those views come with their own module and implement these interfaces;
// until one is connected its outlet is null and the controller does without it (each use
// tests the outlet).
//
// Rows are indexes from 0; a row of -1 means the item is not shown.

#include <cstdint>
#include <string>
#include <vector>

#include "platform/geometry/CGGeometry.h"
#include "src/data/TQCurveEditorItem.h"

class TQCurveEditorCtrl;

// The outline of channels (TQCurveEditorChannelList).
class TQEditorChannelListView {
public:
    virtual ~TQEditorChannelListView() = default;
    virtual void setAllowsEmptySelection(bool allows) = 0;
    virtual void setAllowsMultipleSelection(bool allows) = 0;
    virtual void deselectAll() = 0;
    virtual int64_t rowForItem(const TQCurveEditorItem* item) const = 0;
    virtual CGRect rectOfRow(int64_t row) const = 0;
    virtual CGRect frameOfCellAtColumn(int64_t column, int64_t row) const = 0;
    virtual void selectRowIndexes(const std::vector<int64_t>& rows, bool byExtendingSelection) = 0;
    virtual void setNeedsDisplay() = 0;
    virtual void setNeedsDisplayInRect(const CGRect& rect) = 0;
    virtual void resetCursorRects() = 0;
};

// The outline's data source and delegate (TQCurveEditorListController).
class TQEditorChannelListController {
public:
    virtual ~TQEditorChannelListController() = default;
    // Reloads the rows from the selected curve set.
    virtual void update() = 0;
    // Redraws the values of a row, leaving its title alone.
    virtual void refreshRowWithoutTitle(int64_t row) = 0;
};
