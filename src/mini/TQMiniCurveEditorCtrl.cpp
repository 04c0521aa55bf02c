#include "src/mini/TQMiniCurveEditorCtrl.h"

#include "src/engine/TQEditBrackets.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

struct ExtrapolationEntry {
    int64_t tag;
    const char* key;
};

constexpr ExtrapolationEntry kExtrapolationItems[] = {
    {kTQExtrapolationConstant, "Anim Menu Extrapolation Constant"},
    {kTQExtrapolationLinear, "Anim Menu Extrapolation Linear"},
    {kTQExtrapolationPingPong, "Anim Menu Extrapolation Ping Pong"},
    {kTQExtrapolationRepeat, "Anim Menu Extrapolation Repeat"},
    {kTQExtrapolationProgressive, "Anim Menu Extrapolation Progressive"},
};

constexpr const char* kPreExtrapolationAction = "menuSetCurvePreExtrapolation:";
constexpr const char* kPostExtrapolationAction = "menuSetCurvePostExtrapolation:";

void addExtrapolationSubmenu(RWMenu& menu, const char* titleKey, const char* action,
                             int64_t holderTag, RWActionTarget* target) {
    auto submenu = std::make_shared<RWMenu>(TQLocalizedString(titleKey));
    for (const ExtrapolationEntry& e : kExtrapolationItems) {
        RWMenuItemPtr item = submenu->addItemWithTitle(TQLocalizedString(e.key), action, "");
        item->setTarget(target);
        item->setTag(e.tag);
    }
    RWMenuItemPtr holder = menu.addItemWithTitle(TQLocalizedString(titleKey), "", "");
    holder->setTag(holderTag);
    menu.setSubmenuForItem(submenu, *holder);
}

}  // namespace

TQMiniCurveEditorCtrl::~TQMiniCurveEditorCtrl() {
    if (_view && _view->getController() == this) _view->setController(nullptr);
}

void TQMiniCurveEditorCtrl::initWithView(TQCurveEditorViewBase* view, TQChannelBase* channel) {
    init();
    _linked = true;
    _currentTool = TQTool::kEdit;
    _view = view;
    if (_view) _view->setController(this);
    _pAppDelegate = allocAppDelegate();

    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithName(TQLocalizedString("Curve Editor Curve Set Untitled"), _pAppDelegate);
    set->setIgnoreHiddenChannels(false);
    _selectedCurveSet = set;

    TQCurveEditorItem::resetColorIndex();
    if (auto* single = dynamic_cast<TQChannel*>(channel))
        appendChannelToCurveSet(single);
    else
        appendFolderToCurveSet(dynamic_cast<TQChannelFolder*>(channel));

    for (uint32_t i = 0; i < numberOfChannelItems(); ++i)
        if (auto* item = dynamic_cast<TQCurveEditorChannelItem*>(set->channeItemAtIndex(i).get()))
            item->setDrawProcessedCurve(0);
}

// ---- Menus ---------------------------------------------------------------------------------

void TQMiniCurveEditorCtrl::buildDefaultMenu() {
    TQCurveEditorCtrlBase::buildDefaultMenu();
    addExtrapolationSubmenu(*_defaultMenu, "Anim Menu Pre Extrapolation", kPreExtrapolationAction,
                            kPreExtrapolationItemTag, this);
    addExtrapolationSubmenu(*_defaultMenu, "Anim Menu Post Extrapolation", kPostExtrapolationAction,
                            kPostExtrapolationItemTag, this);
}

bool TQMiniCurveEditorCtrl::validateMenuItem(RWMenuItem& item) {
    if (item.action() == "delete:") return true;
    return TQCurveEditorCtrlBase::validateMenuItem(item);
}

bool TQMiniCurveEditorCtrl::validateDefaultMenuItem(RWMenuItem& item) {
    TQChannel* first = firstChannel();
    if (numberOfChannelItems() == 0 || !first) return false;
    unsigned direction = 0;
    if (item.action() == kPreExtrapolationAction)
        direction = kTQExtrapolationBefore;
    else if (item.action() == kPostExtrapolationAction)
        direction = kTQExtrapolationAfter;
    else
        return true;
    item.setState(item.tag() == static_cast<int64_t>(first->getExtrapolation(direction)) ? 1 : 0);
    return true;
}

TQChannel* TQMiniCurveEditorCtrl::firstChannel() const {
    if (!_selectedCurveSet) return nullptr;
    const TQCurveEditorItemPtr item = _selectedCurveSet->channeItemAtIndex(0);
    return item ? item->channel() : nullptr;
}

