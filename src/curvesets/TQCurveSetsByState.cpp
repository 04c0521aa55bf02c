// The sets by channel state (All, Animated, Modified) and the active set.
#include <cmath>
#include <unordered_set>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/curvesets/TQAutomaticCurveSets.h"

namespace {

// Below this a value counts as its default.
constexpr double kDefaultValueTolerance = 1e-7;

std::vector<TQChannelBase*> selectedObjects(TQCurveEditorAppDelegate* delegate) {
    return delegate ? delegate->selectedObjectsRootChannels() : std::vector<TQChannelBase*>{};
}

bool isObjectOfChannelSelected(TQCurveEditorAppDelegate* delegate, const TQChannel& channel) {
    return delegate && delegate->isObjectSelected(channel.getChannelRoot());
}

// What Animated and Modified share: a behaviour moves the channel of a selected object that
// no rig drives, or a selected behaviour moves a channel of an object that is not selected.
bool movedByBehaviour(const TQCurveSet& set, const TQChannel& channel, bool objectSelected) {
    if (channel.isChannelAffectedByBehaviors(true) && objectSelected && !channel.isRigged())
        return true;
    return set.isChannelAffectedBySelectedBehaviors(&channel) && !objectSelected;
}

}  // namespace

// --- All ----------------------------------------------------------------------------------------

void TQCurveSetAll::filterList() {
    std::vector<TQCurveEditorFolderItemPtr> emptyRoots;
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) {
            emptyRoots.push_back(root);
            continue;
        }
        root->collapse(false);
        // Tested before the children are filtered: a root emptied below stays for now.
        if (!root->hasChildren()) emptyRoots.push_back(root);
        if (!isSettled(*root))
            std::erase_if(root->children(), [](const TQCurveEditorItemPtr& child) {
                TQChannel* channel = child ? child->channel() : nullptr;
                return !channel || !channel->canKeyframe();
            });
        settle(root);
    }
    removeEqual(_roots, emptyRoots);
}

void TQCurveSetAll::refresh(uint32_t numberOfSamples, bool snapshot) {
    const std::vector<TQChannelBase*> objects = selectedObjects(_pAppDelegate);
    const RebuildScope rebuilding(*this);
    reset();
    for (TQChannelBase* object : objects) {
        TQCurveEditorItem::resetColorIndex();
        auto folder = std::make_shared<TQCurveEditorFolderItem>();
        folder->initWithChannel(object, numberOfSamples, _pAppDelegate,
                                _ignoreHiddenChannels ? 1 : 0);
        addRootItem(folder);  // no validation: every item of this set comes back enabled
    }
    if (snapshot) takeSnapshot(true);
}

// --- Animated and Modified ---------------------------------------------------------------------

void TQCurveSetByChannelState::filterList() {
    filterChildren([this](const TQCurveEditorItem& child) {
        const TQChannel* channel = child.channel();
        return channel &&
               keepsChannel(*channel, isObjectOfChannelSelected(_pAppDelegate, *channel));
    });
}

void TQCurveSetByChannelState::refresh(uint32_t numberOfSamples, bool snapshot) {
    const std::vector<TQChannelBase*> objects = selectedObjects(_pAppDelegate);
    const TQCurveSetPtr temporary = makeTemporarySet();
    temporary->initWithName(_name, _pAppDelegate);
    const RebuildScope buildingTemporary(*temporary);
    const RebuildScope buildingThis(*this);
    const EnableStates before = captureEnableStates();
    for (TQChannelBase* object : objects) {
        TQCurveEditorItem::resetColorIndex();  // colours restart for each object
        auto folder = std::make_shared<TQCurveEditorFolderItem>();
        folder->initWithChannel(object, numberOfSamples, _pAppDelegate,
                                _ignoreHiddenChannels ? 1 : 0);
        validateCurveSet(*folder, before);  // against the items this set still holds
        temporary->addRootItem(folder);
        addObjectsAffectedByBehavior(object, *temporary, numberOfSamples);
    }
    reset();
    const std::vector<TQCurveEditorFolderItemPtr> roots = temporary->roots();
    for (const TQCurveEditorFolderItemPtr& root : roots) addRootItem(root);  // filters again
    if (snapshot) takeSnapshot(true);
}

