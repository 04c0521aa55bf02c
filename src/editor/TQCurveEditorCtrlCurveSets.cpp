// The curve set side of the full editor's controller: the automatic sets, the ordered list of
// custom sets, the selected set, creating, cloning and filling sets, and the pop-up that
// offers them all. The panels that manage the sets are in TQCurveEditorCtrlSetPanels.cpp.

#include <algorithm>
#include <array>
#include <cctype>
#include <string>
#include <type_traits>

#include "src/editor/TQCurveEditorCtrl.h"
#include "src/panels/TQEditorControls.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// The channels a set never shows: hidden ones (kTQChannelFlagHidden) and those hidden in curve
// editors, the flags an item's validity looks at.
constexpr uint64_t kNotShownFlags = kTQChannelFlagHidden | kTQChannelFlagHiddenInCurveEditor;

template <class Set>
std::shared_ptr<Set> makeAutomaticSet(TQCurveEditorAppDelegate* delegate) {
    auto set = std::make_shared<Set>();
    set->initWithName(TQLocalizedString(Set::kNameKey), delegate);
    return set;
}

BNString numbered(const BNString& base, uint32_t n) { return base + " " + std::to_string(n); }

}  // namespace

// ---- The automatic sets ----------------------------------------------------------------------

void TQCurveEditorCtrl::createAutomaticCurveSets() {
    _curveSetAnimated = makeAutomaticSet<TQCurveSetAnimated>(_pAppDelegate);
    _curveSetModified = makeAutomaticSet<TQCurveSetModified>(_pAppDelegate);
    _curveSetAll = makeAutomaticSet<TQCurveSetAll>(_pAppDelegate);
    _curveSetCurrent = makeAutomaticSet<TQCurveSetCurrent>(_pAppDelegate);
}

std::array<const TQCurveSet*, 11> TQCurveEditorCtrl::automaticCurveSets() const {
    return {_curveSetAnimated.get(), _curveSetModified.get(), _curveSetAll.get(),
            _curveSetCurrent.get(),  _curveSetPosition.get(), _curveSetScale.get(),
            _curveSetRotation.get(), _curveSetShear.get(),    _curveSetPivot.get(),
            _curveSetOpacity.get(),  _curveSetRetiming.get()};
}

bool TQCurveEditorCtrl::isAutomaticCurveSet(const TQCurveSet* set) const {
    const auto automatic = automaticCurveSets();
    return set && std::find(automatic.begin(), automatic.end(), set) != automatic.end();
}

// ---- Selecting -------------------------------------------------------------------------------

uint32_t TQCurveEditorCtrl::refreshSampleCount() const {
    const double width = _view ? _view->width() : 0.0;
    return static_cast<uint32_t>(std::max(0.0, width));
}

void TQCurveEditorCtrl::refreshCurveSet(const TQCurveSetPtr& set) {
    if (set) set->refresh(refreshSampleCount(), _snapshotChannels);
    if (_view) _view->getSelection()->reset();
    updateUI();
}

void TQCurveEditorCtrl::showSelectedCurveSet(const TQCurveSetPtr& set) {
    if (set == _selectedCurveSet) return;
    setSelectedCurveSet(set);
    refreshSelectedCurveSet();
    updateUI();
}

void TQCurveEditorCtrl::showAll(RWActionSender*) { showSelectedCurveSet(_curveSetAll); }
void TQCurveEditorCtrl::showAnimated(RWActionSender*) { showSelectedCurveSet(_curveSetAnimated); }
void TQCurveEditorCtrl::showModified(RWActionSender*) { showSelectedCurveSet(_curveSetModified); }
void TQCurveEditorCtrl::showActive(RWActionSender*) { showSelectedCurveSet(_curveSetCurrent); }
void TQCurveEditorCtrl::showPosition(RWActionSender*) { showSelectedCurveSet(_curveSetPosition); }
void TQCurveEditorCtrl::showRotation(RWActionSender*) { showSelectedCurveSet(_curveSetRotation); }
void TQCurveEditorCtrl::showScale(RWActionSender*) { showSelectedCurveSet(_curveSetScale); }
void TQCurveEditorCtrl::showShear(RWActionSender*) { showSelectedCurveSet(_curveSetShear); }
void TQCurveEditorCtrl::showPivot(RWActionSender*) { showSelectedCurveSet(_curveSetPivot); }
void TQCurveEditorCtrl::showOpacity(RWActionSender*) { showSelectedCurveSet(_curveSetOpacity); }
void TQCurveEditorCtrl::showRetiming(RWActionSender*) { showSelectedCurveSet(_curveSetRetiming); }

