#include "platform/channels/TQChannelTypes.h"

#include <cmath>
#include <numbers>

// ---- TQChannelBool ------------------------------------------------------------------------

TQChannelBool::TQChannelBool(const BNString& name, TQChannelId channelId, bool defaultValue)
    : TQChannel(name, channelId, defaultValue ? 1.0 : 0.0) {
    setDiscrete(true);
    getImpl()->range().setRange(0.0, 1.0);
    TQChannel::setSliderMaximum(1.0);
    TQChannel::setInterpolation(kTQInterpolationConstant);
}

TQKeyframeHandle TQChannelBool::setKeyframe(const CMTime& time, double value,
                                            bool replaceInterpolation) {
    return TQChannel::setKeyframe(time, snap(value), replaceInterpolation);
}

void TQChannelBool::setKeyframeValue(TQKeyframeHandle handle, double value) {
    TQChannel::setKeyframeValue(handle, snap(value));
}

void TQChannelBool::setInitialValue(double value, bool notify) {
    TQChannel::setInitialValue(snap(value), notify);
}

void TQChannelBool::setDefaultValue(double value) { TQChannel::setDefaultValue(snap(value)); }

void TQChannelBool::setValue(const CMTime* time, double value) {
    TQChannel::setValue(time, snap(value));
}

void TQChannelBool::setCurveSegmentValue(const CMTime& time, double value, bool notify) {
    TQChannel::setCurveSegmentValue(time, snap(value), notify);
    snapAll();
}

void TQChannelBool::offsetCurve(const CMTime* time, double value) {
    TQChannel::offsetCurve(time, value);
    snapAll();
}

void TQChannelBool::snapAll() {
    TQChannel::setInitialValue(snap(getInitialValue()));
    for (TQKeyframeHandle handle : getKeyframes(false)) {
        double v = 0.0;
        if (getKeyframe(handle, nullptr, &v)) TQChannel::setKeyframeValue(handle, snap(v));
    }
}

TQChannelBase* TQChannelBool::cloneChannel() const {
    auto* copy = new TQChannelBool(getName(), getChannelId());
    copyConfigurationTo(*copy);
    copy->copyIdentityFrom(*this);
    static_cast<TQChannelBase&>(*copy) = *this;
    return copy;
}

// ---- Fixed interpolation ------------------------------------------------------------------

TQChannelFixedInterpolation::TQChannelFixedInterpolation(const BNString& name,
                                                         TQChannelId channelId,
                                                         unsigned interpolation,
                                                         double defaultValue)
    : TQChannel(name, channelId, defaultValue) {
    TQChannel::setInterpolation(interpolation);
    setFlag(kTQChannelFlagNoInterpolationChange, false);
}

// The class decides the interpolation; editors already skip these channels by their flag,
// and a host that calls anyway changes nothing.
void TQChannelFixedInterpolation::setKeyframeInterpolation(TQKeyframeHandle, unsigned) {}
void TQChannelFixedInterpolation::setInterpolation(unsigned) {}

TQChannelCurve::TQChannelCurve(const BNString& name, TQChannelId channelId, double defaultValue)
    : TQChannelFixedInterpolation(name, channelId, kTQInterpolationBezier, defaultValue) {}

TQChannelBase* TQChannelCurve::cloneChannel() const {
    auto* copy = new TQChannelCurve(getName(), getChannelId());
    copyConfigurationTo(*copy);
    copy->copyIdentityFrom(*this);
    static_cast<TQChannelBase&>(*copy) = *this;
    return copy;
}

TQChannelBlindData::TQChannelBlindData(const BNString& name, TQChannelId channelId)
    : TQChannelFixedInterpolation(name, channelId, kTQInterpolationConstant, 0.0) {
    setDiscrete(true);
}

TQChannelBase* TQChannelBlindData::cloneChannel() const {
    auto* copy = new TQChannelBlindData(getName(), getChannelId());
    copyConfigurationTo(*copy);
    copy->copyIdentityFrom(*this);
    static_cast<TQChannelBase&>(*copy) = *this;
    return copy;
}

// ---- TQChannelAngle -----------------------------------------------------------------------

TQChannelAngle::TQChannelAngle(const BNString& name, TQChannelId channelId, double defaultRadians)
    : TQChannel(name, channelId, defaultRadians) {
    getInfo()->displayScale = 180.0 / std::numbers::pi;
    // A nudge moves one degree.
    getInfo()->valueStep = std::numbers::pi / 180.0;
}

