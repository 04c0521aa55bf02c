#include <gtest/gtest.h>

#include <climits>
#include <memory>
#include <tuple>
#include <utility>

#include "platform/channels/testing/ReferenceCurves.h"

using curve_catalogue::cloneOf;
using curve_catalogue::SteppedChannel;
using reference_curves::frame;

namespace {

// Keyframes on frames 0 to 40 with a segment of most kinds: Catmull-Rom segments at each end
// and after a step (their shape changes with new neighbours unless baked with care), the step
// (which a mirrored cycle runs backwards), broken handles, an ease and an Exp segment. The ends
// differ in value, so a repeated cycle jumps.
std::unique_ptr<TQChannel> mixedCurve(bool discrete = false) {
    std::unique_ptr<TQChannel> c = discrete ? std::make_unique<SteppedChannel>()
                                            : std::make_unique<TQChannel>("mixed", 1, 0.0);
    struct Key {
        int64_t frame;
        double value;
        unsigned interpolation;
    };
    const Key keys[] = {
        {0, 1.0, kTQInterpolationCatmullRom},  {6, 3.0, kTQInterpolationCatmullRom},
        {11, 2.0, kTQInterpolationBezier},     {17, -1.0, kTQInterpolationConstant},
        {22, 0.5, kTQInterpolationCatmullRom}, {25, 0.0, kTQInterpolationEaseOut},
        {27, 2.5, kTQInterpolationExp},        {32, 4.0, kTQInterpolationCatmullRom},
        {36, 2.0, kTQInterpolationCatmullRom}, {40, 3.0, kTQInterpolationBezier}};
    for (const Key& k : keys) {
        TQKeyframeHandle h = c->setKeyframe(frame(k.frame), k.value);
        c->setKeyframeInterpolation(h, k.interpolation);
    }
    TQKeyframeHandle broken = c->getKeyframe(frame(11));
    c->setKeyframeTangentsBroken(broken, true);
    c->setKeyframeInputTangents(broken, -0.05, 0.8);
    c->setKeyframeOutputTangents(broken, 0.1, -2.0);
    return c;
}

// The frames where the two curves differ, over the baked cycles and two cycles beyond on
// either side, where the extrapolation of the baked curve takes over. `blind` frames are left
// out: every `blind` frames from frame 40 on, beyond the baked keyframes.
int differingFrames(const TQChannel& expected, const TQChannel& baked, unsigned cycles,
                    int64_t blind = 0) {
    const int64_t reach = 40 * int64_t(cycles + 2);
    int differing = 0;
    for (int64_t k = -reach; k <= 40 + reach; ++k) {
        if (blind > 0 && k != 40 && (k - 40) % blind == 0) continue;
        const double want = expected.getCurveValue(frame(k));
        const double got = baked.getCurveValue(frame(k));
        if (!(std::fabs(want - got) <= 1e-9 * (1.0 + std::fabs(want)))) {
            ADD_FAILURE() << "frame " << k << ": " << got << " instead of " << want;
            if (++differing > 5) break;
        }
    }
    return differing;
}

TEST(CurveGenerate, bakes_cycles_that_equal_the_extrapolated_curve_at_every_frame) {
    const unsigned modes[] = {kTQExtrapolationRepeat, kTQExtrapolationPingPong,
                              kTQExtrapolationProgressive, kTQExtrapolationLinear,
                              kTQExtrapolationConstant};
    for (bool discrete : {false, true})
        for (unsigned mode : modes)
            for (unsigned direction : {kTQExtrapolationBefore, kTQExtrapolationAfter})
                for (unsigned cycles : {1u, 2u, 5u}) {
                    SCOPED_TRACE(testing::Message()
                                 << "mode " << mode << " direction " << direction << " cycles "
                                 << cycles << (discrete ? " discrete" : ""));
                    auto curve = mixedCurve(discrete);
                    curve->setExtrapolation(mode, kTQExtrapolationBefore);
                    curve->setExtrapolation(mode, kTQExtrapolationAfter);
                    auto baked = cloneOf(*curve);
                    baked->generateKeypoints(direction, cycles);

                    // A repeated curve that jumps shows the start of a cycle at each seam, but
                    // its last keyframe, now inside, keeps the value that ends one: where the
                    // longer span repeats beyond the new keyframes, so does that value.
                    const bool jumpBakedAfter =
                        mode == kTQExtrapolationRepeat && direction == kTQExtrapolationAfter;
                    const int64_t blind = jumpBakedAfter ? 40 * int64_t(cycles + 1) : 0;
                    EXPECT_EQ(differingFrames(*curve, *baked, cycles, blind), 0);
                    // The keyframes now reach over the cycles on the side baked.
                    const int64_t reach = 40 * int64_t(cycles);
                    EXPECT_EQ(std::pair(CMTimeGetSeconds(baked->getKeyframeMinTime()),
                                        CMTimeGetSeconds(baked->getKeyframeMaxTime())),
                              direction == kTQExtrapolationBefore
                                  ? std::pair(CMTimeGetSeconds(frame(-reach)),
                                              CMTimeGetSeconds(frame(40)))
                                  : std::pair(0.0, CMTimeGetSeconds(frame(40 + reach))));
                    EXPECT_EQ(reference_curves::backwardSegments(*baked), 0u);
                    EXPECT_EQ(baked->getKeyframeMaxValue(false),
                              reference_curves::greatestKeyframeValue(*baked));
                }
}

TEST(CurveGenerate, copies_keep_the_state_of_their_originals_and_existing_handles_stay) {
    auto curve = curve_catalogue::dense(12);
    curve->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter);
    const std::vector<TQKeyframeHandle> before = curve->getKeyframes(false);
    curve->setKeyframeValue(before.back(), curve->getCurveValue(curve->getKeyframeMinTime()));
    curve->setKeyframeLocked(before[3], true);
    const std::vector<TQKeyframeState> original = curve->getKeyframeStates();

