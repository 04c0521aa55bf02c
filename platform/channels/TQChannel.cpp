#include "platform/channels/TQChannel.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <numeric>

#include "platform/channels/internal/TQChannelData.h"

using tq_internal::autoTangents;
using tq_internal::compareTimes;
using tq_internal::CurveCursor;
using tq_internal::handleOf;
using tq_internal::mirroredInterpolation;
using tq_internal::TQChannelData;
using tq_internal::TQKeyframeRecord;

bool TQIsInterpolationCode(unsigned code) {
    switch (code) {
        case kTQInterpolationConstant:
        case kTQInterpolationLinear:
        case kTQInterpolationBezier:
        case kTQInterpolationCatmullRom:
        case kTQInterpolationExp:
        case kTQInterpolationLog:
        case kTQInterpolationEaseBoth:
        case kTQInterpolationEaseOut:
        case kTQInterpolationEaseIn: return true;
        default: return false;
    }
}

namespace {

bool isInterpolationCode(unsigned code) { return TQIsInterpolationCode(code); }

}  // namespace

TQChannel::TQChannel(const BNString& name, TQChannelId channelId, double defaultValue)
    : TQChannelBase(name, channelId), _d(std::make_unique<TQChannelData>()) {
    _d->defaultValue = defaultValue;
    _d->initialValue = defaultValue;
}

TQChannel::~TQChannel() = default;

// ---- Keyframe reading ------------------------------------------------------------------------

std::vector<TQKeyframeHandle> TQChannel::getKeyframes(bool enabledOnly) const {
    std::vector<TQKeyframeHandle> handles;
    handles.reserve(_d->keys.size());
    for (const TQKeyframeRecord& k : _d->keys) {
        if (!enabledOnly || k.enabled) handles.push_back(handleOf(k.serial));
    }
    return handles;
}

bool TQChannel::getKeyframe(TQKeyframeHandle handle, CMTime* time, double* value) const {
    const TQKeyframeRecord* k = _d->find(handle);
    if (!k) return false;
    if (time) *time = k->time;
    if (value) *value = k->value;
    return true;
}

TQKeyframeHandle TQChannel::getKeyframe(const CMTime& time) const {
    const long i = _d->lastAt(time);
    return i < 0 ? nullptr : handleOf(_d->keys[size_t(i)].serial);
}

bool TQChannel::getPreviousKeyframe(const CMTime& time, CMTime* outTime, double* value) const {
    const size_t pos = _d->lowerBound(time);
    if (pos == 0) return false;
    const TQKeyframeRecord& k = _d->keys[pos - 1];
    if (value) *value = k.value;
    if (outTime) *outTime = k.time;  // written last: it may be the input itself
    return true;
}

TQKeyframeHandle TQChannel::getPreviousEnabledKeyframe(TQKeyframeHandle handle) const {
    const long i = _d->indexOf(handle);
    if (i < 0) return nullptr;
    const CMTime& time = _d->keys[size_t(i)].time;
    // The last enabled keyframe of the nearest earlier time: the one that starts the segment
    // arriving here.
    for (long j = i - 1; j >= 0; --j) {
        const TQKeyframeRecord& k = _d->keys[size_t(j)];
        if (k.enabled && compareTimes(k.time, time) < 0) return handleOf(k.serial);
    }
    return nullptr;
}

bool TQChannel::getFirstKeyframe(CMTime* time, double* value) const {
    if (_d->keys.empty()) return false;
    if (time) *time = _d->keys.front().time;
    if (value) *value = _d->keys.front().value;
    return true;
}

bool TQChannel::getLastKeyframe(CMTime* time, double* value) const {
    if (_d->keys.empty()) return false;
    if (time) *time = _d->keys.back().time;
    if (value) *value = _d->keys.back().value;
    return true;
}

CMTime TQChannel::getKeyframeMinTime() const {
    return _d->keys.empty() ? kCMTimeInvalid : _d->keys.front().time;
}

CMTime TQChannel::getKeyframeMaxTime() const {
    return _d->keys.empty() ? kCMTimeInvalid : _d->keys.back().time;
}

double TQChannel::getKeyframeMinValue(bool enabledOnly) const {
    const tq_internal::TQChannelData::Extremes& e = _d->extremes();
    return enabledOnly ? e.minEnabled : e.minAll;
}

double TQChannel::getKeyframeMaxValue(bool enabledOnly) const {
    const tq_internal::TQChannelData::Extremes& e = _d->extremes();
    return enabledOnly ? e.maxEnabled : e.maxAll;
}

