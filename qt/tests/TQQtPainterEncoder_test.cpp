// The painter encoder's frames read back as pixels: lines, textures, translucency and text as
// a user sees them; and frames whose thin lines and keypoint images are written straight into
// the pixels, against the same frames painted entirely by QPainter: the same picture.
#include <gtest/gtest.h>

#include <QColor>
#include <QImage>

#include <algorithm>
#include <cmath>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/geometry/BNViewProjection.h"
#include "qt/TQQtPainterEncoder.h"
#include "qt/internal/TQQtDirectRaster.h"
#include "tests/support/TextBaseline.h"

namespace {

const HXDColor kBackground{0.0f, 0.0f, 0.0f, 1.0f};
const HXDColor kRed{1.0f, 0.0f, 0.0f, 1.0f};
const HXDColor kBlue{0.0f, 0.0f, 1.0f, 1.0f};

using Primitives = std::vector<std::shared_ptr<HXDDrawPrimitive>>;

// One frame on `encoder` whose world coordinates are the pixels of `world` (y up), drawn at
// backing scale `scale`. The primitives go to the encoder `chunk` at a time (a view hands over
// each curve as it builds it); 0: all in one call.
QImage paint(TQQtPainterEncoder& encoder, const Primitives& primitives, QSize world,
             HXDColor background, float scale = 1.0f, size_t chunk = 0) {
    encoder.setDrawableSize(world * scale);
    HXDTexture* target = encoder.nextDrawable();
    const HXDRenderingContext context(
        target, scale, BNViewVolumeProjection(CGRectMake(0, 0, world.width(), world.height())),
        HXDFloat2{1.0f / scale, 1.0f / scale});
    encoder.beginEncoding(*target, background);
    const std::span<const std::shared_ptr<HXDDrawPrimitive>> all(primitives);
    const size_t step = chunk ? chunk : all.size();
    for (size_t at = 0; at < all.size(); at += step)
        encoder.encodePrimitives(all.subspan(at, std::min(step, all.size() - at)), context);
    encoder.endEncoding();
    return encoder.image();
}

// Where a probe walks: from a pixel (y up) in steps of (dx, dy), `count` pixels.
struct Probe {
    int x, y, dx, dy, count;
};
Probe row(int x, int y, int count, int step = 1) { return {x, y, step, 0, count}; }
Probe column(int x, int y, int count) { return {x, y, 0, 1, count}; }

// A 200 x 100 drawable whose world coordinates are its pixels (y up), so that primitives
// can be placed on exact pixel centres.
class PainterEncoderTest : public ::testing::Test {
protected:
    static constexpr int kWidth = 200;
    static constexpr int kHeight = 100;

    // The pixel whose centre is (x + 0.5, y + 0.5) in drawable pixels, y up.
    QColor pixel(int x, int yUp) const {
        return encoder.image().pixelColor(x, encoder.image().height() - 1 - yUp);
    }

    // What a probe saw (">" along a row, every dx-th pixel; "^" up a column), as runs of one
    // colour: "rrggbb" for one pixel, "rrggbb*n" for n.
    std::string runs(const Probe& p) const {
        const auto at = [&](int i) { return pixel(p.x + i * p.dx, p.y + i * p.dy); };
        // Appended piece by piece: GCC 12 at -O3 takes a prefixed string for an overlapping copy.
        std::string out("(");
        out.append(std::to_string(p.x)).append(",").append(std::to_string(p.y)).append(")");
        out.append(p.dy ? "^" : ">").append(p.dx > 1 ? std::to_string(p.dx) : "").append(":");
        for (int i = 0, n = 1; i < p.count; i += n) {
            for (n = 1; i + n < p.count && at(i + n) == at(i);) ++n;
            out.append(" ").append(at(i).name().mid(1).toStdString());
            if (n > 1) out.append("*").append(std::to_string(n));
        }
        return out;
    }

    // Renders a frame at backing scale `scale` (the drawable grows with it) and records, under
    // the heading `what`, what each probe saw.
    void shoot(const std::string& what, const Primitives& primitives,
               std::initializer_list<Probe> probes, float scale = 1.0f) {
        paint(encoder, primitives, QSize(kWidth, kHeight), kBackground, scale);
        record += what + "\n";
        for (const Probe& probe : probes) record += "  " + runs(probe) + "\n";
    }

