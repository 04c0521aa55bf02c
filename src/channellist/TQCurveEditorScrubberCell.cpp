#include "src/channellist/TQCurveEditorScrubberCell.h"

const TQEmptyFormatter TQCurveEditorScrubberCell::kEmptyFormatter;

TQCurveEditorScrubberCell::TQCurveEditorScrubberCell(const std::string& text)
    : RWScrubberCell(text) {
    setFormatter(&kEmptyFormatter);
}

void TQCurveEditorScrubberCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    if (_showCell) RWScrubberCell::drawWithFrame(frame, drawing);
}

bool TQCurveEditorScrubberCell::trackMouse(const RWEvent& event, const CGPoint& point,
                                           const CGRect& frame, RWOutlineView& view, bool) {
    if (!_showCell) return false;
    return RWScrubberCell::trackMouse(event, point, frame, view, false);
}

std::shared_ptr<RWTextFieldCell> TQCurveEditorScrubberCell::copy() const {
    auto cell = std::make_shared<TQCurveEditorScrubberCell>();
    copyScrubberSettingsTo(*cell);
    cell->_showCell = _showCell;
    return cell;
}
