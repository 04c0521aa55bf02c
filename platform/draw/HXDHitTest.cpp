#include "platform/draw/HXDHitTest.h"

#include <algorithm>
#include <cmath>

#include "platform/draw/HXDDrawPrimitive.h"
#include "platform/draw/HXDRenderController.h"
#include "platform/draw/internal/HXDPrimitiveIndex.h"

// ---- HXDScreenMapping ----------------------------------------------------------------------

HXDScreenMapping::HXDScreenMapping(const BNMatrix44f& projection, const CGSize& drawableSize)
    : _drawableSize(drawableSize) {
    const double hw = 0.5 * drawableSize.width;
    const double hh = 0.5 * drawableSize.height;
    // ((row . (x, y, 0, 1)) * 0.5 + 0.5) * size, expanded into the affine terms.
    _a = projection.at(0, 0) * hw;
    _b = projection.at(0, 1) * hw;
    _c = (projection.at(0, 3) + 1.0) * hw;
    _d = projection.at(1, 0) * hh;
    _e = projection.at(1, 1) * hh;
    _f = (projection.at(1, 3) + 1.0) * hh;
    const double det = _a * _e - _b * _d;
    if (!(drawableSize.width > 0.0 && drawableSize.height > 0.0) || !std::isfinite(det) ||
        det == 0.0)
        return;
    _ia = _e / det;
    _ib = -_b / det;
    _id = -_d / det;
    _ie = _a / det;
    _valid = true;
}

namespace {
CGRect boundsOfMappedCorners(const CGRect& r, auto&& map) {
    const CGRect s = CGRectStandardize(r);
    const double x0 = s.origin.x, y0 = s.origin.y;
    const double x1 = x0 + s.size.width, y1 = y0 + s.size.height;
    const CGPoint p[4] = {map(x0, y0), map(x1, y0), map(x0, y1), map(x1, y1)};
    double minX = p[0].x, maxX = p[0].x, minY = p[0].y, maxY = p[0].y;
    for (const CGPoint& q : p) {
        minX = std::min(minX, q.x);
        maxX = std::max(maxX, q.x);
        minY = std::min(minY, q.y);
        maxY = std::max(maxY, q.y);
    }
    return CGRectMake(minX, minY, maxX - minX, maxY - minY);
}
}  // namespace

CGRect HXDScreenMapping::worldRectToPixels(const CGRect& world) const {
    return boundsOfMappedCorners(world, [this](double x, double y) { return worldToPixel(x, y); });
}

CGRect HXDScreenMapping::pixelRectToWorld(const CGRect& pixels) const {
    return boundsOfMappedCorners(pixels, [this](double x, double y) { return pixelToWorld(x, y); });
}

// ---- HXDHitTestContext -----------------------------------------------------------------------

HXDHitTestContext HXDHitTestContext::atPoint(const HXDScreenMapping& mapping, float backingScale,
                                             HXDFloat2 point) {
    HXDHitTestContext c;
    if (!mapping.isValid() || !std::isfinite(point.x) || !std::isfinite(point.y)) return c;
    c._kind = Kind::Point;
    c._mapping = mapping;
    c._backingScale = backingScale > 0.0f ? backingScale : 1.0f;
    c._point = CGPointMake(point.x, point.y);
    c._rect = CGRectMake(point.x, point.y, 0.0, 0.0);
    c.prepareWorldQuery();
    return c;
}

HXDHitTestContext HXDHitTestContext::inRect(const HXDScreenMapping& mapping, float backingScale,
                                            const CGRect& rect) {
    HXDHitTestContext c;
    const CGRect s = CGRectStandardize(rect);
    if (!mapping.isValid() || !std::isfinite(s.origin.x) || !std::isfinite(s.origin.y) ||
        !std::isfinite(s.size.width) || !std::isfinite(s.size.height))
        return c;
    c._kind = Kind::Rect;
    c._mapping = mapping;
    c._backingScale = backingScale > 0.0f ? backingScale : 1.0f;
    c._rect = s;
    c._point = s.origin;
    c.prepareWorldQuery();
    return c;
}

void HXDHitTestContext::prepareWorldQuery() {
    _worldRect = _mapping.pixelRectToWorld(_rect);
    // A pixel square maps to a parallelogram whose bounds are these extents (exact for the
    // axis-aligned projections of curve views, a safe bound otherwise).
    const CGPoint o = _mapping.pixelToWorld(0.0, 0.0);
    const CGPoint ux = _mapping.pixelToWorld(1.0, 0.0);
    const CGPoint uy = _mapping.pixelToWorld(0.0, 1.0);
    _worldPerPixelX = std::fabs(ux.x - o.x) + std::fabs(uy.x - o.x);
    _worldPerPixelY = std::fabs(ux.y - o.y) + std::fabs(uy.y - o.y);
}

