// The controller's core: lifecycle, channels into sets, queries, sampling, unit conversion,
// the four modify brackets and view support. The context menus are in TQCurveEditorCtrlMenus.cpp.

#include "src/engine/TQCurveEditorCtrlBase.h"

#include <algorithm>
#include <cfloat>
#include <cstdio>

#include "platform/channels/TQChannelTypes.h"
#include "src/engine/TQEditBrackets.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

TQCurveEditorCtrlBase::TQCurveEditorCtrlBase() = default;
TQCurveEditorCtrlBase::~TQCurveEditorCtrlBase() = default;

void TQCurveEditorCtrlBase::setView(TQCurveEditorViewBase* view) {
    if (_view && _view != view && _view->getController() == this) _view->setController(nullptr);
    _view = view;
}

// ---- Lifecycle and simple state ---------------------------------------------------------

void TQCurveEditorCtrlBase::init() {
    _selectedCurveSet.reset();
    _lastFrameTextUpdateTime = false;
    _snapshotChannels = false;
    _ignoreHiddenChannels = false;
    _iLastDragDirection = 0;
    _keys.clear();
    buildKeyframeMenu();
    buildCurveMenu();
    buildTangentMenu();
    buildDefaultMenu();
}

void TQCurveEditorCtrlBase::setCurrentTool(TQTool tool) {
    _currentTool = tool;
    if (_view) _view->currentToolChanged();
}

void TQCurveEditorCtrlBase::redrawCurveEditor() {
    if (_view) _view->setNeedsDisplay(1);
}

void TQCurveEditorCtrlBase::updateUI() {
    if (_view) {
        _view->setAllOriginalCurveDirty(1);
        _view->computeVerticalTickMarks();
    }
    redrawCurveEditor();
}

void TQCurveEditorCtrlBase::dumpKeypoints() const {
    std::printf("Keypoints in selection\n");
    std::printf("----------------------\n");
    int index = 0;
    for (const TQKeyframePtr& key : _keys) {
        const double time = key ? CMTimeGetSeconds(key->u()) : 0.0;
        const double value = key ? key->v() : 0.0;
        std::printf("index: %d    time: %f    value: %f\n", index++, time, value);
    }
    std::printf("\n");
}

// ---- Lookup helpers ---------------------------------------------------------------------

TQCurveEditorChannelItem* TQCurveEditorCtrlBase::itemForEntry(const TQCurveSelection& entry) const {
    if (!_selectedCurveSet) return nullptr;
    TQCurveEditorItemPtr item = _selectedCurveSet->itemWithIdentifier(entry.getCurveId());
    // The set owns its items; the pointer lives as long as the item stays in the set, which
    // is for the rest of the calling operation.
    return dynamic_cast<TQCurveEditorChannelItem*>(item.get());
}

TQCurveEditorChannelItem* TQCurveEditorCtrlBase::itemForChannel(
    const TQChannelBase* channel) const {
    if (!_selectedCurveSet || !channel) return nullptr;
    TQCurveEditorItemPtr item = _selectedCurveSet->itemWithChannel(channel);
    return dynamic_cast<TQCurveEditorChannelItem*>(item.get());
}

TQChannel* TQCurveEditorCtrlBase::channelForEntry(const TQCurveSelection& entry) const {
    TQCurveEditorChannelItem* item = itemForEntry(entry);
    return item ? item->channel() : nullptr;
}

TQCompoundChannel* TQCurveEditorCtrlBase::linkedParent(const TQChannel* channel) const {
    if (!channel) return nullptr;
    TQChannelFolder* parent = channel->getParent();
    if (!parent || !parent->isCompoundChannel()) return nullptr;
    if (!_linked && !parent->testFoldFlag(kTQFoldFlagLinked)) return nullptr;
    return static_cast<TQCompoundChannel*>(parent);
}

void TQCurveEditorCtrlBase::markComponentsDirty(const TQCompoundChannel& compound) const {
    const std::vector<TQChannelBase*>* children = compound.getChildren();
    if (!children) return;
    for (TQChannelBase* child : *children) markDirty(itemForChannel(child));
}

