#pragma once
// The controller of the mini curve editor: the engine with one private set that holds the
// channel, or every channel of the folder, it was made for. The X axis is a position over a
// range of 0 to 1, carried as a time of 0 to 1 second; the engine is otherwise unchanged, since
// a curve over a range has the same shape as one over time.
//
// Differences from the full editor: no automatic sets, no pop-up, no list; hidden channels are
// shown; compounds always edit as linked; processed curves are never drawn; the selection is
// mirrored onto the items; the rows of an over-range parameter read the selected keypoint
// (getSelectedValueX/Y) and write it (moveSelectedInY/X) inside brackets they open themselves.
//
// Lifetime. Two-phase: construct, then initWithView. The view is not owned; the controller
// attaches itself to it there and detaches itself when it goes. The delegate is whatever
// allocAppDelegate answers: a host that wants a working mini editor supplies it (the container
// TQMiniCurveEditor hands its host delegate in), and it must outlive the controller.

#include <cstdint>

#include "platform/channels/TQChannelBase.h"
#include "platform/media/CMTime.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

class TQMiniCurveEditorCtrl : public TQCurveEditorCtrlBase {
public:
    // Tags of the two items of the default menu that open the extrapolation sub-menus.
    static constexpr int64_t kPreExtrapolationItemTag = 1;
    static constexpr int64_t kPostExtrapolationItemTag = 2;
    // The interpolation tag that means "the keyframes differ": choosing it does nothing.
    static constexpr int64_t kMixedInterpolationTag = 100;

    // `hostDelegate` is what allocAppDelegate answers unless a subclass overrides it.
    explicit TQMiniCurveEditorCtrl(TQCurveEditorAppDelegate* hostDelegate = nullptr)
        : _hostDelegate(hostDelegate) {}
    ~TQMiniCurveEditorCtrl() override;

    // The base's init, the private set, then the channel (a TQChannel) or every channel of the
    // folder (anything else, a null channel included, which leaves the set empty).
    void initWithView(TQCurveEditorViewBase* view, TQChannelBase* channel);
    TQCurveEditorAppDelegate* allocAppDelegate() override { return _hostDelegate; }

    // ---- Menus ----
    void buildDefaultMenu() override;
    // delete: is always valid; the rest goes to the base.
    bool validateMenuItem(RWMenuItem& item) override;
    // False with no channel item. The extrapolation items take the state of the first
    // channel's extrapolation (before or after); their state is left as it was when invalid.
    bool validateDefaultMenuItem(RWMenuItem& item) override;
    bool performAction(const std::string& action, RWActionSender& sender) override;
    // Each on every channel item of the set, one undo step, posted with kTQNotifyChannelsChanged.
    void menuSetCurvePreExtrapolation(RWActionSender& sender);
    void menuSetCurvePostExtrapolation(RWActionSender& sender);
    // Every channel takes the opposite of the first channel's lock.
    void menuLockChannel(RWActionSender& sender);
    // The sender's tag as the interpolation of every channel; the sender's menu then shows
    // that tag checked. The mixed tag does nothing at all.
    void menuSetCurveInterpolation(RWActionSender& sender);

    // ---- Selection ----
    // Mirrors the list onto the items of the set and posts kTQNotifyChannelsChanged, so that
    // the rows show the new keypoint.
    void selectionChangedTo(TQCurveSelectionList* list) override;
    // Any keypoint or tangent entry in the view's selection whose keyframe is alive.
    bool hasSelection() const;
    // The first keypoint entry's position and value; zero without one.
    CMTime getSelectedValueX() const;
    double getSelectedValueY() const;
    std::vector<TQCurveEditorItemPtr> sketchedChannels() const override;
    uint32_t numberOfSketchedChannels() const override { return numberOfEnabledChannels(); }

    // ---- Value edits from the rows (the caller holds the bracket and posts) ----
    // Entry 0's keyframe takes the value y; every other keypoint moves by the same amount.
    // An empty or wholly stale list changes nothing.
    void moveSelectedInY(TQCurveSelectionList* list, double y);
    // Entry 0's keyframe takes the position x; every other keypoint moves by the same amount,
    // compounds as a whole. Keypoints are not sorted: the caller ends with
    // didEndModifyingSelectedX of the container.
    void moveSelectedInX(TQCurveSelectionList* list, CMTime x);

    // Every curve sampled again, then the UI.
    void update() override;

private:
    // The body shared by the four menu actions: one undo step over every channel item.
    template <class Change>
    void changeAllChannels(const char* undoKey, Change&& change);
    // The value or time of entry 0's keyframe, after the list was validated; false when the
    // list holds no live entry.
    bool primaryKeyframe(TQCurveSelectionList* list, CMTime* time, double* value) const;
    TQChannel* firstChannel() const;

    TQCurveEditorAppDelegate* _hostDelegate = nullptr;  // not owned
};
