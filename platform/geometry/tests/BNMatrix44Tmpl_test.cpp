#include "platform/geometry/BNMatrix44Tmpl.h"
#include "platform/geometry/BNViewProjection.h"
#include "platform/geometry/CGGeometry.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

constexpr double kExact = 1e-12;
constexpr double kFloatUlp = 1.1920928955078125e-7;  // FLT_EPSILON

// The view's mapping, as the curve views do it: the projection of the last frame is kept
// column-major in single precision, made row-major, and applied to double vectors.
struct FrameProjection {
    float columnMajor[16];
    CGSize drawable;

    static FrameProjection forVolume(const CGRect& volume, double w, double h) {
        FrameProjection p{{}, CGSizeMake(w, h)};
        BNViewVolumeProjection(volume).toColumnMajor(p.columnMajor);
        return p;
    }

    BNMatrix44f rowMajor() const { return BNMatrix44f::fromColumnMajor(columnMajor); }
    CGPoint screenOf(CGPoint world) const {
        return BNProjectionWorldToScreen(rowMajor(), drawable, world);
    }
    CGPoint worldOf(CGPoint screen) const {
        return BNProjectionScreenToWorld(rowMajor(), drawable, screen);
    }
};

void expectMatrixNear(const BNMatrix44d& a, const BNMatrix44d& b, double tol, const char* what) {
    for (int r = 0; r < 4; ++r)
        for (int c = 0; c < 4; ++c)
            EXPECT_NEAR(a.at(r, c), b.at(r, c), tol)
                << what << ": element (" << r << ", " << c << ")";
}

}  // namespace

class OrthoProjection : public ::testing::Test {};

TEST_F(OrthoProjection, ortho__matchesConventionalMatrix) {
    const auto m = BNMatrix44d::ortho(-2.0, 6.0, 1.0, 5.0, 0.5, 10.5);
    const BNMatrix44d expected(std::array<double, 16>{0.25, 0, 0, -0.5,  //
                                                      0, 0.5, 0, -1.5,   //
                                                      0, 0, -0.2, -1.1,  //
                                                      0, 0, 0, 1});
    expectMatrixNear(m, expected, kExact, "OpenGL-style ortho");

    const auto z01 = BNMatrix44f::orthoZeroToOne(0.0f, 100.0f, -62.5f, 62.5f, -1.0f, 1.0f);
    EXPECT_FLOAT_EQ(z01.at(2, 2), -0.5f) << "depth scale of the curve views' projection";
    EXPECT_FLOAT_EQ(z01.at(2, 3), 0.5f) << "depth offset of the curve views' projection";
    EXPECT_FLOAT_EQ(z01.at(0, 0), 0.02f);
    EXPECT_FLOAT_EQ(z01.at(1, 3), 0.0f);
}

TEST_F(OrthoProjection, viewVolumeProjection__matchesDepthZeroToOneOrtho) {
    const CGRect volume = CGRectMake(0.0, -62.5, 100.0, 125.0);
    const BNMatrix44f view = BNViewVolumeProjection(volume);
    const BNMatrix44f ortho = BNMatrix44f::orthoZeroToOne(0.0f, 100.0f, -62.5f, 62.5f, -1.0f, 1.0f);
    for (int r = 0; r < 4; ++r)
        for (int c = 0; c < 4; ++c)
            EXPECT_FLOAT_EQ(view.at(r, c), ortho.at(r, c)) << "element (" << r << ", " << c << ")";
    EXPECT_EQ(BNViewVolumeProjection(CGRectMake(5.0, 0.0, 0.0, 1.0)), BNMatrix44f::zero())
        << "a volume without width has no projection";
    // Translation in single precision: -(L + R)/(R - L) of the float edges.
    const BNMatrix44f far = BNViewVolumeProjection(CGRectMake(3600.1, 0.0, 0.3, 1.0));
    const float l = 3600.1f, r = static_cast<float>(3600.1 + 0.3);
    EXPECT_EQ(far.at(0, 3), -(l + r) / (r - l));
}

TEST_F(OrthoProjection, ortho__degenerateExtentGivesZeroMatrix) {
    EXPECT_EQ(BNMatrix44d::ortho(1.0, 1.0, 0.0, 1.0, -1.0, 1.0), BNMatrix44d::zero());
    EXPECT_EQ(BNMatrix44f::orthoZeroToOne(0.0f, 1.0f, 2.0f, 2.0f, -1.0f, 1.0f),
              BNMatrix44f::zero());
}

