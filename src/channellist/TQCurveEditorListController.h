#pragma once
// The data source and delegate of the channel list (TQCurveEditorChannelList): it shows the
// items of the editor's selected curve set, a root item per object with its channels below,
// in five columns:
//
//   "Name"   the item's name; a channel's row shows its curve's colour swatch
//   "Value"  a channel's value at the current time, in display units; typed or scrubbed
//   "Show"   whether the curve is shown; a folder's box is mixed when its channels differ
//   "Key"    keyframe status at the current time   } cells of the animation status cells,
//   "Menu"   the animation menu                     } set by the host (TQChannelListStatusCell)
//
// It edits a channel's value at the current time, switches curves on and off, keeps the
// selection of the list and of the editor's items in step, and tells the status cells where
// the pointer is.
//
// Start: construct, then setMainCurveEditorController and setOutlineView (the two outlets),
// then awakeFromNib, which builds the formatters and the cells of the columns the list has
// and makes this the list's data source and delegate. The editor and the list are not owned
// and must outlive this controller, or be disconnected first.
//
// Nothing here holds a channel across user actions: rows hold items, and an item resolves its
// channel at each use, so a channel that vanished turns each operation on its row into a
// no-op.

#include <cstdint>
#include <limits>
#include <memory>
#include <optional>
#include <string>

#include "platform/ui/RWNumberFormatter.h"
#include "platform/ui/RWOutlineView.h"
#include "src/channellist/TQDecibelFormatter.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/editor/TQCurveEditorListOutlets.h"
#include "src/panels/TQFormatters.h"

class TQCurveEditorCtrl;
class TQCurveEditorChannelList;
class TQCurveEditorScrubberCell;

