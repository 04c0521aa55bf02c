#pragma once
// The hit test over the primitives of a frame.
//
// A test runs in drawable pixels (origin bottom left, y up) through the affine part of the
// frame's projection (curve views draw orthographically). Each primitive is tested at the
// size it is drawn:
//   - lines and multilines: within half their width (points times the backing scale) of a
//     segment, plus a tolerance of kHXDLineHitTolerancePoints points times the backing scale;
//   - textured quads: inside the destination rectangle; with useTextureAlphaForHitTest, only
//     where the texel under the point has an alpha of kHXDTextureAlphaHitThreshold or more;
//   - flat quads and texts: inside their rectangle; meshes: inside a submesh polygon
//     (wireframe meshes: near an edge, as lines of width 1).
//
// Closest. A point either lies on a primitive's drawn shape (distance 0) or within the line
// tolerance of it (distance = pixels beyond the drawn edge). The closest record is the one
// with the least distance; between equals, filled shapes (quads, meshes, texts) come before
// lines, so that a keypoint wins over the curve through it; between equals still, the one
// drawn last (later in the array: on top) wins. A rectangle test finds every primitive whose
// drawn shape meets the rectangle, texture alpha honoured; its distances are all 0.

#include <cstdint>
#include <memory>
#include <vector>

#include "platform/draw/HXDDataType.h"
#include "platform/geometry/BNMatrix44Tmpl.h"
#include "platform/geometry/CGGeometry.h"

class HXDDrawPrimitive;
class HXDExtraInfo;

using HXDPrimitiveArray = std::vector<std::shared_ptr<HXDDrawPrimitive>>;

// Lines are easy to miss with a pointer: they take clicks this many points beyond their edge.
inline constexpr float kHXDLineHitTolerancePoints = 3.0f;
// A texel fainter than this does not take a hit: the transparent corners and the faint
// antialiased fringe of an image belong to what lies under it.
inline constexpr float kHXDTextureAlphaHitThreshold = 0.1f;

// The affine map between world coordinates and drawable pixels of one frame:
//   pixel.x = a * x + b * y + c,  pixel.y = d * x + e * y + f
// taken from the projection's x and y rows and the drawable size, as BNProjectionWorldToScreen
// maps (the w row is taken as (0, 0, 0, 1), which an orthographic projection has).
class HXDScreenMapping {
public:
    HXDScreenMapping() = default;
    HXDScreenMapping(const BNMatrix44f& projection, const CGSize& drawableSize);

    // False for a singular projection or an empty drawable: nothing can be mapped back.
    bool isValid() const { return _valid; }
    CGPoint worldToPixel(double x, double y) const {
        return CGPointMake(_a * x + _b * y + _c, _d * x + _e * y + _f);
    }
    CGPoint pixelToWorld(double px, double py) const {
        const double x = px - _c;
        const double y = py - _f;
        return CGPointMake(_ia * x + _ib * y, _id * x + _ie * y);
    }
    // The pixel rectangle covered by a world rectangle, and the world rectangle covered by a
    // pixel rectangle (bounding boxes of the four mapped corners; both standardized).
    CGRect worldRectToPixels(const CGRect& world) const;
    CGRect pixelRectToWorld(const CGRect& pixels) const;
    CGSize drawableSize() const { return _drawableSize; }
    // True when x maps to pixel x and y to pixel y alone (no rotation or shear), as every
    // orthographic view projection does: world and pixel rectangles then map onto each other.
    bool isAxisAligned() const { return _valid && _b == 0.0 && _d == 0.0; }

private:
    bool _valid = false;
    double _a = 0, _b = 0, _c = 0, _d = 0, _e = 0, _f = 0;
    double _ia = 0, _ib = 0, _id = 0, _ie = 0;
    CGSize _drawableSize = CGSizeZero;
};

