#include "src/resources/GDColor.h"

// A dark theme. The curve colours are bright enough to read on the background at the thin
// line width of a high-density screen, and far enough apart in hue to tell eight curves
// apart; at 0.3 opacity (the dimmed extrapolated ends) they still stand off the background.
// The selection is near white with a high blue component: the tangent lines use its blue
// value as their alpha, so a warm or dark selection colour would make them vanish.

GDColor GDColor::curveColor0() { return {0.40f, 0.82f, 0.38f, 1.0f}; }  // green
GDColor GDColor::curveColor1() { return {0.64f, 0.48f, 0.94f, 1.0f}; }  // purple
GDColor GDColor::curveColor2() { return {0.98f, 0.60f, 0.22f, 1.0f}; }  // orange
GDColor GDColor::curveColor3() { return {0.95f, 0.85f, 0.28f, 1.0f}; }  // yellow
GDColor GDColor::curveColor4() { return {0.94f, 0.32f, 0.32f, 1.0f}; }  // red
GDColor GDColor::curveColor5() { return {0.92f, 0.38f, 0.82f, 1.0f}; }  // magenta
GDColor GDColor::curveColor6() { return {0.32f, 0.58f, 0.98f, 1.0f}; }  // blue
GDColor GDColor::curveColor7() { return {0.28f, 0.84f, 0.90f, 1.0f}; }  // cyan

std::optional<GDColor> GDColor::curveColorAtIndex(std::size_t index) {
    switch (index) {
        case 0: return curveColor0();
        case 1: return curveColor1();
        case 2: return curveColor2();
        case 3: return curveColor3();
        case 4: return curveColor4();
        case 5: return curveColor5();
        case 6: return curveColor6();
        case 7: return curveColor7();
        default: return std::nullopt;
    }
}

GDColor GDColor::selectedCurveColor0() { return {0.96f, 0.96f, 0.96f, 1.0f}; }
// Darker than the grid (45/255), so that the grid reads as lines and not as the background.
GDColor GDColor::curveEditorBackgroundColor0() { return {0.110f, 0.114f, 0.122f, 1.0f}; }
GDColor GDColor::curveEditorTextColor0() { return {0.80f, 0.80f, 0.82f, 1.0f}; }
GDColor GDColor::lockedCurveColor0() { return {0.46f, 0.46f, 0.48f, 1.0f}; }
GDColor GDColor::gridColor() {
    constexpr float k45 = 45.0f / 255.0f;
    return {k45, k45, k45, 1.0f};
}
GDColor GDColor::endpointsColor() { return {1.0f, 1.0f, 1.0f, 0.15f}; }
GDColor GDColor::curveEditorColoredTextFieldBorderColor() { return {0.36f, 0.36f, 0.38f, 1.0f}; }