bool TQChannel::getKeyframeLocked(TQKeyframeHandle handle) const {
    const TQKeyframeRecord* k = _d->find(handle);
    return k && k->locked;
}

bool TQChannel::getKeyframeEnabled(TQKeyframeHandle handle) const {
    const TQKeyframeRecord* k = _d->find(handle);
    return k && k->enabled;
}

unsigned TQChannel::getKeyframeInterpolation(TQKeyframeHandle handle) const {
    const TQKeyframeRecord* k = _d->find(handle);
    return k ? k->interpolation : 0u;
}

bool TQChannel::getKeyframeInterpolationUsesTangents(TQKeyframeHandle handle) const {
    const long i = _d->indexOf(handle);
    if (i < 0 || _d->discrete) return false;
    const bool hasNext = size_t(i) + 1 < _d->keys.size();
    if (hasNext && _d->keys[size_t(i)].interpolation == kTQInterpolationBezier) return true;
    return i > 0 && _d->keys[size_t(i) - 1].interpolation == kTQInterpolationBezier;
}

bool TQChannel::getKeyframeInputTangents(TQKeyframeHandle handle, double* u, double* v,
                                         bool relative) const {
    const TQKeyframeRecord* k = _d->find(handle);
    if (!k) return false;
    if (u) *u = k->inU + (relative ? 0.0 : k->seconds);
    if (v) *v = k->inV + (relative ? 0.0 : k->value);
    return true;
}

bool TQChannel::getKeyframeOutputTangents(TQKeyframeHandle handle, double* u, double* v,
                                          bool relative) const {
    const TQKeyframeRecord* k = _d->find(handle);
    if (!k) return false;
    if (u) *u = k->outU + (relative ? 0.0 : k->seconds);
    if (v) *v = k->outV + (relative ? 0.0 : k->value);
    return true;
}

bool TQChannel::getKeyframeTangentsBroken(TQKeyframeHandle handle) const {
    const TQKeyframeRecord* k = _d->find(handle);
    return k && k->broken;
}

bool TQChannel::getKeyframeTangentsScaled(TQKeyframeHandle handle) const {
    const TQKeyframeRecord* k = _d->find(handle);
    return k && k->scaled;
}

bool TQChannel::hasKeyframeAtTime(CMTime* time, double toleranceSeconds) const {
    if (!time || !CMTIME_IS_NUMERIC(*time)) return false;
    if (!(toleranceSeconds > 0.0)) return _d->lastAt(*time) >= 0;
    const double seconds = CMTimeGetSeconds(*time);
    const size_t pos = _d->lowerBound(*time);
    const TQKeyframeRecord* best = nullptr;
    double bestDistance = toleranceSeconds;
    // The nearest keyframe is the last one before the time or the first one at or after it.
    for (size_t i : {pos, pos - 1}) {
        if (i >= _d->keys.size()) continue;  // pos - 1 wraps when pos is 0
        const double distance = std::fabs(_d->keys[i].seconds - seconds);
        if (distance <= bestDistance) {
            best = &_d->keys[i];
            bestDistance = distance;
        }
    }
    if (!best) return false;
    *time = best->time;
    return true;
}

bool TQChannel::keyframeExistsAtTime(const CMTime* time) const {
    return time && CMTIME_IS_NUMERIC(*time) && _d->lastAt(*time) >= 0;
}

bool TQChannel::previousKeyframeTime(CMTime* time, bool enabledOnly) const {
    if (!time || !CMTIME_IS_NUMERIC(*time)) return false;
    for (size_t i = _d->lowerBound(*time); i > 0; --i) {
        const TQKeyframeRecord& k = _d->keys[i - 1];
        if (enabledOnly && !k.enabled) continue;
        *time = k.time;
        return true;
    }
    return false;
}

bool TQChannel::nextKeyframeTime(CMTime* time, bool enabledOnly) const {
    if (!time || !CMTIME_IS_NUMERIC(*time)) return false;
    for (size_t i = _d->upperBound(*time); i < _d->keys.size(); ++i) {
        const TQKeyframeRecord& k = _d->keys[i];
        if (enabledOnly && !k.enabled) continue;
        *time = k.time;
        return true;
    }
    return false;
}

unsigned TQChannel::numberOfKeyframes() const { return unsigned(_d->keys.size()); }

// ---- Values ----------------------------------------------------------------------------------

