#include "ImageCanvas.h"

#include <png.h>

#include <algorithm>
#include <cmath>

namespace imagegen {

namespace {
constexpr int kSamplesPerAxis = 6;

double clamp01(double v) { return std::clamp(v, 0.0, 1.0); }
double distance(Point a, Point b) { return std::hypot(a.x - b.x, a.y - b.y); }
double smoothstep(double edge0, double edge1, double x) {
    const double t = clamp01((x - edge0) / (edge1 - edge0));
    return t * t * (3.0 - 2.0 * t);
}
}  // namespace

Rgba mix(const Rgba& a, const Rgba& b, double t) {
    return {a.r + (b.r - a.r) * t, a.g + (b.g - a.g) * t, a.b + (b.b - a.b) * t,
            a.a + (b.a - a.a) * t};
}
Rgba withAlpha(const Rgba& c, double alpha) { return {c.r, c.g, c.b, alpha}; }
Rgba grey(double level, double alpha) { return {level, level, level, alpha}; }
Rgba desaturated(const Rgba& c, double amount) {
    // Rec. 709 luma on the sRGB values: close enough for picking a grey of similar weight.
    const double luma = 0.2126 * c.r + 0.7152 * c.g + 0.0722 * c.b;
    return mix(c, grey(luma, c.a), amount);
}
Rgba darker(const Rgba& c, double factor) {
    return {c.r * factor, c.g * factor, c.b * factor, c.a};
}

Coverage disc(Point centre, double radius) {
    return [=](Point p) { return distance(p, centre) <= radius ? 1.0 : 0.0; };
}
Coverage ring(Point centre, double innerRadius, double outerRadius) {
    return [=](Point p) {
        const double d = distance(p, centre);
        return d >= innerRadius && d <= outerRadius ? 1.0 : 0.0;
    };
}
Coverage softDisc(Point centre, double innerRadius, double outerRadius) {
    return [=](Point p) { return 1.0 - smoothstep(innerRadius, outerRadius, distance(p, centre)); };
}
Coverage capsule(Point a, Point b, double halfWidth) {
    return [=](Point p) {
        const double dx = b.x - a.x, dy = b.y - a.y;
        const double lengthSquared = dx * dx + dy * dy;
        double t =
            lengthSquared > 0.0 ? ((p.x - a.x) * dx + (p.y - a.y) * dy) / lengthSquared : 0.0;
        t = clamp01(t);
        return distance(p, {a.x + t * dx, a.y + t * dy}) <= halfWidth ? 1.0 : 0.0;
    };
}
Coverage polygon(std::vector<Point> corners) {
    return [corners = std::move(corners)](Point p) {
        bool inside = false;
        for (std::size_t i = 0, j = corners.size() - 1; i < corners.size(); j = i++) {
            const Point& a = corners[i];
            const Point& b = corners[j];
            if ((a.y > p.y) != (b.y > p.y) && p.x < (b.x - a.x) * (p.y - a.y) / (b.y - a.y) + a.x)
                inside = !inside;
        }
        return inside ? 1.0 : 0.0;
    };
}
Coverage rectangle(double x, double y, double width, double height) {
    return [=](Point p) {
        return p.x >= x && p.x <= x + width && p.y >= y && p.y <= y + height ? 1.0 : 0.0;
    };
}
Paint solid(Rgba color) {
    return [=](Point) { return color; };
}
Paint verticalGradient(Rgba top, Rgba bottom, double y0, double y1) {
    return [=](Point p) { return mix(top, bottom, clamp01((p.y - y0) / (y1 - y0))); };
}

ImageCanvas::ImageCanvas(double widthPoints, double heightPoints, double scale)
    : _width(static_cast<int>(std::lround(widthPoints * scale))),
      _height(static_cast<int>(std::lround(heightPoints * scale))),
      _scale(scale),
      _premultiplied(static_cast<std::size_t>(_width * _height) * 4, 0.0) {}

void ImageCanvas::draw(const Coverage& coverage, const Paint& paint) {
    const double step = 1.0 / (kSamplesPerAxis * _scale);
    for (int py = 0; py < _height; ++py) {
        for (int px = 0; px < _width; ++px) {
            double r = 0.0, g = 0.0, b = 0.0, a = 0.0;  // premultiplied source
            for (int sy = 0; sy < kSamplesPerAxis; ++sy) {
                for (int sx = 0; sx < kSamplesPerAxis; ++sx) {
                    const Point p{px / _scale + (sx + 0.5) * step, py / _scale + (sy + 0.5) * step};
                    const double c = coverage(p);
                    if (c <= 0.0) continue;
                    const Rgba color = paint(p);
                    const double alpha = clamp01(color.a) * clamp01(c);
                    r += color.r * alpha;
                    g += color.g * alpha;
                    b += color.b * alpha;
                    a += alpha;
                }
            }
            constexpr double kInvSamples = 1.0 / (kSamplesPerAxis * kSamplesPerAxis);
            r *= kInvSamples, g *= kInvSamples, b *= kInvSamples, a *= kInvSamples;
            double* d = &_premultiplied[static_cast<std::size_t>(py * _width + px) * 4];
            d[0] = r + d[0] * (1.0 - a);
            d[1] = g + d[1] * (1.0 - a);
            d[2] = b + d[2] * (1.0 - a);
            d[3] = a + d[3] * (1.0 - a);
        }
    }
}

std::vector<unsigned char> ImageCanvas::rgba8() const {
    std::vector<unsigned char> out(_premultiplied.size());
    auto byte = [](double v) {
        return static_cast<unsigned char>(std::lround(clamp01(v) * 255.0));
    };
    for (std::size_t i = 0; i < _premultiplied.size(); i += 4) {
        const double a = _premultiplied[i + 3];
        const unsigned char alpha = byte(a);
        // A pixel that rounds to transparent is written as transparent black, so that corners
        // are exactly 0 and carry no stray colour.
        if (alpha == 0) continue;
        out[i + 0] = byte(_premultiplied[i + 0] / a);
        out[i + 1] = byte(_premultiplied[i + 1] / a);
        out[i + 2] = byte(_premultiplied[i + 2] / a);
        out[i + 3] = alpha;
    }
    return out;
}

bool ImageCanvas::writePNG(const std::string& path, std::string& error) const {
    const std::vector<unsigned char> pixels = rgba8();
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = static_cast<png_uint_32>(_width);
    image.height = static_cast<png_uint_32>(_height);
    image.format = PNG_FORMAT_RGBA;
    if (!png_image_write_to_file(&image, path.c_str(), 0, pixels.data(), 0, nullptr)) {
        error = image.message;
        png_image_free(&image);
        return false;
    }
    png_image_free(&image);
    return true;
}

}  // namespace imagegen
