#include "qt/TQQtPanelDialog.h"

#include <QFrame>
#include <QKeyEvent>
#include <QVBoxLayout>

#include <cmath>

#include "platform/ui/RWButton.h"
#include "platform/ui/RWSegmentedControl.h"
#include "platform/ui/RWTableView.h"
#include "platform/ui/RWTextField.h"
#include "qt/TQQtButton.h"
#include "qt/TQQtScreen.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtTableView.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtValueControls.h"
#include "qt/TQQtWindowBinding.h"

namespace {

int whole(double v) { return static_cast<int>(std::lround(v)); }

}  // namespace

TQQtPanelDialog::TQQtPanelDialog(RWWindow& window, QWidget* parent)
    : QDialog(parent, window.styleMask() == 0 ? Qt::Dialog | Qt::FramelessWindowHint : Qt::Dialog),
      _window(window) {
    const std::shared_ptr<RWView>& content = window.contentView();
    const CGSize size = content ? content->frame().size : CGSizeZero;
    setFixedSize(whole(size.width), whole(size.height));
    // A borderless panel draws an edge of its own, so that it stands out from what is below.
    auto* frame = new QFrame(this);
    frame->setFrameStyle(QFrame::Box | QFrame::Plain);
    frame->setGeometry(rect());

    const auto height = size.height;
    if (content) {
        for (const std::shared_ptr<RWControl>& control : content->subviews()) {
            QWidget* widget = nullptr;
            if (auto field = std::dynamic_pointer_cast<RWTextField>(control)) {
                auto* line = new TQQtTextField(this);
                line->setModel(field);
                // A field nobody types in is a label.
                if (!field->isEditable()) {
                    line->setFrame(false);
                    line->setFocusPolicy(Qt::NoFocus);
                }
                widget = line;
            } else if (auto slider = std::dynamic_pointer_cast<RWSlider>(control)) {
                auto* bound = new TQQtSlider(this);
                bound->setModel(slider);
                widget = bound;
            } else if (auto scrubber = std::dynamic_pointer_cast<RWScrubber>(control)) {
                auto* bound = new TQQtScrubber(this);
                bound->setModel(scrubber);
                widget = bound;
            } else if (auto button = std::dynamic_pointer_cast<RWButton>(control)) {
                auto* push = new TQQtButton(this);
                push->setModel(button);
                push->setFocusPolicy(Qt::NoFocus);
                push->setClickGate([this] { return settleTextFields(); });
                widget = push;
            } else if (auto table = std::dynamic_pointer_cast<RWTableView>(control)) {
                auto* view = new TQQtTableView(this);
                view->setTable(table);
                widget = view;
            } else if (auto segments = std::dynamic_pointer_cast<RWSegmentedControl>(control)) {
                auto* row = new TQQtSegmentedControl(this);
                row->setModel(segments);
                row->setFocusPolicy(Qt::NoFocus);
                widget = row;
            }
            if (!widget) continue;
            // Content points have y up; the dialog's have y down.
            const CGRect f = control->frame();
            widget->setGeometry(whole(f.origin.x), whole(height - f.origin.y - f.size.height),
                                whole(f.size.width), whole(f.size.height));
            _widgets.emplace_back(control.get(), widget);
        }
    }
    // Title, visibility and the user's close go through the window.
    new TQQtWindowBinding(window, this);
    placeAtWindowFrame();
}

QWidget* TQQtPanelDialog::widgetOf(const RWControl* control) const {
    for (const auto& [c, widget] : _widgets)
        if (c == control) return widget;
    return nullptr;
}

void TQQtPanelDialog::placeAtWindowFrame() {
    const QRect global = TQQtGlobalRectOfScreenRect(_window.frame());
    move(global.topLeft());
}

void TQQtPanelDialog::setVisible(bool visible) {
    if (visible) placeAtWindowFrame();
    QDialog::setVisible(visible);
    if (!visible) return;
    const std::shared_ptr<RWControl> responder = _window.firstResponder();
    QWidget* widget = widgetOf(responder.get());
    if (!widget) return;
    widget->setFocus(Qt::OtherFocusReason);
    if (auto* line = dynamic_cast<TQQtTextField*>(widget)) {
        const auto field = std::dynamic_pointer_cast<RWTextField>(responder);
        if (field && field->isAllTextSelected())
            line->selectAll();
        else
            line->deselect();
    }
}

bool TQQtPanelDialog::settleTextFields() {
    bool settled = true;
    for (const auto& [control, widget] : _widgets) {
        auto* line = dynamic_cast<TQQtTextField*>(widget);
        if (line && !line->isReadOnly() && line->isEnabled())
            settled = line->commitEditing() && settled;
    }
    return settled;
}

bool TQQtPanelDialog::clickButtonWithKey(const char* key) {
    for (const auto& [control, widget] : _widgets) {
        const auto* button = dynamic_cast<const RWButton*>(control);
        auto* push = dynamic_cast<TQQtButton*>(widget);
        if (button && push && button->keyEquivalent() == key && push->isEnabled()) {
            push->click();
            return true;
        }
    }
    return false;
}

void TQQtPanelDialog::keyPressEvent(QKeyEvent* event) {
    const bool isReturn = event->key() == Qt::Key_Return || event->key() == Qt::Key_Enter;
    if (isReturn && event->modifiers() == Qt::NoModifier) {
        // A text field has had Return already: it ended its edit (and sent its action), or
        // holds text that is no value, which keeps the panel open.
        if (!dynamic_cast<TQQtTextField*>(focusWidget())) clickButtonWithKey(RWButton::kReturnKey);
        event->accept();
        return;
    }
    QDialog::keyPressEvent(event);
}

void TQQtPanelDialog::reject() {
    // Escape and the close button: the cancelling button if there is one, else the window's
    // close. What they leave running is rejected.
    if (!clickButtonWithKey(RWButton::kEscapeKey)) _window.performClose();
    if (isVisible()) QDialog::reject();
}
