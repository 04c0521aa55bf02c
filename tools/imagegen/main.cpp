// Draws the framework's images and writes them as PNG files, each at 1x ("Name.png") and 2x
// ("Name@2x.png"), into the folder given on the command line.
//
// Keypoints are round points with a darker rim and a soft shadow, centred in a 16-point square
// whose corners stay fully transparent: the editor hit-tests keypoints by the image's alpha,
// and stops tangent lines at an ellipse of a quarter of the image size, which is where the
// point's rim lies. Colours come from GDColor, so the points match the curves they sit on.

#include "ImageCanvas.h"

#include "src/resources/GDColor.h"
#include "src/resources/GDCursor.h"
#include "src/resources/TQKeyframeImages.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <functional>
#include <optional>
#include <string>
#include <vector>

using namespace imagegen;

namespace {

constexpr double kKeypointSize = 16.0;  // points
constexpr double kTangentHandleSize = 9.0;
constexpr double kToolIconSize = 20.0;
constexpr double kSmallIconSize = 14.0;
constexpr Point kKeypointCentre{kKeypointSize * 0.5, kKeypointSize * 0.5};
constexpr double kKeypointRadius = kKeypointSize * 0.25 + 0.25;  // rim's outer edge
constexpr double kRimWidth = 1.0;

Rgba fromGD(const GDColor& c) { return {c.red, c.green, c.blue, c.alpha}; }
const Rgba kWhite = grey(1.0);
const Rgba kBlack = grey(0.0);

struct KeypointLook {
    Rgba fillTop;
    Rgba fillBottom;
    Rgba rim;
    std::optional<Rgba> glow;           // a halo around the point (pressed, selected)
    std::optional<Rgba> selectionRing;  // a thin ring apart from the point
    double shadowAlpha = 0.45;
};

void drawKeypoint(ImageCanvas& canvas, const KeypointLook& look) {
    const Point c = kKeypointCentre;
    // The shadow lifts the point off a curve of the same colour running through it.
    canvas.draw(softDisc(c, kKeypointRadius - 0.25, kKeypointRadius + 1.5),
                solid(withAlpha(kBlack, look.shadowAlpha)));
    if (look.glow)
        canvas.draw(softDisc(c, kKeypointRadius, kKeypointRadius + 2.75), solid(*look.glow));
    if (look.selectionRing)
        canvas.draw(ring(c, kKeypointRadius + 0.6, kKeypointRadius + 1.35),
                    solid(*look.selectionRing));
    canvas.draw(disc(c, kKeypointRadius), solid(look.rim));
    const double inner = kKeypointRadius - kRimWidth;
    canvas.draw(disc(c, inner),
                verticalGradient(look.fillTop, look.fillBottom, c.y - inner, c.y + inner));
    // A faint highlight towards the top left, as from a light above the screen.
    canvas.draw(softDisc({c.x - 0.9, c.y - 1.2}, 0.4, 2.0), solid(withAlpha(kWhite, 0.22)));
}

KeypointLook normalLook(const Rgba& c) {
    return {mix(c, kWhite, 0.18), darker(c, 0.86), darker(c, 0.42), std::nullopt, std::nullopt};
}
KeypointLook pressedLook(const Rgba& c) {
    return {mix(c, kWhite, 0.55), mix(c, kWhite, 0.2), darker(c, 0.6), withAlpha(c, 0.55),
            std::nullopt};
}
KeypointLook disabledLook(const Rgba& c) {
    const Rgba dull = desaturated(c, 0.75);
    KeypointLook look{darker(dull, 0.62), darker(dull, 0.48), darker(dull, 0.3), std::nullopt,
                      std::nullopt};
    look.shadowAlpha = 0.3;
    return look;
}
KeypointLook inactiveLook() {
    return {grey(0.58), grey(0.44), grey(0.2), std::nullopt, std::nullopt};
}

KeypointLook selectedLook(TQKeyframeImages::State state) {
    const Rgba selection = fromGD(GDColor::selectedCurveColor0());
    switch (state) {
        case TQKeyframeImages::kNormal:
            return {mix(selection, kWhite, 0.5), darker(selection, 0.86), grey(0.12), std::nullopt,
                    std::nullopt};
        case TQKeyframeImages::kPressed:
            return {kWhite, darker(selection, 0.92), grey(0.12), withAlpha(selection, 0.5),
                    std::nullopt};
        case TQKeyframeImages::kInactive:
            return {grey(0.8), grey(0.66), grey(0.14), withAlpha(selection, 0.22), std::nullopt};
        case TQKeyframeImages::kDisabled:
        default: {
            KeypointLook look{grey(0.6), grey(0.48), grey(0.16), std::nullopt,
                              withAlpha(selection, 0.6)};
            look.shadowAlpha = 0.3;
            return look;
        }
    }
}

void drawTangentHandle(ImageCanvas& canvas) {
    const Point c{kTangentHandleSize * 0.5, kTangentHandleSize * 0.5};
    const Rgba selection = fromGD(GDColor::selectedCurveColor0());
    canvas.draw(softDisc(c, 2.4, 3.9), solid(withAlpha(kBlack, 0.4)));
    canvas.draw(disc(c, 2.75), solid(grey(0.1)));
    canvas.draw(disc(c, 2.0),
                verticalGradient(kWhite, darker(selection, 0.85), c.y - 2.0, c.y + 2.0));
}

// Tool icons: light glyphs for the dark theme, on a 20-point square.
const Rgba kGlyph = grey(0.85);

void drawEditTool(ImageCanvas& canvas) {
    // A pointer arrow touching a keypoint on a curve that eases from low left to high right.
    auto curveY = [](double x) {
        const double t = std::clamp((x - 2.0) / 15.0, 0.0, 1.0);
        return 15.0 - 10.0 * t * t * (3.0 - 2.0 * t);
    };
    for (double x = 2.0; x < 17.0; x += 0.25)
        canvas.draw(capsule({x, curveY(x)}, {x + 0.25, curveY(x + 0.25)}, 0.6),
                    solid(withAlpha(kGlyph, 0.75)));
    canvas.draw(disc({9.5, curveY(9.5)}, 2.2), solid(kGlyph));
    const Point tip{10.6, 11.0};
    std::vector<Point> arrow;
    for (const Point p : {Point{0.0, 0.0}, Point{0.0, 8.0}, Point{1.84, 6.32}, Point{3.12, 9.12},
                          Point{4.24, 8.64}, Point{2.96, 5.92}, Point{5.44, 5.76}})
        arrow.push_back({tip.x + p.x, tip.y + p.y});
    canvas.draw(polygon(arrow), solid(kWhite));
}

void drawSketchTool(ImageCanvas& canvas) {
    // A pencil over the stroke it has drawn.
    for (double x = 1.5; x < 11.0; x += 0.5) {
        const double y0 = 16.0 - 1.8 * std::sin(x * 0.9);
        const double y1 = 16.0 - 1.8 * std::sin((x + 0.5) * 0.9);
        canvas.draw(capsule({x, y0}, {x + 0.5, y1}, 0.7), solid(kGlyph));
    }
    canvas.draw(polygon({{10.6, 14.6}, {11.4, 11.6}, {13.4, 13.6}}), solid(kGlyph));  // tip
    canvas.draw(polygon({{11.4, 11.6}, {16.6, 6.4}, {18.6, 8.4}, {13.4, 13.6}}),
                solid(kGlyph));  // body
    canvas.draw(polygon({{16.6, 6.4}, {17.6, 5.4}, {19.6, 7.4}, {18.6, 8.4}}),
                solid(withAlpha(kGlyph, 0.6)));  // eraser
}

void drawTransformTool(ImageCanvas& canvas) {
    // A box with its four corner handles and a keypoint inside.
    const double lo = 4.0, hi = 16.0;
    for (double t = lo; t < hi; t += 2.0) {  // dashed edges
        const double e = std::min(t + 1.0, hi);
        canvas.draw(capsule({t, lo}, {e, lo}, 0.45), solid(kGlyph));
        canvas.draw(capsule({t, hi}, {e, hi}, 0.45), solid(kGlyph));
        canvas.draw(capsule({lo, t}, {lo, e}, 0.45), solid(kGlyph));
        canvas.draw(capsule({hi, t}, {hi, e}, 0.45), solid(kGlyph));
    }
    for (const Point corner : {Point{lo, lo}, Point{hi, lo}, Point{lo, hi}, Point{hi, hi}})
        canvas.draw(rectangle(corner.x - 1.6, corner.y - 1.6, 3.2, 3.2), solid(kWhite));
    canvas.draw(disc({10.0, 10.0}, 2.0), solid(kGlyph));
}

void drawAdd(ImageCanvas& canvas) {
    const double c = kSmallIconSize * 0.5;
    canvas.draw(capsule({c - 4.5, c}, {c + 4.5, c}, 0.8), solid(kGlyph));
    canvas.draw(capsule({c, c - 4.5}, {c, c + 4.5}, 0.8), solid(kGlyph));
}

void drawRemove(ImageCanvas& canvas) {
    const double c = kSmallIconSize * 0.5;
    canvas.draw(capsule({c - 4.5, c}, {c + 4.5, c}, 0.8), solid(kGlyph));
}

// Images of the inspector rows: the parameter menu button of a channel row, the reset button of a mini
// editor strip, and the border drawn over the strip (stretched to its bounds, so only its
// edges carry anything).
constexpr double kMenuButtonSize = 16.0;
constexpr double kBorderSize = 24.0;

void drawParameterMenu(ImageCanvas& canvas) {
    const Point c{kMenuButtonSize * 0.5, kMenuButtonSize * 0.5};
    canvas.draw(disc(c, 6.5), verticalGradient(grey(0.42), grey(0.3), c.y - 6.5, c.y + 6.5));
    canvas.draw(ring(c, 6.0, 6.5), solid(grey(0.18)));
    canvas.draw(capsule({c.x - 3.0, c.y - 1.2}, {c.x, c.y + 1.8}, 0.75), solid(kGlyph));
    canvas.draw(capsule({c.x, c.y + 1.8}, {c.x + 3.0, c.y - 1.2}, 0.75), solid(kGlyph));
}

void drawReset(ImageCanvas& canvas) {
    // Three quarters of a circle, open at the top right, and its arrow head.
    const Point c{kSmallIconSize * 0.5, kSmallIconSize * 0.5};
    const double radius = 4.5;
    const Coverage band = ring(c, radius - 0.8, radius + 0.8);
    canvas.draw(
        [band, c](Point p) {
            const double angle = std::atan2(p.y - c.y, p.x - c.x);  // y down: -pi/2 is the top
            return angle > -1.75 && angle < -0.2 ? 0.0 : band(p);
        },
        solid(kGlyph));
    const Point end{c.x + radius * std::cos(-1.75), c.y + radius * std::sin(-1.75)};
    canvas.draw(
        polygon({{end.x + 3.0, end.y}, {end.x - 0.5, end.y - 3.0}, {end.x - 0.5, end.y + 3.0}}),
        solid(kGlyph));
}

void drawGradientBorder(ImageCanvas& canvas) {
    const double s = kBorderSize;
    canvas.draw(rectangle(0.0, 0.0, s, 4.0),
                verticalGradient(grey(0.0, 0.45), grey(0.0, 0.0), 0.0, 4.0));
    canvas.draw(rectangle(0.0, s - 3.0, s, 3.0),
                verticalGradient(grey(1.0, 0.0), grey(1.0, 0.08), s - 3.0, s));
    const Rgba line = grey(0.36);
    canvas.draw(rectangle(0.0, 0.0, s, 1.0), solid(line));
    canvas.draw(rectangle(0.0, s - 1.0, s, 1.0), solid(line));
    canvas.draw(rectangle(0.0, 0.0, 1.0, s), solid(line));
    canvas.draw(rectangle(s - 1.0, 0.0, 1.0, s), solid(line));
}

// Pointers: a dark shape on a white rim, so that it reads on the dark curve view and on light
// windows alike. Each is drawn twice, the rim first and wider.
void drawOutlined(const std::function<void(double, const Rgba&)>& shape) {
    shape(1.25, kWhite);
    shape(0.0, grey(0.08));
}

// A capsule whose half width grows by `grow`.
Coverage stroke(Point a, Point b, double halfWidth, double grow) {
    return capsule(a, b, halfWidth + grow);
}

// A polygon grown by `grow`: its outline stroked around it.
Coverage grownPolygon(const std::vector<Point>& corners, double grow) {
    const Coverage inside = polygon(corners);
    if (grow <= 0.0) return inside;
    std::vector<Coverage> edges;
    for (size_t i = 0; i < corners.size(); ++i)
        edges.push_back(capsule(corners[i], corners[(i + 1) % corners.size()], grow));
    return [inside, edges](Point p) {
        double c = inside(p);
        for (const Coverage& e : edges) c = std::max(c, e(p));
        return c;
    };
}

void drawMoveCursor(ImageCanvas& canvas) {
    // Four arrows from the centre.
    const Point c{12.0, 12.0};
    drawOutlined([&](double g, const Rgba& colour) {
        canvas.draw(stroke({c.x - 7.0, c.y}, {c.x + 7.0, c.y}, 0.75, g), solid(colour));
        canvas.draw(stroke({c.x, c.y - 7.0}, {c.x, c.y + 7.0}, 0.75, g), solid(colour));
        for (const auto& [dx, dy] : {std::pair{1.0, 0.0}, {-1.0, 0.0}, {0.0, 1.0}, {0.0, -1.0}}) {
            const Point tip{c.x + dx * 10.0, c.y + dy * 10.0};
            const Point base{c.x + dx * 6.5, c.y + dy * 6.5};
            canvas.draw(grownPolygon({tip,
                                      {base.x + dy * 3.0, base.y + dx * 3.0},
                                      {base.x - dy * 3.0, base.y - dx * 3.0}},
                                     g),
                        solid(colour));
        }
    });
}

void drawEditPointsCursor(ImageCanvas& canvas) {
    // An arrow whose tip is the hot spot, with a keypoint beside it.
    const std::vector<Point> arrow{{3.0, 2.0},   {3.0, 17.0}, {6.6, 13.6}, {9.2, 19.4},
                                   {11.6, 18.4}, {9.0, 12.6}, {14.0, 12.4}};
    drawOutlined([&](double g, const Rgba& colour) {
        canvas.draw(grownPolygon(arrow, g), solid(colour));
        canvas.draw(disc({17.5, 17.5}, 3.0 + g), solid(colour));
    });
    canvas.draw(disc({17.5, 17.5}, 1.6), solid(kWhite));
}

void drawCrossHairsCursor(ImageCanvas& canvas) {
    // A thin cross open at the centre, so the point under it stays visible.
    const Point c{12.0, 12.0};
    drawOutlined([&](double g, const Rgba& colour) {
        canvas.draw(stroke({c.x - 9.5, c.y}, {c.x - 2.5, c.y}, 0.5, g), solid(colour));
        canvas.draw(stroke({c.x + 2.5, c.y}, {c.x + 9.5, c.y}, 0.5, g), solid(colour));
        canvas.draw(stroke({c.x, c.y - 9.5}, {c.x, c.y - 2.5}, 0.5, g), solid(colour));
        canvas.draw(stroke({c.x, c.y + 2.5}, {c.x, c.y + 9.5}, 0.5, g), solid(colour));
    });
}

void drawSketchCursor(ImageCanvas& canvas) {
    // A pencil leaning to the right, its tip at the bottom left.
    const std::vector<Point> body{{5.6, 15.6}, {16.6, 4.6}, {19.4, 7.4}, {8.4, 18.4}};
    const std::vector<Point> tip{{3.0, 21.0}, {5.6, 15.6}, {8.4, 18.4}};
    const std::vector<Point> eraser{{16.6, 4.6}, {18.2, 3.0}, {21.0, 5.8}, {19.4, 7.4}};
    drawOutlined([&](double g, const Rgba& colour) {
        canvas.draw(grownPolygon(body, g), solid(colour));
        canvas.draw(grownPolygon(tip, g), solid(colour));
        canvas.draw(grownPolygon(eraser, g), solid(colour));
    });
    canvas.draw(polygon({{7.0, 16.0}, {16.8, 6.2}, {17.8, 7.2}, {8.0, 17.0}}), solid(grey(0.85)));
}

void drawPenAddControlPointCursor(ImageCanvas& canvas) {
    // A pen nib pointing down-left at the hot spot, and a plus.
    const std::vector<Point> nib{{4.0, 20.0}, {6.0, 11.0}, {13.0, 4.0}, {20.0, 11.0}, {13.0, 18.0}};
    drawOutlined([&](double g, const Rgba& colour) {
        canvas.draw(grownPolygon(nib, g), solid(colour));
        canvas.draw(stroke({16.0, 19.5}, {22.0, 19.5}, 0.7, g), solid(colour));
        canvas.draw(stroke({19.0, 16.5}, {19.0, 22.5}, 0.7, g), solid(colour));
    });
    canvas.draw(stroke({4.6, 19.4}, {10.4, 13.6}, 0.35, 0.0), solid(kWhite));
    canvas.draw(disc({11.2, 12.8}, 1.3), solid(kWhite));
}

// The parts of a parameter row's animation status cell: arrows to the previous and next
// keyframe, and the keyframe mark, filled when the channel has a keyframe at the current time
// and hollow when it has none there.
constexpr double kStatusPartSize = 16.0;

void drawStatusArrow(ImageCanvas& canvas, bool forward) {
    const double c = kStatusPartSize * 0.5;
    const double tip = forward ? c + 3.0 : c - 3.0;
    const double base = forward ? c - 2.0 : c + 2.0;
    canvas.draw(polygon({{tip, c}, {base, c - 4.0}, {base, c + 4.0}}), solid(kGlyph));
}

void drawStatusKeyframe(ImageCanvas& canvas, bool filled) {
    const double c = kStatusPartSize * 0.5;
    const double r = 5.0;
    const Coverage outer = polygon({{c, c - r}, {c + r, c}, {c, c + r}, {c - r, c}});
    if (filled) {
        canvas.draw(outer, solid(kGlyph));
        return;
    }
    const double i = r - 1.4;
    const Coverage inner = polygon({{c, c - i}, {c + i, c}, {c, c + i}, {c - i, c}});
    canvas.draw([outer, inner](Point p) { return inner(p) > 0.0 ? 0.0 : outer(p); }, solid(kGlyph));
}

bool writeBothScales(const std::string& folder, const std::string& name, double sizePoints,
                     const std::function<void(ImageCanvas&)>& drawImage) {
    for (const double scale : {1.0, 2.0}) {
        ImageCanvas canvas(sizePoints, sizePoints, scale);
        drawImage(canvas);
        const std::string path = folder + "/" + name + (scale > 1.0 ? "@2x" : "") + ".png";
        std::string error;
        if (!canvas.writePNG(path, error)) {
            std::fprintf(stderr, "vce_imagegen: cannot write %s: %s\n", path.c_str(),
                         error.c_str());
            return false;
        }
    }
    return true;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: vce_imagegen <output folder>\n");
        return 2;
    }
    const std::string folder = argv[1];
    bool ok = true;
    using namespace TQKeyframeImages;

