#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/geometry/BNViewProjection.h"

namespace {

using Kind = HXDRecordingEncoder::Kind;

TEST(HXDPrimitivesTest,
     frame__eachPrimitiveReachesItsOwnEncoderOperationAndTheProjectionOutlivesIt) {
    HXDRenderController controller(nullptr, 2.0f);
    EXPECT_EQ(controller.renderingContext(), nullptr)
        << "no frame yet: conversions must see no context";
    HXDRecordingEncoder encoder(100, 50);
    HXDTexture* target = encoder.nextDrawable();
    ASSERT_NE(target, nullptr);
    const BNMatrix44f projection = BNViewVolumeProjection(CGRectMake(0, 0, 10, 5));
    controller.updateTexture(target, 2.0f, projection, HXDFloat2{0.125f, 0.25f});
    const HXDRenderingContext& context = *controller.renderingContext();
    EXPECT_TRUE(context.texture() == target && context.drawableSize() == CGSizeMake(100, 50));
    EXPECT_EQ(context.pixelScale(), (HXDFloat2{0.125f, 0.25f}));

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
    for (const auto& p : frame) p->encodeWithEncoder(encoder, context);
    encoder.endEncoding();
    const Kind expected[] = {Kind::Multiline,       Kind::Line, Kind::QuadTexture,
                             Kind::ScreenspaceQuad, Kind::Mesh, Kind::Text};
    ASSERT_EQ(encoder.entries.size(), std::size(expected));
    for (size_t i = 0; i < std::size(expected); ++i)
        EXPECT_TRUE(encoder.entries[i].kind == expected[i] &&
                    encoder.entries[i].primitive == frame[i].get())
            << i;

    controller.releaseTexture();
    ASSERT_NE(controller.renderingContext(), nullptr);
    EXPECT_EQ(controller.renderingContext()->texture(), nullptr) << "the frame's target is gone";
    EXPECT_EQ(controller.renderingContext()->projection(), projection)
        << "the last projection stays for hit tests";
    EXPECT_EQ(controller.renderingContext()->drawableSize(), CGSizeMake(100, 50)) << "and the size";
}

TEST(HXDPrimitivesTest, values__joinsTexturesNumbersAndExtraInfoTakeBadInputSafely) {
    HXDMultiline line(std::vector<HXDLineVertex>{});
    EXPECT_EQ(line.blendingInfo(), HXDDataType::sourceOneMinusSourceBlendingInfo())
        << "'over' by default";
    EXPECT_FALSE(HXDDataType::opaqueBlendingInfo().enabled);
    line.setLineJoin(1);
    EXPECT_EQ(line.lineJoin(), HXDLineJoin::Round);
    line.setLineJoin(42);
    EXPECT_EQ(line.lineJoin(), HXDLineJoin::Miter) << "an unknown join number falls back to join 0";
    EXPECT_EQ(line.numberOfRuns(), 0u);
    EXPECT_EQ(line.runRange(3), (std::pair<uint32_t, uint32_t>{0, 0}))
        << "a run past the end is empty";

    EXPECT_EQ(HXDPixelTexture::textureWithRGBA(4, 4, 1.0f, std::vector<uint8_t>(10))->width(), 0u)
        << "a buffer of the wrong size gives an empty texture, not a read past its end";
    const auto t = HXDPixelTexture::textureWithRGBA(1, 1, 1.0f, {255, 128, 0, 128});
    EXPECT_EQ(t->rgba(), (std::vector<uint8_t>{128, 64, 0, 128}))
        << "straight pixels are stored premultiplied";
    EXPECT_EQ(HXDPixelTexture::textureWithRGBA(1, 1, 1.0f, {64, 32, 16, 128}, true)->rgba(),
              (std::vector<uint8_t>{64, 32, 16, 128}))
        << "premultiplied input is kept";
    EXPECT_EQ(t->alphaAt(-1, 0) + t->alphaAt(1, 0), 0.0f);
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
