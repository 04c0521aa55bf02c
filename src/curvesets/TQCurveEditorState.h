#pragma once
// The editor's settings as the host saves them in its project file: the "curveeditor" tree.
//
// The host makes and owns the object; nothing in the framework creates one. The five flags
// also live in the user defaults (RWApplicationServices().userDefaults): a new state reads
// them from there, and each flag setter writes its key back, while reading a saved tree
// changes the object only. The displayed range and the view volume never reach the defaults.
//
// The displayed range of a new state is unset: kCMTimeRangeInvalid, which hasDisplayRange()
// tells apart. A copy leaves it unset as well, whatever the source holds: copies carry the
// flags and the view volume only, and that is how the type behaves.
//
// Old documents. Below file format version 5 the range was saved as two frame numbers; the
// stream's frame duration turns them into times (see parseElement).

#include <cstdint>

#include "platform/geometry/BNRect.h"
#include "platform/media/CMTime.h"
#include "platform/support/BNScope.h"
#include "platform/support/BNSerializer.h"

extern const BNScope TQCurveEditorStateScope;

// User defaults keys of the five flags.
inline constexpr const char* kTQPreferenceCurveEditorAutoZoom =
    "TQPreferenceManager::CurveEditorAutoZoom";
inline constexpr const char* kTQPreferenceCurveEditorSnapping =
    "TQPreferenceManager::CurveEditorSnapping";
inline constexpr const char* kTQPreferenceCurveEditorSnapshotChannels =
    "TQPreferenceManager::CurveEditorSnapshotChannels";
inline constexpr const char* kTQPreferenceCurveEditorDisplayAudioWaveform =
    "TQPreferenceManager::CurveEditorDisplayAudioWaveform";
inline constexpr const char* kTQPreferenceCurveEditorLockKeyframesInTime =
    "TQPreferenceManager::CurveEditorLockKeyframesInTime";

class TQCurveEditorState : public BNSerializer {
public:
    // Element ids of the tree.
    enum : uint32_t {
        kElementCurveEditor = 500,
        kElementAutoZoom = 1,
        kElementSnapping = 2,
        kElementDisplayAudioWaveform = 3,
        kElementDisplayRange = 4,
        kElementCurrentViewVolume = 5,
        kElementSnapshotChannels = 6,
        kElementLockKeyframesInTime = 7,
    };

    TQCurveEditorState();
    TQCurveEditorState(const TQCurveEditorState& other);
    TQCurveEditorState& operator=(const TQCurveEditorState&) = delete;

    bool autoZoom() const { return _autoZoom; }
    bool snapping() const { return _snapping; }
    bool snapshotChannels() const { return _snapshotChannels; }
    bool displayAudioWaveform() const { return _displayAudioWaveform; }
    bool lockKeyframesInTime() const { return _lockKeyframesInTime; }
    const CMTimeRange& displayRange() const { return _displayRange; }
    // Whether the range was set or read: its start is a valid time.
    bool hasDisplayRange() const { return CMTIME_IS_VALID(_displayRange.start); }
    const BNRect<double>& currentViewVolume() const { return _currentViewVolume; }

    // Each writes its user defaults key, then the field.
    void setAutoZoom(bool value);
    void setSnapping(bool value);
    void setSnapshotChannels(bool value);
    void setDisplayAudioWaveform(bool value);
    void setLockKeyframesInTime(bool value);
    void setDisplayRange(const CMTimeRange& range) { _displayRange = range; }
    void setCurrentViewVolume(const BNRect<double>& volume) { _currentViewVolume = volume; }

    // Opens element 500 and leaves it open: the caller closes it after writeBody.
    void writeHeader(BNSerializerWriteStream& stream, bool option) override;
    void writeBody(BNSerializerWriteStream& stream, bool option1, bool option2,
                   bool option3) override;
    bool parseBegin(BNSerializerReadStream& stream) override;
    bool parseEnd(BNSerializerReadStream& stream) override;
    bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override;

private:
    void readDisplayRange(BNSerializerReadStream& stream, const BNStreamElement& element);
    void readViewVolume(const BNStreamElement& element);

    bool _autoZoom = false;
    bool _snapping = false;
    bool _snapshotChannels = false;
    bool _displayAudioWaveform = false;
    bool _lockKeyframesInTime = false;
    CMTimeRange _displayRange = kCMTimeRangeInvalid;
    BNRect<double> _currentViewVolume;
};
