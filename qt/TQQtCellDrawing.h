#pragma once
// Cells of platform/ui drawn with a QPainter: RWCellDrawing on a painter, and an item
// delegate that draws, for each index of a view, the cell a provider gives for it (the
// channel list's name column draws its coloured cells this way).

#include <QPainter>
#include <QPalette>
#include <QStyledItemDelegate>

#include <functional>

#include "platform/ui/RWTextField.h"

class TQQtCellDrawing final : public RWCellDrawing {
public:
    // The painter is not owned; its state is saved and restored around the drawing.
    TQQtCellDrawing(QPainter& painter, const QPalette& palette);
    ~TQQtCellDrawing() override;
    TQQtCellDrawing(const TQQtCellDrawing&) = delete;
    TQQtCellDrawing& operator=(const TQQtCellDrawing&) = delete;

    bool shouldAntialias() const override;
    void setShouldAntialias(bool antialias) override;
    void fillRect(const CGRect& rect, const RWColor& color) override;
    // The line lies inside the rectangle, so that a 1 pixel outline of a 9 pixel square
    // covers exactly the square's edge pixels.
    void strokeRect(const CGRect& rect, const RWColor& color, double lineWidth) override;
    void drawText(const std::string& text, const CGRect& frame, RWTextAlignment alignment,
                  bool enabled) override;
    // The image's file for the painter's device pixel ratio, smoothly scaled into the frame.
    void drawImage(const std::string& resourceName, const CGRect& frame, double opacity) override;

    static QColor qtColor(const RWColor& color);

private:
    QPainter& _painter;
    QPalette _palette;
};

class TQQtCellDelegate final : public QStyledItemDelegate {
public:
    // The cell for an index, or null to let the plain delegate draw it.
    using CellProvider = std::function<RWTextFieldCellPtr(const QModelIndex& index)>;

    TQQtCellDelegate(CellProvider provider, QObject* parent = nullptr)
        : QStyledItemDelegate(parent), _provider(std::move(provider)) {}

    void paint(QPainter* painter, const QStyleOptionViewItem& option,
               const QModelIndex& index) const override;

private:
    CellProvider _provider;
};
