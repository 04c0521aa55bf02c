#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/geometry/BNViewProjection.h"

namespace {

using Kind = HXDRecordingEncoder::Kind;

TEST(HXDPrimitivesTest, encode__eachPrimitiveReachesItsOwnEncoderOperationInOrder) {
    HXDRenderController controller(nullptr, 1.0f);
    HXDRecordingEncoder encoder(100, 50);
    HXDTexture* target = encoder.nextDrawable();
    ASSERT_NE(target, nullptr);
    controller.updateTexture(target, 1.0f, BNViewVolumeProjection(CGRectMake(0, 0, 10, 5)),
                             HXDFloat2{0.1f, 0.1f});
    EXPECT_EQ(controller.renderingContext()->drawableSize(), CGSizeMake(100, 50))
        << "the target gives the size";

    const HXDLineVertex v[] = {{{0, 0, 0}, {}}, {{1, 1, 0}, {}}};
    const HXDPrimitiveArray frame{
        std::make_shared<HXDMultiline>(std::span<const HXDLineVertex>(v)),
        HXDLine::lineFromStart({0, 0, 0}, {1, 0, 0}, 1.0f, HXDColor{}, true),
        std::make_shared<HXDQuadTexture>(0, nullptr, CGRectMake(0, 0, 1, 1), 1.0f),
        std::make_shared<HXDScreenspaceQuad>(CGRectMake(0, 0, 1, 1), 0),
        std::make_shared<HXDMesh>(9, HXDBrush{}, std::vector<HXDSubmesh>{}),
        std::make_shared<HXDText>(HXDAttributedString{"t", {}}, HXDTextLayoutAnchor::BottomLeft,
                                  CGPointZero),
    };
    encoder.beginEncoding(*target, HXDColor{0.1f, 0.1f, 0.1f, 1.0f});
    for (const auto& p : frame) p->encodeWithEncoder(encoder, *controller.renderingContext());
    encoder.endEncoding();

    const Kind expected[] = {Kind::Multiline,       Kind::Line, Kind::QuadTexture,
                             Kind::ScreenspaceQuad, Kind::Mesh, Kind::Text};
    ASSERT_EQ(encoder.entries.size(), std::size(expected));
    for (size_t i = 0; i < std::size(expected); ++i) {
        EXPECT_EQ(encoder.entries[i].kind, expected[i])
            << "primitive " << i << " went to the wrong operation";
        EXPECT_EQ(encoder.entries[i].primitive, frame[i].get());
    }

    controller.releaseTexture();
    EXPECT_EQ(controller.renderingContext()->drawableSize(), CGSizeMake(100, 50))
        << "the size outlives the target, for hit tests between frames";
    encoder.setDrawableAvailable(false);
    EXPECT_EQ(encoder.nextDrawable(), nullptr);
}

TEST(HXDPrimitivesTest, defaults__lineJoinNumbersAndBlending) {
    HXDMultiline line(std::vector<HXDLineVertex>{});
    EXPECT_EQ(line.blendingInfo(), HXDDataType::sourceOneMinusSourceBlendingInfo())
        << "primitives blend 'over' by default";
    line.setLineJoin(1);
    EXPECT_EQ(line.lineJoin(), HXDLineJoin::Round);
    line.setLineJoin(42);
    EXPECT_EQ(line.lineJoin(), HXDLineJoin::Miter) << "an unknown join number falls back to join 0";
    EXPECT_FALSE(HXDDataType::opaqueBlendingInfo().enabled);
    EXPECT_EQ(line.numberOfRuns(), 0u);
    EXPECT_EQ(line.runRange(3), (std::pair<uint32_t, uint32_t>{0, 0}))
        << "a run past the end is empty, not a read";
}

TEST(HXDPrimitivesTest, textureAndNumbers__badInputIsSafe) {
    EXPECT_EQ(HXDPixelTexture::textureWithRGBA(4, 4, 1.0f, std::vector<uint8_t>(10))->width(), 0u)
        << "a buffer of the wrong size gives an empty texture, not a read past its end";
    const auto t = HXDPixelTexture::textureWithRGBA(1, 1, 1.0f, {255, 128, 0, 128});
    EXPECT_EQ(t->rgba(), (std::vector<uint8_t>{128, 64, 0, 128}))
        << "an image's straight pixels are stored premultiplied";
    EXPECT_EQ(HXDPixelTexture::textureWithRGBA(1, 1, 1.0f, {64, 32, 16, 128}, true)->rgba(),
              (std::vector<uint8_t>{64, 32, 16, 128}))
        << "premultiplied input is kept";
    EXPECT_EQ(t->alphaAt(-1, 0), 0.0f);
    EXPECT_NE(t->textureID(),
              HXDPixelTexture::textureWithRGBA(1, 1, 1.0f, {0, 0, 0, 0})->textureID());

    EXPECT_EQ(HXDNumber::numberWithDouble(1e300).integerValue(),
              std::numeric_limits<int64_t>::max());
    EXPECT_EQ(HXDNumber::numberWithDouble(std::nan("")).unsignedLongLongValue(), 0u);
    EXPECT_EQ(HXDNumber::numberWithInteger(3), HXDNumber::numberWithUnsignedLongLong(3));
    EXPECT_FALSE(HXDNumber::numberWithInteger(-1) == HXDNumber::numberWithUnsignedLongLong(~0ull));

    HXDExtraInfo info;
    info.setObject("ID", HXDNumber::numberWithInteger(1));
    info.setObject("ID", HXDNumber::numberWithInteger(2));
    EXPECT_EQ(info.count(), 1u) << "setting a present key replaces it";
    EXPECT_EQ(info.objectForKey("ID")->integerValue(), 2);
    EXPECT_EQ(info.objectForKey("Handle"), nullptr);
}

}  // namespace
