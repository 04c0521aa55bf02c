#pragma once
// The editing engine: the object between a curve view and the channels. A view turns events
// into calls on it; it changes channels inside the host's edit brackets and marks items dirty.
// Everything a subclass (the full editor, the mini editor) must supply stands here as an empty
// virtual operation.
//
// Lookups. Every lookup goes from a curve identifier through `_selectedCurveSet` to a channel
// item, and from the item through its TQChannelRef to the channel, again at each use: nothing
// here holds a channel pointer across calls, since the host may destroy a channel between any
// two user actions.
//
// Brackets. Operations named ...Selected expect the caller to have opened the edit bracket of
// the host contract (see TQCurveEditorAppDelegate.h); delete() and the menu... actions open
// it themselves. validateSelection() runs first, so that no stale handle is announced.
//
// Linked edits. A channel is edited as linked when its parent is a compound and either
// `_linked` is true or the compound carries kTQFoldFlagLinked; the edit then goes through the
// compound, which applies it to every component, and every component's item is marked dirty.
//
// Lifetime. Two-phase: construct, then init() (which calls the overridable build...Menu
// family). The delegate is not owned and must outlive the controller; the view is not owned
// either and must be detached (setView(nullptr)) before it goes. The controller owns its four
// context menus and `_keys`; it shares its curve set with whoever else holds it.

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <type_traits>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQCompoundChannel.h"
#include "platform/geometry/CGGeometry.h"
#include "platform/media/CMTime.h"
#include "platform/support/BNString.h"
#include "platform/ui/RWEvent.h"
#include "platform/ui/RWMenu.h"
#include "platform/ui/RWServices.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/data/TQCurveSelection.h"
#include "src/engine/TQCurveEditorCodes.h"

class TQCurveEditorViewBase;
struct TQBilinearMap;

// A host's own wrapper around one of its channels or folders (what the appendCH... forms
// take): all the framework asks of it is the channel inside.
class CHChannelObject {
public:
    virtual ~CHChannelObject() = default;
    virtual TQChannelBase* tqChannel() const = 0;
};

// The window that showValueAtPoint runs modally: it carries the number in and out, and where
// it was asked for. The panel that shows it belongs to the toolkit adapter; a run that ends
// with a positive code (OK) hands back `value`.
class TQCurveEditorValueWindow : public RWWindow {
public:
    double value = 0.0;
    CGPoint location = CGPointZero;  // in the parent window's coordinates
    CGRect parentRect = CGRectZero;
    RWWindow* parentWindow = nullptr;  // not owned; may be null
};

using TQKeyframePtr = std::shared_ptr<TQKeyframe>;

class TQCurveEditorCtrlBase : public RWActionTarget {
public:
    TQCurveEditorCtrlBase();
    ~TQCurveEditorCtrlBase() override;
    TQCurveEditorCtrlBase(const TQCurveEditorCtrlBase&) = delete;
    TQCurveEditorCtrlBase& operator=(const TQCurveEditorCtrlBase&) = delete;

    // ---- Lifecycle and simple state ------------------------------------------------------

    // Zeroes the state, makes `_keys`, builds the four menus (keyframe, curve, tangent,
    // default, in this order).
    virtual void init();
    // Null here: a host's subclass overrides it to make the delegate.
    virtual TQCurveEditorAppDelegate* allocAppDelegate() { return nullptr; }
    TQCurveEditorAppDelegate* appDelegate() const { return _pAppDelegate; }
    // Not owned. An earlier delegate is simply forgotten.
    virtual void setAppDelegate(TQCurveEditorAppDelegate* delegate) { _pAppDelegate = delegate; }
    TQCurveEditorViewBase* getView() const { return _view; }
    // Not owned.
    // A view replaced (or set to null) that still names this controller forgets it, so that it
    // never calls a controller gone before it.
    virtual void setView(TQCurveEditorViewBase* view);
    bool snapshotChannels() const { return _snapshotChannels; }
    void setSnapshotChannels(bool snapshot) { _snapshotChannels = snapshot; }
    bool negativeRangeAllowed() const { return _negativeRangeAllowed; }
    void allowNegativeRange(bool allowed) { _negativeRangeAllowed = allowed; }
    bool ignoreHiddenChannels() const { return _ignoreHiddenChannels; }
    virtual TQTool getCurrentTool() const { return _currentTool; }
    // Stores the tool, then tells the view (currentToolChanged).
    virtual void setCurrentTool(TQTool tool);
    const RWMenuPtr& getKeyframeMenu() const { return _keyframeMenu; }
    const RWMenuPtr& getTangentMenu() const { return _tangentMenu; }
    const RWMenuPtr& getCurveMenu() const { return _curveMenu; }
    const RWMenuPtr& getDefaultMenu() const { return _defaultMenu; }
    // Asks the view for a redraw.
    virtual void redrawCurveEditor();
    // Every cached curve dirty, tick marks again, redraw.
    virtual void updateUI();
    // Prints `_keys` to standard output.
    void dumpKeypoints() const;

