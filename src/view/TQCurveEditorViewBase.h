#pragma once
// The view on which curves are shown and edited: one rectangle of world coordinates, the view
// volume, is mapped onto the drawable, and zoom, pan, auto-zoom and framing change that
// rectangle. World x is time in seconds on the editor's axis; world y is the view's own
// vertical space, into which each channel is normalised by its item's scale and offset
// (computeVerticalTickMarks).
//
// Horizontal position and zoom belong to the display range that the controller decides: the
// view asks the controller for a range, reads back what was applied, and copies it into the
// view volume. Vertical position and zoom belong to the view.
//
// Toolkit-neutral: the view's size, backing scale, redraw requests and cursor come from an
// RWViewHost; delayed calls and the clock from the RWServices of platform/ui (injectable).
// Screen coordinates are drawable pixels, origin at the bottom left, y up.
//
// Lifetime: the controller, the view host, the clock and the timer are not owned; each must
// outlive the view or be detached (set to null) first. The view owns its three selection
// lists, its render controller, its image assets and the primitives of one frame.
//
// Drawing. A host that wants a frame calls displayLayer with an encoder of its own (a painter
// on a widget, a recorder in tests). The view builds the frame's primitives and has each
// encode itself; the same primitives answer the hit tests until the next frame. Frames are
// at most 30 a second: a request inside that gap returns without drawing and schedules one
// delayed redraw, so the host should keep showing its last frame when displayLayer answers
// false.

#include <cstdint>
#include <limits>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "platform/draw/HXDHitTest.h"
#include "platform/draw/HXDPrimitives.h"
#include "platform/geometry/CGGeometry.h"
#include "platform/media/CMTime.h"
#include "platform/support/BNString.h"
#include "platform/ui/RWAction.h"
#include "platform/ui/RWEvent.h"
#include "platform/ui/RWMenu.h"
#include "platform/ui/RWServices.h"
#include "platform/ui/RWTrackingArea.h"
#include "src/contract/TQNotificationWords.h"
#include "src/data/TQCurveSelection.h"
#include "src/engine/TQCurveEditorCodes.h"
#include "src/engine/TQEditBrackets.h"
#include "src/resources/GDColor.h"

class TQCurveEditorCtrlBase;
class TQCurveEditorItem;
class TQCurveEditorChannelItem;

// One image of the keypoint or tangent tables: the texture (shared, immutable) and the
// image's size in points. An image the resources lack leaves a null texture and a zero size.
struct KeyframeAsset {
    std::shared_ptr<const HXDPixelTexture> texture;
    CGSize size = CGSizeZero;
};

// The frame's keypoint quads by the item's channelId (what a rubber band tests).
using TQKeypointPrimitives = std::map<uint32_t, HXDPrimitiveArray>;

// The axis to which a Shift drag of keypoints is held.
enum class TQConstrainDirection : uint32_t {
    kUndecided = 0,
    kHorizontal = 1,  // time follows the pointer, the value stays
    kVertical = 2,    // the value follows the pointer, the time stays
};

// Parts of the box tool's box: the hit ids of what the box draws, and what a gesture holds.
// Hit ids of a pick are compared as raw words, so these are plain constants.
enum TQBoxPart : uint32_t {
    kTQBoxPartNone = 0,
    kTQBoxPartBottomLeft = 1,
    kTQBoxPartBottomRight = 2,
    kTQBoxPartTopRight = 3,
    kTQBoxPartTopLeft = 4,
    kTQBoxPartTopMiddle = 5,
    kTQBoxPartBottomMiddle = 6,
    kTQBoxPartLeftMiddle = 7,
    kTQBoxPartRightMiddle = 8,
    kTQBoxPartInside = 9,
};

class TQCurveEditorViewBase : public RWTrackingAreaOwner, public RWActionTarget {
public:
    // Minimum time between two frames, in seconds, and the delay of the one redraw that a
    // request inside that gap schedules, in nanoseconds.
    static constexpr double kFrameInterval = 0.03333333333333333;
    static constexpr uint64_t kDelayedDisplayNanoseconds = 33333333;

    // Zero volumes; a subclass's constructor sets them.
    TQCurveEditorViewBase();
    ~TQCurveEditorViewBase() override;
    TQCurveEditorViewBase(const TQCurveEditorViewBase&) = delete;
    TQCurveEditorViewBase& operator=(const TQCurveEditorViewBase&) = delete;

    // ---- Wiring ----

    TQCurveEditorCtrlBase* getController() const { return _controller; }
    // A drag's open undo step belongs to the old controller: it is closed first.
    void setController(TQCurveEditorCtrlBase* controller);
    RWViewHost* viewHost() const { return _viewHost; }
    // Also takes the host's backing (viewDidChangeBackingProperties).
    void setViewHost(RWViewHost* host);
    // Null restores the process-wide service.
    void setClock(RWClock* clock) { _clock = clock; }
    void setTimer(RWTimerService* timer) { _timer = timer; }
    RWClock& clock() const;
    RWTimerService& timer() const;

    // ---- Size and backing ----

