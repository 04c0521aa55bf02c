#include <gtest/gtest.h>

#include <vector>

#include "platform/channels/tests/CurveCatalogue.h"

using namespace curve_catalogue;

namespace {

struct Samples {
    explicit Samples(unsigned n) : times(n + 1), values(n + 1), count(n) {}
    std::vector<CMTime> times;
    std::vector<double> values;
    unsigned count;
};

// Keyframed samples of a channel over [start, start + step * n).
Samples sample(const TQChannel& c, CMTime start, CMTime step, unsigned n) {
    Samples s(n);
    CMTime* t = s.times.data();
    double* v = s.values.data();
    c.getSamples(nullptr, start, step, s.count, &t, &v);
    return s;
}

class SamplingCurve : public ::testing::Test {};

TEST_F(SamplingCurve, keyframed_samples__match_point_queries_on_every_catalogue_curve) {
    std::unique_ptr<TQChannel> curves[] = {flat(), overshoot(), cusp(), dense(300)};
    for (auto& c : curves) {
        c->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter);
        c->setExtrapolation(kTQExtrapolationProgressive, kTQExtrapolationBefore);
        const CMTime start = seconds(-3.0);
        const CMTime step = CMTimeMake(1, 997);  // not the keyframes' timescale
        Samples s = sample(*c, start, step, 5000);
        ASSERT_EQ(s.count, 5000u) << c->getName();
        for (unsigned i = 0; i < s.count; ++i) {
            const CMTime expected = CMTimeAdd(start, CMTimeMultiply(step, int32_t(i)));
            ASSERT_EQ(CMTimeCompare(s.times[i], expected), 0) << c->getName() << " time " << i;
            ASSERT_NEAR(s.values[i], c->getCurveValue(s.times[i]), kValueTolerance)
                << c->getName() << " sample " << i;
        }
    }
}

TEST_F(SamplingCurve, every_density__from_many_segments_per_sample_to_many_samples_per_segment) {
    auto c = dense(400);  // segments of 0.1 s to 0.6 s
    CMTime first, last;
    c->getFirstKeyframe(&first, nullptr);
    c->getLastKeyframe(&last, nullptr);
    const double span = CMTimeGetSeconds(last) - CMTimeGetSeconds(first);
    for (unsigned n : {100u, 1000u, 5000u, 60000u}) {
        Samples s = sample(*c, first, TQTarnTimeForChannelSeconds(span / n, 1000000000), n);
        ASSERT_EQ(s.count, n);
        for (unsigned i = 0; i < s.count; ++i) {
            ASSERT_NEAR(s.values[i], c->getCurveValue(s.times[i]), kValueTolerance)
                << n << " samples, sample " << i;
        }
    }
}

TEST_F(SamplingCurve, clustered_keyframes__segments_crossed_per_sample_vary_widely) {
    // Bursts of 1 to 200 keyframes a millisecond apart between gaps of a second: from one sample
    // to the next the walk crosses none, a few or hundreds of segments, so any guess it makes
    // from the last step is often wrong in both directions.
    auto c = makeChannel("clustered");
    Lcg rng{11};
    double t = 0.0;
    for (int burst = 0; burst < 40; ++burst) {
        const int size = 1 + int(rng.next() * 200.0);
        for (int k = 0; k < size; ++k) {
            TQKeyframeHandle h = c->setKeyframe(seconds(t), rng.next() * 20.0 - 10.0);
            c->setKeyframeTangentsBroken(h, true);
            randomHandles(*c, h, rng, 0.001, 1.0, 0.6, 4.0);
            t += 0.001;
        }
        t += 1.0;
    }
    for (const double step : {0.0007, 0.013, 0.37}) {
        const unsigned n = unsigned(t / step);
        Samples s = sample(*c, seconds(0.0), seconds(step), n);
        ASSERT_EQ(s.count, n);
        for (unsigned i = 0; i < s.count; ++i) {
            ASSERT_NEAR(s.values[i], c->getCurveValue(s.times[i]), kValueTolerance)
                << "step " << step << ", sample " << i;
        }
    }
}

TEST_F(SamplingCurve, dense_backwards_cursor__ping_pong_walks_back_through_segments) {
    auto c = dense(2000);
    c->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter);
    CMTime last;
    c->getLastKeyframe(&last, nullptr);
    Samples s = sample(*c, last, seconds(0.05), 4000);
    for (unsigned i = 0; i < s.count; i += 7) {
        ASSERT_NEAR(s.values[i], c->getCurveValue(s.times[i]), kValueTolerance) << "sample " << i;
    }
}

TEST_F(SamplingCurve, count__comes_back_smaller_only_for_what_cannot_be_sampled) {
    auto c = overshoot();
    {
        Samples s = sample(*c, seconds(0.0), kCMTimeZero, 10);
        EXPECT_EQ(s.count, 0u) << "a zero step gives no samples";
    }
    {
        Samples s = sample(*c, seconds(0.0), seconds(-1.0), 10);
        EXPECT_EQ(s.count, 0u) << "a negative step gives no samples";
    }
    {
        Samples s = sample(*c, kCMTimeInvalid, seconds(1.0), 10);
        EXPECT_EQ(s.count, 0u) << "an invalid start gives no samples";
    }
    {
        Samples s = sample(*c, CMTimeMake(INT64_MAX - 5, 1), CMTimeMake(2, 1), 10);
        EXPECT_EQ(s.count, 3u) << "samples past the end of CMTime are left off";
    }
    {
        Samples s = sample(*c, seconds(0.0), seconds(0.5), 3);
        EXPECT_EQ(s.count, 3u) << "asking for fewer gives fewer";
        EXPECT_EQ(s.times[3].flags, 0u) << "nothing is written past the count";
    }
}

TEST_F(SamplingCurve, out_pointers__may_be_null) {
    auto c = overshoot();
    std::vector<double> values(11);
    double* v = values.data();
    CMTime* none = nullptr;
    unsigned count = 10;
    c->getSamples(nullptr, seconds(0.0), seconds(0.25), count, nullptr, &v);
    EXPECT_EQ(count, 10u);
    EXPECT_NEAR(values[4], c->getCurveValue(seconds(1.0)), kValueTolerance);
    count = 10;
    c->getSamples(nullptr, seconds(0.0), seconds(0.25), count, &none, nullptr);
    EXPECT_EQ(count, 10u);
}

TEST_F(SamplingCurve, empty_channel__samples_the_initial_value) {
    auto c = makeChannel("empty");
    c->setInitialValue(2.5);
    Samples s = sample(*c, seconds(0.0), seconds(1.0), 4);
    ASSERT_EQ(s.count, 4u);
    for (unsigned i = 0; i < 4; ++i) EXPECT_EQ(s.values[i], 2.5);
}

}  // namespace
