// The full editor's controller: wiring, the update cycle of notify, the controls it keeps in
// step (the vertical scroller, the tool switch, the list), the window callbacks, the frame
// grid and the routing of actions. The curve set registry and the pop-up are in
// TQCurveEditorCtrlCurveSets.cpp.

#include "src/editor/TQCurveEditorCtrl.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <limits>
#include <unordered_set>

#include "src/editor/TQCurveEditorView.h"
#include "src/editor/TQCurveSetManagerList.h"
#include "src/panels/TQEditorControls.h"
#include "src/resources/TQStrings.h"

namespace {

constexpr TQNotificationWord kSceneWords =
    kTQNotifySceneChanged | kTQNotifySceneReset | kTQNotifyCurveSetContentChanged;
constexpr TQNotificationWord kChannelWords = kTQNotifyChannelsChanging | kTQNotifyChannelsChanged;
constexpr TQNotificationWord kTimeWords = kTQNotifyHostTimeChanged | kTQNotifyTimeChanged;
constexpr TQNotificationWord kPreviewWords = kTQNotifyPreviewChanged | kTQNotifyPlayRangeChanged;
// A channel with either flag is not shown, so its change does not make a set stale.
constexpr uint64_t kHiddenChannelFlags = kTQChannelFlagHidden | kTQChannelFlagHiddenInCurveEditor;
// Five text updates a second during playback, meant as the limit of the rows' refresh.
constexpr double kFrameTextInterval = 0.2;
// The focus ring of the manager's table: the default one.
constexpr int64_t kFocusRingDefault = 1;
// Ranges of the simplify and generate panels' controls.
constexpr double kSimplifyParameterMax = 10.0;
constexpr double kCyclesMin = 1.0;
constexpr double kCyclesMax = 10.0;

// Wall-clock seconds, as the frame text limit reads them.
double wallClockSeconds() {
    using namespace std::chrono;
    return duration<double>(system_clock::now().time_since_epoch()).count();
}

}  // namespace

TQCurveEditorCtrl::TQCurveEditorCtrl() = default;

TQCurveEditorCtrl::~TQCurveEditorCtrl() {
    _draggedRows.clear();
    if (const std::shared_ptr<RWPopUpButton> popUp = _observedPopUp.lock();
        popUp && _popUpObservation)
        popUp->removeNotificationObserver(*_popUpObservation);
    if (_view && _view->getController() == this) _view->setController(nullptr);
    _curveSets.clear();
    for (const std::shared_ptr<RWPanel>& panel : {_reducePanel, _generatePanel, _curveSetNewPanel})
        if (panel && panel->delegate() == this) panel->setDelegate(nullptr);
    if (_curveSetManagerList && _curveSetManagerList->controller() == this) {
        _curveSetManagerList->setController(nullptr);
        _curveSetManagerList->setDelegate(nullptr);
    }
}

// ---- Lifecycle -------------------------------------------------------------------------------

void TQCurveEditorCtrl::init() {
    TQCurveEditorCtrlBase::init();
    _curveSets.clear();
    _extrapolationType = 0;
    _currChan = nullptr;
    _initialCurve.reset();
    _ignoreHiddenChannels = true;
    _useRelativeCurveSets = true;
}

void TQCurveEditorCtrl::connectOutlets(const TQCurveEditorOutlets& o) {
    _verticalScroller = o.verticalScroller;
    _horizontalZoomScroller = o.horizontalZoomScroller;
    _bottomRight = o.bottomRight;
    _autozoom = o.autozoom;
    _curveControls = o.curveControls;
    _waveformListButton = o.waveformListButton;
    _curveSetsPopUp = o.curveSetsPopUp;
    _curveSetManagerPanel = o.curveSetManagerPanel;
    _curveSetManagerList = o.curveSetManagerList;
    _curveSetManagerApply = o.curveSetManagerApply;
    _plusMinusSegmentedControl = o.plusMinusSegmentedControl;
    _curveSetManagerDuplicate = o.curveSetManagerDuplicate;
    _curveSetNewPanel = o.curveSetNewPanel;
    _curveSetNewOk = o.curveSetNewOk;
    _curveSetNewCancel = o.curveSetNewCancel;
    _curveSetNewName = o.curveSetNewName;
    _channels = o.channels;
    _channelsList = o.channelsList;
    _generatePanel = o.generatePanel;
    _numberOfCyclesSlider = o.numberOfCyclesSlider;
    _numberOfCycles = o.numberOfCycles;
    _reducePanel = o.reducePanel;
    _tolerance = o.tolerance;
    _smoothness = o.smoothness;
    _toleranceSlider = o.toleranceSlider;
    _smoothnessSlider = o.smoothnessSlider;
    _tools = o.tools;
}

