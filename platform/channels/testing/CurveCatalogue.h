#pragma once
// Named reference curves shared by the tests of the channels, the engine, the view, the Qt
// adapter and the benchmarks. make(name) answers a fresh channel, fill(channel, name) builds
// the curve into an empty channel that already sits in a tree; times are in the editor's usual
// timescale. Header-only: test and bench targets include it from the repository root.
//
//   "flat"       three Bezier keyframes at value 5: every evaluation must give 5
//   "overshoot"  0 -> 10 -> 0 with long level-raising handles: the curve rises above 10
//   "cusp"       0 -> 10 -> 0 with broken handles pointing up at the middle keyframe
//   "dense-N"    N keyframes (N may end in k: "dense-100k") with deterministic pseudo-random
//                values, spacing and handles
//   "steep-N"    N keyframes with broken handles reaching 10 % to 90 % of their segment at
//                slopes up to +-100: the hard case for the sampler's time solve
//   "level"      three Bezier keyframes at 2, 5 and 8 s, value 0: sits in the middle of the
//                editor's default view (0 to 10 s by -1 to 1)
//   "bump"       as "level" with the middle keyframe at 0.5
//   "ramp"       two keyframes, 0 at 0 s and 100 at 1 s

#include <cmath>
#include <cstdint>
#include <initializer_list>
#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "platform/channels/TQChannel.h"

namespace curve_catalogue {

inline constexpr int kTimescale = 0x40000;
// Agreement of two evaluations of one curve (sampling against point queries, clones).
inline constexpr double kValueTolerance = 1e-9;

inline CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTimescale); }

inline std::unique_ptr<TQChannel> makeChannel(const char* name) {
    return std::make_unique<TQChannel>(name, 1, 0.0);
}

inline std::unique_ptr<TQChannel> cloneOf(const TQChannel& c) {
    return std::unique_ptr<TQChannel>(static_cast<TQChannel*>(c.cloneChannel()));
}

// Counts the change notices that reach it from the channels below it.
struct AnnouncementCounter : TQChannelChangeObserver {
    int count = 0;
    void channelWillChange(TQChannelBase&) override { ++count; }
};

// A channel whose values step whatever the interpolation codes say (as booleans do).
struct SteppedChannel : TQChannel {
    SteppedChannel() : TQChannel("stepped", 1, 0.0) { setDiscrete(true); }
};

inline void keys(TQChannel& c, std::initializer_list<std::pair<double, double>> secondsValues) {
    for (const auto& [t, v] : secondsValues) c.setKeyframe(seconds(t), v);
}

inline void fillOvershoot(TQChannel& channel) {
    TQChannel* c = &channel;
    TQKeyframeHandle a = c->setKeyframe(seconds(0.0), 0.0);
    TQKeyframeHandle b = c->setKeyframe(seconds(1.0), 10.0);
    TQKeyframeHandle d = c->setKeyframe(seconds(2.0), 0.0);
    c->setKeyframeOutputTangents(a, 0.5, 12.0);
    c->setKeyframeInputTangents(b, -0.5, -4.0);
    c->setKeyframeOutputTangents(b, 0.5, 4.0);
    c->setKeyframeInputTangents(d, -0.5, 12.0);
}

