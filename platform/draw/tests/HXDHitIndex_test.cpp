// The render controller's index over long lists: whatever it skips, the answers must be the
// ones a walk over every primitive gives, and any change to the list must be seen.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <random>

#include "platform/draw/HXDPrimitives.h"
#include "platform/draw/internal/HXDPrimitiveIndex.h"
#include "platform/draw/tests/HitFixture.h"

namespace {

constexpr double kPixelTolerance = 1e-4;

struct Found {
    const HXDDrawPrimitive* primitive;
    float distance;
};

// The rules of HXDHitTest.h, applied to every primitive of the list in turn.
std::vector<Found> walk(const HXDPrimitiveArray& list, const HXDHitTestContext& context,
                        bool closest) {
    std::vector<Found> all;
    for (const auto& p : list) {
        if (!p) continue;
        if (context.kind() == HXDHitTestContext::Kind::Point) {
            const float d = p->hitDistanceAtPoint(context);
            if (d >= 0.0f) all.push_back({p.get(), d});
        } else if (p->intersectsRect(context)) {
            all.push_back({p.get(), 0.0f});
        }
    }
    if (!closest || all.empty()) return all;
    Found best = all[0];
    for (const Found& f : all)
        if (f.distance < best.distance ||
            (f.distance == best.distance &&
             f.primitive->hitPriority() >= best.primitive->hitPriority()))
            best = f;
    return {best};
}

class HitIndexFixture : public HitFixture {
protected:
    static std::shared_ptr<HXDMultiline> curve(double y, double amplitude, float width, int samples,
                                               double power = 1.0) {
        auto curve = line(samples, [&](int i) {
            // power > 1 crowds the samples at the start: the bins' guesses are then far off.
            const double x = 10.0 * std::pow(i / double(samples - 1), power);
            return xy(x, y + amplitude * std::sin(x * 2.3 + y));
        });
        curve->setWidth(width);
        return curve;
    }

    // A frame's worth of everything a view draws: curves of several widths in bands, their
    // keypoint images (alpha-tested), tangent handles, and the odd ones out.
    HXDPrimitiveArray frame(uint32_t seed) const {
        std::mt19937 rng(seed);
        std::uniform_real_distribution<double> u(0.0, 1.0);
        std::vector<uint8_t> rgba(8 * 8 * 4, 255);
        for (int i = 0; i < 8; ++i) rgba[(i * 8 + i) * 4 + 3] = 0;  // a transparent diagonal
        auto image = HXDPixelTexture::textureWithRGBA(8, 8, 2.0f, std::move(rgba));
        HXDPrimitiveArray list;
        for (int c = 0; c < 12; ++c) {
            const double y = -4.5 + 0.8 * c;
            list.push_back(curve(y, 0.3, c % 3 == 0 ? 3.0f : 1.0f, 400, c % 4 == 1 ? 3.0 : 1.0));
            for (int k = 0; k < 10; ++k) {
                const double x = 0.4 + k + 0.2 * u(rng);
                auto key = std::make_shared<HXDQuadTexture>(
                    k, image, CGRectMake(x - 0.2, y - 0.4, 0.4, 0.8), 1.0f);
                key->setUseTextureAlphaForHitTest(true);
                list.push_back(key);
                if (k % 4 == 0)
                    list.push_back(std::make_shared<HXDQuadTexture>(
                        100 + k, nullptr, CGRectMake(x + 0.3, y, -0.15, 0.3), 1.0f));
            }
        }
        auto loop =
            line(60, [](int i) { return xy(5 + 3 * std::cos(i * 0.1), 3 * std::sin(i * 0.1)); });
        loop->setLoop(true);  // its closing chord crosses columns its vertices do not reach
        list.push_back(loop);
        list.push_back(nullptr);
        list.push_back(std::make_shared<HXDMesh>(
            7, HXDBrush{}, std::vector<HXDSubmesh>{HXDSubmesh({{1, 1}, {2, 1}, {1.5, 2}})}));
        auto outline = std::make_shared<HXDMesh>(
            8, HXDBrush{}, std::vector<HXDSubmesh>{HXDSubmesh({{6, -2}, {8, -2}, {8, 0}})});
        outline->setWireframe(true);
        list.push_back(outline);
        // Across everything.
        list.push_back(std::make_shared<HXDScreenspaceQuad>(CGRectMake(-1, -1, 12, 0.1), 9));
        list.push_back(std::make_shared<HXDText>(HXDAttributedString{"1.25", HXDTextAttributes{}},
                                                 HXDTextLayoutAnchor::Center, CGPointMake(3, 3)));
        list.push_back(std::make_shared<HXDScreenspaceQuad>(CGRectMake(NAN, 0, 1, 1), 10));
        list.push_back(std::make_shared<HXDMultiline>(std::vector<HXDLineVertex>{}));
        return list;
    }

