#include "src/channellist/TQCurveEditorListController.h"

#include <cmath>

#include "platform/channels/TQChannelTypes.h"
#include "platform/channels/TQFactory.h"
#include "src/channellist/TQChannelListStatusCell.h"
#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorScrubberCell.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/engine/TQEditBrackets.h"
#include "src/panels/TQColoredTextFieldCell.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// The list grows its columns with the view, the name column first (the uniform style).
constexpr int64_t kUniformColumnAutoresizing = 1;

TQCurveEditorItemPtr held(const RWOutlineItem& item) {
    return std::static_pointer_cast<TQCurveEditorItem>(item);
}

}  // namespace

// willChangeChannel and didChangeChannel of one channel around a scrub, inside its capture.
class TQCurveEditorListController::ScrubBracket {
public:
    ScrubBracket(TQCurveEditorAppDelegate* delegate, const TQChannelBase* channel)
        : _capture(delegate, "Undo Set Value"), _delegate(delegate), _channel(channel) {
        if (_delegate) _delegate->willChangeChannel(_channel);
    }
    ~ScrubBracket() {
        if (_delegate) _delegate->didChangeChannel(_channel);
    }
    ScrubBracket(const ScrubBracket&) = delete;
    ScrubBracket& operator=(const ScrubBracket&) = delete;

private:
    TQCaptureGuard _capture;
    TQCurveEditorAppDelegate* _delegate;  // not owned
    const TQChannelBase* _channel;        // announced only
};

TQCurveEditorListController::TQCurveEditorListController() = default;

TQCurveEditorListController::~TQCurveEditorListController() {
    // A scrub cut short by the list going away still closes its step.
    _scrub.reset();
    if (_outlineView) {
        if (_outlineView->dataSource() == this) _outlineView->setDataSource(nullptr);
        if (_outlineView->delegate() == this) _outlineView->setDelegate(nullptr);
    }
}

// ---- Set-up ---------------------------------------------------------------------------------

void TQCurveEditorListController::awakeFromNib() {
    _valueFormatter.setFormat(TQLocalizedString("Curve Editor Number Format"));
    _valueFormatter.setLocalizesFormat(true);
    TQCurveEditorChannelList* list = _outlineView;
    if (!list) return;
    if (const RWTableColumnPtr name = list->tableColumnWithIdentifier(kNameColumn)) {
        auto cell = std::make_shared<TQColoredTextFieldCell>(std::string());
        cell->setEditable(false);
        cell->setWraps(true);
        cell->setFontSize(kFontSize);
        name->setDataCell(cell);
        list->setOutlineTableColumn(name.get());
        list->setAutoresizesOutlineColumn(false);
        list->setColumnAutoresizingStyle(kUniformColumnAutoresizing);
    }
    if (const RWTableColumnPtr value = list->tableColumnWithIdentifier(kValueColumn)) {
        auto cell = std::make_shared<TQCurveEditorScrubberCell>(std::string());
        cell->setTarget(this);
        cell->setAction("setChannelValue:");
        cell->setMinValue(-kValueExtreme);
        cell->setMaxValue(kValueExtreme);
        cell->setEditable(true);
        cell->setAlignment(RWTextAlignment::Center);
        cell->setFontSize(kFontSize);
        value->setDataCell(cell);
        value->setEditable(true);
    }
    if (const RWTableColumnPtr show = list->tableColumnWithIdentifier(kShowColumn)) {
        auto cell = std::make_shared<RWButtonCell>(std::string());
        cell->setButtonType(RWButtonCell::kSwitchButton);
        cell->setBezelStyle(RWButtonCell::kRegularSquareBezelStyle);
        cell->setControlSize(RWButtonCell::kSmallControlSize);
        cell->setEditable(false);
        show->setDataCell(cell);
    }
    // "Key" and "Menu" keep the cells the host gave them (the animation status cells).
    list->setDataSource(this);
    list->setDelegate(this);
}

// ---- Reloading ------------------------------------------------------------------------------

