#include "src/curvesets/TQCurveEditorState.h"

#include "platform/support/BNSerializerReadStream.h"
#include "platform/support/BNSerializerWriteStream.h"
#include "platform/ui/RWServices.h"

namespace {

const BNScopeEntry kStateTable[] = {
    {"curveeditor", 500, 0},
    {"autozoom", 1, 0},
    {"snapping", 2, 0},
    {"displayAudioWaveform", 3, 0},
    {"lockKeyframesInTime", 7, 0},
    {"displayRange", 4, 0},
    {"in", 4, 1},
    {"out", 4, 2},
    {"currentviewvolume", 5, 0},
    {"originx", 5, 1},
    {"originy", 5, 2},
    {"width", 5, 3},
    {"height", 5, 4},
    {"snapshotChannels", 6, 0},
    {nullptr, 0, 0},
};

enum : uint32_t {
    kAttributeIn = 1,
    kAttributeOut = 2,
    kAttributeOriginX = 1,
    kAttributeOriginY = 2,
    kAttributeWidth = 3,
    kAttributeHeight = 4,
};

RWUserDefaults& defaults() { return *RWApplicationServices().userDefaults; }

}  // namespace

const BNScope TQCurveEditorStateScope(kStateTable);

TQCurveEditorState::TQCurveEditorState()
    : _autoZoom(defaults().boolForKey(kTQPreferenceCurveEditorAutoZoom)),
      _snapping(defaults().boolForKey(kTQPreferenceCurveEditorSnapping)),
      _snapshotChannels(defaults().boolForKey(kTQPreferenceCurveEditorSnapshotChannels)),
      _displayAudioWaveform(defaults().boolForKey(kTQPreferenceCurveEditorDisplayAudioWaveform)),
      _lockKeyframesInTime(defaults().boolForKey(kTQPreferenceCurveEditorLockKeyframesInTime)) {}

// The range is deliberately not copied: a copy's range is unset.
TQCurveEditorState::TQCurveEditorState(const TQCurveEditorState& other)
    : BNSerializer(other),
      _autoZoom(other._autoZoom),
      _snapping(other._snapping),
      _snapshotChannels(other._snapshotChannels),
      _displayAudioWaveform(other._displayAudioWaveform),
      _lockKeyframesInTime(other._lockKeyframesInTime),
      _currentViewVolume(other._currentViewVolume) {}

void TQCurveEditorState::setAutoZoom(bool value) {
    defaults().setBool(value, kTQPreferenceCurveEditorAutoZoom);
    _autoZoom = value;
}

void TQCurveEditorState::setSnapping(bool value) {
    defaults().setBool(value, kTQPreferenceCurveEditorSnapping);
    _snapping = value;
}

void TQCurveEditorState::setSnapshotChannels(bool value) {
    defaults().setBool(value, kTQPreferenceCurveEditorSnapshotChannels);
    _snapshotChannels = value;
}

void TQCurveEditorState::setDisplayAudioWaveform(bool value) {
    defaults().setBool(value, kTQPreferenceCurveEditorDisplayAudioWaveform);
    _displayAudioWaveform = value;
}

void TQCurveEditorState::setLockKeyframesInTime(bool value) {
    defaults().setBool(value, kTQPreferenceCurveEditorLockKeyframesInTime);
    _lockKeyframesInTime = value;
}

// ---- Writing ----------------------------------------------------------------------------

void TQCurveEditorState::writeHeader(BNSerializerWriteStream& stream, bool) {
    stream.pushScope(TQCurveEditorStateScope);
    stream.openElement(kElementCurveEditor);
    stream.popScope();
}