void TQChannel::getSamples(const TQSampleContext* context, const CMTime& start, const CMTime& step,
                           unsigned& count, CMTime** times, double** values) const {
    const unsigned asked = count;
    count = 0;
    if (!CMTIME_IS_NUMERIC(start) || !CMTIME_IS_NUMERIC(step) || step.value <= 0) return;

    // One timescale for start and step, so that sample i is start + i * step exactly: their
    // least common multiple when it is a valid timescale and the values still fit, else the
    // finer of the two with the other rounded to it.
    CMTimeScale timescale = start.timescale;
    CMTimeValue startValue = start.value;
    CMTimeValue stepValue = step.value;
    if (step.timescale != start.timescale) {
        const int64_t lcm = std::lcm(int64_t(start.timescale), int64_t(step.timescale));
        CMTimeValue a = 0, b = 0;
        if (lcm <= kCMTimeMaxTimescale &&
            !__builtin_mul_overflow(start.value, lcm / start.timescale, &a) &&
            !__builtin_mul_overflow(step.value, lcm / step.timescale, &b)) {
            timescale = CMTimeScale(lcm);
            startValue = a;
            stepValue = b;
        } else {
            timescale = std::max(start.timescale, step.timescale);
            const CMTime s = CMTimeConvertScale(start, timescale);
            const CMTime d = CMTimeConvertScale(step, timescale);
            if (!CMTIME_IS_NUMERIC(s) || !CMTIME_IS_NUMERIC(d) || d.value <= 0) return;
            startValue = s.value;
            stepValue = d.value;
        }
    }
    // Fewer samples when the last one would not fit in a CMTime value.
    unsigned n = asked;
    if (n > 0) {
        CMTimeValue room = 0;
        if (__builtin_sub_overflow(std::numeric_limits<CMTimeValue>::max(), startValue, &room)) {
            room = std::numeric_limits<CMTimeValue>::max();  // a negative start: all fit
        }
        const CMTimeValue fitting = room / stepValue;  // samples after the first
        if (CMTimeValue(n - 1) > fitting) n = unsigned(fitting) + 1;
    }

    CMTime* outTimes = times ? *times : nullptr;
    double* outValues = values ? *values : nullptr;
    _d->curve().sample(startValue, stepValue, timescale, start.epoch, n, outTimes, outValues);
    count = n;
    if (!context || !outValues) return;

    if (!_d->animationEnabled) std::fill(outValues, outValues + n, _d->initialValue);
    for (const auto& behavior : _d->behaviors) {
        if (context->enabledBehaviorsOnly && !behavior->isEnabled()) continue;
        if (context->selectedBehaviorsOnly && !behavior->isSelected()) continue;
        for (unsigned i = 0; i < n; ++i) {
            const CMTimeValue v = startValue + CMTimeValue(i) * stepValue;
            outValues[i] = behavior->apply(double(v) / double(timescale), outValues[i]);
        }
    }
}

void TQChannel::getSamples(const CMTime& start, const CMTime& step, unsigned& count, CMTime** times,
                           double** values) const {
    const TQSampleContext processed;
    getSamples(&processed, start, step, count, times, values);
}

double TQChannel::getCurveValue(const CMTime& time, bool extrapolate) const {
    if (!CMTIME_IS_NUMERIC(time)) return _d->initialValue;
    CurveCursor cursor;
    return _d->curve().evaluate(CMTimeGetSeconds(time), cursor, extrapolate);
}

double TQChannel::getValueAsDouble(const CMTime& time, double subFrameSeconds) const {
    if (!CMTIME_IS_NUMERIC(time) || !std::isfinite(subFrameSeconds)) return _d->initialValue;
    const double seconds = CMTimeGetSeconds(time) + subFrameSeconds;
    CurveCursor cursor;
    double value =
        _d->animationEnabled ? _d->curve().evaluate(seconds, cursor, true) : _d->initialValue;
    for (const auto& behavior : _d->behaviors) {
        if (behavior->isEnabled()) value = behavior->apply(seconds, value);
    }
    return value;
}

double TQChannel::getInitialValue() const { return _d->initialValue; }

void TQChannel::setInitialValue(double value, bool notify) {
    if (notify) noteWillChange(true);
    _d->initialValue = value;
    _d->curveChanged();
}

double TQChannel::getDefaultValue() const { return _d->defaultValue; }

void TQChannel::setDefaultValue(double value) { _d->defaultValue = value; }

double TQChannel::curveMinimum() const {
    double value = 0.0;
    getImpl()->getRangeMin(&value);
    return value;
}

double TQChannel::curveMaximum() const {
    double value = 0.0;
    getImpl()->getRangeMax(&value);
    return value;
}

