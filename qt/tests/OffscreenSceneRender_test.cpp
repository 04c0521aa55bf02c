// An offscreen frame of the sample scene painted by the QPainter encoder: the first object's
// curves go into a controller and a view on a Qt view host, the view frames them, and the
// image must show each curve's colour where its samples lie on screen and the background
// colour away from every curve and keypoint. The frame is written beside the test binary
// as a PNG, to look at when this test fails.
#include <gtest/gtest.h>

#include <QApplication>
#include <QDir>
#include <QWidget>

#include <algorithm>
#include <cmath>
#include <memory>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtPainterEncoder.h"
#include "qt/TQQtServices.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

constexpr int kTimescale = 0x40000;
// Eight curves: one per colour of the palette.
constexpr size_t kMaxCurves = 8;
// A width-one antialiased line may split over two pixels: at least this share of the curve
// colour must show in one of them.
constexpr double kMinCoverage = 0.4;
// How far (in colour units of 0..255) a pixel may lie off the line from background to curve colour.
constexpr double kColourResidual = 40.0;
// Room around curves and keypoints (drawable pixels) where other curves, images and the
// antialiased fringe may change a pixel.
constexpr double kCurveClearance = 5.0;
constexpr double kKeypointClearance = 12.0;
// Probes per curve between its first and last keypoints.
constexpr int kProbes = 200;
// The dimmed ends: 0.3 of the curve colour over the background, give or take antialiasing
// and 8-bit rounding.
constexpr double kDimShare = 0.3;
constexpr double kDimTolerance = 0.06;
// The stipple repeats every 8 pixels at backing scale 1 (2 steps of 2 points on, 2 off).
constexpr int kStipplePeriod = 8;

struct ScreenCurve {
    TQCurveEditorChannelItem* item = nullptr;
    GDColor color;
    std::vector<CGPoint> points;     // the curve at every drawable column, pixels (y up)
    std::vector<CGPoint> keypoints;  // pixels (y up)
    std::vector<CGPoint> probes;     // where the curve's colour is looked for
    double lastKeySeconds = 0.0;     // on the editor's axis
};

double distanceToSegment(const CGPoint& p, const CGPoint& a, const CGPoint& b) {
    const double dx = b.x - a.x, dy = b.y - a.y;
    const double len2 = dx * dx + dy * dy;
    double t = len2 > 0.0 ? ((p.x - a.x) * dx + (p.y - a.y) * dy) / len2 : 0.0;
    t = std::clamp(t, 0.0, 1.0);
    return std::hypot(p.x - (a.x + t * dx), p.y - (a.y + t * dy));
}

double distanceToPolyline(const CGPoint& p, const std::vector<CGPoint>& line) {
    double best = INFINITY;
    for (size_t i = 0; i + 1 < line.size(); ++i)
        best = std::min(best, distanceToSegment(p, line[i], line[i + 1]));
    return best;
}

class OffscreenSceneRenderTest : public ::testing::Test {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
        widget.resize(800, 400);
        widget.show();  // the offscreen platform gives it a window, hence a backing
        viewHost = std::make_unique<TQQtViewHost>(&widget);
        HXDTextMetrics::setShared(&metrics);

        controller.init();
        controller.setAppDelegate(&host);
        view.setViewHost(viewHost.get());
        view.setClock(&clock);
        view.setTimer(&timer);
        view.setController(&controller);
        controller.setView(&view);
        const CMTime start = CMTimeMake(0, kTimescale);
        const CMTime duration = CMTimeMake(10 * kTimescale, kTimescale);
        view.setDisplayRange(&start, &duration);
        // The full editor's label step: each curve is then fitted to the grid on its own.
        view.setGridSpacingY(25.0);
        view.setCurrentViewVolume(CGRectMake(0.0, -150.0, 10.0, 300.0));
        view.setOriginalViewVolume(CGRectMake(0.0, -150.0, 10.0, 300.0));

