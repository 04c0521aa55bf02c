#pragma once
// Cells: what a table or outline column draws in each of its rows, and what tracks a press in
// one of them. One data cell serves every row of its column: before each use the view sets
// the row's object value and lets its delegate adjust the cell, so that no state may be
// assumed from an earlier row.
//
// A cell holds an object value and shows it as text through its formatter, if it has one.
// It draws itself into a frame through RWCellDrawing, which the adapter implements on its
// painter; frames are in the coordinates of the view that draws the cell, with y growing
// downwards as rows are laid out.
//
// Tracking. A press in a cell may be tracked by the cell (a check box, a scrubber): the view
// calls trackMouse with the press, then continueTracking for each drag and stopTracking once,
// at the release or, when the press was not tracked until the mouse went up, as soon as the
// pointer leaves the cell's frame. The cell may send its action to its target meanwhile.
//
// Formatters are shared and not owned: a formatter outlives the cells that use it. Targets are
// not owned either.

#include <cstdint>
#include <memory>
#include <string>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWAction.h"
#include "platform/ui/RWColor.h"
#include "platform/ui/RWEvent.h"
#include "platform/ui/RWFormatter.h"
#include "platform/ui/RWMenu.h"
#include "platform/ui/RWObjectValue.h"

class RWOutlineView;

enum class RWTextAlignment { Left = 0, Right = 1, Center = 2, Justified = 3, Natural = 4 };

// States of a button cell (RWOnState, RWOffState, RWMixedState of RWMenu.h); mixed only where
// the cell allows it.

// What a cell draws with.
class RWCellDrawing {
public:
    virtual ~RWCellDrawing() = default;
    virtual bool shouldAntialias() const = 0;
    virtual void setShouldAntialias(bool antialias) = 0;
    virtual void fillRect(const CGRect& rect, const RWColor& color) = 0;
    // A line of the given width along the rectangle's edges.
    virtual void strokeRect(const CGRect& rect, const RWColor& color, double lineWidth) = 0;
    // One line of text in the frame, at its top, aligned; dimmed when the cell is disabled.
    // Text wider than the frame is cut at its tail.
    virtual void drawText(const std::string& text, const CGRect& frame, RWTextAlignment alignment,
                          bool enabled) = 0;
    // A check box of the state (RWOnState, RWOffState, RWMixedState) centred in the frame.
    // Here from the primitives above: an outlined square, filled for on, a bar for mixed.
    virtual void drawCheckBox(const CGRect& frame, int32_t state, bool enabled, bool highlighted);
    // The image of the framework's resources of that name, scaled into the frame, at an
    // opacity from 0 to 1. A drawing that shows no images (one that only measures) draws none.
    virtual void drawImage(const std::string& resourceName, const CGRect& frame, double opacity) {
        (void)resourceName;
        (void)frame;
        (void)opacity;
    }
};

class RWCell : public RWActionSender {
public:
    // initTextCell: a cell that shows the text.
    explicit RWCell(const std::string& text = {}) : _objectValue(text) {}
    ~RWCell() override = default;
    RWCell(const RWCell&) = delete;
    RWCell& operator=(const RWCell&) = delete;

    // ---- Value ----
    const RWObjectValue& objectValue() const { return _objectValue; }
    virtual void setObjectValue(const RWObjectValue& value) { _objectValue = value; }
    // The value as text: the formatter's, or the value's own text without one (and when
    // the formatter cannot show the value, no text).
    std::string stringValue() const;
    // Text in: through the formatter when there is one (text it refuses is kept as the
    // string it is), else the string itself.
    void setStringValue(const std::string& text);
    double doubleValue() const { return _objectValue.doubleValue(); }
    int32_t intValue() const { return _objectValue.intValue(); }

    // ---- Settings ----
    const RWFormatter* formatter() const { return _formatter; }
    void setFormatter(const RWFormatter* formatter) { _formatter = formatter; }
    bool isEditable() const { return _editable; }
    void setEditable(bool editable) { _editable = editable; }
    bool isEnabled() const { return _enabled; }
    void setEnabled(bool enabled) { _enabled = enabled; }
    RWTextAlignment alignment() const { return _alignment; }
    void setAlignment(RWTextAlignment alignment) { _alignment = alignment; }
    bool wraps() const { return _wraps; }
    void setWraps(bool wraps) { _wraps = wraps; }
    // Points of the cell's font; the view's default when 0.
    double fontSize() const { return _fontSize; }
    void setFontSize(double size) { _fontSize = size; }
    bool isHighlighted() const { return _highlighted; }
    void setHighlighted(bool highlighted) { _highlighted = highlighted; }

