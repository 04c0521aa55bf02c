// Sampling a channel: every sample must be what a point query at its time answers, however
// the samples fall on the segments, and the processed curve adds the behaviours.
#include <gtest/gtest.h>

#include <cmath>
#include <numbers>
#include <vector>

#include "platform/channels/testing/CurveCatalogue.h"

using namespace curve_catalogue;

namespace {

struct Samples {
    std::vector<CMTime> times;
    std::vector<double> values;
    unsigned count;
};

// Samples over [start, start + step * n): of the keyframed curve without a context, of the
// processed curve with one or when asked.
Samples sample(const TQChannel& c, CMTime start, CMTime step, unsigned n,
               const TQSampleContext* context = nullptr, bool processed = false) {
    Samples s{std::vector<CMTime>(n + 1), std::vector<double>(n + 1), n};
    CMTime* t = s.times.data();
    double* v = s.values.data();
    if (processed && !context)
        c.getSamples(start, step, s.count, &t, &v);
    else
        c.getSamples(context, start, step, s.count, &t, &v);
    return s;
}

void expectPointQueries(const TQChannel& c, const Samples& s, CMTime start, CMTime step,
                        const char* what) {
    for (unsigned i = 0; i < s.count; ++i) {
        ASSERT_EQ(CMTimeCompare(s.times[i], CMTimeAdd(start, CMTimeMultiply(step, int32_t(i)))), 0)
            << what << " time " << i;
        ASSERT_NEAR(s.values[i], c.getCurveValue(s.times[i]), kValueTolerance)
            << what << " sample " << i;
    }
}

// Bursts of 1 to 200 keyframes a millisecond apart between gaps of a second: from one sample to
// the next the walk crosses none, a few or hundreds of segments, so any guess it makes from the
// last step is often wrong in both directions.
std::unique_ptr<TQChannel> clustered() {
    auto c = makeChannel("clustered");
    Lcg rng{11};
    double t = 0.0;
    for (int burst = 0; burst < 40; ++burst, t += 1.0) {
        const int size = 1 + int(rng.next() * 200.0);
        for (int k = 0; k < size; ++k, t += 0.001) {
            TQKeyframeHandle h = c->setKeyframe(seconds(t), rng.next() * 20.0 - 10.0);
            c->setKeyframeTangentsBroken(h, true);
            randomHandles(*c, h, rng, 0.001, 1.0, 0.6, 4.0);
        }
    }
    return c;
}

TEST(SamplingCurve, keyframedSamples__matchPointQueriesAtEveryDensityAndPastTheEnds) {
    // Stairs: constant segments tell a sample that lands on a keyframe from one that lands in
    // the segment before it, however far the walk jumps.
    auto stairs = makeChannel("stairs");
    for (int k = 0; k < 300; ++k) stairs->setKeyframe(seconds(k), k);
    stairs->setInterpolation(kTQInterpolationConstant);
    std::unique_ptr<TQChannel> curves[] = {flat(),     overshoot(), cusp(),
                                           dense(400), clustered(), std::move(stairs)};
    for (auto& c : curves) {
        c->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter);
        c->setExtrapolation(kTQExtrapolationProgressive, kTQExtrapolationBefore);
        const double span = CMTimeGetSeconds(c->getKeyframeMaxTime());
        // Many segments per sample to many samples per segment, in a timescale of their own, and
        // from the last keyframe back through the ping-pong cycle.
        for (const auto& [start, step, n] :
             {std::tuple{seconds(-3.0), CMTimeMake(1, 997), 5000u},
              {seconds(0.0), CMTimeMakeWithSeconds(span / 100, 1000000000), 100u},
              {seconds(0.0), CMTimeMakeWithSeconds(span / 60000, 1000000000), 60000u},
              {seconds(0.0), seconds(0.37), unsigned(span / 0.37)},
              {seconds(0.0), seconds(1.0), unsigned(span)},
              {seconds(0.0), seconds(7.0), unsigned(span / 7.0)},
              {seconds(0.0), seconds(40.0), unsigned(span / 40.0)},
              {c->getKeyframeMaxTime(), seconds(0.05), 4000u}}) {
            const Samples s = sample(*c, start, step, n);
            ASSERT_EQ(s.count, n) << c->getName();
            expectPointQueries(*c, s, start, step, c->getName().c_str());
        }
    }
}

TEST(SamplingCurve, count__smallerOnlyForWhatCannotBeSampled) {
    auto c = overshoot();
    for (const auto& [start, step, count] : {std::tuple{seconds(0.0), kCMTimeZero, 0u},
                                             {seconds(0.0), seconds(-1.0), 0u},
                                             {kCMTimeInvalid, seconds(1.0), 0u},
                                             {seconds(0.0), kCMTimePositiveInfinity, 0u},
                                             {CMTimeMake(INT64_MAX - 5, 1), CMTimeMake(2, 1), 3u},
                                             {CMTimeMake(INT64_MAX - 5, 3), CMTimeMake(2, 2), 2u},
                                             {CMTimeMake(-INT64_MAX, 1), CMTimeMake(1, 1), 10u}})
        EXPECT_EQ(sample(*c, start, step, 10).count, count)
            << start.value << "/" << start.timescale;
    const Samples few = sample(*c, seconds(0.0), seconds(0.5), 3);
    EXPECT_EQ(few.times[3].flags, 0u) << "nothing is written past the count";
    // Either array may be absent.
    std::vector<double> values(11);
    double* v = values.data();
    CMTime* none = nullptr;
    unsigned count = 10;
    c->getSamples(nullptr, seconds(0.0), seconds(0.25), count, nullptr, &v);
    EXPECT_EQ(values[4], c->getCurveValue(seconds(1.0)));
    c->getSamples(nullptr, seconds(0.0), seconds(0.25), count, &none, nullptr);
    EXPECT_EQ(count, 10u);
    auto empty = makeChannel("empty");
    empty->setInitialValue(2.5);
    const Samples initial = sample(*empty, seconds(0.0), seconds(1.0), 4);
    EXPECT_EQ(initial.values, (std::vector<double>{2.5, 2.5, 2.5, 2.5, 0.0}));
}

