#include <gtest/gtest.h>

#include <QColor>
#include <QImage>

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

// A 200 x 100 drawable whose world coordinates are its pixels (y up), so that every
// primitive can be placed on exact pixel centres.
class PainterEncoderTest : public ::testing::Test {
protected:
    static constexpr int kWidth = 200;
    static constexpr int kHeight = 100;

    // One frame with the given primitives, at backing scale `scale` (the drawable grows).
    void render(const std::vector<std::shared_ptr<HXDDrawPrimitive>>& primitives, float scale = 1.0f) {
        encoder.setDrawableSize(QSize(static_cast<int>(kWidth * scale), static_cast<int>(kHeight * scale)));
        HXDTexture* target = encoder.nextDrawable();
        ASSERT_NE(target, nullptr);
        const HXDRenderingContext context(target, scale, BNViewVolumeProjection(CGRectMake(0, 0, kWidth, kHeight)),
                                          HXDFloat2{1.0f / scale, 1.0f / scale});
        encoder.beginEncoding(*target, kBackground);
        for (const auto& p : primitives) p->encodeWithEncoder(encoder, context);
        encoder.endEncoding();
    }

    // The pixel whose centre is (x + 0.5, y + 0.5) in drawable pixels, y up.
    QColor pixel(int x, int yUp) const { return encoder.image().pixelColor(x, encoder.image().height() - 1 - yUp); }

    static ::testing::AssertionResult near(const QColor& got, const HXDColor& want, int tolerance = kChannelTolerance) {
        const QColor w = TQQtPainterEncoder::qColor(want);
        if (std::abs(got.red() - w.red()) <= tolerance && std::abs(got.green() - w.green()) <= tolerance &&
            std::abs(got.blue() - w.blue()) <= tolerance)
            return ::testing::AssertionSuccess();
        return ::testing::AssertionFailure() << "got rgb(" << got.red() << "," << got.green() << "," << got.blue()
                                             << "), want rgb(" << w.red() << "," << w.green() << "," << w.blue()
                                             << ")";
    }

    static std::shared_ptr<HXDMultiline> horizontalLine(float y, HXDColor from, HXDColor to) {
        const std::vector<HXDLineVertex> v{{{10.0f, y, 0.0f}, from}, {{190.0f, y, 0.0f}, to}};
        return std::make_shared<HXDMultiline>(std::span<const HXDLineVertex>(v));
    }

    TQQtPainterEncoder encoder;
};

TEST_F(PainterEncoderTest, frame__clears_to_the_background_and_presents) {
    int presented = 0;
    encoder.setPresentHandler([&](const QImage& image) {
        ++presented;
        EXPECT_EQ(image.size(), QSize(kWidth, kHeight));
    });
    render({});
    EXPECT_EQ(presented, 1);
    EXPECT_EQ(encoder.framesPresented(), 1);
    EXPECT_TRUE(near(pixel(0, 0), kBackground));
    EXPECT_TRUE(near(pixel(kWidth - 1, kHeight - 1), kBackground));
}

TEST_F(PainterEncoderTest, nextDrawable__null_without_a_size_and_foreign_targets_are_refused) {
    EXPECT_EQ(encoder.nextDrawable(), nullptr) << "an encoder without a size has no drawable";
    HXDRecordingEncoder other;  // its target is not a QImage of ours
    encoder.beginEncoding(*other.nextDrawable(), kRed);
    encoder.endEncoding();
    EXPECT_EQ(encoder.framesPresented(), 0) << "a frame on a foreign target must not be presented";
}

TEST_F(PainterEncoderTest, multiline__solid_colour_on_its_row_only) {
    auto line = horizontalLine(50.5f, kRed, kRed);
    line->setAntialiased(true);
    render({line});
    EXPECT_TRUE(near(pixel(100, 50), kRed)) << "the line's own row";
    EXPECT_TRUE(near(pixel(100, 52), kBackground)) << "two rows above the line";
    EXPECT_TRUE(near(pixel(5, 50), kBackground)) << "left of the line's start";
}