    // Bounds of the view in points (zero without a host).
    CGRect bounds() const;
    // Width of the view in points: the sample count of new items follows it.
    double width() const { return bounds().size.width; }
    // The host resized the view: the backing follows, the view volume stays (resizing shows
    // the same world rectangle).
    virtual void setFrameSize(const CGSize& size);
    // Takes the drawable size (bounds in backing pixels) and scale from the host, if the view
    // is in a window.
    virtual void viewDidChangeBackingProperties();
    CGSize drawableSize() const { return _drawableSize; }
    double contentsScale() const { return _contentsScale; }

    // ---- Projection of the last frame ----

    // Installs the orthographic projection of _currentViewVolume on the render controller,
    // with the pixel scale (volume extent over bounds extent). Done at every frame.
    virtual void drawProjection();
    HXDRenderController* renderController() const { return _renderController.get(); }

    // ---- Mapping (through the projection of the last frame; NaN before the first) ----

    CGPoint getPointWorld(const CGPoint& screen) const;
    CGPoint getPointScreen(const CGPoint& world) const;
    CGPoint getSizeWorld(const CGPoint& size) const;
    CGPoint getSizeScreen(const CGPoint& size) const;
    // The world point moved onto the nearest whole drawable pixel.
    CGPoint adjustWorldPointToScreen(const CGPoint& world) const;
    CGPoint getOffsetFromLastWorld(double dx, double deltaY) const;
    CGPoint getOffsetFromOriginWorld(double dx, double deltaY) const;
    CGPoint getMouseOrigin() const { return _mouseOrigin; }
    // Starts a gesture at a drawable pixel: both the origin and the running position.
    void setMouseOrigin(const CGPoint& screen) {
        _mouseOrigin = screen;
        _lastMousePos = screen;
    }
    CGPoint getLastMousePos() const { return _lastMousePos; }
    // Advances the running position of the gesture.
    void updateDrag(double dx, double y) { _lastMousePos = _lastMousePos + CGPointMake(dx, y); }

    // ---- View volume and zoom ----

    // Drag zoom about _mouseOrigin by a pointer movement in pixels.
    virtual void zoom(double dx, double y);
    // Absolute zoom about the centre; a factor of exactly 1 leaves that axis alone.
    virtual void zoomWithFactor(double fx, double y);
    // From the vertical scroller: p = 0 is the top of the controller's maximum view volume.
    virtual void setVerticalZoom(double zoom, double offsetPercentage);
    // Pan by a pointer movement in pixels; never to the left of time zero.
    virtual void pan(double dx, double y);
    // Page pan from a scroller, in fractions of the view.
    virtual void panWithPage(double px, double y);
    // Fit every curve vertically, and in time as well with includeTime.
    virtual void frameAll(char includeTime);
    // Fit vertically to the curves if due (_needsAutoZoom) or forced.
    virtual void performAutoZoom(bool force);
    virtual double getZoomPadding() const { return 0.05; }
    virtual void resetZoom();
    virtual void resetPan();
    virtual void resetZoomX();
    virtual void resetZoomY();
    virtual void resetPanX();
    virtual void resetPanY();
    // Pans by the wheel, folding in every wheel event already queued.
    virtual void scrollWheel(const RWEvent& event);
    // Auto-zoom and auto-pan exclude each other when set through this.
    void setAutoZoom(char autoZoom) {
        _autoZoom = autoZoom;
        _autoPan = autoZoom ? 0 : 1;
    }
    void setAutoPan(char autoPan) { _autoPan = autoPan; }
    void setNeedsAutoZoom(char needs) { _needsAutoZoom = needs; }
    char needsAutoZoom() const { return _needsAutoZoom; }

    // ---- Plain accessors ----

    const CGRect& getCurrentViewVolume() const { return _currentViewVolume; }
    const CGRect& getOriginalViewVolume() const { return _originalViewVolume; }
    const CGRect& getSelectionViewVolume() const { return _selectionViewVolume; }
    // Used by subclasses at creation and by the timeline as the initial time changes; no
    // notification is sent.
    void setCurrentViewVolume(const CGRect& volume) { _currentViewVolume = volume; }
    void setOriginalViewVolume(const CGRect& volume) { _originalViewVolume = volume; }
    double zoomX() const { return _zoomFactorX; }
    double zoomY() const { return _zoomFactorY; }
    double maxZoomY() const { return _maxZoomY; }
    double gridZoomX() const { return _gridZoomX; }
    double gridZoomY() const { return _gridZoomY; }
    double gridSpacingX() const { return _gridSpacingX; }
    double gridSpacingY() const { return _gridSpacingY; }
    void setGridSpacingX(double spacing) { _gridSpacingX = spacing; }
    void setGridSpacingY(double spacing) { _gridSpacingY = spacing; }
    double gridScaleY() const { return _gridScaleY; }
    double gridOffsetY() const { return _gridOffsetY; }
    double minDeltaU() const { return _minDeltaU; }
    char printScale() const { return _printScale; }
    char autoZoom() const { return _autoZoom; }
    char autoPan() const { return _autoPan; }
    char canPanHorizontally() const { return _canPanHorizontally; }
    char canPanVertically() const { return _canPanVertically; }
    void setCanPanHorizontally(char can) { _canPanHorizontally = can; }
    void setCanPanVertically(char can) { _canPanVertically = can; }
    char hasFixedScale() const { return _hasFixedScale; }
    void setHasFixedScale(char fixed) { _hasFixedScale = fixed; }
    CMTimeRange getTotalRange() const { return _totalRange; }
    CMTimeRange getDisplayRange() const { return _displayRange; }
    // Null pointers leave that part as it is.
    virtual void setDisplayRange(const CMTime* start, const CMTime* duration);
    void setTotalRange(const CMTime* start, const CMTime* duration);
    // The host's playhead through the controller's delegate; zero without one.
    CMTime currentTime() const;
    CMTime getCurveEditorCurrentTime() const { return currentTime(); }
    void setCurrentTime(const CMTime& time);

