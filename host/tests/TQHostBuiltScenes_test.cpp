// The sample piece moves as an animator keyed it, in both families; the dense scene has the
// size it was asked for and is the same scene for the same seed.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <numbers>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

constexpr double kTolerance = 1e-6;
// Channel times have 0x40000 ticks a second, so a frame time is exact to half a tick.
constexpr double kHalfTickInFrames = 0.5 * 30.0 / 0x40000;

class SamplePiece : public ::testing::TestWithParam<TQHostObjectFamily> {
protected:
    void SetUp() override { TQHostLoadSampleScene(host, GetParam()); }

    TQChannel* channel(const char* object, TQHostProperty property, size_t axis = 0) {
        const auto& paths = TQHostPropertyPaths(GetParam(), property);
        if (axis >= paths.size()) return nullptr;
        return dynamic_cast<TQChannel*>(
            TQChannelRef(paths[axis]).getChannel(host.scene().objectNamed(object)));
    }
    // The angle in the picture's plane: the last of the rotation's paths.
    TQChannel* spin(const char* object) {
        return channel(object, TQHostProperty::Rotation,
                       TQHostPropertyPaths(GetParam(), TQHostProperty::Rotation).size() - 1);
    }
    static double at(const TQChannel* c, double seconds) {
        return c->getCurveValue(CMTimeMakeWithSeconds(seconds, 0x40000));
    }
    static double extreme(const TQChannel* c, double from, double to, int sign) {
        double best = -sign * INFINITY;
        for (double t = from; t <= to; t += 1.0 / 240.0)
            best = sign > 0 ? std::max(best, at(c, t)) : std::min(best, at(c, t));
        return best;
    }

    TQHostAppDelegate host;
};

TEST_P(SamplePiece, load__sixSecondsOnFramesTitleSelectedCleanHistory) {
    EXPECT_EQ(CMTimeGetSeconds(host.displayRange().duration), 6.0);
    EXPECT_EQ(host.getFrameDuration(), CMTimeMake(1, 30));
    const auto objects = host.scene().objects();
    ASSERT_EQ(objects.size(), 4u);
    EXPECT_EQ(host.selectedObjectsRootChannels(),
              std::vector<TQChannelBase*>{host.scene().objectNamed(kTQHostSampleTitleObject)});
    EXPECT_FALSE(host.canUndo());
    EXPECT_TRUE(host.modifiedChannels().empty());

    size_t behaviours = 0;
    for (TQChannelObjectRootBase* object : objects) {
        std::vector<TQChannelBase*> channels;
        object->getAllDescendantsFlattened(channels, 0, true);
        for (TQChannelBase* base : channels) {
            auto* c = static_cast<TQChannel*>(base);
            behaviours += c->numberOfBehaviors();
            for (TQKeyframeHandle key : c->getKeyframes(false)) {
                CMTime t = kCMTimeInvalid;
                c->getKeyframe(key, &t, nullptr);
                const double frame = CMTimeGetSeconds(t) * 30.0;
                EXPECT_NEAR(frame, std::round(frame), kHalfTickInFrames)
                    << object->getName() << "/" << c->getName() << " keyed between frames";
                EXPECT_TRUE(frame >= 0.0 && std::round(frame) <= kTQHostSampleFrames)
                    << object->getName() << "/" << c->getName() << " keyed outside the piece";
            }
        }
    }
    EXPECT_EQ(behaviours, 1u) << "the logo's sway is the one behaviour";
    EXPECT_EQ(CMTimeGetSeconds(host.scene().objectNamed(kTQHostSampleOffsetObject)->timeOffset()),
              1.0);
}

TEST_P(SamplePiece, title__fliesInEasedAndItsScaleOvershoots) {
    const TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const TQChannel* scale = channel(kTQHostSampleTitleObject, TQHostProperty::Scale);
    ASSERT_TRUE(x && scale);
    EXPECT_LT(at(x, 0.0), -960.0) << "starts outside a 1920-wide picture";
    EXPECT_NEAR(at(x, 0.8), 0.0, kTolerance);
    EXPECT_GT(at(x, 0.4) - at(x, 0.0), at(x, 0.8) - at(x, 0.4)) << "not slowing into its rest";
    EXPECT_GT(at(x, 0.75), -25.0) << "the arrival should be eased, not abrupt";
    EXPECT_NEAR(extreme(x, 0.8, 5.0, 1), 0.0, kTolerance) << "it must rest without drifting";

    EXPECT_GT(extreme(scale, 0.3, 0.8, 1), 1.1) << "the pop must overshoot full size";
    EXPECT_LT(extreme(scale, 0.6, 1.0, -1), 1.0) << "and come back under it";
    EXPECT_NEAR(at(scale, 1.2), 1.0, kTolerance) << "before it settles";
}

