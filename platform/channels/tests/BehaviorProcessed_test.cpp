#include <gtest/gtest.h>

#include <cmath>
#include <numbers>
#include <vector>

#include "platform/channels/tests/CurveCatalogue.h"

using namespace curve_catalogue;

namespace {

constexpr unsigned kCount = 200;

class BehaviorProcessed : public ::testing::Test {
protected:
    void SetUp() override {
        c = overshoot();
        auto wave = std::make_unique<TQOscillateBehavior>(2.0, 1.5, 0.25);
        oscillate = wave.get();
        c->addBehavior(std::move(wave));
    }
    // Processed (context-free form) and keyframed (null context) samples over [0, 2).
    void sampleBoth() {
        processed.assign(kCount + 1, 0.0);
        keyframed.assign(kCount + 1, 0.0);
        times.assign(kCount + 1, kCMTimeInvalid);
        double* p = processed.data();
        double* k = keyframed.data();
        CMTime* t = times.data();
        unsigned n = kCount;
        c->getSamples(seconds(0.0), seconds(0.01), n, &t, &p);
        ASSERT_EQ(n, kCount);
        c->getSamples(nullptr, seconds(0.0), seconds(0.01), n, nullptr, &k);
        ASSERT_EQ(n, kCount);
    }
    std::unique_ptr<TQChannel> c;
    TQOscillateBehavior* oscillate = nullptr;
    std::vector<double> processed, keyframed;
    std::vector<CMTime> times;
};

TEST_F(BehaviorProcessed, oscillation__is_added_to_the_processed_curve_only) {
    sampleBoth();
    for (unsigned i = 0; i < kCount; ++i) {
        const double s = CMTimeGetSeconds(times[i]);
        const double wave = 2.0 * std::sin(2.0 * std::numbers::pi * (1.5 * s + 0.25));
        EXPECT_NEAR(keyframed[i], c->getCurveValue(times[i]), kValueTolerance);
        EXPECT_NEAR(processed[i], keyframed[i] + wave, kValueTolerance) << "sample " << i;
        EXPECT_NEAR(processed[i], c->getValueAsDouble(times[i]), kValueTolerance);
    }
}

TEST_F(BehaviorProcessed, disabled_behaviour__leaves_the_processed_curve_keyframed) {
    EXPECT_TRUE(c->isChannelAffectedByBehaviors());
    oscillate->setEnabled(false);
    EXPECT_FALSE(c->isChannelAffectedByBehaviors());
    EXPECT_TRUE(c->isChannelAffectedByBehaviors(false)) << "it still carries one";
    sampleBoth();
    for (unsigned i = 0; i < kCount; ++i) EXPECT_EQ(processed[i], keyframed[i]);
}

TEST_F(BehaviorProcessed, selection__gates_the_selected_question_and_context) {
    EXPECT_FALSE(c->isChannelAffectedBySelectedBehaviors());
    c->addBehavior(std::make_unique<TQNoiseBehavior>(1.0, 3.0, 42));
    c->getBehavior(1)->setSelected(true);
    EXPECT_TRUE(c->isChannelAffectedBySelectedBehaviors());

    TQSampleContext onlySelected;
    onlySelected.selectedBehaviorsOnly = true;
    double value = 0.0;
    double* v = &value;
    unsigned n = 1;
    c->getSamples(&onlySelected, seconds(0.37), seconds(1.0), n, nullptr, &v);
    const double expected = c->getCurveValue(seconds(0.37)) +
                            TQNoiseBehavior::noise(3.0 * CMTimeGetSeconds(seconds(0.37)), 42);
    EXPECT_NEAR(value, expected, kValueTolerance) << "only the selected noise applies";
}

TEST_F(BehaviorProcessed, noise__is_deterministic_bounded_and_continuous) {
    double previous = TQNoiseBehavior::noise(0.0, 9);
    for (double x = 0.001; x < 20.0; x += 0.001) {
        const double n = TQNoiseBehavior::noise(x, 9);
        ASSERT_LE(std::fabs(n), 1.0);
        ASSERT_LT(std::fabs(n - previous), 0.01) << "noise jumps at x=" << x;
        ASSERT_EQ(n, TQNoiseBehavior::noise(x, 9)) << "same input, same noise";
        previous = n;
    }
    EXPECT_NE(TQNoiseBehavior::noise(3.5, 1), TQNoiseBehavior::noise(3.5, 2)) << "seed matters";
}

TEST_F(BehaviorProcessed, disabled_animation__processes_the_initial_value) {
    c->setInitialValue(1.0);
    c->setAnimationEnabled(false);
    sampleBoth();
    const double t = CMTimeGetSeconds(times[10]);
    EXPECT_NEAR(processed[10], 1.0 + 2.0 * std::sin(2.0 * std::numbers::pi * (1.5 * t + 0.25)),
                kValueTolerance);
}

}  // namespace