template <class Change>
void TQMiniCurveEditorCtrl::changeAllChannels(const char* undoKey, Change&& change) {
    if (!_selectedCurveSet) return;
    {
        TQCaptureGuard capture(_pAppDelegate, undoKey);
        const uint32_t count = numberOfChannelItems();
        if (count >= 2)
            if (TQChannel* first = firstChannel())
                if (TQChannelFolder* parent = first->getParent()) parent->noteWillChange(true);
        for (uint32_t i = 0; i < count; ++i) {
            const TQCurveEditorItemPtr held = _selectedCurveSet->channeItemAtIndex(i);
            auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get());
            TQChannel* channel = item ? item->channel() : nullptr;
            if (!channel) continue;  // vanished since the set was made
            channel->noteWillChange(true);
            change(*channel);
            markDirty(item);
        }
    }
    postNotification(kTQNotifyChannelsChanged);
}

void TQMiniCurveEditorCtrl::menuSetCurvePreExtrapolation(RWActionSender& sender) {
    const auto tag = static_cast<unsigned>(sender.tag());
    changeAllChannels("Undo Set Pre Extrapolation",
                      [tag](TQChannel& c) { c.setExtrapolation(tag, kTQExtrapolationBefore); });
}

void TQMiniCurveEditorCtrl::menuSetCurvePostExtrapolation(RWActionSender& sender) {
    const auto tag = static_cast<unsigned>(sender.tag());
    changeAllChannels("Undo Set Post Extrapolation",
                      [tag](TQChannel& c) { c.setExtrapolation(tag, kTQExtrapolationAfter); });
}

void TQMiniCurveEditorCtrl::menuLockChannel(RWActionSender&) {
    TQChannel* first = firstChannel();
    // Read once, before any channel changes: all follow the first.
    const bool lock = first ? !first->isLocked(true) : true;
    changeAllChannels("Undo Lock Keypoint", [lock](TQChannel& c) { c.setLocked(lock, true); });
}

void TQMiniCurveEditorCtrl::menuSetCurveInterpolation(RWActionSender& sender) {
    const int64_t tag = sender.tag();
    if (tag == kMixedInterpolationTag) return;
    changeAllChannels("Undo Set Interpolation",
                      [tag](TQChannel& c) { c.setInterpolation(static_cast<unsigned>(tag)); });
    auto* item = dynamic_cast<RWMenuItem*>(&sender);
    if (RWMenu* menu = item ? item->menu() : nullptr)
        for (const RWMenuItemPtr& each : menu->itemArray())
            each->setState(each->tag() == tag ? 1 : 0);
}

bool TQMiniCurveEditorCtrl::performAction(const std::string& action, RWActionSender& sender) {
    if (action == kPreExtrapolationAction)
        menuSetCurvePreExtrapolation(sender);
    else if (action == kPostExtrapolationAction)
        menuSetCurvePostExtrapolation(sender);
    else if (action == "menuLockChannel:channel:")
        menuLockChannel(sender);
    else if (action == "menuSetCurveInterpolation:channel:")
        menuSetCurveInterpolation(sender);
    else
        return TQCurveEditorCtrlBase::performAction(action, sender);
    return true;
}

// ---- Selection -----------------------------------------------------------------------------

void TQMiniCurveEditorCtrl::selectionChangedTo(TQCurveSelectionList* list) {
    if (_selectedCurveSet) {
        _selectedCurveSet->deselectAll();
        if (list)
            for (const TQCurveSelectionPtr& entry : list->getSelectionArray())
                if (entry)
                    if (TQCurveEditorItemPtr item =
                            _selectedCurveSet->itemWithIdentifier(entry->getCurveId()))
                        item->select(1);
    }
    postNotification(kTQNotifyChannelsChanged);
}

bool TQMiniCurveEditorCtrl::hasSelection() const {
    TQCurveSelectionList* list = viewSelection();
    if (!list) return false;
    // A handle that went stale (an undo rebuilt its keyframe, and nothing lies at its time)
    // selects nothing: the rows go disabled instead of editing a keyframe that is gone.
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !(entry->isKeypoint() || entry->isTangent())) continue;
        const TQChannel* channel = channelForEntry(*entry);
        if (channel && channel->getKeyframe(entry->getHandle(), nullptr, nullptr)) return true;
    }
    return false;
}

