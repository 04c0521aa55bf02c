#include "host/internal/TQHostProjectScope.h"

namespace tq_host {
namespace {

const BNScopeEntry kTable[] = {
    {"project", kProject, 0},
    {"version", kProject, kVersion},
    {"family", kProject, kFamily},

    {"timing", kTiming, 0},
    {"frameduration", kTiming, kFrameDuration},
    {"rangestart", kTiming, kRangeStart},
    {"rangeduration", kTiming, kRangeDuration},
    {"currenttime", kTiming, kCurrentTime},
    {"firstframe", kTiming, kFirstFrame},
    {"starttimecode", kTiming, kStartTimecode},
    {"textstep", kTiming, kTextStep},
    {"asframes", kTiming, kAsFrames},

    {"scene", kScene, 0},
    {"empty", kEmptySlot, 0},

    {"channel", kChannel, 0},
    {"factory", kChannel, kFactory},
    {"id", kChannel, kId},
    {"name", kChannel, kName},
    {"flags", kChannel, kFlags},
    {"locked", kChannel, kLocked},
    {"timeoffset", kChannel, kTimeOffset},
    {"extentstart", kChannel, kExtentStart},
    {"extentduration", kChannel, kExtentDuration},
    {"xaxislabel", kChannel, kXAxisLabel},
    {"slidermin", kChannel, kSliderMinimum},
    {"valuestep", kChannel, kValueStep},
    {"tickstep", kChannel, kTickStep},
    {"displayscale", kChannel, kDisplayScale},
    {"rangemin", kChannel, kRangeMinimum},
    {"rangemax", kChannel, kRangeMaximum},
    {"foldflags", kChannel, kFoldFlags},
    {"quaternion", kChannel, kQuaternion},
    {"initial", kChannel, kInitialValue},
    {"default", kChannel, kDefaultValue},
    {"slidermax", kChannel, kSliderMaximum},
    {"rigged", kChannel, kRigged},
    {"interpolation", kChannel, kInterpolation},
    {"before", kChannel, kExtrapolationBefore},
    {"after", kChannel, kExtrapolationAfter},
    {"animated", kChannel, kAnimationEnabled},

    // Keyframes are most of a file: short names.
    {"key", kKey, 0},
    {"t", kKey, kTime},
    {"v", kKey, kValue},
    {"iu", kKey, kInU},
    {"iv", kKey, kInV},
    {"ou", kKey, kOutU},
    {"ov", kKey, kOutV},
    {"i", kKey, kKeyInterpolation},
    {"locked", kKey, kKeyLocked},
    {"enabled", kKey, kKeyEnabled},
    {"broken", kKey, kKeyBroken},
    {"scaled", kKey, kKeyScaled},

    {"behavior", kBehavior, 0},
    {"kind", kBehavior, kKind},
    {"amplitude", kBehavior, kAmplitude},
    {"frequency", kBehavior, kFrequency},
    {"phase", kBehavior, kPhase},
    {"seed", kBehavior, kSeed},
    {"enabled", kBehavior, kBehaviorEnabled},
    {"selected", kBehavior, kBehaviorSelected},

    {"selection", kSelection, 0},
    {"selected", kSelected, 0},
    {"ref", kSelected, kRef},

    {"curveeditor", kCurveEditor, 0},
    {"curvesets", kCurveSets, 0},
    {"selected", kCurveSets, kSelectedCurveSet},
    {nullptr, 0, 0},
};

}  // namespace

const BNScope kProjectScope(kTable);

}  // namespace tq_host
