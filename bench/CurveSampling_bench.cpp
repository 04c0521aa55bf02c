// Sampling cost of Bezier channels: 2000 evenly spaced samples across the whole keyframe span,
// for channels of 4 to 100k keyframes, reported as time per sample (items = samples).
//
//   BM_GetSamples        TQChannel::getSamples: a cursor walk over the segments; the time
//                        equations are solved side by side in vector lanes, from the chord
//                        or, within long runs in one segment, from the samples before.
//   BM_ClosedFormSamples the textbook baseline: for every sample a binary search for the
//                        segment and a closed-form (Cardano / trigonometric) cubic solve.
// Both fill the same time and value arrays from the same clamped control points.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <memory>
#include <numbers>
#include <string>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/testing/CurveCatalogue.h"

namespace {

constexpr int kTimescale = 0x40000;
constexpr unsigned kSamples = 2000;

struct Span {
    CMTime start;
    CMTime step;
};

Span samplingSpan(const TQChannel& channel) {
    CMTime first, last;
    channel.getFirstKeyframe(&first, nullptr);
    channel.getLastKeyframe(&last, nullptr);
    const double span = CMTimeGetSeconds(last) - CMTimeGetSeconds(first);
    return {first, TQTarnTimeForChannelSeconds(span / kSamples, kTimescale)};
}

void BM_GetSamples(benchmark::State& state) {
    const auto channel = curve_catalogue::make("steep-" + std::to_string(state.range(0)));
    const Span span = samplingSpan(*channel);
    std::vector<CMTime> times(kSamples + 1);
    std::vector<double> values(kSamples + 1);
    CMTime* t = times.data();
    double* v = values.data();
    unsigned count = kSamples;
    channel->getSamples(nullptr, span.start, span.step, count, &t, &v);  // builds the cache
    for (auto _ : state) {
        count = kSamples;
        channel->getSamples(nullptr, span.start, span.step, count, &t, &v);
        benchmark::DoNotOptimize(values.data());
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(int64_t(state.iterations()) * kSamples);
}

// ---- Baseline ---------------------------------------------------------------------------------

// The channel's Bezier segments as control points, with the same clamp of handle reach to the
// segment that keeps time monotone.
struct ControlPoints {
    std::vector<double> t;                       // keyframe times
    std::vector<double> x1, x2, y0, y1, y2, y3;  // per segment
};

ControlPoints controlPointsOf(const TQChannel& channel) {
    ControlPoints cp;
    const std::vector<TQKeyframeHandle> keys = channel.getKeyframes(true);
    for (size_t i = 0; i < keys.size(); ++i) {
        CMTime time;
        channel.getKeyframe(keys[i], &time, nullptr);
        cp.t.push_back(CMTimeGetSeconds(time));
    }
    auto clampReach = [](double reach, double rise, double dt, double& r, double& v) {
        r = std::clamp(reach, 0.0, dt);
        v = reach > dt ? rise * dt / reach : rise;
    };
    for (size_t i = 0; i + 1 < keys.size(); ++i) {
        double va = 0, vb = 0, ou = 0, ov = 0, iu = 0, iv = 0;
        channel.getKeyframe(keys[i], nullptr, &va);
        channel.getKeyframe(keys[i + 1], nullptr, &vb);
        channel.getKeyframeOutputTangents(keys[i], &ou, &ov);
        channel.getKeyframeInputTangents(keys[i + 1], &iu, &iv);
        const double dt = cp.t[i + 1] - cp.t[i];
        double ro = 0, vo = 0, ri = 0, vi = 0;
        clampReach(ou, ov, dt, ro, vo);
        clampReach(-iu, iv, dt, ri, vi);
        cp.x1.push_back(cp.t[i] + ro);
        cp.x2.push_back(cp.t[i + 1] - ri);
        cp.y0.push_back(va);
        cp.y1.push_back(va + vo);
        cp.y2.push_back(vb + vi);
        cp.y3.push_back(vb);
    }
    return cp;
}

// Real root in [0, 1] of a s^3 + b s^2 + c s + d, by Cardano's formula (one real root) or the
// trigonometric form (three real roots).
double solveCubicInUnitInterval(double a, double b, double c, double d) {
    constexpr double kEps = 1e-12;
    auto inUnit = [](double s) { return s >= -1e-9 && s <= 1.0 + 1e-9; };
    if (std::fabs(a) < kEps) {
        if (std::fabs(b) < kEps) return std::clamp(-d / c, 0.0, 1.0);
        const double disc = std::sqrt(std::max(0.0, c * c - 4.0 * b * d));
        const double r = (-c + disc) / (2.0 * b);
        return std::clamp(inUnit(r) ? r : (-c - disc) / (2.0 * b), 0.0, 1.0);
    }
    const double B = b / a, C = c / a, D = d / a;
    const double p = C - B * B / 3.0;
    const double q = 2.0 * B * B * B / 27.0 - B * C / 3.0 + D;
    const double shift = -B / 3.0;
    const double disc = q * q / 4.0 + p * p * p / 27.0;
    if (disc >= 0.0) {
        const double sq = std::sqrt(disc);
        return std::clamp(std::cbrt(-q / 2.0 + sq) + std::cbrt(-q / 2.0 - sq) + shift, 0.0, 1.0);
    }
    const double r = 2.0 * std::sqrt(-p / 3.0);
    const double phi = std::acos(std::clamp(3.0 * q / (p * r), -1.0, 1.0)) / 3.0;
    for (int k = 0; k < 3; ++k) {
        const double s = r * std::cos(phi - 2.0 * std::numbers::pi * k / 3.0) + shift;
        if (inUnit(s)) return std::clamp(s, 0.0, 1.0);
    }
    return 0.0;
}

void BM_ClosedFormSamples(benchmark::State& state) {
    const auto channel = curve_catalogue::make("steep-" + std::to_string(state.range(0)));
    const Span span = samplingSpan(*channel);
    const ControlPoints cp = controlPointsOf(*channel);
    std::vector<CMTime> times(kSamples + 1);
    std::vector<double> values(kSamples + 1);
    const size_t segments = cp.y0.size();
    for (auto _ : state) {
        for (unsigned i = 0; i < kSamples; ++i) {
            const CMTimeValue value = span.start.value + CMTimeValue(i) * span.step.value;
            times[i] = CMTime{value, kTimescale, kCMTimeFlags_Valid, 0};
            const double t = double(value) / double(kTimescale);
            const size_t upper =
                size_t(std::upper_bound(cp.t.begin(), cp.t.end(), t) - cp.t.begin());
            const size_t seg = std::min(upper == 0 ? 0 : upper - 1, segments - 1);
            const double x0 = cp.t[seg], x3 = cp.t[seg + 1];
            const double x1 = cp.x1[seg], x2 = cp.x2[seg];
            const double a = x3 - x0 + 3.0 * (x1 - x2);
            const double b = 3.0 * (x0 - 2.0 * x1 + x2);
            const double c = 3.0 * (x1 - x0);
            const double s = solveCubicInUnitInterval(a, b, c, x0 - t);
            const double u = 1.0 - s;
            values[i] = u * u * u * cp.y0[seg] + 3.0 * u * u * s * cp.y1[seg] +
                        3.0 * u * s * s * cp.y2[seg] + s * s * s * cp.y3[seg];
        }
        benchmark::DoNotOptimize(values.data());
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(int64_t(state.iterations()) * kSamples);
}

}  // namespace

BENCHMARK(BM_GetSamples)->Arg(4)->Arg(10)->Arg(100)->Arg(1000)->Arg(2000)->Arg(10000)->Arg(100000);
BENCHMARK(BM_ClosedFormSamples)
    ->Arg(4)
    ->Arg(10)
    ->Arg(100)
    ->Arg(1000)
    ->Arg(2000)
    ->Arg(10000)
    ->Arg(100000);
