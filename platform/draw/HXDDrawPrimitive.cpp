#include "platform/draw/HXDDrawPrimitive.h"

HXDHitBounds HXDDrawPrimitive::hitBounds(float) const { return HXDHitBounds::anywhere(); }

bool HXDDrawPrimitive::hitYExtentOverX(double x0, double x1, double& minY, double& maxY) const {
    // What a box answers over any part of it; other kinds have no finite extent to give.
    const HXDHitBounds b = hitBounds(1.0f);
    if (b.kind != HXDHitBounds::Kind::Box || x1 < b.minX || x0 > b.maxX) return false;
    minY = b.minY;
    maxY = b.maxY;
    return true;
}