void TQCurveEditorCtrl::showCustom(RWActionSender* sender) {
    if (!sender) return;
    const int64_t index = sender->tag();
    // A tag out of range (a menu older than the list) selects nothing.
    if (index < 0 || index >= static_cast<int64_t>(_curveSets.size())) return;
    showSelectedCurveSet(_curveSets[static_cast<size_t>(index)]);
}

// ---- The custom list -------------------------------------------------------------------------

void TQCurveEditorCtrl::addCurveSet(const TQCurveSetPtr& set) {
    if (set) _curveSets.push_back(set);
}

TQCurveSetPtr TQCurveEditorCtrl::curveSetWithName(const BNString& name, bool createIfNeeded) {
    for (const TQCurveSetPtr& set : _curveSets)
        if (set && set->curveSetName() == name) return set;
    return createIfNeeded ? createCurveSetWithName(name) : nullptr;
}

TQCurveSetPtr TQCurveEditorCtrl::createCurveSetWithName(const BNString& name) {
    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithName(findUniqueCurveSetNameForName(name), _pAppDelegate);
    _curveSets.push_back(set);
    return set;
}

TQCurveSetPtr TQCurveEditorCtrl::getCurveSetById(uint32_t identifier) const {
    for (const TQCurveSetPtr& set : _curveSets)
        if (set && set->curveSetId() == identifier) return set;
    return nullptr;
}

void TQCurveEditorCtrl::removeCurveSet(const TQCurveSet* set) {
    auto it = std::find_if(_curveSets.begin(), _curveSets.end(),
                           [&](const TQCurveSetPtr& s) { return s.get() == set; });
    if (it != _curveSets.end()) _curveSets.erase(it);
}

TQCurveSetPtr TQCurveEditorCtrl::cloneCurveSetWithName(const BNString& name) {
    if (!_selectedCurveSet) return nullptr;
    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithCurveSet(*_selectedCurveSet);
    // Always absolute at first, whatever it was cloned from.
    set->setRelative(false);
    _curveSets.push_back(set);
    setSelectedCurveSet(set);
    // Named last: the clone is in the list already, so its own present name does not clash.
    set->setCurveSetName(findUniqueCurveSetNameForName(name));
    return set;
}

TQCurveSetPtr TQCurveEditorCtrl::cloneCurveSet(const TQCurveSet& source) {
    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithCurveSet(source);
    BNString name = source.curveSetName();
    const BNString copy = TQLocalizedString("Curve Editor Curve Set Copy");
    // Appended as it stands, with no blank added: the text carries its own.
    if (name.find(copy) == BNString::npos) name += copy;
    set->setCurveSetName(findUniqueCurveSetNameForName(name));
    _curveSets.push_back(set);
    return set;
}

TQCurveSetPtr TQCurveEditorCtrl::addCurveSetToCurrent(const TQCurveSetPtr& other) {
    const TQCurveSetPtr selected = _selectedCurveSet;
    if (!other || !selected) return nullptr;
    refreshCurveSet(other);
    refreshCurveSet(selected);
    auto otherCopy = std::make_shared<TQCurveSetMutable>();
    otherCopy->initWithCurveSet(*other);
    auto merged = std::make_shared<TQCurveSetMutable>();
    merged->initWithCurveSet(*selected);
    merged->setCurveSetName(findUniqueCurveSetNameForName(merged->curveSetName()));
    merged->addCurveSet(*otherCopy);
    _curveSets.push_back(merged);
    setSelectedCurveSet(merged);
    return merged;
}

BNString TQCurveEditorCtrl::findUniqueCurveSetNameForName(const BNString& name) const {
    BNString base = name;
    BNString candidate = name;
    uint32_t n = 1;
    // One digit at the very end after a blank is a number to go on from; "Foo 12" keeps its
    // number whole in the base, since no blank stands before its last digit.
    const size_t size = name.size();
    if (size >= 2 && std::isdigit(static_cast<unsigned char>(name[size - 1])) &&
        std::isblank(static_cast<unsigned char>(name[size - 2]))) {
        n = static_cast<uint32_t>(name[size - 1] - '0');
        base = name.substr(0, size - 2);
        candidate = n >= 2 ? numbered(base, n) : base;
    }
    for (const TQCurveSet* set : automaticCurveSets())
        if (set && set->curveSetName() == base) {
            // The automatic sets' names are reserved.
            candidate = numbered(base, n++);
            break;
        }
    for (;;) {
        const bool taken = std::any_of(_curveSets.begin(), _curveSets.end(), [&](const auto& set) {
            return set && set->curveSetName() == candidate;
        });
        if (!taken) return candidate;
        candidate = numbered(base, n++);
    }
}

