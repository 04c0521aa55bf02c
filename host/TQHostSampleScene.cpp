#include "host/TQHostSampleScene.h"

#include <numbers>
#include <optional>
#include <vector>

#include "host/internal/TQHostSceneLoading.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

constexpr int kChannelTimescale = 0x40000;
constexpr double kFps = kTQHostSampleFramesPerSecond;

CMTime frameTime(double frame) {
    return TQTarnTimeForChannelSeconds(frame / kFps, kChannelTimescale);
}

// One keypoint as an animator sets it: a frame, a value, the interpolation of the segment that
// leaves it and, where the automatic handles would not give the motion, the slope of its
// handles in units per second (a different leaving slope breaks them) and their reach as a
// share of the segment on each side.
struct Key {
    double frame;
    double value;
    unsigned interpolation = kTQInterpolationBezier;
    std::optional<double> slope = std::nullopt;
    std::optional<double> outSlope = std::nullopt;
    double inReach = 1.0 / 3.0;
    double outReach = 1.0 / 3.0;
};

void animate(TQChannel* channel, const std::vector<Key>& keys) {
    if (!channel) return;
    std::vector<TQKeyframeHandle> handles;
    handles.reserve(keys.size());
    for (const Key& k : keys) handles.push_back(channel->setKeyframe(frameTime(k.frame), k.value));
    // Handles once every keypoint is in: the automatic slope looks at both neighbours.
    for (size_t i = 0; i < keys.size(); ++i) {
        const Key& k = keys[i];
        channel->setKeyframeInterpolation(handles[i], k.interpolation);
        if (!k.slope) {
            channel->smoothKeyframe(handles[i], false);
            continue;
        }
        const double before = i > 0 ? (k.frame - keys[i - 1].frame) / kFps : 0.0;
        const double after = i + 1 < keys.size() ? (keys[i + 1].frame - k.frame) / kFps : before;
        const double inU = k.inReach * (i > 0 ? before : after);
        const double outU = k.outReach * after;
        const double outSlope = k.outSlope.value_or(*k.slope);
        channel->setKeyframeTangentsBroken(handles[i], outSlope != *k.slope);
        channel->setKeyframeInputTangents(handles[i], -inU, -inU * *k.slope);
        channel->setKeyframeOutputTangents(handles[i], outU, outU * outSlope);
    }
}

// The channels of one object of the piece, by property and axis, in its family.
class Rig {
public:
    Rig(TQChannelObjectRootBase& object, TQHostObjectFamily family)
        : _object(object), _family(family) {}

    TQChannel* at(TQHostProperty property, size_t axis = 0) const {
        const std::vector<BNString>& paths = TQHostPropertyPaths(_family, property);
        return axis < paths.size() ? channel(paths[axis]) : nullptr;
    }
    TQChannel* x(TQHostProperty property) const { return at(property, 0); }
    TQChannel* y(TQHostProperty property) const { return at(property, 1); }
    // The turn in the picture's plane: the Z angle of a 3D rotation, or the one angle.
    TQChannel* spin() const {
        return at(TQHostProperty::Rotation,
                  TQHostPropertyPaths(_family, TQHostProperty::Rotation).size() - 1);
    }
    TQChannel* volume() const { return channel(TQHostTypedPaths(_family).volume); }

private:
    TQChannel* channel(const BNString& path) const {
        return dynamic_cast<TQChannel*>(TQChannelRef(path).getChannel(&_object));
    }

    TQChannelObjectRootBase& _object;
    TQHostObjectFamily _family;
};

using P = TQHostProperty;

