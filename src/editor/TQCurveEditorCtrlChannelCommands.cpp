// The commands of the animation menu on whole channels: interpolation, extrapolation, lock,
// animation on and off, a keyframe at the playhead added or deleted, reset, back to the ghost;
// the playhead to the next or previous keyframe.

#include "src/editor/TQCurveEditorCtrl.h"

#include "platform/channels/TQChannelTypes.h"
#include "src/engine/TQEditBrackets.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// The menu item that sent an action, or null for another sender.
RWMenu* senderMenu(RWActionSender* sender) {
    auto* item = dynamic_cast<RWMenuItem*>(sender);
    return item ? item->menu() : nullptr;
}

// Every item of the menu off, then the chosen one on.
void tickOnly(RWMenu* menu, const RWMenuItemPtr& chosen) {
    if (!menu) return;
    for (const RWMenuItemPtr& item : menu->itemArray())
        if (item) item->setState(RWOffState);
    if (chosen) chosen->setState(RWOnState);
}

unsigned tagOf(const RWActionSender& sender) { return static_cast<unsigned>(sender.tag()); }

}  // namespace

template <class Change>
void TQCurveEditorCtrl::changeChannel(TQCurveEditorChannelItem& item, TQChannel& channel,
                                      Change&& change) {
    {
        const TQChannelEditGuard announced(_pAppDelegate, &channel);
        channel.noteWillChange(true);
        change(channel);
    }
    item.setOriginalCurveDirty(1);
}

template <class Change, class After>
void TQCurveEditorCtrl::changeSelectedChannels(const char* undoKey, Change&& change,
                                               After&& after) {
    const std::vector<TQCurveEditorItemPtr> items = selectedChannels();
    {
        const TQCaptureGuard step(_pAppDelegate, undoKey);
        for (const TQCurveEditorItemPtr& held : items) {
            auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get());
            TQChannel* channel = item ? item->channel() : nullptr;
            // Not tested where these commands come from; a vanished channel is skipped here.
            if (!channel) continue;
            changeChannel(*item, *channel, [&](TQChannel& c) { change(*item, c); });
            after(*item);
        }
    }
    postNotification(kTQNotifyChannelsChanged);
}

// ---- Interpolation and extrapolation ------------------------------------------------------

void TQCurveEditorCtrl::animMenuSetCurveInterpolation(RWActionSender* sender) {
    if (!sender) return;
    const unsigned interpolation = tagOf(*sender);
    if (interpolation == kTQInterpolationMixed) {
        // Left open on purpose, as it always was: the host closes the step it finds open.
        if (_pAppDelegate)
            _pAppDelegate->startCaptureModifiedChannels(
                TQLocalizedString("Undo Set Interpolation"));
        return;
    }
    RWMenu* menu = senderMenu(sender);
    const std::vector<TQCurveEditorItemPtr> items = selectedChannels();
    {
        const TQCaptureGuard step(_pAppDelegate, "Undo Set Interpolation");
        for (const TQCurveEditorItemPtr& held : items) {
            auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get());
            TQChannel* channel = item ? item->channel() : nullptr;
            // Their interpolation is their kind's.
            if (dynamic_cast<TQChannelCurve*>(channel) ||
                dynamic_cast<TQChannelBlindData*>(channel))
                continue;
            if (channel && !channel->testFlag(kTQChannelFlagNoInterpolationChange)) {
                if (TQCompoundChannel* linked = getChannelsLinkedParent(channel))
                    linked->setLinkedCurveInterpolation(interpolation);
                changeChannel(*item, *channel,
                              [&](TQChannel& c) { c.setInterpolation(interpolation); });
            }
            tickOnly(menu, menu ? menu->itemWithTag(sender->tag()) : nullptr);
        }
    }
    postNotification(kTQNotifyChannelsChanged);
}

void TQCurveEditorCtrl::animMenuSetCurvePreExtrapolation(RWActionSender* sender) {
    if (!sender) return;
    RWMenu* menu = senderMenu(sender);
    // The item at the index of the tag, not the item with the tag: the submenu lists the
    // codes in order, so the two are the same item there.
    changeSelectedChannels(
        "Undo Set Pre Extrapolation",
        [&](TQCurveEditorChannelItem&, TQChannel& c) {
            c.setExtrapolation(tagOf(*sender), kTQExtrapolationBefore);
        },
        [&](TQCurveEditorChannelItem&) {
            tickOnly(menu, menu ? menu->itemAtIndex(sender->tag()) : nullptr);
        });
}

void TQCurveEditorCtrl::animMenuSetCurvePostExtrapolation(RWActionSender* sender) {
    if (!sender) return;
    RWMenu* menu = senderMenu(sender);
    changeSelectedChannels(
        "Undo Set Post Extrapolation",
        [&](TQCurveEditorChannelItem&, TQChannel& c) {
            c.setExtrapolation(tagOf(*sender), kTQExtrapolationAfter);
        },
        [&](TQCurveEditorChannelItem&) {
            tickOnly(menu, menu ? menu->itemAtIndex(sender->tag()) : nullptr);
        });
}

