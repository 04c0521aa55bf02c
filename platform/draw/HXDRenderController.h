#pragma once
// The render controller of a curve view: it holds what one frame is drawn with (the target
// texture, the backing scale, the projection and the size of one drawable pixel in world
// units) and hands it to primitives and to conversions as a rendering context.
//
// The context of the last frame stays until the next update: a view converts between its
// world and drawable pixels through it, so that conversions answer for what the user sees.

#include <cstdint>
#include <memory>

#include "platform/geometry/BNMatrix44Tmpl.h"

struct HXDFloat2 {
    float x = 0.0f;
    float y = 0.0f;
    friend bool operator==(const HXDFloat2&, const HXDFloat2&) = default;
};

// The target of a frame. Encoders supply their own (an image, a window surface); the
// controller only reads its size.
class HXDTexture {
public:
    virtual ~HXDTexture() = default;
    virtual uint32_t width() const = 0;
    virtual uint32_t height() const = 0;
};

// What a frame is drawn with. The projection is row-major (see BNMatrix44Tmpl.h).
class HXDRenderingContext {
public:
    HXDRenderingContext(HXDTexture* texture, float backingScale, const BNMatrix44f& projection,
                        HXDFloat2 pixelScale)
        : _texture(texture), _backingScale(backingScale), _projection(projection), _pixelScale(pixelScale) {}

    // Not owned; null outside a frame, since the target belongs to the frame.
    HXDTexture* texture() const { return _texture; }
    float backingScale() const { return _backingScale; }
    const BNMatrix44f& projection() const { return _projection; }
    // World units per drawable pixel on each axis.
    HXDFloat2 pixelScale() const { return _pixelScale; }

private:
    HXDTexture* _texture;
    float _backingScale;
    BNMatrix44f _projection;
    HXDFloat2 _pixelScale;
};

class HXDRenderController {
public:
    // The texture may be null at creation: a frame supplies it.
    HXDRenderController(HXDTexture* texture, float backingScale);

    // Installs the state of a new frame; the previous context is replaced.
    void updateTexture(HXDTexture* texture, float backingScale, const BNMatrix44f& projection,
                       HXDFloat2 pixelScale);
    // Drops the texture when the frame ends, keeping the projection for conversions.
    void releaseTexture();

    // Null until the first updateTexture.
    const HXDRenderingContext* renderingContext() const { return _context.get(); }
    float backingScale() const { return _backingScale; }

private:
    float _backingScale;
    HXDTexture* _initialTexture;
    std::unique_ptr<HXDRenderingContext> _context;
};