    // ---- Picking and rubber-band selection (TQCurveEditorViewPick.cpp) ----
    //
    // Hit tests run on the primitives of the last frame drawn, so they answer for what the
    // user sees even when a channel changed since. Before the first frame nothing is hit.

    // One-point test at a drawable pixel: the closest thing under it becomes the only entry
    // of _currentSelection (or, for the box tool, _currentActivePart). A miss leaves both
    // as they were.
    virtual void pick(const CGPoint& screen);
    // Rectangle test of _selectionViewVolume against keypoint images only; fills
    // _currentSelection, or leaves it as it was when nothing is inside.
    virtual void select();
    // Turns hit records into entries of _currentSelection (emptied first). With
    // keyframesOnly, only keypoint records count. Records whose "ID" names no item of the
    // selected curve set are skipped.
    virtual void processHits(const std::vector<HXDHitRecord>& hits, char keyframesOnly);
    // Rebuilds _selection from a saved list by keyframe time (handles do not survive a
    // rebuild of a channel); entries whose time is gone are dropped, the others keep order.
    void validateSelectedHandles(TQCurveSelectionList* list);
    // The controller's selected channels, without repeats, in order.
    std::vector<TQChannelBase*> channelsForSelection() const;
    // Every keypoint of every enabled item (locked ones included), as keypoint entries.
    virtual void selectAll(void* sender = nullptr);
    virtual void selectNone(void* sender = nullptr);
    uint32_t getActivePart() const { return _activePart; }
    uint32_t getCurrentActivePart() const { return _currentActivePart; }

    // ---- Mouse, keys and the edit tool (TQCurveEditorViewMouse.cpp) ----
    //
    // Events carry the desktop toolkit's semantics (RWEvent.h): locationInWindow in window
    // points with y up, the modifier bits (Command 0x100000, Option 0x80000, Shift 0x20000,
    // Control 0x40000) and click counts. One gesture is mouseDown, any number of
    // mouseDragged, mouseUp; a drag that changes channels is one undo step of the host,
    // named after what its first step did. Drag steps are limited to one per 1/30 s of the
    // view's clock; a dropped event loses no movement, since the next step measures from
    // the last one that ran.

    virtual void mouseDown(const RWEvent& event);
    virtual void mouseDragged(const RWEvent& event);
    virtual void mouseUp(const RWEvent& event);
    // The edit tool (tool 0).
    virtual void mouseDownEdit(const RWEvent& event);
    virtual void mouseDraggedEdit(const RWEvent& event);
    // The sketch tool (1, TQCurveEditorViewSketch.cpp): the press puts a keypoint at the
    // pointer on every enabled sketched channel, and opens the stroke's one undo step (closed
    // at the release). Each drag step erases, on the first enabled sketched channel, the
    // keypoints that the pointer passed over since the last step, then puts a keypoint at the
    // pointer on each of them. No smoothing: the 1/30 s gate of drag steps alone sets the
    // density of the keypoints. Shift holds the stroke to one axis.
    virtual void mouseDownSketch(const RWEvent& event);
    virtual void mouseDraggedSketch(const RWEvent& event);
    // The box tool (2, TQCurveEditorViewBox.cpp): a press on a part of the box starts its
    // drag; anywhere else it forgets the box and starts a rubber band, whose release puts a
    // box around the keypoints it caught (two at least).
    virtual void mouseDownBox(const RWEvent& event);
    // One step: the band, or the part's drag, which moves the corners (Command: a corner
    // alone; Shift: keeping the aspect; Option: about the centre, or mirrored on the opposite
    // side) and deforms the frozen keypoints to the new box. A drag is one undo step.
    virtual void mouseDraggedBox(const RWEvent& event);
    // The space bar: a repeated space key arms the space-bar navigation of a drag on empty
    // space. Answers false when the key is not the view's (the caller passes it on).
    virtual bool keyDown(const RWEvent& event);
    // Ends the space-bar mode (answers true then); also forgets that a drag has not yet
    // stepped, so that a key released before the first step suppresses that drag's capture.
    virtual bool keyUp(const RWEvent& event);
    // A key equivalent before the menus see it: a space key-down arms the space bar at once.
    virtual bool customKeyEquivalent(const RWEvent& event);
    char space() const { return _space; }
    // The view takes and gives up the keyboard focus (the host tells it); both answer true.
    virtual bool becomeFirstResponder() {
        _isInCurveEditor = 1;
        return true;
    }
    virtual bool resignFirstResponder() {
        _isInCurveEditor = 0;
        return true;
    }
    // Whether the view has the keyboard focus.
    char isInCurveEditor() const { return _isInCurveEditor; }
    void setIsInCurveEditor(char inEditor) { _isInCurveEditor = inEditor; }
    virtual bool acceptsFirstResponder() const { return true; }
    // A click that activates the window also acts in the view; the pointer's shape is brought
    // up to date first (mouseMoved).
    virtual bool acceptsFirstMouse(const RWEvent& event);
    // The pointer moved with no button down: nothing here (cursorUpdate chooses the shape).
    virtual void mouseMoved(const RWEvent&) {}

