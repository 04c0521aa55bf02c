#include "platform/draw/HXDQuad.h"

#include <algorithm>
#include <cmath>

#include "platform/draw/HXDEncoder.h"
#include "platform/draw/internal/HXDGeometry2D.h"

// ---- HXDQuadTexture ----------------------------------------------------------------------------

HXDQuadTexture::HXDQuadTexture(uint32_t hitID, std::shared_ptr<const HXDPixelTexture> texture,
                               const CGRect& destinationRect, float attenuation)
    : HXDDrawPrimitive(hitID),
      _texture(std::move(texture)),
      _destinationRect(destinationRect),
      _attenuation(attenuation) {}

void HXDQuadTexture::encodeWithEncoder(HXDEncoder& encoder,
                                       const HXDRenderingContext& context) const {
    encoder.encodeQuadTexture(*this, context);
}

namespace {
// Whether a world rectangle lies clearly apart from the test, a pixel to spare, decided
// without mapping it: short lists (a channel's keypoints under a rubber band) are walked, and
// most of their quads are far from the test. Only where the mapping is axis-aligned, since
// then a rectangle's pixel box is the rectangle mapped; otherwise the exact test decides.
bool clearlyApart(const CGRect& world, const HXDHitTestContext& context) {
    if (!context.mapping().isAxisAligned()) return false;
    const CGRect q = context.worldQueryRect(1.0);
    const double xa = world.origin.x, xb = xa + world.size.width;
    const double ya = world.origin.y, yb = ya + world.size.height;
    // A rectangle with a NaN edge is never hit by the exact test either, whatever this says.
    return std::max(xa, xb) < q.origin.x || std::min(xa, xb) > q.origin.x + q.size.width ||
           std::max(ya, yb) < q.origin.y || std::min(ya, yb) > q.origin.y + q.size.height;
}

bool alphaTested(const HXDQuadTexture& quad) {
    return quad.useTextureAlphaForHitTest() && quad.texture() && quad.texture()->width() > 0 &&
           quad.texture()->height() > 0;
}

// The texel column (or row) under a pixel coordinate, clamped into the image: a point on the
// far edge of the rectangle belongs to the last texel.
int64_t texelIndex(double offset, double extent, uint32_t texels) {
    const double t = extent > 0.0 ? std::floor(offset / extent * texels) : 0.0;
    if (!(t > 0.0)) return 0;
    return static_cast<int64_t>(std::min(t, static_cast<double>(texels) - 1.0));
}
}  // namespace

bool HXDQuadTexture::opaqueAt(const CGRect& pixels, double px, double py) const {
    const HXDPixelTexture& t = *_texture;
    const int64_t column = texelIndex(px - pixels.origin.x, pixels.size.width, t.width());
    // Row 0 is the top of the image, drawn at the top (greatest y) of the rectangle.
    const int64_t row =
        texelIndex(pixels.origin.y + pixels.size.height - py, pixels.size.height, t.height());
    return t.alphaAt(column, row) * _attenuation >= kHXDTextureAlphaHitThreshold;
}

float HXDQuadTexture::hitDistanceAtPoint(const HXDHitTestContext& context) const {
    if (clearlyApart(_destinationRect, context)) return -1.0f;
    const CGRect pixels = context.mapping().worldRectToPixels(_destinationRect);
    const CGPoint p = context.point();
    if (!hxd_internal::rectContains(pixels, p.x, p.y)) return -1.0f;
    if (alphaTested(*this) && !opaqueAt(pixels, p.x, p.y)) return -1.0f;
    return 0.0f;
}

bool HXDQuadTexture::intersectsRect(const HXDHitTestContext& context) const {
    if (clearlyApart(_destinationRect, context)) return false;
    const CGRect pixels = context.mapping().worldRectToPixels(_destinationRect);
    const CGRect& r = context.rect();
    if (!hxd_internal::rectsMeet(pixels, r)) return false;
    if (!alphaTested(*this)) return true;

    // Walk the texels under the overlap: the band meets the image only where it is opaque.
    const HXDPixelTexture& t = *_texture;
    const double x0 = std::max(pixels.origin.x, r.origin.x);
    const double x1 = std::min(pixels.origin.x + pixels.size.width, r.origin.x + r.size.width);
    const double top = pixels.origin.y + pixels.size.height;
    const double y0 = std::max(pixels.origin.y, r.origin.y);
    const double y1 = std::min(top, r.origin.y + r.size.height);
    const int64_t c0 = texelIndex(x0 - pixels.origin.x, pixels.size.width, t.width());
    const int64_t c1 = texelIndex(x1 - pixels.origin.x, pixels.size.width, t.width());
    const int64_t r0 = texelIndex(top - y1, pixels.size.height, t.height());
    const int64_t r1 = texelIndex(top - y0, pixels.size.height, t.height());
    for (int64_t row = r0; row <= r1; ++row)
        for (int64_t column = c0; column <= c1; ++column)
            if (t.alphaAt(column, row) * _attenuation >= kHXDTextureAlphaHitThreshold) return true;
    return false;
}

// ---- HXDScreenspaceQuad ------------------------------------------------------------------------

HXDScreenspaceQuad::HXDScreenspaceQuad(const CGRect& frame, uint32_t hitID)
    : HXDDrawPrimitive(hitID), _frame(frame) {}

void HXDScreenspaceQuad::encodeWithEncoder(HXDEncoder& encoder,
                                           const HXDRenderingContext& context) const {
    encoder.encodeScreenspaceQuad(*this, context);
}

float HXDScreenspaceQuad::hitDistanceAtPoint(const HXDHitTestContext& context) const {
    if (clearlyApart(_frame, context)) return -1.0f;
    const CGRect pixels = context.mapping().worldRectToPixels(_frame);
    const CGPoint p = context.point();
    return hxd_internal::rectContains(pixels, p.x, p.y) ? 0.0f : -1.0f;
}

bool HXDScreenspaceQuad::intersectsRect(const HXDHitTestContext& context) const {
    if (clearlyApart(_frame, context)) return false;
    return hxd_internal::rectsMeet(context.mapping().worldRectToPixels(_frame), context.rect());
}
