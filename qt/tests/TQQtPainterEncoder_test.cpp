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
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/geometry/BNViewProjection.h"
#include "qt/TQQtPainterEncoder.h"
#include "qt/internal/TQQtDirectRaster.h"

namespace {

// Colour components read back from an 8-bit image are off by rounding and by blending.
constexpr int kChannelTolerance = 3;

const HXDColor kBackground{0.0f, 0.0f, 0.0f, 1.0f};
const HXDColor kRed{1.0f, 0.0f, 0.0f, 1.0f};
const HXDColor kBlue{0.0f, 0.0f, 1.0f, 1.0f};

using Primitives = std::vector<std::shared_ptr<HXDDrawPrimitive>>;

// A 200 x 100 drawable whose world coordinates are its pixels (y up), so that primitives
// can be placed on exact pixel centres.
class PainterEncoderTest : public ::testing::Test {
protected:
    static constexpr int kWidth = 200;
    static constexpr int kHeight = 100;

    // One frame at backing scale `scale` (the drawable grows with it).
    void render(const Primitives& primitives, float scale = 1.0f) {
        encoder.setDrawableSize(
            QSize(static_cast<int>(kWidth * scale), static_cast<int>(kHeight * scale)));
        HXDTexture* target = encoder.nextDrawable();
        ASSERT_NE(target, nullptr);
        const HXDRenderingContext context(target, scale,
                                          BNViewVolumeProjection(CGRectMake(0, 0, kWidth, kHeight)),
                                          HXDFloat2{1.0f / scale, 1.0f / scale});
        encoder.beginEncoding(*target, kBackground);
        for (const auto& p : primitives) p->encodeWithEncoder(encoder, context);
        encoder.endEncoding();
    }

    // The pixel whose centre is (x + 0.5, y + 0.5) in drawable pixels, y up.
    QColor pixel(int x, int yUp) const {
        return encoder.image().pixelColor(x, encoder.image().height() - 1 - yUp);
    }

