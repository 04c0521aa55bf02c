#include "qt/TQQtCellDrawing.h"

#include <QApplication>
#include <QStyle>

#include "qt/TQQtImages.h"
#include "src/resources/BNImage.h"

TQQtCellDrawing::TQQtCellDrawing(QPainter& painter, const QPalette& palette)
    : _painter(painter), _palette(palette) {
    _painter.save();
}

TQQtCellDrawing::~TQQtCellDrawing() { _painter.restore(); }

bool TQQtCellDrawing::shouldAntialias() const {
    return _painter.testRenderHint(QPainter::Antialiasing);
}

void TQQtCellDrawing::setShouldAntialias(bool antialias) {
    _painter.setRenderHint(QPainter::Antialiasing, antialias);
}

QColor TQQtCellDrawing::qtColor(const RWColor& c) {
    return QColor::fromRgbF(c.red, c.green, c.blue, c.alpha);
}

void TQQtCellDrawing::fillRect(const CGRect& r, const RWColor& color) {
    _painter.fillRect(QRectF(r.origin.x, r.origin.y, r.size.width, r.size.height), qtColor(color));
}

void TQQtCellDrawing::strokeRect(const CGRect& r, const RWColor& color, double lineWidth) {
    QPen pen(qtColor(color));
    pen.setWidthF(lineWidth);
    pen.setJoinStyle(Qt::MiterJoin);
    _painter.setPen(pen);
    _painter.setBrush(Qt::NoBrush);
    const double half = lineWidth / 2.0;
    _painter.drawRect(QRectF(r.origin.x + half, r.origin.y + half, r.size.width - lineWidth,
                             r.size.height - lineWidth));
}

void TQQtCellDrawing::drawText(const std::string& text, const CGRect& frame,
                               RWTextAlignment alignment, bool enabled) {
    Qt::Alignment flags = Qt::AlignTop;
    switch (alignment) {
        case RWTextAlignment::Right: flags |= Qt::AlignRight; break;
        case RWTextAlignment::Center: flags |= Qt::AlignHCenter; break;
        case RWTextAlignment::Justified: flags |= Qt::AlignJustify; break;
        case RWTextAlignment::Left:
        case RWTextAlignment::Natural: flags |= Qt::AlignLeft; break;
    }
    _painter.setPen(
        _palette.color(enabled ? QPalette::Active : QPalette::Disabled, QPalette::Text));
    const QRectF rect(frame.origin.x, frame.origin.y, frame.size.width, frame.size.height);
    _painter.drawText(rect, int(flags),
                      _painter.fontMetrics().elidedText(QString::fromStdString(text),
                                                        Qt::ElideRight, int(rect.width())));
}

void TQQtCellDrawing::drawImage(const std::string& resourceName, const CGRect& frame,
                                double opacity) {
    const qreal ratio = _painter.device() ? _painter.device()->devicePixelRatioF() : 1.0;
    const auto image = BNImageForResource(resourceName, ratio);
    if (!image) return;
    _painter.save();
    _painter.setOpacity(_painter.opacity() * opacity);
    _painter.setRenderHint(QPainter::SmoothPixmapTransform, true);
    _painter.drawImage(QRectF(frame.origin.x, frame.origin.y, frame.size.width, frame.size.height),
                       TQQtImage(*image));
    _painter.restore();
}

void TQQtCellDelegate::paint(QPainter* painter, const QStyleOptionViewItem& option,
                             const QModelIndex& index) const {
    const RWTextFieldCellPtr cell = _provider ? _provider(index) : nullptr;
    if (!cell) {
        QStyledItemDelegate::paint(painter, option, index);
        return;
    }
    QStyleOptionViewItem background = option;
    initStyleOption(&background, index);
    background.text.clear();
    background.icon = QIcon();
    const QWidget* widget = option.widget;
    QStyle* style = widget ? widget->style() : QApplication::style();
    style->drawControl(QStyle::CE_ItemViewItem, &background, painter, widget);
    TQQtCellDrawing drawing(*painter, option.palette);
    const QRect r = option.rect;
    cell->drawWithFrame(CGRectMake(r.x(), r.y(), r.width(), r.height()), drawing);
}