TQCurveEditorView* TQCurveEditorCtrl::curveEditorView() const {
    return dynamic_cast<TQCurveEditorView*>(_view);
}

void TQCurveEditorCtrl::setupController() {
    // 1. The view's range, and the view wired to this controller.
    const CMTimeRange total = _view ? _view->getTotalRange() : kCMTimeRangeZero;
    TQCurveEditorView* timeline = curveEditorView();
    if (timeline) timeline->setInitialTime(&total);
    if (_view) _view->setController(this);
    if (timeline) timeline->displayRangeModified(total);

    // 2. The automatic sets.
    createAutomaticCurveSets();
    auto make = [&](auto& field) {
        using Set = typename std::decay_t<decltype(field)>::element_type;
        field = std::make_shared<Set>();
        field->initWithName(TQLocalizedString(Set::kNameKey), _pAppDelegate);
    };
    make(_curveSetPosition);
    make(_curveSetScale);
    make(_curveSetRotation);
    make(_curveSetOpacity);
    make(_curveSetShear);
    make(_curveSetPivot);
    make(_curveSetRetiming);

    // 3. The panels report their closing here.
    for (const std::shared_ptr<RWPanel>& panel : {_reducePanel, _generatePanel, _curveSetNewPanel})
        if (panel) panel->setDelegate(this);

    // 4. The panels' ranges.
    for (RWValueControl* parameter : {static_cast<RWValueControl*>(_tolerance.get()),
                                      static_cast<RWValueControl*>(_smoothness.get()),
                                      static_cast<RWValueControl*>(_toleranceSlider.get()),
                                      static_cast<RWValueControl*>(_smoothnessSlider.get())})
        if (parameter) {
            parameter->setMinValue(0.0);
            parameter->setMaxValue(kSimplifyParameterMax);
        }
    for (RWValueControl* cycles : {static_cast<RWValueControl*>(_numberOfCyclesSlider.get()),
                                   static_cast<RWValueControl*>(_numberOfCycles.get())})
        if (cycles) {
            cycles->setMinValue(kCyclesMin);
            cycles->setMaxValue(kCyclesMax);
        }

    // 5. The list selects any number of channels, or none.
    if (_channels) {
        _channels->setAllowsEmptySelection(true);
        _channels->setAllowsMultipleSelection(true);
    }

    // 6. The tool switch: a segment per tool, the edit tool selected.
    if (_tools) {
        const auto toolCount = static_cast<int64_t>(std::size(kToolImageNames));
        if (_tools->segmentCount() < toolCount) _tools->setSegmentCount(toolCount);
        for (int64_t i = 0; i < toolCount; ++i)
            _tools->setImageName(kToolImageNames[static_cast<size_t>(i)], i);
        _tools->setSelectedSegment(static_cast<int64_t>(TQTool::kEdit));
        _tools->setBordered(false);
    }

    // 7. The vertical scroller becomes the framework's own, in the old one's place.
    if (_verticalScroller) {
        auto scroller = std::make_shared<TQVantaZoomScroller>();
        scroller->takePlacementAndTargetFrom(*_verticalScroller);
        if (RWControlSuperview* superview = _verticalScroller->superview())
            superview->replaceSubview(*_verticalScroller, scroller);
        _verticalScroller = scroller;
        scroller->setEnabled(false);
        scroller->setFloatValue(0.0);
        scroller->setKnobProportion(0.0);
        scroller->setMinimumKnobProportion(kMinimumKnobProportion);
    }

    // 8.
    _oldKnobValue = 0.0f;
    _oldKnobProportion = 0.0f;

    // 9. The manager's table.
    if (_curveSetManagerList) {
        _curveSetManagerList->setAllowsEmptySelection(true);
        _curveSetManagerList->setController(this);
        _curveSetManagerList->registerForDraggedTypes({kPrivateDragType});
        _curveSetManagerList->setDelegate(this);
        _curveSetManagerList->setFocusRingType(kFocusRingDefault);
    }

    // 10.
    setSelectedCurveSet(_curveSetAnimated);
    refreshSelectedCurveSet();

    // 11. The manager's add and remove pair.
    if (_plusMinusSegmentedControl) {
        RWSegmentedControl& pair = *_plusMinusSegmentedControl;
        if (pair.segmentCount() < 2) pair.setSegmentCount(2);
        pair.setAccessibilityLabel(TQLocalizedString("Curve Editor Curve Set Add/Remove"));
        pair.setLabel("", 0);
        pair.setLabel("", 1);
        pair.setImageName("K_General_Add", 0);
        pair.setImageName("K_General_Remove", 1);
        pair.setAccessibilityDescription(TQLocalizedString("Curve Editor Curve Set Add"), 0);
        pair.setAccessibilityDescription(TQLocalizedString("Curve Editor Curve Set Remove"), 1);
    }

    // 12. The pop-up: its menu ignores key equivalents, and it is rebuilt each time it opens.
    if (_curveSetsPopUp) {
        _curveSetsPopUp->selectItem(nullptr);
        _curveSetsPopUp->setMenu(std::make_shared<TQIgnoreKeyEquivalentsMenu>());
        _curveSetsPopUp->setBordered(false);
        if (const std::shared_ptr<RWPopUpButton> old = _observedPopUp.lock();
            old && _popUpObservation)
            old->removeNotificationObserver(*_popUpObservation);
        _popUpObservation = _curveSetsPopUp->addNotificationObserver(
            RWPopUpButtonWillPopUpNotification, [this](RWControl&) { refreshPopUp(); });
        _observedPopUp = _curveSetsPopUp;
    }
}