TEST_F(PainterEncoderTest, multiline__per_vertex_colours_blend_along_the_segment) {
    render({horizontalLine(50.5f, kRed, kBlue)});
    const QColor start = pixel(12, 50);
    const QColor end = pixel(188, 50);
    const QColor middle = pixel(100, 50);
    EXPECT_GT(start.red(), 230);
    EXPECT_LT(start.blue(), 25);
    EXPECT_GT(end.blue(), 230);
    EXPECT_LT(end.red(), 25);
    EXPECT_NEAR(middle.red(), 128, 12) << "halfway the colour is half of each";
    EXPECT_NEAR(middle.blue(), 128, 12);
}

TEST_F(PainterEncoderTest, multiline__stipple_steps_follow_the_pattern_and_scale) {
    // 0x33333333: two steps on, two off; scale 2 points: 4 pixels on, 4 off, from x = 10.
    auto line = horizontalLine(50.5f, kRed, kRed);
    line->setStippled(true);
    line->setStipplePattern(0x33333333u);
    line->setStippleScale(2.0f);
    render({line});
    for (int block = 0; block < 6; ++block) {
        const int x = 10 + block * 4 + 2;  // the middle of each 4-pixel block
        if (block % 2 == 0)
            EXPECT_TRUE(near(pixel(x, 50), kRed)) << "block " << block << " must be drawn";
        else
            EXPECT_TRUE(near(pixel(x, 50), kBackground)) << "block " << block << " must be a gap";
    }
    {
        // The phase runs on across a vertex: a corner at x = 16 is in the middle of a step.
        const std::vector<HXDLineVertex> v{{{10.0f, 20.5f, 0.0f}, kRed},
                                           {{16.0f, 20.5f, 0.0f}, kRed},
                                           {{60.0f, 20.5f, 0.0f}, kRed}};
        auto bent = std::make_shared<HXDMultiline>(std::span<const HXDLineVertex>(v));
        bent->setStippled(true);
        bent->setStipplePattern(0x33333333u);
        bent->setStippleScale(2.0f);
        render({bent});
        // Dashes 10..13, 18..21, gaps 14..17, 22..25; restarting at x = 16 would ink 16..19.
        EXPECT_TRUE(near(pixel(17, 20), kBackground)) << "the gap must run on past the vertex";
        EXPECT_TRUE(near(pixel(20, 20), kRed)) << "pixels 18..21 are the second dash";
        EXPECT_TRUE(near(pixel(23, 20), kBackground)) << "pixels 22..25 are the second gap";
    }
}

TEST_F(PainterEncoderTest, multiline__far_offscreen_start_keeps_the_stipple_phase) {
    // Starts 2^20 pattern periods (64 pixels each) left of x = 16: the visible part starts
    // in phase, as if every step had been walked.
    const float start = 16.0f - 64.0f * 1048576.0f;
    const std::vector<HXDLineVertex> v{{{start, 50.5f, 0.0f}, kRed}, {{190.0f, 50.5f, 0.0f}, kRed}};
    auto line = std::make_shared<HXDMultiline>(std::span<const HXDLineVertex>(v));
    line->setStippled(true);
    line->setStipplePattern(0x33333333u);
    line->setStippleScale(2.0f);
    render({line});
    // Checked in the middle of each 4-pixel step pair: aliased lines may round by one pixel.
    EXPECT_TRUE(near(pixel(18, 50), kRed)) << "a dash starts at x = 16";
    EXPECT_TRUE(near(pixel(22, 50), kBackground)) << "then a gap";
    EXPECT_TRUE(near(pixel(26, 50), kRed));
    EXPECT_TRUE(near(pixel(2, 50), kRed)) << "the part left of x = 16 is drawn in phase too";
    EXPECT_TRUE(near(pixel(6, 50), kBackground));
}

TEST_F(PainterEncoderTest, multiline__width_in_points_times_backing_scale) {
    auto line = horizontalLine(50.0f, kRed, kRed);
    line->setWidth(4.0f);
    render({line}, 2.0f);
    // 4 points at scale 2: 8 pixels, rows 96..103 around pixel row 100.
    EXPECT_TRUE(near(pixel(200, 97), kRed));
    EXPECT_TRUE(near(pixel(200, 102), kRed));
    EXPECT_TRUE(near(pixel(200, 106), kBackground));
}

