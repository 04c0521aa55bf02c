#pragma once
// The render controller of a curve view: it holds what one frame is drawn with (the target
// texture, the backing scale, the projection, the drawable size and the size of one drawable
// pixel in world units) and hands it to primitives and to conversions as a rendering context.
// It also runs the hit test over the primitives of a frame (HXDHitTest.h).
//
// The context of the last frame stays until the next update: a view converts between its
// world and drawable pixels through it, and hit-tests through it, so that conversions and
// picks answer for what the user sees.

#include <cstdint>
#include <memory>
#include <vector>

#include "platform/draw/HXDDataType.h"
#include "platform/draw/HXDHitTest.h"
#include "platform/geometry/BNMatrix44Tmpl.h"
#include "platform/geometry/CGGeometry.h"

// The target of a frame, or an image a primitive draws. Encoders supply their own targets (an
// image, a window surface); the controller only reads the size.
class HXDTexture {
public:
    virtual ~HXDTexture() = default;
    virtual uint32_t width() const = 0;
    virtual uint32_t height() const = 0;
};

// What a frame is drawn with. The projection is row-major (see BNMatrix44Tmpl.h) and maps
// world coordinates to normalised device coordinates; drawable pixels have their origin at
// the bottom left, y up.
class HXDRenderingContext {
public:
    HXDRenderingContext(HXDTexture* texture, float backingScale, const BNMatrix44f& projection,
                        HXDFloat2 pixelScale, CGSize drawableSize = CGSizeZero)
        : _texture(texture),
          _backingScale(backingScale),
          _projection(projection),
          _pixelScale(pixelScale),
          _drawableSize(texture ? CGSizeMake(texture->width(), texture->height()) : drawableSize) {}

    // Not owned; null outside a frame, since the target belongs to the frame.
    HXDTexture* texture() const { return _texture; }
    float backingScale() const { return _backingScale; }
    const BNMatrix44f& projection() const { return _projection; }
    // World units per drawable pixel on each axis.
    HXDFloat2 pixelScale() const { return _pixelScale; }
    // The drawable's size in pixels: the texture's when there is one, otherwise the size the
    // frame was installed with. It outlives the texture, for conversions and hit tests.
    CGSize drawableSize() const { return _drawableSize; }

private:
    HXDTexture* _texture;
    float _backingScale;
    BNMatrix44f _projection;
    HXDFloat2 _pixelScale;
    CGSize _drawableSize;
};

namespace hxd_internal {
class PrimitiveIndex;
}

class HXDRenderController {
public:
    // The texture may be null at creation: a frame supplies it.
    HXDRenderController(HXDTexture* texture, float backingScale);
    ~HXDRenderController();
    HXDRenderController(const HXDRenderController&) = delete;
    HXDRenderController& operator=(const HXDRenderController&) = delete;

    // Installs the state of a new frame; the previous context is replaced. drawableSize is
    // used when no texture is given (neither now nor at creation): a view that installs its
    // projection before the encoder hands it a target passes its drawable size here, or hit
    // tests find nothing (they need the pixel grid).
    void updateTexture(HXDTexture* texture, float backingScale, const BNMatrix44f& projection,
                       HXDFloat2 pixelScale, CGSize drawableSize = CGSizeZero);
    // Drops the texture when the frame ends, keeping the projection and drawable size.
    void releaseTexture();

    // Null until the first updateTexture.
    const HXDRenderingContext* renderingContext() const { return _context.get(); }
    float backingScale() const { return _backingScale; }

    // ---- Hit test (see HXDHitTest.h for what counts as a hit) ----

    // A context for one test at a point in drawable pixels. Before the first frame, or with
    // a singular projection, the context is invalid and every test answers no record.
    HXDHitTestContext renderingContextForHitTestAtCoords(HXDFloat2 coords) const;
    // A context for one test of a rectangle in drawable pixels (any sign of width/height).
    HXDHitTestContext renderingContextForHitTestInRect(const CGRect& rect) const;
    // One record per primitive hit, in the order of the array; with returnClosestHit, at most
    // the one closest record (ranked as HXDHitTest.h tells; in a rectangle test all distances
    // are 0, so the flag keeps the filled shape drawn last). Null entries are skipped; an
    // invalid context answers no record. The records keep their primitives alive.
    //
    // A long list (a frame's pickable primitives) is indexed in world space at its first
    // test, so that later tests of the same list run the exact test of the primitives near
    // them only; a test of another list, or of the same list changed in any way, indexes
    // again. The index holds weak references to the last long list's primitives until then,
    // or until the next updateTexture. Not for concurrent use: tests fill the index.
    std::vector<HXDHitRecord> newHitTestResultForPrimitives(const HXDPrimitiveArray& primitives,
                                                            const HXDHitTestContext& context,
                                                            bool returnClosestHit) const;

private:
    float _backingScale;
    HXDTexture* _initialTexture;
    std::unique_ptr<HXDRenderingContext> _context;
    mutable std::unique_ptr<hxd_internal::PrimitiveIndex> _hitIndex;
};
