#pragma once
// A QWidget that shows a curve view: it is the view's host (TQQtViewHost), draws the view's
// frames with the QPainter encoder in its paint events, and keeps the view's backing in step
// with its size and device pixel ratio.
//
// Frames. A paint event asks the view for a frame. When the view's 1/30 s gate holds the
// frame back, the widget shows the last frame again; the view has then scheduled one delayed
// redraw, which reaches the widget as update(). So a burst of repaints costs one frame.
//
// Mouse and keys. The left button's press, moves and release go to the view's mouseDown,
// mouseDragged and mouseUp as one gesture, in window points with y up and the modifier bits
// of TQQtEvents (Ctrl is Command, Alt is Option). A press that follows the last one within the
// platform's double-click interval, near where it was, counts one click more (2 for Qt's
// double click, 3 for a third press...). Moves without a gesture under way, and the other
// buttons, are not the edit tool's. A key press is offered to the view's customKeyEquivalent
// before any shortcut of the window (Qt's shortcut override), then to its keyDown, then to the
// key map (TQQtKeyMap.h: the arrows nudge, Delete deletes); keys none of them take go on to
// the parent, so that window shortcuts still work. Focus in and out make the view the first
// responder and end that.
//
// Pointer and menu. Moves with no button down reach the view's tracking areas, which choose the
// pointer's shape for what a click would do (and again when a modifier key changes). A right
// click, or the menu key, asks the view for its menu (menuForEvent, which selects what lies
// under the pointer) and shows it, validated as it opens.
//
// The view takes at most one drag step per 1/30 s and drops the moves in between; the next
// step makes up for them. So that a pointer that stops right after a dropped move still
// brings its keypoint along, the last move of a drag is handed to the view once more a
// frame interval later, unless another move came first.
//
// Wheel events are folded as the views expect: each one is queued on the host, and one
// handler run from the event loop takes the first; the view's scrollWheel takes the ones
// still waiting. Events the view has no handler for are translated by subclasses (see
// TQQtEvents.h) and passed to theirs.
//
// Lifetime: the widget does not own the view. It detaches itself from the view when it dies
// or another view is set; the owner of the view detaches it (setView(nullptr)) before
// deleting the view, if the widget lives on.

#include <QTimer>
#include <QWidget>

#include <functional>
#include <optional>
#include <string>

#include "platform/ui/RWMenu.h"
#include "qt/TQQtKeyMap.h"
#include "qt/TQQtPainterEncoder.h"
#include "qt/TQQtServices.h"

class TQCurveEditorViewBase;

class TQQtCurveViewWidget : public QWidget {
public:
    explicit TQQtCurveViewWidget(QWidget* parent = nullptr);
    ~TQQtCurveViewWidget() override;

    void setView(TQCurveEditorViewBase* view);
    TQCurveEditorViewBase* view() const { return _view; }
    TQQtViewHost& viewHost() { return _host; }
    const TQQtPainterEncoder& encoder() const { return _encoder; }
    // Frames the view actually drew (not the repaints that showed the last one again).
    int framesDrawn() const { return _encoder.framesPresented(); }

    QSize sizeHint() const override { return QSize(640, 320); }

    const TQQtKeyMap& keyMap() const { return _keyMap; }
    void setKeyMap(TQQtKeyMap map) { _keyMap = std::move(map); }
    // Shows a context menu and runs the chosen action (TQQtRunContextMenu unless replaced, as
    // a test does to choose without a nested loop).
    using ContextMenuRunner = std::function<bool(const RWMenuPtr&, const QPoint& globalPosition)>;
    void setContextMenuRunner(ContextMenuRunner runner) { _menuRunner = std::move(runner); }

protected:
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void showEvent(QShowEvent* event) override;
    void wheelEvent(QWheelEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseDoubleClickEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    // Key equivalents: the view sees a key press before the window's shortcuts do.
    bool event(QEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void keyReleaseEvent(QKeyEvent* event) override;
    void contextMenuEvent(QContextMenuEvent* event) override;
    void enterEvent(QEnterEvent* event) override;
    void leaveEvent(QEvent* event) override;
    void focusInEvent(QFocusEvent* event) override;
    void focusOutEvent(QFocusEvent* event) override;

private:
    void syncBacking();
    void deliverQueuedWheel();
    // A left press, counted as the click of a multi-click it may continue.
    void beginGesture(QMouseEvent* event, bool doubleClick);
    void repeatLastDrag();
    // Ends the gesture in the view with a release where `at` happened.
    void endGesture(const RWEvent& at);
    // The key map's action for the view, if the map holds the key; answers whether it did.
    bool sendMappedAction(const std::optional<std::string>& action);
    // The pointer is over the widget at `at` (widget coordinates) with these modifiers.
    void hover(const QPointF& at, Qt::KeyboardModifiers modifiers);

    TQQtViewHost _host;
    TQQtPainterEncoder _encoder;
    TQCurveEditorViewBase* _view = nullptr;  // not owned
    qreal _lastPixelRatio = 0.0;
    bool _wheelDeliveryPending = false;
    // The gesture of the left button: true from its press to its release.
    bool _leftGesture = false;
    // The last left press, for counting clicks.
    int64_t _clickCount = 0;
    qint64 _lastPressMs = 0;
    QPointF _lastPressAt;
    bool _hasLastPress = false;
    // The last move of the drag, handed over again by _dragRepeat.
    std::optional<RWEvent> _lastDrag;
    QTimer _dragRepeat;
    TQQtKeyMap _keyMap = TQQtKeyMap::standard();
    ContextMenuRunner _menuRunner;
    // Where the pointer hovers, for a modifier key that changes what a click would do.
    std::optional<QPointF> _hoverAt;
};
