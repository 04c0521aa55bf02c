#pragma once
// TQChannel: one animated value. It holds keyframes (time, value, Bezier handles, interpolation
// of the segment that leaves the keyframe, locked and enabled states), an extrapolation on each
// side, an initial value used when there are no keyframes, and behaviours that modify the
// keyframed curve.
//
// Times. Keyframe times are channel time. Curve editor axis time is channel time plus
// timeOffset(); operations named ...AxisTime, moveKeyframe and toChannelTime take axis time.
//
// Handles. A TQKeyframeHandle is a serial number issued by a process-wide counter, never a
// pointer and never reused: a handle stays valid until its keyframe is deleted (by a delete
// operation, deleteAllKeyframes, reset, purgeKeyframes, a replacing move, or an assignment of
// state that does not carry that keyframe), and a stale handle can never name another keyframe.
// getKeyframe(handle, ...) is the liveness test. Every operation taking a handle is a no-op (or
// answers false / 0 / null) for a null, stale or foreign handle.
//
// Keyframes that meet. moveKeyframe and setKeyframeTime may put two keyframes at one time; both
// live (and are ordered by arrival: the one that arrived last comes last) until purgeKeyframes,
// which keeps, of every run of equal times, the keyframe that arrived last, i.e. the one the
// user moved there. A lookup by time answers that same keyframe.
//
// Locks. A locked keyframe is a state for the editor (which refuses to delete or start moving
// it); the channel itself does not refuse edits of locked keyframes.
//
// All operations are virtual so that a host can bridge its own model. Main thread only.

#include <cstdint>
#include <memory>
#include <vector>

#include "platform/channels/TQChannelBase.h"
#include "platform/channels/TQChannelBehavior.h"

namespace tq_internal {
struct TQChannelData;
}

// Interpolation codes (the segment leaving a keyframe).
enum : unsigned {
    kTQInterpolationConstant = 0,
    kTQInterpolationLinear = 1,
    kTQInterpolationBezier = 4,
    kTQInterpolationCatmullRom = 6,
    kTQInterpolationExp = 13,
    kTQInterpolationLog = 14,
    kTQInterpolationEaseBoth = 15,
    kTQInterpolationEaseOut = 16,  // eased at the segment's start
    kTQInterpolationEaseIn = 17,   // eased at the segment's end
    kTQInterpolationMixed = 100,   // only from getInterpolation: the keyframes differ
};

// Extrapolation codes, and the directions of getExtrapolation / setExtrapolation.
enum : unsigned {
    kTQExtrapolationConstant = 0,
    kTQExtrapolationLinear = 1,
    kTQExtrapolationPingPong = 2,
    kTQExtrapolationRepeat = 3,
    kTQExtrapolationProgressive = 4,
};
enum : unsigned {
    kTQExtrapolationAfter = 0,   // after the last keyframe
    kTQExtrapolationBefore = 1,  // before the first keyframe
};

// True for the interpolation codes above that a keyframe can hold (not kTQInterpolationMixed).
bool TQIsInterpolationCode(unsigned code);

// Everything one keyframe holds but its handle: what a host saves and loads.
struct TQKeyframeState {
    CMTime time = kCMTimeZero;  // channel time
    double value = 0.0;
    double inU = 0.0;  // handles relative to the keypoint, as the getters give them
    double inV = 0.0;
    double outU = 0.0;
    double outV = 0.0;
    unsigned interpolation = kTQInterpolationBezier;
    bool locked = false;
    bool enabled = true;
    bool broken = false;
    bool scaled = false;
};

// The segments simplifyCurve fits (its fourth argument).
enum : int {
    kTQSimplifyConstant = 0,  // steps: each keyframe's value held to the next
    kTQSimplifyLinear = 1,    // straight lines
    kTQSimplifyBezier = 2,    // cubic Bezier segments with handles
};
// Where simplifyCurve may put keyframes (its last argument).
enum : int {
    kTQSimplifyOnFrames = 0,             // on any frame of the span
    kTQSimplifyOnExistingKeyframes = 1,  // only where keyframes are now: it only removes
};

// Options for the sampling form that takes a context. A null context samples the keyframed
// curve alone; a context asks for the processed curve with the behaviours it selects.
struct TQSampleContext {
    bool enabledBehaviorsOnly = true;    // false also applies disabled behaviours
    bool selectedBehaviorsOnly = false;  // true applies only behaviours marked selected
};

