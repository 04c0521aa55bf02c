#pragma once
// The pointer images of the curve views: each is an image of the resources (24 points square,
// at 1x and 2x) with the point of the image that lies under the pointer's position.

#include <string_view>

struct GDCursorImage {
    const char* name;  // the image's resource name, which is also the cursor's
    double hotSpotX;   // points from the image's left
    double hotSpotY;   // points from the image's top
};

inline constexpr double kGDCursorSize = 24.0;

// Keypoints being dragged, or a click that would drag.
inline constexpr GDCursorImage GDCursorMove{"GDCursorMove", 12.0, 12.0};
// Nothing under the pointer: a click selects or starts a band.
inline constexpr GDCursorImage GDCursorEditPoints{"GDCursorEditPoints", 3.0, 2.0};
// The box tool.
inline constexpr GDCursorImage GDCursorCrossHairs{"GDCursorCrossHairs", 12.0, 12.0};
// The sketch tool: the pencil's tip.
inline constexpr GDCursorImage GDCursorSketch{"GDCursorSketch", 3.0, 21.0};
// A click on the curve adds a keypoint: the pen's nib.
inline constexpr GDCursorImage GDCursorPenAddControlPoint{"GDCursorPenAddControlPoint", 4.0, 20.0};

inline constexpr GDCursorImage kGDCursors[] = {GDCursorMove, GDCursorEditPoints, GDCursorCrossHairs,
                                               GDCursorSketch, GDCursorPenAddControlPoint};

// The cursor of that name, or null.
inline const GDCursorImage* GDCursorWithName(std::string_view name) {
    for (const GDCursorImage& cursor : kGDCursors)
        if (name == cursor.name) return &cursor;
    return nullptr;
}