class TQCurveEditorListController : public RWOutlineViewDataSource,
                                    public RWOutlineViewDelegate,
                                    public TQEditorChannelListController,
                                    public RWActionTarget {
public:
    // The column identifiers.
    static constexpr const char* kNameColumn = "Name";
    static constexpr const char* kValueColumn = "Value";
    static constexpr const char* kShowColumn = "Show";
    static constexpr const char* kKeyColumn = "Key";
    static constexpr const char* kMenuColumn = "Menu";
    // No row, no part: what the pointer state holds when it is over none.
    static constexpr int64_t kNone = -2;
    // A value typed or scrubbed equal to the shown one within this changes nothing.
    static constexpr double kValueTolerance = 0.0000001;
    // The value cell's range outside a scrub: any double.
    static constexpr double kValueExtreme = std::numeric_limits<double>::max();
    static constexpr double kFontSize = 11.0;

    TQCurveEditorListController();
    ~TQCurveEditorListController() override;
    TQCurveEditorListController(const TQCurveEditorListController&) = delete;
    TQCurveEditorListController& operator=(const TQCurveEditorListController&) = delete;

    // ---- Outlets and set-up ----
    TQCurveEditorCtrl* mainCurveEditorController() const { return _mainCurveEditorController; }
    void setMainCurveEditorController(TQCurveEditorCtrl* editor) {
        _mainCurveEditorController = editor;
    }
    TQCurveEditorChannelList* outlineView() const { return _outlineView; }
    void setOutlineView(TQCurveEditorChannelList* list) { _outlineView = list; }
    // The formatters, the cells of "Name", "Value" and "Show", the columns' settings; this
    // controller becomes the list's data source and delegate.
    void awakeFromNib();

    // ---- TQEditorChannelListController ----
    // Reloads the rows; opens the folders that are not collapsed; each item's selection from
    // its row's; the tracking areas again.
    void update() override;
    // Redraws the "Value" and "Key" cells of the row.
    void refreshRowWithoutTitle(int64_t row) override;

    // ---- Data source ----
    int64_t numberOfChildrenOfItem(RWOutlineView& view, const RWOutlineItem& item) override;
    bool isItemExpandable(RWOutlineView& view, const RWOutlineItem& item) override;
    RWOutlineItem childOfItem(RWOutlineView& view, int64_t index,
                              const RWOutlineItem& item) override;
    RWObjectValue objectValueForTableColumn(RWOutlineView& view, const RWTableColumn& column,
                                            const RWOutlineItem& item) override;
    // "Show": the item on or off. "Value" on a channel: the typed text, read the way the row
    // shows it (a number, decibels, on and off), or a number; text that reads as no value
    // changes nothing, nor does a value equal to the shown one. A change is one value edit at
    // the current time, and posts kTQNotifyChannelsChanging.
    void setObjectValue(RWOutlineView& view, const RWObjectValue& value,
                        const RWTableColumn& column, const RWOutlineItem& item) override;
    // Rows of the "Name" column can be dragged (out of the list, to leave the set).
    bool canBeginDragInColumn(RWOutlineView& view, const RWTableColumn& column) const;

    // ---- Delegate ----
    void willDisplayCell(RWOutlineView& view, RWCell& cell, const RWTableColumn& column,
                         const RWOutlineItem& item) override;
    bool shouldEditTableColumn(RWOutlineView& view, const RWTableColumn& column,
                               const RWOutlineItem& item) override;
    bool shouldSelectItem(RWOutlineView& view, const RWOutlineItem& item) override;
    bool shouldShowCellExpansion(RWOutlineView& view, const RWTableColumn& column,
                                 const RWOutlineItem& item) override;
    std::optional<std::string> toolTipForCell(RWOutlineView& view, RWCell& cell, const CGRect& rect,
                                              const RWTableColumn& column,
                                              const RWOutlineItem& item,
                                              const CGPoint& mouseLocation) override;
    // The folder's collapsed mark follows the list.
    void itemDidExpand(RWOutlineView& view, const RWOutlineItem& item) override;
    void itemDidCollapse(RWOutlineView& view, const RWOutlineItem& item) override;
    // The editor's items follow the list's selection.
    void selectionDidChange(RWOutlineView& view) override;

    // ---- Scrubbing the "Value" column (the cell's calls, the cell as sender) ----
    // All three act on the first selected row, not on the row of the cell: a press in the
    // column selects its row first.
    void startScrubberAction(RWActionSender* sender);
    void setChannelValue(RWActionSender* sender);
    void endScrubberAction(RWActionSender* sender);

    // ---- Pointer state, for the status cells ----
    void setMouseInRow(int64_t row, int64_t part, const TQCurveEditorItemPtr& item);
    int64_t mouseInRow() const { return _mouseInRow; }
    int64_t mouseInPartIndex() const { return _mouseInPartIndex; }
    // The channel of the row under the pointer, resolved now (null for none).
    TQChannelBase* mouseInChan() const;
    // The row whose status cell was pressed; its channel resolved now.
    void setCellClickedChannel(const TQCurveEditorItemPtr& item) { _cellClickedItem = item; }
    TQChannelBase* cellClickedChannel() const;
    bool mouseDown() const { return _mouseDown; }
    void setMouseDown(bool down) { _mouseDown = down; }

    // ---- Commands, forwarded to the editor ----
    // copy: cut: paste: selectAll: selectNone: and resetSelection go to the editor; delete:
    // removes the selected channels from the set when the set takes changes by hand.
    bool performAction(const std::string& action, RWActionSender& sender) override;
    bool validateMenuItem(RWMenuItem& item) override;
    void resetSelection();
    void deleteSelected();

    // ---- Formatters ----
    // The formatter of a channel's value: on and off for a boolean channel, decibels for a
    // decibel channel, the number format otherwise (also with no channel).
    const RWFormatter& formatterForChannel(const TQChannelBase* channel) const;
    const RWNumberFormatter& valueFormatter() const { return _valueFormatter; }

    // An item of the list as the editor's item (null for the root).
    static TQCurveEditorItem* editorItem(const RWOutlineItem& item) {
        return static_cast<TQCurveEditorItem*>(item.get());
    }

private:
    // The item of the first selected row, held.
    TQCurveEditorItemPtr firstSelectedItem() const;
    // The row's value as the "Value" column shows it.
    std::string shownValue(const TQCurveEditorChannelItem& item) const;
    // The delegate's playhead (zero without a delegate).
    CMTime currentTime() const;
    // The "Key" and "Menu" cells follow the row's channel and the pointer.
    void prepareStatusCell(RWCell& cell, const TQCurveEditorItem& item, bool key);

    TQCurveEditorCtrl* _mainCurveEditorController = nullptr;  // not owned
    TQCurveEditorChannelList* _outlineView = nullptr;         // not owned
    RWNumberFormatter _valueFormatter;
    TQDecibelFormatter _decibelFormatter;
    TQBoolFormatter _boolFormatter;
    int64_t _mouseInRow = kNone;
    int64_t _mouseInPartIndex = kNone;
    TQCurveEditorItemPtr _mouseInItem;
    bool _mouseDown = false;
    TQCurveEditorItemPtr _cellClickedItem;
    // The item a scrub works on and the step it is, from its start to its end.
    class ScrubBracket;
    TQCurveEditorItemPtr _scrubbedItem;
    std::unique_ptr<ScrubBracket> _scrub;
};
