#pragma once
// The name cell of the channel list: the channel's name with a small swatch of its curve's
// colour before it. The swatch sits in the indentation to the left of the cell's own frame
// (12 points left of it, 7 down, 9 by 9, outlined in the border colour, drawn without
// antialiasing so its edges stay crisp); the text is drawn 4 points lower than a plain cell
// draws it, with or without the swatch. Folder rows turn the swatch off (setDisplayBox).

#include <memory>
#include <optional>

#include "platform/ui/RWTextField.h"

class TQColoredTextFieldCell : public RWTextFieldCell {
public:
    // The swatch's place relative to the cell's frame, and the text's drop.
    static constexpr double kSliceWidth = 15.0;
    static constexpr double kSwatchSize = 9.0;
    static constexpr CGPoint kSwatchOffset = {3.0 - 15.0, 6.0 + 1.0};
    static constexpr double kTextDrop = 4.0;

    // initTextCell: no colour, swatch shown.
    explicit TQColoredTextFieldCell(const std::string& text = {}) : RWTextFieldCell(text) {}

    // A cell with an empty text and the same colour; the copy shows its swatch whatever this
    // one does (the flag is not copied).
    std::shared_ptr<RWTextFieldCell> copy() const override;

    const std::optional<RWColor>& fillColor() const { return _color; }
    void setFillColor(const std::optional<RWColor>& color) { _color = color; }
    void setFillColor(float red, float green, float blue, float alpha) {
        _color = RWColor::colorWithCalibratedRed(red, green, blue, alpha);
    }
    bool displayBox() const { return _displayBox; }
    void setDisplayBox(bool display) { _displayBox = display; }

    // Where the swatch of a cell with this frame goes.
    static CGRect swatchRectForFrame(const CGRect& frame);

    void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const override;

private:
    std::optional<RWColor> _color;
    bool _displayBox = true;
};