class TQChannel : public TQChannelBase {
public:
    TQChannel(const BNString& name, TQChannelId channelId, double defaultValue = 0.0);
    ~TQChannel() override;

    // Assignment copies the animation state (TQChannelBase::operator=), also between two
    // TQChannel references, where the implicit copy assignment would otherwise be chosen.
    using TQChannelBase::operator=;
    TQChannel& operator=(const TQChannel& other) {
        TQChannelBase::operator=(other);
        return *this;
    }

    // ---- Keyframe reading -------------------------------------------------------------------

    // Handles in time order (equal times in arrival order). With enabledOnly, only the
    // keyframes that shape the curve: disabled keyframes are left out.
    virtual std::vector<TQKeyframeHandle> getKeyframes(bool enabledOnly) const;
    // False for a stale handle; out-pointers may be null. Time is channel time.
    virtual bool getKeyframe(TQKeyframeHandle handle, CMTime* time, double* value) const;
    // The keyframe exactly at this channel time (CMTimeCompare 0), or null.
    virtual TQKeyframeHandle getKeyframe(const CMTime& time) const;
    // Nearest keyframe strictly earlier than `time`. `time` and `outTime` may be one object.
    virtual bool getPreviousKeyframe(const CMTime& time, CMTime* outTime, double* value) const;
    // Nearest enabled keyframe strictly before this one in order, or null.
    virtual TQKeyframeHandle getPreviousEnabledKeyframe(TQKeyframeHandle handle) const;
    // False without keyframes.
    virtual bool getFirstKeyframe(CMTime* time, double* value) const;
    virtual bool getLastKeyframe(CMTime* time, double* value) const;
    // kCMTimeInvalid without keyframes.
    virtual CMTime getKeyframeMinTime() const;
    virtual CMTime getKeyframeMaxTime() const;
    // Extremes over keyframe values (enabled keyframes only unless told otherwise); the initial
    // value without any keyframe to consider.
    virtual double getKeyframeMinValue(bool enabledOnly = true) const;
    virtual double getKeyframeMaxValue(bool enabledOnly = true) const;
    virtual bool getKeyframeLocked(TQKeyframeHandle handle) const;
    virtual bool getKeyframeEnabled(TQKeyframeHandle handle) const;
    virtual unsigned getKeyframeInterpolation(TQKeyframeHandle handle) const;
    // True when the segment leaving the keyframe, or the one arriving at it, is Bezier: then
    // the editor draws (and lets the user drag) its handles.
    virtual bool getKeyframeInterpolationUsesTangents(TQKeyframeHandle handle) const;
    // Handles. relative true: offsets from the keypoint (u seconds, v channel units); false:
    // the handle's absolute position (u channel seconds, v value). False for a stale handle.
    virtual bool getKeyframeInputTangents(TQKeyframeHandle handle, double* u, double* v,
                                          bool relative = true) const;
    virtual bool getKeyframeOutputTangents(TQKeyframeHandle handle, double* u, double* v,
                                           bool relative = true) const;
    virtual bool getKeyframeTangentsBroken(TQKeyframeHandle handle) const;
    virtual bool getKeyframeTangentsScaled(TQKeyframeHandle handle) const;
    // A keyframe lies within toleranceSeconds of *time (channel time); on success *time becomes
    // that keyframe's exact time. Null time: false.
    virtual bool hasKeyframeAtTime(CMTime* time, double toleranceSeconds = 0.0) const;
    // A keyframe lies exactly at *time (channel time). Null: false.
    virtual bool keyframeExistsAtTime(const CMTime* time) const;
    // Nearest keyframe strictly before / after *time; *time is replaced by its time. With
    // enabledOnly, disabled keyframes are passed over. Null or non-numeric time: false.
    virtual bool previousKeyframeTime(CMTime* time, bool enabledOnly = false) const;
    virtual bool nextKeyframeTime(CMTime* time, bool enabledOnly = false) const;
    virtual unsigned numberOfKeyframes() const;

    // ---- Values -----------------------------------------------------------------------------