void TQCurveEditorCtrl::viewDidLoad() {
    constructCurveSets();
    refreshPopUp();
}

// ---- Notifications ---------------------------------------------------------------------------

void TQCurveEditorCtrl::notify(TQNotificationWord word) {
    TQCurveEditorAppDelegate* delegate = _pAppDelegate;
    // 1. The view volume moved: every curve is sampled again.
    if (word & kTQNotifyViewVolumeChanged) {
        _refreshViewAndBrowser();
        redrawCurveEditor();
        if (_view) _view->setAllOriginalCurveDirty(1);
    }
    // 2.
    if (word & kTQNotifyToolChanged) _refreshViewAndBrowser();
    // 3. A change of the shown channels forgets the box tool's box.
    if (word & kTQNotifyCurveSetContentChanged) {
        if (_view) _view->currentToolChanged();
        _refreshViewAndBrowser();
    }
    // 4.
    if (word & kTQNotifyObjectSelectionChanged) {
        refreshSelectedCurveSet();
        _refreshViewAndBrowser();
    }
    // 5. The scene or the shown set changed; the set counts as stale for step 7 as well.
    bool stale = false;
    if (word & kSceneWords) {
        stale = true;
        const bool sceneReset = (word & kTQNotifySceneReset) != 0;
        if (sceneReset) {
            if (_curveSetCurrent) _curveSetCurrent->clear();
            if (_view) _view->currentToolChanged();
            _refreshViewAndBrowser();
        }
        redrawCurveEditor();
        if (_selectedCurveSet != _curveSetCurrent) {
            refreshSelectedCurveSet();
        } else if (sceneReset) {
            // The Active set is cleared a second time here, on purpose: it always has been.
            if (_curveSetCurrent) _curveSetCurrent->clear();
            _refreshViewAndBrowser();
        } else if (word & kTQNotifyCurveSetContentChanged) {
            refreshSelectedCurveSet();
        } else if (!delegate || !delegate->objectsSelectedInScene()) {
            refreshSelectedCurveSet();
        }
    }
    // 6.
    if (word & kTQNotifyCurvesInvalidated) {
        redrawCurveEditor();
        if (_view) _view->setAllOriginalCurveDirty(1);
    }
    // 7.
    if (word & kChannelWords) notifyChannelsChanged(stale);
    // 8.
    if (word & kPreviewWords) redrawCurveEditor();
    // 9.
    if (word & kTimeWords) notifyTimeChanged();
    // 10.
    if (word & kTQNotifyDisplayChanged) redrawCurveEditor();
    // 11.
    if (word & kTQNotifyCurveSetContentChanged) refreshPopUp();
    // 12. Always, also for a word with no known bit.
    if (delegate) delegate->resetModifiedChannels();
}

