#pragma once
// The names of the keypoint and tangent-handle images, arranged as the view's asset table is:
// by colour index (0 to 7), state (0 normal, 1 pressed, 2 inactive, 3 disabled) and selected
// (0 the colour's own image, 1 the selected image, which is the same in every colour).

#include "platform/support/BNString.h"

#include <cstddef>

namespace TQKeyframeImages {

inline constexpr std::size_t kColorCount = 8;
inline constexpr std::size_t kStateCount = 4;

enum State : std::size_t { kNormal = 0, kPressed = 1, kInactive = 2, kDisabled = 3 };

// The colour word in an image name: "Green", "Purple", "Orange", "Yellow", "Red", "Magenta",
// "Blue", "Cyan" for indices 0 to 7; empty above 7.
const char* colorWord(std::size_t colorIndex);

// The image name for one slot, e.g. "K_KeyframeEditor_Keyframe-Green_Normal",
// "K_KeyframeEditor_Keyframe_Inactive" (one for all colours) or
// "K_KeyframeEditor_Keyframe_Selected_Pressed". Empty for a colour above 7 or a state above 3.
BNString imageName(std::size_t colorIndex, std::size_t state, bool selected);

// "K_KeyframeEditor_KeyframeTangentHandle_Normal".
BNString tangentHandleImageName();

}  // namespace TQKeyframeImages