TEST_F(OrthoProjection, columnMajor__isTheTransposeOfStorage) {
    const auto m = BNMatrix44f::orthoZeroToOne(10.0f, 20.0f, -5.0f, 5.0f, -1.0f, 1.0f);
    float cm[16];
    m.toColumnMajor(cm);
    EXPECT_FLOAT_EQ(cm[12], m.at(0, 3)) << "x translation sits in element 12 of a GPU matrix";
    EXPECT_FLOAT_EQ(cm[13], m.at(1, 3));
    EXPECT_EQ(BNMatrix44f::fromColumnMajor(cm), m);
    EXPECT_EQ(BNMatrix44f(std::array<float, 16>{}), BNMatrix44f::zero());
    EXPECT_EQ(m.transposed().transposed(), m);
    EXPECT_FLOAT_EQ(m.transposed().at(3, 0), m.at(0, 3));
}

TEST_F(OrthoProjection, roundTrip__worldToScreenToWorld) {
    const double w = 1600.0, h = 900.0;
    struct Case {
        const char* name;
        CGRect volume;
    } cases[] = {
        {"timeline start volume", CGRectMake(0.0, -62.5, 100.0, 125.0)},
        {"an hour in, ten seconds wide", CGRectMake(3600.0, -1.0, 10.0, 2.0)},
        {"tiny values", CGRectMake(0.25, 1e-3, 0.5, 2e-3)},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        const FrameProjection p = FrameProjection::forVolume(c.volume, w, h);
        // Single precision limits the answer to a few float ulps of the larger of the
        // volume's edges, expressed in world units.
        const double tolX =
            16.0 * kFloatUlp * std::fmax(std::fabs(c.volume.origin.x), c.volume.size.width);
        const double tolY =
            16.0 * kFloatUlp * std::fmax(std::fabs(c.volume.origin.y), c.volume.size.height);
        for (double fx : {0.0, 0.125, 0.5, 0.9}) {
            for (double fy : {0.0, 0.3, 1.0}) {
                const CGPoint world{c.volume.origin.x + fx * c.volume.size.width,
                                    c.volume.origin.y + fy * c.volume.size.height};
                const CGPoint screen = p.screenOf(world);
                EXPECT_NEAR(screen.x, fx * w, 1e-2) << "screen x of fraction " << fx;
                EXPECT_NEAR(screen.y, fy * h, 1e-2) << "screen y of fraction " << fy;
                const CGPoint back = p.worldOf(screen);
                EXPECT_NEAR(back.x, world.x, tolX) << "world x after the round trip";
                EXPECT_NEAR(back.y, world.y, tolY) << "world y after the round trip";
            }
        }
    }
}

TEST_F(OrthoProjection, roundTrip__zeroMatrixAnswersNaN) {
    // Before the first frame there is no projection: the mapping must say "no answer".
    FrameProjection p{{}, CGSizeMake(800.0, 600.0)};
    const CGPoint world = p.worldOf({10.0, 20.0});
    EXPECT_TRUE(std::isnan(world.x) && std::isnan(world.y))
        << "zero projection must give NaN world points";
    const CGPoint screen = p.screenOf({1.0, 2.0});
    EXPECT_TRUE(std::isnan(screen.x) && std::isnan(screen.y))
        << "zero projection must give NaN screen points";
}

class MatrixInverse : public ::testing::Test {};

TEST_F(MatrixInverse, invert__generalMatrixTimesInverseIsIdentity) {
    const BNMatrix44d a(std::array<double, 16>{2, -1, 0, 3,  //
                                               1, 4, 2, -2,  //
                                               0, 5, -3, 1,  //
                                               7, 0, 1, 0.5});
    bool ok = false;
    const BNMatrix44d inv = a.inverted(&ok);
    ASSERT_TRUE(ok) << "a well-conditioned matrix must invert";
    expectMatrixNear(a * inv, BNMatrix44d::identity(), 1e-12, "A * inverse(A)");
    expectMatrixNear(inv * a, BNMatrix44d::identity(), 1e-12, "inverse(A) * A");
    EXPECT_NEAR(a.determinant() * inv.determinant(), 1.0, 1e-12);

    // A zero on the leading diagonal forces a row swap.
    const BNMatrix44f swapNeeded(
        std::array<float, 16>{0, 1, 0, 0, 1, 0, 0, 0, 0, 0, 0, 1, 0, 0, 1, 0});
    bool okSwap = false;
    const BNMatrix44f invSwap = swapNeeded.inverted(&okSwap);
    ASSERT_TRUE(okSwap);
    EXPECT_EQ(invSwap * swapNeeded, BNMatrix44f::identity());
}