void TQCurveEditorCtrl::notifyChannelsChanged(bool stale) {
    TQCurveEditorAppDelegate* delegate = _pAppDelegate;
    // Held: a refresh below may replace the selected set.
    const TQCurveSetPtr set = _selectedCurveSet;
    // The sets whose members change as channels change.
    const bool followsChanges =
        set && (set == _curveSetCurrent || set == _curveSetAnimated || set == _curveSetModified);
    if (followsChanges) {
        if (delegate && !stale) {
            TQChannelBase* root = delegate->sceneChannelRoot();
            for (const TQChannelRef& ref : delegate->modifiedChannels()) {
                auto* channel = dynamic_cast<TQChannel*>(ref.getChannel(root));
                if (!channel || channel->testFlag(kHiddenChannelFlags) ||
                    set->itemWithChannel(channel))
                    continue;
                if (set != _curveSetAnimated || channel->isAnimated(false)) {
                    stale = true;
                    break;
                }
            }
        }
        if (stale) {
            refreshSelectedCurveSet();
            _refreshViewAndBrowser();
        } else {
            updateIfModifiedByBehaviors();
        }
    } else {
        updateIfModifiedByBehaviors();
    }
    // Roots whose object changed: their names and anchors again.
    if (const TQCurveSetPtr shown = _selectedCurveSet; shown && delegate) {
        for (uint32_t i = 0; i < shown->numberOfItems(); ++i) {
            const TQCurveEditorFolderItemPtr rootItem = shown->rootItemAtIndex(i);
            TQChannelFolder* folder = rootItem ? rootItem->folder() : nullptr;
            if (folder && delegate->wasChannelModified(folder)) {
                rootItem->refresh();
                _refreshViewAndBrowserForItem(rootItem.get());
            }
        }
    }
    if (_view && !_view->isInCurveEditor() && shouldAutoZoom()) {
        _view->performAutoZoom(true);
        updateVerticalZoomScroller();
    }
    redrawCurveEditor();
}

void TQCurveEditorCtrl::notifyTimeChanged() {
    redrawCurveEditor();
    TQCurveEditorAppDelegate* delegate = _pAppDelegate;
    if (delegate && delegate->isPlaying()) {
        const double now = wallClockSeconds();
        if (now - _lastFrameTextUpdateTime <= kFrameTextInterval) return;
        // The field is a bool: it keeps whether `now` is non-zero, so it reads 0 or 1 and the
        // limit above never holds a call back. Kept with its type.
        _lastFrameTextUpdateTime = (now != 0.0);
    }
    if (const TQCurveSetPtr set = _selectedCurveSet) {
        for (const TQCurveEditorItemPtr& item : set->allItems()) {
            const TQChannel* channel = item ? item->channel() : nullptr;
            if (channel &&
                (channel->isAnimated(false) || channel->isChannelAffectedByBehaviors(true)))
                refreshViewAndBrowserWithoutTitleForItem(item.get());
        }
    }
    redrawCurveEditor();
}

void TQCurveEditorCtrl::update() {
    if (_view) {
        _view->getSelection()->reset();
        _view->setAllOriginalCurveScaleDirty(1);
    }
    updateUI();
    notify(kTQNotifyChannelsChanged);
}

void TQCurveEditorCtrl::displayRangeModified(CMTimeRange range) {
    if (TQCurveEditorView* timeline = curveEditorView()) timeline->displayRangeModified(range);
}

// ---- Refresh ---------------------------------------------------------------------------------

void TQCurveEditorCtrl::_refreshViewAndBrowser() {
    updateUI();
    redrawCurveEditor();
}

