#include "host/TQHostSampleScene.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <numbers>
#include <string>

#include "host/TQHostAppDelegate.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

constexpr int kFramesPerSecond = 30;
constexpr int kSceneFrames = 10 * kFramesPerSecond;
constexpr int kChannelTimescale = 0x40000;

constexpr std::array<unsigned, 9> kAllInterpolations = {
    kTQInterpolationLinear,   kTQInterpolationBezier,   kTQInterpolationCatmullRom,
    kTQInterpolationConstant, kTQInterpolationEaseBoth, kTQInterpolationEaseOut,
    kTQInterpolationEaseIn,   kTQInterpolationExp,      kTQInterpolationLog,
};
// What an angle under a quaternion rotation takes: everything but Exp and Log.
constexpr std::array<unsigned, 7> kQuaternionInterpolations = {
    kTQInterpolationLinear,   kTQInterpolationBezier,   kTQInterpolationCatmullRom,
    kTQInterpolationConstant, kTQInterpolationEaseBoth, kTQInterpolationEaseOut,
    kTQInterpolationEaseIn,
};

// xorshift32: small, and the same sequence on every machine.
class Generator {
public:
    explicit Generator(uint32_t seed) : _state(seed ? seed : 0x9e3779b9u) {}
    uint32_t next() {
        _state ^= _state << 13;
        _state ^= _state >> 17;
        _state ^= _state << 5;
        return _state;
    }
    // Uniform in [0, 1).
    double unit() { return static_cast<double>(next() >> 8) / static_cast<double>(1u << 24); }

private:
    uint32_t _state;
};

struct KeySpec {
    int count;
    double base;
    double amplitude;
    bool positive = false;      // values kept above zero (scales, decibel amplitudes)
    int frames = kSceneFrames;  // the span the keys spread over, in frames
};

CMTime frameTime(int frame) {
    return TQTarnTimeForChannelSeconds(static_cast<double>(frame) / kFramesPerSecond,
                                       kChannelTimescale);
}

// Keys at distinct frames spread over the span, each a smooth wave plus a random step, with
// interpolations cycling through the allowed kinds from a random start.
template <size_t N>
void addKeys(TQChannel* channel, const KeySpec& spec, Generator& random,
             const std::array<unsigned, N>& interpolations, double density) {
    if (!channel) return;
    const int count = std::max(2, static_cast<int>(std::lround(spec.count * density)));
    const size_t firstKind = random.next() % N;
    const double phase = random.unit() * 2.0 * std::numbers::pi;
    int lastFrame = -1;
    for (int k = 0; k < count; ++k) {
        // Evenly spaced, shaken by up to a third of the spacing, never on an earlier frame.
        const double spacing = static_cast<double>(spec.frames) / count;
        int frame = static_cast<int>(k * spacing + (random.unit() - 0.5) * spacing / 1.5);
        frame = std::clamp(frame, lastFrame + 1, spec.frames - 1);
        if (frame <= lastFrame) break;  // the span is full
        lastFrame = frame;

        double value = spec.base + spec.amplitude * (0.7 * std::sin(phase + 0.35 * k) +
                                                     0.3 * (random.unit() * 2.0 - 1.0));
        if (spec.positive) value = std::max(value, 0.05);
        TQKeyframeHandle handle = channel->setKeyframe(frameTime(frame), value);
        channel->setKeyframeInterpolation(handle, interpolations[(firstKind + k) % N]);
    }
}

TQChannelBase* find(TQChannelBase* object, const BNString& path) {
    return TQChannelRef(path).getChannel(object);
}

TQChannel* channelAt(TQChannelBase* object, const BNString& path) {
    return dynamic_cast<TQChannel*>(find(object, path));
}

