#include <charconv>

#include "host/TQHostProjectFile.h"
#include "host/internal/TQHostProjectIO.h"
#include "host/internal/TQHostProjectScope.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/channels/TQFactory.h"

namespace tq_host {

bool readEditorTree(BNSerializerReadStream& stream, const BNStreamElement& element,
                    TQCurveEditorState& state, TQCurveSetListSerializer& curveSets) {
    if (element.elementId() == kCurveEditor) {
        stream.pushHandler(&state);
        return true;
    }
    if (element.elementId() == kCurveSets) {
        // The list reads only its children: "selected" on its element is the host's.
        uint32_t selected = 0;
        if (stream.getAttributeAsUInt32(element, kSelectedCurveSet, selected))
            curveSets.setSelectedCurveSet(selected);
        stream.pushHandler(&curveSets);
        return true;
    }
    return false;
}

namespace {

// ---- Checked reads: a missing or bad value fails the stream ---------------------------

class Reader {
public:
    Reader(BNSerializerReadStream& stream, const BNStreamElement& element)
        : _s(stream), _e(element) {}

    bool ok() const { return !_s.failed(); }
    void fail(std::string message) { _s.fail(_e, std::move(message)); }

    // Each answers the value; a missing attribute fails the stream (once) and answers the
    // type's zero. Callers test ok() before they use what they read.
    double number(uint32_t id) {
        return required(id, &BNSerializerReadStream::getAttributeAsDouble);
    }
    uint32_t uint32(uint32_t id) {
        return required(id, &BNSerializerReadStream::getAttributeAsUInt32);
    }
    uint64_t uint64(uint32_t id) {
        return required(id, &BNSerializerReadStream::getAttributeAsUInt64);
    }
    int64_t int64(uint32_t id) {
        return required(id, &BNSerializerReadStream::getAttributeAsInt64);
    }
    bool flag(uint32_t id) { return required(id, &BNSerializerReadStream::getAttributeAsBool); }
    BNString text(uint32_t id) {
        return required(id, &BNSerializerReadStream::getAttributeAsString);
    }
    CMTime time(uint32_t id) { return required(id, &BNSerializerReadStream::getAttributeAsTime); }
    // A time that must be a plain number.
    CMTime numericTime(uint32_t id) {
        const CMTime t = time(id);
        if (ok() && !CMTIME_IS_NUMERIC(t)) fail(quoted(id) + " is not a number of seconds");
        return t;
    }
    CMTime positiveTime(uint32_t id) {
        const CMTime t = numericTime(id);
        if (ok() && CMTimeCompare(t, kCMTimeZero) <= 0) fail(quoted(id) + " is not above zero");
        return t;
    }
    double optionalNumber(uint32_t id) {
        double value = 0.0;
        _s.getAttributeAsDouble(_e, id, value);
        return value;
    }
    bool optionalFlag(uint32_t id, bool otherwise) {
        bool value = otherwise;
        _s.getAttributeAsBool(_e, id, value);
        return value;
    }

    std::string quoted(uint32_t id) const {
        const char* name = kProjectScope.attributeName(_e.elementId(), id);
        return std::string("attribute \"") + (name ? name : "?") + "\" of \"" +
               std::string(_e.name()) + "\"";
    }

private:
    template <class T>
    T required(uint32_t id,
               bool (BNSerializerReadStream::*get)(const BNStreamElement&, uint32_t, T&)) {
        T value{};
        if (!ok()) return value;
        if (!(_s.*get)(_e, id, value) && ok()) fail(quoted(id) + " is missing");
        return value;
    }

