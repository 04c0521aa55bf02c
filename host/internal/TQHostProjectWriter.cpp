#include <bit>
#include <cinttypes>
#include <cstdio>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostProjectFile.h"
#include "host/internal/TQHostProjectIO.h"
#include "host/internal/TQHostProjectScope.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/channels/TQFactory.h"

namespace tq_host {
namespace {

std::string factoryText(const TQFactoryId& id) {
    char text[40];
    std::snprintf(text, sizeof text, "%016" PRIx64 "-%016" PRIx64, id.word0, id.word1);
    return text;
}

class ProjectWriter {
public:
    explicit ProjectWriter(BNSerializerWriteStream& stream) : _s(stream) {}

    void writeTiming(TQHostAppDelegate& host) {
        _s.openElement(kTiming);
        const CMTimeRange range = host.displayRange();
        _s.setAttributeTime(kFrameDuration, host.getFrameDuration());
        _s.setAttributeTime(kRangeStart, range.start);
        _s.setAttributeTime(kRangeDuration, range.duration);
        _s.setAttributeTime(kCurrentTime, host.currentTime());
        _s.setAttributeUInt32(kFirstFrame, host.firstFrameNumber());
        _s.setAttributeUInt32(kStartTimecode, host.startTimecode());
        _s.setAttributeTime(kTextStep, host.secondsPerTextStep());
        _s.setAttributeBool(kAsFrames, host.shouldDisplayTimeAsFrames());
        _s.closeElement();
    }

    void writeScene(TQHostAppDelegate& host) {
        _s.openElement(kScene);
        for (const TQChannelObjectRootBase* object : host.scene().objects()) writeNode(*object);
        _s.closeElement();

        const std::vector<TQChannelBase*> selected = host.selectedObjectsRootChannels();
        if (selected.empty()) return;
        _s.openElement(kSelection);
        for (const TQChannelBase* object : selected) {
            _s.openElement(kSelected);
            _s.setAttributeString(kRef, TQChannelRef(object, &host.scene().root()).getText());
            _s.closeElement();
        }
        _s.closeElement();
    }

private:
    void writeNode(const TQChannelBase& node) {
        const TQFactory* factory = node.getFactory();
        if (!factory) {
            _s.fail("channel \"" + node.getName() + "\" is of a class that cannot be saved");
            return;
        }
        _s.openElement(kChannel);
        _s.setAttributeString(kFactory, factoryText(factory->getIdentifier()));
        _s.setAttributeUInt32(kId, node.getChannelId());
        _s.setAttributeString(kName, node.getName());
        _s.setAttributeUInt64(kFlags, node.getFlags());
        _s.setAttributeBool(kLocked, node.isLocked(false));
        _s.setAttributeTime(kTimeOffset, node.ownTimeOffset());
        const BNTimeRange extent = node.timeExtent();
        _s.setAttributeTime(kExtentStart, extent.start);
        _s.setAttributeTime(kExtentDuration, extent.duration);
        const BNString label = node.getXAxisLabel();
        if (!label.empty()) _s.setAttributeString(kXAxisLabel, label);
        const TQChannelInfo& info = *node.getInfo();
        _s.setAttributeDouble(kSliderMinimum, info.sliderMinimum);
        _s.setAttributeDouble(kValueStep, info.valueStep);
        _s.setAttributeDouble(kTickStep, info.tickStep);
        _s.setAttributeDouble(kDisplayScale, info.displayScale);
        double minimum = 0.0;
        double maximum = 0.0;
        node.getImpl()->getRangeMin(&minimum);
        node.getImpl()->getRangeMax(&maximum);
        _s.setAttributeDouble(kRangeMinimum, minimum);
        _s.setAttributeDouble(kRangeMaximum, maximum);

        if (const auto* channel = dynamic_cast<const TQChannel*>(&node)) {
            writeChannel(*channel);
        } else if (const auto* folder = dynamic_cast<const TQChannelFolder*>(&node)) {
            writeFolder(*folder);
        }
        _s.closeElement();
    }

    void writeFolder(const TQChannelFolder& folder) {
        _s.setAttributeUInt32(kFoldFlags, folder.getFoldFlags());
        if (const auto* rotation = dynamic_cast<const TQChannelRotation3D*>(&folder))
            _s.setAttributeBool(kQuaternion, rotation->isQuaternionMode());
        for (size_t i = 0; i < folder.numberOfChildren(); ++i) {
            if (const TQChannelBase* child = folder.getChild(i)) {
                writeNode(*child);
            } else {
                _s.openElement(kEmptySlot);
                _s.closeElement();
            }
        }
    }

