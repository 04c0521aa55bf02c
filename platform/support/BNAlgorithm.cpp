#include "platform/support/BNAlgorithm.h"

#include <cmath>
#include <limits>
#include <numbers>

namespace {

constexpr double kZeroLength = 1e-7;

bool isFinite(const BNVec2d& v) { return std::isfinite(v.x) && std::isfinite(v.y); }

BNVec2d quarterTurn(const BNVec2d& v) { return {-v.y, v.x}; }

// Turn by an eighth of a full turn, counter-clockwise.
BNVec2d eighthTurn(const BNVec2d& v) {
    constexpr double s = std::numbers::sqrt2 / 2.0;
    return {(v.x - v.y) * s, (v.x + v.y) * s};
}

}  // namespace

BNVec2d BNAlgorithm::findProjectionOn45DegreesDirection(const BNVec2d& vector,
                                                        const BNVec2d& reference,
                                                        double angleOffset) {
    if (!isFinite(vector) || !isFinite(reference) || !std::isfinite(angleOffset)) {
        const double nan = std::numeric_limits<double>::quiet_NaN();
        return {nan, nan};
    }
    if (vector.x == 0.0 && vector.y == 0.0) return {0.0, 0.0};

    // Unit vector of direction 0 of the family.
    BNVec2d base{1.0, 0.0};
    const double refLength = std::hypot(reference.x, reference.y);
    if (refLength >= kZeroLength) base = {reference.x / refLength, reference.y / refLength};
    if (angleOffset != 0.0) {
        const double c = std::cos(angleOffset);
        const double s = std::sin(angleOffset);
        base = {base.x * c - base.y * s, base.x * s + base.y * c};
    }

    // Angle of the vector measured from direction 0, in (-pi, pi]; the nearest step of the
    // family is that angle rounded to a multiple of 45 degrees.
    const double cross = base.x * vector.y - base.y * vector.x;
    const double dot = base.x * vector.x + base.y * vector.y;
    const double relative = std::atan2(cross, dot);
    long step = std::lround(relative / (std::numbers::pi / 4.0));
    step = ((step % 8) + 8) % 8;

    // Build the direction by exact quarter turns and at most one eighth turn, so that a
    // reference on an axis gives directions with exact zero components.
    BNVec2d direction = base;
    for (long q = 0; q < step / 2; ++q) direction = quarterTurn(direction);
    if (step % 2 != 0) direction = eighthTurn(direction);

    const double length = direction.x * vector.x + direction.y * vector.y;
    return {direction.x * length, direction.y * length};
}
