#include "qt/TQQtSegmentedControl.h"

#include <QHBoxLayout>
#include <QSignalBlocker>

#include "qt/TQQtImages.h"

TQQtSegmentedControl::TQQtSegmentedControl(QWidget* parent) : QWidget(parent) {
    auto* layout = new QHBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(1);
    syncFromModel();
}

void TQQtSegmentedControl::syncFromModel() {
    const RWSegmentedControl* m = model().get();
    const int count = m ? int(m->segmentCount()) : 0;
    while (int(_buttons.size()) > count) {
        delete _buttons.back();
        _buttons.pop_back();
    }
    while (int(_buttons.size()) < count) {
        auto* button = new QToolButton(this);
        const int segment = int(_buttons.size());
        connect(button, &QToolButton::clicked, this, [this, segment] {
            if (const std::shared_ptr<RWSegmentedControl> held = model())
                held->userClickSegment(segment);
            syncFromModel();  // a refused click leaves the buttons as the model has them
        });
        layout()->addWidget(button);
        _buttons.push_back(button);
    }
    setEnabled(m && m->isEnabled());
    if (!m) return;
    setAccessibleName(QString::fromStdString(m->accessibilityLabel()));
    const bool selectOne = m->trackingMode() == RWSegmentSwitchTracking::SelectOne;
    for (int i = 0; i < count; ++i) {
        QToolButton* button = _buttons[size_t(i)];
        const QSignalBlocker blocker(button);
        const std::string imageName = m->imageNameForSegment(i);
        const QIcon icon = imageName.empty() ? QIcon() : TQQtIconForResource(imageName);
        button->setIcon(icon);
        button->setText(QString::fromStdString(m->labelForSegment(i)));
        button->setToolButtonStyle(icon.isNull() ? Qt::ToolButtonTextOnly : Qt::ToolButtonIconOnly);
        const QString description =
            QString::fromStdString(m->accessibilityDescriptionForSegment(i));
        button->setToolTip(description);
        button->setAccessibleDescription(description);
        button->setEnabled(m->isEnabledForSegment(i));
        button->setCheckable(selectOne);
        button->setChecked(selectOne && m->selectedSegment() == i);
        button->setAutoRaise(!m->isBordered());
    }
}
