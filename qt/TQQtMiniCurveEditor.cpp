#include "qt/TQQtMiniCurveEditor.h"

#include <QPainter>

#include "qt/TQQtButton.h"
#include "qt/TQQtCurveViewWidget.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtZoomScroller.h"
#include "src/mini/TQMiniCurveEditorInspector.h"

namespace {
// The Y label reads upwards: a label turned by a quarter.
class TurnedLabel final : public QLabel {
public:
    using QLabel::QLabel;

protected:
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        painter.translate(0, height());
        painter.rotate(-90);
        painter.drawText(QRect(0, 0, height(), width()), Qt::AlignCenter, text());
    }
};
}  // namespace

TQQtMiniCurveEditor::TQQtMiniCurveEditor(TQMiniCurveEditor& editor, QWidget* parent)
    : QWidget(parent),
      _editor(editor),
      _inspector(dynamic_cast<TQMiniCurveEditorInspector*>(&editor)) {
    _curveWidget = new TQQtCurveViewWidget(this);
    _curveWidget->setView(&_editor.curveEditorView());
    _axisX = new QLabel(this);
    _axisY = new TurnedLabel(this);
    for (QLabel* label : {_axisX, _axisY}) {
        QFont font = label->font();
        font.setPointSizeF(font.pointSizeF() * 0.85);
        label->setFont(font);
    }
    if (_inspector) {
        _modes = new TQQtSegmentedControl(this);
        _modes->setModel(_inspector->modesModel());
        _autoFit = new TQQtButton(this);
        _autoFit->setModel(_inspector->autoFitModel());
        _vertical = new TQQtZoomScroller(this);
        _vertical->setModel(_inspector->verticalScrollerModel());
        _horizontal = new TQQtZoomScroller(this);
        _horizontal->setModel(_inspector->horizontalScrollerModel());
        // Auto fit moves the view and shows the scrollers: follow it.
        connect(_autoFit, &QPushButton::clicked, this, [this] { sync(); });
    }
    sync();
}

TQQtMiniCurveEditor::~TQQtMiniCurveEditor() { _curveWidget->setView(nullptr); }

QSize TQQtMiniCurveEditor::sizeHint() const {
    const CGRect& m = _editor.masterFrame();
    return QSize(static_cast<int>(m.size.width + 2.0 * m.origin.x),
                 static_cast<int>(m.size.height + 2.0 * m.origin.y));
}

QRect TQQtMiniCurveEditor::qtRect(double x, double y, double w, double h) const {
    const double height = sizeHint().height();
    return QRect(static_cast<int>(x), static_cast<int>(height - y - h), static_cast<int>(w),
                 static_cast<int>(h));
}

void TQQtMiniCurveEditor::sync() {
    setMinimumSize(sizeHint());
    auto place = [this](QWidget* w, const CGRect& r) {
        if (w) w->setGeometry(qtRect(r.origin.x, r.origin.y, r.size.width, r.size.height));
    };
    place(_curveWidget, _editor.curveEditorViewFrame());
    place(_axisX, _editor.axisX().frame());
    // The turned label stands along the view's left edge.
    const CGRect y = _editor.axisY().frame();
    place(_axisY, CGRectMake(y.origin.x - y.size.height, y.origin.y, y.size.height, y.size.width));
    _axisX->setText(QString::fromStdString(_editor.axisX().stringValue()));
    _axisY->setText(QString::fromStdString(_editor.axisY().stringValue()));
    setEnabled(_editor.isEnabled());
    if (!_inspector) return;
    place(_modes, _inspector->modes().frame());
    place(_autoFit, _inspector->autoFitButton().frame());
    place(_vertical, _inspector->verticalZoomScroller().frame());
    place(_horizontal, _inspector->horizontalZoomScrollerControl().frame());
    _vertical->setVisible(!_inspector->verticalZoomScroller().isHidden());
    _horizontal->setVisible(!_inspector->horizontalZoomScrollerControl().isHidden());
    _curveWidget->update();
}
