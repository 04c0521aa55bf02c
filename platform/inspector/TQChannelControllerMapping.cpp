#include "platform/inspector/TQChannelControllerMapping.h"

#include "platform/channels/TQChannel.h"
#include "platform/inspector/TQChanNumberControllers.h"

void TQChannelControllerMapping::registerKind(Test test, Maker maker) {
    _entries.push_back({std::move(test), std::move(maker)});
}

std::unique_ptr<TQViewController> TQChannelControllerMapping::controllerForChannel(
    TQChannelBase* channel, const JNBuildContext& context) const {
    if (!channel) return nullptr;
    for (const Entry& e : _entries)
        if (e.test(*channel))
            if (auto row = e.maker(channel, context)) return row;
    if (dynamic_cast<TQChannel*>(channel))
        return std::make_unique<TQChanDoubleController>(channel, context);
    return nullptr;
}