    // ---- Extension points: empty here --------------------------------------------------

    virtual void viewDidResize() {}
    virtual void windowWasPanned(double) {}
    virtual void windowWasZoomed() {}
    virtual void currentViewVolumeChangedTo(const CGRect*) {}
    virtual void displayRangeChangedTo(CMTimeRange) {}
    virtual void setDisplayRange(CMTimeRange) {}
    virtual void resetDisplayRangeToPlayRange(void* /*sender*/) {}
    virtual void resetDisplayRangeToProjectDuration(void* /*sender*/) {}
    virtual void didSetViewContentsHorizontalOrigin(double /*origin*/, double /*andDuration*/) {}
    virtual void didSetViewContentsHorizontalOffset(double) {}
    // Called by the view on each change of selection.
    virtual void selectionChangedTo(TQCurveSelectionList*) {}
    virtual void update() {}
    virtual void rotateWithEvent(const RWEvent&) {}

    // ---- Channels into sets ------------------------------------------------------------

    TQCurveEditorItemPtr appendCHChannelToSelectedCurveSet(const CHChannelObject* channel);
    TQCurveEditorItemPtr appendCHFolderToSelectedCurveSet(const CHChannelObject* folder);
    TQCurveEditorItemPtr appendCHChannel(const CHChannelObject* channel,
                                         const TQCurveSetPtr& toCurveSet);
    TQCurveEditorItemPtr appendCHFolder(const CHChannelObject* folder,
                                        const TQCurveSetPtr& toCurveSet);
    // The two-argument forms with `_selectedCurveSet`.
    virtual TQCurveEditorItemPtr appendChannelToCurveSet(TQChannel* channel);
    virtual TQCurveEditorItemPtr appendFolderToCurveSet(TQChannelFolder* folder);
    // A channel item sampled at the view's width + 1, appended (to a set that takes items by
    // hand, TQCurveSetMutable); posts kTQNotifyCurveSetContentChanged. Null channel or set, or
    // a set that does not take items: null, nothing posted.
    virtual TQCurveEditorItemPtr appendChannel(TQChannel* channel, const TQCurveSetPtr& toCurveSet);
    // Each child channel in order, sub-folders by recursion; posts and updates the UI once per
    // level. Answers the last item made.
    virtual TQCurveEditorItemPtr appendFolder(TQChannelFolder* folder,
                                              const TQCurveSetPtr& toCurveSet);
    virtual bool removeChannelWithIdentifier(uint32_t identifier,
                                             const TQCurveSetPtr& fromCurveSet);
    // Records the removal with the host's undo (type 2, action 0) first.
    virtual bool removeSelectedChannelFromSelectedCurveSet();
    // Rebuilds the set at the view's width, forgets the view's selection and box.
    virtual void refreshSelectedCurveSet();
    virtual void resetSelection();

    // ---- Queries, forwarded to `_selectedCurveSet` (0 or null without a set) -----------