    void writeChannel(const TQChannel& channel) {
        _s.setAttributeDouble(kInitialValue, channel.getInitialValue());
        _s.setAttributeDouble(kDefaultValue, channel.getDefaultValue());
        _s.setAttributeDouble(kSliderMaximum, channel.sliderMaximum());
        _s.setAttributeBool(kRigged, channel.isRigged());
        _s.setAttributeUInt32(kInterpolation, channel.getDefaultInterpolation());
        _s.setAttributeUInt32(kExtrapolationBefore,
                              channel.getExtrapolation(kTQExtrapolationBefore));
        _s.setAttributeUInt32(kExtrapolationAfter, channel.getExtrapolation(kTQExtrapolationAfter));
        _s.setAttributeBool(kAnimationEnabled, channel.isAnimationEnabled());

        for (const TQKeyframeState& k : channel.getKeyframeStates()) {
            _s.openElement(kKey);
            _s.setAttributeTime(kTime, k.time);
            _s.setAttributeDouble(kValue, k.value);
            // Handles are often flat: a +0 is left out (a -0 is written, to keep its bits).
            const std::pair<uint32_t, double> handles[] = {
                {kInU, k.inU}, {kInV, k.inV}, {kOutU, k.outU}, {kOutV, k.outV}};
            for (const auto& [id, value] : handles)
                if (std::bit_cast<uint64_t>(value) != 0) _s.setAttributeDouble(id, value);
            _s.setAttributeUInt32(kKeyInterpolation, k.interpolation);
            if (k.locked) _s.setAttributeBool(kKeyLocked, true);
            if (!k.enabled) _s.setAttributeBool(kKeyEnabled, false);
            if (k.broken) _s.setAttributeBool(kKeyBroken, true);
            if (k.scaled) _s.setAttributeBool(kKeyScaled, true);
            _s.closeElement();
        }
        for (size_t i = 0; i < channel.numberOfBehaviors(); ++i)
            writeBehavior(*channel.getBehavior(i));
    }

    void writeBehavior(const TQChannelBehavior& behavior) {
        const auto* oscillate = dynamic_cast<const TQOscillateBehavior*>(&behavior);
        const auto* noise = dynamic_cast<const TQNoiseBehavior*>(&behavior);
        if (!oscillate && !noise) {
            _s.fail("behaviour \"" + behavior.kindName() + "\" cannot be saved");
            return;
        }
        _s.openElement(kBehavior);
        _s.setAttributeString(kKind, behavior.kindName());
        if (oscillate) {
            _s.setAttributeDouble(kAmplitude, oscillate->amplitude());
            _s.setAttributeDouble(kFrequency, oscillate->frequency());
            _s.setAttributeDouble(kPhase, oscillate->phase());
        } else {
            _s.setAttributeDouble(kAmplitude, noise->amplitude());
            _s.setAttributeDouble(kFrequency, noise->frequency());
            _s.setAttributeUInt32(kSeed, noise->seed());
        }
        _s.setAttributeBool(kBehaviorEnabled, behavior.isEnabled());
        _s.setAttributeBool(kBehaviorSelected, behavior.isSelected());
        _s.closeElement();
    }

    BNSerializerWriteStream& _s;
};

}  // namespace

void writeProject(BNSerializerWriteStream& stream, TQHostAppDelegate& host,
                  TQCurveEditorState& state, TQCurveSetListSerializer& curveSets) {
    stream.pushScope(kProjectScope);
    stream.openElement(kProject);
    stream.setAttributeInt64(kVersion, kTQHostProjectVersion);
    stream.setAttributeString(kFamily, host.isKestrel() ? "kestrel" : "other");
    ProjectWriter writer(stream);
    writer.writeTiming(host);
    writer.writeScene(host);

    state.writeHeader(stream, false);
    state.writeBody(stream, false, true, true);
    stream.closeElement();
    curveSets.writeHeader(stream, false);
    curveSets.writeBody(stream, false, true, true);
    stream.closeElement();

    stream.closeElement();
    stream.popScope();
}

}  // namespace tq_host