void TQCurveEditorCtrl::_refreshViewAndBrowserForItem(const TQCurveEditorItem* item) {
    if (_channels) {
        const int64_t row = _channels->rowForItem(item);
        if (row >= 0) _channels->setNeedsDisplayInRect(_channels->rectOfRow(row));
    }
    redrawCurveEditor();
}

void TQCurveEditorCtrl::_refreshViewAndBrowserForItem(const TQCurveEditorItem* item,
                                                      uint32_t atCol) {
    if (_channels) {
        const int64_t row = _channels->rowForItem(item);
        if (row >= 0) _channels->setNeedsDisplayInRect(_channels->frameOfCellAtColumn(atCol, row));
    }
    redrawCurveEditor();
}

void TQCurveEditorCtrl::refreshViewAndBrowserWithoutTitleForItem(const TQCurveEditorItem* item) {
    if (_channels && _channelsList) {
        const int64_t row = _channels->rowForItem(item);
        if (row >= 0) _channelsList->refreshRowWithoutTitle(row);
    }
    redrawCurveEditor();
}

void TQCurveEditorCtrl::updateUI() {
    if (_verticalScroller) _verticalScroller->setEnabled(!(_view && _view->autoZoom()));
    updateVerticalZoomScroller();
    if (_channelsList) _channelsList->update();
    if (_channels) _channels->resetCursorRects();
    if (_curveSetsPopUp && _curveSetsPopUp->numberOfItems() > 0) {
        if (_curveSetsPopUp->indexOfSelectedItem() == -1) _curveSetsPopUp->selectItemAtIndex(0);
        if (const RWMenuItemPtr selected = _curveSetsPopUp->selectedItem())
            _curveSetsPopUp->setTitle(selected->title());
    }
    TQCurveEditorCtrlBase::updateUI();
}

void TQCurveEditorCtrl::updateVerticalZoomScroller() {
    const CGRect m = getMaxViewVolume();
    const CGRect c = _view ? _view->getCurrentViewVolume() : CGRectZero;
    const double slack = m.size.height - c.size.height;
    const double value =
        std::fabs(slack) < kExtentTolerance ? 0.0 : 1.0 - (c.origin.y - m.origin.y) / slack;
    double proportion =
        std::fabs(m.size.height) < kExtentTolerance ? 0.0 : c.size.height / m.size.height;
    if (std::fabs(proportion - 1.0) < kExtentTolerance) proportion = 1.0;
    if (!_verticalScroller) {
        _oldKnobValue = 0.0f;
        _oldKnobProportion = 0.0f;
        return;
    }
    _verticalScroller->setFloatValue(value);
    _verticalScroller->setKnobProportion(proportion);
    // What the scroller kept, which may differ from what it was given.
    _oldKnobValue = static_cast<float>(_verticalScroller->floatValue());
    _oldKnobProportion = static_cast<float>(_verticalScroller->knobProportion());
}

// ---- Window and view callbacks ---------------------------------------------------------------

bool TQCurveEditorCtrl::windowShouldClose(RWWindow& window) {
    // The panels close freely; only the editor's own window takes the sets' items with it.
    if (&window == _generatePanel.get() || &window == _reducePanel.get()) return true;
    for (const TQCurveSetPtr& set : {_selectedCurveSet, TQCurveSetPtr(_curveSetAnimated),
                                     _curveSetModified, TQCurveSetPtr(_curveSetAll)})
        if (set) set->reset();
    return true;
}

void TQCurveEditorCtrl::windowWillClose(RWWindow& window) {
    if (&window == _generatePanel.get() || &window == _reducePanel.get())
        RWApplicationServices().modal->abortModal();
    else if (&window == _curveSetNewPanel.get())
        newCurveSetCancel();
}

void TQCurveEditorCtrl::viewDidResize() {
    if (TQCurveEditorView* timeline = curveEditorView()) {
        const CMTimeRange range = timeline->getDisplayRange();
        timeline->setInitialTime(&range);
    }
    const uint32_t samples = newItemSampleCount();
    for (const TQCurveSetPtr& set : _curveSets)
        if (set)
            for (const TQCurveEditorItemPtr& item : set->allItems())
                if (auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get()))
                    channelItem->setNumberOfSamples(samples);
    TQCurveEditorCtrlBase::viewDidResize();
}

void TQCurveEditorCtrl::windowWasPanned(double) { updateVerticalZoomScroller(); }

