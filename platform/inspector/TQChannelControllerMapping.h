#pragma once
// The host's table from a channel to the inspector row that shows it. The host registers a
// maker per kind of channel (a test on the channel, most specific first); the first whose test
// passes makes the row. The framework decides nothing here: a host that wants an over-range
// pair shown as a mini editor group registers that.
//
// Without a matching entry, a TQChannel gets a TQChanDoubleController and anything else no row.

#include <functional>
#include <memory>
#include <vector>

#include "platform/inspector/JNBuildContext.h"

class TQChannelBase;
class TQViewController;

class TQChannelControllerMapping {
public:
    using Test = std::function<bool(const TQChannelBase&)>;
    using Maker =
        std::function<std::unique_ptr<TQViewController>(TQChannelBase*, const JNBuildContext&)>;

    // Appended: entries are tried in the order they were registered.
    void registerKind(Test test, Maker maker);
    // A maker for the channels of one class (or its subclasses).
    template <class Channel>
    void registerClass(Maker maker) {
        registerKind(
            [](const TQChannelBase& c) { return dynamic_cast<const Channel*>(&c) != nullptr; },
            std::move(maker));
    }
    std::unique_ptr<TQViewController> controllerForChannel(TQChannelBase* channel,
                                                           const JNBuildContext& context) const;

private:
    struct Entry {
        Test test;
        Maker maker;
    };
    std::vector<Entry> _entries;
};