    curve->generateKeypoints(kTQExtrapolationAfter, 2);

    for (TQKeyframeHandle h : before) EXPECT_TRUE(curve->getKeyframe(h, nullptr, nullptr));
    const std::vector<TQKeyframeState> baked = curve->getKeyframeStates();
    // The ends meet in value, so each seam is one keyframe: two cycles of 11 more.
    ASSERT_EQ(baked.size(), 12u + 2 * 11u);
    const CMTime period = CMTimeSubtract(original.back().time, original.front().time);
    const auto kept = [](const TQKeyframeState& k) {
        return std::tuple(k.value, k.inU, k.inV, k.outU, k.outV, k.interpolation, k.locked,
                          k.enabled, k.broken, k.scaled);
    };
    for (size_t i = 1; i + 1 < original.size(); ++i) {
        const TQKeyframeState& copy = baked[11 + i];
        EXPECT_EQ(CMTimeCompare(copy.time, CMTimeAdd(original[i].time, period)), 0);
        EXPECT_EQ(kept(copy), kept(original[i])) << "copy of keyframe " << i;
    }
    // At a seam the arriving handle is the last keyframe's, the leaving one the first's.
    const TQKeyframeState &seam = baked[11], &last = original.back(), &first = original.front();
    EXPECT_EQ(std::tuple(seam.inU, seam.inV, seam.outU, seam.outV),
              std::tuple(last.inU, last.inV, first.outU, first.outV));
}

TEST(CurveGenerate, refuses_what_it_cannot_bake_and_changes_nothing) {
    auto curve = mixedCurve();
    curve->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter);
    const auto untouched = cloneOf(*curve);
    curve_catalogue::AnnouncementCounter announced;
    curve->setChangeObserver(&announced);
    for (const auto& [what, direction, cycles] :
         {std::tuple<const char*, unsigned, unsigned>{"no cycle", kTQExtrapolationAfter, 0},
          {"unknown direction", 2, 1},
          {"more keyframes than a channel holds", kTQExtrapolationAfter, UINT_MAX},
          {"18 million keyframes", kTQExtrapolationAfter, 2'000'000}}) {
        curve->generateKeypoints(direction, cycles);
        EXPECT_TRUE(*curve == *untouched) << what;
    }

    // A single keyframe has no cycle to copy; cycles that would end past the range of time
    // cannot be made.
    auto single = std::make_unique<TQChannel>("single", 1, 0.0);
    single->setKeyframe(frame(3), 1.0);
    auto wide = std::make_unique<TQChannel>("wide", 1, 0.0);
    wide->setKeyframe(CMTimeMake(0, 1), 0.0);
    wide->setKeyframe(CMTimeMake(INT64_MAX / 3, 1), 1.0);
    for (TQChannel* c : {single.get(), wide.get()}) {
        c->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter);
        const auto before = cloneOf(*c);
        c->generateKeypoints(kTQExtrapolationAfter, 4);
        EXPECT_TRUE(*c == *before) << c->getName();
    }
    EXPECT_EQ(announced.count, 0) << "a refusal announces nothing";
    curve->generateKeypoints(kTQExtrapolationAfter, 1);
    EXPECT_EQ(announced.count, 1) << "a bake announces its change";
}

}  // namespace