double TQChannel::sliderMaximum() const { return _d->sliderMaximum; }

void TQChannel::setSliderMaximum(double value) { _d->sliderMaximum = value; }

unsigned TQChannel::getInterpolation() const {
    if (_d->keys.empty()) return _d->defaultInterpolation;
    const unsigned first = _d->keys.front().interpolation;
    for (const TQKeyframeRecord& k : _d->keys) {
        if (k.interpolation != first) return kTQInterpolationMixed;
    }
    return first;
}

bool TQChannel::hasInterpolation(unsigned interpolation) const {
    return std::any_of(_d->keys.begin(), _d->keys.end(),
                       [&](const TQKeyframeRecord& k) { return k.interpolation == interpolation; });
}

unsigned TQChannel::getExtrapolation(unsigned direction) const {
    if (direction == kTQExtrapolationBefore) return _d->extrapolationBefore;
    if (direction == kTQExtrapolationAfter) return _d->extrapolationAfter;
    return kTQExtrapolationConstant;
}

bool TQChannel::isDiscrete() const { return _d->discrete; }

bool TQChannel::canKeyframe() const { return _d->animationEnabled; }

bool TQChannel::isAnimationReset() const { return !_d->rigged; }

bool TQChannel::isChannelAffectedByBehaviors(bool enabledOnly) const {
    return std::any_of(_d->behaviors.begin(), _d->behaviors.end(),
                       [&](const auto& b) { return !enabledOnly || b->isEnabled(); });
}

bool TQChannel::isChannelAffectedBySelectedBehaviors() const {
    return std::any_of(_d->behaviors.begin(), _d->behaviors.end(),
                       [](const auto& b) { return b->isEnabled() && b->isSelected(); });
}

bool TQChannel::isRigged() const { return _d->rigged; }

void TQChannel::setRigged(bool rigged) { _d->rigged = rigged; }

bool TQChannel::isAnimated(bool /*checkChildren: a channel has none*/) const {
    return _d->animationEnabled && !_d->keys.empty();
}

bool TQChannel::isAnimationEnabled() const { return _d->animationEnabled; }

// ---- Edits -----------------------------------------------------------------------------------

TQKeyframeHandle TQChannel::setKeyframe(const CMTime& time, double value,
                                        bool replaceInterpolation) {
    if (!CMTIME_IS_NUMERIC(time) || !std::isfinite(value)) return nullptr;
    const long existing = _d->lastAt(time);
    if (existing >= 0) {
        TQKeyframeRecord& k = _d->keys[size_t(existing)];
        k.value = value;
        if (replaceInterpolation) k.interpolation = _d->defaultInterpolation;
        _d->curveChanged();
        return handleOf(k.serial);
    }
    TQKeyframeRecord record;
    record.serial = tq_internal::nextKeyframeSerial();
    record.time = time;
    record.seconds = CMTimeGetSeconds(time);
    record.value = value;
    record.interpolation = _d->defaultInterpolation;
    const size_t pos = _d->insert(record);
    autoTangents(_d->keys, pos);
    return handleOf(record.serial);
}

TQKeyframeHandle TQChannel::addKeyframeAtAxisTime(const CMTime* axisTime) {
    if (!axisTime) return nullptr;
    const CMTime time = toChannelTime(axisTime);
    return addKeyframe(&time);
}

TQKeyframeHandle TQChannel::addKeyframe(const CMTime* currentTime) {
    if (!currentTime || !CMTIME_IS_NUMERIC(*currentTime)) return nullptr;
    if (TQKeyframeHandle existing = getKeyframe(*currentTime)) return existing;
    return setKeyframe(*currentTime, getCurveValue(*currentTime, true));
}

void TQChannel::deleteKeyframeAtTime(const CMTime* time) {
    if (!time || !CMTIME_IS_NUMERIC(*time)) return;
    const size_t lo = _d->lowerBound(*time);
    const size_t hi = _d->upperBound(*time);
    if (lo == hi) return;
    _d->keys.erase(_d->keys.begin() + long(lo), _d->keys.begin() + long(hi));
    _d->orderChanged();
}

void TQChannel::deleteKeyframeAtAxisTime(const CMTime* axisTime, bool all) {
    if (!axisTime) return;
    const CMTime time = toChannelTime(axisTime);
    if (all) {
        deleteKeyframeAtTime(&time);
    } else if (CMTIME_IS_NUMERIC(time)) {
        const long i = _d->lastAt(time);
        if (i >= 0) _d->eraseAt(size_t(i));
    }
}

