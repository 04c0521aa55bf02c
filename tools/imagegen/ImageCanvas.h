#pragma once
// A small antialiased canvas for drawing icons in points at a given scale, and writing them as
// PNG. Shapes are predicates in point coordinates (y down, origin at the top left); each pixel
// averages 6 x 6 samples, which is plenty for images of a dozen points.

#include <functional>
#include <string>
#include <vector>

namespace imagegen {

struct Point {
    double x = 0.0;
    double y = 0.0;
};

// Straight (not premultiplied) sRGB colour, components 0 to 1.
struct Rgba {
    double r = 0.0, g = 0.0, b = 0.0, a = 1.0;
};

Rgba mix(const Rgba& a, const Rgba& b, double t);
Rgba withAlpha(const Rgba& c, double alpha);
Rgba grey(double level, double alpha = 1.0);
// The colour with its saturation taken down by `amount` (0 keeps it, 1 makes it grey).
Rgba desaturated(const Rgba& c, double amount);
Rgba darker(const Rgba& c, double factor);  // rgb times factor, alpha kept

// How much of a sample lies in a shape: 0 or 1 for hard edges, in between for soft ones.
using Coverage = std::function<double(Point)>;
using Paint = std::function<Rgba(Point)>;

Coverage disc(Point centre, double radius);
Coverage ring(Point centre, double innerRadius, double outerRadius);
// Full alpha up to `innerRadius`, falling smoothly to none at `outerRadius`: a glow or shadow.
Coverage softDisc(Point centre, double innerRadius, double outerRadius);
// A stroke from a to b with round caps.
Coverage capsule(Point a, Point b, double halfWidth);
// A closed polygon, even-odd rule.
Coverage polygon(std::vector<Point> corners);
Coverage rectangle(double x, double y, double width, double height);
Paint solid(Rgba color);
// From `top` at y0 to `bottom` at y1, clamped outside.
Paint verticalGradient(Rgba top, Rgba bottom, double y0, double y1);

class ImageCanvas {
public:
    ImageCanvas(double widthPoints, double heightPoints, double scale);

    int pixelsWide() const { return _width; }
    int pixelsHigh() const { return _height; }

    // Composites `paint` over the canvas where `coverage` says, source over destination.
    void draw(const Coverage& coverage, const Paint& paint);

    // Straight RGBA8, rows from the top.
    std::vector<unsigned char> rgba8() const;
    bool writePNG(const std::string& path, std::string& error) const;

private:
    int _width;
    int _height;
    double _scale;
    std::vector<double> _premultiplied;  // r g b a per pixel
};

}  // namespace imagegen
