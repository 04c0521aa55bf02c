#pragma once
// The typed channels. The editor tells them apart by downcast only; each clones as its own
// class and has its own factory (TQFactory.h).
//
//   TQChannelBool           on/off value: discrete, 0 or 1
//   TQChannelCurve          smooth shape parameter: Bezier segments, interpolation fixed
//   TQChannelBlindData      stepped opaque data (indices into a host's table): Constant, fixed
//   TQChannelAngle          angle in radians, read by users in degrees
//   TQChannelDecibel        amplitude (linear gain), read by users in decibels
//   TQChannel2D             compound of X and Y
//   TQChannel2DOverRange    compound of X and Y over a position range 0..1
//   TQChannelScaleOverRange compound of a scale in X and Y over a position range 0..1
//   TQChannelRotation3D     compound of three angles, Euler or quaternion mode
//
// Typed compounds come with their components (ids 1, 2 and 3 for X, Y and Z), linked.

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQCompoundChannel.h"

// Component ids of the typed compounds.
enum : TQChannelId {
    kTQComponentX = 1,
    kTQComponentY = 2,
    kTQComponentZ = 3,
};

class TQChannelBool : public TQChannel {
public:
    TQChannelBool(const BNString& name, TQChannelId channelId, bool defaultValue = false);

    // Values written are snapped: 0.5 and above is on (1), below is off (0), so that a drag in
    // a curve editor flips the value half way.
    static double snap(double value) { return value >= 0.5 ? 1.0 : 0.0; }
    bool getBoolValue(const CMTime& time) const { return getValueAsDouble(time) >= 0.5; }

    TQKeyframeHandle setKeyframe(const CMTime& time, double value,
                                 bool replaceInterpolation = false) override;
    void setKeyframeValue(TQKeyframeHandle handle, double value) override;
    void setInitialValue(double value, bool notify = false) override;
    void setDefaultValue(double value) override;
    void setValue(const CMTime* time, double value) override;
    // The shift of the whole curve or of a segment, then every value snapped: a curve dragged
    // half way up turns on, and nothing is left between off and on (a saved project keeps
    // booleans, so a value between would not come back).
    void setCurveSegmentValue(const CMTime& time, double value, bool notify = false) override;
    void offsetCurve(const CMTime* time, double value) override;

    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;

private:
    void snapAll();
};

// A channel whose interpolation belongs to its class: the interpolation setters do nothing,
// and the channel carries kTQChannelFlagNoInterpolationChange so editors leave it alone.
class TQChannelFixedInterpolation : public TQChannel {
public:
    void setKeyframeInterpolation(TQKeyframeHandle handle, unsigned interpolation) override;
    void setInterpolation(unsigned interpolation) override;

protected:
    TQChannelFixedInterpolation(const BNString& name, TQChannelId channelId, unsigned interpolation,
                                double defaultValue);
};

class TQChannelCurve : public TQChannelFixedInterpolation {
public:
    TQChannelCurve(const BNString& name, TQChannelId channelId, double defaultValue = 0.0);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;
};

class TQChannelBlindData : public TQChannelFixedInterpolation {
public:
    TQChannelBlindData(const BNString& name, TQChannelId channelId);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;
};

class TQChannelAngle : public TQChannel {
public:
    // Default value in radians. The display scale turns radians into degrees.
    TQChannelAngle(const BNString& name, TQChannelId channelId, double defaultRadians = 0.0);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;
};

class TQChannelDecibel : public TQChannel {
public:
    // Default amplitude 1 (0 dB); amplitudes are never negative.
    TQChannelDecibel(const BNString& name, TQChannelId channelId, double defaultAmplitude = 1.0);
    // The channel's value at a time, in decibels.
    double getDecibels(const CMTime& time) const;
    static double decibelsToAmplitude(double decibels);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;
};

// Two plain components, X (id 1) and Y (id 2), named "X" and "Y". The base of the pair
// classes below; they derive from it side by side, so that a downcast to one of them never
// answers for another.
class TQChannelPair : public TQCompoundChannel {
public:
    // Null when the component was removed by the host.
    TQChannel* getXChannel() const { return componentWithId(kTQComponentX); }
    TQChannel* getYChannel() const { return componentWithId(kTQComponentY); }

protected:
    TQChannelPair(const BNString& name, TQChannelId channelId, double defaultX, double defaultY);
    TQChannelPair(const TQChannelPair& source, CloneTag tag) : TQCompoundChannel(source, tag) {}
};

class TQChannel2D : public TQChannelPair {
public:
    TQChannel2D(const BNString& name, TQChannelId channelId, double defaultX = 0.0,
                double defaultY = 0.0);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;

protected:
    TQChannel2D(const TQChannel2D& source, CloneTag tag) : TQChannelPair(source, tag) {}
};

// The span of the position axis of the over-range pairs: a position from 0 to 1, carried as
// 0 to 1 second.
BNTimeRange TQOverRangePositionRange();

// A pair whose X axis is a position over a range (TQOverRangePositionRange) and not time.
class TQChannel2DOverRange : public TQChannelPair {
public:
    TQChannel2DOverRange(const BNString& name, TQChannelId channelId, double defaultX = 0.0,
                         double defaultY = 0.0);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;

protected:
    TQChannel2DOverRange(const TQChannel2DOverRange& source, CloneTag tag)
        : TQChannelPair(source, tag) {}
};

// A scale in X and Y (default 1) over a position range.
class TQChannelScaleOverRange : public TQChannelPair {
public:
    TQChannelScaleOverRange(const BNString& name, TQChannelId channelId);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;

protected:
    TQChannelScaleOverRange(const TQChannelScaleOverRange& source, CloneTag tag)
        : TQChannelPair(source, tag) {}
};

// Three TQChannelAngle components X, Y, Z. In quaternion mode the host blends orientations
// as quaternions, which rules out the Exp and Log interpolations on the angles.
class TQChannelRotation3D : public TQCompoundChannel {
public:
    TQChannelRotation3D(const BNString& name, TQChannelId channelId);
    TQChannelAngle* getAngleChannel(TQChannelId component) const;
    bool isQuaternionMode() const { return _quaternionMode; }
    void setQuaternionMode(bool quaternionMode, bool notify = true);
    TQChannelBase* cloneChannel() const override;
    const TQFactory* getFactory() const override;

protected:
    TQChannelRotation3D(const TQChannelRotation3D& source, CloneTag tag)
        : TQCompoundChannel(source, tag), _quaternionMode(source._quaternionMode) {}
    void assignState(const TQChannelBase& other) override;
    bool equalState(const TQChannelBase& other) const override;

private:
    bool _quaternionMode = false;
};