    const TQCurveSetPtr& selectedCurveSet() const { return _selectedCurveSet; }
    // Stores the set and posts kTQNotifyCurveSetContentChanged.
    virtual void setSelectedCurveSet(const TQCurveSetPtr& set);
    TQCurveEditorItemPtr channelItemWithIdentifier(uint32_t identifier) const;
    uint32_t numberOfEnabledChannels() const;
    uint32_t numberOfSelectedChannels() const;
    uint32_t numberOfChannelItems() const;
    uint32_t numberOfRootItems() const;
    uint32_t numberOfSelectedRootItems() const;
    std::vector<TQCurveEditorItemPtr> selectedChannels() const;
    std::vector<TQCurveEditorFolderItemPtr> selectedRoots() const;
    TQCurveEditorItemPtr selectedChannel() const;
    void deselectAllChannels();
    virtual uint32_t numberOfDisplayedChannels() const { return numberOfChannelItems(); }
    virtual std::vector<TQCurveEditorItemPtr> sketchedChannels() const {
        return selectedChannels();
    }
    virtual uint32_t numberOfSketchedChannels() const { return numberOfSelectedChannels(); }
    // The first channel item that is selected and enabled, or null.
    TQCurveEditorItemPtr getFirstChannel() const;
    // At least one selected item has an unlocked channel.
    bool canModifySelectedAnyCurve() const;
    // The parent compound when it carries kTQFoldFlagLinked (`_linked` is not consulted).
    TQCompoundChannel* getChannelsLinkedParent(const TQChannel* channel) const;

    // ---- Sampling and reading -----------------------------------------------------------

    // The cached samples of the item found by its id in `_selectedCurveSet`, refreshed first
    // when dirty (`*number` gives the sample count then). flag bit 0 chooses the processed
    // curve (kTQSamplesProcessedCurve). The arrays stay the item's and live until its next
    // refresh. An item that is not in the set leaves the out pointers null and `*number` 0.
    void getSamples(TQCurveEditorItem* item, char flag, CMTime minU, CMTime resolution,
                    const CMTime** samplesU, const double** samplesV, unsigned* number);
    // A copy of the item's keyframe handles; empty for an unknown id.
    std::vector<TQKeyframeHandle> getKeypoints(uint32_t identifier);
    // (seconds of axis time, V) of the entry's keyframe; (0, 0) without a channel.
    CGPoint getKeypointPosition(const TQCurveSelection* entry) const;
    // For a keypoint entry: the same two results, each pointer optional.
    void getSelectedVertex(const TQCurveSelection* entry, double* u, double* y) const;
    // Bounding box of the entries from index 1 on, in channel seconds and V; false when no
    // keypoint was counted (bounds then at +/- the largest float).
    bool getSelected(TQCurveSelectionList* list, double* minX, double* maxX, double* minY,
                     double* maxY) const;
    // The whole channel's interpolation; no bracket.
    void setCurveInterpolation(const TQCurveSelection* entry, uint32_t interpolation);

    // ---- Unit conversion ---------------------------------------------------------------

    // V to channel units: (value * scaleY + offsetY) / conversionFactor. A null item gives
    // the value back.
    double convertToChannelCoords(const TQCurveEditorItem* item, double value) const;
    // Channel units to V: (value * conversionFactor - offsetY) / scaleY.
    double convertFromChannelCoords(const TQCurveEditorItem* item, double value) const;
    // Puts a time on the editor's time grid: identity here, frames in the full editor.
    virtual CMTime convertToCurveEditorAxis(CMTime time) const { return time; }
    virtual bool shouldConstrainToFrames() const { return false; }

    // ---- Modify brackets: the distinct channels of the list, gathered anew each time ----

    // willChangeChannel for each, in order of first appearance.
    void willModify(TQCurveSelectionList* list);
    // didChangeChannel for each, last gathered first.
    void didModify(TQCurveSelectionList* list);
    void willModifyValue(TQCurveSelectionList* list);
    void didModifyValue(TQCurveSelectionList* list);

    // ---- View support ------------------------------------------------------------------

    // The world rectangle that a vertical scroller spans: the current view volume widened to
    // every curve's extremes plus the view's padding.
    CGRect getMaxViewVolume() const;
    void magnifyGestureWithEvent(const RWEvent& event, double andFactor);
    // Asks for a new value of the primary keypoint in a modal value panel and writes it, with
    // no bracket. Nothing for an empty selection, a missing channel or a boolean channel.
    void showValueAtPoint(const CGPoint& point, RWWindow* inWindow, const CGRect& withRect);

    // ---- Keypoint operations (caller holds the bracket) ---------------------------------