TEST_P(SamplePiece, logo__bouncesToRestAndSpinsForEver) {
    const TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const TQChannel* turn = spin(kTQHostSampleBehaviorObject);
    ASSERT_TRUE(y && turn);
    const double floor = at(y, 1.5);
    EXPECT_GE(extreme(y, 1.0, 6.0, -1), floor - kTolerance) << "it must not sink through";
    const double first = extreme(y, 1.5, 2.0, 1), second = extreme(y, 2.0, 2.3, 1);
    EXPECT_GT(first, second) << "each bounce lower than the last";
    EXPECT_GT(second, floor);
    EXPECT_NEAR(at(y, 3.0), floor, kTolerance) << "at rest on the floor";

    EXPECT_NEAR(at(turn, 2.0), std::numbers::pi, 1e-9) << "half a turn a second";
    for (double t : {3.25, 4.5, 5.9})
        EXPECT_NEAR(at(turn, t), at(turn, t - 2.0), 1e-9) << "the turn must repeat at " << t;
    EXPECT_EQ(turn->numberOfKeyframes(), 2u) << "the repetition is the extrapolation's";
    const TQChannel* sway = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position);
    EXPECT_EQ(sway->numberOfKeyframes(), 0u);
    EXPECT_NE(sway->getValueAsDouble(CMTimeMake(1, 2)), sway->getValueAsDouble(kCMTimeZero))
        << "the behaviour must move the keyless channel";
}