    void expectAgreesWithWalk(const HXDPrimitiveArray& list, uint32_t seed, int trials) const {
        std::mt19937 rng(seed);
        std::uniform_real_distribution<double> ux(-0.5, 10.5), uy(-5.5, 5.5), band(0.0, 1.0);
        for (int trial = 0; trial < trials; ++trial) {
            // One draw per statement, so every compiler tests the same points.
            const double px = ux(rng);
            const double py = uy(rng);
            const CGPoint p = pixel(px, py);
            // Small bands use the columns, wide ones the pass over every entry.
            const double w = trial % 5 == 4 ? 180.0 * band(rng) : 12.0 * band(rng);
            const HXDHitTestContext contexts[] = {
                at(p), controller.renderingContextForHitTestInRect(
                           CGRectMake(p.x, p.y, trial % 2 ? w : -w, 8.0 * band(rng)))};
            for (const HXDHitTestContext& c : contexts)
                for (const bool closest : {true, false}) {
                    const auto got = controller.newHitTestResultForPrimitives(list, c, closest);
                    const auto expected = walk(list, c, closest);
                    ASSERT_EQ(got.size(), expected.size())
                        << "trial " << trial
                        << (c.kind() == HXDHitTestContext::Kind::Rect ? " band" : " point")
                        << " closest " << closest;
                    for (size_t i = 0; i < got.size(); ++i) {
                        EXPECT_EQ(got[i].primitive().get(), expected[i].primitive)
                            << "trial " << trial << " record " << i;
                        EXPECT_NEAR(got[i].distance(), expected[i].distance, kPixelTolerance)
                            << "trial " << trial;
                    }
                }
        }
    }
};

TEST_F(HitIndexFixture, longList__answersAsAWalkDoesForPointsAndBands) {
    const HXDPrimitiveArray list = frame(1);
    ASSERT_GE(list.size(), hxd_internal::PrimitiveIndex::kMinPrimitives)
        << "the list must be long enough to index";
    expectAgreesWithWalk(list, 11, 400);
    // On a backing scale of 2 the lines reach twice as far: the index is rebuilt for it.
    installFrame(2.0f);
    expectAgreesWithWalk(list, 12, 150);
    // A sheared mapping: world boxes no longer bound pixel boxes, and the list is walked.
    installFrame(1.0f, 0.05);
    expectAgreesWithWalk(list, 13, 150);
}

TEST_F(HitIndexFixture, index__columnsCutTheListAndFindOnlyWhatIsNear) {
    const HXDPrimitiveArray list = frame(2);
    hxd_internal::PrimitiveIndex index;
    index.build(list, 1.0f);
    EXPECT_TRUE(index.describes(list, 1.0f));
    EXPECT_FALSE(index.describes(list, 2.0f)) << "the lines' reach follows the backing scale";
    EXPECT_GT(index.columnCount(), 1u);
    const auto candidates = index.candidates(list, at(pixel(5.0, -4.5)));
    EXPECT_LT(candidates.size(), list.size() / 8)
        << "a pick reads the primitives near it, not the list";
    EXPECT_TRUE(std::is_sorted(candidates.begin(), candidates.end()))
        << "candidates come in list order";
}

TEST_F(HitIndexFixture, changes__aNewFrameInTheSameVectorAndGeometryChangedAfterATestAreSeen) {
    HXDPrimitiveArray list = frame(3);
    const CGPoint high = pixel(5.0, 4.8);
    pick(list, high, false);
    // The next frame refills the same vector: same size, same buffer, other primitives.
    const size_t size = list.size();
    list.clear();
    auto line = curve(4.8, 0.0, 1.0f, 50);
    list.push_back(line);
    while (list.size() < size)
        list.push_back(std::make_shared<HXDScreenspaceQuad>(CGRectMake(0, -5, 0.1, 0.1), 1));
    EXPECT_EQ(pick(list, high).at(0).primitive(), line)
        << "the new curve through the point is found";
    // 6 px off a 1 pt line is beyond its reach; a wider line reaches further.
    const CGPoint off = CGPointMake(high.x, high.y + 6.0);
    EXPECT_TRUE(pick(list, off).empty());
    line->setWidth(8.0f);
    EXPECT_EQ(pick(list, off).size(), 1u);
    // One entry replaced in place: a filled shape on the curve wins, once the index sees it.
    list[size / 2] = std::make_shared<HXDScreenspaceQuad>(CGRectMake(4.9, 4.7, 0.2, 0.2), 42);
    EXPECT_EQ(pick(list, high).at(0).hitID(), 42u);
    // Left of where the curves start: outside a filled polygon, then on its outline.
    auto mesh = std::make_shared<HXDMesh>(
        5, HXDBrush{},
        std::vector<HXDSubmesh>{HXDSubmesh({{-0.9f, 2}, {-0.5f, 2}, {-0.5f, 2.5f}})});
    list.push_back(mesh);
    const CGPoint below = pixel(-0.6, 1.8);  // 2 px below the bottom edge
    EXPECT_TRUE(pick(list, below).empty());
    mesh->setWireframe(true);
    EXPECT_EQ(pick(list, below).size(), 1u) << "the outline takes the line tolerance";
}

// Quads reject far tests in world space before mapping themselves: the edges must still
// decide as the pixel test does. Points go through single precision on the way in: a
// thousandth of a pixel inside a corner is on the quad, a hundredth outside is not.
TEST_F(HitIndexFixture, quad__edgesDecideAsInPixels) {
    const auto quad =
        std::make_shared<HXDScreenspaceQuad>(CGRectMake(6, 1, -2, 2), 1);  // negative width
    const CGPoint lo = pixel(4, 1), hi = pixel(6, 3);
    for (const CGPoint edge : {lo, hi, CGPointMake(lo.x, hi.y), CGPointMake(hi.x, lo.y)}) {
        const double out = edge.x == lo.x ? -1.0 : 1.0, up = edge.y == lo.y ? -1.0 : 1.0;
        EXPECT_EQ(pick({quad}, CGPointMake(edge.x - 0.001 * out, edge.y - 0.001 * up)).size(), 1u)
            << edge.x << ", " << edge.y;
        EXPECT_TRUE(pick({quad}, CGPointMake(edge.x + 0.01 * out, edge.y)).empty())
            << edge.x << ", " << edge.y;
        const auto band = [&](double x) {
            return inBand({quad}, CGRectMake(x, edge.y, 5.0 * out, 1.0));
        };
        EXPECT_TRUE(band(edge.x + 0.01 * out).empty()) << "a band just beside the edge";
        EXPECT_EQ(band(edge.x).size(), 1u) << "a band touching the edge";
    }
}

}  // namespace
