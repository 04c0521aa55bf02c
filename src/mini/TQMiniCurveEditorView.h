#pragma once
// The curve view of the mini editor. World x is the position over the range, 0 to 1 (a time of
// 0 to 1 second), shown with a margin of 0.02 on each side; world y is the view's own value
// space, 100 units high about 0. Its grid has a vertical line every tenth of the range and a
// labelled horizontal line every fifth of the height (scaled by the vertical grid zoom); the X
// axis has no labels.
//
// Horizontal zoom and pan go through the controller's display range, which the mini
// controller leaves alone: the range shown stays 0 to 1 unless the inspector's horizontal
// scroller sets a view volume directly.
//
// A disabled view ignores the mouse and the wheel, and offers no menu.

#include "src/view/TQCurveEditorViewBase.h"

class TQMiniCurveEditor;

class TQMiniCurveEditorView : public TQCurveEditorViewBase {
public:
    static constexpr CGRect kInitialViewVolume = {{-0.02, -50.0}, {1.04, 100.0}};
    static constexpr double kRangeMargin = 0.02;

    TQMiniCurveEditorView();

    TQMiniCurveEditor* curveEditor() const { return _curveEditor; }
    // Not owned: the container that holds the view.
    void setCurveEditor(TQMiniCurveEditor* editor) { _curveEditor = editor; }
    bool isHUD() const { return _isHUD; }
    void setIsHUD(bool hud) { _isHUD = hud; }

    // Repairs the controller's view of the selection, forgets the box when nothing is
    // selected, and redraws.
    void update();
    uint32_t numberOfTickMarks() const override { return 4; }
    void setEnabled(bool enabled) { _isEnabled = enabled; }
    bool isEnabled() const { return _isEnabled; }
    // Forgets the box and the selection.
    void reset();

    void mouseDown(const RWEvent& event) override;
    void mouseDragged(const RWEvent& event) override;
    void mouseUp(const RWEvent& event) override;
    void scrollWheel(const RWEvent& event) override;
    // None while disabled: a right click must not select what it lands on either.
    RWMenuPtr menuForEvent(const RWEvent& event) override;

    // Stores the volume; the horizontal zoom follows from the reference width, and every
    // curve is sampled again.
    void setCurrentViewVolume(const CGRect& volume);

    void drawGrid() override;

private:
    // The vertical lines: from 0 both ways, one step at a time, until both runs have left
    // the view (the line at 0 is drawn twice).
    void drawGridColumns(double left, double right, double bottom, double top, HXDColor color);
    void drawGridRows(double left, double right, double bottom, double top, HXDColor color);
    void addGridLine(CGPoint from, CGPoint to, HXDColor color);

    TQMiniCurveEditor* _curveEditor = nullptr;  // not owned
    bool _isHUD = false;
    bool _isEnabled = true;
};
