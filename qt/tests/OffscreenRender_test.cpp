// A frame painted by the QPainter encoder into an image, as the user sees it: three level
// curves in bands of their own, each in its colour between its keypoints, its ends at 30 % of
// that colour over the background (as a GPU pipeline blends a colour at 0.3 opacity, not the
// 9 % that an opacity applied twice leaves), and the background everywhere else. The frame is
// written beside the test binary as a PNG, to look at when this test fails.
#include <gtest/gtest.h>

#include <QDir>
#include <QImage>

#include <algorithm>

#include "qt/TQQtPainterEncoder.h"
#include "qt/tests/QtViewFixture.h"

namespace qt_test {
namespace {

// The stipple repeats every 8 pixels at backing scale 1 (2 steps of 2 points on, 2 off).
constexpr int kStipplePeriod = 8;
// Room around keypoint images (pixels) where the curve's colour is not judged.
constexpr int kKeypointClearance = 12;

class OffscreenRender : public QtViewFixture {
protected:
    // The share of `want` over `background` a pixel shows (its projection on the line between
    // them); -1 when the pixel lies off that line, as another colour would.
    static double share(const QColor& got, const QColor& background, const QColor& want) {
        const double d[3] = {double(want.red() - background.red()),
                             double(want.green() - background.green()),
                             double(want.blue() - background.blue())};
        const double g[3] = {double(got.red() - background.red()),
                             double(got.green() - background.green()),
                             double(got.blue() - background.blue())};
        const double len2 = d[0] * d[0] + d[1] * d[1] + d[2] * d[2];
        const double a = (g[0] * d[0] + g[1] * d[1] + g[2] * d[2]) / len2;
        return std::hypot(g[0] - a * d[0], g[1] - a * d[1], g[2] - a * d[2]) <= 40.0 ? a : -1.0;
    }
    // The summed share of `want` in the column of five pixels around row `y` (y up).
    double columnShare(const QImage& image, int x, int y, const QColor& want) const {
        double sum = 0.0;
        for (int dy = -2; dy <= 2; ++dy)
            sum += std::max(
                0.0, share(image.pixelColor(x, image.height() - 1 - (y + dy)), background(), want));
        return sum;
    }
    QColor background() const {
        const GDColor c = view.backgroundColor();
        return TQQtPainterEncoder::qColor(HXDColor{c.red, c.green, c.blue, 1.0f});
    }
};

TEST_F(OffscreenRender, frame__curve_colours_dimmed_ends_and_background) {
    const double levels[] = {-0.5, 0.0, 0.5};  // rows 100, 200 and 300 of 400
    std::vector<TQCurveEditorChannelItemPtr> items;
    for (double v : levels) {
        items.push_back(addItem(addChannel("L", {{2.0, v}, {5.0, v}, {8.0, v}})));
        items.back()->setScaleY(1.0);
        items.back()->setOffsetY(0.0);
    }
    drawFrame();
    const QImage& image = widget.encoder().image();
    ASSERT_EQ(image.size(), QSize(800, 400));
    image.save(QDir(QCoreApplication::applicationDirPath()).filePath("offscreen_render.png"));

    for (size_t i = 0; i < items.size(); ++i) {
        SCOPED_TRACE(i);
        const GDColor c = TQCurveEditorViewBase::getColorForIndex(items[i]->colorIndex());
        const QColor want = TQQtPainterEncoder::qColor(HXDColor{c.red, c.green, c.blue, 1.0f});
        const int row = 100 * static_cast<int>(i + 1);
        // Between the keypoints (160 to 640 px): the full colour in every uncrowded column.
        for (int x = 160 + kKeypointClearance; x < 640 - kKeypointClearance; x += 7) {
            if (std::abs(x - 400) < kKeypointClearance) continue;
            EXPECT_NEAR(columnShare(image, x, row, want), 1.0, 0.15) << "column " << x;
        }
        // Past the last keypoint: the brightest column of each stipple period holds 0.3.
        for (int x = 640 + kKeypointClearance; x + kStipplePeriod < 798; x += kStipplePeriod) {
            double best = 0.0;
            for (int dx = 0; dx < kStipplePeriod; ++dx)
                best = std::max(best, columnShare(image, x + dx, row, want));
            EXPECT_NEAR(best, 0.3, 0.06) << "dimmed end at column " << x;
        }
    }
    // Half-way between the bands, nothing but the background.
    for (int y : {50, 150, 250, 350})
        for (int x = 0; x < 800; x += 9)
            ASSERT_EQ(image.pixel(x, 399 - y), background().rgba()) << x << ", " << y;
}

}  // namespace
}  // namespace qt_test