void TQChannel::deleteKeyframe(TQKeyframeHandle handle) {
    const long i = _d->indexOf(handle);
    if (i >= 0) _d->eraseAt(size_t(i));
}

void TQChannel::deleteAllKeyframes(const CMTime& currentTime) {
    if (_d->keys.empty()) return;
    if (CMTIME_IS_NUMERIC(currentTime)) _d->initialValue = getCurveValue(currentTime, true);
    _d->keys.clear();
    _d->orderChanged();
}

void TQChannel::purgeKeyframes() {
    std::vector<TQKeyframeRecord>& keys = _d->keys;
    const auto tie = std::adjacent_find(keys.begin(), keys.end(), [](const auto& a, const auto& b) {
        return compareTimes(a.time, b.time) == 0;
    });
    if (tie == keys.end()) return;
    // Callers purge without announcing it (a gesture settles its channels as it ends): the
    // channel says it will change, as every mutation does, so that the host's undo holds the
    // keyframes that go.
    noteWillChange(true);
    size_t kept = 0;
    for (size_t i = 0; i < keys.size(); ++i) {
        const bool lastOfRun =
            i + 1 == keys.size() || compareTimes(keys[i].time, keys[i + 1].time) != 0;
        if (lastOfRun) {
            if (kept != i) keys[kept] = keys[i];
            ++kept;
        }
    }
    if (kept == keys.size()) return;
    keys.resize(kept);
    _d->orderChanged();
}

TQKeyframeHandle TQChannel::cloneKeyframe(TQKeyframeHandle handle, const CMTime& time) {
    const TQKeyframeRecord* source = _d->find(handle);
    if (!source || !CMTIME_IS_NUMERIC(time)) return nullptr;
    TQKeyframeRecord copy = *source;
    copy.serial = tq_internal::nextKeyframeSerial();
    copy.time = time;
    copy.seconds = CMTimeGetSeconds(time);
    _d->insert(copy);
    return handleOf(copy.serial);
}

void TQChannel::moveKeyframe(const CMTime* from, const CMTime* to, bool keepBoth) {
    if (!from || !to) return;
    const CMTime source = toChannelTime(from);
    const CMTime target = toChannelTime(to);
    if (!CMTIME_IS_NUMERIC(source) || !CMTIME_IS_NUMERIC(target)) return;
    const long i = _d->lastAt(source);
    if (i < 0 || compareTimes(source, target) == 0) return;
    const size_t pos = _d->retime(size_t(i), target);
    if (keepBoth) return;
    // The moved keyframe arrived last at the target: the others there come just before it.
    const size_t firstThere = _d->lowerBound(target);
    if (firstThere == pos) return;
    _d->keys.erase(_d->keys.begin() + long(firstThere), _d->keys.begin() + long(pos));
    _d->orderChanged();
}

void TQChannel::setKeyframeTime(TQKeyframeHandle handle, const CMTime* time, const double* newValue,
                                bool* collided) {
    if (collided) *collided = false;
    const long i = _d->indexOf(handle);
    if (i < 0 || !time || !CMTIME_IS_NUMERIC(*time)) return;
    size_t pos = size_t(i);
    if (compareTimes(_d->keys[pos].time, *time) != 0) {
        if (collided) *collided = _d->lastAt(*time) >= 0;
        pos = _d->retime(pos, *time);
    }
    if (newValue && std::isfinite(*newValue)) {
        _d->keys[pos].value = *newValue;
        _d->curveChanged();
    }
}

void TQChannel::setKeyframeValue(TQKeyframeHandle handle, double value) {
    TQKeyframeRecord* k = _d->find(handle);
    if (!k || !std::isfinite(value)) return;
    k->value = value;
    _d->curveChanged();
}

void TQChannel::setCurveSegmentValue(const CMTime& time, double value, bool notify) {
    if (!CMTIME_IS_NUMERIC(time) || !std::isfinite(value)) return;
    if (notify) noteWillChange(true);
    std::vector<TQKeyframeRecord>& keys = _d->keys;
    if (keys.empty()) {
        _d->initialValue = value;
        _d->curveChanged();
        return;
    }
    const double delta = value - getCurveValue(time, true);
    // The keyframes of the times that bound the segment (all keyframes that met there).
    const size_t after = _d->upperBound(time);
    auto offsetRunAt = [&](size_t pos) {
        const CMTime at = keys[pos].time;
        for (size_t j = _d->lowerBound(at); j < keys.size() && compareTimes(keys[j].time, at) == 0;
             ++j) {
            keys[j].value += delta;
        }
    };
    if (after > 0) offsetRunAt(after - 1);
    if (after < keys.size()) offsetRunAt(after);
    _d->curveChanged();
}

