#include "platform/geometry/BNMatrix44Tmpl.h"
#include "platform/geometry/BNViewProjection.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace {

constexpr double kExact = 1e-12;

template <class T>
::testing::AssertionResult near(const BNMatrix44Tmpl<T>& a, const BNMatrix44Tmpl<T>& b,
                                double tol) {
    for (int i = 0; i < 16; ++i)
        if (!(std::fabs(a.data()[i] - b.data()[i]) <= tol))
            return ::testing::AssertionFailure()
                   << "element " << i << ": " << a.data()[i] << " vs " << b.data()[i];
    return ::testing::AssertionSuccess();
}

BNMatrix44d rows(std::array<double, 16> m) { return BNMatrix44d(m); }

TEST(Matrix, projections__conventionalRowsDepthRangesAndDegenerateExtents) {
    EXPECT_TRUE(near(BNMatrix44d::ortho(-2.0, 6.0, 1.0, 5.0, 0.5, 10.5),
                     rows({0.25, 0, 0, -0.5, 0, 0.5, 0, -1.5, 0, 0, -0.2, -1.1, 0, 0, 0, 1}),
                     kExact));
    EXPECT_TRUE(near(BNMatrix44d::orthoZeroToOne(-2.0, 6.0, 1.0, 5.0, 0.5, 10.5),
                     rows({0.25, 0, 0, -0.5, 0, 0.5, 0, -1.5, 0, 0, -0.1, -0.05, 0, 0, 0, 1}),
                     kExact))
        << "depth from near to 0 and far to 1";
    // The curve views draw with the zero-to-one projection of their view volume, near -1, far 1.
    const BNMatrix44f view = BNViewVolumeProjection(CGRectMake(0.0, -62.5, 100.0, 125.0));
    EXPECT_EQ(view, BNMatrix44f::orthoZeroToOne(0.0f, 100.0f, -62.5f, 62.5f, -1.0f, 1.0f));
    // Its translation is computed from the float edges, as the drawn frame has it.
    const BNMatrix44f far = BNViewVolumeProjection(CGRectMake(3600.1, 0.0, 0.3, 1.0));
    const float l = 3600.1f, r = static_cast<float>(3600.1 + 0.3);
    EXPECT_EQ(far.at(0, 3), -(l + r) / (r - l));
    EXPECT_EQ(far.at(1, 3), -1.0f);
    // A degenerate extent has no projection.
    for (const auto& e : {std::array{1.0, 1.0, 0.0, 1.0, -1.0, 1.0},
                          {0.0, 1.0, 2.0, 2.0, -1.0, 1.0},
                          {0.0, 1.0, 0.0, 1.0, 3.0, 3.0}}) {
        EXPECT_EQ(BNMatrix44d::ortho(e[0], e[1], e[2], e[3], e[4], e[5]), BNMatrix44d::zero());
        EXPECT_EQ(BNMatrix44d::orthoZeroToOne(e[0], e[1], e[2], e[3], e[4], e[5]),
                  BNMatrix44d::zero());
    }
    for (const CGRect& volume : {CGRectMake(5, 0, 0, 1), CGRectMake(5, 0, 1, 0),
                                 CGRectMake(0, 0, NAN, 1), CGRectMake(0, 0, 1, NAN)})
        EXPECT_EQ(BNViewVolumeProjection(volume), BNMatrix44f::zero());
}