    // ---- Keys, nudges, deletion, cursors, the context menu (TQCurveEditorViewKeys.cpp) ----
    //
    // The view offers actions; which keys send them is the host's key map. Each nudge and
    // each deletion is one undo step of its own.

    // The selection by one step: up and down by one drawable pixel of value (so the step
    // follows the zoom), left and right by one frame of the host (no time without a host).
    void nudgeUp(void* sender = nullptr);
    void nudgeDown(void* sender = nullptr);
    void nudgeLeft(void* sender = nullptr);
    void nudgeRight(void* sender = nullptr);
    // The key of a nudge came up: the host hears that the channels are done changing.
    void nudgeUpFinished(void* sender = nullptr);
    void nudgeDownFinished(void* sender = nullptr);
    void nudgeLeftFinished(void* sender = nullptr);
    void nudgeRightFinished(void* sender = nullptr);
    // The Delete key: the selected keypoints through the controller, and the selection
    // emptied; with the box tool, the box and the selection are forgotten and no keypoint goes.
    void deleteKeypoints(void* sender = nullptr);
    // The menu of a right click: what is under the pointer is selected (keypoints and handles
    // join the selection as a click does, a curve replaces it), the view redraws, and the
    // controller's menu for the kind hit (keypoint, tangent, curve; else the background's)
    // is the answer. The pick stays in the current selection for the menu's actions.
    virtual RWMenuPtr menuForEvent(const RWEvent& event);
    // The pointer's shape for what a click would do: the tool's own for the sketch and box
    // tools; for the edit tool, by what lies under the pointer, unchanged while a button or
    // the space bar is down.
    void cursorUpdate(const RWEvent& event) override;
    void setCursor(RWCursor cursor) const { setCursorShape(cursor); }
    // The area that makes the host report pointer moves over the visible part (cursor updates
    // while the application is active); made again when the view's host or size changes.
    virtual void updateTrackingAreas();
    const RWTrackingAreaPtr& trackingArea() const { return _trackingArea; }
    // Redraws at once where the host can (the next pick tests the new frame).
    void display();
    // The actions above by name ("nudgeUp:", "nudgeUpFinished:", ..., "delete:",
    // "selectAll:", "selectNone:"), as a key map sends them.
    bool performAction(const std::string& action, RWActionSender& sender) override;

    // Horizontal or vertical constraint of a Shift drag: the first call with no direction
    // decides it from p - origin (a tie is vertical) and answers origin; later calls keep
    // origin's y (horizontal) or x (vertical).
    CGPoint constrainMove(const CGPoint& p, const CGPoint& origin);
    TQConstrainDirection constrainMoveDirection() const { return _constrainMove; }
    // Keeps a world x inside [total range start, later of total and display range end].
    CGPoint constrainTime(const CGPoint& p) const;
    // Round trip through the screen: the dragged point is deliberately not moved onto the
    // nearby marker times it looks at.
    CGPoint snapCursorTo(const CGPoint& p) const;

    void setSnapCursor(char snap) { _snapCursor = snap; }
    char snapCursor() const { return _snapCursor; }
    void setLockKeyframesInU(char lock) { _lockInU = lock; }
    char lockKeyframesInU() const { return _lockInU; }
    // A drag's or a key's undo step is open (a drag's from its first step until the release).
    char getCapturing() const { return _capturing.has_value() || _keyCapturing ? 1 : 0; }
    void setShouldDrawProcessedCurve(char draw) { _shouldDrawProcessedCurve = draw; }
    char shouldDrawProcessedCurve() const { return _shouldDrawProcessedCurve; }
    char startDrag() const { return _startDrag; }
    char didAddPoint() const { return _didAddPoint; }
    // Posts kTQNotifyChannelsChanged (a gesture is done).
    void notifyChannelChangeDone() const;

    // ---- Selection (the controller reads and repairs these) ----

    // _selection, after its stored keypoint times and values were refreshed from the
    // channels (prepareSelectedHandles). Never null.
    TQCurveSelectionList* getSelection();
    TQCurveSelectionList* getCurrentSelection() const { return _currentSelection.get(); }
    TQCurveSelectionList* getPreviousSelection() const { return _previousSelection.get(); }
    // Stores each keypoint entry's live time and value (entries without a channel are left).
    void prepareSelectedHandles();

    // ---- Redraw and dirty marks ----

    // Asks the host for a redraw when the flag is set.
    virtual void setNeedsDisplay(char needs);
    // Asks the host to redraw a rectangle of the view (points).
    virtual void setNeedsDisplayInRect(const CGRect& rect);
    void setOriginalCurveDirty(TQCurveEditorItem* item, char enable);
    void setProcessedCurveDirty(TQCurveEditorItem* item, char enable);
    // Every item with a channel that the host reports as modified.
    void setVisibleOriginalCurveDirty(char dirty);
    void setAllOriginalCurveDirty(char dirty);
    // Marks every item for a new vertical mapping at the next tick pass.
    void setAllOriginalCurveScaleDirty(char dirty);

    // ---- Vertical mapping ----

