#pragma once
// A push or switch button: a title, an image, and a state that a click steps (off to on, on to
// off) before the action is sent; and a key that presses it from anywhere in its window
// (Return for a panel's default button, Escape for its cancelling one).

#include <cstdint>
#include <memory>
#include <string>

#include "platform/ui/RWCell.h"
#include "platform/ui/RWControl.h"

class RWButton : public RWControl {
public:
    // A push button's type (any type but a switch's is one).
    static constexpr int64_t kPushButton = 0;
    // The key equivalents of a panel's two usual buttons.
    static constexpr const char* kReturnKey = "\r";
    static constexpr const char* kEscapeKey = "\x1b";

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
    // Empty: no key presses it.
    const std::string& keyEquivalent() const { return _keyEquivalent; }
    void setKeyEquivalent(const std::string& key);

    // The user clicked: a switch takes its next state, then the action. Nothing while
    // disabled or hidden.
    void userClick();

private:
    std::shared_ptr<RWButtonCell> _cell;
    std::string _imageName;
    std::string _keyEquivalent;
    int64_t _buttonType = RWButtonCell::kSwitchButton;
};
