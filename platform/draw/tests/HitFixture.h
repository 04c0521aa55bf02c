#pragma once
// A view of 10 seconds by 10 units (x 0..10, y -5..5) on a 200 x 100 drawable: 20 pixels per
// second across, 10 pixels per unit up; picks and bands in its pixels.
#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "platform/geometry/BNViewProjection.h"

class HitFixture : public ::testing::Test {
protected:
    void SetUp() override { installFrame(1.0f); }

    // A shear puts x into y: world boxes no longer bound pixel boxes.
    void installFrame(float backingScale, double shear = 0.0) {
        BNMatrix44f projection = BNViewVolumeProjection(CGRectMake(0, -5, 10, 10));
        projection.set(0, 1, static_cast<float>(shear));
        controller.updateTexture(nullptr, backingScale, projection, HXDFloat2{0.05f, 0.1f},
                                 CGSizeMake(200, 100));
    }
    CGPoint pixel(double x, double y) const {
        return HXDScreenMapping(controller.renderingContext()->projection(), CGSizeMake(200, 100))
            .worldToPixel(x, y);
    }
    HXDHitTestContext at(CGPoint p) const {
        return controller.renderingContextForHitTestAtCoords(HXDFloat2{float(p.x), float(p.y)});
    }
    std::vector<HXDHitRecord> pick(const HXDPrimitiveArray& list, CGPoint p,
                                   bool closest = true) const {
        return controller.newHitTestResultForPrimitives(list, at(p), closest);
    }
    std::vector<HXDHitRecord> inBand(const HXDPrimitiveArray& list, CGRect band) const {
        return controller.newHitTestResultForPrimitives(
            list, controller.renderingContextForHitTestInRect(band), false);
    }

    // A line through n points, the i-th at(i).
    template <class At>
    static std::shared_ptr<HXDMultiline> line(int n, const At& at) {
        std::vector<HXDLineVertex> v;
        for (int i = 0; i < n; ++i) v.push_back({at(i), {}});
        return std::make_shared<HXDMultiline>(std::move(v));
    }
    static HXDFloat3 xy(double x, double y) { return {float(x), float(y), 0}; }

    HXDRenderController controller{nullptr, 1.0f};
};