    // Per-item scaleY and offsetY of the items marked updateScale.
    virtual void computeVerticalTickMarks();
    virtual uint32_t numberOfTickMarks() const { return 10; }

    // ---- Frame (drawing pipeline) ----

    // Draws one frame through the encoder: the 1/30 s gate, then the background primitives,
    // the projection, drawCurveEditor, and every primitive encoded in order. Answers true
    // when a frame was encoded; false when the gate held it back (one delayed redraw is then
    // pending) or when the encoder had no drawable (a null encoder is a host without one).
    virtual bool displayLayer(HXDEncoder* encoder);
    // One-time set-up at the first frame: render controller, assets, primitive lists.
    virtual void setupMetalRender();
    char metalRenderReady() const { return _metalRenderReady; }
    void setMetalRenderReady(char ready) { _metalRenderReady = ready; }
    // Loads the keypoint and tangent images at the present backing scale.
    virtual void loadAssets();
    // One image of the resources at the present backing scale.
    KeyframeAsset keyframeAssetWithImageName(const BNString& name) const;
    // [colorIndex 0..7][state 0 normal, 1 pressed, 2 inactive, 3 disabled][selected 0/1];
    // out-of-range indices answer an empty asset.
    const KeyframeAsset& keyframeAsset(uint32_t colorIndex, uint32_t state,
                                       uint32_t selected) const;
    const KeyframeAsset& tangentAsset() const { return _tangentAsset; }

    // Steps of a frame, in the order displayLayer runs them. drawBackground, drawGrid and
    // drawCurveUnits are empty here: subclasses fill them.
    virtual void drawBackground() {}
    // Builds the frame's primitives: auto-zoom, tick marks, grid, the curves (the primary
    // channel last, on top), overlays, units.
    virtual void drawCurveEditor();
    virtual void drawGrid() {}
    virtual void drawCurveUnits() {}
    // The rubber band while selecting; the box of the box tool.
    virtual void drawOverlays(const CGRect& bounds);
    virtual void drawSelectionRect();
    // The box tool's outline, its eight handles (hit ids 1 to 8) and its inside (hit id 9,
    // pickable, not drawn).
    virtual void drawFourCornerBox();

    // The frame's lists. Primitives live until the next frame starts; the hit test runs on
    // _selectionPrimitives and _keypointsPrimitives.
    const HXDPrimitiveArray& primitives() const { return _primitives; }
    const HXDPrimitiveArray& backgroundPrimitives() const { return _backgroundPrimitives; }
    const HXDPrimitiveArray& selectionPrimitives() const { return _selectionPrimitives; }
    const TQKeypointPrimitives& keypointsPrimitives() const { return _keypointsPrimitives; }
    // Non-null only while a frame is encoded.
    HXDEncoder* encoder() const { return _encoder; }
    HXDTexture* currentTexture() const { return _currentTexture; }

    // ---- Colours and text ----

    GDColor gridColor() const;
    GDColor endpointsColor() const;
    GDColor textColor() const;
    GDColor selectionColor() const;
    GDColor backgroundColor() const;
    GDColor lockedColor() const;
    // curveColor0..curveColor7; none above 7.
    std::optional<GDColor> curveColor(uint32_t index) const;
    // From a table built once per process. An index above 7 wraps (index & 7), as the colour
    // counter of new items does, instead of reading past the table.
    static GDColor getColorForIndex(uint32_t index);
    // A named colour (straight alpha) as primitives take it: premultiplied.
    static HXDColor drawingColor(const GDColor& color);
    const HXDTextAttributes& textAttribs() const { return _textAttribs; }
    // The system font at 8 points in curveEditorTextColor0.
    static HXDTextAttributes defaultTextAttributes();

    // Text of a value label: decibels ("%.f") for an amplitude channel, "%4.2f" otherwise;
    // none when the item has no channel.
    std::optional<BNString> getScale(const TQCurveEditorItem* item, double value) const;
    // Text of a keypoint label from the localised time and coordinates formats; time is on
    // the editor's axis.
    virtual BNString getCoordinates(const TQCurveEditorItem* item, const CMTime& time,
                                    double value) const;
    // Places a text at a world point, nudged by _minDeltaU pixels' worth of zoom and snapped
    // to a whole drawable pixel (metalPrint:atPos:).
    void metalPrint(const BNString& text, const CGPoint& worldPosition);

    // ---- Curves, keypoints and tangents of one item ----