TQChannelBase* TQChannelAngle::cloneChannel() const {
    auto* copy = new TQChannelAngle(getName(), getChannelId());
    copyConfigurationTo(*copy);
    copy->copyIdentityFrom(*this);
    static_cast<TQChannelBase&>(*copy) = *this;
    return copy;
}

// ---- TQChannelDecibel ---------------------------------------------------------------------

TQChannelDecibel::TQChannelDecibel(const BNString& name, TQChannelId channelId,
                                   double defaultAmplitude)
    : TQChannel(name, channelId, std::fabs(defaultAmplitude)) {
    double maximum = 0.0;
    getImpl()->getRangeMax(&maximum);
    getImpl()->range().setRange(0.0, maximum);
}

double TQChannelDecibel::getDecibels(const CMTime& time) const {
    return BN_UIAmplitudeToDecibels(getValueAsDouble(time));
}

double TQChannelDecibel::decibelsToAmplitude(double decibels) {
    return std::pow(10.0, decibels / 20.0);
}

TQChannelBase* TQChannelDecibel::cloneChannel() const {
    auto* copy = new TQChannelDecibel(getName(), getChannelId());
    copyConfigurationTo(*copy);
    copy->copyIdentityFrom(*this);
    static_cast<TQChannelBase&>(*copy) = *this;
    return copy;
}

// ---- Pairs --------------------------------------------------------------------------------

TQChannelPair::TQChannelPair(const BNString& name, TQChannelId channelId, double defaultX,
                             double defaultY)
    : TQCompoundChannel(name, channelId) {
    addComponent<TQChannel>("X", kTQComponentX, defaultX);
    addComponent<TQChannel>("Y", kTQComponentY, defaultY);
    setLinked(true);
}

TQChannel2D::TQChannel2D(const BNString& name, TQChannelId channelId, double defaultX,
                         double defaultY)
    : TQChannelPair(name, channelId, defaultX, defaultY) {}

TQChannelBase* TQChannel2D::cloneChannel() const { return new TQChannel2D(*this, CloneTag{}); }

BNTimeRange TQOverRangePositionRange() { return BNTimeRange{kCMTimeZero, CMTimeMake(1, 1)}; }

TQChannel2DOverRange::TQChannel2DOverRange(const BNString& name, TQChannelId channelId,
                                           double defaultX, double defaultY)
    : TQChannelPair(name, channelId, defaultX, defaultY) {
    setTimeExtent(TQOverRangePositionRange());
}

TQChannelBase* TQChannel2DOverRange::cloneChannel() const {
    return new TQChannel2DOverRange(*this, CloneTag{});
}

TQChannelScaleOverRange::TQChannelScaleOverRange(const BNString& name, TQChannelId channelId)
    : TQChannelPair(name, channelId, 1.0, 1.0) {
    setTimeExtent(TQOverRangePositionRange());
}

TQChannelBase* TQChannelScaleOverRange::cloneChannel() const {
    return new TQChannelScaleOverRange(*this, CloneTag{});
}

// ---- TQChannelRotation3D ------------------------------------------------------------------

TQChannelRotation3D::TQChannelRotation3D(const BNString& name, TQChannelId channelId)
    : TQCompoundChannel(name, channelId) {
    addComponent<TQChannelAngle>("X", kTQComponentX);
    addComponent<TQChannelAngle>("Y", kTQComponentY);
    addComponent<TQChannelAngle>("Z", kTQComponentZ);
    setLinked(true);
}

TQChannelAngle* TQChannelRotation3D::getAngleChannel(TQChannelId component) const {
    return dynamic_cast<TQChannelAngle*>(findChild(component));
}

void TQChannelRotation3D::setQuaternionMode(bool quaternionMode, bool notify) {
    if (_quaternionMode == quaternionMode) return;
    if (notify) noteWillChange(true);
    _quaternionMode = quaternionMode;
}

TQChannelBase* TQChannelRotation3D::cloneChannel() const {
    return new TQChannelRotation3D(*this, CloneTag{});
}

void TQChannelRotation3D::assignState(const TQChannelBase& other) {
    TQCompoundChannel::assignState(other);
    if (const auto* rotation = dynamic_cast<const TQChannelRotation3D*>(&other)) {
        _quaternionMode = rotation->_quaternionMode;
    }
}

bool TQChannelRotation3D::equalState(const TQChannelBase& other) const {
    const auto* rotation = dynamic_cast<const TQChannelRotation3D*>(&other);
    return rotation && _quaternionMode == rotation->_quaternionMode &&
           TQCompoundChannel::equalState(other);
}