bool TQCurveEditorCtrl::canModifySelectedCurveSet() const {
    return dynamic_cast<TQCurveSetMutable*>(_selectedCurveSet.get()) != nullptr;
}

// ---- Filling the selected set ----------------------------------------------------------------

TQCurveSetPtr TQCurveEditorCtrl::customSetForAdding() {
    // The user's first add while an automatic set shows starts a new custom set, the Active
    // set included although it takes channels by hand.
    if (isAutomaticCurveSet(_selectedCurveSet.get())) {
        const BNString name =
            numbered(TQLocalizedString("Curve Editor Curve Set Untitled"), gNewCurveSetIndex);
        ++gNewCurveSetIndex;
        setSelectedCurveSet(curveSetWithName(name, true));
    }
    return _selectedCurveSet;
}

TQCurveEditorItemPtr TQCurveEditorCtrl::appendChannelToCurveSet(TQChannel* channel) {
    if (!channel) return nullptr;
    const TQCurveSetPtr set = customSetForAdding();
    auto item = std::make_shared<TQCurveEditorChannelItem>();
    item->initWithChannel(channel, newItemSampleCount(), _pAppDelegate,
                          static_cast<char>(_ignoreHiddenChannels));
    if (auto* target = dynamic_cast<TQCurveSetMutable*>(set.get()); target && item->isValid())
        target->appendItem(item);
    postNotification(kTQNotifyCurveSetContentChanged);
    return item;
}

TQCurveEditorItemPtr TQCurveEditorCtrl::appendFolderToCurveSet(TQChannelFolder* folder) {
    if (!folder) return nullptr;
    const TQCurveSetPtr set = customSetForAdding();
    if (folder->testFlag(kNotShownFlags)) return nullptr;
    auto* target = dynamic_cast<TQCurveSetMutable*>(set.get());
    TQCurveEditorItemPtr last;
    if (const std::vector<TQChannelBase*>* children = folder->getChildren()) {
        // A copy: a host's notify, reached through the posts below, may change the tree.
        const std::vector<TQChannelBase*> snapshot = *children;
        for (TQChannelBase* child : snapshot) {
            if (!child || child->testFlag(kNotShownFlags)) continue;
            if (auto* channel = dynamic_cast<TQChannel*>(child)) {
                if (!channel->canKeyframe()) continue;
                auto item = std::make_shared<TQCurveEditorChannelItem>();
                item->initWithChannel(channel, newItemSampleCount(), _pAppDelegate,
                                      static_cast<char>(_ignoreHiddenChannels));
                if (target) target->appendItem(item);
                last = item;
            } else if (auto* sub = dynamic_cast<TQChannelFolder*>(child)) {
                appendFolderToCurveSet(sub);
            }
        }
    }
    postNotification(kTQNotifyCurveSetContentChanged);
    updateUI();
    return last;
}

TQCurveEditorItemPtr TQCurveEditorCtrl::setChannelInList(TQChannel* channel) {
    auto* target = dynamic_cast<TQCurveSetMutable*>(_selectedCurveSet.get());
    if (!target || !channel) return nullptr;
    auto item = std::make_shared<TQCurveEditorChannelItem>();
    item->initWithChannel(channel, newItemSampleCount(), _pAppDelegate,
                          static_cast<char>(_ignoreHiddenChannels));
    if (!item->isValid()) return item;
    if (_snapshotChannels) item->takeCurveSnapshot(1);
    target->setItem(item);
    postNotification(kTQNotifyCurveSetContentChanged);
    updateUI();
    return item;
}

void TQCurveEditorCtrl::clearSelectedCurveSet() { clearCurveSet(_selectedCurveSet); }

void TQCurveEditorCtrl::clearCurveSet(const TQCurveSetPtr& set) {
    if (!set) {
        // With no custom set there is nothing to fall back on: nothing is selected.
        if (!_curveSets.empty()) setSelectedCurveSet(_curveSets.front());
    } else if (auto* mutableSet = dynamic_cast<TQCurveSetMutable*>(set.get())) {
        mutableSet->clear();
    }
    postNotification(kTQNotifyCurveSetContentChanged);
}