        set = std::make_shared<TQCurveSetMutable>();
        set->initWithName("Offscreen", &host);
        controller.setSelectedCurveSet(set);
        const std::vector<TQChannelObjectRootBase*> objects = host.scene().objects();
        ASSERT_FALSE(objects.empty()) << "the sample scene has no object";
        collectChannels(objects.front());
        ASSERT_GE(channels.size(), 2u) << "the first object has too few keyframed channels";
        for (TQChannel* channel : channels) controller.appendChannel(channel, set);
    }

    void TearDown() override {
        HXDTextMetrics::setShared(nullptr);
        view.setController(nullptr);
        view.setViewHost(nullptr);
        controller.setView(nullptr);
    }

    void collectChannels(TQChannelBase* node) {
        if (channels.size() >= kMaxCurves || !node) return;
        if (auto* channel = dynamic_cast<TQChannel*>(node)) {
            // Flat curves of equal value would hide each other: only curves that move.
            double lo = INFINITY, hi = -INFINITY;
            for (TQKeyframeHandle h : channel->getKeyframes(false)) {
                double v = 0.0;
                if (!channel->getKeyframe(h, nullptr, &v)) continue;
                lo = std::min(lo, v);
                hi = std::max(hi, v);
            }
            if (hi - lo > 1e-6) channels.push_back(channel);
        }
        if (const std::vector<TQChannelBase*>* children = node->getChildren())
            for (TQChannelBase* child : *children) collectChannels(child);
    }

    // A frame through the encoder, past the 1/30 s gate.
    bool renderFrame() {
        encoder.setDrawableSize(QSize(static_cast<int>(view.drawableSize().width),
                                      static_cast<int>(view.drawableSize().height)));
        timer.advance(0.05);
        return view.displayLayer(&encoder);
    }

    // Where each item's curve and keypoints lie in the last frame, computed from the
    // channels, not from the primitives.
    std::vector<ScreenCurve> screenCurves() {
        std::vector<ScreenCurve> out;
        const double columns = view.drawableSize().width;
        const CMTimeRange range = view.getDisplayRange();
        for (uint32_t i = 0; i < controller.numberOfChannelItems(); ++i) {
            auto* item = dynamic_cast<TQCurveEditorChannelItem*>(set->channeItemAtIndex(i).get());
            TQChannel* channel = item ? item->channel() : nullptr;
            if (!channel) continue;
            ScreenCurve curve;
            curve.item = item;
            curve.color = TQCurveEditorViewBase::getColorForIndex(item->colorIndex());
            const double off = CMTimeGetSeconds(channel->timeOffset());
            const auto toScreen = [&](double channelSeconds, double value) {
                return view.getPointScreen(CGPointMake(
                    channelSeconds + off, controller.convertFromChannelCoords(item, value)));
            };
            const double start = CMTimeGetSeconds(range.start);
            const double duration = CMTimeGetSeconds(range.duration);
            for (int c = 0; c <= static_cast<int>(columns); ++c) {
                const double t = start + duration * c / columns - off;
                curve.points.push_back(
                    toScreen(t, channel->getCurveValue(CMTimeMakeWithSeconds(t, kTimescale))));
            }
            CMTime first{}, last{};
            channel->getFirstKeyframe(&first, nullptr);
            channel->getLastKeyframe(&last, nullptr);
            curve.lastKeySeconds = CMTimeGetSeconds(last) + off;
            for (TQKeyframeHandle h : channel->getKeyframes(false)) {
                CMTime t{};
                double v = 0.0;
                if (channel->getKeyframe(h, &t, &v))
                    curve.keypoints.push_back(toScreen(CMTimeGetSeconds(t), v));
            }
            // Probes between the first and last keypoints, where the curve has its full colour.
            for (int k = 1; k < kProbes; ++k) {
                const double t = CMTimeGetSeconds(first) +
                                 (CMTimeGetSeconds(last) - CMTimeGetSeconds(first)) * k / kProbes;
                curve.probes.push_back(
                    toScreen(t, channel->getCurveValue(CMTimeMakeWithSeconds(t, kTimescale))));
            }
            out.push_back(std::move(curve));
        }
        return out;
    }

    // Two frames: the first fits each curve to the grid, then the view frames them all.
    void renderFramed() {
        ASSERT_TRUE(renderFrame()) << "the first frame must draw";
        view.frameAll(1);
        ASSERT_TRUE(renderFrame()) << "the framed frame must draw";
        ASSERT_EQ(encoder.image().size(), QSize(800, 400));
    }

    QColor backgroundColour() const {
        const GDColor c = view.backgroundColor();
        return TQQtPainterEncoder::qColor(HXDColor{c.red, c.green, c.blue, 1.0f});
    }

    // Whether another curve than curves[index], or any keypoint, comes near the point.
    bool crowded(const std::vector<ScreenCurve>& curves, size_t index, const CGPoint& p) const {
        if (nearKeypoint(curves, p)) return true;
        for (size_t other = 0; other < curves.size(); ++other)
            if (other != index && distanceToPolyline(p, curves[other].points) < kCurveClearance)
                return true;
        return false;
    }

    bool nearKeypoint(const std::vector<ScreenCurve>& curves, const CGPoint& p) const {
        for (const ScreenCurve& c : curves)
            for (const CGPoint& k : c.keypoints)
                if (std::hypot(p.x - k.x, p.y - k.y) < kKeypointClearance) return true;
        return false;
    }

    // Looks for `want` near each probe of curves[index] that no other curve and no keypoint
    // come near; answers how many probes were judged, and reports each where it is missing.
    int checkCurveColour(const std::vector<ScreenCurve>& curves, size_t index, const QColor& want) {
        const QImage& image = encoder.image();
        const QColor background = backgroundColour();
        const ScreenCurve& curve = curves[index];
        int checked = 0;
        for (const CGPoint& p : curve.probes) {
            if (p.x < 2 || p.y < 2 || p.x > image.width() - 3 || p.y > image.height() - 3) continue;
            if (crowded(curves, index, p)) continue;
            ++checked;
            double best = -1.0;
            for (int dy = -2; dy <= 2; ++dy)
                for (int dx = -2; dx <= 2; ++dx)
                    best = std::max(best, coverage(pixel(static_cast<int>(p.x) + dx,
                                                         static_cast<int>(p.y) + dy),
                                                   background, want));
            if (best < kMinCoverage)
                ADD_FAILURE() << "curve " << index << " (" << curve.item->simpleName()
                              << ") missing at pixel (" << p.x << ", " << p.y << ")";
        }
        return checked;
    }

    static QColor qColour(const GDColor& c) {
        return TQQtPainterEncoder::qColor(HXDColor{c.red, c.green, c.blue, 1.0f});
    }

    QColor pixel(int x, int yUp) const {
        const QImage& image = encoder.image();
        return image.pixelColor(x, image.height() - 1 - yUp);
    }

    // The share of `want` over `background` the pixel shows (its projection on the line
    // between the two), or -1 if the pixel is off that line.
    static double coverage(const QColor& got, const QColor& background, const QColor& want) {
        const double d[3] = {want.red() - background.red() + 0.0,
                             want.green() - background.green() + 0.0,
                             want.blue() - background.blue() + 0.0};
        const double g[3] = {got.red() - background.red() + 0.0,
                             got.green() - background.green() + 0.0,
                             got.blue() - background.blue() + 0.0};
        const double len2 = d[0] * d[0] + d[1] * d[1] + d[2] * d[2];
        if (len2 < 1.0) return -1.0;
        const double a = (g[0] * d[0] + g[1] * d[1] + g[2] * d[2]) / len2;
        const double r = std::hypot(g[0] - a * d[0], g[1] - a * d[1], g[2] - a * d[2]);
        return r <= kColourResidual ? a : -1.0;
    }

    TQHostAppDelegate host;
    QWidget widget;
    std::unique_ptr<TQQtViewHost> viewHost;
    TQQtTextMetrics metrics;
    RWManualClock clock;
    RWManualTimer timer{clock};
    TQCurveEditorCtrlBase controller;
    TQCurveEditorViewBase view;
    TQCurveSetMutablePtr set;
    std::vector<TQChannel*> channels;
    TQQtPainterEncoder encoder;
};