void animateTitle(const Rig& rig) {
    // In from the left with a hard ease into its rest; out to the right, slow to start.
    animate(rig.x(P::Position), {{.frame = 0, .value = -1400, .slope = 5200, .outReach = 0.25},
                                 {.frame = 24, .value = 0, .slope = 0, .inReach = 0.65},
                                 {.frame = 150, .value = 0, .slope = 0, .outReach = 0.6},
                                 {.frame = 170, .value = 1500, .slope = 6000, .inReach = 0.25}});
    animate(rig.y(P::Position), {{.frame = 0, .value = 300, .slope = -900, .outReach = 0.25},
                                 {.frame = 24, .value = 110, .slope = 0, .inReach = 0.65}});
    // The pop: past full size, back under it, settled.
    const std::vector<Key> pop = {{.frame = 4, .value = 0.3},
                                  {.frame = 16, .value = 1.18},
                                  {.frame = 24, .value = 0.95},
                                  {.frame = 31, .value = 1.02},
                                  {.frame = 36, .value = 1.0}};
    animate(rig.x(P::Scale), pop);
    animate(rig.y(P::Scale), pop);
    animate(rig.x(P::Opacity),
            {{.frame = 0, .value = 0, .interpolation = kTQInterpolationLinear},
             {.frame = 12, .value = 1, .interpolation = kTQInterpolationLinear},
             {.frame = 150, .value = 1, .interpolation = kTQInterpolationLinear},
             {.frame = 170, .value = 0, .interpolation = kTQInterpolationLinear}});
}

void animateLogo(const Rig& rig) {
    animate(rig.x(P::Opacity),
            {{.frame = 28, .value = 0, .interpolation = kTQInterpolationLinear},
             {.frame = 31, .value = 1, .interpolation = kTQInterpolationLinear}});
    // Dropped from above the picture at 1 s: parabolic falls and rises (handles a third of
    // each segment long reproduce a parabola), each contact a broken handle pair, each
    // bounce lower than the last.
    animate(rig.y(P::Position), {{.frame = 30, .value = 560, .slope = 0},
                                 {.frame = 45, .value = -180, .slope = -2960, .outSlope = 1650},
                                 {.frame = 53, .value = 40, .slope = 0},
                                 {.frame = 61, .value = -180, .slope = -1650, .outSlope = 1200},
                                 {.frame = 66, .value = -80, .slope = 0},
                                 {.frame = 71, .value = -180, .slope = -1200, .outSlope = 700},
                                 {.frame = 74, .value = -145, .slope = 0},
                                 {.frame = 77, .value = -180, .slope = -700, .outSlope = 0}});
    // Squash and stretch at the first two contacts: wider and flatter, then back.
    const struct {
        double frame, width, height;
    } squash[] = {{43, 1.0, 1.0}, {45, 1.22, 0.75}, {49, 0.95, 1.06}, {53, 1.0, 1.0},
                  {59, 1.0, 1.0}, {61, 1.1, 0.88},  {64, 1.0, 1.0}};
    std::vector<Key> width, height;
    for (const auto& k : squash) {
        width.push_back({.frame = k.frame, .value = k.width});
        height.push_back({.frame = k.frame, .value = k.height});
    }
    animate(rig.x(P::Scale), width);
    animate(rig.y(P::Scale), height);
    // One turn in two seconds, repeated by the extrapolation for as long as the piece runs.
    if (TQChannel* spin = rig.spin()) {
        animate(spin, {{.frame = 30, .value = 0, .interpolation = kTQInterpolationLinear},
                       {.frame = 90,
                        .value = 2.0 * std::numbers::pi,
                        .interpolation = kTQInterpolationLinear}});
        spin->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter);
    }
    // The turn goes round a point off the logo's centre: one keypoint, never animated.
    animate(rig.x(P::Pivot), {{.frame = 0, .value = 36}});
    // A sway that no keypoint makes.
    if (TQChannel* sway = rig.x(P::Position))
        sway->addBehavior(std::make_unique<TQOscillateBehavior>(24.0, 0.5));
}

void animateLowerThird(const Rig& rig) {
    // Frames of the layer's own time: it starts 1 s into the piece.
    animate(rig.x(P::Position), {{.frame = 15, .value = -1500, .slope = 7000, .outReach = 0.25},
                                 {.frame = 30, .value = -560, .slope = 0, .inReach = 0.6},
                                 {.frame = 105, .value = -560, .slope = 0, .outReach = 0.6},
                                 {.frame = 120, .value = -1500, .slope = -7000, .inReach = 0.25}});
    // Leans into each move.
    animate(rig.x(P::Shear), {{.frame = 15, .value = 0.3},
                              {.frame = 28, .value = 0},
                              {.frame = 107, .value = 0},
                              {.frame = 120, .value = -0.3}});
    animate(rig.x(P::Opacity),
            {{.frame = 15, .value = 0, .interpolation = kTQInterpolationLinear},
             {.frame = 21, .value = 1, .interpolation = kTQInterpolationLinear},
             {.frame = 114, .value = 1, .interpolation = kTQInterpolationLinear},
             {.frame = 120, .value = 0, .interpolation = kTQInterpolationLinear}});
    // Its height is set, not animated.
    if (TQChannel* height = rig.y(P::Position)) height->setInitialValue(-380.0);
}

