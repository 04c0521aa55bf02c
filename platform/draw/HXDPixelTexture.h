#pragma once
// An image in memory that primitives draw: RGBA8 texels with PREMULTIPLIED alpha (each colour
// component already multiplied by the texel's alpha, as colours are: see HXDColor), so that
// filtering and blending it keep antialiased edges free of dark fringes. Rows run from the top
// of the image down, and the scale it was made for (2 for an @2x
// image: width() texels cover width() / 2 points).
//
// Textures are immutable once made and shared (std::shared_ptr<const HXDPixelTexture>) by the
// primitives of every frame that shows them. Each has a process-unique textureID, which
// encoders may use as a cache key for their own copy of the texels (safe against address
// reuse, unlike the pointer).

#include <cstdint>
#include <memory>
#include <vector>

#include "platform/draw/HXDRenderController.h"

class HXDPixelTexture : public HXDTexture {
public:
    // rgba holds width * height * 4 bytes; a buffer of another size gives an empty texture
    // (0 x 0), never a read past the end. premultiplied tells what the bytes hold: straight
    // input (an image file's pixels) is multiplied by its alpha, premultiplied input is kept.
    static std::shared_ptr<const HXDPixelTexture> textureWithRGBA(uint32_t width, uint32_t height,
                                                                  float scale,
                                                                  std::vector<uint8_t> rgba,
                                                                  bool premultiplied = false);

    uint32_t width() const override { return _width; }
    uint32_t height() const override { return _height; }
    float scale() const { return _scale; }
    // Size in points: texels over scale.
    float pointWidth() const { return _scale > 0.0f ? static_cast<float>(_width) / _scale : 0.0f; }
    float pointHeight() const {
        return _scale > 0.0f ? static_cast<float>(_height) / _scale : 0.0f;
    }
    uint64_t textureID() const { return _textureID; }

    // Premultiplied RGBA8, row 0 at the top, width * 4 bytes per row.
    const std::vector<uint8_t>& rgba() const { return _rgba; }
    // Alpha of one texel as 0 to 1; 0 outside the image.
    float alphaAt(int64_t column, int64_t row) const;

    HXDPixelTexture(uint32_t width, uint32_t height, float scale, std::vector<uint8_t> rgba);

private:
    uint32_t _width;
    uint32_t _height;
    float _scale;
    uint64_t _textureID;
    std::vector<uint8_t> _rgba;
};
