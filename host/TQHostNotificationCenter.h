#pragma once
// Delivery of notification words to every registered receiver.
//
// A word posted from inside a receiver's notify() is not delivered at once: it waits until
// the word in progress has reached every receiver, so that all receivers see the words in
// one order and a receiver is never re-entered. The outermost post() returns when the queue
// is empty. A receiver may register or unregister itself or another at any time, also from
// inside notify(): an unregistered receiver hears nothing more, a newly registered one hears
// the next word that starts delivery.
//
// Receivers are not owned. A receiver must unregister before it is destroyed.

#include <cstddef>
#include <deque>
#include <vector>

#include "src/contract/TQNotificationWords.h"

class TQHostNotificationCenter {
public:
    TQHostNotificationCenter() = default;
    TQHostNotificationCenter(const TQHostNotificationCenter&) = delete;
    TQHostNotificationCenter& operator=(const TQHostNotificationCenter&) = delete;

    // Registering a receiver twice keeps one registration. Null is ignored.
    void addReceiver(TQNotificationReceiver* receiver);
    // Unknown receivers are ignored.
    void removeReceiver(TQNotificationReceiver* receiver);
    bool hasReceiver(const TQNotificationReceiver* receiver) const;
    size_t receiverCount() const;

    void post(TQNotificationWord word);

    // True while a word is being delivered.
    bool isDelivering() const { return _delivering; }
    // Words delivered since construction; a word counts once however many receivers heard it.
    size_t deliveredWordCount() const { return _deliveredWords; }

private:
    void deliver(TQNotificationWord word);
    void compact();

    // A slot is cleared, not erased, while a delivery walks the list; compact() closes the gaps.
    std::vector<TQNotificationReceiver*> _receivers;
    std::deque<TQNotificationWord> _pending;
    bool _delivering = false;
    bool _hasGaps = false;
    size_t _deliveredWords = 0;
};