void animateBackground(const Rig& rig) {
    // A slow drift that carries on past both ends.
    const auto drift = [](TQChannel* channel, double from, double to) {
        animate(
            channel,
            {{.frame = 0, .value = from, .interpolation = kTQInterpolationLinear},
             {.frame = kTQHostSampleFrames, .value = to, .interpolation = kTQInterpolationLinear}});
        if (!channel) return;
        channel->setExtrapolation(kTQExtrapolationLinear, kTQExtrapolationBefore);
        channel->setExtrapolation(kTQExtrapolationLinear, kTQExtrapolationAfter);
    };
    drift(rig.x(P::Position), -60, 60);
    drift(rig.y(P::Position), 20, -20);
    const std::vector<Key> push = {
        {.frame = 0, .value = 1.0, .interpolation = kTQInterpolationEaseBoth},
        {.frame = kTQHostSampleFrames, .value = 1.12}};
    animate(rig.x(P::Scale), push);
    animate(rig.y(P::Scale), push);
    animate(rig.spin(), {{.frame = 0, .value = -0.03, .interpolation = kTQInterpolationEaseBoth},
                         {.frame = kTQHostSampleFrames, .value = 0.03}});
    // A speed ramp into half speed and back. The retime value is the offset of source time
    // from the layer's time, so half speed is a slope of -0.5.
    animate(rig.at(P::Retiming, 0), {{.frame = 0, .value = 0, .slope = 0},
                                     {.frame = 84, .value = 0, .slope = 0, .outReach = 0.5},
                                     {.frame = 108, .value = -0.4, .slope = -0.5},
                                     {.frame = 150, .value = -1.1, .slope = -0.5},
                                     {.frame = 174, .value = -1.3, .slope = 0, .inReach = 0.5}});
    // The second family also keys the speed itself.
    animate(rig.at(P::Retiming, 1), {{.frame = 84, .value = 1.0},
                                     {.frame = 108, .value = 0.5},
                                     {.frame = 150, .value = 0.5},
                                     {.frame = 174, .value = 1.0}});
    // Dimmed behind the titles: set, not animated.
    if (TQChannel* opacity = rig.x(P::Opacity)) opacity->setInitialValue(0.85);
    // The music fades out over the last second.
    animate(rig.volume(),
            {{.frame = 150, .value = 1.0}, {.frame = kTQHostSampleFrames, .value = 0}});
}

}  // namespace

void TQHostPopulateSampleScene(TQHostScene& scene) {
    const TQHostObjectFamily family = scene.family();
    const BNTimeRange piece{kCMTimeZero,
                            CMTimeMake(kTQHostSampleFrames, kTQHostSampleFramesPerSecond)};

    TQChannelObjectRootBase* title = scene.addObject(kTQHostSampleTitleObject);
    title->setTimeExtent(piece);
    animateTitle(Rig(*title, family));

    TQChannelObjectRootBase* logo = scene.addObject(kTQHostSampleBehaviorObject);
    logo->setTimeExtent(piece);
    animateLogo(Rig(*logo, family));

    TQChannelObjectRootBase* lowerThird = scene.addObject(kTQHostSampleOffsetObject);
    lowerThird->setTimeOffset(CMTimeMake(1, 1));
    lowerThird->setTimeExtent({CMTimeMake(1, 1), CMTimeMake(5, 1)});
    animateLowerThird(Rig(*lowerThird, family));

    TQChannelObjectRootBase* background =
        scene.addObject(kTQHostSampleQuaternionObject, {scene.isKestrel()});
    background->setTimeExtent(piece);
    animateBackground(Rig(*background, family));
}

void TQHostLoadSampleScene(TQHostAppDelegate& host, TQHostObjectFamily family) {
    TQHostLoadBuiltScene(
        host, family, CMTimeMake(1, kTQHostSampleFramesPerSecond),
        CMTimeRangeMake(kCMTimeZero, CMTimeMake(kTQHostSampleFrames, kTQHostSampleFramesPerSecond)),
        TQHostPopulateSampleScene);
}