void TQChannel::offsetCurve(const CMTime* time, double value) {
    if (!time || !std::isfinite(value)) return;
    const CMTime at = toChannelTime(time);
    if (!CMTIME_IS_NUMERIC(at)) return;
    // Every extrapolation moves with its keyframes, so one uniform shift carries the curve's
    // value at `at`, inside the keyframe span or outside it, onto the target.
    const double delta = value - getCurveValue(at, true);
    if (!std::isfinite(delta) || delta == 0.0) return;
    if (_d->keys.empty()) _d->initialValue += delta;
    for (TQKeyframeRecord& k : _d->keys) k.value += delta;
    _d->curveChanged();
}

void TQChannel::setKeyframeInterpolation(TQKeyframeHandle handle, unsigned interpolation) {
    TQKeyframeRecord* k = _d->find(handle);
    if (!k || !isInterpolationCode(interpolation)) return;
    k->interpolation = interpolation;
    _d->curveChanged();
}

void TQChannel::setInterpolation(unsigned interpolation) {
    if (!isInterpolationCode(interpolation)) return;
    _d->defaultInterpolation = interpolation;
    for (TQKeyframeRecord& k : _d->keys) k.interpolation = interpolation;
    _d->curveChanged();
}

void TQChannel::setExtrapolation(unsigned value, unsigned direction) {
    if (value > kTQExtrapolationProgressive) return;
    if (direction == kTQExtrapolationBefore) {
        _d->extrapolationBefore = value;
    } else if (direction == kTQExtrapolationAfter) {
        _d->extrapolationAfter = value;
    } else {
        return;
    }
    _d->curveChanged();
}

void TQChannel::setKeyframeLocked(TQKeyframeHandle handle, bool locked) {
    if (TQKeyframeRecord* k = _d->find(handle)) k->locked = locked;
}

void TQChannel::setKeyframeEnabled(TQKeyframeHandle handle, bool enabled) {
    TQKeyframeRecord* k = _d->find(handle);
    if (!k) return;
    k->enabled = enabled;
    _d->curveChanged();
}

namespace {

// Writes one handle of a keyframe and, when asked and the pair is unbroken, turns the other
// to the opposite direction (see setKeyframeInputTangents in the header).
void writeHandle(TQKeyframeRecord& k, bool output, double u, double v, bool relative,
                 bool keepAligned) {
    if (!relative) {
        u -= k.seconds;
        v -= k.value;
    }
    if (!std::isfinite(u) || !std::isfinite(v)) return;
    double& du = output ? k.outU : k.inU;
    double& dv = output ? k.outV : k.inV;
    double& ou = output ? k.inU : k.outU;
    double& ov = output ? k.inV : k.outV;
    const double oldLength = std::hypot(du, dv);
    du = u;
    dv = v;
    if (!keepAligned || k.broken) return;
    const double newLength = std::hypot(u, v);
    if (newLength == 0.0) return;  // no direction to follow
    const double otherLength = std::hypot(ou, ov);
    const double length = k.scaled
                              ? otherLength
                              : (oldLength > 0.0 ? otherLength * newLength / oldLength : newLength);
    ou = -u / newLength * length;
    ov = -v / newLength * length;
}

}  // namespace

void TQChannel::setKeyframeInputTangents(TQKeyframeHandle handle, double u, double v, bool relative,
                                         bool keepAligned) {
    TQKeyframeRecord* k = _d->find(handle);
    if (!k) return;
    writeHandle(*k, false, u, v, relative, keepAligned);
    _d->curveChanged();
}

void TQChannel::setKeyframeOutputTangents(TQKeyframeHandle handle, double u, double v,
                                          bool relative, bool keepAligned) {
    TQKeyframeRecord* k = _d->find(handle);
    if (!k) return;
    writeHandle(*k, true, u, v, relative, keepAligned);
    _d->curveChanged();
}

void TQChannel::setKeyframeTangentsBroken(TQKeyframeHandle handle, bool broken) {
    if (TQKeyframeRecord* k = _d->find(handle)) k->broken = broken;
}

void TQChannel::setKeyframeTangentsScaled(TQKeyframeHandle handle, bool scaled) {
    if (TQKeyframeRecord* k = _d->find(handle)) k->scaled = scaled;
}