TEST_F(MatrixInverse, invert__singularBecomesZeroAndAnswersFalse) {
    {
        // Third row is the sum of the first two.
        BNMatrix44d m(std::array<double, 16>{1, 2, 3, 4, 5, 6, 7, 8, 6, 8, 10, 12, 0, 0, 0, 1});
        EXPECT_FALSE(m.invert()) << "rank-deficient matrix must not invert";
        EXPECT_EQ(m, BNMatrix44d::zero()) << "the singular answer is the zero matrix";
    }
    {
        // The same in single precision, where the dependent row only cancels up to rounding.
        BNMatrix44f m(std::array<float, 16>{0.1f, 0.7f, 0.3f, 0, 0.2f, 0.9f, 0.4f, 0, 0.3f, 1.6f,
                                            0.7f, 0, 0, 0, 0, 1});
        bool ok = true;
        const BNMatrix44f inv = m.inverted(&ok);
        EXPECT_FALSE(ok) << "a float matrix singular up to rounding must be reported singular";
        EXPECT_EQ(inv, BNMatrix44f::zero());
    }
    {
        BNMatrix44f m = BNMatrix44f::identity();
        m.set(1, 1, std::nanf(""));
        EXPECT_FALSE(m.invert()) << "NaN elements must not invert";
    }
    {
        BNMatrix44d z;
        EXPECT_FALSE(z.invert());
        const auto p = z.transformPoint(1.0, 2.0, 3.0);
        EXPECT_TRUE(std::isnan(p.x)) << "a point through the singular answer has no value";
    }
}

TEST_F(MatrixInverse, invert__orthoInverseMapsClipCornersToVolume) {
    const auto m = BNMatrix44d::ortho(3.0, 7.0, -2.0, 2.0, -1.0, 1.0);
    const BNMatrix44d inv = m.inverted();
    const auto lowLeft = inv.transformPoint(-1.0, -1.0, 0.0);
    const auto upRight = inv.transformPoint(1.0, 1.0, 0.0);
    EXPECT_NEAR(lowLeft.x, 3.0, kExact);
    EXPECT_NEAR(lowLeft.y, -2.0, kExact);
    EXPECT_NEAR(upRight.x, 7.0, kExact);
    EXPECT_NEAR(upRight.y, 2.0, kExact);
}

class MatrixArithmetic : public ::testing::Test {};

TEST_F(MatrixArithmetic, multiply__rightOperandAppliesFirst) {
    const auto t = BNMatrix44d::translation(10.0, 0.0, 0.0);
    const auto s = BNMatrix44d::scaling(2.0, 2.0, 2.0);
    EXPECT_NEAR((t * s).transformPoint(1.0, 1.0, 1.0).x, 12.0, kExact) << "scale, then translate";
    EXPECT_NEAR((s * t).transformPoint(1.0, 1.0, 1.0).x, 22.0, kExact) << "translate, then scale";
    EXPECT_EQ(BNMatrix44d::identity() * t, t);
}

TEST_F(MatrixArithmetic, transform__perspectiveDivideAndVectors) {
    BNMatrix44d m = BNMatrix44d::identity();
    m.set(3, 2, 1.0);  // w' = z + 1
    const auto p = m.transformPoint(4.0, 6.0, 1.0);
    EXPECT_NEAR(p.x, 2.0, kExact) << "x divided by w = 2";
    EXPECT_NEAR(p.y, 3.0, kExact);
    EXPECT_NEAR(p.w, 1.0, kExact);

    const auto t = BNMatrix44d::translation(5.0, 5.0, 5.0);
    const auto v = t.transformVector(1.0, 0.0, 0.0);
    EXPECT_EQ(v.x, 1.0) << "a direction ignores translation";
    EXPECT_EQ(v.w, 0.0);
}

TEST_F(MatrixArithmetic, access__outOfRangeIndexIsHarmless) {
    BNMatrix44d m = BNMatrix44d::identity();
    m.set(4, 0, 9.0);
    m.set(-1, 2, 9.0);
    EXPECT_EQ(m, BNMatrix44d::identity()) << "writes outside 0..3 must go nowhere";
    EXPECT_EQ(m.at(0, 4), 0.0);
    EXPECT_EQ(m.at(-3, -3), 0.0);
}

TEST_F(MatrixArithmetic, determinant__knownValues) {
    EXPECT_NEAR(BNMatrix44d::scaling(2.0, 3.0, 4.0).determinant(), 24.0, kExact);
    EXPECT_NEAR(BNMatrix44d::translation(9.0, 8.0, 7.0).determinant(), 1.0, kExact);
    const BNMatrix44d swapped(
        std::array<double, 16>{0, 1, 0, 0, 1, 0, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1});
    EXPECT_NEAR(swapped.determinant(), -1.0, kExact) << "one row swap flips the sign";
    EXPECT_EQ(BNMatrix44f(BNMatrix44d::scaling(0.5, 0.5, 0.5)),
              BNMatrix44f::scaling(0.5f, 0.5f, 0.5f));
}