    // Drawable pixels per point of the window: the host's, or the last known without one.
    double windowBackingScale() const;
    // getSizeWorld of a size in drawable pixels, through the projection of the last frame
    // (which is affine, so the world size of one pixel, taken once per frame, scales).
    CGPoint worldSizeOfPixels(double width, double height) const;
    // Width of thin lines in points: 1 on a backing scale of 1, 0.5 above (one pixel).
    float thinLineWidth() const;
    // The curve as three multilines (dimmed before the first and after the last keypoint),
    // and the ghost of a selected item during a gesture.
    virtual void drawOriginalCurve(TQCurveEditorItem* item);
    // The curve after behaviours, translucent, not pickable.
    virtual void drawProcessedCurve(TQCurveEditorItem* item);
    // Every keypoint's image, and the handles of selected, enabled, unlocked keypoints.
    virtual void drawPoints(TQCurveEditorItem* item, char drawTangents);
    // One keypoint image (slot chosen from the six assets by its state), its value label for
    // the primary selected keypoint; rasterSize receives the image's size in world units.
    virtual void drawKeypoint(TQKeyframeHandle handle, const CMTime* u, double v, bool selected,
                              bool enabled, bool locked, TQCurveEditorItem* item,
                              const KeyframeAsset assets[6], CGPoint* rasterSize);
    // Turns a relative tangent (seconds, channel units) into absolute world coordinates, and
    // gives the offset from the keypoint to where the handle line meets the ellipse inscribed
    // in half the keypoint image.
    void calculateDrawTangentU(double* tangentU, double* tangentV, double* deltaU, double* deltaV,
                               const CMTime* u, double v, const CGPoint& rasterSize,
                               const TQCurveEditorItem* item) const;
    // One tangent handle (line and image), unless it lies on its keypoint.
    virtual void drawTangent(TQKeyframeHandle handle, double tangentU, double tangentV,
                             const CMTime* u, double v, uint32_t whichTangent,
                             TQCurveEditorItem* item, const CGPoint& rasterSize);
    // Three pixels in world units, as the last drawPoints set it.
    CGPoint pointSize() const { return _pointSize; }

    // ---- Gesture flags that drawing reads (the mouse code sets them) ----

    char printText() const { return _printText; }
    void setPrintText(char print) { _printText = print; }
    char mouseIsDown() const { return _mouseIsDown; }
    void setMouseIsDown(char down) { _mouseIsDown = down; }
    char selecting() const { return _selecting; }
    void setSelecting(char selecting) { _selecting = selecting; }
    void setSelectionViewVolume(const CGRect& volume) { _selectionViewVolume = volume; }

    // ---- Tools ----

    // Forgets the box, redraws, posts kTQNotifyToolChangedWord.
    virtual void currentToolChanged();
    // Forgets the box: its corners, the flag, the rubber band.
    virtual void resetBoxDeformation();
    char fourCornerBoxInitialized() const { return _fourCornerBoxInitialized; }

    // ---- The box of the box tool (TQCurveEditorViewBox.cpp) ----
    //
    // Four corners in world coordinates. Made at the release of a rubber band of any tool
    // around the keypoints it caught (the controller's setupDeformSelected); shown and
    // dragged with the box tool only.

    // The bounding rectangle of the four corners: its size and centre; any pointer may be
    // null, and a null corner does not count.
    static void getBoxLimits(const CGPoint* boxTopLeft, const CGPoint* boxTopRight,
                             const CGPoint* boxBottomLeft, const CGPoint* boxBottomRight,
                             double* pWidth, double* pHeight, double* pCenterX, double* pCenterY);
    // Origin the bottom-left corner; width top-right minus top-left in x, height top-right
    // minus bottom-right in y. Exact for a box that is still a rectangle.
    CGRect getEditBox() const;
    // All four corners to the rectangle's; the box is shown unless the rectangle is zero.
    // For a host's undo of a box edit: the corners the box was made with stay as they were.
    void setEditBox(const CGRect& box);
    CGPoint fourCornersTopLeft() const { return _fourCornersTopLeft; }
    CGPoint fourCornersTopRight() const { return _fourCornersTopRight; }
    CGPoint fourCornersBottomLeft() const { return _fourCornersBottomLeft; }
    CGPoint fourCornersBottomRight() const { return _fourCornersBottomRight; }

protected:
    // Posts through the controller's delegate; nothing without one.
    void postNotification(TQNotificationWord word) const;
    // After a change of the view volume that moves or zooms it.
    void volumeChanged(bool markCurvesDirty);
    // After a reset of one axis of the view volume: the controller is told, every curve is
    // dirty, and with ticksAgain the tick marks are computed again first. No word is posted.
    void volumeReset(bool ticksAgain);
    // The display range's start and duration, in seconds, into x and width.
    void takeHorizontalFromDisplayRange();
    // One drag step of the rubber band by a pointer movement in backing pixels (dy up).
    void rubberBandStep(double dx, double dy, uint64_t modifierFlags);
    // The Shift band: _selection becomes _previousSelection with the membership of the
    // keypoints in _currentSelection inverted; joiners go to the front or the back.
    void invertBandMembership(bool joinAtFront);
    // An event's location in drawable pixels of this view (y up), and in backing pixels of
    // the window (the source of drag deltas).
    CGPoint drawablePointOfEvent(const RWEvent& event) const;
    CGPoint backingPointOfEvent(const RWEvent& event) const;
    // The edit tool's drag of the primary entry, by kind; W is the pointer's world point.
    void dragTangentStep(TQCurveSelection& primary, CGPoint world, uint64_t modifierFlags);
    // Answers the point after the Shift axis constraint, the time limits and the snap.
    CGPoint dragKeypointStep(TQCurveSelection& primary, CGPoint world, double dx,
                             uint64_t modifierFlags);
    void dragCurveStep(CGPoint world, uint64_t modifierFlags);
    // Opens the drag's one undo step at its first step (a step after the first, or after a
    // key release, opens nothing).
    void openDragCapture(const char* undoKey);
    // Closes the drag's undo step, if one is open: didModify of the selection, then the end
    // of the capture.
    void closeDragCapture() { _capturing.reset(); }
    // Turns the ghost on for every selected item at a drag's first step (with coarseCurves,
    // an edit drag's, also a lower sample count and no processed curve), and restores them at
    // its end.
    void prepareItemsForDrag(bool coarseCurves);
    void restoreItemsAfterDrag();
    // The box tool's part of mouseUp: the last deformation of a part drag (on the time grid),
    // and the box around what a rubber band caught, with any tool.
    void finishBoxDeformation();
    void makeBoxAroundBand();
    // Steps of a box part's drag: the overrun of the view's edges, the Shift bookkeeping, the
    // corners' moves for each kind of part, by world deltas.
    struct BoxOverrun {
        double vertical = 0.0;
        double horizontal = 0.0;
    };
    BoxOverrun boxOverrun(double sx, double sy);
    void trackBoxShift(bool shiftDown);
    void moveBoxCorner(uint32_t part, double dx, double dy, uint64_t modifierFlags);
    void moveBoxSide(uint32_t part, double dx, double dy, uint64_t modifierFlags);
    void moveBoxInside(const CGPoint& world, double dx, double dy, uint64_t modifierFlags);
    // Whether Shift may keep an aspect: a collapsed box has none.
    bool boxKeepsAspect() const;
    void setCursorShape(RWCursor cursor) const;
    void hideCursorForDrag();
    // A nudge: the selection offset by a time and a value, in one undo step of its own.
    void nudgeBy(CMTime time, double value);
    void nudgeVertically(double pixels);
    // The host's frame, or a zero time without a host.
    CMTime frameDuration() const;
    // One drag step of the sketch tool on one channel item: erases the keypoints passed since
    // _lastTime, then writes a keypoint at (newTime, v).
    void sketchChannelStep(uint32_t channelId, double lastX, double newX, double v);
    // The entry the sketch tool writes through, made at first use.
    const TQCurveSelectionPtr& sketchEntry(uint32_t channelId);

