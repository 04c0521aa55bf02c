#pragma once
// The editor's named colours: the eight curve colours, the selection, the background, text,
// locked curves, grid and end markers, in one dark theme.
//
// A GDColor is a plain value: sRGB components from 0 to 1 with straight (not premultiplied)
// alpha, as a colour table or a picker gives them. The named colours are fixed for the life
// of the process. Drawing takes colours premultiplied: the view converts a GDColor once, and
// derives a dimmed or translucent variant from the converted colour, where scaling all four
// components keeps the hue and lowers the opacity.
//
// This file depends on nothing but the standard library, so that tools (the image generator)
// can compile it alone and draw their images in exactly these colours.

#include <array>
#include <cstddef>
#include <optional>

struct GDColor {
    float red = 0.0f;
    float green = 0.0f;
    float blue = 0.0f;
    float alpha = 1.0f;

    friend bool operator==(const GDColor&, const GDColor&) = default;

    // The four components in the order red, green, blue, alpha.
    std::array<float, 4> components() const { return {red, green, blue, alpha}; }
    GDColor withAlpha(float newAlpha) const { return {red, green, blue, newAlpha}; }

    // The curve colours, in the order of an item's colour index: green, purple, orange,
    // yellow, red, magenta, blue, cyan.
    static GDColor curveColor0();
    static GDColor curveColor1();
    static GDColor curveColor2();
    static GDColor curveColor3();
    static GDColor curveColor4();
    static GDColor curveColor5();
    static GDColor curveColor6();
    static GDColor curveColor7();
    static constexpr std::size_t kCurveColorCount = 8;
    // curveColor0 .. curveColor7 by index; empty above 7.
    static std::optional<GDColor> curveColorAtIndex(std::size_t index);

    // A selected curve, the rubber band and the tangent handle lines.
    static GDColor selectedCurveColor0();
    // The clear colour of the curve editor's drawable.
    static GDColor curveEditorBackgroundColor0();
    // Value labels and other text drawn over the curves.
    static GDColor curveEditorTextColor0();
    // A curve whose channel is locked.
    static GDColor lockedCurveColor0();
    // The grid lines: 45/255 grey, opaque.
    static GDColor gridColor();
    // The lines that mark where a channel's keyframes begin and end: white at 0.15.
    static GDColor endpointsColor();
    // The border around a colour swatch in a value field.
    static GDColor curveEditorColoredTextFieldBorderColor();
};
