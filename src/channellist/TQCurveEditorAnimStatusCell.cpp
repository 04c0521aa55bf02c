#include "src/channellist/TQCurveEditorAnimStatusCell.h"

#include <set>
#include <string_view>

#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQChannelTypes.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/resources/TQStrings.h"

namespace {

// The cell's actions and the controller's that carry them out.
struct ForwardedAction {
    std::string_view cell;
    const char* controller;
};
constexpr ForwardedAction kForwarded[] = {
    {"simplifyChannel:", "animMenuSimplifyCurve:"},
    {"generatePostKeypoints:", "animMenuGeneratePostKeypoints:"},
    {"generatePreKeypoints:", "animMenuGeneratePreKeypoints:"},
    {"setCurveInterpolation:", "animMenuSetCurveInterpolation:"},
    {"setCurvePreExtrapolation:", "animMenuSetCurvePreExtrapolation:"},
    {"setCurvePostExtrapolation:", "animMenuSetCurvePostExtrapolation:"},
    {"lockChannel:", "animMenuLockChannel:"},
    {"unlockChannel:", "animMenuUnlockChannel:"},
    {"enableAnimationForCell:", "animMenuEnableAnimation:"},
    {"disableAnimationForCell:", "animMenuDisableAnimation:"},
    {"addKeyframeForCell:", "animMenuAddKeyframe:"},
    {"deleteKeyframeForCell:", "animMenuDeleteKeyframe:"},
    {"nextKeyframeForCell:", "animMenuNextKeyframe:"},
    {"previousKeyframeForCell:", "animMenuPreviousKeyframe:"},
    {"resetChannelForCell:", "animMenuResetChannel:"},
    {"setChannelToGhost:", "animMenuSetChannelToGhost:"},
};

// The interpolations the menu offers, and the extrapolations.
struct Entry {
    const char* key;
    int64_t tag;
};
constexpr Entry kInterpolations[] = {
    {"Anim Menu Interpolation Constant", kTQInterpolationConstant},
    {"Anim Menu Interpolation Linear", kTQInterpolationLinear},
    {"Anim Menu Interpolation Bezier", kTQInterpolationBezier},
    {"Anim Menu Interpolation Catmull Rom", kTQInterpolationCatmullRom},
};
constexpr Entry kExtrapolations[] = {
    {"Anim Menu Extrapolation Constant", kTQExtrapolationConstant},
    {"Anim Menu Extrapolation Linear", kTQExtrapolationLinear},
    {"Anim Menu Extrapolation Ping Pong", kTQExtrapolationPingPong},
    {"Anim Menu Extrapolation Repeat", kTQExtrapolationRepeat},
    {"Anim Menu Extrapolation Progressive", kTQExtrapolationProgressive},
};
// The highest interpolation code a channel's mixed keyframes are searched for.
constexpr unsigned kLastSearchedInterpolation = 14;

// On when the tag is the one value of the set, mixed when the set holds it among others.
int32_t stateForValues(const std::set<unsigned>& values, int64_t tag) {
    if (tag < 0 || !values.contains(static_cast<unsigned>(tag))) return RWOffState;
    return values.size() > 1 ? RWMixedState : RWOnState;
}

// Mixed when the flag differs among the channels.
template <class Flag>
int32_t mixedWhenDiffering(const std::vector<TQChannelBase*>& channels, Flag&& flag) {
    for (const TQChannelBase* c : channels)
        if (flag(*c) != flag(*channels.front())) return RWMixedState;
    return RWOffState;
}

template <class Test>
bool anyChannel(const std::vector<TQChannelBase*>& channels, Test&& test) {
    for (TQChannelBase* c : channels)
        if (test(*c)) return true;
    return false;
}

}  // namespace

TQCurveEditorAnimStatusCell::TQCurveEditorAnimStatusCell(TQCurveEditorCtrl* controller)
    : _mainCurveEditorController(controller) {}

void TQCurveEditorAnimStatusCell::setMouseOverLocation(int64_t part) {
    _mouseInPartIndex = part;
    setHoveredPart(part);
}

void TQCurveEditorAnimStatusCell::setMouseDownLocation(int64_t part) {
    _mouseDown = part != kPartNone;
    setPressedPart(part);
}

void TQCurveEditorAnimStatusCell::updateState() {
    _isFolder = dynamic_cast<TQChannelFolder*>(_pChan) != nullptr;
    TQAnimStatusCell::updateState();
}

void TQCurveEditorAnimStatusCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    if (!_isFolder) TQAnimStatusCell::drawWithFrame(frame, drawing);
}

void TQCurveEditorAnimStatusCell::stopTracking(const CGPoint& point, RWOutlineView& view,
                                               bool mouseIsUp) {
    TQCurveEditorAppDelegate* delegate =
        _mainCurveEditorController ? _mainCurveEditorController->appDelegate() : nullptr;
    const CMTime now = delegate ? delegate->currentTime() : kCMTimeZero;
    auto* list =
        _mainCurveEditorController
            ? dynamic_cast<TQCurveEditorListController*>(_mainCurveEditorController->channelsList())
            : nullptr;
    if (list) updateChannel(list->cellClickedChannel(), now);
    TQAnimStatusCell::stopTracking(point, view, mouseIsUp);
    if (list) list->setMouseDown(false);
}