    // Removes entries whose item or channel is gone (and the item from the set), and repairs
    // stale handles of keypoint and tangent entries by their stored time.
    void validateSelection(TQCurveSelectionList* list);
    // purgeKeyframes once on each distinct channel of the list.
    void purgeSelected(TQCurveSelectionList* list);
    // Deliberately without effect (its bound test can never pass); kept for its callers.
    void cleanSelection(TQCurveSelectionList* list);
    // True when the view's selection holds an unlocked keypoint.
    bool shouldDeleteKeypoints();
    // Deletes the unlocked keypoints; the first deletion on a channel stores the curve's
    // present value as its initial value, so a channel that loses its last keyframe keeps
    // showing what it showed.
    void deleteSelected(TQCurveSelectionList* list);
    // A copy of each keypoint at the first free frame from its own (floored) time.
    void duplicateSelected(TQCurveSelectionList* list);
    // Reverses, per curve, the span from its earliest to its latest selected keypoint.
    void reverseSelected(TQCurveSelectionList* list);
    // Every entry takes the opposite of the first entry's state (not toggled one by one).
    void lockSelected(TQCurveSelectionList* list);
    void disableSelected(TQCurveSelectionList* list);
    void easeInSelected(TQCurveSelectionList* list);
    // Marks no item dirty, unlike ease-in: the old behaviour, kept.
    void easeOutSelected(TQCurveSelectionList* list);
    void easeBothSelected(TQCurveSelectionList* list);
    // A keypoint on the curve at an axis time (put on the grid first); the entry becomes a
    // keypoint entry of it. No noteWillChange and no dirty mark, unlike the next one.
    TQCurveSelectionPtr addVertex(const TQCurveSelectionPtr& entry, CMTime u);
    // A keypoint at an axis time and a V value (the sketch tool).
    TQCurveSelectionPtr addVertex(const TQCurveSelectionPtr& entry, CMTime u, double v, char link);
    // Deletes the keypoint at a channel time.
    void deleteVertex(const TQCurveSelection* entry, CMTime u);
    // Forwarded to the view (every keypoint of the enabled items, or none); nothing without
    // a view.
    void selectAll(void* sender = nullptr);
    void selectNone(void* sender = nullptr);

    // ---- Commands with their own bracket -----------------------------------------------

    // The full bracket under "Undo Delete Keypoint" around deleteSelected, unless nothing
    // deletable is selected.
    virtual void deleteKeypoints(void* sender = nullptr);
    void menuDelete(void* sender = nullptr) { deleteKeypoints(sender); }
    void menuDuplicate(void* sender = nullptr);
    void menuReverse(void* sender = nullptr);
    void menuEaseIn(void* sender = nullptr);
    void menuEaseOut(void* sender = nullptr);
    void menuEaseBoth(void* sender = nullptr);
    void menuLockSelected(void* sender = nullptr);
    void menuDisableSelected(void* sender = nullptr);
    // From the curve menu: a keypoint on the picked curve at the mouse origin's time,
    // recorded with addChannelToUndo (no capture bracket).
    void menuAddKeyframe(void* sender = nullptr);

    // ---- Moving keypoints ---------------------------------------------------------------

    // Moves the selection so that its primary keypoint lands on (x axis time, y in its V).
    // Keypoints move in the order that keeps them from running through each other.
    void moveSelected(TQCurveSelectionList* list, CMTime x, double y, char useSelectionOrder,
                      char isConstraining);
    // Moves the selection by a time delta and a V delta (nudges).
    void offsetSelected(TQCurveSelectionList* list, CMTime x, double y);
    // Moves the whole curve of entry 0 by a V delta.
    void offsetCurve(TQCurveSelectionList* list, CMTime x, double y);
    // In place by u; equal times never compare equal, and a null element counts as time 0.
    void sortKeypoints(std::vector<TQKeyframePtr>& keys, bool bBackward);

    // ---- Box deformation (TQCurveEditorCtrlDeform.cpp) ----------------------------------
    //
    // The box tool's math. Setup freezes every keypoint of a list, with both its handles,
    // as coordinates normalised to the box around the keypoints; each deform maps those
    // frozen coordinates through the bilinear map of the box's four corners and writes the
    // result to the channels. Every deform starts from the frozen copy, so a drag of many
    // steps ends where one step to the same corners ends, and a box pulled inside out and
    // back gives back what it took. The caller holds the edit bracket.
    //
    // The frozen keys live in `_keys` until the next setup. They are valid for the box that
    // setup answered: a deform with that box's corners is the identity, up to one tick of
    // each keypoint's timescale times the box's width. Keys whose item, channel or keyframe
    // has gone since are skipped.