inline void fillCusp(TQChannel& channel) {
    TQChannel* c = &channel;
    c->setKeyframe(seconds(0.0), 0.0);
    TQKeyframeHandle mid = c->setKeyframe(seconds(1.0), 10.0);
    c->setKeyframe(seconds(2.0), 0.0);
    c->setKeyframeTangentsBroken(mid, true);
    c->setKeyframeInputTangents(mid, -0.3, 3.0);
    c->setKeyframeOutputTangents(mid, 0.3, 3.0);
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

inline void fillDense(TQChannel& c, int n, uint64_t seed = 7) {
    Lcg rng{seed};
    double t = 0.0;
    for (int i = 0; i < n; ++i) {
        TQKeyframeHandle h = c.setKeyframe(seconds(t), rng.next() * 20.0 - 10.0);
        c.setKeyframeTangentsBroken(h, rng.next() < 0.3);
        randomHandles(c, h, rng, 0.6, 4.0, 0.6, 4.0);
        t += 0.1 + rng.next() * 0.5;
    }
}

inline std::unique_ptr<TQChannel> dense(int n, uint64_t seed = 7) {
    auto c = makeChannel("dense");
    fillDense(*c, n, seed);
    return c;
}

inline void fillSteep(TQChannel& c, int n) {
    Lcg rng{0x5eed + uint64_t(n)};
    std::vector<double> times(size_t(n > 0 ? n : 0));
    double t = 0.0;
    for (double& time : times) {
        time = t;
        t += 0.05 + rng.next() * 0.2;
    }
    for (size_t i = 0; i < times.size(); ++i) {
        TQKeyframeHandle h = c.setKeyframe(seconds(times[i]), rng.next() * 100.0 - 50.0);
        const double before = i > 0 ? times[i] - times[i - 1] : 0.1;
        const double after = i + 1 < times.size() ? times[i + 1] - times[i] : 0.1;
        c.setKeyframeTangentsBroken(h, true);
        const double reachIn = before * (0.1 + 0.8 * rng.next());
        const double reachOut = after * (0.1 + 0.8 * rng.next());
        const double riseIn = reachIn * (rng.next() * 200.0 - 100.0);
        c.setKeyframeInputTangents(h, -reachIn, riseIn);
        const double riseOut = reachOut * (rng.next() * 200.0 - 100.0);
        c.setKeyframeOutputTangents(h, reachOut, riseOut);
    }
    c.setInterpolation(kTQInterpolationBezier);
}

// The count of a "dense-N" or "steep-N" name, or -1 when `name` is not `prefix` and a count.
inline int countAfter(std::string_view name, std::string_view prefix) {
    if (name.substr(0, prefix.size()) != prefix || name.size() == prefix.size()) return -1;
    int n = 0;
    for (size_t i = prefix.size(); i < name.size(); ++i) {
        const char ch = name[i];
        if (ch == 'k' && i + 1 == name.size()) return n * 1000;
        if (ch < '0' || ch > '9') return -1;
        n = n * 10 + (ch - '0');
    }
    return n;
}

// Builds the named curve into `c`, which holds no keyframes yet. A name the catalogue does not
// hold is a mistake in the test and throws.
inline void fill(TQChannel& c, std::string_view name) {
    if (name == "flat") return keys(c, {{0.0, 5.0}, {1.0, 5.0}, {2.0, 5.0}});
    if (name == "overshoot") return fillOvershoot(c);
    if (name == "cusp") return fillCusp(c);
    if (name == "level") return keys(c, {{2.0, 0.0}, {5.0, 0.0}, {8.0, 0.0}});
    if (name == "bump") return keys(c, {{2.0, 0.0}, {5.0, 0.5}, {8.0, 0.0}});
    if (name == "ramp") return keys(c, {{0.0, 0.0}, {1.0, 100.0}});
    if (const int n = countAfter(name, "dense-"); n >= 0) return fillDense(c, n);
    if (const int n = countAfter(name, "steep-"); n >= 0) return fillSteep(c, n);
    throw std::invalid_argument("no reference curve named " + std::string(name));
}

inline std::unique_ptr<TQChannel> make(std::string_view name) {
    auto c = std::make_unique<TQChannel>(std::string(name), 1, 0.0);
    fill(*c, name);
    return c;
}

inline std::unique_ptr<TQChannel> flat() { return make("flat"); }
inline std::unique_ptr<TQChannel> overshoot() { return make("overshoot"); }
inline std::unique_ptr<TQChannel> cusp() { return make("cusp"); }

}  // namespace curve_catalogue
