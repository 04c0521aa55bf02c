// The context menus: how they are built, the actions they send, and how each item is enabled,
// marked and titled before a menu shows.
//
// Every action reads the view's selection as it stands when the action runs, and validates
// it first: an item chosen after its curve went away finds an empty selection and changes
// nothing.

#include <cstdint>
#include <vector>

#include "platform/channels/TQChannelTypes.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/engine/TQEditBrackets.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

struct InterpolationEntry {
    int64_t tag;
    const char* key;
};

constexpr InterpolationEntry kInterpolationItems[] = {
    {kTQInterpolationConstant, "Anim Menu Interpolation Constant"},
    {kTQInterpolationLinear, "Anim Menu Interpolation Linear"},
    {kTQInterpolationBezier, "Anim Menu Interpolation Bezier"},
    {kTQInterpolationCatmullRom, "Anim Menu Interpolation Catmull Rom"},
    {kTQInterpolationExp, "Anim Menu Interpolation Exp"},
    {kTQInterpolationLog, "Anim Menu Interpolation Log"},
};

RWMenuItemPtr addItem(RWMenu& menu, const char* key, const char* action, RWActionTarget* target) {
    RWMenuItemPtr item = menu.addItemWithTitle(TQLocalizedString(key), action, "");
    item->setTarget(target);
    item->setTag(0);
    return item;
}

// "Anim Menu Interpolation" with its six items, each sending `action` with its code as tag.
void addInterpolationSubmenu(RWMenu& menu, const char* action, RWActionTarget* target) {
    auto submenu = std::make_shared<RWMenu>(TQLocalizedString("Anim Menu Interpolation"));
    for (const InterpolationEntry& e : kInterpolationItems) {
        RWMenuItemPtr item = submenu->addItemWithTitle(TQLocalizedString(e.key), action, "");
        item->setTarget(target);
        item->setTag(e.tag);
    }
    RWMenuItemPtr holder =
        menu.addItemWithTitle(TQLocalizedString("Anim Menu Interpolation"), "", "");
    holder->setTag(0);
    menu.setSubmenuForItem(submenu, *holder);
}

// Curve and blind-data channels keep the interpolation of their kind.
bool hasFixedInterpolation(const TQChannel* channel) {
    return dynamic_cast<const TQChannelFixedInterpolation*>(channel) != nullptr;
}

bool refusesInterpolationChange(const TQChannel& channel) {
    return channel.testFlag(kTQChannelFlagNoInterpolationChange);
}

// The interpolation code a sender's tag stands for; none for a tag no channel can hold.
std::optional<unsigned> interpolationOfTag(const RWActionSender* sender) {
    if (!sender || sender->tag() < 0 || sender->tag() > int64_t{UINT32_MAX}) return std::nullopt;
    return static_cast<unsigned>(sender->tag());
}

// Constant, Exp and Log shape their segment from its first keypoint alone; the other kinds
// need both ends, so the keypoint before takes the same interpolation.
bool usesBothEnds(unsigned interpolation) {
    return interpolation != kTQInterpolationConstant && interpolation != kTQInterpolationExp &&
           interpolation != kTQInterpolationLog;
}

// Linear, Bezier and Catmull-Rom: the kinds whose segments are marked mixed when the keypoint
// and the one before it differ.
constexpr uint32_t kBothEndsMask = (1u << kTQInterpolationLinear) | (1u << kTQInterpolationBezier) |
                                   (1u << kTQInterpolationCatmullRom);

bool inBothEndsMask(unsigned interpolation) {
    return interpolation < 32 && ((kBothEndsMask >> interpolation) & 1u) != 0;
}

// An angle of a rotation blended as quaternions: Exp and Log do not apply to it.
bool isQuaternionAngle(const TQChannel* channel) {
    if (!dynamic_cast<const TQChannelAngle*>(channel)) return false;
    const auto* rotation = dynamic_cast<const TQChannelRotation3D*>(channel->getParent());
    return rotation && rotation->isQuaternionMode();
}

// The handle of the keyframe before the one `handle` names, or null.
TQKeyframeHandle previousKeyframe(const TQChannel& channel, TQKeyframeHandle handle) {
    CMTime time = kCMTimeInvalid;
    if (!channel.getKeyframe(handle, &time, nullptr)) return nullptr;
    if (!channel.getPreviousKeyframe(time, &time, nullptr)) return nullptr;
    return channel.getKeyframe(time);
}

}  // namespace