void TQCurveEditorAnimStatusCell::setCurrentTimeAndNotify(CMTime time, TQChannelBase*) {
    TQCurveEditorAppDelegate* delegate =
        _mainCurveEditorController ? _mainCurveEditorController->appDelegate() : nullptr;
    if (!delegate) return;
    delegate->abort();
    delegate->setCurrentTime(time);
    delegate->postNotification(kTQNotifyTimeChanged);
}

// ---- The animation menu -----------------------------------------------------------------------

RWMenuPtr TQCurveEditorAnimStatusCell::newMenuUseImages(bool) {
    if (!_mainCurveEditorController) return nullptr;
    const std::vector<TQCurveEditorItemPtr> items = _mainCurveEditorController->selectedChannels();
    if (items.empty() || !items.front() || !items.front()->channelBase()) return nullptr;
    bool anyAnimated = false;
    bool anyUnlocked = false;
    for (const TQCurveEditorItemPtr& item : items) {
        const TQChannelBase* c = item ? item->channelBase() : nullptr;
        if (!c) continue;
        anyAnimated = anyAnimated || isAnimated(c);
        anyUnlocked = anyUnlocked || !c->isLocked(true);
        if (anyAnimated && anyUnlocked) break;
    }

    auto menu = std::make_shared<RWMenu>("");
    auto add = [this](RWMenu& into, const char* key, const char* action, int64_t tag = 0) {
        RWMenuItemPtr item = into.addItemWithTitle(TQLocalizedString(key), action, "");
        item->setTarget(this);
        item->setTag(tag);
        return item;
    };
    auto separator = [&] { menu->addItem(RWMenuItem::separatorItem()); };
    auto submenu = [&](const char* key, int64_t tag, const Entry* entries, size_t count,
                       const char* action, const char* generate) {
        auto sub = std::make_shared<RWMenu>(TQLocalizedString(key));
        for (size_t i = 0; i < count; ++i) add(*sub, entries[i].key, action, entries[i].tag);
        if (generate) {
            sub->addItem(RWMenuItem::separatorItem());
            add(*sub, "Anim Menu Extrapolation Generate", generate);
        }
        RWMenuItemPtr holder = add(*menu, key, "", tag);
        holder->setSubmenu(sub);
    };

    add(*menu, "Anim Menu Reset Channel", "resetChannelForCell:");
    separator();
    add(*menu, "Anim Menu KEYFRAMES", "")->setEnabled(false);
    add(*menu, "Anim Menu Add Keyframe", "addKeyframeForCell:");
    add(*menu, "Anim Menu Delete Keyframe", "deleteKeyframeForCell:");
    add(*menu, "Anim Menu Previous Keyframe", "previousKeyframeForCell:");
    add(*menu, "Anim Menu Next Keyframe", "nextKeyframeForCell:");
    if (anyAnimated)
        add(*menu, "Anim Menu Disable Animation", "disableAnimationForCell:");
    else
        add(*menu, "Anim Menu Enable Animation", "enableAnimationForCell:");
    separator();
    submenu("Anim Menu Interpolation", 0, kInterpolations, std::size(kInterpolations),
            "setCurveInterpolation:", nullptr);
    separator();
    submenu("Anim Menu Pre Extrapolation", 1, kExtrapolations, std::size(kExtrapolations),
            "setCurvePreExtrapolation:", "generatePreKeypoints:");
    submenu("Anim Menu Post Extrapolation", 2, kExtrapolations, std::size(kExtrapolations),
            "setCurvePostExtrapolation:", "generatePostKeypoints:");
    separator();
    if (anyUnlocked)
        add(*menu, "Anim Menu Lock Channel", "lockChannel:");
    else
        add(*menu, "Anim Menu Unlock Channel", "unlockChannel:");
    separator();
    add(*menu, "Anim Menu Simplify Channel", "simplifyChannel:");
    separator();
    add(*menu, "Anim Menu Set To Ghost", "setChannelToGhost:");
    menu->update();
    return menu;
}

