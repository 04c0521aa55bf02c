#pragma once
// The segmented control of platform/ui as a row of QToolButtons, one per segment: the image
// named by the segment (from the framework's resources) or its label, its accessibility
// description as tool tip and accessible description, enabled with its segment. A control that
// selects one segment shows it checked; a momentary one checks nothing. A click is the model's
// userClickSegment; what the model then holds is shown again, so a click the model refuses
// leaves the buttons as they were.

#include <QToolButton>
#include <QWidget>

#include <vector>

#include "platform/ui/RWSegmentedControl.h"
#include "qt/TQQtControlBinding.h"

class TQQtSegmentedControl final : public QWidget, public TQQtControlBinding<RWSegmentedControl> {
public:
    explicit TQQtSegmentedControl(QWidget* parent = nullptr);

    QToolButton* button(int segment) const {
        return segment >= 0 && segment < int(_buttons.size()) ? _buttons[size_t(segment)] : nullptr;
    }
    int buttonCount() const { return int(_buttons.size()); }

protected:
    void syncFromModel() override;

private:
    std::vector<QToolButton*> _buttons;
};