TEST(SamplingCurve, processedCurve__addsEnabledOrSelectedBehavioursInOrder) {
    auto c = overshoot();
    c->addBehavior(std::make_unique<TQOscillateBehavior>(2.0, 1.5, 0.25));
    c->addBehavior(std::make_unique<TQNoiseBehavior>(1.0, 3.0, 42));
    c->getBehavior(1)->setSelected(true);
    const auto wave = [](double s) {
        return 2.0 * std::sin(2.0 * std::numbers::pi * (1.5 * s + 0.25));
    };
    const auto noise = [](double s) { return TQNoiseBehavior::noise(3.0 * s, 42); };
    const auto expectProcessed = [&](const auto& expected, const TQSampleContext* context,
                                     const char* what) {
        const Samples s = sample(*c, seconds(0.0), seconds(0.01), 200, context, true);
        ASSERT_EQ(s.count, 200u);
        for (unsigned i = 0; i < s.count; ++i) {
            const double secs = CMTimeGetSeconds(s.times[i]);
            EXPECT_NEAR(s.values[i], expected(secs), kValueTolerance) << what << " sample " << i;
            if (!context) {
                EXPECT_NEAR(s.values[i], c->getValueAsDouble(s.times[i]), kValueTolerance) << what;
            }
        }
    };
    const auto curve = [&](double s) {
        return c->getCurveValue(CMTimeMakeWithSeconds(s, 0x40000));
    };
    expectProcessed([&](double s) { return curve(s) + wave(s) + noise(s); }, nullptr, "both");
    TQSampleContext selected{true, true};
    expectProcessed([&](double s) { return curve(s) + noise(s); }, &selected, "the selected one");
    c->getBehavior(1)->setEnabled(false);
    EXPECT_TRUE(c->isChannelAffectedByBehaviors() && c->isChannelAffectedByBehaviors(false));
    EXPECT_FALSE(c->isChannelAffectedBySelectedBehaviors()) << "a disabled behaviour moves nothing";
    expectProcessed([&](double s) { return curve(s) + wave(s); }, nullptr, "the enabled one");
    TQSampleContext all{false, false};
    expectProcessed([&](double s) { return curve(s) + wave(s) + noise(s); }, &all,
                    "disabled ones too");
    c->setInitialValue(1.0);
    c->setAnimationEnabled(false);
    expectProcessed([&](double s) { return 1.0 + wave(s); }, nullptr, "the initial value");
    EXPECT_EQ(c->getValueAsDouble(seconds(1.0), NAN), 1.0);

    // Behaviours are owned in order; out of range answers nothing and removes nothing.
    EXPECT_FALSE(c->getBehavior(2) || c->removeBehavior(2));
    const std::unique_ptr<TQChannelBehavior> removed = c->removeBehavior(1);
    c->addBehavior(nullptr);
    ASSERT_TRUE(removed && c->numberOfBehaviors() == 1u);
    EXPECT_EQ(removed->kindName() + " " + c->getBehavior(0)->kindName(), "Noise Oscillate");
    c->removeBehavior(0);
    EXPECT_FALSE(c->isChannelAffectedByBehaviors(false));
}

TEST(SamplingCurve,
     behaviours__noiseIsDeterministicBoundedAndContinuousAndEachComparesItsParameters) {
    double previous = TQNoiseBehavior::noise(0.0, 9);
    for (double x = 0.001; x < 20.0; x += 0.001) {
        const double n = TQNoiseBehavior::noise(x, 9);
        ASSERT_LE(std::fabs(n), 1.0);
        ASSERT_LT(std::fabs(n - previous), 0.01) << "noise jumps at x=" << x;
        previous = n;
    }
    EXPECT_NE(TQNoiseBehavior::noise(3.5, 1), TQNoiseBehavior::noise(3.5, 2)) << "seed matters";
    EXPECT_EQ(TQNoiseBehavior::noise(INFINITY, 1), 0.0);
    const TQOscillateBehavior wave(1.0, 2.0, 0.5);
    const TQNoiseBehavior noise(1.0, 2.0, 7);
    EXPECT_TRUE(wave.clone()->equals(wave) && noise.clone()->equals(noise));
    EXPECT_FALSE(wave.equals(noise) || noise.equals(wave));
    for (const TQOscillateBehavior& other :
         {TQOscillateBehavior(1.5, 2.0, 0.5), TQOscillateBehavior(1.0, 2.5, 0.5),
          TQOscillateBehavior(1.0, 2.0, 0.0)})
        EXPECT_FALSE(wave.equals(other));
    for (const TQNoiseBehavior& other :
         {TQNoiseBehavior(1.5, 2.0, 7), TQNoiseBehavior(1.0, 2.5, 7), TQNoiseBehavior(1.0, 2.0, 8)})
        EXPECT_FALSE(noise.equals(other));
    auto disabled = noise.clone();
    disabled->setEnabled(false);
    EXPECT_FALSE(disabled->equals(noise)) << "the flags are part of a behaviour";
}

}  // namespace
