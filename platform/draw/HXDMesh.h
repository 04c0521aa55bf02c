#pragma once
// HXDMesh: filled polygons of one brush. Each submesh is one simple polygon (its vertices in
// order around it, world coordinates), filled by the even-odd rule; wireframe draws and hits
// the outlines instead, as one-point lines.

#include <cstdint>
#include <vector>

#include "platform/draw/HXDDrawPrimitive.h"

struct HXDSubmesh {
    std::vector<HXDFloat2> vertices;

    HXDSubmesh() = default;
    explicit HXDSubmesh(std::vector<HXDFloat2> polygon) : vertices(std::move(polygon)) {}
};

// Brush type 0 is a flat colour, the only type there is; others draw as type 0.
struct HXDBrush {
    uint32_t type = 0;
    HXDColor color{1.0f, 1.0f, 1.0f, 1.0f};
};

class HXDMesh : public HXDDrawPrimitive {
public:
    // initWithHitID:brush:submeshes:
    HXDMesh(uint32_t hitID, HXDBrush brush, std::vector<HXDSubmesh> submeshes);

    const HXDBrush& brush() const { return _brush; }
    const std::vector<HXDSubmesh>& submeshes() const { return _submeshes; }
    bool wireframe() const { return _wireframe; }
    void setWireframe(bool wireframe);

    void encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const override;
    float hitDistanceAtPoint(const HXDHitTestContext& context) const override;
    bool intersectsRect(const HXDHitTestContext& context) const override;
    int hitPriority() const override { return _wireframe ? 0 : 1; }
    // The box of every vertex; outlines reach as far as one-point lines do.
    HXDHitBounds hitBounds(float backingScale) const override;

private:
    HXDBrush _brush;
    std::vector<HXDSubmesh> _submeshes;
    bool _wireframe = false;
};