    for (std::size_t colour = 0; colour < kColorCount; ++colour) {
        const Rgba c = fromGD(*GDColor::curveColorAtIndex(colour));
        ok &= writeBothScales(folder, imageName(colour, kNormal, false), kKeypointSize,
                              [&](ImageCanvas& canvas) { drawKeypoint(canvas, normalLook(c)); });
        ok &= writeBothScales(folder, imageName(colour, kPressed, false), kKeypointSize,
                              [&](ImageCanvas& canvas) { drawKeypoint(canvas, pressedLook(c)); });
        ok &= writeBothScales(folder, imageName(colour, kDisabled, false), kKeypointSize,
                              [&](ImageCanvas& canvas) { drawKeypoint(canvas, disabledLook(c)); });
    }
    ok &= writeBothScales(folder, imageName(0, kInactive, false), kKeypointSize,
                          [](ImageCanvas& canvas) { drawKeypoint(canvas, inactiveLook()); });
    for (const State state : {kNormal, kPressed, kInactive, kDisabled}) {
        ok &= writeBothScales(
            folder, imageName(0, state, true), kKeypointSize,
            [state](ImageCanvas& canvas) { drawKeypoint(canvas, selectedLook(state)); });
    }
    ok &= writeBothScales(folder, tangentHandleImageName(), kTangentHandleSize, drawTangentHandle);

