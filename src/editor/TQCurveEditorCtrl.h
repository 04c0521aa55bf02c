#pragma once
// The controller of the full curve editor: the window-sized editor with a channel list, a tool
// switch, a vertical zoom scroller and a curve set pop-up. It keeps the view, the list and the
// scrollers in step with the host through notify(), and owns the editor's curve sets: the
// eleven automatic ones and the ordered list of custom ones, one of which is selected.
//
// Start, in this order:
//   construct; init(); setAppDelegate(host); setView(view); connectOutlets(controls);
//   setupController()   the automatic sets, the controls, the Animated set selected;
//   viewDidLoad()       the saved custom sets built (constructCurveSets), the pop-up filled.
// The host delivers its notification words, and those the framework posts, to notify().
// Before the window closes it asks windowShouldClose (the controller is the window's
// delegate); the destructor undoes the set-up: it detaches the view, stops observing the
// pop-up, clears itself from the panels.
//
// Outlets. The controls come from the host (what an interface file would connect) before
// setupController. The controller replaces the vertical scroller by one of its own class in
// the scroller's superview; the host reads it back with verticalScroller(). Outlets of views
// that are built with other modules (the channel list and its controller, the manager's
// table, the simplify, generate and curve set panels) may be null: every use tests them.
//
// Ownership. The controller owns its curve sets. It shares the controls with the host (which
// shows them); the channel list, its controller and the manager's table are not owned. The
// delegate and the view are not owned (TQCurveEditorCtrlBase).

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/ui/RWPopUpButton.h"
#include "platform/ui/RWSegmentedControl.h"
#include "platform/ui/RWTableView.h"
#include "platform/ui/RWTextField.h"
#include "platform/ui/RWValueControls.h"
#include "platform/ui/RWWindow.h"
#include "platform/ui/RWZoomScroller.h"
#include "src/contract/TQNotificationWords.h"
#include "src/curvesets/TQAutomaticCurveSets.h"
#include "src/editor/TQCurveEditorListOutlets.h"
#include "src/editor/TQKeypointClipboard.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

class TQCurveEditorView;
class TQCurveSetListSerializer;
class TQCurveSetManagerList;

// The controls of the editor, as a host connects them.
struct TQCurveEditorOutlets {
    std::shared_ptr<RWZoomScroller> verticalScroller;
    // Connected for the host's own use: the framework reads none of these five.
    std::shared_ptr<RWZoomScroller> horizontalZoomScroller;
    RWControlPtr bottomRight;
    std::shared_ptr<RWSegmentedControl> autozoom;
    std::shared_ptr<RWSegmentedControl> curveControls;
    std::shared_ptr<RWPopUpButton> waveformListButton;

    std::shared_ptr<RWPopUpButton> curveSetsPopUp;
    std::shared_ptr<RWPanel> curveSetManagerPanel;
    TQCurveSetManagerList* curveSetManagerList = nullptr;
    RWControlPtr curveSetManagerApply;
    std::shared_ptr<RWSegmentedControl> plusMinusSegmentedControl;
    RWControlPtr curveSetManagerDuplicate;
    std::shared_ptr<RWPanel> curveSetNewPanel;
    RWControlPtr curveSetNewOk;
    RWControlPtr curveSetNewCancel;
    std::shared_ptr<RWTextField> curveSetNewName;

    TQEditorChannelListView* channels = nullptr;
    TQEditorChannelListController* channelsList = nullptr;

    std::shared_ptr<RWPanel> generatePanel;
    std::shared_ptr<RWSlider> numberOfCyclesSlider;
    std::shared_ptr<RWScrubber> numberOfCycles;
    std::shared_ptr<RWPanel> reducePanel;
    std::shared_ptr<RWScrubber> tolerance;
    std::shared_ptr<RWScrubber> smoothness;
    std::shared_ptr<RWSlider> toleranceSlider;
    std::shared_ptr<RWSlider> smoothnessSlider;

    std::shared_ptr<RWSegmentedControl> tools;
};

