#include "host/TQHostNotificationCenter.h"

#include <algorithm>

void TQHostNotificationCenter::addReceiver(TQNotificationReceiver* receiver) {
    if (!receiver || hasReceiver(receiver)) return;
    _receivers.push_back(receiver);
}

void TQHostNotificationCenter::removeReceiver(TQNotificationReceiver* receiver) {
    auto it = std::find(_receivers.begin(), _receivers.end(), receiver);
    if (!receiver || it == _receivers.end()) return;
    if (_delivering) {
        // The walk in deliver() holds an index into this list: keep positions stable.
        *it = nullptr;
        _hasGaps = true;
    } else {
        _receivers.erase(it);
    }
}

bool TQHostNotificationCenter::hasReceiver(const TQNotificationReceiver* receiver) const {
    return receiver &&
           std::find(_receivers.begin(), _receivers.end(), receiver) != _receivers.end();
}

size_t TQHostNotificationCenter::receiverCount() const {
    return static_cast<size_t>(
        std::count_if(_receivers.begin(), _receivers.end(), [](auto* r) { return r != nullptr; }));
}

void TQHostNotificationCenter::post(TQNotificationWord word) {
    _pending.push_back(word);
    if (_delivering) return;  // the outer post drains the queue

    // Cleared and compacted on every way out, an unwinding receiver included.
    struct DeliveryScope {
        TQHostNotificationCenter& center;
        explicit DeliveryScope(TQHostNotificationCenter& c) : center(c) {
            center._delivering = true;
        }
        ~DeliveryScope() {
            center._delivering = false;
            center._pending.clear();
            center.compact();
        }
    } scope(*this);

    while (!_pending.empty()) {
        TQNotificationWord next = _pending.front();
        _pending.pop_front();
        deliver(next);
    }
}

void TQHostNotificationCenter::deliver(TQNotificationWord word) {
    ++_deliveredWords;
    // Receivers added during this word sit past `count` and wait for the next word.
    const size_t count = _receivers.size();
    for (size_t i = 0; i < count; ++i) {
        // Re-read the slot at each step: an earlier receiver may have removed this one.
        if (TQNotificationReceiver* receiver = _receivers[i]) receiver->notify(word);
    }
}

void TQHostNotificationCenter::compact() {
    if (!_hasGaps) return;
    std::erase(_receivers, nullptr);
    _hasGaps = false;
}