    // Freezes the keypoint entries of the list (validated first). Answers the box: origin the
    // earliest keypoint (axis seconds) and the lowest (V), size their extent, a degenerate
    // extent widened to 1e-6. Handles never widen it. Without a keypoint: the zero rectangle.
    CGRect setupDeformSelected(TQCurveSelectionList* list);
    // Maps the frozen keys through the box with these corners (world points). The list is
    // not read: the work list is `_keys`. Times stay between frames during a drag; the last
    // deformation of a gesture puts them on the grid when the controller constrains to
    // frames.
    void deformSelected(TQCurveSelectionList* list, CGPoint bottomLeft, CGPoint bottomRight,
                        CGPoint topRight, CGPoint topLeft, char lastDeformation);
    const std::vector<TQKeyframePtr>& deformKeys() const { return _keys; }

    // ---- Tangents -----------------------------------------------------------------------

    void setTangents(const TQCurveSelection* entry, double u, double v);
    void setTangentsSelected(TQCurveSelectionList* list, double u, double v);
    void setTangents45(const TQCurveSelection* entry, double u, double v, char flag);
    void setTangents45Selected(TQCurveSelectionList* list, double u, double v, char flag);
    void saveTangents(const TQCurveSelection* entry);
    void breakTangents(const TQCurveSelection* entry);
    void breakTangentsSelected(TQCurveSelectionList* list);
    void alignTangentsSelected(TQCurveSelectionList* list);
    void weightTangents(const TQCurveSelection* entry, char flag);
    void weightTangentsSelected(TQCurveSelectionList* list, char flag);
    void setBezierPoint(const TQCurveSelection* entry);
    void setBezierPointSelected(TQCurveSelectionList* list);
    void flattenSelected(TQCurveSelectionList* list);

    // ---- Context menus (TQCurveEditorCtrlMenus.cpp) -------------------------------------
    //
    // Four menus: a keypoint's, a tangent handle's, a curve's and the empty background's; the
    // view picks one for a right click (menuForEvent). Titles are looked up in the strings
    // table when a menu is built; validation may retitle an item (Lock / Unlock, Disable /
    // Enable, Break / Link). Every action runs on the view's selection as it is when the
    // action runs, validated first: an item chosen after its curve went away changes nothing.

    // Each stores its menu in its field; a subclass may build its own or add to the base's.
    virtual void buildKeyframeMenu();
    virtual void buildCurveMenu();
    virtual void buildTangentMenu();
    virtual void buildDefaultMenu();
    // Runs the menu... action named; false for an action this controller does not know.
    bool performAction(const std::string& action, RWActionSender& sender) override;
    // Routes the item by its menu (a submenu's item through the submenu's supermenu) to one of
    // the four below; an item of none of the four menus is disabled.
    bool validateMenuItem(RWMenuItem& item) override;
    // Lock and Disable take their title and a mixed mark from the selected keypoints; the
    // interpolation items are marked on, mixed or off by the selected keypoints' segments.
    virtual bool validateKeyframeMenuItem(RWMenuItem& item);
    // Delete All wants keypoints; the segment interpolation items a segment under the click.
    virtual bool validateCurveMenuItem(RWMenuItem& item);
    // Break reads Link on a broken pair; both need an unlocked channel.
    virtual bool validateTangentMenuItem(RWMenuItem& item);
    virtual bool validateDefaultMenuItem(RWMenuItem& item);

    void menuBreakTangent(void* sender = nullptr);
    void menuAlignTangent(void* sender = nullptr);
    // The sender's tag as the interpolation of every selected keypoint (through the linked
    // compound when there is one), and of the keypoint before it for the kinds that shape a
    // segment from both ends. One undo step; nothing without a sender.
    void menuSetKeypointInterpolation(RWActionSender* sender);
    // The sender's tag as the interpolation of the segment of the picked curve under the
    // mouse origin (that of the keypoint starting it). One undo step.
    void menuSetSegmentInterpolation(RWActionSender* sender);
    // Every keypoint of the first selected entry's channel, keeping its present value.
    void menuDeleteAllKeyframes(void* sender = nullptr);

    // ---- Public fields ------------------------------------------------------------------

    // Every compound behaves as linked while this is set. Nothing in the framework writes it.
    bool _linked = false;

protected:
    // ---- Lookup helpers: resolved anew at each call -------------------------------------