    // ---- Target and action ----
    RWActionTarget* target() const { return _target; }
    void setTarget(RWActionTarget* target) { _target = target; }
    const std::string& action() const { return _action; }
    void setAction(const std::string& action) { _action = action; }
    int64_t tag() const override { return _tag; }
    void setTag(int64_t tag) { _tag = tag; }
    // The action to the target, the cell as sender; false without either, or when disabled.
    bool sendAction();
    // Any named action to the target, the cell as sender (a cell that reports the start and
    // end of a gesture).
    bool sendActionNamed(const std::string& action);

    // ---- Drawing ----
    // Draws the text in the frame.
    virtual void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const;

    // ---- Tracking a press (see above) ----
    // Starts tracking the press at `event` (its location in the view's coordinates is
    // `point`) in a cell of `frame`; false when this cell does not track presses (a text cell).
    virtual bool trackMouse(const RWEvent& event, const CGPoint& point, const CGRect& frame,
                            RWOutlineView& view, bool untilMouseUp);
    virtual void continueTracking(const RWEvent& event, const CGPoint& point, RWOutlineView& view);
    virtual void stopTracking(const CGPoint& point, RWOutlineView& view, bool mouseIsUp);
    // After a tracked press: whether the view is to hand the cell's new value to its data
    // source (a check box), and whether the press was a click that asks to edit the text (a
    // scrubber that was not dragged).
    virtual bool commitsTrackedValue() const { return false; }
    // Whether a press goes on being tracked outside the frame until the release (a scrubber,
    // whose drag runs wherever the pointer goes).
    virtual bool prefersTrackingUntilMouseUp() const { return false; }
    virtual bool wantsEditingAfterTracking() const { return false; }
    // A cell whose tracking changes its settings (a scrubber, whose target gives it the range
    // of the row it scrubs) answers a copy to track, so that the column's cell keeps serving
    // the other rows meanwhile. Null: the view tracks the column's cell itself.
    virtual std::shared_ptr<RWCell> copyForTracking() const { return nullptr; }

protected:
    // Every setting of this cell, target and action included, onto another.
    void copyCellTo(RWCell& copy) const;

private:
    RWObjectValue _objectValue;
    const RWFormatter* _formatter = nullptr;  // not owned
    bool _editable = false;
    bool _enabled = true;
    RWTextAlignment _alignment = RWTextAlignment::Natural;
    bool _wraps = false;
    double _fontSize = 0.0;
    bool _highlighted = false;
    RWActionTarget* _target = nullptr;  // not owned
    std::string _action;
    int64_t _tag = 0;
};

using RWCellPtr = std::shared_ptr<RWCell>;

// A check box (or another two- or three-state button) in a column.
class RWButtonCell : public RWCell {
public:
    // The button types and bezel styles a check box column uses.
    static constexpr int64_t kSwitchButton = 3;
    static constexpr int64_t kRegularSquareBezelStyle = 2;
    static constexpr int64_t kSmallControlSize = 1;

    // initTextCell: off, no mixed state; the text is the button's title.
    explicit RWButtonCell(const std::string& title = {});

    const std::string& title() const { return _title; }
    void setTitle(const std::string& title) { _title = title; }
    // RWOnState, RWOffState or, when allowed, RWMixedState; the object value is the state.
    int32_t state() const { return intValue(); }
    void setState(int32_t state);
    bool allowsMixedState() const { return _allowsMixedState; }
    // Turning mixed off makes a mixed state on.
    void setAllowsMixedState(bool allows);
    // The state a click gives: off to on, on to off; with a mixed state the cycle is on, off,
    // mixed, on.
    int32_t nextState() const;
    void setNextState() { setState(nextState()); }
    void setObjectValue(const RWObjectValue& value) override;

    int64_t buttonType() const { return _buttonType; }
    void setButtonType(int64_t type) { _buttonType = type; }
    int64_t bezelStyle() const { return _bezelStyle; }
    void setBezelStyle(int64_t style) { _bezelStyle = style; }
    int64_t controlSize() const { return _controlSize; }
    void setControlSize(int64_t size) { _controlSize = size; }

    void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const override;

    // A press is tracked while the pointer stays inside: a release inside takes the next
    // state and sends the action.
    bool trackMouse(const RWEvent& event, const CGPoint& point, const CGRect& frame,
                    RWOutlineView& view, bool untilMouseUp) override;
    void continueTracking(const RWEvent& event, const CGPoint& point, RWOutlineView& view) override;
    void stopTracking(const CGPoint& point, RWOutlineView& view, bool mouseIsUp) override;
    bool commitsTrackedValue() const override { return _clicked; }

private:
    std::string _title;
    bool _allowsMixedState = false;
    int64_t _buttonType = 0;
    int64_t _bezelStyle = 0;
    int64_t _controlSize = 0;
    CGRect _trackingFrame = CGRectZero;
    bool _clicked = false;
};