CMTime TQMiniCurveEditorCtrl::getSelectedValueX() const {
    TQCurveSelectionList* list = viewSelection();
    if (!list) return kCMTimeZero;
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        const TQChannel* channel = channelForEntry(*entry);
        CMTime time = kCMTimeZero;
        // A stale handle or a vanished channel reads as no selection.
        if (channel && channel->getKeyframe(entry->getHandle(), &time, nullptr)) return time;
        return kCMTimeZero;
    }
    return kCMTimeZero;
}

double TQMiniCurveEditorCtrl::getSelectedValueY() const {
    TQCurveSelectionList* list = viewSelection();
    if (!list) return 0.0;
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        const TQChannel* channel = channelForEntry(*entry);
        double value = 0.0;
        if (channel && channel->getKeyframe(entry->getHandle(), nullptr, &value)) return value;
        return 0.0;
    }
    return 0.0;
}

std::vector<TQCurveEditorItemPtr> TQMiniCurveEditorCtrl::sketchedChannels() const {
    return _selectedCurveSet ? _selectedCurveSet->enabledItems()
                             : std::vector<TQCurveEditorItemPtr>{};
}

// ---- Value edits ---------------------------------------------------------------------------

bool TQMiniCurveEditorCtrl::primaryKeyframe(TQCurveSelectionList* list, CMTime* time,
                                            double* value) const {
    // Entry 0 is read without a test by the rows' contract; an empty list after validation
    // (everything went stale) is a no-op here instead.
    if (!list || list->empty()) return false;
    const TQCurveSelectionPtr& primary = list->getSelectionArray().front();
    const TQChannel* channel = primary ? channelForEntry(*primary) : nullptr;
    return channel && channel->getKeyframe(primary->getHandle(), time, value);
}

void TQMiniCurveEditorCtrl::moveSelectedInY(TQCurveSelectionList* list, double y) {
    validateSelection(list);
    double primaryValue = 0.0;
    if (!primaryKeyframe(list, nullptr, &primaryValue)) return;
    const double delta = y - primaryValue;
    forEachEntryChannel(
        list, [](const TQCurveSelection& e) { return e.isKeypoint(); }, {},
        [delta](const EntryChannel& e) {
            double value = 0.0;
            if (!e.channel.getKeyframe(e.entry.getHandle(), nullptr, &value)) return false;
            e.channel.setKeyframeValue(e.entry.getHandle(), value + delta);
            return true;
        });
}

void TQMiniCurveEditorCtrl::moveSelectedInX(TQCurveSelectionList* list, CMTime x) {
    validateSelection(list);
    CMTime primaryTime = kCMTimeZero;
    if (!primaryKeyframe(list, &primaryTime, nullptr)) return;
    const CMTime delta = BN_CMTimeSaferSubtract(x, primaryTime);
    const std::vector<TQCurveSelectionPtr> entries = list->getSelectionArray();
    for (const TQCurveSelectionPtr& entry : entries) {
        if (!entry || !entry->isKeypoint()) continue;
        TQChannel* channel = channelForEntry(*entry);
        if (!channel) continue;
        TQChannelFolder* parent = channel->getParent();
        auto* compound = parent && parent->isCompoundChannel()
                             ? static_cast<TQCompoundChannel*>(parent)
                             : nullptr;
        if (compound && (_linked || compound->isLinked())) {
            compound->noteWillChange(true);
            for (TQChannel* component : compound->getComponents()) component->noteWillChange(true);
            CMTime time = kCMTimeZero;
            if (!channel->getKeyframe(entry->getHandle(), &time, nullptr)) continue;
            // The compound moves by axis time: the channel's offset added.
            const CMTime from = BN_CMTimeSaferAdd(time, channel->timeOffset());
            compound->moveKeyframe(channel, from, BN_CMTimeSaferAdd(from, delta), nullptr, nullptr,
                                   true);
            markComponentsDirty(*compound);
            continue;
        }
        editEntryChannel(entry.get(), {}, [delta](const EntryChannel& e) {
            CMTime time = kCMTimeZero;
            if (!e.channel.getKeyframe(e.entry.getHandle(), &time, nullptr)) return false;
            if (CMTimeCompare(delta, kCMTimeZero) != 0) {
                const CMTime to = BN_CMTimeSaferAdd(time, delta);
                e.channel.setKeyframeTime(e.entry.getHandle(), &to);
            }
            return true;
        });
    }
}

void TQMiniCurveEditorCtrl::update() {
    if (_view) _view->setAllOriginalCurveDirty(1);
    updateUI();
}
