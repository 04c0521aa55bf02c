// Images drawn by cells through the painter: the resource's file for the device's pixel
// ratio, scaled into the frame, at the opacity asked for; a name the resources lack draws
// nothing.
#include <gtest/gtest.h>

#include <QImage>
#include <QPainter>

#include "qt/TQQtCellDrawing.h"

namespace {

// The most opaque pixel's alpha inside the rectangle.
int maxAlpha(const QImage& image, const QRect& rect) {
    int most = 0;
    for (int y = rect.top(); y <= rect.bottom(); ++y)
        for (int x = rect.left(); x <= rect.right(); ++x)
            most = std::max(most, qAlpha(image.pixel(x, y)));
    return most;
}

int drawnAlpha(const char* name, double opacity, qreal ratio, const QRect& probe) {
    QImage image(QSize(40, 20) * ratio, QImage::Format_ARGB32_Premultiplied);
    image.setDevicePixelRatio(ratio);
    image.fill(Qt::transparent);
    {
        QPainter painter(&image);
        TQQtCellDrawing drawing(painter, QPalette());
        drawing.drawImage(name, CGRectMake(20, 2, 16, 16), opacity);
    }
    return maxAlpha(image, QRect(probe.topLeft() * ratio, probe.size() * ratio));
}

TEST(QtCellImages, drawImage__in_its_frame_at_its_opacity_and_either_ratio) {
    for (const qreal ratio : {1.0, 2.0}) {
        SCOPED_TRACE(ratio);
        const QRect frame(20, 2, 16, 16);
        const int full = drawnAlpha("AnimStatusKeyframe", 1.0, ratio, frame);
        EXPECT_GT(full, 200) << "the filled keyframe mark";
        EXPECT_EQ(drawnAlpha("AnimStatusKeyframe", 1.0, ratio, QRect(0, 0, 18, 20)), 0)
            << "nothing outside the frame";
        EXPECT_NEAR(drawnAlpha("AnimStatusKeyframe", 0.5, ratio, frame), full / 2, 3);
        EXPECT_EQ(drawnAlpha("NoSuchImage", 1.0, ratio, QRect(0, 0, 40, 20)), 0);
    }
}

}  // namespace
