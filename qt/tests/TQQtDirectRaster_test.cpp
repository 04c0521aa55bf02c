// Frames whose thin lines and keypoint images are written straight into the pixels, against
// the same frames painted entirely by QPainter: a user must see the same picture.
#include <gtest/gtest.h>

#include <QImage>

#include <algorithm>
#include <cmath>
#include <memory>
#include <span>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "platform/geometry/BNViewProjection.h"
#include "qt/TQQtPainterEncoder.h"
#include "qt/internal/TQQtDirectRaster.h"

namespace {

// Coverage is stepped along a line in fixed point on both paths, each its own: along a long
// line the two drift apart by a few hundredths of a pixel, a few steps of a channel. An
// off-by-one pixel, a wrong blend or a primitive painted out of order is ten times that.
constexpr int kCoverageTolerance = 8;
// Taller than one band of rows, so that bands meet inside the frame.
constexpr int kWidth = 240, kHeight = 300;

using Primitives = std::vector<std::shared_ptr<HXDDrawPrimitive>>;

const HXDColor kOrange{0.9f, 0.5f, 0.1f, 1.0f};
const HXDColor kGreen{0.2f, 0.8f, 0.3f, 1.0f};
const HXDColor kHalfBlue{0.0f, 0.1f, 0.4f, 0.4f};  // premultiplied: 40 % of a blue

// World coordinates are drawable pixels, y up. The primitives go to the encoder `chunk` at a
// time (a view hands over each curve as it builds it); 0: all in one call.
QImage render(const Primitives& primitives, bool direct, size_t chunk = 0) {
    TQQtPainterEncoder encoder(QSize(kWidth, kHeight));
    encoder.setDirectRaster(direct);
    HXDTexture* target = encoder.nextDrawable();
    const HXDRenderingContext context(target, 1.0f,
                                      BNViewVolumeProjection(CGRectMake(0, 0, kWidth, kHeight)),
                                      HXDFloat2{1.0f, 1.0f});
    encoder.beginEncoding(*target, HXDColor{0.1f, 0.1f, 0.12f, 1.0f});
    const std::span<const std::shared_ptr<HXDDrawPrimitive>> all(primitives);
    const size_t step = chunk ? chunk : all.size();
    for (size_t at = 0; at < all.size(); at += step)
        encoder.encodePrimitives(all.subspan(at, std::min(step, all.size() - at)), context);
    encoder.endEncoding();
    return encoder.image();
}

std::shared_ptr<HXDMultiline> polyline(const std::vector<CGPoint>& points, HXDColor color,
                                       float width = 1.0f) {
    std::vector<HXDLineVertex> vertices;
    for (const CGPoint& p : points)
        vertices.emplace_back(HXDFloat3{float(p.x), float(p.y), 0}, color);
    auto line = std::make_shared<HXDMultiline>(std::move(vertices));
    line->setAntialiased(true);
    line->setWidth(width);
    return line;
}

std::shared_ptr<HXDMultiline> seg(double x0, double y0, double x1, double y1, HXDColor color,
                                  float width = 1.0f) {
    return polyline({CGPointMake(x0, y0), CGPointMake(x1, y1)}, color, width);
}

// A 9 x 9 round keypoint image with a soft rim (premultiplied), centred on a point.
std::shared_ptr<HXDQuadTexture> keypoint(double x, double y, float attenuation = 1.0f) {
    static const auto image = [] {
        std::vector<uint8_t> rgba;
        for (int t = 0; t < 81; ++t) {
            const double alpha = std::clamp(4.5 - std::hypot(t % 9 - 4.0, t / 9 - 4.0), 0.0, 1.0);
            for (const int c : {240, 220, 60, 255}) rgba.push_back(uint8_t(std::lround(c * alpha)));
        }
        return HXDPixelTexture::textureWithRGBA(9, 9, 1.0f, std::move(rgba), true);
    }();
    return std::make_shared<HXDQuadTexture>(0, image, CGRectMake(x - 4.5, y - 4.5, 9, 9),
                                            attenuation);
}

Primitives testFrame() {
    Primitives p;
    // Every direction from a centre off the grid; lines on pixel centres and edges.
    for (int k = 0; k < 24; ++k) {
        const double a = k * M_PI / 12.0 + 0.05;
        p.push_back(
            seg(120.3, 150.6, 120.3 + 110 * std::cos(a), 150.6 + 140 * std::sin(a), kOrange));
    }
    p.push_back(seg(10, 20.5, 200, 20.5, kGreen));
    p.push_back(seg(10, 30, 200, 30, kGreen));
    p.push_back(seg(30.5, 40, 30.5, 290, kGreen));
    // Nearly flat lines every 16 rows from the top: wherever bands of rows meet, one runs along.
    for (int row = 16; row < kHeight; row += 16)
        p.push_back(seg(140, kHeight - row + 0.3, 230, kHeight - row - 0.4, kGreen));
    // A field of small zigzags, steep swings a pixel or two apart as a dense animation draws:
    // enough points that the frame is painted in parts while it is encoded.
    for (int cell = 0; cell < 2000; ++cell) {
        std::vector<CGPoint> zigzag;
        for (int i = 0; i < 9; ++i)
            zigzag.push_back(CGPointMake(cell % 40 * 6 + i * 0.6 + 0.1 * (cell % 7),
                                         cell / 40 * 6 + (i % 2 ? 5.2 : 0.4)));
        p.push_back(polyline(zigzag, cell % 2 ? kGreen : kOrange));
    }
    // Off every edge, far outside, translucent, thin, sub-pixel and zero-length pieces.
    for (auto line : {seg(-50, 100, 300, 180, kOrange), seg(60, -40, 90, 400, kOrange),
                      seg(-10, -10, 250, 310, kGreen), seg(239.6, 0.2, 239.6, 299.8, kGreen),
                      seg(0.3, 299.7, 239.7, 299.7, kGreen), seg(-5000, 50, 5000, 250, kOrange),
                      seg(20, 260, 220, 60, kHalfBlue), seg(20, 60, 220, 260, kOrange, 0.5f),
                      polyline({CGPointMake(100.2, 200.2), CGPointMake(100.7, 200.5),
                                CGPointMake(100.7, 200.5), CGPointMake(101.1, 201.4)},
                               kGreen)})
        p.push_back(line);
    // Keypoints on edges and corners, overlapping, faded; a gradient line and a filled square
    // go through the painter in between, and what lies under and over them must stay so.
    auto gradient = std::make_shared<HXDMultiline>(std::vector<HXDLineVertex>{
        {HXDFloat3{10, 200, 0}, kOrange}, {HXDFloat3{230, 210, 0}, kGreen}});
    gradient->setAntialiased(true);
    p.push_back(gradient);
    for (const CGPoint c : {CGPointMake(1, 150), CGPointMake(239, 150), CGPointMake(120, 1),
                            CGPointMake(120, 299), CGPointMake(0, 0), CGPointMake(240, 300),
                            CGPointMake(128.2, 128.7), CGPointMake(131, 130)})
        p.push_back(keypoint(c.x, c.y));
    p.push_back(seg(30, 170, 110, 90, kOrange));
    p.push_back(keypoint(55, 115));
    p.push_back(std::make_shared<HXDScreenspaceQuad>(CGRectMake(40, 100, 60, 60), 0));
    p.push_back(keypoint(70, 130, 0.5f));
    p.push_back(seg(30, 90, 110, 170, kOrange));
    return p;
}

// Handed over in pieces, the frame is painted in parts on the pool while later pieces are
// encoded: every pixel as when it comes in one call, whichever thread painted which band.
TEST(DirectRaster, aFrameOfLinesAndKeypointsMatchesThePaintersInOnePieceOrMany) {
    const Primitives p = testFrame();
    const QImage reference = render(p, false);
    const QImage direct = render(p, true);
    ASSERT_EQ(direct.size(), reference.size());
    int largest = 0;
    for (int y = 0; y < reference.height() && largest <= kCoverageTolerance; ++y)
        for (int x = 0; x < reference.width() && largest <= kCoverageTolerance; ++x) {
            const QRgb a = direct.pixel(x, y), b = reference.pixel(x, y);
            for (const int d : {qRed(a) - qRed(b), qGreen(a) - qGreen(b), qBlue(a) - qBlue(b)})
                largest = std::max(largest, std::abs(d));
            EXPECT_LE(largest, kCoverageTolerance) << "at (" << x << ", " << y << ")";
        }
    for (const size_t chunk : {size_t(1), size_t(7), size_t(500)})
        EXPECT_TRUE(render(p, true, chunk) == direct) << "in pieces of " << chunk;
}

// A band passes over runs of a long polyline that lie wholly above or below it: what it
// paints is what the segments paint one by one.
TEST(DirectRaster, aLongPolylinePaintsAsItsSegmentsDo) {
    std::vector<QPointF> wave;
    for (int i = 0; i < 400; ++i) wave.emplace_back(i * 0.6, 150 + 145 * std::sin(i * 0.037));
    tq_raster::Batch whole, pieces;
    whole.addPolyline(wave.data(), wave.size(), 0xff20c040u);
    for (size_t i = 0; i + 1 < wave.size(); ++i) pieces.addPolyline(&wave[i], 2, 0xff20c040u);
    QImage images[2];
    for (int k = 0; k < 2; ++k) {
        images[k] = QImage(kWidth, kHeight, QImage::Format_ARGB32_Premultiplied);
        images[k].fill(0);
        tq_raster::Surface band = tq_raster::Surface::of(images[k]);
        for (int top = 0; top < kHeight; top += 64) {
            band.clip = QRect(0, top, kWidth, 64).intersected(images[k].rect());
            (k == 0 ? whole : pieces).paintBand(band);
        }
    }
    EXPECT_TRUE(images[0] == images[1]);
}

}  // namespace
