#include "platform/channels/TQChannelObjectRootBase.h"

TQChannelObjectRootBase::TQChannelObjectRootBase(const BNString& name, TQChannelId channelId)
    : TQChannelFolder(name, channelId) {}

TQChannelObjectRootBase::TQChannelObjectRootBase(const TQChannelObjectRootBase& source,
                                                 CloneTag tag)
    : TQChannelFolder(source, tag), _currentTime(source._currentTime) {}

CMTime TQChannelObjectRootBase::getRootCurrentTime(bool channelTime) const {
    if (!channelTime) return _currentTime;
    return BN_CMTimeSaferSubtract(_currentTime, timeOffset());
}

TQChannelBase* TQChannelObjectRootBase::cloneChannel() const {
    return new TQChannelObjectRootBase(*this, CloneTag{});
}
