#pragma once
// Named reference curves shared by the curve, sampling and behaviour tests. Each builder
// answers a fresh channel; times are in the editor's usual timescale.
//
//   "flat"       three Bezier keyframes at value 5: every evaluation must give 5
//   "overshoot"  0 -> 10 -> 0 with long level-raising handles: the curve rises above 10
//   "cusp"       0 -> 10 -> 0 with broken handles pointing up at the middle keyframe
//   "dense"      n keyframes with deterministic pseudo-random values, spacing and handles

#include <cmath>
#include <cstdint>
#include <memory>

#include "platform/channels/TQChannel.h"

namespace curve_catalogue {

inline constexpr int kTimescale = 0x40000;
// Agreement of two evaluations of one curve (sampling against point queries, clones).
inline constexpr double kValueTolerance = 1e-9;

inline CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTimescale); }

inline std::unique_ptr<TQChannel> makeChannel(const char* name) {
    return std::make_unique<TQChannel>(name, 1, 0.0);
}

inline std::unique_ptr<TQChannel> flat() {
    auto c = makeChannel("flat");
    for (double t : {0.0, 1.0, 2.0}) c->setKeyframe(seconds(t), 5.0);
    return c;
}

inline std::unique_ptr<TQChannel> overshoot() {
    auto c = makeChannel("overshoot");
    TQKeyframeHandle a = c->setKeyframe(seconds(0.0), 0.0);
    TQKeyframeHandle b = c->setKeyframe(seconds(1.0), 10.0);
    TQKeyframeHandle d = c->setKeyframe(seconds(2.0), 0.0);
    c->setKeyframeOutputTangents(a, 0.5, 12.0);
    c->setKeyframeInputTangents(b, -0.5, -4.0);
    c->setKeyframeOutputTangents(b, 0.5, 4.0);
    c->setKeyframeInputTangents(d, -0.5, 12.0);
    return c;
}

inline std::unique_ptr<TQChannel> cusp() {
    auto c = makeChannel("cusp");
    c->setKeyframe(seconds(0.0), 0.0);
    TQKeyframeHandle mid = c->setKeyframe(seconds(1.0), 10.0);
    c->setKeyframe(seconds(2.0), 0.0);
    c->setKeyframeTangentsBroken(mid, true);
    c->setKeyframeInputTangents(mid, -0.3, 3.0);
    c->setKeyframeOutputTangents(mid, 0.3, 3.0);
    return c;
}

// Deterministic generator (64-bit LCG, top bits) so that every run sees the same curve. Draw
// into named locals, one per statement: two draws in one call's arguments happen in an order
// each compiler picks, and the curve would differ between compilers.
struct Lcg {
    uint64_t state;
    double next() {
        state = state * 6364136223846793005ull + 1442695040888963407ull;
        return double(state >> 11) / 9007199254740992.0;
    }
};

// Handles of random reach (up to inReach, outReach) and rise (within +-inRise, +-outRise), drawn
// in that order.
inline void randomHandles(TQChannel& c, TQKeyframeHandle h, Lcg& rng, double inReach, double inRise,
                          double outReach, double outRise) {
    const double inU = -rng.next() * inReach;
    const double inV = (rng.next() * 2.0 - 1.0) * inRise;
    c.setKeyframeInputTangents(h, inU, inV);
    const double outU = rng.next() * outReach;
    const double outV = (rng.next() * 2.0 - 1.0) * outRise;
    c.setKeyframeOutputTangents(h, outU, outV);
}

inline std::unique_ptr<TQChannel> dense(int n, uint64_t seed = 7) {
    auto c = makeChannel("dense");
    Lcg rng{seed};
    double t = 0.0;
    for (int i = 0; i < n; ++i) {
        TQKeyframeHandle h = c->setKeyframe(seconds(t), rng.next() * 20.0 - 10.0);
        c->setKeyframeTangentsBroken(h, rng.next() < 0.3);
        randomHandles(*c, h, rng, 0.6, 4.0, 0.6, 4.0);
        t += 0.1 + rng.next() * 0.5;
    }
    return c;
}

}  // namespace curve_catalogue
