#pragma once
// Two small modal panels that ask for one number at a place on the screen: the timing move
// panel (a time, as a count of frames, to move keypoints by or to) and, derived from it, the
// value panel (a keypoint's value). A caller uses a class method, gets yes or no back, and
// reads the number from the double it passed in.
//
// Each class method keeps a controller of its own, made on first use and kept for the life
// of the process, with its panel: five controllers at most. A panel is a borderless floating
// window whose content comes from its interface file (TQNumberPanelViews.h): a number field,
// OK and Cancel. It is run through the process-wide modal service (RWServices.h), so a host
// without a display (the headless service aborts every run) always answers no.
//
// While a panel runs, its field reads finite numbers only: text that is no number cannot end
// the edit, so Return and OK leave the panel open and nothing is changed.
//
// Main thread only.

#include <memory>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWAction.h"
#include "platform/ui/RWEvent.h"
#include "platform/ui/RWTextField.h"
#include "platform/ui/RWWindow.h"

// The panels: they take the keys, and close at once on the user's close, without asking.
class TQNumberPanel : public RWPanel {
public:
    bool canBecomeKeyWindow() const override { return true; }
    bool performClose() override {
        close();
        return true;
    }
};
class TQTimingMovePanel : public TQNumberPanel {};
class TQCurveEditorValuePanel : public TQNumberPanel {};

class TQTimingMoveController : public RWActionTarget, public RWWindowDelegate {
public:
    TQTimingMoveController() = default;
    ~TQTimingMoveController() override;
    TQTimingMoveController(const TQTimingMoveController&) = delete;
    TQTimingMoveController& operator=(const TQTimingMoveController&) = delete;

    // Two-phase: construct, then init, which builds the panel (buildUI).
    virtual void init() { buildUI(); }
    void awakeFromNib() {}
    // The content from the interface file, once; the panel around it, once; the field's
    // target and action.
    virtual void buildUI();

    // Places the panel below the rectangle (centred on it when it has a width), shows it with
    // the number at `value` selected, or with the key of a key event typed into the field in
    // its place, and runs it. OK, or Return on a number, answers true and writes the field's
    // number through `value`; anything else answers false and leaves it. `isDelta` is passed
    // along for the caller and never read or written. The rectangle is in screen points.
    bool openWithEventParentRectValueIsDelta(const RWEvent* event, const CGRect& parentRect,
                                             double* value, bool* isDelta);

    // ---- Class methods, each with its own controller ----
    // A panel below (and centred on) a rectangle of the screen, opened by an event or none.
    static bool openWithEvent(const RWEvent* event, const CGRect& parentRect, double* timeValue,
                              bool* timeIsDelta);
    // A panel hanging below a point of the screen.
    static bool openWithLocation(const CGPoint& location, double* value);

    // ---- Actions and the panel's delegate ----
    // cancelNotify: and okNotify: (the buttons), valueFieldChanged: (Return in the field).
    bool performAction(const std::string& action, RWActionSender& sender) override;
    // The panel closed by the user: the run ends as cancelled.
    void windowWillClose(RWWindow& window) override;
    virtual void valueFieldChanged();

    const std::shared_ptr<RWTextField>& valueField() const { return _pValueField; }
    const std::shared_ptr<RWPanel>& panel() const { return _pPanel; }
    const std::shared_ptr<RWView>& view() const { return _pView; }

protected:
    // The interface file's name, what is logged when it cannot be loaded, and the panel of
    // this class.
    virtual const char* interfaceName() const { return "TQTimingMoveView"; }
    virtual const char* interfaceFailureMessage() const { return "Unable to load timing move nib"; }
    virtual std::shared_ptr<RWPanel> makePanel() const {
        return std::make_shared<TQTimingMovePanel>();
    }
    // Ends the run of this controller's panel, if one is on.
    void stopModalWithCode(int64_t code) const;

    // ---- Fields, in order ----
    std::shared_ptr<RWTextField> _pValueField;
    std::shared_ptr<RWPanel> _pPanel;
    std::shared_ptr<RWView> _pView;

private:
    bool _running = false;  // this controller's panel is in its modal run
};

class TQCurveEditorValueController : public TQTimingMoveController {
public:
    static bool openWithEvent(const RWEvent* event, const CGRect& parentRect, double* timeValue,
                              bool* timeIsDelta);
    static bool openWithLocation(const CGPoint& location, double* value);
    // A panel at a point of the window (window points, y up), kept inside the rectangle of
    // the window (getPanelLocation), its top at the point. Without a window the point is
    // taken as a screen point.
    static bool openWithLocationValueInWindow(const CGPoint& location, double* value,
                                              const RWWindow* window, const CGRect& rect);

    // Where the panel's top-left corner goes so that the panel stays inside the parent frame,
    // its top at the point's y where it can be: x no further left than the frame's left edge
    // and no further right than fits; y raised to leave room for the panel's height above the
    // frame's bottom, and lowered to the frame's top.
    CGPoint getPanelLocation(CGPoint location, const CGRect& parentFrame) const;

    // Return ends the run as OK only on a number; on anything else as cancelled.
    void valueFieldChanged() override;

protected:
    const char* interfaceName() const override { return "TQCurveEditorValueView"; }
    const char* interfaceFailureMessage() const override {
        return "Unable to load marker info view nib";
    }
    std::shared_ptr<RWPanel> makePanel() const override {
        return std::make_shared<TQCurveEditorValuePanel>();
    }
};
