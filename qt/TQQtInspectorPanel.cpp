#include "qt/TQQtInspectorPanel.h"

#include <QDial>
#include <QHBoxLayout>
#include <QLabel>
#include <QPainter>
#include <QSignalBlocker>
#include <QToolButton>
#include <QVBoxLayout>

#include <cmath>

#include "platform/inspector/TQChanNumberControllers.h"
#include "platform/inspector/TQInspectorRows.h"
#include "qt/TQQtButton.h"
#include "qt/TQQtMiniCurveEditor.h"
#include "qt/TQQtPainterEncoder.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtValueControls.h"
#include "src/mini/TQMiniCurveEditorStripController.h"
#include "src/parameters/TQMiniCurveEditorGroupController.h"

namespace {

constexpr int kLabelWidth = 90;

// The curve strip in a widget that is its view host.
class StripWidget final : public QWidget, public RWViewHost {
public:
    StripWidget(TQMiniCurveEditorStripView& strip, QWidget* parent)
        : QWidget(parent), _strip(strip) {
        setMinimumSize(100, 18);
        setFixedHeight(22);
        _strip.setViewHost(this);
    }
    ~StripWidget() override { _strip.setViewHost(nullptr); }

    CGRect bounds() const override { return CGRectMake(0, 0, width(), height()); }
    double backingScaleFactor() const override { return devicePixelRatioF(); }
    void setNeedsDisplay() override { update(); }
    void setCursor(RWCursor) override {}
    void setCursorHidden(bool) override {}
    CGPoint convertPointFromWindow(const CGPoint& p) const override { return p; }
    std::optional<RWEvent> nextEventMatchingMask(RWEventMask) override { return std::nullopt; }

protected:
    void resizeEvent(QResizeEvent*) override { _strip.sample(); }
    void paintEvent(QPaintEvent*) override {
        const qreal dpr = devicePixelRatioF();
        _encoder.setDrawableSize(QSize(static_cast<int>(std::ceil(width() * dpr)),
                                       static_cast<int>(std::ceil(height() * dpr))));
        _strip.drawInView(_encoder);
        QPainter painter(this);
        painter.drawImage(rect(), _encoder.image());
    }

private:
    TQMiniCurveEditorStripView& _strip;
    TQQtPainterEncoder _encoder;
};

// A row of widgets side by side without margins.
QWidget* hbox(QWidget* parent, QHBoxLayout** layout) {
    auto* w = new QWidget(parent);
    *layout = new QHBoxLayout(w);
    (*layout)->setContentsMargins(0, 0, 0, 0);
    (*layout)->setSpacing(4);
    return w;
}

}  // namespace

TQQtInspectorPanel::TQQtInspectorPanel(QWidget* parent) : QWidget(parent) {
    _layout = new QVBoxLayout(this);
    _layout->setContentsMargins(6, 6, 6, 6);
}

TQQtInspectorPanel::~TQQtInspectorPanel() = default;

void TQQtInspectorPanel::setRows(const std::vector<TQViewController*>& rows) {
    _bound.clear();
    delete _content;
    _content = new QWidget(this);
    auto* column = new QVBoxLayout(_content);
    column->setContentsMargins(0, 0, 0, 0);
    column->setSpacing(2);
    for (TQViewController* row : rows)
        if (QWidget* w = build(row, {})) column->addWidget(w);
    column->addStretch(1);
    _layout->addWidget(_content);
    sync();
}

void TQQtInspectorPanel::sync() {
    for (const Bound& b : _bound) {
        b.widget->setVisible(!b.row->isHidden());
        if (b.sync) b.sync();
    }
}