    // Fills times[0..count) and values[0..count) with the curve at start + i * step (channel
    // time). The caller's arrays have room for count + 1 entries; either pointer may be null.
    // The count comes back 0 when start is not a numeric time or step is not a positive
    // numeric time, and smaller when the sample times would leave the range of CMTime.
    // A null context samples the keyframed curve alone (what getCurveValue answers); a context
    // the processed curve (what getValueAsDouble answers, with the context's behaviours).
    // Cost: O(log n) to find the first segment, then a galloping walk proportional to the
    // segments crossed plus the samples; nothing is allocated once the curve's evaluation
    // cache is built (an edit invalidates the cache, the next read rebuilds it in O(n)).
    virtual void getSamples(const TQSampleContext* context, const CMTime& start, const CMTime& step,
                            unsigned& count, CMTime** times, double** values) const;
    // The processed curve: keyframed curve plus every enabled behaviour.
    virtual void getSamples(const CMTime& start, const CMTime& step, unsigned& count,
                            CMTime** times, double** values) const;
    // The keyframed curve at channel time. With extrapolate false the curve holds its end
    // values outside the keyframes whatever the extrapolation. No keyframes: the initial value.
    // Disabled keyframes are skipped; disabled animation does not matter here (see
    // getValueAsDouble). Non-numeric time: the initial value.
    virtual double getCurveValue(const CMTime& time, bool extrapolate = true) const;
    // The channel's value: the processed curve at time + subFrameSeconds. While animation is
    // disabled the initial value stands in for the keyframed curve; enabled behaviours still
    // apply on top of it.
    virtual double getValueAsDouble(const CMTime& time, double subFrameSeconds = 0.0) const;
    virtual double getInitialValue() const;
    virtual void setInitialValue(double value, bool notify = false);
    virtual double getDefaultValue() const;
    virtual void setDefaultValue(double value);
    // Value limits: the range of getImpl().
    virtual double curveMinimum() const;
    virtual double curveMaximum() const;
    virtual double sliderMaximum() const;
    virtual void setSliderMaximum(double value);
    // The common interpolation of all keyframes, kTQInterpolationMixed when they differ, the
    // interpolation new keyframes get when there are none.
    virtual unsigned getInterpolation() const;
    // Whether any keyframe has this interpolation.
    virtual bool hasInterpolation(unsigned interpolation) const;
    virtual unsigned getExtrapolation(unsigned direction) const;
    // Values step: segments evaluate as Constant whatever their interpolation code.
    virtual bool isDiscrete() const;
    // The channel takes keypoints: animation is enabled.
    virtual bool canKeyframe() const;
    // The animation is free to be remade by the editor (simplify, generate, enable): the
    // channel's value is not driven by a rig.
    virtual bool isAnimationReset() const;
    // Carries a behaviour (an enabled one when enabledOnly).
    virtual bool isChannelAffectedByBehaviors(bool enabledOnly = true) const;
    // Carries an enabled behaviour marked selected.
    virtual bool isChannelAffectedBySelectedBehaviors() const;
    virtual bool isRigged() const;
    virtual void setRigged(bool rigged);
    // Animation enabled and at least one keyframe. A channel has no children to check.
    bool isAnimated(bool checkChildren = false) const override;
    virtual bool isAnimationEnabled() const;

    // ---- Edits ------------------------------------------------------------------------------

