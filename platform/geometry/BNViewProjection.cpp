#include "platform/geometry/BNViewProjection.h"

#include <cmath>

BNMatrix44f BNViewVolumeProjection(const CGRect& viewVolume) {
    const double width = viewVolume.size.width, height = viewVolume.size.height;
    if (!(width != 0.0) || !(height != 0.0) || std::isnan(width) || std::isnan(height))
        return BNMatrix44f::zero();
    const float l = static_cast<float>(viewVolume.origin.x);
    const float r = static_cast<float>(viewVolume.origin.x + width);
    const float b = static_cast<float>(viewVolume.origin.y);
    const float t = static_cast<float>(viewVolume.origin.y + height);
    BNMatrix44f m;
    m.set(0, 0, static_cast<float>(2.0 / width));
    m.set(0, 3, -(l + r) / (r - l));
    m.set(1, 1, static_cast<float>(2.0 / height));
    m.set(1, 3, -(b + t) / (t - b));
    m.set(2, 2, -0.5f);
    m.set(2, 3, 0.5f);
    m.set(3, 3, 1.0f);
    return m;
}

CGPoint BNProjectionScreenToWorld(const BNMatrix44f& projection, const CGSize& drawableSize,
                                  const CGPoint& screen) {
    // A singular matrix inverts to zero, and 0/0 below gives the documented NaN.
    const BNMatrix44f inverse = projection.inverted();
    const auto v = inverse.transform(
        BNVector4Tmpl<double>{2.0 * screen.x / drawableSize.width - 1.0,
                              2.0 * screen.y / drawableSize.height - 1.0, -1.0, 1.0});
    return CGPointMake(v.x / v.w, v.y / v.w);
}

CGPoint BNProjectionWorldToScreen(const BNMatrix44f& projection, const CGSize& drawableSize,
                                  const CGPoint& world) {
    const auto v = projection.transform(BNVector4Tmpl<double>{world.x, world.y, 0.0, 1.0});
    return CGPointMake((v.x / v.w * 0.5 + 0.5) * drawableSize.width,
                       (v.y / v.w * 0.5 + 0.5) * drawableSize.height);
}
