#pragma once
// The button of platform/ui as a QPushButton: its title or image, checkable for a switch, its
// state as the check. A click is the model's userClick. Hidden with the model. Its key
// equivalent is the window's business (TQQtPanelDialog), so Return never presses whichever
// button had the focus last.
//
// A window that must settle something before a click counts (a text field's edit in progress)
// sets a gate: a click the gate holds back does not reach the model.

#include <QPushButton>

#include <functional>

#include "platform/ui/RWButton.h"
#include "qt/TQQtControlBinding.h"

class TQQtButton final : public QPushButton, public TQQtControlBinding<RWButton> {
public:
    explicit TQQtButton(QWidget* parent = nullptr);

    using Gate = std::function<bool()>;
    void setClickGate(Gate gate) { _gate = std::move(gate); }

protected:
    void syncFromModel() override;

private:
    Gate _gate;
};
