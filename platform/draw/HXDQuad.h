#pragma once
// Quads: HXDQuadTexture draws an image into a world rectangle, HXDScreenspaceQuad fills a
// world rectangle with one flat colour. Both rectangles are in world coordinates, the
// coordinates the frame's projection maps, and may have a negative width or height (they
// cover their standardized form).

#include <cstdint>
#include <memory>

#include "platform/draw/HXDDrawPrimitive.h"
#include "platform/draw/HXDPixelTexture.h"
#include "platform/geometry/CGGeometry.h"

class HXDQuadTexture : public HXDDrawPrimitive {
public:
    // attenuation scales the image's opacity: every component of its premultiplied texels (1
    // draws it as it is). A null texture draws nothing and is hit as its rectangle.
    HXDQuadTexture(uint32_t hitID, std::shared_ptr<const HXDPixelTexture> texture,
                   const CGRect& destinationRect, float attenuation);

    const std::shared_ptr<const HXDPixelTexture>& texture() const { return _texture; }
    const CGRect& destinationRect() const { return _destinationRect; }
    float attenuation() const { return _attenuation; }
    // For a quad kept from frame to frame (a view's keypoints): the image and where it goes.
    void setTexture(const std::shared_ptr<const HXDPixelTexture>& texture) {
        if (_texture != texture) _texture = texture;
    }
    void setDestinationRect(const CGRect& destinationRect) {
        _destinationRect = destinationRect;
        hitGeometryChanged();
    }

    // With it set, a texel below kHXDTextureAlphaHitThreshold does not take hits: the image,
    // not its rectangle, is what can be clicked. Off by default.
    bool useTextureAlphaForHitTest() const { return _useTextureAlphaForHitTest; }
    void setUseTextureAlphaForHitTest(bool use) { _useTextureAlphaForHitTest = use; }

    void encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const override;
    float hitDistanceAtPoint(const HXDHitTestContext& context) const override;
    bool intersectsRect(const HXDHitTestContext& context) const override;
    HXDHitBounds hitBounds(float) const override {
        return HXDHitBounds::box(_destinationRect, 0.0);
    }

private:
    // Whether the texel drawn at the pixel point (inside `pixels`, the drawn rectangle) is
    // opaque enough to take a hit.
    bool opaqueAt(const CGRect& pixels, double px, double py) const;

    std::shared_ptr<const HXDPixelTexture> _texture;
    CGRect _destinationRect;
    float _attenuation;
    bool _useTextureAlphaForHitTest = false;
};

class HXDScreenspaceQuad : public HXDDrawPrimitive {
public:
    // initWithFrame:hitID:. The colour starts opaque white.
    HXDScreenspaceQuad(const CGRect& frame, uint32_t hitID);

    const CGRect& frame() const { return _frame; }
    HXDColor color() const { return _color; }
    void setColor(HXDColor color) { _color = color; }

    void encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const override;
    float hitDistanceAtPoint(const HXDHitTestContext& context) const override;
    bool intersectsRect(const HXDHitTestContext& context) const override;
    HXDHitBounds hitBounds(float) const override { return HXDHitBounds::box(_frame, 0.0); }

private:
    CGRect _frame;
    HXDColor _color{1.0f, 1.0f, 1.0f, 1.0f};
};
