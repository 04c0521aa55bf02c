#include "src/resources/TQKeyframeImages.h"

namespace TQKeyframeImages {

const char* colorWord(std::size_t colorIndex) {
    static constexpr const char* kWords[kColorCount] = {"Green", "Purple",  "Orange", "Yellow",
                                                        "Red",   "Magenta", "Blue",   "Cyan"};
    return colorIndex < kColorCount ? kWords[colorIndex] : "";
}

BNString imageName(std::size_t colorIndex, std::size_t state, bool selected) {
    static constexpr const char* kStateWords[kStateCount] = {"Normal", "Pressed", "Inactive",
                                                             "Disabled"};
    if (colorIndex >= kColorCount || state >= kStateCount) return {};
    if (selected) return BNString("K_KeyframeEditor_Keyframe_Selected_") + kStateWords[state];
    // The inactive image carries no colour: one image serves every row.
    if (state == kInactive) return "K_KeyframeEditor_Keyframe_Inactive";
    return BNString("K_KeyframeEditor_Keyframe-") + colorWord(colorIndex) + "_" +
           kStateWords[state];
}

BNString tangentHandleImageName() { return "K_KeyframeEditor_KeyframeTangentHandle_Normal"; }

}  // namespace TQKeyframeImages