CGRect HXDHitTestContext::worldQueryRect(double reach) const {
    const double gx = reach * _worldPerPixelX;
    const double gy = reach * _worldPerPixelY;
    return CGRectMake(_worldRect.origin.x - gx, _worldRect.origin.y - gy,
                      _worldRect.size.width + 2.0 * gx, _worldRect.size.height + 2.0 * gy);
}

// ---- HXDHitBounds ----------------------------------------------------------------------------

HXDHitBounds HXDHitBounds::box(const CGRect& world, double reach) {
    // The standardized rectangle, without a call per quad of a frame.
    const double xa = world.origin.x, xb = xa + world.size.width;
    const double ya = world.origin.y, yb = ya + world.size.height;
    if (!(std::isfinite(xa) && std::isfinite(xb) && std::isfinite(ya) && std::isfinite(yb)))
        return anywhere();
    HXDHitBounds b;
    b.kind = Kind::Box;
    b.minX = std::min(xa, xb), b.maxX = std::max(xa, xb);
    b.minY = std::min(ya, yb), b.maxY = std::max(ya, yb);
    b.reach = reach;
    return b;
}

// ---- HXDHitRecord ----------------------------------------------------------------------------

uint32_t HXDHitRecord::hitID() const { return _primitive->hitInfo().hitID(); }

const HXDExtraInfo& HXDHitRecord::extraInfo() const { return _primitive->hitInfo().extraInfo(); }

// ---- The test itself -------------------------------------------------------------------------

namespace {
HXDScreenMapping mappingOf(const HXDRenderingContext* context) {
    if (!context) return HXDScreenMapping();
    return HXDScreenMapping(context->projection(), context->drawableSize());
}
}  // namespace

HXDHitTestContext HXDRenderController::renderingContextForHitTestAtCoords(HXDFloat2 coords) const {
    const HXDRenderingContext* context = _context.get();
    return HXDHitTestContext::atPoint(mappingOf(context),
                                      context ? context->backingScale() : _backingScale, coords);
}

HXDHitTestContext HXDRenderController::renderingContextForHitTestInRect(const CGRect& rect) const {
    const HXDRenderingContext* context = _context.get();
    return HXDHitTestContext::inRect(mappingOf(context),
                                     context ? context->backingScale() : _backingScale, rect);
}

std::vector<HXDHitRecord> HXDRenderController::newHitTestResultForPrimitives(
    const HXDPrimitiveArray& primitives, const HXDHitTestContext& context,
    bool returnClosestHit) const {
    std::vector<HXDHitRecord> result;
    if (!context.isValid()) return result;
    const bool isPoint = context.kind() == HXDHitTestContext::Kind::Point;

    // The best so far: least distance, then the higher priority, then the later one (on top).
    const std::shared_ptr<HXDDrawPrimitive>* best = nullptr;
    float bestDistance = 0.0f;
    int bestPriority = 0;
    auto test = [&](const std::shared_ptr<HXDDrawPrimitive>& primitive) {
        if (!primitive) return;
        float distance = 0.0f;
        if (isPoint) {
            distance = primitive->hitDistanceAtPoint(context);
            if (!(distance >= 0.0f)) return;
        } else if (!primitive->intersectsRect(context)) {
            return;
        }
        if (!returnClosestHit) {
            result.emplace_back(primitive, distance);
            return;
        }
        const int priority = primitive->hitPriority();
        if (!best || distance < bestDistance ||
            (distance == bestDistance && priority >= bestPriority)) {
            best = &primitive;
            bestDistance = distance;
            bestPriority = priority;
        }
    };

    // The index serves axis-aligned mappings, where a world box bounds a pixel box; the
    // candidates come in list order, so the ranking above sees what a walk would.
    if (primitives.size() >= hxd_internal::PrimitiveIndex::kMinPrimitives &&
        context.mapping().isAxisAligned()) {
        if (!_hitIndex) _hitIndex = std::make_unique<hxd_internal::PrimitiveIndex>();
        if (!_hitIndex->describes(primitives, context.backingScale()))
            _hitIndex->build(primitives, context.backingScale());
        for (const uint32_t i : _hitIndex->candidates(primitives, context)) test(primitives[i]);
    } else {
        for (const auto& primitive : primitives) test(primitive);
    }
    if (returnClosestHit && best) result.emplace_back(*best, bestDistance);
    return result;
}