uint32_t TQCurveEditorCtrlBase::newItemSampleCount() const {
    const double width = _view ? _view->width() : 0.0;
    return static_cast<uint32_t>(std::max(0.0, width + 1.0));
}

TQCurveSelectionList* TQCurveEditorCtrlBase::viewSelection() const {
    return _view ? _view->getSelection() : nullptr;
}

void TQCurveEditorCtrlBase::postNotification(TQNotificationWord word) const {
    if (_pAppDelegate) _pAppDelegate->postNotification(word);
}

// ---- Channels into sets -----------------------------------------------------------------

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendCHChannelToSelectedCurveSet(
    const CHChannelObject* channel) {
    return appendChannelToCurveSet(channel ? dynamic_cast<TQChannel*>(channel->tqChannel())
                                           : nullptr);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendCHFolderToSelectedCurveSet(
    const CHChannelObject* folder) {
    return appendFolderToCurveSet(folder ? dynamic_cast<TQChannelFolder*>(folder->tqChannel())
                                         : nullptr);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendCHChannel(const CHChannelObject* channel,
                                                            const TQCurveSetPtr& toCurveSet) {
    return appendChannel(channel ? dynamic_cast<TQChannel*>(channel->tqChannel()) : nullptr,
                         toCurveSet);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendCHFolder(const CHChannelObject* folder,
                                                           const TQCurveSetPtr& toCurveSet) {
    return appendFolder(folder ? dynamic_cast<TQChannelFolder*>(folder->tqChannel()) : nullptr,
                        toCurveSet);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendChannelToCurveSet(TQChannel* channel) {
    return appendChannel(channel, _selectedCurveSet);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendFolderToCurveSet(TQChannelFolder* folder) {
    return appendFolder(folder, _selectedCurveSet);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendChannel(TQChannel* channel,
                                                          const TQCurveSetPtr& toCurveSet) {
    TQCurveEditorItemPtr item = appendChannelItem(channel, toCurveSet);
    if (item) postNotification(kTQNotifyCurveSetContentChanged);
    return item;
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendChannelItem(TQChannel* channel,
                                                              const TQCurveSetPtr& toCurveSet) {
    auto* mutableSet = dynamic_cast<TQCurveSetMutable*>(toCurveSet.get());
    if (!channel || !mutableSet) return nullptr;
    auto item = std::make_shared<TQCurveEditorChannelItem>();
    item->initWithChannel(channel, newItemSampleCount(), _pAppDelegate,
                          static_cast<char>(_ignoreHiddenChannels));
    // No isValid test at this level: the set's appendItem decides.
    mutableSet->appendItem(item);
    return item;
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::appendFolder(TQChannelFolder* folder,
                                                         const TQCurveSetPtr& toCurveSet) {
    if (!folder || !toCurveSet) return nullptr;
    TQCurveEditorItemPtr last;
    if (const std::vector<TQChannelBase*>* children = folder->getChildren()) {
        // Copy: appending may not change the tree, but a host's notify may.
        const std::vector<TQChannelBase*> snapshot = *children;
        for (TQChannelBase* child : snapshot) {
            if (!child) continue;
            if (auto* c = dynamic_cast<TQChannel*>(child)) {
                // The set's own append, which posts nothing: the level posts once below.
                if (TQCurveEditorItemPtr made = appendChannelItem(c, toCurveSet)) last = made;
            } else if (auto* f = dynamic_cast<TQChannelFolder*>(child)) {
                if (TQCurveEditorItemPtr made = appendFolder(f, toCurveSet)) last = made;
            }
        }
    }
    // Once for each level of the recursion.
    postNotification(kTQNotifyCurveSetContentChanged);
    updateUI();
    return last;
}

bool TQCurveEditorCtrlBase::removeChannelWithIdentifier(uint32_t identifier,
                                                        const TQCurveSetPtr& fromCurveSet) {
    if (!fromCurveSet) return false;
    // The set is not read after the notification, which may replace the selected set (and so
    // what `fromCurveSet` refers to).
    const bool removed = fromCurveSet->removeItemWithIdentifier(identifier);
    postNotification(kTQNotifyCurveSetContentChanged);
    updateUI();
    return removed;
}

bool TQCurveEditorCtrlBase::removeSelectedChannelFromSelectedCurveSet() {
    const TQCurveSetPtr keep = _selectedCurveSet;
    auto* mutableSet = dynamic_cast<TQCurveSetMutable*>(keep.get());
    if (!mutableSet) return false;
    if (_pAppDelegate)
        _pAppDelegate->addToUndo(this, kTQUndoTypeController, kTQUndoActionRemoveChannel,
                                 TQLocalizedString("Curve Editor Undo Remove Channel"));
    const bool removed = mutableSet->removeSelectedItem();
    postNotification(kTQNotifyCurveSetContentChanged);
    updateUI();
    return removed;
}

void TQCurveEditorCtrlBase::refreshSelectedCurveSet() {
    if (_selectedCurveSet) {
        const double width = _view ? _view->width() : 0.0;
        _selectedCurveSet->refresh(static_cast<uint32_t>(std::max(0.0, width)), _snapshotChannels);
    }
    if (_view) {
        _view->getSelection()->reset();
        _view->resetBoxDeformation();
    }
    updateUI();
}

void TQCurveEditorCtrlBase::resetSelection() {
    if (_view) _view->getSelection()->reset();
}

// ---- Queries ----------------------------------------------------------------------------

void TQCurveEditorCtrlBase::setSelectedCurveSet(const TQCurveSetPtr& set) {
    _selectedCurveSet = set;
    postNotification(kTQNotifyCurveSetContentChanged);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::channelItemWithIdentifier(uint32_t identifier) const {
    return _selectedCurveSet ? _selectedCurveSet->itemWithIdentifier(identifier) : nullptr;
}

uint32_t TQCurveEditorCtrlBase::numberOfEnabledChannels() const {
    return _selectedCurveSet ? _selectedCurveSet->numberOfEnabledItems() : 0;
}

uint32_t TQCurveEditorCtrlBase::numberOfSelectedChannels() const {
    return _selectedCurveSet ? _selectedCurveSet->numberOfSelectedItems() : 0;
}

uint32_t TQCurveEditorCtrlBase::numberOfChannelItems() const {
    return _selectedCurveSet ? _selectedCurveSet->numberOfChannelItems() : 0;
}

uint32_t TQCurveEditorCtrlBase::numberOfRootItems() const {
    return _selectedCurveSet ? _selectedCurveSet->numberOfItems() : 0;
}

uint32_t TQCurveEditorCtrlBase::numberOfSelectedRootItems() const {
    return _selectedCurveSet ? _selectedCurveSet->numberOfSelectedRootItems() : 0;
}

std::vector<TQCurveEditorItemPtr> TQCurveEditorCtrlBase::selectedChannels() const {
    return _selectedCurveSet ? _selectedCurveSet->selectedItems()
                             : std::vector<TQCurveEditorItemPtr>{};
}

std::vector<TQCurveEditorFolderItemPtr> TQCurveEditorCtrlBase::selectedRoots() const {
    return _selectedCurveSet ? _selectedCurveSet->selectedRootItems()
                             : std::vector<TQCurveEditorFolderItemPtr>{};
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::selectedChannel() const {
    return _selectedCurveSet ? _selectedCurveSet->selectedItem() : nullptr;
}

void TQCurveEditorCtrlBase::deselectAllChannels() {
    if (_selectedCurveSet) _selectedCurveSet->deselectAll();
}

void TQCurveEditorCtrlBase::selectAll(void* sender) {
    if (_view) _view->selectAll(sender);
}

void TQCurveEditorCtrlBase::selectNone(void* sender) {
    if (_view) _view->selectNone(sender);
}

TQCurveEditorItemPtr TQCurveEditorCtrlBase::getFirstChannel() const {
    if (!_selectedCurveSet) return nullptr;
    const uint32_t n = _selectedCurveSet->numberOfChannelItems();
    for (uint32_t i = 0; i < n; ++i) {
        TQCurveEditorItemPtr item = _selectedCurveSet->channeItemAtIndex(i);
        if (item && item->isSelected() && item->isEnabledItem() != 0) return item;
    }
    return nullptr;
}

bool TQCurveEditorCtrlBase::canModifySelectedAnyCurve() const {
    for (const TQCurveEditorItemPtr& item : selectedChannels()) {
        if (!item) continue;
        const TQChannelBase* channel = item->channelBase();
        if (channel && !channel->isLocked(true)) return true;
    }
    return false;
}

TQCompoundChannel* TQCurveEditorCtrlBase::getChannelsLinkedParent(const TQChannel* channel) const {
    if (!channel) return nullptr;
    TQChannelFolder* parent = channel->getParent();
    if (!parent || !parent->isCompoundChannel() || !parent->testFoldFlag(kTQFoldFlagLinked))
        return nullptr;
    return static_cast<TQCompoundChannel*>(parent);
}

// ---- Sampling and reading ---------------------------------------------------------------

void TQCurveEditorCtrlBase::getSamples(TQCurveEditorItem* item, char flag, CMTime minU,
                                       CMTime resolution, const CMTime** samplesU,
                                       const double** samplesV, unsigned* number) {
    if (samplesU) *samplesU = nullptr;
    if (samplesV) *samplesV = nullptr;
    // The caller's item may be a stale copy: the one in the selected set is authoritative.
    TQCurveEditorChannelItem* own = nullptr;
    if (item && _selectedCurveSet) {
        TQCurveEditorItemPtr found = _selectedCurveSet->itemWithIdentifier(item->channelId());
        own = dynamic_cast<TQCurveEditorChannelItem*>(found.get());
    }
    if (!own) {
        if (number) *number = 0;
        return;
    }
    // The count goes out as the arrays bound it: a new count waits for the next fetch.
    if ((flag & 1) == 0) {
        if (own->originalCurveDirty()) {
            // A caller passes the count it wants filled in; without one, keep the item's.
            if (number) own->setNumberOfSamples(*number);
            own->refreshOriginalCurve(minU, resolution);
        }
        if (samplesU) *samplesU = own->samplesU();
        if (samplesV) *samplesV = own->samplesV();
        if (number) *number = own->readableSamples();
    } else {
        if (own->processedCurveDirty()) {
            if (number) own->setNumberOfProcessedSamples(*number);
            own->refreshProcessedCurve(minU, resolution);
        }
        if (samplesU) *samplesU = own->processedSamplesU();
        if (samplesV) *samplesV = own->processedSamplesV();
        if (number) *number = own->readableProcessedSamples();
    }
}

std::vector<TQKeyframeHandle> TQCurveEditorCtrlBase::getKeypoints(uint32_t identifier) {
    auto* item =
        dynamic_cast<TQCurveEditorChannelItem*>(channelItemWithIdentifier(identifier).get());
    if (!item) return {};
    return *item->keypoints();
}

CGPoint TQCurveEditorCtrlBase::getKeypointPosition(const TQCurveSelection* entry) const {
    if (!entry) return CGPointZero;
    TQCurveEditorChannelItem* item = itemForEntry(*entry);
    TQChannel* channel = item ? item->channel() : nullptr;
    if (!channel) return CGPointZero;
    CMTime time = kCMTimeInvalid;
    double value = 0.0;
    channel->getKeyframe(entry->getHandle(), &time, &value);
    const double u = CMTimeGetSeconds(BN_CMTimeSaferAdd(time, channel->timeOffset()));
    return CGPointMake(u, convertFromChannelCoords(item, value));
}

void TQCurveEditorCtrlBase::getSelectedVertex(const TQCurveSelection* entry, double* u,
                                              double* y) const {
    if (!entry || !entry->isKeypoint()) return;
    const CGPoint p = getKeypointPosition(entry);
    if (u) *u = p.x;
    if (y) *y = p.y;
}

bool TQCurveEditorCtrlBase::getSelected(TQCurveSelectionList* list, double* minX, double* maxX,
                                        double* minY, double* maxY) const {
    // The largest float, as the bounds have always started: callers compare against it.
    double lowX = FLT_MAX, highX = -FLT_MAX, lowY = FLT_MAX, highY = -FLT_MAX;
    bool counted = false;
    if (list && list->size() >= 2) {
        // From index 1 on: the primary entry is the one being dragged.
        for (uint32_t i = 1; i < list->size(); ++i) {
            const TQCurveSelectionPtr entry = list->selectionAtIndex(i);
            if (!entry || !entry->isKeypoint()) continue;
            TQCurveEditorChannelItem* item = itemForEntry(*entry);
            TQChannel* channel = item ? item->channel() : nullptr;
            CMTime time = kCMTimeInvalid;
            double value = 0.0;
            if (!channel || !channel->getKeyframe(entry->getHandle(), &time, &value)) continue;
            const double x = CMTimeGetSeconds(time);
            const double v = convertFromChannelCoords(item, value);
            lowX = std::min(lowX, x);
            highX = std::max(highX, x);
            lowY = std::min(lowY, v);
            highY = std::max(highY, v);
            counted = true;
        }
    }
    if (minX) *minX = lowX;
    if (maxX) *maxX = highX;
    if (minY) *minY = lowY;
    if (maxY) *maxY = highY;
    return counted;
}

void TQCurveEditorCtrlBase::setCurveInterpolation(const TQCurveSelection* entry,
                                                  uint32_t interpolation) {
    // No announcement to the channel here: the old behaviour, kept.
    editEntryChannel(entry, {.noteWillChange = false},
                     [&](const EntryChannel& e) { e.channel.setInterpolation(interpolation); });
}

// ---- Unit conversion --------------------------------------------------------------------

double TQCurveEditorCtrlBase::convertToChannelCoords(const TQCurveEditorItem* item,
                                                     double value) const {
    const auto* c = dynamic_cast<const TQCurveEditorChannelItem*>(item);
    if (!c) return value;
    return (value * c->scaleY() + c->offsetY()) / c->conversionFactor();
}

double TQCurveEditorCtrlBase::convertFromChannelCoords(const TQCurveEditorItem* item,
                                                       double value) const {
    const auto* c = dynamic_cast<const TQCurveEditorChannelItem*>(item);
    if (!c) return value;
    return (value * c->conversionFactor() - c->offsetY()) / c->scaleY();
}

// ---- Modify brackets --------------------------------------------------------------------

namespace {

// The distinct channels of the list's entries, in order of first appearance. Entries whose
// item or channel is gone are passed over. Small lists: a linear membership test is cheaper
// than hashing, and a drag announces at most a few dozen channels. Entries of one curve
// usually follow each other (a band takes them channel by channel), so a curve is looked up
// and tested again only where the curve changes.
template <class Lookup>
std::vector<const TQChannelBase*> gatherChannels(const TQCurveSelectionList& list,
                                                 Lookup&& lookup) {
    std::vector<const TQChannelBase*> channels;
    bool looked = false;
    uint32_t lastCurveId = 0;
    for (const TQCurveSelectionPtr& entry : list.getSelectionArray()) {
        if (!entry || (looked && entry->getCurveId() == lastCurveId)) continue;
        looked = true;
        lastCurveId = entry->getCurveId();
        const TQChannelBase* channel = lookup(*entry);
        if (!channel) continue;
        if (std::find(channels.begin(), channels.end(), channel) == channels.end())
            channels.push_back(channel);
    }
    return channels;
}

}  // namespace

void TQCurveEditorCtrlBase::announce(TQCurveSelectionList* list, ChannelAnnouncement call,
                                     bool lastFirst) {
    if (!list || !_pAppDelegate) return;
    const auto lookup = [this](const TQCurveSelection& e) { return channelForEntry(e); };
    const std::vector<const TQChannelBase*> channels = gatherChannels(*list, lookup);
    if (lastFirst) {
        for (auto it = channels.rbegin(); it != channels.rend(); ++it) (_pAppDelegate->*call)(*it);
    } else {
        for (const TQChannelBase* c : channels) (_pAppDelegate->*call)(c);
    }
}

void TQCurveEditorCtrlBase::willModify(TQCurveSelectionList* list) {
    announce(list, &TQCurveEditorAppDelegate::willChangeChannel, false);
}

void TQCurveEditorCtrlBase::didModify(TQCurveSelectionList* list) {
    announce(list, &TQCurveEditorAppDelegate::didChangeChannel, true);
}

void TQCurveEditorCtrlBase::willModifyValue(TQCurveSelectionList* list) {
    announce(list, &TQCurveEditorAppDelegate::willSetChannelValue, false);
}

void TQCurveEditorCtrlBase::didModifyValue(TQCurveSelectionList* list) {
    announce(list, &TQCurveEditorAppDelegate::didSetChannelValue, true);
}

void TQCurveEditorCtrlBase::performWithBracket(const char* undoKey, ListOperation operation) {
    TQCurveSelectionList* list = viewSelection();
    if (!list) return;
    validateSelection(list);
    {
        const TQEditBracket bracket(*this, list, undoKey);
        (this->*operation)(list);
    }
    postNotification(kTQNotifyChannelsChanged);
}

// ---- View support -----------------------------------------------------------------------

CGRect TQCurveEditorCtrlBase::getMaxViewVolume() const {
    double maximum = 0.0;
    double minimum = 0.0;
    if (_selectedCurveSet) {
        const std::vector<TQCurveEditorItemPtr> items = _selectedCurveSet->allItems();
        if (!items.empty()) {
            // The maximum starts at the smallest positive double, not the most negative one:
            // a set whose curves all lie below zero keeps its upper bound at about zero.
            maximum = DBL_MIN;
            minimum = DBL_MAX;
            for (const TQCurveEditorItemPtr& item : items) {
                auto* c = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
                if (!c) continue;
                double low = 0.0;
                double high = 0.0;
                c->extremes(&low, &high);
                maximum = std::max(maximum, convertFromChannelCoords(c, high));
                minimum = std::min(minimum, convertFromChannelCoords(c, low));
            }
        }
    }
    const CGRect current = _view ? _view->getCurrentViewVolume() : CGRectZero;
    const double padding = _view ? _view->getZoomPadding() : 0.0;
    const double h = current.size.height;
    const double top = std::max(current.origin.y + h, maximum + padding * h);
    const double bottom = std::min(current.origin.y, minimum - padding * h);
    return CGRectMake(current.origin.x, bottom, current.size.width, top - bottom);
}

void TQCurveEditorCtrlBase::magnifyGestureWithEvent(const RWEvent& event, double andFactor) {
    (void)event;
    if (_view) _view->zoomWithFactor(_view->zoomX() + andFactor * -0.5, 1.0);
}

bool TQCurveEditorCtrlBase::runValuePanel(TQCurveEditorValueWindow& window) {
    const RWModalResponse response = RWApplicationServices().modal->runModalForWindow(window);
    // The panel ends with 1 on OK and 0 on cancel; an aborted or stopped run (nothing could
    // be shown, or something else ended the run) is not an answer either.
    return response > 0;
}

void TQCurveEditorCtrlBase::showValueAtPoint(const CGPoint& point, RWWindow* inWindow,
                                             const CGRect& withRect) {
    TQCurveSelectionList* list = viewSelection();
    if (!list || list->empty()) return;
    const TQCurveSelectionPtr entry = list->selectionAtIndex(0);
    TQChannel* channel = entry ? channelForEntry(*entry) : nullptr;
    if (!channel || dynamic_cast<TQChannelBool*>(channel)) return;
    const TQKeyframeHandle handle = entry->getHandle();
    double value = 0.0;
    if (!channel->getKeyframe(handle, nullptr, &value)) return;
    const double displayScale = channel->getInfo()->displayScale;

    TQCurveEditorValueWindow window;
    window.setTitle("TQCurveEditorValueView");
    window.value = value * displayScale;
    window.location = point;
    window.parentRect = withRect;
    window.parentWindow = inWindow;
    if (!runValuePanel(window)) return;
    // The panel ran a modal loop: the channel is looked up again, and may have gone. This
    // writes outside any bracket and without a dirty mark, as it always has.
    const double typed = displayScale != 0.0 ? window.value / displayScale : window.value;
    editEntryChannel(entry.get(), {.markDirty = false},
                     [&](const EntryChannel& e) { e.channel.setKeyframeValue(handle, typed); });
}
