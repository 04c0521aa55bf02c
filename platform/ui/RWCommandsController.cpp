#include "platform/ui/RWCommandsController.h"

#include <algorithm>

RWCommandsController& RWCommandsController::sharedController() {
    static RWCommandsController controller;
    return controller;
}

void RWCommandsController::addCommand(const std::shared_ptr<RWCommand>& command) {
    if (!command) return;
    std::erase_if(_commands, [&](const std::shared_ptr<RWCommand>& c) {
        return c->character() == command->character() &&
               c->modifierMask() == command->modifierMask();
    });
    _commands.push_back(command);
}

void RWCommandsController::removeCommand(const std::string& name) {
    std::erase_if(_commands,
                  [&](const std::shared_ptr<RWCommand>& c) { return c->name() == name; });
}

std::shared_ptr<RWCommand> RWCommandsController::commandWithCharacter(uint32_t character,
                                                                      uint64_t modifierMask) const {
    for (const std::shared_ptr<RWCommand>& c : _commands)
        if (c->character() == character && c->modifierMask() == modifierMask) return c;
    return nullptr;
}

uint32_t RWCommandsController::firstCharacter(const std::string& text) {
    if (text.empty()) return 0;
    const auto b = [&](size_t i) { return static_cast<uint32_t>(static_cast<uint8_t>(text[i])); };
    const uint32_t lead = b(0);
    size_t length = lead < 0x80           ? 1
                    : (lead >> 5) == 0x6  ? 2
                    : (lead >> 4) == 0xe  ? 3
                    : (lead >> 3) == 0x1e ? 4
                                          : 0;
    if (length == 0 || text.size() < length) return 0;
    if (length == 1) return lead;
    uint32_t code = lead & (0xff >> (length + 1));
    for (size_t i = 1; i < length; ++i) {
        if ((b(i) & 0xc0) != 0x80) return 0;
        code = (code << 6) | (b(i) & 0x3f);
    }
    return code;
}