// ---- Building ---------------------------------------------------------------------------

void TQCurveEditorCtrlBase::buildKeyframeMenu() {
    auto menu = std::make_shared<RWMenu>("");
    addItem(*menu, "Curve Editor Menu Delete", "menuDelete:", this);
    menu->addItem(RWMenuItem::separatorItem());
    addItem(*menu, "Curve Editor Menu Reverse", "menuReverse:", this);
    menu->addItem(RWMenuItem::separatorItem());
    addItem(*menu, "Anim Menu Ease In", "menuEaseIn:", this);
    addItem(*menu, "Anim Menu Ease Out", "menuEaseOut:", this);
    addItem(*menu, "Anim Menu Ease Both", "menuEaseBoth:", this);
    menu->addItem(RWMenuItem::separatorItem());
    addInterpolationSubmenu(*menu, "menuSetKeypointInterpolation:", this);
    menu->addItem(RWMenuItem::separatorItem());
    addItem(*menu, "Curve Editor Menu Lock", "menuLockSelected:", this);
    addItem(*menu, "Curve Editor Menu Disable", "menuDisableSelected:", this);
    _keyframeMenu = menu;
}

void TQCurveEditorCtrlBase::buildCurveMenu() {
    auto menu = std::make_shared<RWMenu>("");
    addItem(*menu, "Curve Editor Menu Add", "menuAddKeyframe:", this);
    menu->addItem(RWMenuItem::separatorItem());
    addItem(*menu, "Curve Editor Menu Delete All", "menuDeleteAllKeyframes:", this);
    menu->addItem(RWMenuItem::separatorItem());
    addInterpolationSubmenu(*menu, "menuSetSegmentInterpolation:", this);
    _curveMenu = menu;
}

void TQCurveEditorCtrlBase::buildTangentMenu() {
    auto menu = std::make_shared<RWMenu>("");
    addItem(*menu, "Curve Editor Menu Break", "menuBreakTangent:", this);
    addItem(*menu, "Curve Editor Menu Align", "menuAlignTangent:", this);
    _tangentMenu = menu;
}

void TQCurveEditorCtrlBase::buildDefaultMenu() { _defaultMenu = std::make_shared<RWMenu>(""); }

bool TQCurveEditorCtrlBase::performAction(const std::string& action, RWActionSender& sender) {
    using Plain = void (TQCurveEditorCtrlBase::*)(void*);
    using Tagged = void (TQCurveEditorCtrlBase::*)(RWActionSender*);
    struct Named {
        const char* name;
        Plain plain;
        Tagged tagged;
    };
    static constexpr Named kActions[] = {
        {"menuDelete:", &TQCurveEditorCtrlBase::menuDelete, nullptr},
        {"menuDuplicate:", &TQCurveEditorCtrlBase::menuDuplicate, nullptr},
        {"menuReverse:", &TQCurveEditorCtrlBase::menuReverse, nullptr},
        {"menuEaseIn:", &TQCurveEditorCtrlBase::menuEaseIn, nullptr},
        {"menuEaseOut:", &TQCurveEditorCtrlBase::menuEaseOut, nullptr},
        {"menuEaseBoth:", &TQCurveEditorCtrlBase::menuEaseBoth, nullptr},
        {"menuLockSelected:", &TQCurveEditorCtrlBase::menuLockSelected, nullptr},
        {"menuDisableSelected:", &TQCurveEditorCtrlBase::menuDisableSelected, nullptr},
        {"menuAddKeyframe:", &TQCurveEditorCtrlBase::menuAddKeyframe, nullptr},
        {"menuDeleteAllKeyframes:", &TQCurveEditorCtrlBase::menuDeleteAllKeyframes, nullptr},
        {"menuBreakTangent:", &TQCurveEditorCtrlBase::menuBreakTangent, nullptr},
        {"menuAlignTangent:", &TQCurveEditorCtrlBase::menuAlignTangent, nullptr},
        {"menuSetKeypointInterpolation:", nullptr,
         &TQCurveEditorCtrlBase::menuSetKeypointInterpolation},
        {"menuSetSegmentInterpolation:", nullptr,
         &TQCurveEditorCtrlBase::menuSetSegmentInterpolation},
    };
    for (const Named& a : kActions) {
        if (action != a.name) continue;
        if (a.tagged)
            (this->*a.tagged)(&sender);
        else
            (this->*a.plain)(&sender);
        return true;
    }
    return false;
}

