#include "qt/TQQtKeyMap.h"

#include <algorithm>

namespace {

// The keypad flag tells where a key is, not what the user meant: arrows carry it on some
// platforms.
Qt::KeyboardModifiers meaningful(Qt::KeyboardModifiers modifiers) {
    return modifiers & ~Qt::KeypadModifier;
}

}  // namespace

TQQtKeyMap TQQtKeyMap::standard() {
    TQQtKeyMap map;
    map.bind(Qt::Key_Up, Qt::NoModifier, "nudgeUp:", "nudgeUpFinished:");
    map.bind(Qt::Key_Down, Qt::NoModifier, "nudgeDown:", "nudgeDownFinished:");
    map.bind(Qt::Key_Left, Qt::NoModifier, "nudgeLeft:", "nudgeLeftFinished:");
    map.bind(Qt::Key_Right, Qt::NoModifier, "nudgeRight:", "nudgeRightFinished:");
    map.bind(Qt::Key_Delete, Qt::NoModifier, "delete:");
    map.bind(Qt::Key_Backspace, Qt::NoModifier, "delete:");
    return map;
}

void TQQtKeyMap::bind(int key, Qt::KeyboardModifiers modifiers, std::string pressAction,
                      std::string releaseAction) {
    unbind(key, modifiers);
    _bindings.push_back(
        {key, meaningful(modifiers), std::move(pressAction), std::move(releaseAction)});
}

void TQQtKeyMap::unbind(int key, Qt::KeyboardModifiers modifiers) {
    const Qt::KeyboardModifiers wanted = meaningful(modifiers);
    std::erase_if(_bindings,
                  [&](const Binding& b) { return b.key == key && b.modifiers == wanted; });
}

const TQQtKeyMap::Binding* TQQtKeyMap::find(const QKeyEvent& event) const {
    const Qt::KeyboardModifiers modifiers = meaningful(event.modifiers());
    const auto it = std::find_if(_bindings.begin(), _bindings.end(), [&](const Binding& b) {
        return b.key == event.key() && b.modifiers == modifiers;
    });
    return it == _bindings.end() ? nullptr : &*it;
}

std::optional<std::string> TQQtKeyMap::actionForPress(const QKeyEvent& event) const {
    const Binding* binding = find(event);
    if (!binding) return std::nullopt;
    return binding->pressAction;
}

std::optional<std::string> TQQtKeyMap::actionForRelease(const QKeyEvent& event) const {
    if (event.isAutoRepeat()) return std::nullopt;
    const Binding* binding = find(event);
    if (!binding || binding->releaseAction.empty()) return std::nullopt;
    return binding->releaseAction;
}
