#pragma once
// Keypoints on the clipboard: what copy writes and paste reads, and its two forms.
//
// The private form (kTQKeypointClipboardType) is exact: times are rationals relative to the
// earliest keypoint copied, values and handles are written so that they read back to the
// same doubles, and each keypoint keeps its interpolation, both handles, and its broken,
// scaled, locked and enabled states. Keypoints are grouped by the channel they came from,
// named by its reference's text form and by its class, which lets a paste find the channel
// again or one of the same kind. The readable form (text/plain) lists the same keypoints in
// seconds for a person or another program; it is never read back.
//
// Reading is strict: anything other applications put under our type, a truncated or edited
// payload, a number that does not parse whole, a time out of order or an unknown
// interpolation gives no clip at all, never a partial one.

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/ui/RWServices.h"

inline constexpr const char* kTQKeypointClipboardType = "application/x-vantacurveeditor-keypoints";
inline constexpr const char* kTQPlainTextClipboardType = "text/plain";

struct TQKeypointClipChannel {
    std::string ref;   // the channel reference's text form
    std::string kind;  // class name of the channel (TQChannelKind)
    // Times relative to the clip's earliest keypoint (axis time), in time order.
    std::vector<TQKeyframeState> keys;
};

struct TQKeypointClip {
    std::vector<TQKeypointClipChannel> channels;
    size_t keyCount() const;
};

// The name a clip gives a channel's kind: its factory's class name, or "TQChannel" for a
// class of the host without a factory.
std::string TQChannelKind(const TQChannelBase& channel);

enum class TQKeypointClipRead { kOk, kNone, kDamaged };

struct TQKeypointClipReading {
    TQKeypointClipRead status = TQKeypointClipRead::kNone;
    TQKeypointClip clip;  // filled only with kOk
};

// The private form.
std::string TQWriteKeypointClip(const TQKeypointClip& clip);
// kDamaged for anything that is not exactly what TQWriteKeypointClip writes.
TQKeypointClipReading TQReadKeypointClip(std::string_view text);
// The readable form.
std::string TQDescribeKeypointClip(const TQKeypointClip& clip);

// What a paste did. Every answer but kPasted changed nothing.
enum class TQPasteResult {
    kPasted,
    kNothingToPaste,  // the pasteboard holds no keypoints of ours
    kDamaged,         // it does, but they do not read
    kNoChannel,       // a group's channel is neither shown nor stood in for by a selected one
    kLocked,          // a group would paste into a locked channel
};
// The strings table's key of the message that tells the user why a paste was refused; null
// for kPasted.
const char* TQPasteRefusalKey(TQPasteResult result);

// Both forms onto the pasteboard, replacing what it held.
void TQPutKeypointClip(RWPasteboard& pasteboard, const TQKeypointClip& clip);
// The private form from the pasteboard: kNone when it holds none.
TQKeypointClipReading TQTakeKeypointClip(const RWPasteboard& pasteboard);
bool TQPasteboardHasKeypoints(const RWPasteboard& pasteboard);
