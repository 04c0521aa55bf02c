// The custom curve sets to and from their saved form: the list of holders the host writes
// into its document and reads back (TQCurveSetListSerializer), and the number by which the
// list names the selected set.

#include <memory>

#include "src/curvesets/TQCurveSetListSerializer.h"
#include "src/editor/TQCurveEditorCtrl.h"

namespace {

// The document versions whose numbering differs: before 3 only All, Animated and Active had
// numbers; 3 added the sets by state and by property; 5 added Retiming.
constexpr double kVersionWithPropertySets = 3.0;
constexpr double kVersionWithRetiming = 5.0;
// Saving numbers as the present version does.
constexpr double kSavingVersion = kVersionWithRetiming;

}  // namespace

std::vector<TQCurveSetPtr> TQCurveEditorCtrl::numberedAutomaticCurveSets(double version) const {
    std::vector<TQCurveSetPtr> sets{_curveSetAll, _curveSetAnimated, _curveSetCurrent};
    if (version < kVersionWithPropertySets) return sets;
    sets.insert(sets.end(), {_curveSetModified, _curveSetPosition, _curveSetRotation,
                             _curveSetScale, _curveSetShear, _curveSetPivot, _curveSetOpacity});
    if (version >= kVersionWithRetiming) sets.push_back(_curveSetRetiming);
    return sets;
}

TQCurveSetPtr TQCurveEditorCtrl::curveSetForSavedNumber(uint32_t number, double version) const {
    const std::vector<TQCurveSetPtr> automatic = numberedAutomaticCurveSets(version);
    if (number < automatic.size()) return automatic[number];
    const size_t custom = number - automatic.size();
    // The number is not checked against the list when it is read; one past the custom sets
    // (a file edited by hand, or sets that merged by name) must not index out of range, and
    // Animated is the set a list without a number names.
    if (custom >= _curveSets.size()) return _curveSetAnimated;
    return _curveSets[custom];
}

void TQCurveEditorCtrl::saveCurveSets(TQCurveSetListSerializer* list) {
    if (!list) return;
    list->clear();
    TQChannelBase* root = _pAppDelegate ? _pAppDelegate->sceneChannelRoot() : nullptr;
    for (const TQCurveSetPtr& set : _curveSets) {
        if (!set) continue;
        auto saved = std::make_unique<TQCurveSetSerializer>(set->curveSetName());
        saved->setRelative(set->isRelative());
        for (uint32_t i = 0; i < set->numberOfChannelItems(); ++i) {
            const TQCurveEditorItemPtr entry = set->channeItemAtIndex(i);
            const auto* item = dynamic_cast<const TQCurveEditorChannelItem*>(entry.get());
            const TQChannelRef* ref = item ? item->channelRef() : nullptr;
            // A channel that no longer resolves is left out of the file.
            if (!ref || !root || !ref->getChannel(root)) continue;
            auto channel = std::make_unique<TQCurveEditorItemSerializer>();
            channel->setChannelRef(*ref);
            channel->setColorIndex(item->colorIndex());
            saved->addChannel(channel.release());
        }
        list->addCurveSet(saved.release());
    }

    const TQCurveSet* selected = _selectedCurveSet.get();
    if (!selected) return;
    const std::vector<TQCurveSetPtr> automatic = numberedAutomaticCurveSets(kSavingVersion);
    for (size_t n = 0; n < automatic.size(); ++n) {
        // Pivot has a number when read but none when saved: the list keeps the one it had,
        // so a document saved on Pivot reopens on Animated. Files depend on that gap.
        if (automatic[n].get() == selected && selected != _curveSetPivot.get()) {
            list->setSelectedCurveSet(static_cast<uint32_t>(n));
            return;
        }
    }
    for (size_t i = 0; i < _curveSets.size(); ++i)
        if (_curveSets[i].get() == selected) {
            list->setSelectedCurveSet(static_cast<uint32_t>(automatic.size() + i));
            return;
        }
}

void TQCurveEditorCtrl::constructCurveSets() {
    TQCurveSetListSerializer* list =
        _pAppDelegate ? _pAppDelegate->getCurveSetListSerializer() : nullptr;
    if (!list) return;
    TQChannelBase* root = _pAppDelegate->sceneChannelRoot();
    for (const TQCurveSetSerializer* saved : list->curveSets()) {
        if (!saved) continue;
        const TQCurveSetPtr set = curveSetWithName(saved->_name, true);
        set->setCurveSetShortcut(saved->_shortcut);
        // The channels go into the set by way of the selection.
        setSelectedCurveSet(set);
        for (const TQCurveEditorItemSerializer* item : saved->_channels) {
            if (!item) continue;
            const TQChannelRef ref(item->getChannelRef());
            auto* channel = root ? dynamic_cast<TQChannel*>(ref.getChannel(root)) : nullptr;
            if (!channel) continue;  // vanished, or no longer a channel
            const TQCurveEditorItemPtr made = appendChannelToCurveSet(channel);
            if (auto* madeItem = dynamic_cast<TQCurveEditorChannelItem*>(made.get()))
                madeItem->setColorIndex(item->getColorIndex());
        }
        // After the channels: a relative set takes its paths from the channels found.
        set->setRelative(saved->_relative);
    }
    const double version = _pAppDelegate->version();
    setSelectedCurveSet(curveSetForSavedNumber(list->getSelectedCurveSet(), version));
    refreshSelectedCurveSet();
}
