#pragma once
// Images of the framework: keypoint images per colour and state, the tangent handle, tool
// icons. The PNG files in resources/images are compiled into this library at build time, so
// a lookup never touches the disk; a file is decoded on its first request and kept.
//
// Pixel format: RGBA, 8 bits per component, STRAIGHT alpha (not premultiplied), rows from the
// top of the image down, tightly packed (bytesPerRow == pixelsWide * 4). This is how the PNG
// files store them. sRGB components.

#include "platform/geometry/CGGeometry.h"
#include "platform/support/BNString.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <vector>

class BNImage {
public:
    // `pixels` must hold pixelsWide * pixelsHigh * 4 bytes; `scale` is pixels per point (1 for
    // the plain file, 2 for the "@2x" file) and must be above 0.
    BNImage(int pixelsWide, int pixelsHigh, double scale, std::vector<std::uint8_t> pixels);

    int pixelsWide() const { return _pixelsWide; }
    int pixelsHigh() const { return _pixelsHigh; }
    // Pixels per point.
    double scale() const { return _scale; }
    // The size in points: pixels over scale. The 1x and 2x files of one image answer the
    // same size.
    CGSize size() const;

    std::size_t bytesPerRow() const { return static_cast<std::size_t>(_pixelsWide) * 4; }
    const std::vector<std::uint8_t>& pixels() const { return _pixels; }

    struct RGBA8 {
        std::uint8_t red = 0, green = 0, blue = 0, alpha = 0;
        friend bool operator==(const RGBA8&, const RGBA8&) = default;
    };
    // The pixel at column x, row y (row 0 at the top); transparent black outside the image.
    RGBA8 pixelAt(int x, int y) const;
    // Its alpha; 0 outside the image.
    std::uint8_t alphaAt(int x, int y) const { return pixelAt(x, y).alpha; }

private:
    int _pixelsWide;
    int _pixelsHigh;
    double _scale;
    std::vector<std::uint8_t> _pixels;
};

// The image of the framework's resources called `name` (no extension, no "@2x"), at the
// file that suits `scale`: the "@2x" file when scale is above 1 and there is one, otherwise
// the plain file. Null for a name the resources do not hold. Decoded once per file and shared;
// the image is immutable, so the pointer can be kept for the life of the process.
std::shared_ptr<const BNImage> BNImageForResource(const BNString& name, double scale = 1.0);

// Every image name the resources hold, sorted, each once (1x and 2x together).
std::vector<BNString> BNImageResourceNames();

// Decodes a PNG held in memory into straight RGBA8 with the given scale (pixels per point).
// Null for bytes that are not a PNG libpng can read; `error`, when given, then says why.
std::shared_ptr<const BNImage> BNImageFromPNGData(std::span<const std::uint8_t> bytes, double scale,
                                                  BNString* error = nullptr);