void TQCurveEditorState::writeBody(BNSerializerWriteStream& stream, bool, bool, bool) {
    stream.pushScope(TQCurveEditorStateScope);
    const std::pair<uint32_t, bool> flags[] = {
        {kElementAutoZoom, _autoZoom},
        {kElementSnapping, _snapping},
        {kElementDisplayAudioWaveform, _displayAudioWaveform},
        {kElementLockKeyframesInTime, _lockKeyframesInTime},
    };
    for (const auto& [element, value] : flags) {
        stream.openElement(element);
        stream.writeBool(value);
        stream.closeElement();
    }

    stream.openElement(kElementDisplayRange);
    stream.setAttributeTime(kAttributeIn, _displayRange.start);
    stream.setAttributeTime(kAttributeOut,
                            BN_CMTimeSaferAdd(_displayRange.start, _displayRange.duration));
    stream.closeElement();

    // "originy" is the top edge, not y.
    stream.openElement(kElementCurrentViewVolume);
    stream.setAttributeDouble(kAttributeOriginX, _currentViewVolume.x);
    stream.setAttributeDouble(kAttributeOriginY, _currentViewVolume.y + _currentViewVolume.height);
    stream.setAttributeDouble(kAttributeWidth, _currentViewVolume.width);
    stream.setAttributeDouble(kAttributeHeight, _currentViewVolume.height);
    stream.closeElement();

    stream.openElement(kElementSnapshotChannels);
    stream.writeBool(_snapshotChannels);
    stream.closeElement();
    stream.popScope();
}

// ---- Reading ----------------------------------------------------------------------------

bool TQCurveEditorState::parseBegin(BNSerializerReadStream& stream) {
    stream.pushScope(TQCurveEditorStateScope);
    return true;
}

bool TQCurveEditorState::parseEnd(BNSerializerReadStream&) { return true; }

bool TQCurveEditorState::parseElement(BNSerializerReadStream& stream, BNStreamElement& element) {
    switch (element.elementId()) {
        case kElementAutoZoom: element.getAsBool(_autoZoom); break;
        case kElementSnapping: element.getAsBool(_snapping); break;
        case kElementDisplayAudioWaveform: element.getAsBool(_displayAudioWaveform); break;
        case kElementSnapshotChannels: element.getAsBool(_snapshotChannels); break;
        case kElementLockKeyframesInTime: element.getAsBool(_lockKeyframesInTime); break;
        case kElementDisplayRange: readDisplayRange(stream, element); break;
        case kElementCurrentViewVolume: readViewVolume(element); break;
        default: break;
    }
    return false;
}

void TQCurveEditorState::readDisplayRange(BNSerializerReadStream& stream,
                                          const BNStreamElement& element) {
    if (stream.version() >= 5) {
        CMTime in;
        if (element.getAttributeAsTime(kAttributeIn, in)) _displayRange.start = in;
        CMTime out;
        if (!element.getAttributeAsTime(kAttributeOut, out)) return;
        _displayRange.duration = BN_CMTimeSaferSubtract(out, _displayRange.start);
        return;
    }
    // Frame numbers. The duration is counted from frame 0, not from the start: old files
    // read back exactly so, and must keep doing so.
    const CMTime frame = stream.frameDuration();
    double in = 0.0;
    if (element.getAttributeAsDouble(kAttributeIn, in)) _displayRange.start = frame * in;
    double out = 0.0;
    if (!element.getAttributeAsDouble(kAttributeOut, out)) return;
    _displayRange.duration = BN_CMTimeSaferSubtract(frame * (out - 1.0), frame);
}

void TQCurveEditorState::readViewVolume(const BNStreamElement& element) {
    BNRect<double>& v = _currentViewVolume;
    double value = 0.0;
    if (element.getAttributeAsDouble(kAttributeOriginX, value)) {
        v.width -= value - v.x;  // the right edge stays
        v.x = value;
    }
    if (element.getAttributeAsDouble(kAttributeOriginY, value)) v.y = value - v.height;
    if (element.getAttributeAsDouble(kAttributeWidth, value)) v.width = value;
    if (element.getAttributeAsDouble(kAttributeHeight, value)) {
        v.y = v.y + v.height - value;  // the top edge stays
        v.height = value;
    }
}