TEST_F(OffscreenSceneRenderTest, frame__curve_colours_on_the_curves_background_elsewhere) {
    renderFramed();
    const QImage& image = encoder.image();
    const QString path =
        QDir(QCoreApplication::applicationDirPath()).filePath("offscreen_sample_scene.png");
    EXPECT_TRUE(image.save(path, "PNG")) << "could not write " << path.toStdString();

    const QColor background = backgroundColour();
    const std::vector<ScreenCurve> curves = screenCurves();
    ASSERT_EQ(curves.size(), channels.size());

    // Each curve's colour at its probes. Curves of one compound can coincide (one hides the
    // other); most must be judged.
    int totalChecked = 0;
    size_t judged = 0;
    for (size_t ci = 0; ci < curves.size(); ++ci) {
        const int checked = checkCurveColour(curves, ci, qColour(curves[ci].color));
        totalChecked += checked;
        judged += checked >= 5 ? 1 : 0;
    }
    EXPECT_GE(judged * 2, curves.size()) << "too few curves had clear probes: the framing is wrong";
    EXPECT_GE(totalChecked, 100);

    // Background on a grid of pixels away from every curve and keypoint.
    int clear = 0;
    for (int y = 4; y < image.height(); y += 16) {
        for (int x = 4; x < image.width(); x += 16) {
            const CGPoint p = CGPointMake(x + 0.5, y + 0.5);
            if (nearKeypoint(curves, p)) continue;
            if (std::any_of(curves.begin(), curves.end(), [&](const ScreenCurve& c) {
                    return distanceToPolyline(p, c.points) < kCurveClearance;
                }))
                continue;
            ++clear;
            const QColor got = pixel(x, y);
            EXPECT_TRUE(std::abs(got.red() - background.red()) <= 2 &&
                        std::abs(got.green() - background.green()) <= 2 &&
                        std::abs(got.blue() - background.blue()) <= 2)
                << "pixel (" << x << ", " << y << ") away from all curves is not the background";
        }
    }
    EXPECT_GT(clear, 200) << "the curves cover nearly the whole view: the framing is wrong";
}

