#include <gtest/gtest.h>

#include "platform/draw/HXDRenderController.h"
#include "platform/geometry/BNViewProjection.h"

namespace {

class FixedTexture : public HXDTexture {
public:
    uint32_t width() const override { return 640; }
    uint32_t height() const override { return 480; }
};

TEST(HXDRenderControllerTest,
     renderingContext__isNullUntilTheFirstFrameThenKeepsTheLastProjection) {
    FixedTexture texture;
    HXDRenderController controller(nullptr, 2.0f);
    EXPECT_EQ(controller.renderingContext(), nullptr)
        << "no frame yet: conversions must see no context";

    const BNMatrix44f first = BNViewVolumeProjection(CGRectMake(0, -62.5, 100, 125));
    controller.updateTexture(&texture, 2.0f, first, HXDFloat2{0.125f, 0.25f});
    ASSERT_NE(controller.renderingContext(), nullptr);
    EXPECT_EQ(controller.renderingContext()->texture(), &texture);
    EXPECT_EQ(controller.renderingContext()->pixelScale(), (HXDFloat2{0.125f, 0.25f}));

    controller.releaseTexture();
    ASSERT_NE(controller.renderingContext(), nullptr);
    EXPECT_EQ(controller.renderingContext()->texture(), nullptr) << "the frame's target is gone";
    EXPECT_EQ(controller.renderingContext()->projection(), first)
        << "the projection of the last frame must outlive the frame";
}

}  // namespace
