#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <memory>
#include <random>
#include <sstream>
#include <utility>

#include "platform/draw/HXDPrimitives.h"
#include "platform/draw/internal/HXDGeometry2D.h"
#include "platform/draw/tests/HitFixture.h"

namespace {

constexpr uint32_t kCurveID = 0x10000000u;
constexpr uint32_t kKeypointID = 0x20000000u;
constexpr uint32_t kOutTangentID = 0x40000000u;
constexpr double kPixelTolerance = 1e-3;

class HitTestFixture : public HitFixture {
protected:
    // The records in order, each as its hit id in hex and, for a keypoint, "/" and its handle.
    static std::string found(const std::vector<HXDHitRecord>& hits) {
        std::ostringstream out;
        for (const HXDHitRecord& h : hits) {
            out << (out.tellp() > 0 ? " " : "") << std::hex << h.hitID() << std::dec;
            if (const HXDNumber* handle = h.extraInfo().objectForKey("Handle"))
                out << "/" << handle->unsignedLongLongValue();
        }
        return out.str();
    }

    // A keypoint image of 8 x 8 texels (2x, so 4 x 4 points): opaque except a transparent
    // 2 x 2 corner at each corner.
    static std::shared_ptr<const HXDPixelTexture> keypointImage() {
        std::vector<uint8_t> rgba(8 * 8 * 4, 255);
        for (int row = 0; row < 8; ++row)
            for (int col = 0; col < 8; ++col) {
                const bool corner = (row < 2 || row >= 6) && (col < 2 || col >= 6);
                rgba[(row * 8 + col) * 4 + 3] = corner ? 0 : 255;
            }
        return HXDPixelTexture::textureWithRGBA(8, 8, 2.0f, std::move(rgba));
    }
    // A keypoint quad of 16 x 16 pixels centred on a world point, as a view makes it.
    std::shared_ptr<HXDQuadTexture> keypoint(double x, double y, uint64_t handle) const {
        const CGRect dest = CGRectMake(x - 0.4, y - 0.8, 0.8, 1.6);  // 16 px by 16 px
        auto quad = std::make_shared<HXDQuadTexture>(0, keypointImage(), dest, 1.0f);
        quad->setUseTextureAlphaForHitTest(true);
        quad->hitInfo().setHitID(kKeypointID);
        quad->hitInfo().extraInfo().setObject("ID", HXDNumber::numberWithInteger(7));
        quad->hitInfo().extraInfo().setObject("Handle",
                                              HXDNumber::numberWithUnsignedLongLong(handle));
        return quad;
    }
    static std::shared_ptr<HXDMultiline> curve(std::vector<HXDLineVertex> vertices) {
        auto line = std::make_shared<HXDMultiline>(std::move(vertices));
        line->hitInfo().setHitID(kCurveID);
        return line;
    }
};

TEST_F(HitTestFixture, multiline__hitOnTheLineWithinTheToleranceAndOnlyAfterAFrame) {
    const HXDPrimitiveArray list{nullptr,
                                 curve({{{0, 0, 0}, {}}, {{5, 2, 0}, {}}, {{10, 2, 0}, {}}})};
    HXDRenderController fresh(nullptr, 1.0f);
    const HXDHitTestContext none = fresh.renderingContextForHitTestAtCoords(HXDFloat2{100, 50});
    EXPECT_FALSE(none.isValid());
    EXPECT_TRUE(fresh.newHitTestResultForPrimitives(list, none, true).empty())
        << "no frame: no projection";
    // On the line: distance 0 (a null entry is skipped). 2 px above a 1 px line: 1.5 px beyond
    // its edge, inside the 3 px tolerance; 4 px is beyond it.
    const CGPoint p = pixel(7.5, 2);
    for (const auto& [dy, distance] : {std::pair{0.0, 0.0}, {2.0, 1.5}, {-2.0, 1.5}, {4.0, -1.0}}) {
        const auto hits = pick(list, CGPointMake(p.x, p.y + dy));
        EXPECT_NEAR(hits.empty() ? -1.0 : hits[0].distance(), distance, kPixelTolerance) << dy;
        EXPECT_EQ(found(hits), hits.empty() ? "" : "10000000") << dy;
    }
    installFrame(2.0f);  // width 1 covers 2 px and the tolerance 6 px
    EXPECT_EQ(pick(list, CGPointMake(pixel(7.5, 2).x, pixel(7.5, 2).y + 6.5)).size(), 1u)
        << "the tolerance follows the backing scale";
}

// The index must find what a walk over every segment finds, for points and bands, for curves
// (x in order, bins filled as queries reach them) and for anything else (a loop, x going back).
TEST_F(HitTestFixture, multiline__indexAgreesWithABruteForceWalk) {
    std::mt19937 rng(1234);
    std::uniform_real_distribution<double> ux(-0.5, 10.5), uy(-5.5, 5.5), jy(-4.5, 4.5);
    const auto monotone =
        line(2000, [](int i) { return xy(i * 10.0 / 1999.0, 4.0 * std::sin(i * 30.0 / 1999.0)); });
    // Jagged: few, long segments, so that each one decides some answers.
    const auto jagged = line(120, [&](int i) { return xy(i * 10.0 / 119.0, jy(rng)); });
    const auto looped =
        line(2000, [](int i) { return xy(5 + 4 * std::cos(i * 0.01), 4 * std::sin(i * 0.013)); });
    looped->setLoop(true);
    const HXDScreenMapping mapping(controller.renderingContext()->projection(),
                                   CGSizeMake(200, 100));
    for (const auto& line : {monotone, jagged, looped}) {
        const auto& v = line->vertices();
        const size_t segments = v.size() - 1 + (line->loop() ? 1 : 0);
        for (int trial = 0; trial < 300; ++trial) {
            // One draw per statement, so every compiler tests the same points.
            const double px = ux(rng);
            const double py = uy(rng);
            const CGPoint p = pixel(px, py);
            // A band of up to 30 px around the point: crossed by some segment, or not.
            const CGRect band = CGRectMake(p.x, p.y, (trial % 7) * 5.0, (trial % 5) * 6.0);
            // A column's y extent, for the lines ordered in x: the ends of every segment in it.
            const double x0 = px, x1 = px + (trial % 4) * 0.3;
            double best = std::numeric_limits<double>::infinity(), lo = HUGE_VAL, hi = -HUGE_VAL;
            bool crossed = false;
            for (size_t s = 0; s < segments; ++s) {
                const HXDLineVertex& a = v[s];
                const HXDLineVertex& b = v[(s + 1) % v.size()];
                const CGPoint pa = mapping.worldToPixel(a.start.x, a.start.y);
                const CGPoint pb = mapping.worldToPixel(b.start.x, b.start.y);
                const double dx = pb.x - pa.x, dy = pb.y - pa.y;
                double t = ((p.x - pa.x) * dx + (p.y - pa.y) * dy) / (dx * dx + dy * dy);
                t = std::clamp(std::isfinite(t) ? t : 0.0, 0.0, 1.0);
                best = std::min(best, std::hypot(pa.x + t * dx - p.x, pa.y + t * dy - p.y));
                crossed = crossed || hxd_internal::segmentMeetsRect(
                                         pa.x, pa.y, pb.x, pb.y, band.origin.x - 0.5,
                                         band.origin.y - 0.5, band.origin.x + band.size.width + 0.5,
                                         band.origin.y + band.size.height + 0.5);
                if (s + 1 < v.size() && b.start.x >= x0 && a.start.x <= x1) {
                    lo = std::min({lo, double(a.start.y), double(b.start.y)});
                    hi = std::max({hi, double(a.start.y), double(b.start.y)});
                }
            }
            EXPECT_EQ(inBand({line}, band).size(), crossed ? 1u : 0u)
                << "band of trial " << trial << " loop " << line->loop();

            if (!line->loop()) {
                double gotLo = 0, gotHi = 0;
                const bool found = line->hitYExtentOverX(x0, x1, gotLo, gotHi);
                EXPECT_EQ(found ? std::pair(gotLo, gotHi) : std::pair(HUGE_VAL, -HUGE_VAL),
                          std::pair(lo, hi))
                    << "column of trial " << trial;
            }

            const auto hits = pick({line}, p);
            const bool expected = best <= 0.5 + 3.0;
            ASSERT_EQ(!hits.empty(), expected)
                << "trial " << trial << " loop " << line->loop() << " brute " << best;
            if (expected) {
                EXPECT_NEAR(hits[0].distance(), std::max(0.0, best - 0.5), kPixelTolerance);
            }
        }
    }
}

TEST_F(HitTestFixture, multiline__segmentsWithGapsMakeRunsAndLoopsClose) {
    const HXDColor c{1, 0, 0, 1};
    const HXDLineSegment segs[] = {
        {{0, 0, 0}, {0, 2, 0}, c}, {{0, 2, 0}, {2, 2, 0}, c}, {{6, 0, 0}, {8, 0, 0}, c}};
    auto line = std::make_shared<HXDMultiline>(std::span<const HXDLineSegment>(segs));
    EXPECT_EQ(line->numberOfRuns(), 2u);
    EXPECT_EQ(line->vertices().size(), 5u) << "chained segments share their vertex";
    EXPECT_TRUE(pick({line}, pixel(4, 1)).empty()) << "the gap between runs is not a segment";
    EXPECT_TRUE(pick({line}, pixel(1, 1)).empty()) << "open: the first run does not close";
    line->setLoop(true);
    EXPECT_EQ(pick({line}, pixel(1, 1)).size(), 1u)
        << "loop closes (2,2) back to (0,0) through (1,1)";
}

TEST_F(HitTestFixture, keypointQuad__transparentCornerDoesNotHitButTheImageDoes) {
    auto key = keypoint(5, 0, 0xFFFFFFFF12345678ull);
    const CGPoint centre = pixel(5, 0);
    const auto hits = pick({key}, centre);
    EXPECT_EQ(found(hits), "20000000/18446744069720004216")
        << "a 64-bit handle survives the record";
    ASSERT_EQ(hits.size(), 1u);
    EXPECT_EQ(hits[0].extraInfo().objectForKey("ID")->unsignedLongValue(), 7u);
    // The quad spans centre +- 8 px; its 2 x 2 texel corners are the outer 4 px.
    const CGPoint corner = CGPointMake(centre.x + 7, centre.y + 7);
    EXPECT_TRUE(pick({key}, corner).empty()) << "a transparent texel is not the keypoint";
    EXPECT_EQ(pick({key}, CGPointMake(centre.x + 7, centre.y)).size(), 1u)
        << "an opaque edge texel is";
    key->setUseTextureAlphaForHitTest(false);
    EXPECT_EQ(pick({key}, corner).size(), 1u)
        << "without the flag the whole rectangle hits, as tangent handles do";
}

TEST_F(HitTestFixture, closest__keypointOverCurveOverlapsToTheTopOneAndLinesByDistance) {
    auto line = curve({{{0, 0, 0}, {}}, {{10, 0, 0}, {}}});
    auto first = keypoint(5, 0, 1);
    auto second = keypoint(5.2, 0, 2);  // overlaps the first by 12 px
    EXPECT_EQ(found(pick({first, line}, pixel(5, 0))), "20000000/1")
        << "the keypoint wins over the curve through it, drawn later or not";
    EXPECT_EQ(found(pick({line, first, second}, pixel(5.1, 0))), "20000000/2")
        << "of two overlapping keypoints the one drawn on top is hit";
    EXPECT_EQ(found(pick({line, first, second}, pixel(5.1, 0), false)),
              "10000000 20000000/1 20000000/2")
        << "without the flag every primitive under the point answers, in order";
    // A tangent handle near a curve: on the handle it wins; 2 px off the curve and outside the
    // handle, the curve does.
    auto handle = std::make_shared<HXDQuadTexture>(kOutTangentID, nullptr,
                                                   CGRectMake(1, 0.5, 0.5, 1.0), 1.0f);
    EXPECT_EQ(found(pick({line, handle}, pixel(1.25, 1.0))), "40000000");
    EXPECT_EQ(found(pick({line, handle}, pixel(3, 0.2))), "10000000");
}

TEST_F(HitTestFixture, rectangle__findsKeypointsByTheirOpaqueTexelsAndCurvesThatCross) {
    auto a = keypoint(2, 0, 1), b = keypoint(5, 2, 2), c = keypoint(8, -2, 3);
    const CGPoint pa = pixel(2, 0), pb = pixel(5, 2), mid = pixel(5, 0);
    EXPECT_EQ(
        found(inBand({a, b, c}, CGRectMake(pb.x + 1, pb.y + 1, pa.x - pb.x - 2, pa.y - pb.y - 2))),
        "20000000/1 20000000/2")
        << "a band of negative size from b's centre to a's covers both, not c, in array order";
    EXPECT_EQ(found(inBand({a}, CGRectMake(pa.x + 6.5, pa.y + 6.5, 1, 1))), "")
        << "a band over a transparent corner does not select the keypoint";
    auto line = curve({{{0, -4, 0}, {}}, {{10, 4, 0}, {}}});
    EXPECT_EQ(inBand({line}, CGRectMake(mid.x - 3, mid.y - 3, 6, 6)).size(), 1u);
    EXPECT_TRUE(inBand({line}, CGRectMake(mid.x + 20, mid.y - 3, 6, 6)).empty());
}

TEST_F(HitTestFixture, meshAndFlatQuad__insideHitsOutsideDoesNot) {
    auto mesh = std::make_shared<HXDMesh>(
        9, HXDBrush{}, std::vector<HXDSubmesh>{HXDSubmesh({{2, -2}, {2, 2}, {8, 2}, {8, -2}})});
    auto handle = std::make_shared<HXDScreenspaceQuad>(CGRectMake(7.9, 1.8, 0.2, 0.4), 3);
    EXPECT_EQ(found(pick({mesh, handle}, pixel(5, 0))), "9");
    EXPECT_EQ(found(pick({mesh, handle}, pixel(8, 2))), "3")
        << "a box handle drawn over the box's inside wins";
    EXPECT_EQ(found(pick({mesh, handle}, pixel(9, 0))), "");
    mesh->setWireframe(true);
    EXPECT_EQ(found(pick({mesh}, pixel(5, 0))), "")
        << "a wireframe mesh is hit on its outline only";
    EXPECT_EQ(found(pick({mesh}, pixel(2, 0))), "9");
}

TEST_F(HitTestFixture, text__boxFollowsTheAnchorAndTheBackingScale) {
    HXDText text(HXDAttributedString{"0.50", HXDTextAttributes{}}, HXDTextLayoutAnchor::BottomLeft,
                 CGPointMake(5, 0));
    const HXDScreenMapping mapping(controller.renderingContext()->projection(),
                                   CGSizeMake(200, 100));
    const CGRect one = text.pixelRect(mapping, 1.0f);
    const CGRect two = text.pixelRect(mapping, 2.0f);
    EXPECT_NEAR(one.origin.x, 100, kPixelTolerance);
    EXPECT_NEAR(one.origin.y, 50, kPixelTolerance)
        << "anchor 0 puts the box's bottom left at the position";
    EXPECT_GT(one.size.width, 0.0);
    EXPECT_NEAR(two.size.height, 2 * one.size.height, kPixelTolerance)
        << "a point is two pixels on a 2x backing";
}

}  // namespace
