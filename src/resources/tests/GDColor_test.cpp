#include "src/resources/GDColor.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

constexpr float kExact = 1e-6f;

// WCAG relative luminance of an sRGB colour, and the contrast ratio of two of them.
double luminance(const GDColor& c) {
    auto linear = [](double v) {
        return v <= 0.04045 ? v / 12.92 : std::pow((v + 0.055) / 1.055, 2.4);
    };
    return 0.2126 * linear(c.red) + 0.7152 * linear(c.green) + 0.0722 * linear(c.blue);
}
double contrast(const GDColor& a, const GDColor& b) {
    const double la = luminance(a), lb = luminance(b);
    return (std::max(la, lb) + 0.05) / (std::min(la, lb) + 0.05);
}

TEST(GDColor, curveColorAtIndex__theEightNamedColoursThenNothing) {
    const GDColor named[] = {GDColor::curveColor0(), GDColor::curveColor1(), GDColor::curveColor2(),
                             GDColor::curveColor3(), GDColor::curveColor4(), GDColor::curveColor5(),
                             GDColor::curveColor6(), GDColor::curveColor7()};
    for (std::size_t i = 0; i < GDColor::kCurveColorCount; ++i) {
        ASSERT_TRUE(GDColor::curveColorAtIndex(i).has_value()) << "index " << i;
        EXPECT_EQ(GDColor::curveColorAtIndex(i).value_or(GDColor{}), named[i]) << "index " << i;
    }
    EXPECT_FALSE(GDColor::curveColorAtIndex(8).has_value());
    EXPECT_FALSE(GDColor::curveColorAtIndex(static_cast<std::size_t>(-1)).has_value());
}

TEST(GDColor, curveColors__distinctAndReadableOnTheBackground) {
    const GDColor background = GDColor::curveEditorBackgroundColor0();
    for (std::size_t i = 0; i < GDColor::kCurveColorCount; ++i) {
        const GDColor c = GDColor::curveColorAtIndex(i).value_or(GDColor{});
        EXPECT_EQ(c.alpha, 1.0f) << "curve " << i;
        EXPECT_GT(contrast(c, background), 4.5)
            << "curve " << i << " is hard to read on the background";
        // The extrapolated ends are drawn at 0.3 opacity: composited over the background
        // they must still read as the curve, not as the background.
        const GDColor dim{0.3f * c.red + 0.7f * background.red,
                          0.3f * c.green + 0.7f * background.green,
                          0.3f * c.blue + 0.7f * background.blue, 1.0f};
        EXPECT_GT(contrast(dim, background), 1.4) << "dimmed curve " << i << " vanishes";
        for (std::size_t k = 0; k < i; ++k) {
            const GDColor o = GDColor::curveColorAtIndex(k).value_or(GDColor{});
            EXPECT_GT(std::hypot(c.red - o.red, c.green - o.green, c.blue - o.blue), 0.2)
                << "curves " << k << " and " << i << " look alike";
        }
    }
}

TEST(GDColor, fixedAndThemeColours) {
    const GDColor grid = GDColor::gridColor();
    EXPECT_NEAR(grid.red, 45.0f / 255.0f, kExact);
    EXPECT_NEAR(grid.green, 45.0f / 255.0f, kExact);
    EXPECT_NEAR(grid.blue, 45.0f / 255.0f, kExact);
    EXPECT_EQ(grid.alpha, 1.0f);
    EXPECT_EQ(GDColor::endpointsColor(), (GDColor{1.0f, 1.0f, 1.0f, 0.15f}));

    EXPECT_LT(luminance(GDColor::curveEditorBackgroundColor0()), luminance(grid))
        << "the grid must show as lines on the background";
    EXPECT_GT(contrast(GDColor::curveEditorTextColor0(), GDColor::curveEditorBackgroundColor0()),
              7.0);
    // Tangent lines are drawn in the selection colour with its blue value as their alpha.
    EXPECT_GT(GDColor::selectedCurveColor0().blue, 0.8f) << "tangent lines would be faint";
    EXPECT_GT(contrast(GDColor::lockedCurveColor0(), GDColor::curveEditorBackgroundColor0()), 3.0);
}

TEST(GDColor, withAlpha) {
    const GDColor c{0.5f, 0.25f, 1.0f, 0.8f};
    EXPECT_EQ(c.withAlpha(0.1f), (GDColor{0.5f, 0.25f, 1.0f, 0.1f}));
    EXPECT_EQ(c.components(), (std::array<float, 4>{0.5f, 0.25f, 1.0f, 0.8f}));
}

}  // namespace
