#include "platform/draw/HXDRenderController.h"

#include "platform/draw/internal/HXDPrimitiveIndex.h"

HXDRenderController::HXDRenderController(HXDTexture* texture, float backingScale)
    : _backingScale(backingScale), _initialTexture(texture) {}

HXDRenderController::~HXDRenderController() = default;

void HXDRenderController::updateTexture(HXDTexture* texture, float backingScale,
                                        const BNMatrix44f& projection, HXDFloat2 pixelScale,
                                        CGSize drawableSize) {
    _backingScale = backingScale;
    // A new frame brings new primitives: let the last ones go now rather than at the next test.
    if (_hitIndex) _hitIndex->clear();
    _context = std::make_unique<HXDRenderingContext>(
        texture ? texture : _initialTexture, backingScale, projection, pixelScale, drawableSize);
}

void HXDRenderController::releaseTexture() {
    _initialTexture = nullptr;
    if (_context)
        _context = std::make_unique<HXDRenderingContext>(
            nullptr, _context->backingScale(), _context->projection(), _context->pixelScale(),
            _context->drawableSize());
}