    static ::testing::AssertionResult near(const QColor& got, const HXDColor& want,
                                           int tolerance = kChannelTolerance) {
        const QColor w = TQQtPainterEncoder::qColor(want);
        if (std::abs(got.red() - w.red()) <= tolerance &&
            std::abs(got.green() - w.green()) <= tolerance &&
            std::abs(got.blue() - w.blue()) <= tolerance)
            return ::testing::AssertionSuccess();
        return ::testing::AssertionFailure()
               << "got rgb(" << got.red() << "," << got.green() << "," << got.blue()
               << "), want rgb(" << w.red() << "," << w.green() << "," << w.blue() << ")";
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
};

TEST_F(PainterEncoderTest, nextDrawable__null_without_a_size_and_foreign_targets_are_refused) {
    EXPECT_EQ(encoder.nextDrawable(), nullptr);
    HXDRecordingEncoder other;
    encoder.beginEncoding(*other.nextDrawable(), kRed);
    encoder.endEncoding();
    EXPECT_EQ(encoder.framesPresented(), 0) << "a frame on a foreign target must not be presented";
}

TEST_F(PainterEncoderTest, multiline__per_vertex_colours_blend_along_the_segment) {
    render({horizontal(50.5f, kRed, kBlue)});
    EXPECT_GT(pixel(12, 50).red(), 230);
    EXPECT_GT(pixel(188, 50).blue(), 230);
    EXPECT_NEAR(pixel(100, 50).red(), 128, 12) << "halfway the colour is half of each";
    EXPECT_TRUE(near(pixel(100, 52), kBackground)) << "two rows above the line";
}

TEST_F(PainterEncoderTest, multiline__stipple_phase_runs_on_across_vertices_and_offscreen) {
    // Checked in the middle of each 4-pixel step: aliased lines may round by one pixel.
    // A corner at x = 16 lies inside a gap: dashes 10..13, 18..21; restarting there would
    // ink 16..19.
    render({stippled(line({{{10.0f, 20.5f, 0.0f}, kRed},
                           {{16.0f, 20.5f, 0.0f}, kRed},
                           {{60.0f, 20.5f, 0.0f}, kRed}}))});
    EXPECT_TRUE(near(pixel(12, 20), kRed));
    EXPECT_TRUE(near(pixel(16, 20), kBackground)) << "the gap must run on past the vertex";
    EXPECT_TRUE(near(pixel(20, 20), kRed));
    // 2^20 pattern periods (64 pixels) left of x = 16: the visible part is in phase, as if
    // every step had been walked (and it is not walked: this would take minutes).
    render({stippled(horizontal(50.5f, kRed, kRed, 16.0f - 64.0f * 1048576.0f))});
    EXPECT_TRUE(near(pixel(18, 50), kRed)) << "a dash starts at x = 16";
    EXPECT_TRUE(near(pixel(22, 50), kBackground));
    EXPECT_TRUE(near(pixel(2, 50), kRed)) << "the part left of x = 16 is in phase too";
}

TEST_F(PainterEncoderTest, multiline__width_in_points_times_backing_scale) {
    auto thick = horizontal(50.0f, kRed, kRed);
    thick->setWidth(4.0f);
    render({thick}, 2.0f);
    EXPECT_TRUE(near(pixel(200, 102), kRed)) << "4 points at scale 2 cover rows 96..103";
    EXPECT_TRUE(near(pixel(200, 106), kBackground));
    auto thin = horizontal(50.5f, kRed, kRed);
    thin->setWidth(0.5f);
    render({thin});
    EXPECT_NEAR(pixel(100, 50).red(), 128, 8) << "half a pixel wide covers half the pixel";
}

TEST_F(PainterEncoderTest, multiline__gamma_raises_partial_coverage) {
    // On a pixel boundary a one-pixel line covers two rows by half each.
    auto edge = horizontal(50.0f, kRed, kRed);
    edge->setAntialiased(true);
    render({edge});
    const int linear = pixel(100, 50).red();
    edge->setGamma(2.0f);
    render({edge});
    EXPECT_NEAR(pixel(100, 50).red(), 255.0 * std::sqrt(linear / 255.0), 6.0) << "coverage^(1/2)";
    EXPECT_TRUE(near(pixel(100, 53), kBackground)) << "no coverage stays none";
}

TEST_F(PainterEncoderTest, multiline__join_and_loop) {
    // A V of width 8 with its corner at (100, 80): a mitre reaches about 6 pixels past it.
    auto corner = line({{{50.0f, 20.0f, 0.0f}, kRed},
                        {{100.0f, 80.0f, 0.0f}, kRed},
                        {{150.0f, 20.0f, 0.0f}, kRed}});
    corner->setWidth(8.0f);
    corner->setLineJoin(0);
    render({corner});
    EXPECT_TRUE(near(pixel(99, 84), kRed)) << "join 0 is a mitre";
    corner->setLineJoin(2);
    render({corner});
    EXPECT_TRUE(near(pixel(99, 84), kBackground)) << "join 2 is a bevel";
    corner->setLoop(true);
    corner->setWidth(1.0f);
    render({corner});
    EXPECT_GT(std::max(pixel(100, 19).red(), pixel(100, 20).red()), 200)
        << "the loop closes the run along the bottom";
}

TEST_F(PainterEncoderTest, quadTexture__alpha_kept_and_texel_for_pixel_on_whole_pixels) {
    // 4 x 4 texels: left half red, right half blue, the top-left texel transparent and the
    // bottom-right one half transparent (an antialiased edge).
    std::vector<uint8_t> rgba(4 * 4 * 4);
    for (size_t i = 0; i < 16; ++i) {
        rgba[i * 4 + (i % 4 < 2 ? 0 : 2)] = 255;
        rgba[i * 4 + 3] = i == 0 ? 0 : i == 15 ? 128 : 255;
    }
    auto texture = HXDPixelTexture::textureWithRGBA(4, 4, 1.0f, std::move(rgba));
    render({std::make_shared<HXDQuadTexture>(0, texture, CGRectMake(100, 40, 40, 40), 1.0f)});
    EXPECT_TRUE(near(pixel(103, 77), kBackground)) << "the transparent top-left texel";
    EXPECT_TRUE(near(pixel(137, 43), HXDColor{0.0f, 0.0f, 0.5f, 1.0f}))
        << "half a blue texel over black: half blue, neither darker nor brighter";
    EXPECT_TRUE(near(pixel(127, 65), kBlue));
    // Placed 0.3 pixels off the grid at its own size: not resampled.
    render({std::make_shared<HXDQuadTexture>(0, texture, CGRectMake(100.3, 40.2, 4, 4), 1.0f)});
    EXPECT_TRUE(near(pixel(101, 41), kRed, 0));
    EXPECT_TRUE(near(pixel(102, 41), kBlue, 0));
    EXPECT_EQ(encoder.cachedTextureCount(), 1u) << "a texture is converted once, not per frame";
}

TEST_F(PainterEncoderTest, translucent_colours__premultiplied_show_their_share_over_the_target) {
    auto under = std::make_shared<HXDScreenspaceQuad>(CGRectMake(0, 0, 100, 100), 0);
    under->setColor(kRed);
    auto band = std::make_shared<HXDScreenspaceQuad>(CGRectMake(50, 0, 100, 100), 0);
    band->setColor(kBlue.scaled(0.25f));
    auto mesh = std::make_shared<HXDMesh>(
        9, HXDBrush{0, kBlue},
        std::vector<HXDSubmesh>{HXDSubmesh({{160, 20}, {190, 20}, {190, 80}})});
    // A curve's dimmed end: everything times 0.3, stippled, one pixel wide.
    auto dim = stippled(horizontal(90.5f, kRed.scaled(0.3f), kRed.scaled(0.3f)));
    render({under, band, mesh, dim});
    EXPECT_TRUE(near(pixel(75, 50), HXDColor{0.75f, 0.0f, 0.25f, 1.0f}))
        << "a quarter of blue over red";
    EXPECT_TRUE(near(pixel(185, 30), kBlue)) << "inside the triangle";
    EXPECT_TRUE(near(pixel(145, 70), HXDColor{0.0f, 0.0f, 0.25f, 1.0f})) << "the band over black";
    EXPECT_TRUE(near(pixel(155, 90), HXDColor{0.3f, 0.0f, 0.0f, 1.0f}))
        << "a dimmed line shows 30 % of its colour, not 9 %";
    band->setBlendingInfo(HXDDataType::additiveBlendingInfo());
    render({under, band});
    EXPECT_TRUE(near(pixel(75, 50), HXDColor{1.0f, 0.0f, 0.25f, 1.0f})) << "additive keeps the red";
    // A blending that multiplies by alpha once more takes the components as straight.
    HXDBlendingInfo straight = HXDDataType::sourceOneMinusSourceBlendingInfo();
    straight.sourceRGB = HXDBlendFactor::SourceAlpha;
    band->setBlendingInfo(straight);
    render({band});
    EXPECT_TRUE(near(pixel(145, 70), HXDColor{0.0f, 0.0f, 0.0625f, 1.0f}));
}

TEST_F(PainterEncoderTest, text__paints_inside_its_measured_box_in_its_colour) {
    TQQtTextMetrics metrics;
    HXDTextMetrics::setShared(&metrics);
    HXDAttributedString s{"Wide 8.88", HXDTextAttributes{}};
    s.attributes.color = kRed;
    auto text = std::make_shared<HXDText>(s, HXDTextLayoutAnchor::BottomLeft, CGPointMake(40, 40));
    HXDTextMetrics::setShared(nullptr);
    render({text});
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
