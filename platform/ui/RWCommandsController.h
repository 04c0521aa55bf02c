#pragma once
// The application's key commands: a key (its character) with modifiers bound to something the
// application does. Views that would otherwise consume a key ask here first, so that a bound
// command wins (the channel list's arrows and page keys step the playhead when bound).
//
// One process-wide controller, reached through sharedController(); the application binds and
// unbinds its commands. Main thread only.

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

class RWCommand {
public:
    RWCommand(std::string name, uint32_t character, uint64_t modifierMask,
              std::function<bool()> perform)
        : _name(std::move(name)),
          _character(character),
          _modifierMask(modifierMask),
          _perform(std::move(perform)) {}

    const std::string& name() const { return _name; }
    uint32_t character() const { return _character; }
    uint64_t modifierMask() const { return _modifierMask; }
    // What the command does; false when it did nothing (the key then goes on to the view).
    bool performCommand() const { return _perform ? _perform() : false; }

private:
    std::string _name;
    uint32_t _character;
    uint64_t _modifierMask;
    std::function<bool()> _perform;
};

class RWCommandsController {
public:
    static RWCommandsController& sharedController();

    // Replaces a command of the same character and modifiers.
    void addCommand(const std::shared_ptr<RWCommand>& command);
    void removeCommand(const std::string& name);
    void removeAllCommands() { _commands.clear(); }
    // The command bound to exactly this character and these device-independent modifiers.
    std::shared_ptr<RWCommand> commandWithCharacter(uint32_t character,
                                                    uint64_t modifierMask) const;

    // The first character of a UTF-8 text as a code point (0 for an empty or broken text).
    static uint32_t firstCharacter(const std::string& text);

private:
    std::vector<std::shared_ptr<RWCommand>> _commands;
};