    BNSerializerReadStream& _s;
    const BNStreamElement& _e;
};

bool parseFactory(std::string_view text, TQFactoryId& out) {
    if (text.size() != 33 || text[16] != '-') return false;
    auto word = [](std::string_view hex, uint64_t& value) {
        const auto [ptr, ec] = std::from_chars(hex.data(), hex.data() + hex.size(), value, 16);
        return ec == std::errc() && ptr == hex.data() + hex.size();
    };
    return word(text.substr(0, 16), out.word0) && word(text.substr(17), out.word1);
}

// The parts of a document that come in this order, each at most once.
enum Section {
    kNone,
    kTimingSection,
    kSceneSection,
    kSelectionSection,
    kEditorSection,
    kSetsSection
};

// A node of a channel tree with its attributes; null after a failure.
std::unique_ptr<TQChannelBase> readNode(BNSerializerReadStream& stream,
                                        const BNStreamElement& element) {
    Reader r(stream, element);
    TQFactoryId factoryId;
    const BNString factoryText = r.text(kFactory);
    const uint32_t id = r.uint32(kId);
    const BNString name = r.text(kName);
    if (!r.ok()) return nullptr;
    const TQFactory* factory =
        parseFactory(factoryText, factoryId) ? TQFactory::find(factoryId) : nullptr;
    if (!factory) {
        r.fail("channel \"" + name + "\" is of an unknown class \"" + factoryText + "\"");
        return nullptr;
    }
    std::unique_ptr<TQChannelBase> node = factory->create(name, id);

    const uint64_t flags = r.uint64(kFlags);
    const bool locked = r.flag(kLocked);
    const CMTime offset = r.numericTime(kTimeOffset);
    const BNTimeRange extent{r.time(kExtentStart), r.time(kExtentDuration)};
    BNString label;
    stream.getAttributeAsString(element, kXAxisLabel, label);
    const TQChannelInfo info{r.number(kSliderMinimum), r.number(kValueStep), r.number(kTickStep),
                             r.number(kDisplayScale)};
    const double minimum = r.number(kRangeMinimum);
    const double maximum = r.number(kRangeMaximum);
    if (!r.ok()) return nullptr;
    node->resetFlag(~uint64_t{0});
    node->setFlag(flags);
    node->setLocked(locked, false);
    node->setTimeOffset(offset);
    node->setTimeExtent(extent);
    node->setXAxisLabel(label);
    *node->getInfo() = info;
    node->getImpl()->range().setRange(minimum, maximum);

    if (auto* folder = dynamic_cast<TQChannelFolder*>(node.get())) {
        const uint32_t foldFlags = r.uint32(kFoldFlags);
        auto* rotation = dynamic_cast<TQChannelRotation3D*>(folder);
        const bool quaternion = rotation && r.flag(kQuaternion);
        if (!r.ok()) return nullptr;
        // The file lists every child, those a typed compound comes with included.
        folder->removeAllChildren();
        folder->resetFoldFlag(~uint32_t{0});
        folder->setFoldFlag(foldFlags);
        if (rotation) rotation->setQuaternionMode(quaternion, false);
    } else if (auto* channel = dynamic_cast<TQChannel*>(node.get())) {
        const double initial = r.number(kInitialValue);
        const double defaultValue = r.number(kDefaultValue);
        const double sliderMaximum = r.number(kSliderMaximum);
        const bool rigged = r.flag(kRigged);
        const uint32_t interpolation = r.uint32(kInterpolation);
        const uint32_t before = r.uint32(kExtrapolationBefore);
        const uint32_t after = r.uint32(kExtrapolationAfter);
        const bool animated = r.flag(kAnimationEnabled);
        if (r.ok() && !TQIsInterpolationCode(interpolation))
            r.fail(r.quoted(kInterpolation) + " is no interpolation code");
        if (r.ok() && (before > kTQExtrapolationProgressive || after > kTQExtrapolationProgressive))
            r.fail("an extrapolation of \"channel\" is no extrapolation code");
        if (!r.ok()) return nullptr;
        channel->setDefaultValue(defaultValue);
        channel->setInitialValue(initial);
        channel->setSliderMaximum(sliderMaximum);
        channel->setRigged(rigged);
        channel->setDefaultInterpolation(interpolation);
        channel->setExtrapolation(before, kTQExtrapolationBefore);
        channel->setExtrapolation(after, kTQExtrapolationAfter);
        channel->setAnimationEnabled(animated);
    }
    return node;
}

bool readKey(BNSerializerReadStream& stream, const BNStreamElement& element,
             std::vector<TQKeyframeState>& keys) {
    Reader r(stream, element);
    TQKeyframeState k;
    k.time = r.numericTime(kTime);
    k.value = r.number(kValue);
    k.inU = r.optionalNumber(kInU);
    k.inV = r.optionalNumber(kInV);
    k.outU = r.optionalNumber(kOutU);
    k.outV = r.optionalNumber(kOutV);
    k.interpolation = r.uint32(kKeyInterpolation);
    k.locked = r.optionalFlag(kKeyLocked, false);
    k.enabled = r.optionalFlag(kKeyEnabled, true);
    k.broken = r.optionalFlag(kKeyBroken, false);
    k.scaled = r.optionalFlag(kKeyScaled, false);
    if (r.ok() && !TQIsInterpolationCode(k.interpolation))
        r.fail(r.quoted(kKeyInterpolation) + " is no interpolation code");
    if (r.ok() && !keys.empty() && CMTimeCompare(keys.back().time, k.time) > 0)
        r.fail("keyframe is earlier than the one before it");
    if (!r.ok()) return false;
    keys.push_back(k);
    return true;
}

std::unique_ptr<TQChannelBehavior> readBehavior(BNSerializerReadStream& stream,
                                                const BNStreamElement& element) {
    Reader r(stream, element);
    const BNString kind = r.text(kKind);
    const double amplitude = r.number(kAmplitude);
    const double frequency = r.number(kFrequency);
    const bool enabled = r.flag(kBehaviorEnabled);
    const bool selected = r.flag(kBehaviorSelected);
    if (!r.ok()) return nullptr;
    std::unique_ptr<TQChannelBehavior> behavior;
    if (kind == "Oscillate") {
        const double phase = r.number(kPhase);
        if (r.ok()) behavior = std::make_unique<TQOscillateBehavior>(amplitude, frequency, phase);
    } else if (kind == "Noise") {
        const uint32_t seed = r.uint32(kSeed);
        if (r.ok()) behavior = std::make_unique<TQNoiseBehavior>(amplitude, frequency, seed);
    } else {
        r.fail("behaviour kind \"" + kind + "\" is unknown");
    }
    if (!behavior) return nullptr;
    behavior->setEnabled(enabled);
    behavior->setSelected(selected);
    return behavior;
}

void unexpected(BNSerializerReadStream& stream, const BNStreamElement& element) {
    std::string message = "element \"" + std::string(element.name()) + "\" is not expected";
    if (!element.parentName().empty())
        message += " inside \"" + std::string(element.parentName()) + "\"";
    stream.fail(element, std::move(message));
}

// ---- Handlers ---------------------------------------------------------------------------

// One node: takes its keyframes, behaviours and children. The project reader keeps every
// node handler until the read is over (a handler must outlive its element).
class NodeHandler final : public BNSerializer {
public:
    NodeHandler(TQChannelBase& node, size_t depth, std::vector<std::unique_ptr<NodeHandler>>& all)
        : _node(node), _depth(depth), _all(all) {}