    // Adds a keyframe at channel time or replaces the value of the one there; with
    // replaceInterpolation the existing keyframe also takes the channel's interpolation.
    // Answers the keyframe (null for a non-numeric time).
    virtual TQKeyframeHandle setKeyframe(const CMTime& time, double value,
                                         bool replaceInterpolation = false);
    // Adds a keyframe at an axis time with the curve's value there (an existing keyframe there
    // is kept as it is). Null: no-op.
    virtual TQKeyframeHandle addKeyframeAtAxisTime(const CMTime* axisTime);
    // Adds a keyframe at the given current time (channel time), valued from the curve.
    virtual TQKeyframeHandle addKeyframe(const CMTime* currentTime);
    // Deletes the keyframe(s) exactly at a channel time.
    virtual void deleteKeyframeAtTime(const CMTime* time);
    // Deletes the keyframe at an axis time; with all, every keyframe that met there.
    virtual void deleteKeyframeAtAxisTime(const CMTime* axisTime, bool all = true);
    virtual void deleteKeyframe(TQKeyframeHandle handle);
    // Deletes every keyframe, first keeping the curve's value at currentTime (channel time) as
    // the initial value so that the channel keeps showing what it showed.
    virtual void deleteAllKeyframes(const CMTime& currentTime);
    // Leaves at most one keyframe at any time: of keyframes that met, the one that arrived
    // last survives. Handles of the others go stale.
    virtual void purgeKeyframes();
    // A copy (value, handles, interpolation, states) at a channel time; answers its handle.
    // A keyframe already at that time stays, and the copy arrives after it.
    virtual TQKeyframeHandle cloneKeyframe(TQKeyframeHandle handle, const CMTime& time);
    // Moves the keyframe found at axis time `from` (the last arrived, if several) to axis time
    // `to`. keepBoth true: a keyframe already at `to` stays until purgeKeyframes; false: it is
    // deleted now. Never fails for a numeric target; null or unknown source: no-op.
    virtual void moveKeyframe(const CMTime* from, const CMTime* to, bool keepBoth = true);
    // Moves one keyframe by handle to channel time *time, keeping any keyframe there until
    // purgeKeyframes. newValue, if given, also sets the value; collided, if given, tells
    // whether the target time was already taken.
    virtual void setKeyframeTime(TQKeyframeHandle handle, const CMTime* time,
                                 const double* newValue = nullptr, bool* collided = nullptr);
    virtual void setKeyframeValue(TQKeyframeHandle handle, double value);
    // Puts the curve through `value` at channel time: the keyframes bounding the segment
    // there move by the same amount (the end keyframe outside the keyframe span; the initial
    // value without keyframes).
    virtual void setCurveSegmentValue(const CMTime& time, double value, bool notify = false);
    // Moves the whole curve up or down so that its value at axis time *time becomes `value`
    // (channel units): every keyframe, or the initial value without keyframes, moves by the
    // same amount. The target is absolute, so a drag that passes the pointer at each step
    // keeps the curve under the pointer however many steps were dropped, and calling it
    // twice with the same arguments changes nothing the second time. Null or non-numeric
    // time, or a value that is not finite: no-op.
    virtual void offsetCurve(const CMTime* time, double value);
    virtual void setKeyframeInterpolation(TQKeyframeHandle handle, unsigned interpolation);
    // Every keyframe, and the interpolation of keyframes created later.
    virtual void setInterpolation(unsigned interpolation);
    // Unknown codes or directions: no-op.
    virtual void setExtrapolation(unsigned value, unsigned direction);
    virtual void setKeyframeLocked(TQKeyframeHandle handle, bool locked);
    virtual void setKeyframeEnabled(TQKeyframeHandle handle, bool enabled);
    // Writes one handle. relative as for the getters. The opposite handle is left alone unless
    // keepAligned is set: the editor's tangent drag computes the opposite handle itself in
    // screen space and reads it back, so a channel-side follow would turn it twice. With
    // keepAligned on an unbroken pair, the opposite handle is put opposite to the new one;
    // its length is kept when the pair is scaled, and scaled with the ratio of new to old
    // length of the written handle when not (the editor's meaning of the scaled bit).
    // The time offset u of an input handle is meant to be <= 0 and of an output handle >= 0;
    // other values are stored as given and clamped only when the curve is evaluated.
    virtual void setKeyframeInputTangents(TQKeyframeHandle handle, double u, double v,
                                          bool relative = true, bool keepAligned = false);
    virtual void setKeyframeOutputTangents(TQKeyframeHandle handle, double u, double v,
                                           bool relative = true, bool keepAligned = false);
    virtual void setKeyframeTangentsBroken(TQKeyframeHandle handle, bool broken);
    virtual void setKeyframeTangentsScaled(TQKeyframeHandle handle, bool scaled);
    // Automatic tangents: the handles take the Catmull-Rom slope through the neighbours
    // (flat at an extreme and at the ends), a third of each adjacent segment long, unbroken.
    // With makeBezier the keyframe's interpolation also becomes Bezier.
    virtual void smoothKeyframe(TQKeyframeHandle handle, bool makeBezier = true);
    // Mirrors the run of keyframes from first to last in time within the span they cover;
    // handles are mirrored and swapped (input becomes output), and each segment keeps its
    // interpolation, which moves to the keyframe that now starts it.
    virtual void reverseKeyframes(TQKeyframeHandle first, TQKeyframeHandle last);
    // Refits the curve between two of its keyframes with as few keyframes as a fitter can
    // find, within a promised worst error.
    //
    // Span. From the first keyframe at or after `start` to the last at or before `end`
    // (channel times); with fewer than two there, nothing happens. Those two keyframes keep
    // their times, values and outer handles, and every keyframe outside stays, so the curve
    // outside is unchanged (a Catmull-Rom segment bordering the span, whose shape would follow
    // the new keyframe inside, is written out as the Bezier segment it was). Locked keyframes
    // inside stay with their times and values, and the fit runs on either side of them; every
    // other keyframe inside, disabled ones included, is replaced.
    //
    // tolerance: the worst value error, in percent of the span's height (the highest minus the
    // lowest value of the curve at the frames of the span). In the curve's own units, the new
    // curve lies within tolerance / 100 * height of the old one at every frame of the span
    // (each multiple of frameDuration inside it, and its two ends) and at the time of every
    // keyframe the span had. The editor's panel offers 0 to 10; any finite value from 0 up is
    // taken. At 0 the curve stays as it is to within 1e-10 of its scale (height plus largest
    // magnitude): only keyframes that change nothing go.
    //
    // smoothness: a number of frames, 0 to 10 from the panel (up to 100 taken; more counts as
    // 100). The fit follows the curve smoothed over that many frames on either side (at each
    // frame the value of the parabola that best fits the frames around it), which keeps slopes
    // and peaks that are slower than that and irons out jitter that is faster: on recorded
    // data the keyframes land on the motion, not on its noise. The smoothed curve is never let
    // further than half the tolerance from the old one, so the promise above holds whatever
    // the smoothness. At 0 the fit follows the curve itself and keeps segments of the old curve
    // whole where they serve.
    //
    // shape: kTQSimplifyBezier (the editor's) fits cubic Bezier segments whose handles reach a
    // third of their segment, so that time runs forward through every new segment; a
    // keyframe's two handles line up (unbroken) wherever the tolerance allows, and are marked
    // broken where not. kTQSimplifyLinear and kTQSimplifyConstant fit lines and steps, with
    // automatic handles on new keyframes. A discrete channel is always fitted with steps on its
    // own values, unsmoothed.
    //
    // placement: kTQSimplifyOnFrames (the editor's) puts new keyframes on frames, whole
    // multiples of frameDuration; kTQSimplifyOnExistingKeyframes only keeps or removes the
    // span's keyframes, with their values.
    //
    // The fewest keyframes: a keyframe takes the (smoothed) curve's value at its frame, and of
    // the chains of fitting segments the fitter finds the shortest, checking the error at
    // every frame rather than estimating it (internal/TQCurveFit.h tells how).
    //
    // Announces the change (noteWillChange(true)) once when it goes ahead. Handles of replaced
    // keyframes go stale; keyframes that stay (outside, the ends, locked ones, old ones the fit
    // keeps) keep their handles. No-op, announcing nothing: a time that is not numeric, a frame
    // duration that is not a positive time, an unknown shape or placement, a tolerance that is
    // negative or not finite, a negative smoothness, a span of more than 10 million frames.
    // Cost: about linear in the frames of the span (a few fits per frame, each over the frames
    // it spans), plus frames times smoothness for the smoothing.
    virtual void simplifyCurve(const CMTime& start, const CMTime& end, const CMTime& frameDuration,
                               int shape, int smoothness, double tolerance, int placement);
    // Bakes `cycles` cycles of the extrapolation on one side (kTQExtrapolationBefore or
    // kTQExtrapolationAfter) into keyframes, so that the curve stays what it was: the new
    // keyframes are the cycles the extrapolation showed, and beyond them the extrapolation,
    // left as it is, repeats the longer span, which shows the same curve.
    //
    // A cycle is the span from the first keyframe to the last. Repeat and progressive cycles
    // are copies (raised by the span's rise per cycle for progressive), ping-pong cycles
    // alternate mirror images and copies; copies keep the values, handles (lengths and broken
    // state included), interpolation and locked state of the keyframes they copy. Where two
    // cycles meet, their end keyframes become one, with the arriving handle of the one and the
    // leaving handle of the other (broken unless they line up). Constant and linear
    // extrapolation bake one keyframe per cycle length on the held value or the line.
    //
    // Exactness. The baked curve equals the extrapolated one at every time but these:
    // - where a repeated curve jumps (its ends differ), the jump takes one tick of timescale
    //   0x40000: a keyframe that close to the seam, the segment beside it cut there. Only
    //   times inside that tick differ (an Exp or Log segment cut there keeps its shape squeezed
    //   into the shorter span: a difference of about a tick over the segment's length);
    // - a step run backwards in a mirrored cycle takes a tick likewise;
    // - baked after the keyframes, the last keyframe of a curve that jumps keeps its value,
    //   the end of a cycle, where the seams beyond show the start of the next; the longer span
    //   repeats it, so at the instants a whole number of new spans away from that keyframe,
    //   beyond the new keyframes, the curve shows the end of a cycle instead of the start.
    // Catmull-Rom segments whose shape would change with their new neighbours (at the seams,
    // and beside a step in a mirrored cycle) are written out as the Bezier segments they are.
    // Only keyframes that shape the curve are copied: enabled ones, and of keyframes that met,
    // the one that stands.
    //
    // Announces the change (noteWillChange(true)) once when it goes ahead. Existing keyframes
    // keep their handles (the one at the seam too); the copies get new ones. No-op: fewer than
    // two keyframes at distinct times, zero cycles, an unknown direction, more keyframes than a
    // channel holds (10 million, counting up to two per keyframe of a cycle), or a time beyond
    // the range of CMTime. Cost: linear in the keyframes made.
    virtual void generateKeypoints(unsigned direction, unsigned cycles);
    // Disabled animation: the value is the initial value; keyframes stay.
    virtual void setAnimationEnabled(bool enabled);
    // With keyframes and enabled animation: a keyframe at *time (channel time) with that value;
    // otherwise the initial value. Null time: the initial value.
    virtual void setValue(const CMTime* time, double value);
    // Axis time to channel time: axis time minus timeOffset(). Null: kCMTimeInvalid.
    virtual CMTime toChannelTime(const CMTime* axisTime) const;
    // Axis time to the time of a segment lookup (setCurveSegmentValue): also channel time.
    virtual CMTime toSegmentTime(const CMTime* axisTime) const;
    // The current time the host last told this channel (setRootCurrentTime); in channel time
    // when inChannelTime, else in axis time.
    virtual CMTime getRootCurrentTime(bool inChannelTime = true) const;
    virtual void setRootCurrentTime(const CMTime& axisTime);

