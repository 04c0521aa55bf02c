#include "platform/channels/TQCompoundChannel.h"

#include <algorithm>

TQCompoundChannel::TQCompoundChannel(const BNString& name, TQChannelId channelId)
    : TQChannelFolder(name, channelId) {}

TQCompoundChannel::TQCompoundChannel(const TQCompoundChannel& source, CloneTag tag)
    : TQChannelFolder(source, tag) {}

TQChannelBase* TQCompoundChannel::cloneChannel() const {
    return new TQCompoundChannel(*this, CloneTag{});
}

std::vector<TQChannel*> TQCompoundChannel::getComponents() const {
    std::vector<TQChannel*> components;
    if (const auto* children = getChildren()) {
        components.reserve(children->size());
        for (TQChannelBase* child : *children) {
            if (auto* channel = dynamic_cast<TQChannel*>(child)) components.push_back(channel);
        }
    }
    return components;
}

size_t TQCompoundChannel::numberOfComponents() const {
    const auto* children = getChildren();
    if (!children) return 0;
    return static_cast<size_t>(std::count_if(children->begin(), children->end(), [](auto* c) {
        return dynamic_cast<const TQChannel*>(c) != nullptr;
    }));
}

TQChannel* TQCompoundChannel::componentWithId(TQChannelId channelId) const {
    return dynamic_cast<TQChannel*>(findChild(channelId));
}

template <class Fn>
void TQCompoundChannel::forEachTarget(TQChannel* component, bool linked, Fn&& fn) const {
    if (!component || component->getParent() != this) return;
    // The compound's own link flag links as surely as the caller's request.
    if (!linked && !isLinked()) {
        fn(*component);
        return;
    }
    // The children are looked up afresh at each step: an edit leaves them alone, but the
    // change observer that noteWillChange reaches belongs to the host and might not.
    for (size_t i = 0; i < numberOfChildren(); ++i) {
        if (auto* channel = dynamic_cast<TQChannel*>(getChild(i))) fn(*channel);
    }
}

namespace {
// The channel time in `target` of what is channel time `time` in `source`. Components
// normally share their offset; when one has its own, the edit still meets the same instant
// on the editor's axis.
CMTime sameInstantIn(const TQChannel& target, const TQChannel& source, const CMTime& time) {
    if (&target == &source) return time;
    const CMTime axis = BN_CMTimeSaferAdd(time, source.timeOffset());
    return target.toChannelTime(&axis);
}
}  // namespace

void TQCompoundChannel::addKeyframe(TQChannel* component, const CMTime& axisTime, bool linked) {
    if (!CMTIME_IS_NUMERIC(axisTime)) return;
    forEachTarget(component, linked, [&](TQChannel& channel) {
        const CMTime channelTime = channel.toChannelTime(&axisTime);
        if (channel.keyframeExistsAtTime(&channelTime)) return;  // kept as it is
        channel.noteWillChange(true);
        channel.addKeyframeAtAxisTime(&axisTime);
    });
}

void TQCompoundChannel::moveKeyframe(TQChannel* component, const CMTime& from, const CMTime& to,
                                     const double* newValue, bool* collided, bool linked) {
    if (collided) *collided = false;
    if (!CMTIME_IS_NUMERIC(from) || !CMTIME_IS_NUMERIC(to)) return;
    forEachTarget(component, linked, [&](TQChannel& channel) {
        const CMTime fromChannel = channel.toChannelTime(&from);
        if (!channel.keyframeExistsAtTime(&fromChannel)) return;
        const CMTime toChannel = channel.toChannelTime(&to);
        if (collided && CMTimeCompare(fromChannel, toChannel) != 0 &&
            channel.keyframeExistsAtTime(&toChannel)) {
            *collided = true;
        }
        channel.noteWillChange(true);
        channel.moveKeyframe(&from, &to, true);
        if (newValue && &channel == component) {
            // A lookup by time answers the keyframe that arrived last: the one just moved.
            channel.setKeyframeValue(channel.getKeyframe(toChannel), *newValue);
        }
    });
}

void TQCompoundChannel::deleteKeyframe(TQChannel* component, const CMTime& channelTime,
                                       bool linked) {
    if (!component || !CMTIME_IS_NUMERIC(channelTime)) return;
    forEachTarget(component, linked, [&](TQChannel& channel) {
        const CMTime time = sameInstantIn(channel, *component, channelTime);
        if (!channel.keyframeExistsAtTime(&time)) return;
        channel.noteWillChange(true);
        channel.deleteKeyframeAtTime(&time);
    });
}

void TQCompoundChannel::setLinkedInterpolation(TQChannel* component, TQKeyframeHandle handle,
                                               unsigned interpolation, bool linked) {
    CMTime time = kCMTimeInvalid;
    if (!component || !component->getKeyframe(handle, &time, nullptr)) return;
    forEachTarget(component, linked, [&](TQChannel& channel) {
        if (channel.testFlag(kTQChannelFlagNoInterpolationChange)) return;
        const TQKeyframeHandle target =
            &channel == component ? handle
                                  : channel.getKeyframe(sameInstantIn(channel, *component, time));
        if (!target) return;
        channel.noteWillChange(true);
        channel.setKeyframeInterpolation(target, interpolation);
    });
}

void TQCompoundChannel::setLinkedCurveInterpolation(unsigned interpolation) {
    for (size_t i = 0; i < numberOfChildren(); ++i) {
        auto* channel = dynamic_cast<TQChannel*>(getChild(i));
        if (!channel || channel->testFlag(kTQChannelFlagNoInterpolationChange)) continue;
        channel->noteWillChange(true);
        channel->setInterpolation(interpolation);
    }
}

bool TQCompoundChannel::isAnimated(bool /*checkChildren*/) const {
    const auto* children = getChildren();
    if (!children) return false;
    return std::any_of(children->begin(), children->end(),
                       [](const TQChannelBase* child) { return child && child->isAnimated(true); });
}