bool TQCurveEditorAnimStatusCell::validateMenuItem(RWMenuItem& item) {
    if (!_mainCurveEditorController) return false;
    std::vector<TQChannelBase*> channels;
    const std::vector<TQCurveEditorItemPtr> items = _mainCurveEditorController->selectedChannels();
    for (const TQCurveEditorItemPtr& selected : items)
        if (TQChannelBase* c = selected ? selected->channelBase() : nullptr) channels.push_back(c);
    if (channels.empty()) return false;

    const std::string& action = item.action();
    const auto unlocked = [](const TQChannelBase& c) { return !c.isLocked(true); };
    const bool anyUnlocked = anyChannel(channels, unlocked);
    const auto keyframable = [](const TQChannelBase& c) {
        const auto* channel = dynamic_cast<const TQChannel*>(&c);
        return channel && channel->canKeyframe();
    };
    const auto valuesOf = [&](auto&& read) {
        std::set<unsigned> values;
        for (const TQChannelBase* c : channels)
            if (const auto* channel = dynamic_cast<const TQChannel*>(c)) read(*channel, values);
        return values;
    };

    if (action == "setCurveInterpolation:") {
        const std::set<unsigned> values = valuesOf([](const TQChannel& c, std::set<unsigned>& v) {
            const unsigned interpolation = c.getInterpolation();
            if (interpolation != kTQInterpolationMixed) {
                v.insert(interpolation);
                return;
            }
            for (unsigned i = 0; i <= kLastSearchedInterpolation; ++i)
                if (c.hasInterpolation(i)) v.insert(i);
        });
        item.setState(stateForValues(values, item.tag()));
        bool enabled = anyUnlocked;
        if (values.size() == 1) {
            const TQChannelBase* first = channels.front();
            if (dynamic_cast<const TQChannelCurve*>(first)) return false;
            if (first->testFlag(kTQChannelFlagNoInterpolationChange)) enabled = false;
        }
        return enabled;
    }
    for (const unsigned direction : {kTQExtrapolationBefore, kTQExtrapolationAfter}) {
        if (action != (direction == kTQExtrapolationBefore ? "setCurvePreExtrapolation:"
                                                           : "setCurvePostExtrapolation:"))
            continue;
        const std::set<unsigned> values =
            valuesOf([direction](const TQChannel& c, std::set<unsigned>& v) {
                v.insert(c.getExtrapolation(direction));
            });
        item.setState(stateForValues(values, item.tag()));
        return anyUnlocked;
    }
    if (action == "lockChannel:" || action == "unlockChannel:") {
        item.setState(
            mixedWhenDiffering(channels, [](const TQChannelBase& c) { return c.isLocked(true); }));
        return anyChannel(channels, [](const TQChannelBase& c) {
            return c.getParent() && !c.getParent()->isLocked(true);
        });
    }
    if (action == "simplifyChannel:" || action == "generatePostKeypoints:" ||
        action == "generatePreKeypoints:") {
        const auto* only =
            channels.size() == 1 ? dynamic_cast<const TQChannel*>(channels[0]) : nullptr;
        return items.size() == 1 && only && only->isAnimationReset() && !only->isLocked(true);
    }
    if (action == "previousKeyframeForCell:" || action == "nextKeyframeForCell:") {
        const bool next = action == "nextKeyframeForCell:";
        return anyChannel(channels, [&](const TQChannelBase& base) {
            const auto* c = dynamic_cast<const TQChannel*>(&base);
            CMTime t = _time;
            return c && c->canKeyframe() && c->isAnimated(false) &&
                   (next ? c->nextKeyframeTime(&t, false) : c->previousKeyframeTime(&t, false));
        });
    }
    if (action == "enableAnimationForCell:" || action == "disableAnimationForCell:") {
        item.setState(mixedWhenDiffering(
            channels, [this](const TQChannelBase& c) { return isAnimated(&c); }));
        if (action == "disableAnimationForCell:")
            return anyChannel(
                channels, [&](const TQChannelBase& c) { return keyframable(c) && unlocked(c); });
        return anyChannel(channels, [&](const TQChannelBase& base) {
            const auto* c = dynamic_cast<const TQChannel*>(&base);
            return c && !c->canKeyframe() && c->isAnimationReset() && unlocked(*c);
        });
    }
    if (action == "resetChannelForCell:") return anyUnlocked;
    if (action == "addKeyframeForCell:")
        return anyChannel(channels, [&](const TQChannelBase& base) {
            const auto* c = dynamic_cast<const TQChannel*>(&base);
            return c && c->canKeyframe() && !c->keyframeExistsAtTime(&_time) && unlocked(*c);
        });
    if (action == "deleteKeyframeForCell:")
        return anyChannel(channels, [&](const TQChannelBase& c) {
            return hasKeypointAtTime(_time, &c, false) && unlocked(c);
        });
    if (action == "setChannelToGhost:")
        return _mainCurveEditorController->snapshotChannels() && anyUnlocked;
    return TQAnimStatusCell::validateMenuItem(item);
}

bool TQCurveEditorAnimStatusCell::performAction(const std::string& action, RWActionSender& sender) {
    for (const ForwardedAction& forwarded : kForwarded)
        if (action == forwarded.cell)
            return _mainCurveEditorController &&
                   _mainCurveEditorController->performAction(forwarded.controller, sender);
    return TQAnimStatusCell::performAction(action, sender);
}

// ---- The menu cell ----------------------------------------------------------------------------

TQCurveEditorAnimMenuCell::TQCurveEditorAnimMenuCell(TQCurveEditorCtrl* controller)
    : TQCurveEditorAnimStatusCell(controller) {
    setMouseOver(false);
}

void TQCurveEditorAnimMenuCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    if (_isMouseOverRow && !dynamic_cast<const TQChannelFolder*>(_pChan))
        drawing.drawImage(kMenuImage, frame, kHoveredOpacity);
}