// ---- The other per-channel commands --------------------------------------------------------

namespace {
constexpr auto kNothingAfter = [](TQCurveEditorChannelItem&) {};
}  // namespace

void TQCurveEditorCtrl::animMenuLockChannel(RWActionSender*) {
    changeSelectedChannels(
        "Undo Lock Keypoint",
        [](TQCurveEditorChannelItem&, TQChannel& c) { c.setLocked(true, true); }, kNothingAfter);
}

void TQCurveEditorCtrl::animMenuUnlockChannel(RWActionSender*) {
    changeSelectedChannels(
        "Undo Unlock Keypoint",
        [](TQCurveEditorChannelItem&, TQChannel& c) { c.setLocked(false, true); }, kNothingAfter);
}

void TQCurveEditorCtrl::animMenuEnableAnimation(RWActionSender*) {
    changeSelectedChannels(
        "Undo Chan Menu Enable Animation",
        [](TQCurveEditorChannelItem&, TQChannel& c) { c.setAnimationEnabled(true); },
        kNothingAfter);
}

void TQCurveEditorCtrl::animMenuDisableAnimation(RWActionSender*) {
    changeSelectedChannels(
        "Undo Chan Menu Disable Animation",
        [](TQCurveEditorChannelItem&, TQChannel& c) { c.setAnimationEnabled(false); },
        kNothingAfter);
}

void TQCurveEditorCtrl::animMenuAddKeyframe(RWActionSender*) {
    const CMTime now = _pAppDelegate ? _pAppDelegate->currentTime() : kCMTimeZero;
    changeSelectedChannels(
        "Undo Chan Menu Add Keyframe",
        [&](TQCurveEditorChannelItem&, TQChannel& c) { c.addKeyframe(&now); }, kNothingAfter);
}

void TQCurveEditorCtrl::animMenuDeleteKeyframe(RWActionSender*) {
    const CMTime now = _pAppDelegate ? _pAppDelegate->currentTime() : kCMTimeZero;
    changeSelectedChannels(
        "Undo Chan Menu Delete Keyframe",
        [&](TQCurveEditorChannelItem&, TQChannel& c) { c.deleteKeyframeAtTime(&now); },
        kNothingAfter);
}

void TQCurveEditorCtrl::animMenuResetChannel(RWActionSender*) {
    changeSelectedChannels(
        "Undo Chan Menu Reset Channel",
        [](TQCurveEditorChannelItem&, TQChannel& c) { c.reset(false); }, kNothingAfter);
}

void TQCurveEditorCtrl::animMenuSetChannelToGhost(RWActionSender*) {
    changeSelectedChannels(
        "Undo Chan Menu Set Channel To Ghost",
        [](TQCurveEditorChannelItem& item, TQChannel& c) {
            // The menu keeps this disabled without ghosts; a channel without one stays.
            if (const TQChannel* ghost = item.snapshotChannel()) c = *ghost;
        },
        kNothingAfter);
}

// ---- Keyframe navigation --------------------------------------------------------------------

namespace {

// The playhead to the nearest keyframe beyond it on the selected channels, by `step` (the
// channel's next or previous keyframe time) and `better` (whether a found time beats the
// best so far); nothing without one.
template <class Step, class Better>
void jumpToKeyframe(TQCurveEditorAppDelegate* delegate,
                    const std::vector<TQCurveEditorItemPtr>& items, CMTime best, Step&& step,
                    Better&& better) {
    if (!delegate) return;
    const CMTime now = delegate->currentTime();
    bool found = false;
    for (const TQCurveEditorItemPtr& item : items) {
        const TQChannel* channel = item ? item->channel() : nullptr;
        CMTime t = now;
        if (channel && step(*channel, t) && better(t, best)) {
            best = t;
            found = true;
        }
    }
    if (!found) return;
    delegate->setCurrentTime(best);
    delegate->postNotification(kTQNotifyTimeChanged);
}

}  // namespace

void TQCurveEditorCtrl::animMenuNextKeyframe(RWActionSender*) {
    validateSelection(viewSelection());
    jumpToKeyframe(
        _pAppDelegate, selectedChannels(), kCMTimePositiveInfinity,
        [](const TQChannel& c, CMTime& t) { return c.nextKeyframeTime(&t, false); },
        [](CMTime t, CMTime best) { return CMTimeCompare(t, best) <= 0; });
}

void TQCurveEditorCtrl::animMenuPreviousKeyframe(RWActionSender*) {
    validateSelection(viewSelection());
    // The best starts at zero, so a keyframe before time 0 is never taken: as it always was.
    jumpToKeyframe(
        _pAppDelegate, selectedChannels(), kCMTimeZero,
        [](const TQChannel& c, CMTime& t) { return c.previousKeyframeTime(&t, false); },
        [](CMTime t, CMTime best) { return CMTimeCompare(t, best) >= 0; });
}
