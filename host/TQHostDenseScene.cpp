#include "host/TQHostDenseScene.h"

#include <cmath>
#include <numbers>
#include <string>
#include <vector>

#include "host/internal/TQHostSceneLoading.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

constexpr int kChannelTimescale = 0x40000;
constexpr TQChannelId kDenseFolderId = 900;
constexpr TQChannelId kFirstPlainChannelId = 100;

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

// Appended piece by piece: '"C" + to_string' trips a false -Wrestrict of GCC 12 at -O3.
BNString numbered(const char* prefix, size_t number) {
    BNString name = prefix;
    name += std::to_string(number);
    return name;
}

TQChannel* addPlainChannel(TQChannelFolder& folder, size_t index) {
    return static_cast<TQChannel*>(folder.addChild(std::make_unique<TQChannel>(
        numbered("C", index), static_cast<TQChannelId>(kFirstPlainChannelId + index))));
}

// The channels of one new object that get keyframes, in order.
std::vector<TQChannel*> makeObject(TQHostScene& scene, const BNString& name,
                                   const TQHostDenseSceneLayout& layout) {
    std::vector<TQChannel*> animated;
    TQChannelObjectRootBase* object = nullptr;
    if (layout.channels == TQHostDenseChannels::Plain) {
        object = scene.adoptObject(std::make_unique<TQChannelObjectRootBase>(
            name, static_cast<TQChannelId>(scene.numberOfObjects() + 1)));
        for (size_t c = 0; c < layout.channelsPerObject; ++c)
            animated.push_back(addPlainChannel(*object, c));
    } else {
        object = scene.addObject(name);
        std::vector<TQChannelBase*> modelled;
        object->getAllDescendantsFlattened(modelled, 0, true);
        for (TQChannelBase* channel : modelled) {
            if (animated.size() == layout.channelsPerObject) break;
            if (auto* c = dynamic_cast<TQChannel*>(channel)) animated.push_back(c);
        }
        if (animated.size() < layout.channelsPerObject) {
            auto* extra = static_cast<TQChannelFolder*>(
                object->addChild(std::make_unique<TQChannelFolder>("Dense", kDenseFolderId)));
            for (size_t c = 0; animated.size() < layout.channelsPerObject; ++c)
                animated.push_back(addPlainChannel(*extra, c));
        }
    }
    object->setTimeExtent(
        {kCMTimeZero, TQTarnTimeForChannelSeconds(layout.seconds, kChannelTimescale)});
    return animated;
}

bool isOverRangeComponent(const TQChannel& channel) {
    const TQChannelFolder* parent = channel.getParent();
    return dynamic_cast<const TQChannel2DOverRange*>(parent) ||
           dynamic_cast<const TQChannelScaleOverRange*>(parent);
}

void addKeyframes(TQChannel& channel, size_t count, size_t bandIndex,
                  const TQHostDenseSceneLayout& layout, Generator& random) {
    if (count == 0) return;
    channel.setInterpolation(kTQInterpolationBezier);  // what new keyframes take
    const double span = isOverRangeComponent(channel)
                            ? CMTimeGetSeconds(TQOverRangePositionRange().duration)
                            : layout.seconds;
    const double phase = random.unit() * 2.0 * std::numbers::pi;
    const double base =
        channel.getDefaultValue() + layout.bandSpacing * static_cast<double>(bandIndex);
    for (size_t k = 0; k < count; ++k) {
        const double seconds = span * static_cast<double>(k) / static_cast<double>(count);
        const double wave = 0.7 * std::sin(phase + 0.35 * static_cast<double>(k)) +
                            0.3 * (random.unit() * 2.0 - 1.0);
        channel.setKeyframe(TQTarnTimeForChannelSeconds(seconds, kChannelTimescale),
                            base + layout.amplitude * wave);
    }
}

}  // namespace

TQHostDenseSceneLayout TQHostStressSceneLayout() {
    TQHostDenseSceneLayout layout;
    layout.objects = 100;
    layout.channelsPerObject = 30;
    layout.totalKeyframes = 1'000'000;
    return layout;
}

size_t TQHostDenseKeyframesOfChannel(const TQHostDenseSceneLayout& layout, size_t index) {
    if (layout.totalKeyframes == 0) return layout.keyframesPerChannel;
    const size_t channels = layout.objects * layout.channelsPerObject;
    if (channels == 0) return 0;
    return layout.totalKeyframes / channels + (index < layout.totalKeyframes % channels ? 1 : 0);
}

void TQHostPopulateDenseScene(TQHostScene& scene, const TQHostDenseSceneLayout& layout) {
    Generator random(layout.seed);
    size_t index = 0;
    for (size_t o = 0; o < layout.objects; ++o) {
        for (TQChannel* channel : makeObject(scene, numbered("Dense ", o + 1), layout)) {
            addKeyframes(*channel, TQHostDenseKeyframesOfChannel(layout, index), index, layout,
                         random);
            ++index;
        }
    }
}

void TQHostLoadDenseScene(TQHostAppDelegate& host, TQHostObjectFamily family,
                          const TQHostDenseSceneLayout& layout) {
    TQHostLoadBuiltScene(
        host, family, CMTimeMake(1, 30),
        CMTimeRangeMake(kCMTimeZero,
                        TQTarnTimeForChannelSeconds(layout.seconds, kChannelTimescale)),
        [&layout](TQHostScene& scene) { TQHostPopulateDenseScene(scene, layout); });
}