void TQCurveEditorCtrl::windowWasZoomed() { updateVerticalZoomScroller(); }

// ---- Tools and zoom --------------------------------------------------------------------------

TQTool TQCurveEditorCtrl::getCurrentTool() const {
    if (!_tools || _tools->selectedSegment() < 0) return TQTool::kEdit;
    return static_cast<TQTool>(_tools->selectedSegment());
}

void TQCurveEditorCtrl::setCurrentTool(TQTool tool) {
    if (_tools) _tools->setSelectedSegment(static_cast<int64_t>(tool));
    _currentTool = tool;
    if (_view) _view->currentToolChanged();
}

void TQCurveEditorCtrl::setCurrentTool(RWActionSender*) {
    if (_view) _view->currentToolChanged();
}

void TQCurveEditorCtrl::setAutoZoom(RWActionSender*) {
    if (!_view) return;
    const bool on = !_view->autoZoom();
    _view->setAutoZoom(on ? 1 : 0);
    if (on) {
        _view->frameAll(0);
        if (_verticalScroller) _verticalScroller->setEnabled(false);
    } else {
        if (_verticalScroller) _verticalScroller->setEnabled(true);
        updateVerticalZoomScroller();
    }
}

void TQCurveEditorCtrl::panVertically(double fraction) {
    if (_view) _view->panWithPage(0.0, fraction);
}

void TQCurveEditorCtrl::verticalZoomScroll(RWActionSender* sender) {
    auto* scroller = dynamic_cast<RWZoomScroller*>(sender);
    if (!scroller) return;
    const CGRect c = _view ? _view->getCurrentViewVolume() : CGRectZero;
    const CGRect m = getMaxViewVolume();
    switch (scroller->hitPart()) {
        case kRWScrollerDecrementPage: panVertically(-kPageStep); break;
        case kRWScrollerIncrementPage: panVertically(kPageStep); break;
        case kRWScrollerDecrementLine: panVertically(-kLineStep); break;
        case kRWScrollerIncrementLine: panVertically(kLineStep); break;
        case kRWScrollerKnob:
        case kRWScrollerKnobSlot:
        case kRWScrollerKnobStartEdge:
        case kRWScrollerKnobEndEdge:
            if (_view) _view->setVerticalZoom(scroller->knobProportion(), scroller->floatValue());
            redrawCurveEditor();
            return;
        default: return;
    }
    // From the volumes before the pan, and without the flip of updateVerticalZoomScroller:
    // the two have always differed; the next update puts the knob right.
    const double slack = m.size.height - c.size.height;
    if (std::fabs(slack) >= kExtentTolerance)
        scroller->setFloatValue((c.origin.y - m.origin.y) / slack);
    _oldKnobValue = static_cast<float>(scroller->floatValue());
}

bool TQCurveEditorCtrl::shouldAutoZoom() const {
    const CGRect m = getMaxViewVolume();
    const CGRect c = _view ? _view->getCurrentViewVolume() : CGRectZero;
    if (!(m.size.height > c.size.height)) return false;
    if (_view && _view->autoZoom()) return true;
    float p = std::fabs(m.size.height) < kExtentTolerance
                  ? 0.0f
                  : static_cast<float>(c.size.height / m.size.height);
    if (std::fabs(p - 1.0f) < kProportionTolerance) p = 1.0f;
    const double knob = _verticalScroller ? _verticalScroller->knobProportion() : 0.0;
    return std::fabs(p - knob) >= kProportionTolerance;
}

// ---- Time ------------------------------------------------------------------------------------

CMTime TQCurveEditorCtrl::convertToCurveEditorAxis(CMTime time) const {
    const CMTime frame = _pAppDelegate ? _pAppDelegate->getFrameDuration() : CMTime{};
    // Half a frame exactly: at the frame's own timescale a half would be rounded.
    const CMTime half =
        frame.timescale > 0 && frame.timescale <= std::numeric_limits<int32_t>::max() / 2
            ? CMTimeMake(frame.value, frame.timescale * 2)
            : frame * 0.5;
    return BN_CMTimeFloorToSampleDuration(BN_CMTimeSaferAdd(time, half), frame);
}