// ---- Actions ----------------------------------------------------------------------------

void TQCurveEditorCtrlBase::menuBreakTangent(void*) {
    performWithBracket("Undo Break Tangents", &TQCurveEditorCtrlBase::breakTangentsSelected);
}

void TQCurveEditorCtrlBase::menuAlignTangent(void*) {
    performWithBracket("Undo Align Tangents", &TQCurveEditorCtrlBase::alignTangentsSelected);
}

void TQCurveEditorCtrlBase::setKeypointInterpolation(TQChannel& channel, TQKeyframeHandle handle,
                                                     unsigned interpolation) {
    channel.noteWillChange(true);
    if (TQCompoundChannel* parent = getChannelsLinkedParent(&channel)) {
        parent->setLinkedInterpolation(&channel, handle, interpolation, true);
        markComponentsDirty(*parent);
    }
    channel.setKeyframeInterpolation(handle, interpolation);
    markDirty(itemForChannel(&channel));
}

void TQCurveEditorCtrlBase::menuSetKeypointInterpolation(RWActionSender* sender) {
    TQCurveSelectionList* list = viewSelection();
    const std::optional<unsigned> interpolation = interpolationOfTag(sender);
    if (!list || !interpolation) return;
    validateSelection(list);
    const TQEditBracket bracket(*this, list, "Undo Set Interpolation");
    // A copy: the posts below reach the host, whose handlers may change the view's selection.
    const std::vector<TQCurveSelectionPtr> entries = list->getSelectionArray();
    for (const TQCurveSelectionPtr& entry : entries) {
        if (!entry) continue;
        TQChannel* channel = channelForEntry(*entry);
        if (channel && hasFixedInterpolation(channel)) continue;
        if (entry->isKeypoint()) {
            if (!channel || refusesInterpolationChange(*channel)) continue;
            const TQKeyframeHandle handle = entry->getHandle();
            // Looked up before the change: a linked edit must not move what "before" means.
            const TQKeyframeHandle before =
                usesBothEnds(*interpolation) ? previousKeyframe(*channel, handle) : nullptr;
            setKeypointInterpolation(*channel, handle, *interpolation);
            if (before) setKeypointInterpolation(*channel, before, *interpolation);
        }
        // Once per entry that was not passed over, other kinds of entries included: the host
        // has always heard one word per entry here.
        updateUI();
        postNotification(kTQNotifyChannelsChanged);
    }
}

CMTime TQCurveEditorCtrlBase::channelTimeAtMouseOrigin(const TQChannel& channel) const {
    if (!_view) return kCMTimeInvalid;
    const CGPoint world = _view->getPointWorld(_view->getMouseOrigin());
    const CMTime axis = TQTarnTimeForChannelSeconds(world.x, kTQCurveEditorTimescale);
    return channel.toChannelTime(&axis);
}

TQKeyframeHandle TQCurveEditorCtrlBase::segmentKeyframeAtMouseOrigin(
    const TQChannel& channel) const {
    CMTime time = channelTimeAtMouseOrigin(channel);
    if (!channel.previousKeyframeTime(&time, false)) return nullptr;
    return channel.getKeyframe(time);
}

void TQCurveEditorCtrlBase::menuSetSegmentInterpolation(RWActionSender* sender) {
    TQCurveSelectionList* list = viewSelection();
    const std::optional<unsigned> interpolation = interpolationOfTag(sender);
    if (!list || !interpolation) return;
    validateSelection(list);
    if (list->empty()) return;
    const TQEditBracket bracket(*this, list, "Undo Set Interpolation");
    const TQCurveSelectionPtr entry = list->selectionAtIndex(0);
    TQChannel* channel = entry ? channelForEntry(*entry) : nullptr;
    // The segment's interpolation is that of the keypoint at its start.
    if (entry && entry->isCurve() && channel && !hasFixedInterpolation(channel) &&
        !refusesInterpolationChange(*channel)) {
        if (const TQKeyframeHandle start = segmentKeyframeAtMouseOrigin(*channel)) {
            channel->noteWillChange(true);
            channel->setKeyframeInterpolation(start, *interpolation);
            markDirty(itemForChannel(channel));
        }
    }
    updateUI();
    postNotification(kTQNotifyChannelsChanged);
}

