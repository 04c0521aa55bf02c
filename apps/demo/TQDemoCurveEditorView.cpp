#include "apps/demo/TQDemoCurveEditorView.h"

namespace {

struct BoxState {
    CGPoint bottomLeft, bottomRight, topRight, topLeft;
    char shown = 0;
};

}  // namespace

void TQDemoCurveEditorView::drawOverlays(const CGRect& bounds) {
    const double scale = windowBackingScale();
    const CGPoint bottom = getPointWorld(bounds.origin);
    const CGPoint top = getPointWorld(CGPointMake(bounds.origin.x + bounds.size.width * scale,
                                                  bounds.origin.y + bounds.size.height * scale));
    const auto x = static_cast<float>(CMTimeGetSeconds(getCurveEditorCurrentTime()));
    _primitives.push_back(HXDLine::lineFromStart(
        {x, static_cast<float>(bottom.y), 0.0f}, {x, static_cast<float>(top.y), 0.0f},
        thinLineWidth() * 2.0f, drawingColor(kPlayheadColor), false));
    TQCurveEditorView::drawOverlays(bounds);
}

void TQDemoCurveEditorView::registerBoxUndo(TQHostAppDelegate& host) {
    host.registerUndoClient(undoObject(), this);
}

void TQDemoCurveEditorView::unregisterBoxUndo(TQHostAppDelegate& host) {
    host.unregisterUndoClient(undoObject());
}

void TQDemoCurveEditorView::forgetBox() {
    resetBoxDeformation();
    getSelection()->reset();
    setNeedsDisplay(1);
    notifyChannelChangeDone();
}

std::any TQDemoCurveEditorView::captureUndoState(uint32_t, uint32_t) {
    return BoxState{_fourCornersBottomLeft, _fourCornersBottomRight, _fourCornersTopRight,
                    _fourCornersTopLeft, _fourCornerBoxInitialized};
}

void TQDemoCurveEditorView::restoreUndoState(uint32_t, uint32_t, const std::any& state) {
    const auto* box = std::any_cast<BoxState>(&state);
    if (!box) return;
    _fourCornersBottomLeft = box->bottomLeft;
    _fourCornersBottomRight = box->bottomRight;
    _fourCornersTopRight = box->topRight;
    _fourCornersTopLeft = box->topLeft;
    _fourCornerBoxInitialized = box->shown;
    setNeedsDisplay(1);
}