    // The channel item of the entry's curve id, or null.
    TQCurveEditorChannelItem* itemForEntry(const TQCurveSelection& entry) const;
    TQCurveEditorChannelItem* itemForChannel(const TQChannelBase* channel) const;
    // The channel of the entry's item, or null.
    TQChannel* channelForEntry(const TQCurveSelection& entry) const;
    // The compound through which an edit of `channel` goes, or null when it is not linked.
    TQCompoundChannel* linkedParent(const TQChannel* channel) const;
    // The `linked` argument for an edit through `compound`. The compound applies an edit to
    // every component only when told so, and does not consult its own fold flag; a linked
    // compound's edits must reach every component whatever the caller asked, so its flag is
    // added to the request here.
    static bool compoundLinkArgument(const TQCompoundChannel& compound, bool requested) {
        return requested || compound.isLinked();
    }
    // ---- Per-entry edits ------------------------------------------------------------------

    // What an edit of one entry's channel does around itself: announce the change to the
    // channel first (noteWillChange(true)) and mark the item's curve dirty after. Edits that
    // leave either out say so where they call.
    struct EntryEditMarks {
        bool noteWillChange = true;
        bool markDirty = true;
    };
    // An entry with its live item and channel, as an edit receives it.
    struct EntryChannel {
        const TQCurveSelection& entry;
        TQCurveEditorChannelItem& item;
        TQChannel& channel;
    };
    // Resolves the entry's item and channel (nothing happens when either is gone), announces,
    // runs `edit`, marks the item dirty. An edit that answers false (it found nothing to
    // change) leaves the dirty mark alone. Answers whether the edit ran.
    template <class Edit>
    bool editEntryChannel(const TQCurveSelection* entry, EntryEditMarks marks, Edit&& edit);
    // The same for each entry of the list that `wants` (a predicate on the entry), in order.
    template <class Predicate, class Edit>
    void forEachEntryChannel(TQCurveSelectionList* list, Predicate&& wants, EntryEditMarks marks,
                             Edit&& edit);
    // Lock and disable: every keypoint entry takes the opposite of the first entry's state
    // (`read`), written by `write`, on every component when its channel is linked.
    template <class Read, class Write>
    void applyKeyframeState(TQCurveSelectionList* list, Read&& read, Write&& write);

    // The steps of setTangents and setTangents45 on a resolved entry; false when its handle is
    // stale (or, for the snap, when no frame has been drawn) and nothing was changed.
    bool dragHandle(const EntryChannel& e, double u, double v);
    bool snapHandle45(const EntryChannel& e, double u, double v, char flag);

    // Marks the cached curve of every component of the compound that has an item.
    void markComponentsDirty(const TQCompoundChannel& compound) const;
    static void markDirty(TQCurveEditorChannelItem* item) {
        if (item) item->setOriginalCurveDirty(1);
    }
    // Sample count of new items: the view's width + 1, truncated.
    uint32_t newItemSampleCount() const;
    // appendChannel without its post: the set's appendItem, which posts nothing.
    TQCurveEditorItemPtr appendChannelItem(TQChannel* channel, const TQCurveSetPtr& toCurveSet);
    // The view's selection list, or null without a view.
    TQCurveSelectionList* viewSelection() const;
    void postNotification(TQNotificationWord word) const;
    // One announcement of the delegate for each distinct channel of the list, in order of
    // first appearance or, for the closing ones, last first.
    using ChannelAnnouncement = void (TQCurveEditorAppDelegate::*)(const TQChannelBase*);
    void announce(TQCurveSelectionList* list, ChannelAnnouncement call, bool lastFirst);
    // The one-shot bracket of the menu commands around `operation` on the view's selection,
    // closed by a post of kTQNotifyChannelsChanged.
    using ListOperation = void (TQCurveEditorCtrlBase::*)(TQCurveSelectionList*);
    void performWithBracket(const char* undoKey, ListOperation operation);
    // Runs the value window modally; true when it was accepted (value updated).
    virtual bool runValuePanel(TQCurveEditorValueWindow& window);

    // ---- Menu helpers ---------------------------------------------------------------------