    // ---- Fields of the view volume, in declaration order ----
    TQCurveEditorCtrlBase* _controller = nullptr;  // not owned
    CGRect _currentViewVolume = CGRectZero;
    CGRect _originalViewVolume = CGRectZero;
    CGRect _selectionViewVolume = CGRectZero;
    double _maxZoomX = 32.0;  // set and never read: the horizontal zoom has no limit here
    double _maxZoomY = 128.0;
    double _zoomFactorX = 1.0;
    double _zoomFactorY = 1.0;
    double _gridZoomX = 1.0;
    double _gridZoomY = 1.0;
    double _gridSpacingX = 0.0;
    double _gridSpacingY = 0.0;
    double _gridScaleY = 0.0;
    double _gridOffsetY = 0.0;
    double _minDeltaU = 1.0;
    char _printScale = 0;
    char _canPanVertically = 1;
    char _canPanHorizontally = 1;
    char _autoZoom = 1;
    char _autoPan = 1;
    char _hasFixedScale = 0;
    char _needsAutoZoom = 0;
    CMTimeRange _displayRange = kCMTimeRangeZero;
    CMTimeRange _totalRange = kCMTimeRangeZero;
    CMTime _currentTime = kCMTimeZero;  // kept, not read: currentTime asks the host
    CMTime _lastTime = kCMTimeInvalid;

    // ---- Gesture state (the mouse code sets it) ----
    CGPoint _mouseOrigin;        // where the gesture began, drawable pixels
    CGPoint _lastMousePos;       // running pointer position of the gesture, drawable pixels;
                                 // after a constrained step, where the constrained point lies
    CGPoint _lastPoint;          // last raw pointer position in backing pixels (window), for deltas
    char _space = 0;             // the space bar is held
    char _startDrag = 0;         // no drag step has run yet in this gesture
    char _useOriginalAngle = 0;  // a Shift-constrained tangent drag keeps its stored angle
    char _printText = 0;         // show the value label of the primary keypoint
    TQConstrainDirection _constrainMove = TQConstrainDirection::kUndecided;
    char _shiftWasPressed = 0;  // Shift has been seen during this drag
    char _cursorHidden = 0;     // the drag has hidden the pointer
    // The drag's undo step while it is open: set at the first step that changes anything,
    // reset at the release, or when the gesture is abandoned (a new press without a release,
    // a new controller, the view's end).
    std::optional<TQChangeBracket> _capturing;
    char _keyCapturing = 0;     // a nudge's or a deletion's undo step is open
    char _isInCurveEditor = 0;  // the view has the keyboard focus
    char _mouseIsDown = 0;      // a gesture is under way
    char _snapCursor = 0;
    char _lockInU = 0;                   // keypoints keep their time in a drag unless Shift is down
    char _didAddPoint = 0;               // the mouse down added a keypoint
    char _shouldDrawProcessedCurve = 1;  // restore the processed curve at mouse up
    // Clock time of the last drag step that ran; -infinity lets the first one through.
    double _lastMouseDraggedEvent = -std::numeric_limits<double>::infinity();
    char _selecting = 0;
    uint32_t _activePart = kTQBoxPartNone;         // box part of the gesture
    uint32_t _currentActivePart = kTQBoxPartNone;  // hit id of the last pick of the box tool

    RWTrackingAreaPtr _trackingArea;  // registered with _viewHost while both exist
    // The sketch tool's entry, reused for every channel and step of a stroke.
    TQCurveSelectionPtr _sketchEntry;