    void writeHeader(BNSerializerWriteStream&, bool) override {}
    void writeBody(BNSerializerWriteStream&, bool, bool, bool) override {}
    bool parseBegin(BNSerializerReadStream&) override { return true; }
    bool parseEnd(BNSerializerReadStream&) override {
        // Checked in order as they came, so the channel cannot refuse them.
        if (auto* channel = dynamic_cast<TQChannel*>(&_node)) channel->setKeyframeStates(_keys);
        std::vector<TQKeyframeState>().swap(_keys);
        return true;
    }

    bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override {
        if (element.depth() != _depth + 1) {
            unexpected(stream, element);
            return true;
        }
        auto* channel = dynamic_cast<TQChannel*>(&_node);
        auto* folder = dynamic_cast<TQChannelFolder*>(&_node);
        switch (element.elementId()) {
            case kKey:
                if (!channel) break;
                readKey(stream, element, _keys);
                return false;
            case kBehavior:
                if (!channel) break;
                if (auto behavior = readBehavior(stream, element))
                    channel->addBehavior(std::move(behavior));
                return false;
            case kEmptySlot:
                if (!folder) break;
                folder->addChild(nullptr);
                return false;
            case kChannel: {
                if (!folder) break;
                if (auto child = readNode(stream, element))
                    push(stream, *folder->addChild(std::move(child)), _depth + 1, _all);
                return false;
            }
            default: break;
        }
        unexpected(stream, element);
        return true;
    }