    static std::shared_ptr<HXDMultiline> line(std::vector<HXDLineVertex> v) {
        return std::make_shared<HXDMultiline>(std::span<const HXDLineVertex>(v));
    }
    static std::shared_ptr<HXDMultiline> horizontal(float y, HXDColor from, HXDColor to,
                                                    float x0 = 10.0f) {
        return line({{{x0, y, 0.0f}, from}, {{190.0f, y, 0.0f}, to}});
    }
    static std::shared_ptr<HXDMultiline> stippled(std::shared_ptr<HXDMultiline> m) {
        m->setStippled(true);
        m->setStipplePattern(0x33333333u);  // two steps on, two off
        m->setStippleScale(2.0f);           // of 2 points: 4 pixels on, 4 off
        return m;
    }

    TQQtPainterEncoder encoder;
    std::string record;
};

TEST_F(PainterEncoderTest, nextDrawable__null_without_a_size_and_foreign_targets_are_refused) {
    EXPECT_EQ(encoder.nextDrawable(), nullptr);
    HXDRecordingEncoder other;
    encoder.beginEncoding(*other.nextDrawable(), kRed);
    encoder.endEncoding();
    EXPECT_EQ(encoder.framesPresented(), 0) << "a frame on a foreign target must not be presented";
}

// Frames of lines, quads and textures, each read back along a few rows or columns of pixels.
TEST_F(PainterEncoderTest, frames__read_back_along_probes_as_recorded) {
    shoot("per-vertex colours blend along the segment", {horizontal(50.5f, kRed, kBlue)},
          {row(4, 50, 25, 8), column(100, 47, 7)});
    // A corner at x = 16 lies inside a gap: restarting the pattern there would ink 16..19.
    shoot("the stipple runs on across a vertex",
          {stippled(line({{{10.0f, 20.5f, 0.0f}, kRed},
                          {{16.0f, 20.5f, 0.0f}, kRed},
                          {{60.0f, 20.5f, 0.0f}, kRed}}))},
          {row(6, 20, 28)});
    // 2^20 periods left of x = 16 (never walked: that would take minutes), in phase.
    shoot("the stipple runs on from far offscreen",
          {stippled(horizontal(50.5f, kRed, kRed, 16.0f - 64.0f * 1048576.0f))}, {row(0, 50, 28)});
    auto thick = horizontal(50.0f, kRed, kRed), thin = horizontal(50.5f, kRed, kRed);
    thick->setWidth(4.0f);
    thin->setWidth(0.5f);
    shoot("4 points wide at scale 2 cover 8 rows", {thick}, {column(200, 92, 18)}, 2.0f);
    shoot("half a pixel wide covers half the pixel", {thin}, {column(100, 48, 5)});
    // On a pixel boundary a one-pixel line covers two rows by half each.
    auto edge = horizontal(50.0f, kRed, kRed);
    edge->setAntialiased(true);
    shoot("an edge between rows", {edge}, {column(100, 47, 7)});
    edge->setGamma(2.0f);
    shoot("an edge between rows at gamma 2: coverage^(1/2)", {edge}, {column(100, 47, 7)});
    // A V of width 8 with its corner at (100, 80): a mitre reaches about 6 pixels past it.
    auto corner = line({{{50.0f, 20.0f, 0.0f}, kRed},
                        {{100.0f, 80.0f, 0.0f}, kRed},
                        {{150.0f, 20.0f, 0.0f}, kRed}});
    corner->setWidth(8.0f);
    corner->setLineJoin(0);
    shoot("join 0 is a mitre", {corner}, {column(99, 76, 14)});
    corner->setLineJoin(2);
    shoot("join 2 is a bevel", {corner}, {column(99, 76, 14)});
    corner->setLoop(true);
    corner->setWidth(1.0f);
    shoot("the loop closes the run along the bottom", {corner}, {column(100, 16, 7)});

    // A quarter of blue over red and over black, a blue triangle, and a curve's dimmed end:
    // everything times 0.3, stippled, one pixel wide (30 % of red, not 9 %).
    auto under = std::make_shared<HXDScreenspaceQuad>(CGRectMake(0, 0, 100, 100), 0);
    under->setColor(kRed);
    auto band = std::make_shared<HXDScreenspaceQuad>(CGRectMake(50, 0, 100, 100), 0);
    band->setColor(kBlue.scaled(0.25f));
    auto mesh = std::make_shared<HXDMesh>(
        9, HXDBrush{0, kBlue},
        std::vector<HXDSubmesh>{HXDSubmesh({{160, 20}, {190, 20}, {190, 80}})});
    auto dim = stippled(horizontal(90.5f, kRed.scaled(0.3f), kRed.scaled(0.3f)));
    shoot("premultiplied colours show their share over the target", {under, band, mesh, dim},
          {row(45, 50, 10), row(95, 70, 60), row(158, 30, 36), row(150, 90, 24)});
    band->setBlendingInfo(HXDDataType::additiveBlendingInfo());
    shoot("additive keeps the red", {under, band}, {row(45, 50, 10)});
    // A blending that multiplies by alpha once more takes the components as straight.
    HXDBlendingInfo straight = HXDDataType::sourceOneMinusSourceBlendingInfo();
    straight.sourceRGB = HXDBlendFactor::SourceAlpha;
    band->setBlendingInfo(straight);
    shoot("straight components are multiplied once", {band}, {row(140, 70, 15)});

    // 4 x 4 texels: left half red, right half blue, the top-left texel transparent and the
    // bottom-right one half transparent (an antialiased edge).
    std::vector<uint8_t> rgba(4 * 4 * 4);
    for (size_t i = 0; i < 16; ++i) {
        rgba[i * 4 + (i % 4 < 2 ? 0 : 2)] = 255;
        rgba[i * 4 + 3] = i == 0 ? 0 : i == 15 ? 128 : 255;
    }
    auto texture = HXDPixelTexture::textureWithRGBA(4, 4, 1.0f, std::move(rgba));
    shoot("a texture keeps its alpha, scaled up",
          {std::make_shared<HXDQuadTexture>(0, texture, CGRectMake(100, 40, 40, 40), 1.0f)},
          {row(96, 77, 48), row(96, 65, 48), row(96, 43, 48)});
    shoot("a texture at its own size 0.3 pixels off the grid is not resampled",
          {std::make_shared<HXDQuadTexture>(0, texture, CGRectMake(100.3, 40.2, 4, 4), 1.0f)},
          {row(98, 41, 8), row(98, 43, 8)});
    EXPECT_EQ(encoder.cachedTextureCount(), 1u) << "a texture is converted once, not per frame";
    EXPECT_TRUE(tests_support::matchesBaseline("painted-runs", record, "qt/tests/baselines"));
}

TEST_F(PainterEncoderTest, text__paints_inside_its_measured_box_in_its_colour) {
    TQQtTextMetrics metrics;
    HXDTextMetrics::setShared(&metrics);
    HXDAttributedString s{"Wide 8.88", HXDTextAttributes{}};
    s.attributes.color = kRed;
    auto text = std::make_shared<HXDText>(s, HXDTextLayoutAnchor::BottomLeft, CGPointMake(40, 40));
    HXDTextMetrics::setShared(nullptr);
    paint(encoder, {text}, QSize(kWidth, kHeight), kBackground);
    const CGSize size = text->size();
    int inked = 0, outside = 0;
    for (int y = 0; y < kHeight; ++y)
        for (int x = 0; x < kWidth; ++x)
            if (pixel(x, y).red() >= 60)
                ++(x >= 39 && x <= 41 + size.width && y >= 39 && y <= 41 + size.height ? inked
                                                                                       : outside);
    EXPECT_GT(inked, 10) << "the text left no red pixels";
    EXPECT_EQ(outside, 0) << "text pixels outside the measured box";
}

// Coverage is stepped along a line in fixed point on both paths, each its own: along a long
// line the two drift apart by a few hundredths of a pixel, a few steps of a channel. An
// off-by-one pixel, a wrong blend or a primitive painted out of order is ten times that.
constexpr int kCoverageTolerance = 8;
// Taller than one band of rows, so that bands meet inside the frame.
constexpr int kWidth = 240, kHeight = 300;

const HXDColor kOrange{0.9f, 0.5f, 0.1f, 1.0f};
const HXDColor kGreen{0.2f, 0.8f, 0.3f, 1.0f};
const HXDColor kHalfBlue{0.0f, 0.1f, 0.4f, 0.4f};  // premultiplied: 40 % of a blue

QImage render(const Primitives& primitives, bool direct, size_t chunk = 0) {
    TQQtPainterEncoder encoder;
    encoder.setDirectRaster(direct);
    return paint(encoder, primitives, QSize(kWidth, kHeight), HXDColor{0.1f, 0.1f, 0.12f, 1.0f},
                 1.0f, chunk);
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
