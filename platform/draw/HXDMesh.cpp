#include "platform/draw/HXDMesh.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "platform/draw/HXDEncoder.h"
#include "platform/draw/internal/HXDGeometry2D.h"

HXDMesh::HXDMesh(uint32_t hitID, HXDBrush brush, std::vector<HXDSubmesh> submeshes)
    : HXDDrawPrimitive(hitID), _brush(brush), _submeshes(std::move(submeshes)) {}

void HXDMesh::encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const {
    encoder.encodeMesh(*this, context);
}

void HXDMesh::setWireframe(bool wireframe) {
    if (wireframe == _wireframe) return;
    _wireframe = wireframe;
    hitGeometryChanged();
}

// The wireframe half width here is the one hitDistanceAtPoint tests with.
HXDHitBounds HXDMesh::hitBounds(float backingScale) const {
    double minX = std::numeric_limits<double>::infinity(), minY = minX;
    double maxX = -minX, maxY = -minX;
    for (const HXDSubmesh& s : _submeshes) {
        // Even one vertex counts: its degenerate edge is what outlines and bands test.
        for (const HXDFloat2& v : s.vertices) {
            // A vertex at infinity, or NaN, leaves the shape without bounds.
            if (!(std::isfinite(v.x) && std::isfinite(v.y))) return HXDHitBounds::anywhere();
            minX = std::min(minX, static_cast<double>(v.x));
            maxX = std::max(maxX, static_cast<double>(v.x));
            minY = std::min(minY, static_cast<double>(v.y));
            maxY = std::max(maxY, static_cast<double>(v.y));
        }
    }
    if (!(minX <= maxX)) return HXDHitBounds::nowhere();
    const double reach =
        _wireframe ? 0.5 + static_cast<double>(kHXDLineHitTolerancePoints) * backingScale : 0.0;
    return HXDHitBounds::box(CGRectMake(minX, minY, maxX - minX, maxY - minY), reach);
}

namespace {
// Walks the edges of a submesh in pixels: edge(a, b) for each vertex and its successor, the
// last joined to the first. Stops when edge answers true.
template <class Edge>
bool forEachEdge(const HXDSubmesh& submesh, const HXDScreenMapping& m, Edge&& edge) {
    const size_t n = submesh.vertices.size();
    if (n == 0) return false;
    CGPoint prev = m.worldToPixel(submesh.vertices[n - 1].x, submesh.vertices[n - 1].y);
    for (const HXDFloat2& v : submesh.vertices) {
        const CGPoint cur = m.worldToPixel(v.x, v.y);
        if (edge(prev, cur)) return true;
        prev = cur;
    }
    return false;
}

// Even-odd rule by a horizontal ray to the right.
bool polygonContains(const HXDSubmesh& submesh, const HXDScreenMapping& m, double px, double py) {
    if (submesh.vertices.size() < 3) return false;
    bool inside = false;
    forEachEdge(submesh, m, [&](CGPoint a, CGPoint b) {
        if ((a.y > py) != (b.y > py)) {
            const double x = a.x + (py - a.y) * (b.x - a.x) / (b.y - a.y);
            if (px < x) inside = !inside;
        }
        return false;
    });
    return inside;
}
}  // namespace

float HXDMesh::hitDistanceAtPoint(const HXDHitTestContext& context) const {
    const HXDScreenMapping& m = context.mapping();
    const CGPoint p = context.point();
    if (!_wireframe) {
        for (const HXDSubmesh& s : _submeshes)
            if (polygonContains(s, m, p.x, p.y)) return 0.0f;
        return -1.0f;
    }
    // Outlines are one-pixel lines and take the line tolerance.
    const double half = 0.5;
    double best = std::numeric_limits<double>::infinity();
    for (const HXDSubmesh& s : _submeshes) {
        forEachEdge(s, m, [&](CGPoint a, CGPoint b) {
            best = std::min(best, hxd_internal::distanceToSegment(p.x, p.y, a.x, a.y, b.x, b.y));
            return false;
        });
    }
    if (!(best <= half + context.lineTolerance())) return -1.0f;
    return static_cast<float>(std::max(0.0, best - half));
}

bool HXDMesh::intersectsRect(const HXDHitTestContext& context) const {
    const HXDScreenMapping& m = context.mapping();
    const CGRect& r = context.rect();
    const double x0 = r.origin.x, y0 = r.origin.y;
    const double x1 = x0 + r.size.width, y1 = y0 + r.size.height;
    for (const HXDSubmesh& s : _submeshes) {
        // An edge that crosses the rectangle, or a vertex inside it...
        if (forEachEdge(s, m, [&](CGPoint a, CGPoint b) {
                return hxd_internal::segmentMeetsRect(a.x, a.y, b.x, b.y, x0, y0, x1, y1);
            }))
            return true;
        // ...or, for a filled polygon, the rectangle wholly inside it.
        if (!_wireframe && polygonContains(s, m, x0, y0)) return true;
    }
    return false;
}