    static void push(BNSerializerReadStream& stream, TQChannelBase& node, size_t depth,
                     std::vector<std::unique_ptr<NodeHandler>>& all) {
        all.push_back(std::make_unique<NodeHandler>(node, depth, all));
        stream.pushHandler(all.back().get());
    }

private:
    TQChannelBase& _node;
    size_t _depth;
    std::vector<std::unique_ptr<NodeHandler>>& _all;
    std::vector<TQKeyframeState> _keys;
};

// The document: its root, the sections below it and the selection's entries.
class ProjectHandler final : public BNSerializer {
public:
    explicit ProjectHandler(LoadedProject& loaded) : _loaded(loaded) {}

    void writeHeader(BNSerializerWriteStream&, bool) override {}
    void writeBody(BNSerializerWriteStream&, bool, bool, bool) override {}
    bool parseBegin(BNSerializerReadStream& stream) override {
        stream.pushScope(kProjectScope);
        return true;
    }
    bool parseEnd(BNSerializerReadStream&) override { return true; }

    bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override {
        switch (element.depth()) {
            case 1: readRoot(stream, element); return false;
            case 2: readSection(stream, element); return false;
            case 3:
                if (_section == kSelectionSection && element.elementId() == kSelected) {
                    readSelected(stream, element);
                    return false;
                }
                break;
            default: break;
        }
        unexpected(stream, element);
        return true;
    }

    // Checks what a document must hold, once it has been read through.
    std::optional<BNSerializerError> finish() const {
        if (_section < kSceneSection)
            return BNSerializerError{0, 0, "the project has no \"timing\" and \"scene\""};
        return std::nullopt;
    }

    std::vector<std::unique_ptr<NodeHandler>>& nodes() { return _nodes; }

private:
    void readRoot(BNSerializerReadStream& stream, const BNStreamElement& element) {
        if (element.elementId() != kProject) {
            stream.fail(element,
                        "not a project: the document is a \"" + std::string(element.name()) + "\"");
            return;
        }
        Reader r(stream, element);
        const int64_t version = r.int64(kVersion);
        const BNString family = r.text(kFamily);
        if (!r.ok()) return;
        if (version < 1 || version > kTQHostProjectVersion) {
            r.fail("the project's version " + std::to_string(version) +
                   (version > kTQHostProjectVersion
                        ? " is newer than this program reads (" +
                              std::to_string(kTQHostProjectVersion) + ")"
                        : " is not a version"));
            return;
        }
        if (family != "kestrel" && family != "other") {
            r.fail("the project's object family \"" + family + "\" is unknown");
            return;
        }
        _loaded.version = static_cast<int32_t>(version);
        _loaded.family =
            family == "kestrel" ? TQHostObjectFamily::Kestrel : TQHostObjectFamily::Other;
        stream.setVersion(_loaded.version);
    }

    void readSection(BNSerializerReadStream& stream, const BNStreamElement& element) {
        Section section = kNone;
        switch (element.elementId()) {
            case kTiming: section = kTimingSection; break;
            case kScene: section = kSceneSection; break;
            case kSelection: section = kSelectionSection; break;
            case kCurveEditor: section = kEditorSection; break;
            case kCurveSets: section = kSetsSection; break;
            default: return unexpected(stream, element);
        }
        const bool needsTiming = section >= kSceneSection && _section < kTimingSection;
        const bool needsScene = section >= kSelectionSection && _section < kSceneSection;
        if (section <= _section || needsTiming || needsScene) {
            stream.fail(element, "element \"" + std::string(element.name()) +
                                     "\" is out of place: the order is timing, scene, "
                                     "selection, curveeditor, curvesets");
            return;
        }
        _section = section;
        switch (section) {
            case kTimingSection: readTiming(stream, element); break;
            case kSceneSection:
                _sceneDepth = element.depth();
                stream.pushHandler(&_scene);
                break;
            case kSelectionSection: break;
            default: readEditorTree(stream, element, *_loaded.state, *_loaded.curveSets); break;
        }
    }