void TQChannel::smoothKeyframe(TQKeyframeHandle handle, bool makeBezier) {
    const long i = _d->indexOf(handle);
    if (i < 0) return;
    autoTangents(_d->keys, size_t(i));
    if (makeBezier) _d->keys[size_t(i)].interpolation = kTQInterpolationBezier;
    _d->curveChanged();
}

void TQChannel::reverseKeyframes(TQKeyframeHandle first, TQKeyframeHandle last) {
    long a = _d->indexOf(first);
    long b = _d->indexOf(last);
    if (a < 0 || b < 0 || a == b) return;
    if (a > b) std::swap(a, b);
    std::vector<TQKeyframeRecord>& keys = _d->keys;
    const size_t lo = size_t(a), hi = size_t(b);
    const CMTime spanSum = CMTimeAdd(keys[lo].time, keys[hi].time);
    // The segment leaving the run keeps its interpolation; each segment inside the run is run
    // backwards, so its code goes, mirrored, to the keyframe that now starts it.
    const unsigned leaving = keys[hi].interpolation;
    std::vector<unsigned> inside;
    inside.reserve(hi - lo);
    for (size_t i = lo; i < hi; ++i) inside.push_back(mirroredInterpolation(keys[i].interpolation));

    std::reverse(keys.begin() + long(lo), keys.begin() + long(hi) + 1);
    for (size_t i = lo; i <= hi; ++i) {
        TQKeyframeRecord& k = keys[i];
        k.time = CMTimeSubtract(spanSum, k.time);
        k.seconds = CMTimeGetSeconds(k.time);
        const double inU = k.inU, inV = k.inV;
        k.inU = -k.outU;
        k.inV = k.outV;
        k.outU = -inU;
        k.outV = inV;
        // New position i held old position lo + hi - i; the segment it starts was the old
        // segment ending there, governed by the old keyframe before it.
        k.interpolation = i < hi ? inside[(lo + hi - i) - 1 - lo] : leaving;
    }
    _d->orderChanged();
}

void TQChannel::setAnimationEnabled(bool enabled) { _d->animationEnabled = enabled; }

void TQChannel::setValue(const CMTime* time, double value) {
    if (!std::isfinite(value)) return;
    if (time && CMTIME_IS_NUMERIC(*time) && _d->animationEnabled && !_d->keys.empty()) {
        setKeyframe(*time, value);
        return;
    }
    _d->initialValue = value;
    _d->curveChanged();
}

CMTime TQChannel::toChannelTime(const CMTime* axisTime) const {
    if (!axisTime) return kCMTimeInvalid;
    const CMTime offset = timeOffset();
    return CMTIME_IS_VALID(offset) ? CMTimeSubtract(*axisTime, offset) : *axisTime;
}

CMTime TQChannel::toSegmentTime(const CMTime* axisTime) const { return toChannelTime(axisTime); }

CMTime TQChannel::getRootCurrentTime(bool inChannelTime) const {
    return inChannelTime ? toChannelTime(&_d->currentAxisTime) : _d->currentAxisTime;
}

void TQChannel::setRootCurrentTime(const CMTime& axisTime) { _d->currentAxisTime = axisTime; }

// ---- Behaviours ------------------------------------------------------------------------------

void TQChannel::addBehavior(std::unique_ptr<TQChannelBehavior> behavior) {
    if (behavior) _d->behaviors.push_back(std::move(behavior));
}

std::unique_ptr<TQChannelBehavior> TQChannel::removeBehavior(size_t index) {
    if (index >= _d->behaviors.size()) return nullptr;
    std::unique_ptr<TQChannelBehavior> removed = std::move(_d->behaviors[index]);
    _d->behaviors.erase(_d->behaviors.begin() + long(index));
    return removed;
}

size_t TQChannel::numberOfBehaviors() const { return _d->behaviors.size(); }

TQChannelBehavior* TQChannel::getBehavior(size_t index) const {
    return index < _d->behaviors.size() ? _d->behaviors[index].get() : nullptr;
}

// ---- Tree ------------------------------------------------------------------------------------

TQChannelBase* TQChannel::cloneChannel() const {
    auto* clone = new TQChannel(getName(), getChannelId(), _d->defaultValue);
    clone->copyIdentityFrom(*this);
    copyConfigurationTo(*clone);
    clone->assignState(*this);
    return clone;
}

void TQChannel::reset(bool notify) {
    if (notify) noteWillChange(true);
    _d->keys.clear();
    _d->initialValue = _d->defaultValue;
    _d->defaultInterpolation = _d->discrete ? kTQInterpolationConstant : kTQInterpolationBezier;
    _d->extrapolationBefore = kTQExtrapolationConstant;
    _d->extrapolationAfter = kTQExtrapolationConstant;
    _d->animationEnabled = true;
    _d->orderChanged();
}

