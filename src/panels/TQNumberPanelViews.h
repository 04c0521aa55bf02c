#pragma once
// The interface files of the number panels: "TQTimingMoveView" and "TQCurveEditorValueView".
// Each lays out a number field above a Cancel and an OK button; the buttons send cancelNotify:
// and okNotify: to the owner, Return presses OK, Escape Cancel. The field is editable and
// left without target or action for the owner to connect.

#include <memory>
#include <optional>
#include <string>

#include "platform/ui/RWAction.h"
#include "platform/ui/RWTextField.h"
#include "platform/ui/RWWindow.h"

struct TQNumberPanelOutlets {
    std::shared_ptr<RWView> view;
    std::shared_ptr<RWTextField> valueField;
};

// The named interface with its buttons' target set to `owner`; nothing for another name.
std::optional<TQNumberPanelOutlets> TQInstantiateNumberPanelView(const std::string& name,
                                                                 RWActionTarget* owner);