    void readTiming(BNSerializerReadStream& stream, const BNStreamElement& element) {
        Reader r(stream, element);
        _loaded.frameDuration = r.positiveTime(kFrameDuration);
        _loaded.displayRange.start = r.numericTime(kRangeStart);
        _loaded.displayRange.duration = r.positiveTime(kRangeDuration);
        _loaded.currentTime = r.numericTime(kCurrentTime);
        _loaded.firstFrameNumber = r.uint32(kFirstFrame);
        _loaded.startTimecode = r.uint32(kStartTimecode);
        _loaded.secondsPerTextStep = r.positiveTime(kTextStep);
        _loaded.displayTimeAsFrames = r.flag(kAsFrames);
        if (r.ok()) stream.setFrameDuration(_loaded.frameDuration);
    }

    void readSelected(BNSerializerReadStream& stream, const BNStreamElement& element) {
        Reader r(stream, element);
        const BNString text = r.text(kRef);
        if (!r.ok()) return;
        const TQChannelRef ref(text);
        const bool names = ref.isValid() && ref.depth() == 1;
        const TQChannelId id = names ? ref.getIds().front() : 0;
        for (const auto& object : _loaded.objects) {
            if (names && object->getChannelId() == id) {
                _loaded.selection.push_back(id);
                return;
            }
        }
        r.fail("selected object \"" + text + "\" is no object of the scene");
    }

    // The scene's children: object roots.
    class SceneHandler final : public BNSerializer {
    public:
        explicit SceneHandler(ProjectHandler& project) : _project(project) {}
        void writeHeader(BNSerializerWriteStream&, bool) override {}
        void writeBody(BNSerializerWriteStream&, bool, bool, bool) override {}
        bool parseBegin(BNSerializerReadStream&) override { return true; }
        bool parseEnd(BNSerializerReadStream&) override { return true; }
        bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override {
            if (element.depth() != _project._sceneDepth + 1 || element.elementId() != kChannel) {
                unexpected(stream, element);
                return true;
            }
            std::unique_ptr<TQChannelBase> node = readNode(stream, element);
            if (!node) return true;
            auto* object = dynamic_cast<TQChannelObjectRootBase*>(node.get());
            if (!object) {
                stream.fail(element, "\"" + node->getName() + "\" in \"scene\" is no object");
                return true;
            }
            auto& objects = _project._loaded.objects;
            for (const auto& other : objects) {
                if (other->getChannelId() == object->getChannelId()) {
                    stream.fail(element, "two objects have the id " +
                                             std::to_string(object->getChannelId()));
                    return true;
                }
            }
            objects.emplace_back(static_cast<TQChannelObjectRootBase*>(node.release()));
            NodeHandler::push(stream, *object, element.depth(), _project._nodes);
            return false;
        }

    private:
        ProjectHandler& _project;
    };

    LoadedProject& _loaded;
    Section _section = kNone;
    size_t _sceneDepth = 0;
    SceneHandler _scene{*this};
    std::vector<std::unique_ptr<NodeHandler>> _nodes;
};

}  // namespace

std::optional<BNSerializerError> readProject(
    const std::function<std::optional<BNSerializerError>(BNSerializerReadStream&, BNSerializer&)>&
        read,
    LoadedProject& loaded) {
    BNSerializerReadStream stream;
    ProjectHandler handler(loaded);
    if (auto error = read(stream, handler)) return error;
    return handler.finish();
}

}  // namespace tq_host