TEST(Matrix, algebra__productOrderTransposeColumnMajorAccessAndDeterminant) {
    const auto t = BNMatrix44d::translation(10.0, 20.0, 30.0);
    const auto s = BNMatrix44d::scaling(2.0, 3.0, 4.0);
    using V = BNVector4Tmpl<double>;
    EXPECT_EQ((t * s).transformPoint(1.0, 1.0, 1.0), (V{12, 23, 34, 1})) << "scale first";
    EXPECT_EQ((s * t).transformPoint(1.0, 1.0, 1.0), (V{22, 63, 124, 1}));
    EXPECT_EQ(t.transformVector(1.0, 2.0, 3.0), (V{1, 2, 3, 0})) << "a direction ignores moves";
    BNMatrix44d w = BNMatrix44d::identity();
    w.set(3, 2, 1.0);  // w' = z + 1
    EXPECT_EQ(w.transformPoint(4.0, 6.0, 1.0), (V{2, 3, 0.5, 1})) << "divided by w";

    // GPU matrices are column-major: the transpose of the storage, translation in 12 to 14.
    float cm[16];
    const auto m = BNMatrix44f::orthoZeroToOne(10.0f, 20.0f, -5.0f, 5.0f, -1.0f, 1.0f);
    m.toColumnMajor(cm);
    EXPECT_EQ((std::array{cm[12], cm[13], cm[1]}),
              (std::array{m.at(0, 3), m.at(1, 3), m.at(1, 0)}));
    EXPECT_EQ(m.transposed().at(3, 0), m.at(0, 3));
    EXPECT_EQ(BNMatrix44f::fromColumnMajor(cm), m);

    // Indices outside 0..3 read as zero and write nowhere.
    BNMatrix44d g = BNMatrix44d::identity();
    for (const auto& [row, col] : {std::pair{4, 0}, {-1, 2}, {0, 4}, {2, -1}}) {
        g.set(row, col, 9.0);
        EXPECT_EQ(g.at(row, col), 0.0);
    }
    EXPECT_EQ(g, BNMatrix44d::identity());

    EXPECT_NEAR(s.determinant(), 24.0, kExact);
    EXPECT_NEAR(rows({2, -1, 0, 3, 1, 4, 2, -2, 0, 5, -3, 1, 7, 0, 1, 0.5}).determinant(), 366.5,
                1e-9);
}

TEST(Matrix, invert__pivotsRowsAndTurnsSingularMatricesToZero) {
    for (const BNMatrix44d& a :
         {rows({2, -1, 0, 3, 1, 4, 2, -2, 0, 5, -3, 1, 7, 0, 1, 0.5}),
          rows({0, 1, 0, 0, 1, 0, 0, 0, 0, 0, 0, 1, 0, 0, 1, 0}),  // zero pivots
          rows({1e-9, 1, 0, 0, 1, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}),
          BNMatrix44d::ortho(3.0, 7.0, -2.0, 2.0, -1.0, 1.0)}) {
        bool ok = false;
        const BNMatrix44d inv = a.inverted(&ok);
        ASSERT_TRUE(ok) << "a well-conditioned matrix must invert";
        EXPECT_TRUE(near(a * inv, BNMatrix44d::identity(), 1e-12));
        EXPECT_TRUE(near(inv * a, BNMatrix44d::identity(), 1e-12));
    }
    const auto clip = BNMatrix44d::ortho(3.0, 7.0, -2.0, 2.0, -1.0, 1.0).inverted();
    EXPECT_EQ(clip.transformPoint(-1.0, -1.0, 0.0), (BNVector4Tmpl<double>{3, -2, 0, 1}));

    // A rank-deficient row, a zero row, NaN or infinity, an inverse too large for a double, and
    // in single precision a row that is a sum of two others up to rounding: no inverse, and the
    // matrix becomes zero.
    const double inf = std::numeric_limits<double>::infinity();
    for (BNMatrix44d m :
         {rows({1, 2, 3, 4, 5, 6, 7, 8, 6, 8, 10, 12, 0, 0, 0, 1}),
          rows({1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1}),
          rows({1, 0, 0, 0, 0, NAN, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}),
          rows({1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, inf, 0, 0, 0, 1}),
          rows({1e-310, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}), BNMatrix44d()}) {
        EXPECT_FALSE(m.invert());
        EXPECT_EQ(m, BNMatrix44d::zero());
    }
    BNMatrix44f nearly(std::array<float, 16>{0.1f, 0.7f, 0.3f, 0, 0.2f, 0.9f, 0.4f, 0, 0.3f, 1.6f,
                                             0.7f, 0, 0, 0, 0, 1});
    bool ok = true;
    EXPECT_EQ(nearly.inverted(&ok), BNMatrix44f::zero());
    EXPECT_FALSE(ok) << "a float matrix singular up to rounding must be reported singular";
    EXPECT_TRUE(std::isnan(BNMatrix44d().transformPoint(1.0, 2.0, 3.0).x))
        << "a point through the singular answer has no value";
}

}  // namespace
