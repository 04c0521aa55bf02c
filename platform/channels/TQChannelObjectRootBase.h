#pragma once
// The root of one scene object's channel tree. getChannelRoot of any node below it answers
// the nearest such root, and references made with getRef(true) are relative to it, so that
// the same place under two objects has the same reference. Scene roots above the objects are
// plain folders.

#include "platform/channels/TQChannelFolder.h"

class TQChannelObjectRootBase : public TQChannelFolder {
public:
    TQChannelObjectRootBase(const BNString& name, TQChannelId channelId);

    using TQChannelFolder::operator=;

    // The object's current time as the host last set it, in scene time.
    void setRootCurrentTime(const CMTime& sceneTime) { _currentTime = sceneTime; }
    // With `channelTime`, in the object's channel time (scene time less the object's time
    // offset), which is what keyframe lookups below this root take; otherwise in scene time.
    virtual CMTime getRootCurrentTime(bool channelTime = true) const;

    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;

protected:
    TQChannelObjectRootBase(const TQChannelObjectRootBase& source, CloneTag);

private:
    CMTime _currentTime = kCMTimeZero;
};