TEST_F(PainterEncoderTest, multiline__thinner_than_a_pixel_is_weakened_by_its_width) {
    auto line = horizontalLine(50.5f, kRed, kRed);
    line->setWidth(0.5f);
    render({line});
    EXPECT_NEAR(pixel(100, 50).red(), 128, 8) << "half a pixel wide covers half the pixel";
    render({line}, 2.0f);
    EXPECT_GT(std::max(pixel(200, 100).red(), pixel(200, 101).red()), 200)
        << "half a point on a backing scale of 2 is one full pixel";
}

TEST_F(PainterEncoderTest, multiline__join_decides_the_corner) {
    // A V of width 8 with its corner at (100, 80): a mitre reaches about 6 pixels past the
    // corner, a bevel under 3.
    const std::vector<HXDLineVertex> v{{{50.0f, 20.0f, 0.0f}, kRed},
                                       {{100.0f, 80.0f, 0.0f}, kRed},
                                       {{150.0f, 20.0f, 0.0f}, kRed}};
    auto corner = std::make_shared<HXDMultiline>(std::span<const HXDLineVertex>(v));
    corner->setWidth(8.0f);
    corner->setLineJoin(0);
    render({corner});
    EXPECT_TRUE(near(pixel(99, 84), kRed)) << "join 0 is a mitre";
    corner->setLineJoin(2);
    render({corner});
    EXPECT_TRUE(near(pixel(99, 84), kBackground)) << "join 2 is a bevel";
    EXPECT_TRUE(near(pixel(99, 80), kRed)) << "the corner itself is drawn";
}

TEST_F(PainterEncoderTest, multiline__loop_closes_each_run) {
    const std::vector<HXDLineSegment> segments{{{20.5f, 20.5f, 0.0f}, {20.5f, 80.5f, 0.0f}, kRed},
                                               {{20.5f, 80.5f, 0.0f}, {80.5f, 80.5f, 0.0f}, kRed},
                                               {{80.5f, 80.5f, 0.0f}, {80.5f, 20.5f, 0.0f}, kRed}};
    auto box = std::make_shared<HXDMultiline>(std::span<const HXDLineSegment>(segments));
    render({box});
    EXPECT_TRUE(near(pixel(50, 20), kBackground)) << "an open run has no bottom edge";
    box->setLoop(true);
    render({box});
    EXPECT_TRUE(near(pixel(50, 20), kRed)) << "the loop closes the bottom edge";
}

TEST_F(PainterEncoderTest, quadTexture__draws_the_image_with_its_transparent_corners) {
    // 4 x 4 texels: opaque blue with a transparent top-left texel.
    std::vector<uint8_t> rgba(4 * 4 * 4);
    for (size_t i = 0; i < 16; ++i) {
        rgba[i * 4 + 2] = 255;
        rgba[i * 4 + 3] = i == 0 ? 0 : 255;
    }
    auto texture = HXDPixelTexture::textureWithRGBA(4, 4, 1.0f, std::move(rgba));
    auto quad = std::make_shared<HXDQuadTexture>(0, texture, CGRectMake(100, 40, 40, 40), 1.0f);
    render({quad});
    EXPECT_TRUE(near(pixel(120, 60), kBlue)) << "inside the image";
    EXPECT_TRUE(near(pixel(103, 77), kBackground)) << "the transparent top-left texel";
    EXPECT_TRUE(near(pixel(137, 43), kBlue)) << "the opaque bottom-right texel";
    EXPECT_TRUE(near(pixel(95, 60), kBackground)) << "outside the rectangle";
    EXPECT_EQ(encoder.cachedTextureCount(), 1u);
    render({quad});
    EXPECT_EQ(encoder.cachedTextureCount(), 1u) << "a texture is converted once, not per frame";
}