TEST_P(SamplePiece, lowerThirdAndBackground__slideHoldAndDrift) {
    const TQChannel* slide = channel(kTQHostSampleOffsetObject, TQHostProperty::Position);
    const TQChannel* fade = channel(kTQHostSampleOffsetObject, TQHostProperty::Opacity);
    ASSERT_TRUE(slide && fade);
    // Layer time: in at 0.5-1 s, out at 3.5-4 s, which the scene shows 1 s later.
    EXPECT_LT(at(slide, 0.5), -960.0);
    EXPECT_NEAR(at(slide, 2.0), at(slide, 3.0), kTolerance) << "it holds in the picture";
    EXPECT_GT(at(slide, 2.0), -960.0);
    EXPECT_LT(at(slide, 4.0), -960.0);
    EXPECT_NEAR(at(fade, 0.5), 0.0, kTolerance);
    EXPECT_NEAR(at(fade, 2.0), 1.0, kTolerance);

    const TQChannel* drift = channel(kTQHostSampleQuaternionObject, TQHostProperty::Position);
    ASSERT_NE(drift, nullptr);
    const double speed = at(drift, 3.0) - at(drift, 2.0);
    EXPECT_GT(speed, 0.0);
    EXPECT_NEAR(at(drift, 7.0) - at(drift, 6.0), speed, kTolerance) << "the drift carries on";
    EXPECT_NEAR(at(drift, -1.0) - at(drift, -2.0), speed, kTolerance);
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, SamplePiece,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

std::vector<TQChannel*> denseChannels(const TQHostScene& scene) {
    std::vector<TQChannel*> out;
    for (TQChannelObjectRootBase* object : scene.objects()) {
        std::vector<TQChannelBase*> channels;
        object->getAllDescendantsFlattened(channels, 0, true);
        for (TQChannelBase* c : channels) out.push_back(static_cast<TQChannel*>(c));
    }
    return out;
}

size_t keyframeCount(const TQHostScene& scene) {
    size_t n = 0;
    for (TQChannel* c : denseChannels(scene)) n += c->numberOfKeyframes();
    return n;
}

TEST(DenseScene, size__objectsChannelsAndKeyframesAsAsked) {
    struct Case {
        const char* what;
        TQHostObjectFamily family;
        TQHostDenseSceneSpec spec;
        size_t channelsPerObject;  // in the objects, animated or not
        size_t keyframes;
    };
    const Case cases[] = {
        {"kestrel model topped up",
         TQHostObjectFamily::Kestrel,
         {.objects = 3, .channelsPerObject = 30, .keyframesPerChannel = 7},
         30,
         3 * 30 * 7},
        {"other model topped up",
         TQHostObjectFamily::Other,
         {.objects = 2, .channelsPerObject = 30, .keyframesPerChannel = 5},
         30,
         2 * 30 * 5},
        {"fewer than the model: the rest stay still",
         TQHostObjectFamily::Kestrel,
         {.objects = 2, .channelsPerObject = 4, .keyframesPerChannel = 9},
         29,
         2 * 4 * 9},
        {"a total spread with a remainder",
         TQHostObjectFamily::Kestrel,
         {.objects = 2, .channelsPerObject = 30, .totalKeyframes = 1001},
         30,
         1001},
        {"plain",
         TQHostObjectFamily::Kestrel,
         {.objects = 1,
          .channelsPerObject = 50,
          .keyframesPerChannel = 3,
          .channels = TQHostDenseChannels::Plain},
         50,
         150},
    };
    for (const Case& c : cases) {
        TQHostScene scene(c.family);
        TQHostPopulateDenseScene(scene, c.spec);
        ASSERT_EQ(scene.numberOfObjects(), c.spec.objects) << c.what;
        EXPECT_EQ(denseChannels(scene).size(), c.spec.objects * c.channelsPerObject) << c.what;
        EXPECT_EQ(keyframeCount(scene), c.keyframes) << c.what;
    }
    {  // The remainder goes to the first channels, one each.
        const TQHostDenseSceneSpec spec{.objects = 2, .channelsPerObject = 3, .totalKeyframes = 20};
        std::vector<size_t> shares;
        for (size_t i = 0; i < 6; ++i) shares.push_back(TQHostDenseKeyframesOfChannel(spec, i));
        EXPECT_EQ(shares, (std::vector<size_t>{4, 4, 3, 3, 3, 3}));
    }
    const TQHostDenseSceneSpec stress = TQHostStressSceneSpec();
    EXPECT_EQ(stress.objects * stress.channelsPerObject, 3000u);
    EXPECT_EQ(stress.totalKeyframes, 1'000'000u);
}

TEST(DenseScene, seed__sameSeedSameSceneAndBandsStack) {
    const TQHostDenseSceneSpec spec{
        .objects = 2, .channelsPerObject = 30, .keyframesPerChannel = 6};
    TQHostScene a, b, other;
    TQHostPopulateDenseScene(a, spec);
    TQHostPopulateDenseScene(b, spec);
    TQHostDenseSceneSpec reseeded = spec;
    reseeded.seed = 2;
    TQHostPopulateDenseScene(other, reseeded);
    const auto ca = denseChannels(a), cb = denseChannels(b), co = denseChannels(other);
    size_t differing = 0;
    for (size_t i = 0; i < ca.size(); ++i) {
        EXPECT_TRUE(*ca[i] == *cb[i]) << "channel " << i << " differs for the same seed";
        differing += !(*ca[i] == *co[i]);
    }
    EXPECT_GT(differing, ca.size() / 2) << "another seed should give another scene";

    {  // Over-range components are keyed across their position range, not the seconds.
        CMTime last = kCMTimeInvalid;
        for (TQChannel* c : ca)
            if (dynamic_cast<TQChannel2DOverRange*>(c->getParent()))
                c->getLastKeyframe(&last, nullptr);
        ASSERT_TRUE(CMTIME_IS_VALID(last));
        EXPECT_LT(CMTimeGetSeconds(last), 1.0);
    }
    {  // Plain curves stacked in bands of 2 with a wave of 0.5 never cross.
        TQHostScene scene;
        TQHostPopulateDenseScene(scene, {.objects = 1,
                                         .channelsPerObject = 5,
                                         .keyframesPerChannel = 40,
                                         .channels = TQHostDenseChannels::Plain,
                                         .bandSpacing = 2.0,
                                         .amplitude = 0.5});
        const auto channels = denseChannels(scene);
        for (size_t i = 0; i < channels.size(); ++i) {
            EXPECT_GE(channels[i]->getKeyframeMinValue(), 2.0 * i - 0.5 - kTolerance) << i;
            EXPECT_LE(channels[i]->getKeyframeMaxValue(), 2.0 * i + 0.5 + kTolerance) << i;
        }
    }
}

}  // namespace
