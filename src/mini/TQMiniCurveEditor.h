#pragma once
// The visible mini editor: a container that owns the curve view, its controller and the two
// axis labels, and offers the selected keypoint to the rows of an over-range parameter.
// TQMiniCurveEditorHUD is the bare form of heads-up panels; TQMiniCurveEditorInspector
// (TQMiniCurveEditorInspector.h) adds tools, auto fit and zoom scrollers.
//
// Frames are in points, origin at the bottom left of the container; a toolkit adapter places
// the curve view and the controls by them. The curve view gets its size and redraws from the
// RWViewHost the adapter gives it.
//
// Lifetime. setChannel makes a new controller each time (the old one goes first); before the
// first, every accessor answers zero. The host delegate is not owned and must outlive the
// editor.

#include <memory>

#include "platform/geometry/CGGeometry.h"
#include "platform/media/CMTime.h"
#include "platform/ui/RWTextField.h"
#include "src/mini/TQMiniCurveEditorCtrl.h"
#include "src/mini/TQMiniCurveEditorView.h"

class TQMiniCurveEditor : public RWActionTarget {
public:
    explicit TQMiniCurveEditor(TQCurveEditorAppDelegate* hostDelegate = nullptr);
    ~TQMiniCurveEditor() override;
    TQMiniCurveEditor(const TQMiniCurveEditor&) = delete;
    TQMiniCurveEditor& operator=(const TQMiniCurveEditor&) = delete;

    // The controller of a channel. A host with a controller of its own overrides this.
    virtual std::unique_ptr<TQMiniCurveEditorCtrl> allocCurveEditorController(
        TQChannelBase* channel);
    TQCurveEditorAppDelegate* hostDelegate() const { return _hostDelegate; }

    // A new controller for the channel (null: an empty editor); the labels show the
    // channel's name and its X axis label.
    virtual void setChannel(TQChannelBase* channel);
    // The controller's update, then the view's.
    virtual void update();
    virtual void setEnabled(bool enabled);
    bool isEnabled() const { return _curveEditorView->isEnabled(); }
    void setTotalRange(const CMTime* start, const CMTime* duration);
    void setDisplayRange(const CMTime* start, const CMTime* duration);
    virtual void windowWasPanned(double) {}
    virtual void windowWasZoomed() {}

    TQCurveEditorAppDelegate* appDelegate() const;
    // A row's current time is the selected keypoint's position in the range.
    CMTime currentTime() const { return getSelectedValueX(); }

    // ---- The selected keypoint, for the rows ----
    CMTime getSelectedValueX() const;
    double getSelectedValueY() const;
    bool hasSelection() const;
    // Moves the selection (the caller holds the bracket).
    void setSelectedValueY(double y);
    void setSelectedValueX(CMTime x);
    CMTime getSelectedValueXForChannel(const TQChannelBase*) const { return getSelectedValueX(); }
    // The channel's curve at the selected position, keypoint or not.
    double getSelectedValueYForChannel(const TQChannelBase* channel) const;
    // A keypoint of the channel at the selected position takes y (added when there is none),
    // so that a row edits every component of a compound at one position; an auto-zooming
    // view fits again when y leaves it.
    void setSelectedValueY(double y, TQChannelBase* channel);
    void setSelectedValueX(CMTime x, TQChannelBase*) { setSelectedValueX(x); }
    // After a move in X: stale handles repaired, keypoints that met purged.
    void didEndModifyingSelectedX();

    // ---- Parts ----
    TQMiniCurveEditorView& curveEditorView() { return *_curveEditorView; }
    const TQMiniCurveEditorView& curveEditorView() const { return *_curveEditorView; }
    TQMiniCurveEditorCtrl* controller() const { return _curveEditorCtrl.get(); }
    // The models, shared with the widgets that show them.
    const std::shared_ptr<RWTextField>& axisXModel() const { return _axisX; }
    const std::shared_ptr<RWTextField>& axisYModel() const { return _axisY; }
    RWTextField& axisX() { return *_axisX; }
    RWTextField& axisY() { return *_axisY; }
    // The Y label is drawn turned by this many degrees.
    double axisYRotation() const { return _axisYRotation; }
    const CGRect& masterFrame() const { return _masterFrame; }
    const CGRect& curveEditorViewFrame() const { return _curveEditorViewFrame; }
    void setCurveEditorViewFrame(const CGRect& frame);

    bool performAction(const std::string&, RWActionSender&) override { return false; }

protected:
    // Frames and the labels' common settings; subclasses call it from their constructors.
    void layOut(const CGRect& master, const CGRect& view, const CGRect& axisY, const CGRect& axisX);

    TQCurveEditorAppDelegate* _hostDelegate = nullptr;  // not owned
    CGRect _masterFrame = CGRectZero;
    std::unique_ptr<TQMiniCurveEditorView> _curveEditorView;
    CGRect _curveEditorViewFrame = CGRectZero;
    std::shared_ptr<RWTextField> _axisX;
    std::shared_ptr<RWTextField> _axisY;
    double _axisYRotation = 90.0;
    std::unique_ptr<TQMiniCurveEditorCtrl> _curveEditorCtrl;
};

// The heads-up form: the curve view and the labels only, always fitting the curves.
class TQMiniCurveEditorHUD : public TQMiniCurveEditor {
public:
    explicit TQMiniCurveEditorHUD(TQCurveEditorAppDelegate* hostDelegate = nullptr);
    void setChannel(TQChannelBase* channel) override;
};
