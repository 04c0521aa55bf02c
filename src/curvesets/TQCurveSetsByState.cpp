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

// The rebuild of Animated and Modified: every selected object's folder is validated against
// the receiver's present items and filtered in a temporary set; then the receiver takes the
// temporary set's roots, filtering them once more as it adds them.
template <class Hook>
void rebuildThroughTemporarySet(TQCurveSet& receiver, TQCurveSet& temporary,
                                uint32_t numberOfSamples, bool snapshot, Hook addAffected) {
    TQCurveEditorAppDelegate* delegate = receiver.appDelegate();
    const std::vector<TQChannelBase*> objects = selectedObjects(delegate);
    temporary.initWithName(receiver.curveSetName(), delegate);
    const TQCurveSet::EnableStates before = receiver.captureEnableStates();
    for (TQChannelBase* object : objects) {
        TQCurveEditorItem::resetColorIndex();  // colours restart for each object
        auto folder = std::make_shared<TQCurveEditorFolderItem>();
        folder->initWithChannel(object, numberOfSamples, delegate,
                                receiver.ignoreHiddenChannels() ? 1 : 0);
        receiver.validateCurveSet(*folder, before);
        temporary.addRootItem(folder);
        addAffected(object, temporary, numberOfSamples);
    }
    receiver.reset();
    const std::vector<TQCurveEditorFolderItemPtr> roots = temporary.roots();
    for (const TQCurveEditorFolderItemPtr& root : roots) receiver.addRootItem(root);
    if (snapshot) receiver.takeSnapshot(true);
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
        std::erase_if(root->children(), [](const TQCurveEditorItemPtr& child) {
            TQChannel* channel = child ? child->channel() : nullptr;
            return !channel || !channel->canKeyframe();
        });
    }
    removeEqual(_roots, emptyRoots);
}

void TQCurveSetAll::refresh(uint32_t numberOfSamples, bool snapshot) {
    const std::vector<TQChannelBase*> objects = selectedObjects(_pAppDelegate);
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

// --- Animated -----------------------------------------------------------------------------------

void TQCurveSetAnimated::initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) {
    TQCurveSet::initWithName(name, appDelegate);
    setCurveSetShortcut("u");
}

void TQCurveSetAnimated::filterList() {
    filterChildren([this](const TQCurveEditorItem& child) {
        const TQChannel* channel = child.channel();
        if (!channel) return false;
        const bool selected = isObjectOfChannelSelected(_pAppDelegate, *channel);
        if (channel->canKeyframe() && channel->numberOfKeyframes() >= 2 && selected) return true;
        return movedByBehaviour(*this, *channel, selected);
    });
}

void TQCurveSetAnimated::refresh(uint32_t numberOfSamples, bool snapshot) {
    // A subclass rebuilds in a set of its own class, so that its own filter runs.
    const TQCurveSetPtr temporary = makeEmpty();
    rebuildThroughTemporarySet(*this, *temporary, numberOfSamples, snapshot,
                               [this](TQChannelBase* object, TQCurveSet& set, uint32_t samples) {
                                   addObjectsAffectedByBehavior(object, set, samples);
                               });
}

void TQCurveSetAnimated::addObjectsAffectedByBehavior(TQChannelBase*, TQCurveSet&, uint32_t) {}

// --- Modified -----------------------------------------------------------------------------------

void TQCurveSetModified::initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) {
    TQCurveSet::initWithName(name, appDelegate);
    setCurveSetShortcut("y");
}

void TQCurveSetModified::filterList() {
    filterChildren([this](const TQCurveEditorItem& child) {
        const TQChannel* channel = child.channel();
        if (!channel) return false;
        const bool selected = isObjectOfChannelSelected(_pAppDelegate, *channel);
        // One keypoint is enough here, where Animated wants two.
        if (channel->canKeyframe() && channel->numberOfKeyframes() != 0 && selected) return true;
        if (movedByBehaviour(*this, *channel, selected)) return true;
        if (selected &&
            std::fabs(channel->getDefaultValue() - channel->getValueAsDouble(kCMTimeZero, 0.0)) >=
                kDefaultValueTolerance &&
            channel->canKeyframe())
            return true;
        const TQChannelFolder* parent = channel->getParent();
        return parent && parent->isCompoundChannel() && parent->isAnimated(false);
    });
}

void TQCurveSetModified::refresh(uint32_t numberOfSamples, bool snapshot) {
    // Of this class whatever the receiver's: a subclass still filters as Modified does here.
    TQCurveSetModified temporary;
    rebuildThroughTemporarySet(*this, temporary, numberOfSamples, snapshot,
                               [this](TQChannelBase* object, TQCurveSet& set, uint32_t samples) {
                                   addObjectsAffectedByBehavior(object, set, samples);
                               });
}

void TQCurveSetModified::addObjectsAffectedByBehavior(TQChannelBase*, TQCurveSet&, uint32_t) {}

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
