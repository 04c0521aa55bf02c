#pragma once
// The "Value" cell of the channel list: a scrubber cell that shows the text the list's
// controller gives it (an empty formatter lets that text through unchanged), and that a folder
// row turns off (setShowCell): an off cell draws nothing and takes no press.

#include <memory>

#include "platform/ui/RWScrubberCell.h"
#include "src/panels/TQFormatters.h"

class TQCurveEditorScrubberCell : public RWScrubberCell {
public:
    explicit TQCurveEditorScrubberCell(const std::string& text = {});

    bool showCell() const { return _showCell; }
    void setShowCell(bool show) { _showCell = show; }

    void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const override;
    bool trackMouse(const RWEvent& event, const CGPoint& point, const CGRect& frame,
                    RWOutlineView& view, bool untilMouseUp) override;
    std::shared_ptr<RWTextFieldCell> copy() const override;

private:
    // Shared by every value cell: it holds no state.
    static const TQEmptyFormatter kEmptyFormatter;

    bool _showCell = true;
};