// The ends past the last keypoints are the curve colour at 0.3 opacity: over the background
// they must show 30 % of the curve's colour, as a GPU pipeline blends them, not the 9 % that
// an opacity applied twice leaves (as dark as the background to the eye).
TEST_F(OffscreenSceneRenderTest, frame__dimmed_ends_show_30_percent_of_the_curve_colour) {
    renderFramed();
    // Four seconds past the last keyframes, so that the dimmed, stippled ends take room.
    const CGRect framed = view.getCurrentViewVolume();
    const CMTime start = CMTimeMake(0, kTimescale);
    const CMTime duration = CMTimeMake(14 * kTimescale, kTimescale);
    view.setDisplayRange(&start, &duration);
    view.setCurrentViewVolume(CGRectMake(0.0, framed.origin.y, 14.0, framed.size.height));
    view.setAllOriginalCurveDirty(1);
    ASSERT_TRUE(renderFrame());
    const QImage& image = encoder.image();
    EXPECT_TRUE(image.save(
        QDir(QCoreApplication::applicationDirPath()).filePath("offscreen_dimmed_ends.png"), "PNG"));

    const QColor background = backgroundColour();
    const std::vector<ScreenCurve> curves = screenCurves();
    int judged = 0;
    for (size_t ci = 0; ci < curves.size(); ++ci) {
        const ScreenCurve& curve = curves[ci];
        const QColor want = qColour(curve.color);
        const double lastKeyColumn =
            view.getPointScreen(CGPointMake(curve.lastKeySeconds, 0.0)).x + kKeypointClearance;
        // One probe per stipple period along the flat stretches of the dimmed end: there a
        // column of pixels across the line adds up to the line's whole share.
        for (int x = static_cast<int>(lastKeyColumn); x + kStipplePeriod + 1 < image.width() - 2;
             x += kStipplePeriod) {
            const CGPoint& p = curve.points[static_cast<size_t>(x)];
            const CGPoint& q = curve.points[static_cast<size_t>(x) + kStipplePeriod];
            if (std::abs(q.y - p.y) > 0.5 || p.y < 3 || p.y > image.height() - 4) continue;
            if (crowded(curves, ci, p) || crowded(curves, ci, q)) continue;
            // The dash of the period: the column with the most of the curve's colour.
            double best = 0.0;
            bool foreign = false;
            for (int dx = 0; dx < kStipplePeriod; ++dx) {
                double column = 0.0;
                for (int dy = -2; dy <= 2; ++dy) {
                    const double c =
                        coverage(pixel(x + dx, static_cast<int>(p.y) + dy), background, want);
                    foreign = foreign || c < 0.0;
                    column += std::max(c, 0.0);
                }
                best = std::max(best, column);
            }
            if (foreign) continue;
            ++judged;
            EXPECT_NEAR(best, kDimShare, kDimTolerance)
                << "curve " << ci << " (" << curve.item->simpleName() << ") at pixel (" << x << ", "
                << p.y << "): share of the curve colour over the background";
        }
    }
    EXPECT_GE(judged, 20) << "too few flat, uncrowded stretches past the last keypoints";
}

}  // namespace