void TQCurveEditorListController::update() {
    TQCurveEditorChannelList* list = _outlineView;
    if (!list) return;
    list->reloadData();
    // Read before the folders open: rows below an opened folder are then compared with their
    // old numbers. That is how the list has always matched items to rows after a reload.
    const RWIndexSet selected = list->selectedRowIndexes();
    for (int64_t row = 0; row < list->numberOfRows(); ++row) {
        const TQCurveEditorItemPtr item = held(list->itemAtRow(row));
        if (!item || !item->channelBase()) continue;
        auto* folder = dynamic_cast<TQCurveEditorFolderItem*>(item.get());
        if (folder && !folder->isCollapsed()) list->expandItem(item.get());
        item->select(selected.containsIndex(row) ? 1 : 0);
    }
    list->resetCursorRects();
}

void TQCurveEditorListController::refreshRowWithoutTitle(int64_t row) {
    TQCurveEditorChannelList* list = _outlineView;
    if (!list) return;
    for (const char* identifier : {kValueColumn, kKeyColumn}) {
        const int64_t column = list->columnWithIdentifier(identifier);
        if (column >= 0) list->setNeedsDisplayInRect(list->frameOfCellAtColumn(column, row));
    }
}

// ---- Data source ----------------------------------------------------------------------------

int64_t TQCurveEditorListController::numberOfChildrenOfItem(RWOutlineView&,
                                                            const RWOutlineItem& item) {
    if (!item)
        return _mainCurveEditorController ? _mainCurveEditorController->numberOfRootItems() : 0;
    if (auto* folder = dynamic_cast<TQCurveEditorFolderItem*>(editorItem(item)))
        return folder->numberOfChildren();
    return 0;
}

bool TQCurveEditorListController::isItemExpandable(RWOutlineView&, const RWOutlineItem& item) {
    auto* folder = dynamic_cast<TQCurveEditorFolderItem*>(editorItem(item));
    return folder && folder->hasChildren();
}

RWOutlineItem TQCurveEditorListController::childOfItem(RWOutlineView&, int64_t index,
                                                       const RWOutlineItem& item) {
    const TQCurveSetPtr set =
        _mainCurveEditorController ? _mainCurveEditorController->selectedCurveSet() : nullptr;
    if (!set || index < 0) return nullptr;
    if (!item) {
        if (_mainCurveEditorController->numberOfRootItems() == 0) return nullptr;
        return set->rootItemAtIndex(static_cast<uint32_t>(index));
    }
    if (dynamic_cast<TQCurveEditorChannelItem*>(editorItem(item))) return nullptr;
    return set->childrenAtIndex(static_cast<uint32_t>(index), held(item));
}

std::string TQCurveEditorListController::shownValue(const TQCurveEditorChannelItem& item) const {
    const TQChannel* channel = item.channel();
    const RWFormatter& formatter = formatterForChannel(channel);
    // A flag shows its own value; anything else in display units.
    const double value = &formatter == &_boolFormatter
                             ? item.currentValue()
                             : item.currentValue() * item.conversionFactor();
    return formatter.stringForObjectValue(value).value_or(std::string());
}

RWObjectValue TQCurveEditorListController::objectValueForTableColumn(RWOutlineView&,
                                                                     const RWTableColumn& column,
                                                                     const RWOutlineItem& item) {
    const TQCurveEditorItem* editor = editorItem(item);
    if (!editor) return {};
    const std::string& id = column.identifier();
    // The name whole: the cell cuts a name too long for the column at its tail.
    if (id == kNameColumn) return RWObjectValue(editor->simpleName());
    if (id == kValueColumn)
        if (auto* channelItem = dynamic_cast<const TQCurveEditorChannelItem*>(editor))
            return RWObjectValue(shownValue(*channelItem));
    return {};
}