TEST_F(PainterEncoderTest, quadTexture__shown_texel_for_pixel_lands_on_whole_pixels) {
    // 4 x 4 texels, the left half red and the right half blue, placed 0.3 pixels off the grid.
    std::vector<uint8_t> rgba(4 * 4 * 4);
    for (size_t i = 0; i < 16; ++i) {
        const bool left = i % 4 < 2;
        rgba[i * 4 + 0] = left ? 255 : 0;
        rgba[i * 4 + 2] = left ? 0 : 255;
        rgba[i * 4 + 3] = 255;
    }
    auto texture = HXDPixelTexture::textureWithRGBA(4, 4, 1.0f, std::move(rgba));
    render({std::make_shared<HXDQuadTexture>(0, texture, CGRectMake(100.3, 40.2, 4, 4), 1.0f)});
    EXPECT_TRUE(near(pixel(101, 41), kRed, 0)) << "a texel drawn one to one must not be resampled";
    EXPECT_TRUE(near(pixel(102, 41), kBlue, 0));
}

TEST_F(PainterEncoderTest, screenspaceQuad__blends_over_what_lies_below) {
    auto under = std::make_shared<HXDScreenspaceQuad>(CGRectMake(0, 0, 100, 100), 0);
    under->setColor(kRed);
    auto band = std::make_shared<HXDScreenspaceQuad>(CGRectMake(50, 0, 100, 100), 0);
    band->setColor(HXDColor{0.0f, 0.0f, 1.0f, 0.25f});
    render({under, band});
    EXPECT_TRUE(near(pixel(25, 50), kRed));
    EXPECT_TRUE(near(pixel(75, 50), HXDColor{0.75f, 0.0f, 0.25f, 1.0f})) << "a quarter of blue over red";
    EXPECT_TRUE(near(pixel(125, 50), HXDColor{0.0f, 0.0f, 0.25f, 1.0f})) << "a quarter of blue over black";
    band->setBlendingInfo(HXDDataType::additiveBlendingInfo());
    render({under, band});
    EXPECT_TRUE(near(pixel(75, 50), HXDColor{1.0f, 0.0f, 0.25f, 1.0f})) << "additive keeps the red";
}

TEST_F(PainterEncoderTest, mesh__fills_its_polygons_or_their_outlines) {
    std::vector<HXDSubmesh> submeshes{HXDSubmesh({{20, 20}, {80, 20}, {80, 80}, {20, 80}})};
    auto mesh = std::make_shared<HXDMesh>(9, HXDBrush{0, kBlue}, submeshes);
    render({mesh});
    EXPECT_TRUE(near(pixel(50, 50), kBlue));
    mesh->setWireframe(true);
    render({mesh});
    EXPECT_TRUE(near(pixel(50, 50), kBackground)) << "a wireframe leaves the inside alone";
    EXPECT_GT(pixel(50, 20).blue(), 100) << "the bottom edge is drawn";
}

TEST_F(PainterEncoderTest, text__paints_inside_its_box_in_its_colour) {
    TQQtTextMetrics metrics;
    HXDTextMetrics::setShared(&metrics);
    HXDAttributedString s{"Wide 8.88", HXDTextAttributes{}};
    s.attributes.color = kRed;
    auto text = std::make_shared<HXDText>(s, HXDTextLayoutAnchor::BottomLeft, CGPointMake(40, 40));
    HXDTextMetrics::setShared(nullptr);
    render({text});
    const CGSize size = text->size();
    EXPECT_GT(size.width, 10.0);
    EXPECT_NEAR(size.height, metrics.sizeOfText("Wide 8.88", s.attributes).height, 1e-9);
    int inked = 0;
    int outside = 0;
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            if (pixel(x, y).red() < 60) continue;
            const bool inBox = x >= 39 && x <= 41 + size.width && y >= 39 && y <= 41 + size.height;
            ++(inBox ? inked : outside);
        }
    }
    EXPECT_GT(inked, 10) << "the text left no red pixels";
    EXPECT_EQ(outside, 0) << "text pixels outside the measured box";
}

TEST(PainterEncoderBlending, compositionModeFor__named_blendings) {
    EXPECT_EQ(TQQtPainterEncoder::compositionModeFor(HXDDataType::sourceOneMinusSourceBlendingInfo()),
              QPainter::CompositionMode_SourceOver);
    EXPECT_EQ(TQQtPainterEncoder::compositionModeFor(HXDDataType::opaqueBlendingInfo()),
              QPainter::CompositionMode_Source);
    EXPECT_EQ(TQQtPainterEncoder::compositionModeFor(HXDDataType::additiveBlendingInfo()),
              QPainter::CompositionMode_Plus);
}

}  // namespace
