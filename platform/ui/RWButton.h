#pragma once
// A push or switch button: a title, an image, and a state that a click steps (off to on, on to
// off) before the action is sent.

#include <cstdint>
#include <memory>
#include <string>

#include "platform/ui/RWCell.h"
#include "platform/ui/RWControl.h"

class RWButton : public RWControl {
public:
    RWButton() : _cell(std::make_shared<RWButtonCell>()) {}

    const std::string& title() const { return _cell->title(); }
    void setTitle(const std::string& title);
    const std::string& imageName() const { return _imageName; }
    void setImageName(const std::string& name);
    // RWButtonCell::kSwitchButton for a switch; anything else is a push button, whose state
    // a click leaves alone.
    int64_t buttonType() const { return _buttonType; }
    void setButtonType(int64_t type) { _buttonType = type; }
    int32_t state() const { return _cell->state(); }
    void setState(int32_t state);

    // The user clicked: a switch takes its next state, then the action. Nothing while
    // disabled or hidden.
    void userClick();

private:
    std::shared_ptr<RWButtonCell> _cell;
    std::string _imageName;
    int64_t _buttonType = RWButtonCell::kSwitchButton;
};