void TQCurveEditorListController::setObjectValue(RWOutlineView&, const RWObjectValue& object,
                                                 const RWTableColumn& column,
                                                 const RWOutlineItem& item) {
    const TQCurveEditorItemPtr target = held(item);
    TQCurveEditorCtrl* editor = _mainCurveEditorController;
    if (!target) return;
    if (column.identifier() == kShowColumn) {
        target->enableItem(object.intValue() != 0 ? 1 : 0);
        if (editor) editor->_refreshViewAndBrowser();
        return;
    }
    if (column.identifier() != kValueColumn) return;
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(target.get());
    TQChannel* channel = channelItem ? channelItem->channel() : nullptr;
    if (!channel) return;
    const RWFormatter& formatter = formatterForChannel(channel);
    // Equal at the precision shown: the present value is read back from the shown text.
    RWObjectValue present;
    formatter.getObjectValue(&present, shownValue(*channelItem), nullptr);
    RWObjectValue typed = object;
    if (const std::string* text = object.string())
        if (!formatter.getObjectValue(&typed, *text, nullptr)) return;
    const double value = typed.doubleValue() / channelItem->conversionFactor();
    // The present value is in display units and the new one in channel units: the two have
    // always been compared so, and a factor other than 1 keeps that difference.
    if (!std::isfinite(value) || std::fabs(value - present.doubleValue()) < kValueTolerance) return;
    TQCurveEditorAppDelegate* delegate = editor ? editor->appDelegate() : nullptr;
    channel->beginValueEdit(TQLocalizedString("Undo Set Value"));
    {
        const TQChannelEditGuard announce(delegate, channel);
        channelItem->setCurrentValue(value);
    }
    if (editor) editor->_refreshViewAndBrowser();
    if (delegate) delegate->postNotification(kTQNotifyChannelsChanging);
}

bool TQCurveEditorListController::canBeginDragInColumn(RWOutlineView&,
                                                       const RWTableColumn& column) const {
    return column.identifier() == kNameColumn;
}

// ---- Delegate -------------------------------------------------------------------------------

CMTime TQCurveEditorListController::currentTime() const {
    TQCurveEditorAppDelegate* delegate =
        _mainCurveEditorController ? _mainCurveEditorController->appDelegate() : nullptr;
    return delegate ? delegate->currentTime() : kCMTimeZero;
}

void TQCurveEditorListController::prepareStatusCell(RWCell& cell, const TQCurveEditorItem& item,
                                                    bool key) {
    auto* status = dynamic_cast<TQChannelListStatusCell*>(&cell);
    TQChannelBase* channel = item.channelBase();
    if (!status || !channel) return;
    if (channel->getChannelRoot()) {
        // Setting the cell's channel asks for no redraw of the list: the list is drawing.
        const TQCurveEditorChannelList::IgnoreNeedsDisplay quiet(_outlineView);
        status->updateChannel(channel, currentTime());
    }
    const TQChannelBase* hovered = mouseInChan();
    const bool over = hovered && hovered == status->associatedChannel();
    status->setIsMouseOverRow(over);
    status->setMouseOver(over);
    if (!key) return;
    status->setMouseOverLocation(over ? _mouseInPartIndex : 0);
    status->setMouseDownLocation(over && _mouseDown ? _mouseInPartIndex : 0);
}

void TQCurveEditorListController::willDisplayCell(RWOutlineView&, RWCell& cell,
                                                  const RWTableColumn& column,
                                                  const RWOutlineItem& item) {
    const TQCurveEditorItem* editor = editorItem(item);
    if (!editor || !editor->channelBase()) return;
    const std::string& id = column.identifier();
    const auto* channelItem = dynamic_cast<const TQCurveEditorChannelItem*>(editor);
    if (id == kShowColumn) {
        if (auto* button = dynamic_cast<RWButtonCell*>(&cell)) {
            button->setAllowsMixedState(!channelItem);
            button->setState(channelItem ? (editor->isEnabledItem() != 0 ? RWOnState : RWOffState)
                                         : editor->isEnabledItem());
        }
    } else if (id == kKeyColumn || id == kMenuColumn) {
        prepareStatusCell(cell, *editor, id == kKeyColumn);
    } else if (id == kNameColumn) {
        if (auto* name = dynamic_cast<TQColoredTextFieldCell*>(&cell)) {
            name->setDisplayBox(channelItem != nullptr);
            if (channelItem) {
                const GDColor c =
                    TQCurveEditorViewBase::getColorForIndex(channelItem->colorIndex());
                name->setFillColor(c.red, c.green, c.blue, c.alpha);
            }
        }
    } else if (id == kValueColumn) {
        if (auto* value = dynamic_cast<TQCurveEditorScrubberCell*>(&cell))
            value->setShowCell(editor->channel() != nullptr);
    }
}