// One test: a point or a rectangle in drawable pixels, with the frame's mapping and backing
// scale. Made by HXDRenderController; a default-constructed context is invalid.
class HXDHitTestContext {
public:
    enum class Kind : uint8_t { Invalid, Point, Rect };

    HXDHitTestContext() = default;
    static HXDHitTestContext atPoint(const HXDScreenMapping& mapping, float backingScale,
                                     HXDFloat2 point);
    static HXDHitTestContext inRect(const HXDScreenMapping& mapping, float backingScale,
                                    const CGRect& rect);

    Kind kind() const { return _kind; }
    bool isValid() const { return _kind != Kind::Invalid; }
    // The point (Point contexts) and the rectangle, standardized (Rect contexts; a Point
    // context answers the empty rectangle at the point).
    CGPoint point() const { return _point; }
    const CGRect& rect() const { return _rect; }
    const HXDScreenMapping& mapping() const { return _mapping; }
    float backingScale() const { return _backingScale; }
    // The line tolerance of this test in drawable pixels.
    double lineTolerance() const {
        return static_cast<double>(kHXDLineHitTolerancePoints) * _backingScale;
    }

    // The region of world space that a primitive must reach to be hit, grown by `reach`
    // pixels on every side: primitives with cached world bounds reject on it first.
    CGRect worldQueryRect(double reach) const;
    // The world extent of one drawable pixel on each axis (bounds for a skewed mapping).
    double worldPerPixelX() const { return _worldPerPixelX; }
    double worldPerPixelY() const { return _worldPerPixelY; }

private:
    void prepareWorldQuery();

    Kind _kind = Kind::Invalid;
    CGPoint _point = CGPointZero;
    CGRect _rect = CGRectZero;
    // The query's world bounds and the world extent of one pixel on each axis, made once per
    // test: every primitive asks for its grown query rectangle.
    CGRect _worldRect = CGRectZero;
    double _worldPerPixelX = 0.0;
    double _worldPerPixelY = 0.0;
    HXDScreenMapping _mapping;
    float _backingScale = 1.0f;
};

// Where a primitive can take hits, in world coordinates: every point or rectangle that hits
// it lies within `reach` drawable pixels of this box. A render controller indexes long lists
// by it (HXDRenderController.h), so that a test only runs the exact test of primitives near
// its point. Answers are conservative: a box too large costs time, never a missed hit.
struct HXDHitBounds {
    enum class Kind : uint8_t {
        Nowhere,   // nothing can hit it (no segment, no area)
        Anywhere,  // not known: every test runs the exact test
        Box,       // within [minX, maxX] x [minY, maxY]
        // Within [minX, maxX] across; the y extent over part of that span is asked for when a
        // test comes near (hitYExtentOverX), since finding it for the whole of a long curve
        // would read every vertex.
        XSpan,
    };
    Kind kind = Kind::Anywhere;
    double minX = 0.0, minY = 0.0, maxX = 0.0, maxY = 0.0;
    double reach = 0.0;

    static HXDHitBounds nowhere() { return {Kind::Nowhere}; }
    static HXDHitBounds anywhere() { return {Kind::Anywhere}; }
    // A box of a world rectangle (any sign of width and height); Anywhere when it is not finite.
    static HXDHitBounds box(const CGRect& world, double reach);
};

// One hit. It keeps its primitive alive and answers the primitive's hit id and dictionary.
class HXDHitRecord {
public:
    HXDHitRecord(std::shared_ptr<HXDDrawPrimitive> primitive, float distance)
        : _primitive(std::move(primitive)), _distance(distance) {}

    uint32_t hitID() const;
    const HXDExtraInfo& extraInfo() const;
    const std::shared_ptr<HXDDrawPrimitive>& primitive() const { return _primitive; }
    // Pixels beyond the drawn edge (0 when the point lies on the drawn shape).
    float distance() const { return _distance; }

private:
    std::shared_ptr<HXDDrawPrimitive> _primitive;
    float _distance;
};
