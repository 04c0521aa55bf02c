#include "platform/ui/RWControl.h"

#include <algorithm>

bool RWControl::sendAction() {
    if (!_enabled || !_target || _action.empty()) return false;
    // The target may drop its last reference to this control (a replaced scroller).
    const std::shared_ptr<RWControl> keep = weak_from_this().lock();
    return _target->performAction(_action, *this);
}

void RWControl::setEnabled(bool enabled) {
    if (_enabled == enabled) return;
    _enabled = enabled;
    changed();
}

void RWControl::setHidden(bool hidden) {
    if (_hidden == hidden) return;
    _hidden = hidden;
    changed();
}

void RWControl::setAccessibilityLabel(const std::string& label) {
    if (_accessibilityLabel == label) return;
    _accessibilityLabel = label;
    changed();
}

void RWControl::setFrame(const CGRect& frame) {
    _frame = frame;
    changed();
}

void RWControl::takePlacementAndTargetFrom(const RWControl& other) {
    _target = other._target;
    _action = other._action;
    _tag = other._tag;
    _frame = other._frame;
    _autoresizingMask = other._autoresizingMask;
    _autoresizesSubviews = other._autoresizesSubviews;
    changed();
}

void RWControl::changed() {
    const std::shared_ptr<RWControl> keep = weak_from_this().lock();
    _observers.forEach([&](RWControlObserver& observer) { observer.controlDidChange(*this); });
}

RWControl::NotificationToken RWControl::addNotificationObserver(const std::string& name,
                                                                NotificationBlock block) {
    const NotificationToken token = _nextToken++;
    _notificationObservers.push_back({token, name, std::move(block)});
    return token;
}

void RWControl::removeNotificationObserver(NotificationToken token) {
    std::erase_if(_notificationObservers,
                  [&](const NotificationObserver& o) { return o.token == token; });
}

void RWControl::postNotification(const std::string& name) {
    const std::shared_ptr<RWControl> keep = weak_from_this().lock();
    // By token, looked up again before each call: a block may remove observers.
    std::vector<NotificationToken> tokens;
    for (const NotificationObserver& o : _notificationObservers)
        if (o.name == name) tokens.push_back(o.token);
    for (NotificationToken token : tokens) {
        auto it = std::find_if(_notificationObservers.begin(), _notificationObservers.end(),
                               [&](const NotificationObserver& o) { return o.token == token; });
        if (it == _notificationObservers.end()) continue;
        const NotificationBlock block = it->block;  // the vector may change during the call
        block(*this);
    }
}
