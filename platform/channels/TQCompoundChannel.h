#pragma once
// A folder whose children are the components of one value (the axes of a position, the
// angles of a rotation). While the components are linked (fold flag kTQFoldFlagLinked, or a
// caller's own link state passed as `linked`), a keyframe edit on one component applies to
// every component, so that their keyframes stay at the same times.
//
// Each edit names the component the user touched. With `linked` false only that component is
// changed; with `linked` true every TQChannel child is, in child order. Every component is
// told noteWillChange(true) just before it changes; a component with nothing to change (no
// keyframe at the given time) is left alone and not told. A component that is not a child of
// this compound, or null, makes the edit a no-op.

#include <cstdint>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"

class TQCompoundChannel : public TQChannelFolder {
public:
    TQCompoundChannel(const BNString& name, TQChannelId channelId);

    using TQChannelFolder::operator=;

    bool isCompoundChannel() const override { return true; }
    bool isLinked() const { return testFoldFlag(kTQFoldFlagLinked); }
    void setLinked(bool linked) {
        if (linked)
            setFoldFlag(kTQFoldFlagLinked);
        else
            resetFoldFlag(kTQFoldFlagLinked);
    }

    // The components: the TQChannel children in child order (other children and null slots
    // are passed over).
    std::vector<TQChannel*> getComponents() const;
    size_t numberOfComponents() const;

    // A keyframe at axis time on the component(s), valued from each curve there; a keyframe
    // already at that time is kept as it is.
    virtual void addKeyframe(TQChannel* component, const CMTime& axisTime, bool linked);
    // Moves the keyframe at axis time `from` to axis time `to` on the component(s). Every
    // component gets the same pair of times, so after the move each one's keyframe is found at
    // `to`. `newValue`, when given, becomes the value of the touched component's keyframe
    // only (the others keep theirs); `collided`, when given, tells whether a moved keyframe
    // met another one at `to` (both stay until purgeKeyframes).
    virtual void moveKeyframe(TQChannel* component, const CMTime& from, const CMTime& to,
                              const double* newValue, bool* collided, bool linked);
    // Deletes the keyframe at channel time (no offset) on the component(s).
    virtual void deleteKeyframe(TQChannel* component, const CMTime& channelTime, bool linked);
    // Sets the interpolation of the keyframe `handle` of `component` and, when linked, of the
    // other components' keyframes at the same time. Components with flag
    // kTQChannelFlagNoInterpolationChange are left alone; a stale handle is a no-op.
    virtual void setLinkedInterpolation(TQChannel* component, TQKeyframeHandle handle,
                                        unsigned interpolation, bool linked = true);
    // The channel-wide interpolation of every component (those that take interpolation
    // changes).
    virtual void setLinkedCurveInterpolation(unsigned interpolation);

    TQChannelBase* cloneChannel() const override;
    // A compound is animated when a component is: its own keyframes are its components'.
    bool isAnimated(bool checkChildren = false) const override;

    const TQFactory* getFactory() const override;

protected:
    TQCompoundChannel(const TQCompoundChannel& source, CloneTag tag);

    // Adds a plain component channel (typed compounds build theirs in their constructors).
    template <class Channel, class... Args>
    Channel* addComponent(Args&&... args) {
        return static_cast<Channel*>(
            addChild(std::make_unique<Channel>(std::forward<Args>(args)...)));
    }
    // The component with this id, as a TQChannel; null when gone or of another kind.
    TQChannel* componentWithId(TQChannelId channelId) const;

private:
    // Calls fn on each channel an edit touches: the component alone, or every component when
    // linked; on none when the component is not one of this compound's.
    template <class Fn>
    void forEachTarget(TQChannel* component, bool linked, Fn&& fn) const;
};
