#pragma once
// Reference curves for simplifyCurve, shared by its tests and its benchmark so that both judge
// the same curves, and the measures its promises are stated in: the worst value error at every
// frame of a span, and segments whose handles turn time back.
//
//   noisySine       one keyframe per frame (30 fps) of a sine of amplitude 1 and period 2 s
//                   plus uniform noise of +-0.02, linear segments: recorded data
//   catmullRomKeys  Bezier keyframes 3 to 9 frames apart, values in [-1, 1], handles a third
//                   of their segment along the chord through the neighbours: a hand-keyed
//                   animation, sampled per frame by the simplifier
//   sketchedStroke  one keyframe per frame of a smooth random walk (the velocity wanders):
//                   what a pen stroke leaves
//
// Every time is a whole frame of kFps, as the editor's frame grid puts them.

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <numbers>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/testing/CurveCatalogue.h"

namespace reference_curves {

inline constexpr int32_t kFps = 30;

inline CMTime frame(int64_t k) { return CMTimeMake(k, kFps); }
inline CMTime frameDuration() { return CMTimeMake(1, kFps); }

using curve_catalogue::cloneOf;
using curve_catalogue::Lcg;
using curve_catalogue::SteppedChannel;

inline std::unique_ptr<TQChannel> noisySine(int64_t frames = 100'000, uint64_t seed = 11) {
    auto c = std::make_unique<TQChannel>("noisy sine", 1, 0.0);
    c->setInterpolation(kTQInterpolationLinear);
    Lcg rng{seed};
    for (int64_t k = 0; k < frames; ++k) {
        const double noise = (rng.next() * 2.0 - 1.0) * 0.02;
        const double seconds = double(k) / kFps;
        c->setKeyframe(frame(k), std::sin(std::numbers::pi * seconds) + noise);
    }
    return c;
}

inline std::unique_ptr<TQChannel> catmullRomKeys(int keys = 500, uint64_t seed = 5) {
    auto c = std::make_unique<TQChannel>("catmull-rom keys", 1, 0.0);
    Lcg rng{seed};
    const size_t n = size_t(std::max(keys, 2));
    std::vector<int64_t> at(n);
    std::vector<double> value(n);
    int64_t k = 0;
    for (size_t i = 0; i < at.size(); ++i) {
        at[i] = k;
        value[i] = rng.next() * 2.0 - 1.0;
        k += 3 + int64_t(rng.next() * 7.0);  // 3 to 9 frames
    }
    auto seconds = [&](size_t i) { return double(at[i]) / kFps; };
    for (size_t i = 0; i < at.size(); ++i) {
        const size_t lo = i == 0 ? 0 : i - 1;
        const size_t hi = std::min(i + 1, at.size() - 1);
        const double slope = (value[hi] - value[lo]) / (seconds(hi) - seconds(lo));
        TQKeyframeHandle h = c->setKeyframe(frame(at[i]), value[i]);
        const double in = i == 0 ? 0.0 : (seconds(i) - seconds(i - 1)) / 3.0;
        const double out = i + 1 == at.size() ? 0.0 : (seconds(i + 1) - seconds(i)) / 3.0;
        c->setKeyframeInputTangents(h, -in, -in * slope);
        c->setKeyframeOutputTangents(h, out, out * slope);
    }
    return c;
}

inline std::unique_ptr<TQChannel> sketchedStroke(int points = 300, uint64_t seed = 3) {
    auto c = std::make_unique<TQChannel>("sketched stroke", 1, 0.0);
    Lcg rng{seed};
    double value = 0.0;
    double velocity = 0.0;
    for (int k = 0; k < points; ++k) {
        c->setKeyframe(frame(k), value);
        const double push = rng.next() * 2.0 - 1.0;
        velocity = 0.9 * velocity + 0.02 * push;
        value += velocity;
    }
    for (TQKeyframeHandle h : c->getKeyframes(false)) c->smoothKeyframe(h);
    return c;
}

// The greatest keyframe value, read from the keyframes themselves: what the channel's cached
// extremes must answer after an edit.
inline double greatestKeyframeValue(const TQChannel& c) {
    double greatest = -HUGE_VAL;
    for (const TQKeyframeState& k : c.getKeyframeStates()) greatest = std::max(greatest, k.value);
    return greatest;
}

// The highest minus the lowest value of the curve at the frames from `first` to `last`.
inline double height(const TQChannel& c, int64_t first, int64_t last) {
    double lo = HUGE_VAL, hi = -HUGE_VAL;
    for (int64_t k = first; k <= last; ++k) {
        const double v = c.getCurveValue(frame(k));
        lo = std::min(lo, v);
        hi = std::max(hi, v);
    }
    return hi - lo;
}

// The largest difference between two curves at the frames from `first` to `last`.
inline double worstFrameError(const TQChannel& a, const TQChannel& b, int64_t first, int64_t last) {
    double worst = 0.0;
    for (int64_t k = first; k <= last; ++k) {
        worst = std::max(worst, std::fabs(a.getCurveValue(frame(k)) - b.getCurveValue(frame(k))));
    }
    return worst;
}

// Bezier segments between enabled keyframes whose handles, as stored, make time run backwards
// somewhere: a handle reaching the wrong way, or two reaching past each other. Over a segment
// of length d whose handles reach a and c along time, the time's derivative has the Bernstein
// coefficients a, d - a - c, c: it stays non-negative iff a >= 0, c >= 0 and the middle one is
// at least -sqrt(a c).
inline size_t backwardSegments(const TQChannel& channel) {
    std::vector<TQKeyframeState> keys = channel.getKeyframeStates();
    std::erase_if(keys, [](const TQKeyframeState& k) { return !k.enabled; });
    size_t count = 0;
    for (size_t i = 0; i + 1 < keys.size(); ++i) {
        const TQKeyframeState& a = keys[i];
        const TQKeyframeState& b = keys[i + 1];
        if (a.interpolation != kTQInterpolationBezier || channel.isDiscrete()) continue;
        const double d = CMTimeGetSeconds(b.time) - CMTimeGetSeconds(a.time);
        const double first = a.outU;
        const double last = -b.inU;
        const double middle = d - first - last;
        if (first < 0.0 || last < 0.0 || middle < -std::sqrt(first * last)) ++count;
    }
    return count;
}

}  // namespace reference_curves