    ok &= writeBothScales(folder, "K_KeyframeEditor_EditKeyframes", kToolIconSize, drawEditTool);
    ok &=
        writeBothScales(folder, "K_KeyframeEditor_SketchKeyframes", kToolIconSize, drawSketchTool);
    ok &= writeBothScales(folder, "K_KeyframeEditor_TransformKeyframes", kToolIconSize,
                          drawTransformTool);
    ok &= writeBothScales(folder, "K_General_Add", kSmallIconSize, drawAdd);
    ok &= writeBothScales(folder, "K_General_Remove", kSmallIconSize, drawRemove);
    // Files named by this project; the embedding step lists them under the resource names
    // the panels ask for (src/resources/cmake/EmbedImages.cmake).
    ok &= writeBothScales(folder, "ChannelRowMenu", kMenuButtonSize, drawParameterMenu);
    ok &= writeBothScales(folder, "StripReset", kSmallIconSize, drawReset);
    ok &= writeBothScales(folder, "StripBorder", kBorderSize, drawGradientBorder);
    ok &= writeBothScales(folder, GDCursorMove.name, kGDCursorSize, drawMoveCursor);
    ok &= writeBothScales(folder, GDCursorEditPoints.name, kGDCursorSize, drawEditPointsCursor);
    ok &= writeBothScales(folder, GDCursorCrossHairs.name, kGDCursorSize, drawCrossHairsCursor);
    ok &= writeBothScales(folder, GDCursorSketch.name, kGDCursorSize, drawSketchCursor);
    ok &= writeBothScales(folder, GDCursorPenAddControlPoint.name, kGDCursorSize,
                          drawPenAddControlPointCursor);
    ok &= writeBothScales(folder, "AnimStatusPrevious", kStatusPartSize,
                          [](ImageCanvas& canvas) { drawStatusArrow(canvas, false); });
    ok &= writeBothScales(folder, "AnimStatusNext", kStatusPartSize,
                          [](ImageCanvas& canvas) { drawStatusArrow(canvas, true); });
    ok &= writeBothScales(folder, "AnimStatusKeyframe", kStatusPartSize,
                          [](ImageCanvas& canvas) { drawStatusKeyframe(canvas, true); });
    ok &= writeBothScales(folder, "AnimStatusNoKeyframe", kStatusPartSize,
                          [](ImageCanvas& canvas) { drawStatusKeyframe(canvas, false); });
    return ok ? 0 : 1;
}