void TQCurveEditorCtrlBase::menuDeleteAllKeyframes(void*) {
    TQCurveSelectionList* list = viewSelection();
    if (!list) return;
    validateSelection(list);
    if (list->empty()) return;
    const TQCurveSelectionPtr entry = list->selectionAtIndex(0);
    // Held for the edit. Only the first entry's channel is cleared.
    const TQCurveEditorItemPtr held =
        entry ? channelItemWithIdentifier(entry->getCurveId()) : nullptr;
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get());
    TQChannel* channel = item ? item->channel() : nullptr;
    if (!channel) return;
    const CMTime time = item->getCurrentTime();
    {
        const TQCaptureGuard capture(_pAppDelegate, "Undo Delete All Keypoints");
        const TQChannelEditGuard announced(_pAppDelegate, channel);
        channel->noteWillChange(true);
        channel->deleteAllKeyframes(time);
        markDirty(item);
    }
    postNotification(kTQNotifyChannelsChanged);
}

// ---- Validation -------------------------------------------------------------------------

bool TQCurveEditorCtrlBase::validateMenuItem(RWMenuItem& item) {
    const RWMenu* menu = item.menu();
    const RWMenu* super = menu ? menu->supermenu() : nullptr;
    // A submenu's items are recognised through the menu that holds the submenu.
    const auto within = [&](const RWMenuPtr& m) {
        return m && menu && (menu == m.get() || super == m.get());
    };
    if (within(_curveMenu)) return validateCurveMenuItem(item);
    if (within(_keyframeMenu)) return validateKeyframeMenuItem(item);
    if (_tangentMenu && menu == _tangentMenu.get()) return validateTangentMenuItem(item);
    if (within(_defaultMenu)) return validateDefaultMenuItem(item);
    return false;
}

TQCurveEditorCtrlBase::KeypointStates TQCurveEditorCtrlBase::keypointStates(
    TQCurveSelectionList* list) const {
    KeypointStates s;
    if (!list) return s;
    s.count = list->size();
    // An entry without a channel counts as the one before it; the first as locked and
    // enabled.
    bool locked = true;
    bool enabled = true;
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (const TQChannel* channel = entry ? channelForEntry(*entry) : nullptr) {
            locked = channel->getKeyframeLocked(entry->getHandle());
            enabled = channel->getKeyframeEnabled(entry->getHandle());
        }
        ++(locked ? s.locked : s.unlocked);
        ++(enabled ? s.enabled : s.disabled);
    }
    return s;
}

bool TQCurveEditorCtrlBase::validateKeyframeMenuItem(RWMenuItem& item) {
    TQCurveSelectionList* list = viewSelection();
    validateSelection(list);
    const KeypointStates s = keypointStates(list);
    const bool canModify = canModifySelectedAnyCurve();
    const std::string& action = item.action();

    if (action == "menuLockSelected:") {
        item.setState(s.allLocked() || s.locked == 0 ? RWOffState : RWMixedState);
        item.setTitle(TQLocalizedString(s.allLocked() ? "Curve Editor Menu Unlock"
                                                      : "Curve Editor Menu Lock"));
        return canModify;
    }
    if (action == "menuDisableSelected:") {
        if (s.count == 0) {
            item.setState(RWOffState);
            item.setTitle(TQLocalizedString("Curve Editor Menu Disable"));
            return false;
        }
        const bool allDisabled = s.enabled == 0;
        item.setState(s.disabled == 0 || allDisabled ? RWOffState : RWMixedState);
        item.setTitle(TQLocalizedString(allDisabled ? "Curve Editor Menu Enable"
                                                    : "Curve Editor Menu Disable"));
        return canModify && !s.allLocked();
    }
    const bool interpolation = action == "menuSetKeypointInterpolation:";
    // A mark left by an earlier showing must not stay on an item that is not judged again.
    if (interpolation) item.setState(RWOffState);
    // With nothing enabled, only the item that enables keypoints again is of use.
    if (s.enabled == 0) return false;
    if (interpolation)
        return !s.allLocked() && validateKeypointInterpolationItem(item, list, canModify);
    if (action == "menuDelete:" || action == "menuReverse:") return s.count != 0 && canModify;
    return true;
}