bool TQCurveEditorListController::shouldEditTableColumn(RWOutlineView&, const RWTableColumn& column,
                                                        const RWOutlineItem& item) {
    const TQCurveEditorItem* editor = editorItem(item);
    return column.identifier() == kValueColumn && editor && editor->channel();
}

bool TQCurveEditorListController::shouldSelectItem(RWOutlineView&, const RWOutlineItem&) {
    return true;
}

bool TQCurveEditorListController::shouldShowCellExpansion(RWOutlineView&, const RWTableColumn&,
                                                          const RWOutlineItem&) {
    return false;
}

std::optional<std::string> TQCurveEditorListController::toolTipForCell(RWOutlineView&, RWCell&,
                                                                       const CGRect&,
                                                                       const RWTableColumn& column,
                                                                       const RWOutlineItem& item,
                                                                       const CGPoint&) {
    const TQCurveEditorItem* editor = editorItem(item);
    if (column.identifier() != kNameColumn || !editor || !editor->channelBase())
        return std::nullopt;
    return editor->simpleName();
}

void TQCurveEditorListController::itemDidExpand(RWOutlineView&, const RWOutlineItem& item) {
    if (auto* folder = dynamic_cast<TQCurveEditorFolderItem*>(editorItem(item)))
        folder->collapse(false);
}

void TQCurveEditorListController::itemDidCollapse(RWOutlineView&, const RWOutlineItem& item) {
    if (auto* folder = dynamic_cast<TQCurveEditorFolderItem*>(editorItem(item)))
        folder->collapse(true);
}

void TQCurveEditorListController::selectionDidChange(RWOutlineView& view) {
    TQCurveEditorCtrl* editor = _mainCurveEditorController;
    if (!editor) return;
    editor->deselectAllChannels();
    const RWIndexSet& rows = view.selectedRowIndexes();
    if (rows.empty()) return;
    editor->redrawCurveEditor();
    // Held: selecting an item may not drop it, but the walk must not depend on that.
    const RWIndexSet walk = rows;
    for (int64_t row : walk)
        if (const TQCurveEditorItemPtr item = held(view.itemAtRow(row))) item->select(1);
}

// ---- Scrubbing ------------------------------------------------------------------------------

TQCurveEditorItemPtr TQCurveEditorListController::firstSelectedItem() const {
    if (!_outlineView) return nullptr;
    return held(_outlineView->itemAtRow(_outlineView->selectedRowIndexes().firstIndex()));
}

const RWFormatter& TQCurveEditorListController::formatterForChannel(
    const TQChannelBase* channel) const {
    const TQFactory* factory = channel ? channel->getFactory() : nullptr;
    if (factory && factory->getIdentifier() == kTQChannelBoolFactoryId) return _boolFormatter;
    if (dynamic_cast<const TQChannelDecibel*>(channel)) return _decibelFormatter;
    return _valueFormatter;
}

void TQCurveEditorListController::startScrubberAction(RWActionSender* sender) {
    auto* cell = dynamic_cast<RWScrubberCell*>(sender);
    const TQCurveEditorItemPtr item = firstSelectedItem();
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
    TQChannel* channel = channelItem ? channelItem->channel() : nullptr;
    if (!cell || !channel) return;
    const double factor = channelItem->conversionFactor();
    double low = 0.0, high = 0.0;
    channel->getImpl()->getRangeMin(&low);
    channel->getImpl()->getRangeMax(&high);
    cell->setMinValue(low * factor);
    cell->setMaxValue(high * factor);
    const TQChannelInfo& info = *channel->getInfo();
    // A channel that leaves its tick spacing to the view scrubs by its nudge step.
    const double tick = info.tickStep > 0.0 ? info.tickStep : info.valueStep;
    cell->setCoarseIncrement(tick * 10.0 * factor);
    cell->setNormalIncrement(tick * factor);
    cell->setFineIncrement(info.valueStep * factor);
    // A flag is scrubbed as the flag it is (the cast, as the scrubber has always decided).
    cell->setFormatter(dynamic_cast<TQChannelBool*>(channel) ? &_boolFormatter
                       : dynamic_cast<TQChannelDecibel*>(channel)
                           ? static_cast<const RWFormatter*>(&_decibelFormatter)
                           : &_valueFormatter);
    TQCurveEditorAppDelegate* delegate =
        _mainCurveEditorController ? _mainCurveEditorController->appDelegate() : nullptr;
    if (delegate) delegate->postNotification(kTQNotifyChannelsChanged);
    _scrubbedItem = item;
    _scrub = std::make_unique<ScrubBracket>(delegate, channel);
}

