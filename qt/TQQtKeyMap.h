#pragma once
// The keys of a curve view and the actions they send it. The view offers actions by name
// ("nudgeUp:", "delete:"...); which key sends which is the host's choice, made here. A press
// sends its action at each auto-repeat; the key's final release sends its release action
// ("nudgeUpFinished:"), so that the host hears once that the channels are done changing.
//
// The standard map: the arrows nudge (up and down by a pixel of value, left and right by a
// frame), Delete and Backspace delete the selection. A host may bind more keys or unbind
// these.

#include <QKeyEvent>

#include <optional>
#include <string>
#include <vector>

class TQQtKeyMap {
public:
    struct Binding {
        int key;                          // Qt::Key
        Qt::KeyboardModifiers modifiers;  // exactly these (the keypad flag is ignored)
        std::string pressAction;
        std::string releaseAction;  // may be empty
    };

    // An empty map; standard() gives the editor's keys.
    TQQtKeyMap() = default;
    static TQQtKeyMap standard();

    // Replaces a binding of the same key and modifiers.
    void bind(int key, Qt::KeyboardModifiers modifiers, std::string pressAction,
              std::string releaseAction = {});
    void unbind(int key, Qt::KeyboardModifiers modifiers);
    const std::vector<Binding>& bindings() const { return _bindings; }

    // The action a press sends, or none for a key the map does not hold.
    std::optional<std::string> actionForPress(const QKeyEvent& event) const;
    // The action a release sends: none for an auto-repeat's release, or a key without one.
    std::optional<std::string> actionForRelease(const QKeyEvent& event) const;

private:
    const Binding* find(const QKeyEvent& event) const;
    std::vector<Binding> _bindings;
};
