#include "qt/TQQtButton.h"

#include <QSignalBlocker>

#include "qt/TQQtImages.h"

TQQtButton::TQQtButton(QWidget* parent) : QPushButton(parent) {
    setAutoDefault(false);
    connect(this, &QPushButton::clicked, this, [this] {
        if (_gate && !_gate()) return;
        if (const std::shared_ptr<RWButton> held = model()) held->userClick();
        syncFromModel();  // a click the model refused shows its state again
    });
}

void TQQtButton::syncFromModel() {
    const QSignalBlocker block(this);
    const RWButton* m = model().get();
    setEnabled(m && m->isEnabled());
    if (!m) return;
    setVisible(!m->isHidden());
    const bool isSwitch = m->buttonType() == RWButtonCell::kSwitchButton;
    setCheckable(isSwitch);
    if (isSwitch) setChecked(m->state() == 1);
    setText(QString::fromStdString(m->title()));
    if (!m->imageName().empty()) {
        const QIcon icon = TQQtIconForResource(m->imageName());
        if (!icon.isNull()) setIcon(icon);
        if (m->title().empty() && icon.isNull()) setText(QStringLiteral("\u21BA"));
    }
}