    // Locks and enabled states over a selection's keypoints.
    struct KeypointStates {
        size_t count = 0;
        size_t locked = 0;
        size_t unlocked = 0;
        size_t enabled = 0;
        size_t disabled = 0;
        // An empty selection counts as all locked.
        bool allLocked() const { return locked == count; }
    };
    KeypointStates keypointStates(TQCurveSelectionList* list) const;
    bool validateKeypointInterpolationItem(RWMenuItem& item, TQCurveSelectionList* list,
                                           bool canModify) const;
    // One keypoint's interpolation, through its linked compound when there is one; announced
    // and marked dirty.
    void setKeypointInterpolation(TQChannel& channel, TQKeyframeHandle handle,
                                  unsigned interpolation);
    // The time of the view's mouse origin as the channel's own time (invalid without a view).
    CMTime channelTimeAtMouseOrigin(const TQChannel& channel) const;
    // The keypoint that starts the segment under the mouse origin, or null before the first.
    TQKeyframeHandle segmentKeyframeAtMouseOrigin(const TQChannel& channel) const;

    // A frozen key's item and channel, resolved once per curve for one deform call.
    struct DeformTarget {
        uint32_t curveId = 0;
        TQCurveEditorItemPtr held;  // keeps the item alive through the call
        TQCurveEditorChannelItem* item = nullptr;
        TQChannel* channel = nullptr;
    };
    // The target of a curve id for this call (null channel when the item or channel is gone).
    const DeformTarget& deformTarget(uint32_t curveId);
    // The first pass of a deform: the direction of travel and whether the box is mirrored,
    // and the write order that follows from them.
    void orderKeysForDeform(const TQBilinearMap& map);
    // The second pass for one key: value and handles first, the time last.
    void writeDeformedKey(const TQKeyframe& key, const TQBilinearMap& map, char lastDeformation);

    // ---- Fields, in declaration order ---------------------------------------------------

    TQCurveEditorAppDelegate* _pAppDelegate = nullptr;  // not owned
    TQCurveEditorViewBase* _view = nullptr;             // not owned
    TQTool _currentTool = TQTool::kEdit;
    TQCurveSetPtr _selectedCurveSet;
    RWMenuPtr _keyframeMenu;
    RWMenuPtr _tangentMenu;
    RWMenuPtr _curveMenu;
    RWMenuPtr _defaultMenu;
    double _originalInTanU = 0.0;
    double _originalInTanV = 0.0;
    double _originalOutTanU = 0.0;
    double _originalOutTanV = 0.0;
    bool _lastFrameTextUpdateTime = false;
    bool _snapshotChannels = false;
    bool _ignoreHiddenChannels = false;
    bool _negativeRangeAllowed = false;
    int32_t _iLastDragDirection = 0;     // box deformation only
    bool _bSelectionWasFlipped = false;  // box deformation only
    std::vector<TQKeyframePtr> _keys;    // box deformation only; owned

private:
    // Scratch of deformSelected: the targets by curve id, sorted, kept between calls so that
    // a drag step allocates nothing per keypoint.
    std::vector<DeformTarget> _deformTargets;
};

// ---- Per-entry edits --------------------------------------------------------------------

template <class Edit>
bool TQCurveEditorCtrlBase::editEntryChannel(const TQCurveSelection* entry, EntryEditMarks marks,
                                             Edit&& edit) {
    if (!entry) return false;
    // Held for the edit: the set could drop the item while the channel changes.
    const TQCurveEditorItemPtr held = channelItemWithIdentifier(entry->getCurveId());
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get());
    TQChannel* channel = item ? item->channel() : nullptr;
    if (!channel) return false;
    if (marks.noteWillChange) channel->noteWillChange(true);
    const EntryChannel target{*entry, *item, *channel};
    bool changed = true;
    if constexpr (std::is_void_v<std::invoke_result_t<Edit&, const EntryChannel&>>)
        edit(target);
    else
        changed = edit(target);
    if (changed && marks.markDirty) markDirty(item);
    return true;
}

template <class Predicate, class Edit>
void TQCurveEditorCtrlBase::forEachEntryChannel(TQCurveSelectionList* list, Predicate&& wants,
                                                EntryEditMarks marks, Edit&& edit) {
    if (!list) return;
    const std::vector<TQCurveSelectionPtr>& entries = list->getSelectionArray();
    // By index, each entry held while it is edited: nothing here changes the list, but an
    // edit must not be able to pull it from under the walk.
    for (size_t i = 0; i < entries.size(); ++i) {
        const TQCurveSelectionPtr entry = entries[i];
        if (entry && std::invoke(wants, *entry)) editEntryChannel(entry.get(), marks, edit);
    }
}