QWidget* TQQtInspectorPanel::build(TQViewController* row,
                                   const std::function<void(bool)>& twiddle) {
    if (!row) return nullptr;
    QWidget* widget = nullptr;
    if (auto* editorRow = dynamic_cast<TQChanMiniCurveEditorController*>(row)) {
        auto* editor = new TQQtMiniCurveEditor(*editorRow->getMiniCurveEditor(), _content);
        _bound.push_back({editor, row, [editor] { editor->sync(); }});
        return editor;
    }
    if (auto* group = dynamic_cast<TQViewControllerGroup*>(row)) {
        std::function<void(bool)> open = twiddle;
        if (auto* overRange = dynamic_cast<TQMiniCurveEditorGroupController*>(group))
            open = [this, overRange](bool o) {
                overRange->twiddle(o);
                sync();
            };
        else if (auto* folder = dynamic_cast<TQFolderGroupController*>(group))
            open = [this, folder](bool o) {
                folder->twiddle(o);
                sync();
            };
        widget = new QWidget(_content);
        auto* column = new QVBoxLayout(widget);
        column->setContentsMargins(static_cast<int>(row->indentation()), 0, 0, 0);
        column->setSpacing(2);
        for (const auto& child : group->controllers())
            if (QWidget* w = build(child.get(), open)) column->addWidget(w);
        _bound.push_back({widget, row, {}});
        return widget;
    }
    if (auto* labeled = dynamic_cast<TQLabeledParamController*>(row)) {
        QHBoxLayout* line = nullptr;
        widget = hbox(_content, &line);
        line->setContentsMargins(static_cast<int>(row->indentation()), 0, 0, 0);
        if (auto* folder = dynamic_cast<TQFolderLabelController*>(labeled->label())) {
            auto* arrow = new QToolButton(widget);
            arrow->setCheckable(true);
            arrow->setAutoRaise(true);
            arrow->setArrowType(Qt::RightArrow);
            arrow->setText(QString::fromStdString(folder->labelString()));
            arrow->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
            arrow->setFixedWidth(kLabelWidth);
            connect(arrow, &QToolButton::toggled, arrow, [arrow, twiddle](bool o) {
                arrow->setArrowType(o ? Qt::DownArrow : Qt::RightArrow);
                if (twiddle) twiddle(o);
            });
            line->addWidget(arrow);
        } else if (auto* label = dynamic_cast<TQChanLabelController*>(labeled->label())) {
            auto* text = new QLabel(QString::fromStdString(label->labelString()), widget);
            text->setFixedWidth(kLabelWidth);
            line->addWidget(text);
        }
        if (QWidget* param = buildParam(labeled->param())) line->addWidget(param, 1);
        _bound.push_back({widget, row, {}});
        return widget;
    }
    widget = buildParam(row);
    if (widget) _bound.push_back({widget, row, {}});
    return widget;
}

QWidget* TQQtInspectorPanel::buildParam(TQViewController* row) {
    QHBoxLayout* line = nullptr;
    if (auto* strip = dynamic_cast<TQMiniCurveEditorStripController*>(row)) {
        QWidget* w = hbox(_content, &line);
        auto* image = new StripWidget(strip->stripView(), w);
        auto* reset = new TQQtButton(w);
        reset->setModel(strip->resetButtonModel());
        reset->setFixedWidth(24);
        line->addWidget(image, 1);
        line->addWidget(reset);
        _bound.push_back({image, row, [image, strip] {
                              image->setVisible(!strip->isBorderHidden());
                              strip->update();
                          }});
        return w;
    }
    auto* number = dynamic_cast<TQChanNumberController*>(row);
    if (!number) return nullptr;
    QWidget* w = hbox(_content, &line);
    auto* field = new TQQtTextField(w);
    field->setModel(number->textFieldModel());
    field->setFixedWidth(64);
    line->addWidget(field);
    std::shared_ptr<RWSlider> sliderModel;
    if (auto* d = dynamic_cast<TQChanDoubleController*>(row)) sliderModel = d->sliderModel();
    if (auto* p = dynamic_cast<TQChan2DPropController*>(row)) sliderModel = p->sliderModel();
    if (sliderModel) {
        auto* slider = new TQQtSlider(w);
        slider->setOrientation(Qt::Horizontal);
        slider->setModel(sliderModel);
        connect(slider, &QSlider::sliderPressed, slider,
                [number, sliderModel] { number->startScrubberAction(*sliderModel); });
        connect(slider, &QSlider::sliderReleased, slider,
                [number, sliderModel] { number->endSliderAction(*sliderModel); });
        line->addWidget(slider, 1);
    }
    if (auto* angle = dynamic_cast<TQChanAngleController*>(row)) {
        auto* dial = new QDial(w);
        dial->setRange(0, 360);
        dial->setWrapping(true);
        dial->setFixedSize(28, 28);
        const std::shared_ptr<RWSlider> model = angle->dialModel();
        connect(dial, &QDial::valueChanged, dial,
                [model](int v) { model->userSetDoubleValue(static_cast<double>(v)); });
        connect(dial, &QDial::sliderPressed, dial,
                [angle, model] { angle->startScrubberAction(*model); });
        connect(dial, &QDial::sliderReleased, dial,
                [angle, model] { angle->endScrubberAction(*model); });
        line->addWidget(dial);
        line->addStretch(1);
        _bound.push_back({dial, row, [dial, model] {
                              const QSignalBlocker block(dial);
                              dial->setValue(static_cast<int>(std::lround(model->doubleValue())));
                              dial->setEnabled(model->isEnabled());
                          }});
    }
    if (auto* d = dynamic_cast<TQChanDoubleController*>(row); d && !d->suffix().empty())
        line->addWidget(new QLabel(QString::fromStdString(d->suffix()), w));
    return w;
}