void animateObject(TQChannelObjectRootBase& object, TQHostObjectFamily family, Generator& random,
                   double density, bool quaternionRotation) {
    auto paths = [family](TQHostProperty property) {
        return TQHostPropertyPaths(family, property);
    };
    const TQHostTypedChannelPaths& typed = TQHostTypedPaths(family);

    for (const BNString& path : paths(TQHostProperty::Position))
        addKeys(channelAt(&object, path), {60, 0.0, 200.0}, random, kAllInterpolations, density);

    const auto rotations = paths(TQHostProperty::Rotation);
    const int rotationKeys = rotations.size() > 1 ? 30 : 60;
    for (const BNString& path : rotations) {
        if (quaternionRotation)
            addKeys(channelAt(&object, path), {rotationKeys, 0.0, 1.5}, random,
                    kQuaternionInterpolations, density);
        else
            addKeys(channelAt(&object, path), {rotationKeys, 0.0, 1.5}, random, kAllInterpolations,
                    density);
    }

    const auto scales = paths(TQHostProperty::Scale);
    for (size_t axis = 0; axis < std::min<size_t>(scales.size(), 2); ++axis)
        addKeys(channelAt(&object, scales[axis]), {25, 1.0, 0.5, true}, random, kAllInterpolations,
                density);

    for (const BNString& path : paths(TQHostProperty::Opacity))
        addKeys(channelAt(&object, path), {20, 0.6, 0.4, true}, random, kAllInterpolations,
                density);

    static constexpr std::array<unsigned, 1> kConstant = {kTQInterpolationConstant};
    addKeys(channelAt(&object, typed.visible), {8, 0.5, 0.7}, random, kConstant, density);
    addKeys(channelAt(&object, typed.volume), {12, 1.0, 0.6, true}, random, kAllInterpolations,
            density);
    addKeys(channelAt(&object, typed.softness), {10, 0.5, 0.4}, random, kAllInterpolations,
            density);
    addKeys(channelAt(&object, typed.fontIndex), {5, 3.0, 3.0, true}, random, kConstant, density);

    // The over-range pair's X axis is a position 0..1, carried as 0..1 s.
    if (auto* gradient = dynamic_cast<TQChannelPair*>(find(&object, typed.gradient))) {
        addKeys(gradient->getXChannel(), {6, 0.5, 0.5, false, kFramesPerSecond}, random,
                kAllInterpolations, density);
        addKeys(gradient->getYChannel(), {6, 0.5, 0.5, false, kFramesPerSecond}, random,
                kAllInterpolations, density);
    }
}

BNString objectName(size_t index) {
    static const std::array<const char*, 4> kNames = {"Title", kTQHostSampleBehaviorObject,
                                                      kTQHostSampleQuaternionObject,
                                                      kTQHostSampleOffsetObject};
    return index < kNames.size() ? BNString(kNames[index]) : "Object " + std::to_string(index + 1);
}

}  // namespace

void TQHostPopulateSampleScene(TQHostScene& scene, const TQHostSampleSceneSpec& spec) {
    Generator random(spec.seed);
    const double density = spec.density > 0.0 ? spec.density : 1.0;
    const BNTimeRange tenSeconds{kCMTimeZero, CMTimeMake(10, 1)};

    for (size_t i = 0; i < spec.objects; ++i) {
        const BNString name = objectName(i);
        const bool quaternion = scene.isKestrel() && name == kTQHostSampleQuaternionObject;
        TQChannelObjectRootBase* object = scene.addObject(name, {quaternion});
        object->setTimeExtent(tenSeconds);
        animateObject(*object, scene.family(), random, density, quaternion);

        if (name == kTQHostSampleBehaviorObject) {
            const TQHostObjectFamily family = scene.family();
            if (auto* x =
                    channelAt(object, TQHostPropertyPaths(family, TQHostProperty::Position)[0]))
                x->addBehavior(std::make_unique<TQOscillateBehavior>(40.0, 0.5));
            if (auto* opacity =
                    channelAt(object, TQHostPropertyPaths(family, TQHostProperty::Opacity)[0]))
                opacity->addBehavior(std::make_unique<TQNoiseBehavior>(0.1, 2.0, spec.seed));
        } else if (name == kTQHostSampleOffsetObject) {
            object->setTimeOffset(CMTimeMake(1, 1));
            object->setTimeExtent({CMTimeMake(1, 1), CMTimeMake(10, 1)});
        }
    }
}

void TQHostLoadSampleScene(TQHostAppDelegate& host, TQHostObjectFamily family,
                           const TQHostSampleSceneSpec& spec) {
    host.resetScene(family);
    host.setFrameDuration(CMTimeMake(1, kFramesPerSecond));
    host.setDisplayRange(CMTimeRangeMake(kCMTimeZero, CMTimeMake(10, 1)));
    TQHostPopulateSampleScene(host.scene(), spec);
    host.setCurrentTime(kCMTimeZero);  // also hands the time to the new object roots
    if (!host.scene().objects().empty()) host.selectObject(host.scene().objects().front());
    // Building announces nothing the user did: start from a clean slate.
    host.undoStack().clear();
    host.resetModifiedChannels();
    host.postNotification(kTQNotifySceneChanged);
}