void TQChannel::assignState(const TQChannelBase& other) {
    TQChannelBase::assignState(other);
    const auto* source = dynamic_cast<const TQChannel*>(&other);
    if (!source || source == this) return;
    const TQChannelData& s = *source->_d;
    _d->keys = s.keys;  // serials too: restoring a backup keeps the editor's handles alive
    _d->initialValue = s.initialValue;
    _d->defaultInterpolation = s.defaultInterpolation;
    _d->extrapolationBefore = s.extrapolationBefore;
    _d->extrapolationAfter = s.extrapolationAfter;
    _d->animationEnabled = s.animationEnabled;
    _d->behaviors.clear();
    for (const auto& behavior : s.behaviors) _d->behaviors.push_back(behavior->clone());
    _d->orderChanged();
}

bool TQChannel::equalState(const TQChannelBase& other) const {
    if (!TQChannelBase::equalState(other)) return false;
    const auto* o = dynamic_cast<const TQChannel*>(&other);
    if (!o) return false;
    const TQChannelData& a = *_d;
    const TQChannelData& b = *o->_d;
    if (a.initialValue != b.initialValue || a.defaultInterpolation != b.defaultInterpolation ||
        a.extrapolationBefore != b.extrapolationBefore ||
        a.extrapolationAfter != b.extrapolationAfter || a.animationEnabled != b.animationEnabled ||
        a.keys.size() != b.keys.size() || a.behaviors.size() != b.behaviors.size()) {
        return false;
    }
    for (size_t i = 0; i < a.keys.size(); ++i) {
        if (!tq_internal::sameState(a.keys[i], b.keys[i])) return false;
    }
    for (size_t i = 0; i < a.behaviors.size(); ++i) {
        if (!a.behaviors[i]->equals(*b.behaviors[i])) return false;
    }
    return true;
}

std::vector<TQKeyframeState> TQChannel::getKeyframeStates() const {
    std::vector<TQKeyframeState> out;
    out.reserve(_d->keys.size());
    for (const TQKeyframeRecord& k : _d->keys) {
        out.push_back({k.time, k.value, k.inU, k.inV, k.outU, k.outV, k.interpolation, k.locked,
                       k.enabled, k.broken, k.scaled});
    }
    return out;
}

bool TQChannel::setKeyframeStates(const std::vector<TQKeyframeState>& keyframes) {
    for (size_t i = 0; i < keyframes.size(); ++i) {
        const TQKeyframeState& k = keyframes[i];
        if (!CMTIME_IS_NUMERIC(k.time) || !isInterpolationCode(k.interpolation)) return false;
        if (i > 0 && compareTimes(keyframes[i - 1].time, k.time) > 0) return false;
    }
    std::vector<TQKeyframeRecord> records;
    records.reserve(keyframes.size());
    for (const TQKeyframeState& k : keyframes) {
        TQKeyframeRecord r;
        r.serial = tq_internal::nextKeyframeSerial();
        r.time = k.time;
        r.seconds = CMTimeGetSeconds(k.time);
        r.value = k.value;
        r.inU = k.inU;
        r.inV = k.inV;
        r.outU = k.outU;
        r.outV = k.outV;
        r.interpolation = k.interpolation;
        r.locked = k.locked;
        r.enabled = k.enabled;
        r.broken = k.broken;
        r.scaled = k.scaled;
        records.push_back(r);
    }
    _d->keys = std::move(records);
    _d->orderChanged();
    return true;
}

unsigned TQChannel::getDefaultInterpolation() const { return _d->defaultInterpolation; }

void TQChannel::setDefaultInterpolation(unsigned interpolation) {
    if (!isInterpolationCode(interpolation)) return;
    _d->defaultInterpolation = interpolation;
}

void TQChannel::setDiscrete(bool discrete) {
    _d->discrete = discrete;
    if (discrete && _d->keys.empty()) _d->defaultInterpolation = kTQInterpolationConstant;
    _d->curveChanged();
}

void TQChannel::copyConfigurationTo(TQChannel& clone) const {
    clone._d->defaultValue = _d->defaultValue;
    clone._d->discrete = _d->discrete;
    clone._d->sliderMaximum = _d->sliderMaximum;
    clone._d->rigged = _d->rigged;
    clone._d->currentAxisTime = _d->currentAxisTime;
    clone._d->curveChanged();
}