class TQCurveEditorCtrl : public TQCurveEditorCtrlBase,
                          public TQNotificationReceiver,
                          public RWWindowDelegate,
                          public RWTableViewDataSource,
                          public RWTableViewDelegate {
public:
    // The private drag type of the manager's rows.
    static constexpr const char* kPrivateDragType = "TQCurveEditorPrivateDrag";
    // The columns of the manager's table.
    static constexpr const char* kNameColumn = "Name";
    static constexpr const char* kRelativeColumn = "Relative";
    static constexpr const char* kShortcutColumn = "Shortcut";
    // The tool switch's images, by tool id.
    static constexpr const char* kToolImageNames[] = {"K_KeyframeEditor_EditKeyframes",
                                                      "K_KeyframeEditor_SketchKeyframes",
                                                      "K_KeyframeEditor_TransformKeyframes"};
    // Degenerate extents of the scroller arithmetic, and the knob's smallest size.
    static constexpr double kExtentTolerance = 0.0000001;
    static constexpr double kProportionTolerance = 0.00001;
    static constexpr double kMinimumKnobProportion = 0.01;
    // Steps of the vertical scroller: a page, and a line as a fraction of the pan range.
    static constexpr double kPageStep = 1.0;
    static constexpr double kLineStep = 0.2;

    TQCurveEditorCtrl();
    // Undoes the set-up (see above).
    ~TQCurveEditorCtrl() override;

    // ---- Lifecycle ----

    // The base's, then the custom list empty, hidden channels ignored, the sets by property
    // offered.
    void init() override;
    void connectOutlets(const TQCurveEditorOutlets& outlets);
    // The twelve steps: the view's range, the automatic sets, the panels' delegate, the panels'
    // ranges, the list's selection, the tool switch, the vertical scroller, the scroller's
    // last values, the manager's table, the Animated set selected, the add and remove
    // control, the pop-up.
    virtual void setupController();
    // Builds the custom sets the host read from its document, then fills the pop-up.
    virtual void viewDidLoad();

    // ---- Controls ----

    const std::shared_ptr<RWZoomScroller>& verticalScroller() const { return _verticalScroller; }
    const std::shared_ptr<RWPopUpButton>& curveSetsPopUp() const { return _curveSetsPopUp; }
    void setCurveSetsPopUp(const std::shared_ptr<RWPopUpButton>& popUp) { _curveSetsPopUp = popUp; }
    TQEditorChannelListController* channelsList() const { return _channelsList; }
    const std::shared_ptr<RWSegmentedControl>& tools() const { return _tools; }
    TQCurveEditorView* curveEditorView() const;
    float oldKnobValue() const { return _oldKnobValue; }
    float oldKnobProportion() const { return _oldKnobProportion; }

    // ---- Notifications ----

    // Tests the flags of the word in a fixed order; several may act in one call. Always ends
    // with resetModifiedChannels on the delegate.
    void notify(TQNotificationWord word) override;
    // Forgets the view's selection, rescales every curve, updates the controls, and
    // notifies itself of finished changes (kTQNotifyChannelsChanged).
    void update() override;
    // Called where channels changed outside the selected set's rule; empty, for subclasses.
    virtual void updateIfModifiedByBehaviors() {}
    // Passes the range on to the view.
    void displayRangeModified(CMTimeRange range);

    // ---- Refresh ----

    // updateUI, then a redraw of the view.
    void _refreshViewAndBrowser();
    // Redraws the item's row in the list (when it shows one), then the view.
    void _refreshViewAndBrowserForItem(const TQCurveEditorItem* item);
    void _refreshViewAndBrowserForItem(const TQCurveEditorItem* item, uint32_t atCol);
    // Redraws the item's row without its title, then the view.
    void refreshViewAndBrowserWithoutTitleForItem(const TQCurveEditorItem* item);
    // The scroller enabled unless the view zooms by itself, its knob from the view volume; the
    // list reloaded; the pop-up's title from its selected item; then the base's.
    void updateUI() override;
    // Value and knob of the vertical scroller from the view volume, within the maximum volume.
    void updateVerticalZoomScroller();

    // ---- Window and view callbacks ----

    // Forgets the items of the selected set and of Animated, Modified and All; answers true.
    // The simplify and generate panels close without that.
    bool windowShouldClose(RWWindow& window) override;
    // The generate and simplify panels end their modal run; the new-set panel cancels.
    void windowWillClose(RWWindow& window) override;
    // The reference width from the display range, and the custom sets sampled at the view's
    // width.
    void viewDidResize() override;
    // Both update the scroller (the argument is not read).
    void windowWasPanned(double delta) override;
    void windowWasZoomed() override;

    // ---- Tools and zoom ----

    // The tool switch's selected segment (the edit tool without a switch).
    TQTool getCurrentTool() const override;
    // Selects the tool's segment and tells the view.
    void setCurrentTool(TQTool tool) override;
    // The tool switch's action: the segment already holds the tool; the view is told.
    void setCurrentTool(RWActionSender* sender);
    // Toggles the view's auto-zoom: on frames everything and disables the scroller, off
    // enables the scroller and updates it.
    void setAutoZoom(RWActionSender* sender);
    // The scroller's action, by its hit part: pages and lines pan, the knob zooms.
    void verticalZoomScroll(RWActionSender* sender);
    // Whether the knob no longer matches the view (or the view zooms by itself), when the
    // curves reach beyond the view.
    bool shouldAutoZoom() const;

    // ---- Time ----

    // The nearest frame of the host, a time halfway between two going to the later one.
    CMTime convertToCurveEditorAxis(CMTime time) const override;
    // The channel's time offset (zero without a channel).
    CMTime getTimeOffsetForChannel(const TQChannelBase* channel) const;

    // ---- Selection ----

    // Mirrors a keypoint selection into the channel list: the rows of the selected curves.
    void selectionChangedTo(TQCurveSelectionList* list) override;

    // ---- Commands on whole channels (TQCurveEditorCtrlChannelCommands.cpp) ----
    //
    // The animation menu's commands. Each works on the selected channels, in one undo step
    // under its key even when no channel is selected, announcing each channel around its
    // change and marking its curve dirty; the step is followed by kTQNotifyChannelsChanged.
    // Items whose channel has gone are skipped.

    // The sender's tag as the interpolation of every keyframe, through the linked compound
    // too; curve and blind-data channels are skipped, and a channel that refuses
    // interpolation changes keeps its own. The sender's menu ticks the item of that tag. Tag
    // 100 (the mixed entry) opens the step and returns, leaving it open: hosts close it.
    void animMenuSetCurveInterpolation(RWActionSender* sender);
    // The sender's tag as the extrapolation before the first (after the last) keyframe; the
    // sender's menu ticks the item whose index is the tag.
    void animMenuSetCurvePreExtrapolation(RWActionSender* sender);
    void animMenuSetCurvePostExtrapolation(RWActionSender* sender);
    void animMenuLockChannel(RWActionSender* sender = nullptr);
    void animMenuUnlockChannel(RWActionSender* sender = nullptr);
    void animMenuEnableAnimation(RWActionSender* sender = nullptr);
    void animMenuDisableAnimation(RWActionSender* sender = nullptr);
    // A keyframe at (the keyframe at) the delegate's current time.
    void animMenuAddKeyframe(RWActionSender* sender = nullptr);
    void animMenuDeleteKeyframe(RWActionSender* sender = nullptr);
    void animMenuResetChannel(RWActionSender* sender = nullptr);
    // Each channel takes the state of its ghost; a channel without a ghost is left alone.
    void animMenuSetChannelToGhost(RWActionSender* sender = nullptr);
    // The playhead to the nearest keyframe after (before) it on any selected channel, posting
    // kTQNotifyTimeChanged; nothing when there is none. A keyframe before time 0 is never
    // the previous one.
    void animMenuNextKeyframe(RWActionSender* sender = nullptr);
    void animMenuPreviousKeyframe(RWActionSender* sender = nullptr);
    void nextKeyframe(RWActionSender* sender = nullptr) { animMenuNextKeyframe(sender); }
    void previousKeyframe(RWActionSender* sender = nullptr) { animMenuPreviousKeyframe(sender); }

    // ---- Clipboard (TQCurveEditorCtrlClipboard.cpp) ----
    //
    // Keypoints through the application's pasteboard (TQKeypointClipboard.h). Each action
    // reads the view's selection when it runs, validated first, so an item chosen after its
    // channel went away copies or cuts nothing of it.

    // The selected keypoints onto the pasteboard; with none, the pasteboard keeps what it held.
    virtual void copy(RWActionSender* sender = nullptr);
    // Copies, then deletes the unlocked keypoints of the selection in one undo step.
    virtual void cut(RWActionSender* sender = nullptr);
    // pasteKeypoints; its answer is kept for the host (lastPasteResult).
    virtual void paste(RWActionSender* sender = nullptr);
    void menuCopy(RWActionSender* sender = nullptr) { copy(sender); }
    void menuCut(RWActionSender* sender = nullptr) { cut(sender); }
    void menuPaste(RWActionSender* sender = nullptr) { paste(sender); }
    // The pasteboard's keypoints at the playhead, their spacing kept, each group into the
    // shown channel it was copied from (by reference; a selected one first when several
    // objects show it) or else into the next selected channel of its kind. One undo step;
    // the pasted keypoints become the selection. Anything refused changes nothing.
    TQPasteResult pasteKeypoints();
    TQPasteResult lastPasteResult() const { return _lastPasteResult; }
    // Whether the pasteboard holds keypoints (not whether they would paste).
    bool canPaste() const;

    // ---- Simplify and generate (TQCurveEditorCtrlSimplify.cpp) ----
    //
    // Simplify: a modal panel with tolerance and smoothness (each a slider and a scrubber
    // bound both ways, whole numbers 0 to 10), previewed on the real channel. Every change of
    // a control starts again from a clone of the channel taken when the panel opened; Cancel
    // puts that clone back, keypoints and tangents as they were. The panel's previews and its
    // OK make one undo step, which the run holds open until the panel goes: undoing it brings
    // back the curve of the moment the panel opened.
    //
    // Generate: a panel beside the editor (not modal) with a number of cycles, baked into
    // keypoints before or after the existing ones by OK, in one undo step.

    // The selected channel's panel opens, tolerance 1 and smoothness 0, and runs until OK,
    // Cancel or a close; nothing happens without a selected channel or a panel.
    void animMenuSimplifyCurve(RWActionSender* sender = nullptr);
    // The update once more with the present values, then the panel closes.
    void reduceOk(RWActionSender* sender = nullptr);
    // The curve of the moment the panel opened, then the panel closes.
    void reduceCancel(RWActionSender* sender = nullptr);
    // Each copies its control's whole value to its twin, then updates the preview.
    void setSmoothnessWithSlider(RWActionSender* sender = nullptr);
    void setSmoothnessWithScrubber(RWActionSender* sender = nullptr);
    void setToleranceWithSlider(RWActionSender* sender = nullptr);
    void setToleranceWithScrubber(RWActionSender* sender = nullptr);
    // The channel back to the clone, then simplified over its keyframes' span with the
    // panel's values, in the step of the run. A channel that has left the selected set is
    // only restored. Nothing while no panel is open.
    void _updateSimplifyResult();
    // The generate panel for the selected channel, before (pre) or after (post) its
    // keyframes, with one cycle.
    void animMenuGeneratePreKeypoints(RWActionSender* sender = nullptr);
    void animMenuGeneratePostKeypoints(RWActionSender* sender = nullptr);
    // Bakes the cycles when the channel is still in the selected set; the panel goes either
    // way, its count back to 1.
    void generateOk(RWActionSender* sender = nullptr);
    void generateCancel(RWActionSender* sender = nullptr);
    // Copy the whole number of cycles across; nothing is previewed.
    void setNumberOfCylesWithSlider(RWActionSender* sender = nullptr);
    void setNumberOfCylesWithScrubber(RWActionSender* sender = nullptr);
    // The simplify panel's clone, while the panel is open (null otherwise).
    const TQChannel* initialCurve() const { return _initialCurve.get(); }

    // ---- Time moves of selected keypoints (TQCurveEditorCtrlTimeMoves.cpp) ----
    //
    // The caller holds the edit bracket. Both are plainer than a drag: keypoints move by
    // handle in list order, each put on the frame grid by itself (so spacing may change), with
    // no clamp at time 0 and no linked edit.

    // Each keypoint entry's channel time plus the delta, on the frame grid.
    void moveSelectedInTime(TQCurveSelectionList* list, CMTime by);
    // The same by the delta that takes the earliest keypoint (axis time) to the target;
    // nothing when no entry is a keypoint or the delta is zero.
    void moveSelectedInTimeTo(TQCurveSelectionList* list, CMTime to);

    // ---- Curve sets: the automatic sets ----

    // Animated, Modified, All and Active, each with its localised name and the delegate.
    void createAutomaticCurveSets();
    const std::shared_ptr<TQCurveSetAnimated>& curveSetAnimated() const {
        return _curveSetAnimated;
    }
    const std::shared_ptr<TQCurveSetAll>& curveSetAll() const { return _curveSetAll; }
    const std::shared_ptr<TQCurveSetCurrent>& curveSetCurrent() const { return _curveSetCurrent; }
    const TQCurveSetPtr& curveSetModified() const { return _curveSetModified; }
    const std::shared_ptr<TQCurveSetPosition>& curveSetPosition() const {
        return _curveSetPosition;
    }
    const std::shared_ptr<TQCurveSetScale>& curveSetScale() const { return _curveSetScale; }
    const std::shared_ptr<TQCurveSetRotation>& curveSetRotation() const {
        return _curveSetRotation;
    }
    const std::shared_ptr<TQCurveSetShear>& curveSetShear() const { return _curveSetShear; }
    const std::shared_ptr<TQCurveSetPivot>& curveSetPivot() const { return _curveSetPivot; }
    const std::shared_ptr<TQCurveSetOpacity>& curveSetOpacity() const { return _curveSetOpacity; }
    const std::shared_ptr<TQCurveSetRetiming>& curveSetRetiming() const {
        return _curveSetRetiming;
    }
    // Whether the set is one of the eleven.
    bool isAutomaticCurveSet(const TQCurveSet* set) const;
    // The eleven, in the order they are made (null before setupController).
    std::array<const TQCurveSet*, 11> automaticCurveSets() const;

    // ---- Curve sets: selecting ----

    BNString curveSetName(const TQCurveSet* set) const { return set ? set->curveSetName() : ""; }
    // Rebuilds the set at the view's width, forgets the view's selection, updates the controls.
    void refreshCurveSet(const TQCurveSetPtr& set);
    // The pop-up's actions: each selects its set (unless already selected), refreshes it and
    // updates the controls.
    void showAll(RWActionSender* sender = nullptr);
    void showAnimated(RWActionSender* sender = nullptr);
    void showModified(RWActionSender* sender = nullptr);
    void showActive(RWActionSender* sender = nullptr);
    void showPosition(RWActionSender* sender = nullptr);
    void showRotation(RWActionSender* sender = nullptr);
    void showScale(RWActionSender* sender = nullptr);
    void showShear(RWActionSender* sender = nullptr);
    void showPivot(RWActionSender* sender = nullptr);
    void showOpacity(RWActionSender* sender = nullptr);
    void showRetiming(RWActionSender* sender = nullptr);
    // The custom set at the index of the sender's tag; nothing for a tag out of range.
    void showCustom(RWActionSender* sender);

    // ---- Curve sets: the custom list ----

    const std::vector<TQCurveSetPtr>& curveSets() const { return _curveSets; }
    std::vector<TQCurveSetPtr>& _mutableCurveSets() { return _curveSets; }
    uint32_t numberOfCustomCurveSets() const { return static_cast<uint32_t>(_curveSets.size()); }
    // Appends; nothing else.
    void addCurveSet(const TQCurveSetPtr& set);
    void removeAllCurveSets() { _curveSets.clear(); }
    // The first custom set of that name; made (createCurveSetWithName) when asked to, else
    // null. The automatic sets are not searched.
    TQCurveSetPtr curveSetWithName(const BNString& name, bool createIfNeeded);
    // A new empty custom set under the unique form of the name, appended, not selected.
    TQCurveSetPtr createCurveSetWithName(const BNString& name);
    TQCurveSetPtr getCurveSetById(uint32_t identifier) const;
    // Removes that very set, if it is in the list; nothing is posted.
    void removeCurveSet(const TQCurveSet* set);
    // A copy of the selected set, absolute, appended and selected, under the unique form of
    // the name.
    TQCurveSetPtr cloneCurveSetWithName(const BNString& name);
    // A copy of the set (relative if the set is), its name with the localised copy suffix,
    // made unique; appended, not selected.
    TQCurveSetPtr cloneCurveSet(const TQCurveSet& set);
    // A new custom set holding the selected set's roots and then the other set's, appended and
    // selected.
    TQCurveSetPtr addCurveSetToCurrent(const TQCurveSetPtr& set);
    // The name, or the first free "base n" among the custom sets; the automatic sets' names
    // are reserved. A trailing blank and single digit counts as a number to continue from.
    BNString findUniqueCurveSetNameForName(const BNString& name) const;
    void setUsesRelativeCurveSets(bool uses) { _useRelativeCurveSets = uses; }
    bool usesRelativeCurveSets() const { return _useRelativeCurveSets; }
    // Whether the selected set takes channels by hand.
    bool canModifySelectedCurveSet() const;

    // ---- Curve sets: filling the selected set ----

    // The channel into the selected set; on an automatic set a new custom set is started first.
    TQCurveEditorItemPtr appendChannelToCurveSet(TQChannel* channel) override;
    // The folder's keyframable channels, sub-folders by recursion, the same way.
    TQCurveEditorItemPtr appendFolderToCurveSet(TQChannelFolder* folder) override;
    // The channel alone in the selected set, when the set takes one (TQCurveSetMutable).
    TQCurveEditorItemPtr setChannelInList(TQChannel* channel);
    void clearSelectedCurveSet();
    // Empties the set; null selects the first custom set (nothing when there is none).
    void clearCurveSet(const TQCurveSetPtr& set);
    void selectChannel(const TQChannelBase* channel, bool enable);
    void enableChannel(const TQChannelBase* channel, bool enable);
    // Shows the selected channels' curves.
    uint32_t numberOfDisplayedChannels() const override { return numberOfSelectedChannels(); }
    // Shows the item alone, or, when it already is, everything again.
    void soloItem(TQCurveEditorItem* item);

    // ---- Curve sets: the saved form (TQCurveEditorCtrlSavedSets.cpp) ----

    // Fills the list from the custom sets, in order: each set's name, kind and the channels
    // of its present items that still resolve in the scene, with their colours; and the
    // number of the selected set. The shortcut is not passed on: every saved set has none.
    // A selected set without a number (Pivot) leaves the list's number as it was.
    void saveCurveSets(TQCurveSetListSerializer* list);
    // Builds custom sets from the list the delegate hands over (getCurveSetListSerializer):
    // each set by name (an existing one of that name takes the channels), its shortcut, the
    // channels that resolve in the scene with their colours, then its kind. Then selects the
    // set the list's number names under the delegate's document version, and refreshes it.
    // Nothing happens without a list.
    void constructCurveSets();
    // The set a saved number names in a document of that version: the automatic sets first
    // (fewer of them in older versions), then the custom sets in order. A number past the
    // custom sets answers the Animated set.
    TQCurveSetPtr curveSetForSavedNumber(uint32_t number, double version) const;

    // ---- The curve set pop-up ----

    // Rebuilds the pop-up's menu: the automatic sets, the sets by property when offered, the
    // custom sets, New and Manage; the selected set's item selected and its title shown. Each
    // set's shortcut stands beside it, as a plain key.
    virtual void refreshPopUp();

    // ---- The curve set panels (TQCurveEditorCtrlSetPanels.cpp) ----
    //
    // The manager runs modally on working copies of the custom sets; the sets as they were
    // wait in _curveSetsTemp until Done keeps the copies or Cancel puts the originals back.

    // Opens the manager and returns when it has stopped.
    void showCurveSet(RWActionSender* sender = nullptr);
    // The set of the table's selected row becomes the shown one; the panel stays open.
    void curveSetManagerApply(RWActionSender* sender = nullptr);
    // Keeps the edits and closes, unless a rename was just refused.
    void curveSetManagerDone(RWActionSender* sender = nullptr);
    // Puts every set back as it was when the manager opened, and closes.
    void curveSetManagerCancel(RWActionSender* sender = nullptr);
    // The add and remove pair: segment 0 adds, any other removes.
    void plusMinusPressed(RWActionSender* sender);
    void curveSetManagerNew(RWActionSender* sender = nullptr);
    // Removing the last set shows All.
    void curveSetManagerDelete(RWActionSender* sender = nullptr);
    void curveSetManagerDuplicate(RWActionSender* sender = nullptr);
    bool isManagingCurveSets() const { return _curveSetsTemp.has_value(); }
    // Opens the new-set panel, its name field holding the untitled name.
    void showNewCurveSet(RWActionSender* sender = nullptr);
    // A copy of the shown set under the field's name (the untitled one for a blank name),
    // shown, as one undo step.
    virtual void newCurveSetOk(RWActionSender* sender = nullptr);
    // The new-set panel's Cancel: ends its modal run, hides it, updates the controls and the
    // pop-up.
    void newCurveSetCancel(RWActionSender* sender = nullptr);

    // The manager's table: one row per custom set.
    int64_t numberOfRowsInTableView(RWTableView& table) override;
    RWObjectValue objectValueForTableColumn(RWTableView& table, const RWTableColumn& column,
                                            int64_t row) override;
    // A name taken by another row raises the one alert and is refused; a blank name or a
    // shortcut another set has is refused without one.
    void setObjectValue(RWTableView& table, const RWObjectValue& value, const RWTableColumn& column,
                        int64_t row) override;
    void willDisplayCell(RWTableView& table, RWCell& cell, const RWTableColumn& column,
                         int64_t row) override;
    // The rows travel in _draggedRows; the pasteboard only names the private type.
    bool writeRows(RWTableView& table, const std::vector<int64_t>& rows,
                   RWPasteboard& pasteboard) override;
    // Every drop lands between rows.
    uint64_t validateDrop(RWTableView& table, RWDraggingInfo& info, int64_t row,
                          RWTableViewDropOperation operation) override;
    bool acceptDrop(RWTableView& table, RWDraggingInfo& info, int64_t row,
                    RWTableViewDropOperation operation) override;

    // ---- Target and action ----

    // The actions above by name (the pop-up's items, the tool switch, the scroller, the
    // auto-zoom switch), then the base's.
    bool performAction(const std::string& action, RWActionSender& sender) override;
    // New and Manage are enabled while their panels are connected. Cut, Delete and Copy want a
    // selected channel, Paste keypoints on the pasteboard; the keyframe jumps are always
    // offered.
    bool validateMenuItem(RWMenuItem& item) override;
    // Copy, Cut and Paste before Delete in the keypoint menu, and as the background menu.
    void buildKeyframeMenu() override;
    void buildDefaultMenu() override;
    // Cut, Delete and Paste want an unlocked keypoint selected; Copy a modifiable channel.
    bool validateKeyframeMenuItem(RWMenuItem& item) override;
    bool validateDefaultMenuItem(RWMenuItem& item) override;

protected:
    // Sample count of a refresh: the view's width, truncated.
    uint32_t refreshSampleCount() const;
    // The show... actions' common shape.
    void showSelectedCurveSet(const TQCurveSetPtr& set);
    // Whether another set than `except` (automatic or custom) has the shortcut.
    bool isShortcutTaken(const BNString& shortcut, const TQCurveSet* except) const;
    // Selects a row of the manager's table and scrolls to it.
    void selectManagerRow(int64_t row);
    // The custom set at a row of the manager's table, or null.
    TQCurveSetPtr curveSetAtRow(int64_t row) const;
    // On an automatic set: a new custom set named with the untitled text and the next number,
    // selected. Answers the selected set.
    TQCurveSetPtr customSetForAdding();
    // Step 7 of notify: the changed channels against the selected set.
    void notifyChannelsChanged(bool stale);
    // The automatic sets in the order a document of that version numbers them.
    std::vector<TQCurveSetPtr> numberedAutomaticCurveSets(double version) const;
    // Step 9 of notify: the playhead moved.
    void notifyTimeChanged();
    // The shape of the per-channel commands: one step under the key around `change` (item,
    // channel) for each selected channel item with a channel, each announced and marked
    // dirty, then `after` (item); kTQNotifyChannelsChanged when the step has closed.
    template <class Change, class After>
    void changeSelectedChannels(const char* undoKey, Change&& change, After&& after);
    // One channel's announced change inside the open step, its curve marked dirty after.
    template <class Change>
    void changeChannel(TQCurveEditorChannelItem& item, TQChannel& channel, Change&& change);
    // The generate panel's shape: the direction, the selected channel, one cycle, shown.
    void openGeneratePanel(uint32_t direction);
    // Both panels' common ending: the controls back to their defaults, the panel hidden.
    void closeSimplifyPanel();
    void closeGeneratePanel();
    // A scroller pan of the view by a fraction of its range.
    void panVertically(double fraction);
    // The keypoints of the list's live entries, grouped by channel; empty without any.
    TQKeypointClip clipOfSelection(const TQCurveSelectionList& list) const;
    // The view's selection validated and copied; answers it, or null when nothing was copied.
    TQCurveSelectionList* copySelectedKeypoints();
    // The channel item each group of the clip pastes into, in the clip's order; null where
    // there is none.
    std::vector<TQCurveEditorChannelItem*> pasteTargets(const TQKeypointClip& clip) const;

    // ---- Fields, in declaration order ----
    std::shared_ptr<RWZoomScroller> _verticalScroller;
    std::shared_ptr<RWZoomScroller> _horizontalZoomScroller;  // not read
    RWControlPtr _bottomRight;                                // not read
    std::shared_ptr<RWSegmentedControl> _autozoom;            // not read
    std::shared_ptr<RWSegmentedControl> _curveControls;       // not read
    std::shared_ptr<RWPopUpButton> _waveformListButton;       // not read
    float _oldKnobProportion = 0.0f;
    float _oldKnobValue = 0.0f;
    std::shared_ptr<RWPopUpButton> _curveSetsPopUp;
    std::shared_ptr<RWPanel> _curveSetManagerPanel;
    TQCurveSetManagerList* _curveSetManagerList = nullptr;  // not owned
    RWControlPtr _curveSetManagerApply;
    std::shared_ptr<RWSegmentedControl> _plusMinusSegmentedControl;
    RWControlPtr _curveSetManagerDuplicate;
    std::vector<int64_t> _draggedRows;
    std::shared_ptr<RWPanel> _curveSetNewPanel;
    RWControlPtr _curveSetNewOk;
    RWControlPtr _curveSetNewCancel;
    std::shared_ptr<RWTextField> _curveSetNewName;
    TQEditorChannelListView* _channels = nullptr;            // not owned
    TQEditorChannelListController* _channelsList = nullptr;  // not owned
    std::shared_ptr<RWPanel> _generatePanel;
    std::shared_ptr<RWSlider> _numberOfCyclesSlider;
    std::shared_ptr<RWScrubber> _numberOfCycles;
    uint32_t _extrapolationType = 0;
    TQChannel* _currChan = nullptr;  // not owned
    std::unique_ptr<TQChannel> _initialCurve;
    std::shared_ptr<RWPanel> _reducePanel;
    std::shared_ptr<RWScrubber> _tolerance;
    std::shared_ptr<RWScrubber> _smoothness;
    std::shared_ptr<RWSlider> _toleranceSlider;
    std::shared_ptr<RWSlider> _smoothnessSlider;
    std::shared_ptr<RWSegmentedControl> _tools;
    std::vector<TQCurveSetPtr> _curveSets;
    std::shared_ptr<TQCurveSetAnimated> _curveSetAnimated;
    std::shared_ptr<TQCurveSetAll> _curveSetAll;
    std::shared_ptr<TQCurveSetCurrent> _curveSetCurrent;
    TQCurveSetPtr _curveSetModified;
    std::shared_ptr<TQCurveSetPosition> _curveSetPosition;
    std::shared_ptr<TQCurveSetScale> _curveSetScale;
    std::shared_ptr<TQCurveSetRotation> _curveSetRotation;
    std::shared_ptr<TQCurveSetShear> _curveSetShear;
    std::shared_ptr<TQCurveSetPivot> _curveSetPivot;
    std::shared_ptr<TQCurveSetOpacity> _curveSetOpacity;
    std::shared_ptr<TQCurveSetRetiming> _curveSetRetiming;
    // While the manager runs: the custom sets as they were before it opened.
    std::optional<std::vector<TQCurveSetPtr>> _curveSetsTemp;
    // While the manager runs: the set shown when it opened, for Cancel to show again.
    TQCurveSetPtr _shownBeforeManaging;
    bool _curveSetValid = true;
    bool _useRelativeCurveSets = true;
    TQPasteResult _lastPasteResult = TQPasteResult::kPasted;

private:
    // The observation of the pop-up's will-pop-up notification, while it lasts.
    std::optional<RWControl::NotificationToken> _popUpObservation;
    std::weak_ptr<RWPopUpButton> _observedPopUp;
};