    // ---- Behaviours -------------------------------------------------------------------------

    // Applied in order on top of the keyframed curve. The channel owns them.
    virtual void addBehavior(std::unique_ptr<TQChannelBehavior> behavior);
    // Out of range: null / no-op.
    virtual std::unique_ptr<TQChannelBehavior> removeBehavior(size_t index);
    virtual size_t numberOfBehaviors() const;
    virtual TQChannelBehavior* getBehavior(size_t index) const;

    // ---- Whole state, for hosts that save and load channels ---------------------------------

    // Every keyframe in order, as getKeyframes(false) lists them.
    virtual std::vector<TQKeyframeState> getKeyframeStates() const;
    // Replaces every keyframe by new ones with these states, in this order; every old handle
    // goes stale. Refused (false, and nothing changes) when a time is not numeric, a time is
    // earlier than the one before it, or an interpolation code is unknown. Equal times stay
    // in the order given, as keyframes that met do. Costs O(n).
    virtual bool setKeyframeStates(const std::vector<TQKeyframeState>& keyframes);
    // The interpolation that new keyframes take; getInterpolation answers it only while there
    // are no keyframes. The setter leaves existing keyframes alone; unknown codes: no-op.
    virtual unsigned getDefaultInterpolation() const;
    virtual void setDefaultInterpolation(unsigned interpolation);

    // ---- Tree -------------------------------------------------------------------------------

    TQChannelBase* cloneChannel() const override;
    // Keyframes gone, initial value back to the default value, interpolation and extrapolation
    // back to their defaults, animation enabled. Behaviours stay.
    void reset(bool notify = false) override;

protected:
    // State: keyframes (with their handles' serials), flags, interpolation, extrapolation,
    // initial value, animation enabled, behaviours. Compared exactly (CMTimeIdentical).
    void assignState(const TQChannelBase& other) override;
    bool equalState(const TQChannelBase& other) const override;
    // For kinds whose values step (booleans, enumerations).
    void setDiscrete(bool discrete);
    // Copies the configuration that is not animation state (default value, discreteness,
    // slider maximum, rig state) into a fresh clone; cloneChannel of subclasses calls it.
    void copyConfigurationTo(TQChannel& clone) const;

private:
    std::unique_ptr<tq_internal::TQChannelData> _d;
};
