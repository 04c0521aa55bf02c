#pragma once
// The base of every drawing primitive.
//
// A primitive keeps its geometry in world coordinates (what the frame's projection maps);
// sizes that do not follow the zoom (line widths, font sizes, stipple lengths) are in points
// and become drawable pixels through the backing scale. It encodes itself into an encoder
// (HXDEncoder.h), which paints it, and it answers hit tests (HXDHitTest.h) at the size it is
// drawn. Primitives are made per frame and shared between the frame's lists
// (std::shared_ptr): one object is both drawn and hit-tested.

#include <atomic>
#include <cstdint>
#include <memory>

#include "platform/draw/HXDDataType.h"
#include "platform/draw/HXDHitInfo.h"
#include "platform/draw/HXDHitTest.h"

class HXDEncoder;
class HXDRenderingContext;

class HXDDrawPrimitive {
public:
    virtual ~HXDDrawPrimitive() = default;
    HXDDrawPrimitive(const HXDDrawPrimitive&) = delete;
    HXDDrawPrimitive& operator=(const HXDDrawPrimitive&) = delete;

    // Hands the primitive to the encoder's operation for its kind.
    virtual void encodeWithEncoder(HXDEncoder& encoder,
                                   const HXDRenderingContext& context) const = 0;

    HXDHitInfo& hitInfo() { return _hitInfo; }
    const HXDHitInfo& hitInfo() const { return _hitInfo; }

    const HXDBlendingInfo& blendingInfo() const { return _blendingInfo; }
    void setBlendingInfo(const HXDBlendingInfo& blendingInfo) { _blendingInfo = blendingInfo; }

    // ---- Hit test, called by HXDRenderController ----
    // A point test: the distance in pixels beyond the drawn edge (0 on the shape), or a
    // negative value for no hit. The context is a valid Point context.
    virtual float hitDistanceAtPoint(const HXDHitTestContext& context) const = 0;
    // A rectangle test: whether the drawn shape meets the context's rectangle.
    virtual bool intersectsRect(const HXDHitTestContext& context) const = 0;
    // Filled shapes (1) win over lines (0) at equal distance.
    virtual int hitPriority() const { return 1; }

    // ---- World bounds, read by the index a render controller keeps over a long list ----
    // Where tests at this backing scale can hit the primitive (see HXDHitBounds). The default,
    // Anywhere, is always right: a subclass that does not say is tested by every test.
    virtual HXDHitBounds hitBounds(float backingScale) const;
    // For XSpan bounds: the y extent of the part of the shape over world x in [x0, x1]
    // (segments that reach into the range count whole); false when no part lies there.
    virtual bool hitYExtentOverX(double x0, double x1, double& minY, double& maxY) const;

    // Counts changes to the hit geometry (width, loop, wireframe) of primitives that an index
    // has read: an index built before the count moved is rebuilt at its next test.
    static uint64_t hitGeometryRevision() {
        return sHitGeometryRevision.load(std::memory_order_relaxed);
    }
    // Called by the index as it reads the primitive's bounds.
    void markHitIndexed() const { _hitIndexed = true; }

protected:
    HXDDrawPrimitive() = default;
    explicit HXDDrawPrimitive(uint32_t hitID) { _hitInfo.setHitID(hitID); }

    // Subclasses call this when a setter changes what hitBounds answers. Primitives being
    // built for a frame have not been indexed yet, and cost nothing here.
    void hitGeometryChanged() {
        if (_hitIndexed) sHitGeometryRevision.fetch_add(1, std::memory_order_relaxed);
    }

private:
    static inline std::atomic<uint64_t> sHitGeometryRevision{0};

    mutable bool _hitIndexed = false;
    HXDHitInfo _hitInfo;
    HXDBlendingInfo _blendingInfo = HXDDataType::sourceOneMinusSourceBlendingInfo();
};

// The name the frame's lists are declared with elsewhere.
using HXDMetalDrawPrimitive = HXDDrawPrimitive;