bool TQCurveEditorCtrlBase::validateKeypointInterpolationItem(RWMenuItem& item,
                                                              TQCurveSelectionList* list,
                                                              bool canModify) const {
    if (!list || item.tag() < 0) return false;
    const auto tag = static_cast<uint64_t>(item.tag());
    const std::vector<TQCurveSelectionPtr>& entries = list->getSelectionArray();
    if (tag == kTQInterpolationExp || tag == kTQInterpolationLog) {
        for (const TQCurveSelectionPtr& entry : entries)
            if (entry && isQuaternionAngle(channelForEntry(*entry))) return false;
    }

    bool allFixed = true;
    bool firstSeen = false;
    unsigned first = 0;
    bool seenTag = false;
    bool differ = false;
    size_t withChannel = 0;
    size_t refusing = 0;
    // The state is settled by the first of the early marks below, or by the whole walk; the
    // counts that decide enablement always take every entry.
    std::optional<int32_t> state;
    for (const TQCurveSelectionPtr& entry : entries) {
        const TQChannel* channel = entry ? channelForEntry(*entry) : nullptr;
        if (!channel) continue;
        ++withChannel;
        if (!hasFixedInterpolation(channel)) allFixed = false;
        const TQKeyframeHandle handle = entry->getHandle();
        const unsigned interpolation = channel->getKeyframeInterpolation(handle);
        if (!firstSeen) {
            first = interpolation;
            firstSeen = true;
        } else if (interpolation != first) {
            differ = true;
        }
        if (interpolation == tag) seenTag = true;
        if (refusesInterpolationChange(*channel)) {
            ++refusing;
        } else if (!state && inBothEndsMask(interpolation)) {
            // A segment of two kinds that need both ends: both kinds are marked mixed.
            if (const TQKeyframeHandle before = previousKeyframe(*channel, handle)) {
                const unsigned previous = channel->getKeyframeInterpolation(before);
                if (previous != interpolation && (previous == tag || interpolation == tag))
                    state = RWMixedState;
            }
        }
        if (!state && differ && seenTag) state = RWMixedState;
    }
    if (!state) state = seenTag && !differ ? RWOnState : differ ? RWMixedState : RWOffState;
    item.setState(*state);
    if (refusing == withChannel || allFixed) return false;
    return canModify;
}

bool TQCurveEditorCtrlBase::validateCurveMenuItem(RWMenuItem& item) {
    const bool canModify = canModifySelectedAnyCurve();
    const std::string& action = item.action();
    if (action == "menuAddKeyframe:") return canModify;
    if (action != "menuDeleteAllKeyframes:" && action != "menuSetSegmentInterpolation:")
        return true;
    if (action == "menuSetSegmentInterpolation:") item.setState(RWOffState);

    TQCurveSelectionList* list = viewSelection();
    validateSelection(list);
    if (!list || list->empty()) return false;
    const TQCurveSelectionPtr entry = list->selectionAtIndex(0);
    const TQChannel* channel = entry ? channelForEntry(*entry) : nullptr;
    if (action == "menuDeleteAllKeyframes:")
        return canModify && channel && channel->numberOfKeyframes() != 0;

    if (!channel) return canModify;
    const TQKeyframeHandle start = segmentKeyframeAtMouseOrigin(*channel);
    // A click before the first keypoint lies on no segment.
    if (!start) return false;
    item.setState(channel->getKeyframeInterpolation(start) == static_cast<uint64_t>(item.tag())
                      ? RWOnState
                      : RWOffState);
    bool locked = false;
    if (list->size() == 1) {
        if (hasFixedInterpolation(channel)) return false;
        locked = channel->getKeyframeLocked(start) || refusesInterpolationChange(*channel);
    }
    return canModify && !locked;
}

bool TQCurveEditorCtrlBase::validateTangentMenuItem(RWMenuItem& item) {
    TQCurveSelectionList* list = viewSelection();
    validateSelection(list);
    if (!list || list->empty()) return false;
    const TQCurveSelectionPtr entry = list->selectionAtIndex(0);
    const TQChannel* channel = entry ? channelForEntry(*entry) : nullptr;
    if (item.action() == "menuBreakTangent:") {
        item.setState(RWOffState);
        const bool broken = channel && channel->getKeyframeTangentsBroken(entry->getHandle());
        item.setTitle(
            TQLocalizedString(broken ? "Curve Editor Menu Link" : "Curve Editor Menu Break"));
    }
    return channel && !channel->isLocked(true);
}

bool TQCurveEditorCtrlBase::validateDefaultMenuItem(RWMenuItem&) { return true; }