    // ---- Selection lists, owned, never null ----
    std::shared_ptr<TQCurveSelectionList> _selection;
    std::shared_ptr<TQCurveSelectionList> _currentSelection;
    std::shared_ptr<TQCurveSelectionList> _previousSelection;

    // ---- Box of the box tool ----
    CGPoint _fourCornersTopLeft;
    CGPoint _fourCornersTopRight;
    CGPoint _fourCornersBottomLeft;
    CGPoint _fourCornersBottomRight;
    // The corners when the box was made: kept for a host, never read here.
    CGPoint _initialFourCornersTopLeft;
    CGPoint _initialFourCornersTopRight;
    CGPoint _initialFourCornersBottomLeft;
    CGPoint _initialFourCornersBottomRight;
    char _fourCornerBoxInitialized = 0;
    // Proportions of each corner within the bounding rectangle, taken when Shift goes down:
    // a Shift drag moves every corner in proportion, so a distorted box scales as a whole.
    double _topLeftXFactor = 1.0;
    double _topLeftYFactor = 1.0;
    double _topRightXFactor = 1.0;
    double _topRightYFactor = 1.0;
    double _bottomLeftXFactor = 1.0;
    double _bottomLeftYFactor = 1.0;
    double _bottomRightXFactor = 1.0;
    double _bottomRightYFactor = 1.0;
    double _boxAspect = 0.0;   // width / height when Shift went down; 0 otherwise
    double _boxCenterX = 0.0;  // centre of the corners' bounding rectangle at this step
    double _boxCenterY = 0.0;

    // ---- Backing and frame ----
    RWViewHost* _viewHost = nullptr;   // not owned
    RWClock* _clock = nullptr;         // not owned; null: the process-wide clock
    RWTimerService* _timer = nullptr;  // not owned; null: the process-wide timer
    CGSize _drawableSize = CGSizeZero;
    double _contentsScale = 1.0;
    std::unique_ptr<HXDRenderController> _renderController;

    // ---- Drawing pipeline, in declaration order ----
    HXDTextAttributes _textAttribs = defaultTextAttributes();
    KeyframeAsset _keyframeAssets[8][4][2];
    KeyframeAsset _tangentAsset;
    double _lastDrawTime = 0.0;               // clock time of the last frame
    char _firedFutureDisplayEvent = 0;        // a delayed redraw is scheduled
    char _metalRenderReady = 0;               // setupMetalRender has run
    HXDTexture* _currentTexture = nullptr;    // the drawable during a frame, not owned
    HXDEncoder* _encoder = nullptr;           // set only during a frame, not owned
    HXDPrimitiveArray _primitives;            // this frame's primitives, in drawing order
    HXDPrimitiveArray _backgroundPrimitives;  // drawn before the projection is set
    TQKeypointPrimitives _keypointsPrimitives;
    HXDPrimitiveArray _selectionPrimitives;  // everything pickable, in drawing order
    CGPoint _pointSize = CGPointZero;
    CGPoint _worldPerPixel = CGPointZero;  // getSizeWorld of one pixel, set with the projection

private:
    friend class HotKeySentry;
    // Scratch of drawOriginalCurve, kept between frames so that the merge of selected
    // keypoints allocates only when it grows.
    std::vector<std::pair<CMTime, double>> _selectedKeyScratch;
    // The selected handles, sorted at the start of each frame for drawPoints' lookups.
    std::vector<TQKeyframeHandle> _selectedHandleScratch;
    // Scratch of select: the records of every channel's keypoints, kept between the steps of
    // a rubber band.
    std::vector<HXDHitRecord> _bandHitScratch;
    // Scratch of invertBandMembership: sorted keys of the selection at mouse down and of the
    // covered keypoints that leave it.
    std::vector<std::pair<uintptr_t, uint64_t>> _bandKeyScratch;
    std::vector<std::pair<uintptr_t, uint64_t>> _bandLeavingScratch;
    std::vector<TQCurveSelectionPtr> _bandJoiningScratch;
    // The frame's primitives handed to the encoder so far: each item's go as soon as it is
    // built, in drawing order.
    size_t _primitivesEncoded = 0;
    void encodeBuiltPrimitives();
    // Keypoint quads kept from frame to frame: a frame of thousands of keypoints refills them
    // and their hit dictionaries instead of allocating each anew. A quad still held elsewhere
    // (by a hit record) is replaced, never changed under its holder.
    std::vector<std::shared_ptr<HXDQuadTexture>> _keypointQuads;
    size_t _keypointQuadsUsed = 0;
    // The keypoint list of the channel drawKeypoint last appended to.
    uint32_t _keypointListChannel = 0;
    HXDPrimitiveArray* _keypointList = nullptr;
    // Empties the keypoint lists for a new frame, keeping their storage.
    void beginKeypointLists();
    // Drops the lists of channels this frame did not draw, and the quads it did not use.
    void endKeypointLists();
    std::shared_ptr<HXDQuadTexture> keypointQuad(const KeyframeAsset& asset,
                                                 const CGRect& destination, uint32_t channelId,
                                                 TQKeyframeHandle handle);
    // Expires with the view, so that a delayed redraw scheduled by a frame never calls a
    // dead view.
    std::shared_ptr<char> _lifeToken = std::make_shared<char>(0);
};
