#pragma once
// The button of platform/ui as a QPushButton: its title or image, checkable for a switch, its
// state as the check. A click is the model's userClick. Hidden with the model.

#include <QPushButton>

#include "platform/ui/RWButton.h"
#include "qt/TQQtControlBinding.h"

class TQQtButton final : public QPushButton, public TQQtControlBinding<RWButton> {
public:
    explicit TQQtButton(QWidget* parent = nullptr);

protected:
    void syncFromModel() override;
};