void TQCurveEditorListController::setChannelValue(RWActionSender* sender) {
    auto* cell = dynamic_cast<RWCell*>(sender);
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(_scrubbedItem.get());
    TQChannel* channel = channelItem ? channelItem->channel() : nullptr;
    if (!cell || !channel || !_scrub) return;
    TQCurveEditorAppDelegate* delegate = _mainCurveEditorController->appDelegate();
    if (delegate) delegate->willSetChannelValue(channel);
    channelItem->setCurrentValue(cell->doubleValue() / channelItem->conversionFactor());
    if (delegate) delegate->postNotification(kTQNotifyChannelsChanging);
    // The post may have rebuilt the set: the channel is resolved again for the closing call.
    if (delegate) delegate->didSetChannelValue(channelItem->channel());
}

void TQCurveEditorListController::endScrubberAction(RWActionSender* sender) {
    if (auto* cell = dynamic_cast<RWScrubberCell*>(sender)) {
        cell->setMinValue(-kValueExtreme);
        cell->setMaxValue(kValueExtreme);
        cell->setFormatter(nullptr);
    }
    if (!_scrub) return;
    TQCurveEditorAppDelegate* delegate = _mainCurveEditorController->appDelegate();
    if (delegate) delegate->postNotification(kTQNotifyChannelsChanged);
    _scrub.reset();
    _scrubbedItem.reset();
}

// ---- Pointer state --------------------------------------------------------------------------

void TQCurveEditorListController::setMouseInRow(int64_t row, int64_t part,
                                                const TQCurveEditorItemPtr& item) {
    _mouseInRow = row;
    _mouseInPartIndex = part;
    _mouseInItem = item;
}

TQChannelBase* TQCurveEditorListController::mouseInChan() const {
    return _mouseInItem ? _mouseInItem->channelBase() : nullptr;
}

TQChannelBase* TQCurveEditorListController::cellClickedChannel() const {
    return _cellClickedItem ? _cellClickedItem->channelBase() : nullptr;
}

// ---- Commands -------------------------------------------------------------------------------

void TQCurveEditorListController::resetSelection() {
    if (_mainCurveEditorController) _mainCurveEditorController->resetSelection();
}

void TQCurveEditorListController::deleteSelected() {
    TQCurveEditorCtrl* editor = _mainCurveEditorController;
    if (editor && editor->canModifySelectedCurveSet() &&
        editor->removeSelectedChannelFromSelectedCurveSet())
        update();
}

bool TQCurveEditorListController::performAction(const std::string& action, RWActionSender& sender) {
    if (action == "startScrubberAction:") {
        startScrubberAction(&sender);
        return true;
    }
    if (action == "setChannelValue:") {
        setChannelValue(&sender);
        return true;
    }
    if (action == "endScrubberAction:") {
        endScrubberAction(&sender);
        return true;
    }
    if (action == "delete:") {
        deleteSelected();
        return true;
    }
    if (action == "resetSelection:") {
        resetSelection();
        return true;
    }
    TQCurveEditorCtrl* editor = _mainCurveEditorController;
    if (!editor) return false;
    if (action == "selectAll:") {
        editor->selectAll(&sender);
        return true;
    }
    if (action == "selectNone:") {
        editor->selectNone(&sender);
        return true;
    }
    // copy:, cut:, paste: and anything else the editor knows.
    return editor->performAction(action, sender);
}

bool TQCurveEditorListController::validateMenuItem(RWMenuItem& item) {
    return _mainCurveEditorController ? _mainCurveEditorController->validateMenuItem(item) : false;
}
