// The sample piece moves as an animator keyed it, in both families; the dense scene has the
// size it was asked for and is the same scene for the same seed.
#include <gtest/gtest.h>

#include <cmath>
#include <numbers>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannel.h"

namespace {

constexpr double kTolerance = 1e-6;

std::vector<TQChannel*> channelsOf(const TQHostScene& scene) {
    std::vector<TQChannel*> out;
    for (TQChannelObjectRootBase* object : scene.objects()) {
        std::vector<TQChannelBase*> channels;
        object->getAllDescendantsFlattened(channels, 0, true);
        for (TQChannelBase* c : channels) out.push_back(static_cast<TQChannel*>(c));
    }
    return out;
}

class SamplePiece : public ::testing::TestWithParam<TQHostObjectFamily> {
protected:
    TQChannel* channel(const char* object, TQHostProperty property, size_t axis = 0) {
        return dynamic_cast<TQChannel*>(
            TQChannelRef(TQHostPropertyPaths(GetParam(), property).at(axis))
                .getChannel(host.scene().objectNamed(object)));
    }
    static double at(const TQChannel* c, double seconds) {
        return c->getCurveValue(CMTimeMakeWithSeconds(seconds, 0x40000));
    }
    // The largest (sign 1) or smallest (sign -1) value over a span, sampled finely.
    static double peak(const TQChannel* c, double from, double to, double sign) {
        double best = -INFINITY;
        for (double t = from; t <= to; t += 1.0 / 240.0) best = std::max(best, sign * at(c, t));
        return sign * best;
    }
    TQHostAppDelegate host;
};

TEST_P(SamplePiece, piece__titleFliesInAndPopsLogoBouncesAndSpinsOneBehaviour) {
    TQHostLoadSampleScene(host, GetParam());
    EXPECT_EQ(CMTimeGetSeconds(host.displayRange().duration), 6.0);
    EXPECT_EQ(host.selectedObjectsRootChannels(),
              std::vector<TQChannelBase*>{host.scene().objectNamed(kTQHostSampleTitleObject)});
    EXPECT_FALSE(host.canUndo());
    size_t behaviours = 0;
    for (TQChannel* c : channelsOf(host.scene())) behaviours += c->numberOfBehaviors();
    EXPECT_EQ(behaviours, 1u) << "the logo's sway is the one behaviour";

    const TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const TQChannel* scale = channel(kTQHostSampleTitleObject, TQHostProperty::Scale);
    EXPECT_LT(at(x, 0.0), -960.0) << "the title starts outside a 1920-wide picture";
    EXPECT_GT(at(x, 0.75), -25.0) << "and slows into its rest";
    EXPECT_NEAR(peak(x, 0.8, 5.0, 1), 0.0, kTolerance) << "where it stays";
    EXPECT_GT(peak(scale, 0.3, 0.8, 1), 1.1) << "its scale overshoots";
    EXPECT_NEAR(at(scale, 1.2), 1.0, kTolerance);

    const TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const double floor = at(y, 3.0);
    EXPECT_GE(peak(y, 1.0, 6.0, -1), floor - kTolerance) << "the logo never sinks through";
    EXPECT_GT(peak(y, 1.5, 2.0, 1), peak(y, 2.0, 2.3, 1)) << "each bounce lower";
    const auto& rotation = TQHostPropertyPaths(GetParam(), TQHostProperty::Rotation);
    const TQChannel* spin =
        channel(kTQHostSampleBehaviorObject, TQHostProperty::Rotation, rotation.size() - 1);
    EXPECT_NEAR(at(spin, 2.0), std::numbers::pi, 1e-9);
    EXPECT_NEAR(at(spin, 5.9), at(spin, 3.9), 1e-9) << "the turn repeats past its keys";
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, SamplePiece,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

TEST(DenseScene, sizeAndSeed__asAskedAndTheSameForTheSameSeed) {
    const struct {
        TQHostObjectFamily family;
        TQHostDenseSceneSpec spec;
        size_t channels;  // in the objects, animated or not
        size_t keyframes;
    } cases[] = {
        {TQHostObjectFamily::Other, {.objects = 3, .keyframesPerChannel = 7}, 90, 630},
        {TQHostObjectFamily::Kestrel, {.objects = 2, .channelsPerObject = 4}, 58, 800},
        {TQHostObjectFamily::Kestrel, {.objects = 2, .totalKeyframes = 1001}, 60, 1001},
        {TQHostObjectFamily::Other,
         {.objects = 1, .channelsPerObject = 50, .channels = TQHostDenseChannels::Plain},
         50,
         5000},
    };
    for (const auto& c : cases) {
        TQHostScene scene(c.family), again(c.family);
        TQHostPopulateDenseScene(scene, c.spec);
        TQHostPopulateDenseScene(again, c.spec);
        const auto channels = channelsOf(scene), twins = channelsOf(again);
        ASSERT_EQ(channels.size(), c.channels);
        size_t keyframes = 0;
        for (size_t i = 0; i < channels.size(); ++i) {
            keyframes += channels[i]->numberOfKeyframes();
            EXPECT_TRUE(*channels[i] == *twins[i]) << "channel " << i << " differs, same seed";
        }
        EXPECT_EQ(keyframes, c.keyframes);
    }
    const TQHostDenseSceneSpec stress = TQHostStressSceneSpec();
    EXPECT_EQ(stress.objects * stress.channelsPerObject, 3000u);
    EXPECT_EQ(TQHostDenseKeyframesOfChannel(stress, 0), 334u) << "the remainder goes first";
    EXPECT_EQ(TQHostDenseKeyframesOfChannel(stress, 2999), 333u);
}

}  // namespace
