#include "src/panels/TQColoredTextFieldCell.h"

#include "src/resources/GDColor.h"

std::shared_ptr<RWTextFieldCell> TQColoredTextFieldCell::copy() const {
    auto cell = std::make_shared<TQColoredTextFieldCell>(std::string());
    cell->_color = _color;
    return cell;
}

CGRect TQColoredTextFieldCell::swatchRectForFrame(const CGRect& frame) {
    // The slice divided off the frame's left edge is as tall as the frame; the swatch is
    // placed from its origin, which is the frame's.
    return CGRectMake(frame.origin.x + kSwatchOffset.x, frame.origin.y + kSwatchOffset.y,
                      kSwatchSize, kSwatchSize);
}

void TQColoredTextFieldCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    if (_displayBox) {
        // The slice is divided off, and the frame then given back its width: the text is not
        // narrowed by the swatch.
        const CGRect swatch = swatchRectForFrame(frame);
        const bool antialias = drawing.shouldAntialias();
        drawing.setShouldAntialias(false);
        // Without a colour nothing is filled; the outline is drawn all the same.
        if (_color) drawing.fillRect(swatch, *_color);
        const GDColor border = GDColor::curveEditorColoredTextFieldBorderColor();
        drawing.strokeRect(swatch, {border.red, border.green, border.blue, border.alpha}, 1.0);
        drawing.setShouldAntialias(antialias);
    }
    CGRect text = frame;
    text.origin.y += kTextDrop;
    text.size.height -= kTextDrop;
    RWTextFieldCell::drawWithFrame(text, drawing);
}