void TQCurveSetByChannelState::addObjectsAffectedByBehavior(TQChannelBase*, TQCurveSet&, uint32_t) {
}

void TQCurveSetAnimated::initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) {
    TQCurveSet::initWithName(name, appDelegate);
    setCurveSetShortcut("u");
}

bool TQCurveSetAnimated::keepsChannel(const TQChannel& channel, bool objectSelected) const {
    if (channel.canKeyframe() && channel.numberOfKeyframes() >= 2 && objectSelected) return true;
    return movedByBehaviour(*this, channel, objectSelected);
}

void TQCurveSetModified::initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) {
    TQCurveSet::initWithName(name, appDelegate);
    setCurveSetShortcut("y");
}

bool TQCurveSetModified::keepsChannel(const TQChannel& channel, bool objectSelected) const {
    // One keypoint is enough here, where Animated wants two.
    if (channel.canKeyframe() && channel.numberOfKeyframes() != 0 && objectSelected) return true;
    if (movedByBehaviour(*this, channel, objectSelected)) return true;
    if (objectSelected &&
        std::fabs(channel.getDefaultValue() - channel.getValueAsDouble(kCMTimeZero, 0.0)) >=
            kDefaultValueTolerance &&
        channel.canKeyframe())
        return true;
    const TQChannelFolder* parent = channel.getParent();
    return parent && parent->isCompoundChannel() && parent->isAnimated(false);
}

// --- Active -------------------------------------------------------------------------------------

void TQCurveSetCurrent::refresh(uint32_t numberOfSamples, bool snapshot) {
    const std::vector<TQCurveEditorItemPtr> items = allItems();
    TQCurveEditorItem::resetColorIndex();
    std::vector<TQCurveEditorItemPtr> stale;
    for (const TQCurveEditorItemPtr& item : items) {
        TQChannel* channel = item->channel();
        const bool keep = channel && _pAppDelegate && _pAppDelegate->wasChannelModified(channel) &&
                          channel->canKeyframe();
        if (!keep) stale.push_back(item);
    }
    const std::vector<TQChannelRef> modified =
        _pAppDelegate ? _pAppDelegate->modifiedChannels() : std::vector<TQChannelRef>{};
    for (const TQCurveEditorItemPtr& item : stale) removeItem(item);

    // The channels shown, kept in step with the appends below: itemWithChannel for each
    // reference would resolve every item again.
    std::unordered_set<const TQChannelBase*> shown;
    for (const TQCurveEditorItemPtr& item : allItems())
        if (const TQChannelBase* c = item->channelBase()) shown.insert(c);
    TQChannelBase* sceneRoot = _pAppDelegate ? _pAppDelegate->sceneChannelRoot() : nullptr;
    for (const TQChannelRef& ref : modified) {
        auto* channel = dynamic_cast<TQChannel*>(ref.getChannel(sceneRoot));
        if (!channel || shown.contains(channel) || !channel->canKeyframe()) continue;
        auto item = std::make_shared<TQCurveEditorChannelItem>();
        item->initWithChannel(channel, numberOfSamples, _pAppDelegate,
                              _ignoreHiddenChannels ? 1 : 0);
        if (!item->isValid()) continue;
        appendItem(item);
        item->enableItem(1);
        shown.insert(channel);
    }
    if (snapshot) takeSnapshot(true);
}

bool TQCurveSetCurrent::containsOnlyChannels(const std::vector<TQCurveEditorItemPtr>& items) const {
    const std::vector<TQCurveEditorItemPtr> present = allItems();
    if (present.size() != items.size()) return false;
    bool contained = true;
    for (const TQCurveEditorItemPtr& item : present) {
        contained = false;
        for (const TQCurveEditorItemPtr& candidate : items)
            if (candidate && candidate->isEqual(*item)) {
                contained = true;
                break;
            }
    }
    return contained;  // the last item's answer, as it always was
}
