#include <gtest/gtest.h>

#include <QColor>
#include <QImage>

#include <cmath>
#include <memory>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/geometry/BNViewProjection.h"
#include "qt/TQQtPainterEncoder.h"

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

}  // namespace