void TQCurveEditorCtrl::selectChannel(const TQChannelBase* channel, bool enable) {
    if (_selectedCurveSet && channel)
        if (const TQCurveEditorItemPtr item = _selectedCurveSet->itemWithChannel(channel))
            item->select(enable ? 1 : 0);
    updateUI();
}

void TQCurveEditorCtrl::enableChannel(const TQChannelBase* channel, bool enable) {
    if (_selectedCurveSet && channel)
        if (const TQCurveEditorItemPtr item = _selectedCurveSet->itemWithChannel(channel))
            item->enableItem(enable ? 1 : 0);
    updateUI();
}

void TQCurveEditorCtrl::soloItem(TQCurveEditorItem* item) {
    if (!item || !_selectedCurveSet) return;
    if (item->isEnabledItem() == 0) {
        item->enableItem(1);
        _selectedCurveSet->enableAll(false, item);
    } else if (_selectedCurveSet->numberOfEnabledItems() == 1) {
        _selectedCurveSet->enableAll(true, nullptr);
    } else {
        _selectedCurveSet->enableAll(false, item);
    }
    redrawCurveEditor();
}

// ---- The pop-up ------------------------------------------------------------------------------

void TQCurveEditorCtrl::refreshPopUp() {
    const std::shared_ptr<RWPopUpButton> popUp = _curveSetsPopUp;
    if (!popUp) return;
    popUp->removeAllItems();
    // Every item enabled with this controller as target, and the set's shortcut as its key
    // equivalent: the menu ignores key equivalents, so the key is shown, never taken. `keepMask`
    // leaves the default modifier mask, which only All, Active, New and Manage keep: the
    // others' keys are plain keys.
    auto add = [&](const BNString& title, const char* action, const TQCurveSetPtr& set,
                   bool keepMask) {
        auto item =
            std::make_shared<RWMenuItem>(title, action, set ? set->curveSetShortcut() : BNString());
        item->setTarget(this);
        item->setEnabled(true);
        if (!keepMask) item->setKeyEquivalentModifierMask(0);
        popUp->addItem(item);
        if (set && set == _selectedCurveSet) popUp->selectItem(item.get());
        return item;
    };
    auto addAutomatic = [&](const auto& set, const char* action, bool keepMask) {
        using Set = typename std::decay_t<decltype(set)>::element_type;
        add(TQLocalizedString(Set::kNameKey), action, set, keepMask);
    };
    addAutomatic(_curveSetAll, "showAll:", true);
    addAutomatic(_curveSetAnimated, "showAnimated:", false);
    add(TQLocalizedString(TQCurveSetModified::kNameKey), "showModified:", _curveSetModified, false);
    addAutomatic(_curveSetCurrent, "showActive:", true);
    if (_useRelativeCurveSets) {
        popUp->addItem(RWMenuItem::separatorItem());
        addAutomatic(_curveSetPosition, "showPosition:", false);
        addAutomatic(_curveSetRotation, "showRotation:", false);
        addAutomatic(_curveSetScale, "showScale:", false);
        addAutomatic(_curveSetShear, "showShear:", false);
        addAutomatic(_curveSetPivot, "showPivot:", false);
        addAutomatic(_curveSetOpacity, "showOpacity:", false);
        addAutomatic(_curveSetRetiming, "showRetiming:", false);
        popUp->addItem(RWMenuItem::separatorItem());
    }
    for (size_t i = 0; i < _curveSets.size(); ++i) {
        const TQCurveSetPtr& set = _curveSets[i];
        add(set ? set->curveSetName() : BNString(), "showCustom:", set, false)
            ->setTag(static_cast<int64_t>(i));
    }
    popUp->addItem(RWMenuItem::separatorItem());
    add(TQLocalizedString("Curve Editor Curve Set New"), "showNewCurveSet:", nullptr, true);
    add(TQLocalizedString("Curve Editor Curve Set Manage"), "showCurveSet:", nullptr, true);
    if (popUp->numberOfItems() > 0) {
        if (popUp->indexOfSelectedItem() == -1) popUp->selectItemAtIndex(0);
        if (const RWMenuItemPtr selected = popUp->selectedItem())
            popUp->setTitle(selected->title());
    }
}
