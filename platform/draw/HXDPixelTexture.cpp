#include "platform/draw/HXDPixelTexture.h"

#include <atomic>

namespace {
uint64_t nextTextureID() {
    static std::atomic<uint64_t> counter{0};
    return ++counter;
}
}  // namespace

HXDPixelTexture::HXDPixelTexture(uint32_t width, uint32_t height, float scale,
                                 std::vector<uint8_t> rgba)
    : _width(width),
      _height(height),
      _scale(scale),
      _textureID(nextTextureID()),
      _rgba(std::move(rgba)) {
    // A buffer that does not match the size would be read past its end: keep nothing.
    if (_rgba.size() != static_cast<size_t>(_width) * _height * 4u) {
        _width = 0;
        _height = 0;
        _rgba.clear();
    }
}

std::shared_ptr<const HXDPixelTexture> HXDPixelTexture::textureWithRGBA(
    uint32_t width, uint32_t height, float scale, std::vector<uint8_t> rgba, bool premultiplied) {
    if (!premultiplied && rgba.size() == static_cast<size_t>(width) * height * 4u) {
        for (size_t i = 0; i + 3 < rgba.size(); i += 4) {
            const unsigned a = rgba[i + 3];
            if (a == 255) continue;
            for (size_t c = 0; c < 3; ++c)
                rgba[i + c] = static_cast<uint8_t>((rgba[i + c] * a + 127u) / 255u);
        }
    }
    return std::make_shared<const HXDPixelTexture>(width, height, scale, std::move(rgba));
}

float HXDPixelTexture::alphaAt(int64_t column, int64_t row) const {
    if (column < 0 || row < 0 || column >= static_cast<int64_t>(_width) ||
        row >= static_cast<int64_t>(_height))
        return 0.0f;
    const size_t i = (static_cast<size_t>(row) * _width + static_cast<size_t>(column)) * 4u + 3u;
    return static_cast<float>(_rgba[i]) / 255.0f;
}
