#pragma once
// Internal: the element and attribute ids of the host's own part of the project file, and the
// scope that names them. The editor's two trees bring their own scopes; the host's scope names
// only their root elements (and "selected" of "curvesets", which the host reads).

#include <cstdint>

#include "platform/support/BNScope.h"

namespace tq_host {

enum Element : uint32_t {
    kProject = 1000,
    kTiming = 1001,
    kScene = 1002,
    kChannel = 1003,  // any node of a channel tree, an object's root included
    kEmptySlot = 1004,
    kKey = 1005,
    kBehavior = 1006,
    kSelection = 1007,
    kSelected = 1008,
    kCurveEditor = 500,
    kCurveSets = 600,
};

enum ProjectAttribute : uint32_t { kVersion = 1, kFamily = 2 };

enum TimingAttribute : uint32_t {
    kFrameDuration = 1,
    kRangeStart = 2,
    kRangeDuration = 3,
    kCurrentTime = 4,
    kFirstFrame = 5,
    kStartTimecode = 6,
    kTextStep = 7,
    kAsFrames = 8,
};

enum ChannelAttribute : uint32_t {
    // Every node.
    kFactory = 1,
    kId = 2,
    kName = 3,
    kFlags = 4,
    kLocked = 5,
    kTimeOffset = 6,
    kExtentStart = 7,
    kExtentDuration = 8,
    kXAxisLabel = 9,
    kSliderMinimum = 10,
    kValueStep = 11,
    kTickStep = 12,
    kDisplayScale = 13,
    kRangeMinimum = 14,
    kRangeMaximum = 15,
    // Folders.
    kFoldFlags = 20,
    kQuaternion = 21,
    // Animated values.
    kInitialValue = 30,
    kDefaultValue = 31,
    kSliderMaximum = 32,
    kRigged = 33,
    kInterpolation = 34,
    kExtrapolationBefore = 35,
    kExtrapolationAfter = 36,
    kAnimationEnabled = 37,
};

enum KeyAttribute : uint32_t {
    kTime = 1,
    kValue = 2,
    kInU = 3,
    kInV = 4,
    kOutU = 5,
    kOutV = 6,
    kKeyInterpolation = 7,
    kKeyLocked = 8,
    kKeyEnabled = 9,
    kKeyBroken = 10,
    kKeyScaled = 11,
};

enum BehaviorAttribute : uint32_t {
    kKind = 1,
    kAmplitude = 2,
    kFrequency = 3,
    kPhase = 4,
    kSeed = 5,
    kBehaviorEnabled = 6,
    kBehaviorSelected = 7,
};

enum SelectionAttribute : uint32_t { kRef = 1 };
enum CurveSetsAttribute : uint32_t { kSelectedCurveSet = 1 };

extern const BNScope kProjectScope;

}  // namespace tq_host