CMTime TQCurveEditorCtrl::getTimeOffsetForChannel(const TQChannelBase* channel) const {
    return channel ? channel->timeOffset() : kCMTimeZero;
}

// ---- Selection -------------------------------------------------------------------------------

void TQCurveEditorCtrl::selectionChangedTo(TQCurveSelectionList* list) {
    // Without a list no row shows an item: the items are deselected and selected directly,
    // as a list does through its selection.
    if (_channels)
        _channels->deselectAll();
    else
        deselectAllChannels();
    std::unordered_set<uint32_t> curves;
    if (list)
        for (const TQCurveSelectionPtr& entry : list->getSelectionArray())
            if (entry) curves.insert(entry->getCurveId());
    if (const TQCurveSetPtr set = _selectedCurveSet) {
        for (const TQCurveEditorItemPtr& item : set->allItems()) {
            if (!dynamic_cast<TQCurveEditorChannelItem*>(item.get()) ||
                !curves.contains(item->channelId()))
                continue;
            const int64_t row = _channels ? _channels->rowForItem(item.get()) : -1;
            if (row < 0)
                item->select(1);
            else
                _channels->selectRowIndexes({row}, true);
        }
    }
    if (_channels) _channels->setNeedsDisplay();
}

// ---- Target and action -----------------------------------------------------------------------

namespace {
using Action = void (TQCurveEditorCtrl::*)(RWActionSender*);
struct NamedAction {
    const char* name;
    Action action;
};
constexpr NamedAction kActions[] = {
    {"verticalZoomScroll:", &TQCurveEditorCtrl::verticalZoomScroll},
    {"setCurrentTool:", static_cast<Action>(&TQCurveEditorCtrl::setCurrentTool)},
    {"setAutoZoom:", &TQCurveEditorCtrl::setAutoZoom},
    {"showAll:", &TQCurveEditorCtrl::showAll},
    {"showAnimated:", &TQCurveEditorCtrl::showAnimated},
    {"showModified:", &TQCurveEditorCtrl::showModified},
    {"showActive:", &TQCurveEditorCtrl::showActive},
    {"showPosition:", &TQCurveEditorCtrl::showPosition},
    {"showRotation:", &TQCurveEditorCtrl::showRotation},
    {"showScale:", &TQCurveEditorCtrl::showScale},
    {"showShear:", &TQCurveEditorCtrl::showShear},
    {"showPivot:", &TQCurveEditorCtrl::showPivot},
    {"showOpacity:", &TQCurveEditorCtrl::showOpacity},
    {"showRetiming:", &TQCurveEditorCtrl::showRetiming},
    {"showCustom:", &TQCurveEditorCtrl::showCustom},
    {"showCurveSet:", &TQCurveEditorCtrl::showCurveSet},
    {"curveSetManagerApply:", &TQCurveEditorCtrl::curveSetManagerApply},
    {"curveSetManagerDone:", &TQCurveEditorCtrl::curveSetManagerDone},
    {"curveSetManagerCancel:", &TQCurveEditorCtrl::curveSetManagerCancel},
    {"plusMinusPressed:", &TQCurveEditorCtrl::plusMinusPressed},
    {"curveSetManagerNew:", &TQCurveEditorCtrl::curveSetManagerNew},
    {"curveSetManagerDelete:", &TQCurveEditorCtrl::curveSetManagerDelete},
    {"curveSetManagerDuplicate:", &TQCurveEditorCtrl::curveSetManagerDuplicate},
    {"showNewCurveSet:", &TQCurveEditorCtrl::showNewCurveSet},
    {"newCurveSetOk:", &TQCurveEditorCtrl::newCurveSetOk},
    {"newCurveSetCancel:", &TQCurveEditorCtrl::newCurveSetCancel},
    {"animMenuSetCurveInterpolation:", &TQCurveEditorCtrl::animMenuSetCurveInterpolation},
    {"animMenuSetCurvePreExtrapolation:", &TQCurveEditorCtrl::animMenuSetCurvePreExtrapolation},
    {"animMenuSetCurvePostExtrapolation:", &TQCurveEditorCtrl::animMenuSetCurvePostExtrapolation},
    {"animMenuLockChannel:", &TQCurveEditorCtrl::animMenuLockChannel},
    {"animMenuUnlockChannel:", &TQCurveEditorCtrl::animMenuUnlockChannel},
    {"animMenuEnableAnimation:", &TQCurveEditorCtrl::animMenuEnableAnimation},
    {"animMenuDisableAnimation:", &TQCurveEditorCtrl::animMenuDisableAnimation},
    {"animMenuAddKeyframe:", &TQCurveEditorCtrl::animMenuAddKeyframe},
    {"animMenuDeleteKeyframe:", &TQCurveEditorCtrl::animMenuDeleteKeyframe},
    {"animMenuResetChannel:", &TQCurveEditorCtrl::animMenuResetChannel},
    {"animMenuSetChannelToGhost:", &TQCurveEditorCtrl::animMenuSetChannelToGhost},
    {"animMenuNextKeyframe:", &TQCurveEditorCtrl::animMenuNextKeyframe},
    {"animMenuPreviousKeyframe:", &TQCurveEditorCtrl::animMenuPreviousKeyframe},
    {"nextKeyframe:", &TQCurveEditorCtrl::nextKeyframe},
    {"previousKeyframe:", &TQCurveEditorCtrl::previousKeyframe},
    {"animMenuSimplifyCurve:", &TQCurveEditorCtrl::animMenuSimplifyCurve},
    {"reduceOk:", &TQCurveEditorCtrl::reduceOk},
    {"reduceCancel:", &TQCurveEditorCtrl::reduceCancel},
    {"setSmoothnessWithSlider:", &TQCurveEditorCtrl::setSmoothnessWithSlider},
    {"setSmoothnessWithScrubber:", &TQCurveEditorCtrl::setSmoothnessWithScrubber},
    {"setToleranceWithSlider:", &TQCurveEditorCtrl::setToleranceWithSlider},
    {"setToleranceWithScrubber:", &TQCurveEditorCtrl::setToleranceWithScrubber},
    {"animMenuGeneratePreKeypoints:", &TQCurveEditorCtrl::animMenuGeneratePreKeypoints},
    {"animMenuGeneratePostKeypoints:", &TQCurveEditorCtrl::animMenuGeneratePostKeypoints},
    {"generateOk:", &TQCurveEditorCtrl::generateOk},
    {"generateCancel:", &TQCurveEditorCtrl::generateCancel},
    {"setNumberOfCylesWithSlider:", &TQCurveEditorCtrl::setNumberOfCylesWithSlider},
    {"setNumberOfCylesWithScrubber:", &TQCurveEditorCtrl::setNumberOfCylesWithScrubber},
    {"copy:", &TQCurveEditorCtrl::copy},
    {"cut:", &TQCurveEditorCtrl::cut},
    {"paste:", &TQCurveEditorCtrl::paste},
    {"menuCopy:", &TQCurveEditorCtrl::menuCopy},
    {"menuCut:", &TQCurveEditorCtrl::menuCut},
    {"menuPaste:", &TQCurveEditorCtrl::menuPaste},
};
}  // namespace

bool TQCurveEditorCtrl::performAction(const std::string& action, RWActionSender& sender) {
    for (const NamedAction& a : kActions)
        if (action == a.name) {
            (this->*a.action)(&sender);
            return true;
        }
    return TQCurveEditorCtrlBase::performAction(action, sender);
}

bool TQCurveEditorCtrl::validateMenuItem(RWMenuItem& item) {
    // The panels' entries work once their panels are connected.
    if (item.action() == "showNewCurveSet:") return _curveSetNewPanel != nullptr;
    if (item.action() == "showCurveSet:") return _curveSetManagerPanel != nullptr;
    // The pop-up's sets can always be chosen; the context menus are the base's to judge.
    if (_curveSetsPopUp && item.menu() && item.menu() == _curveSetsPopUp->menu().get()) return true;
    const std::string& action = item.action();
    if ((action == "cut:" || action == "delete:" || action == "copy:") &&
        !selectedChannels().empty())
        return true;
    // Beyond the channels' selection, a paste needs something to paste.
    if (action == "paste:") return canPaste();
    if (action == "nextKeyframe:" || action == "previousKeyframe:") return true;
    return TQCurveEditorCtrlBase::validateMenuItem(item);
}
