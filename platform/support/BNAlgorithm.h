#pragma once
// Small geometric algorithms of the core library.
//
// The support library sits below the geometry module, so its vectors are a plain pair of
// doubles; callers convert from their own point types.

struct BNVec2d {
    double x = 0.0;
    double y = 0.0;
    friend bool operator==(const BNVec2d&, const BNVec2d&) = default;
};

namespace BNAlgorithm {

// The orthogonal projection of `vector` on the nearest of the eight directions that lie at
// multiples of 45 degrees from `reference` (turned further by `angleOffset` radians; callers
// pass 0.0). The answer lies on that direction, so its length is at most that of `vector`.
//
// A reference shorter than 1e-7 defines no direction: the family is then taken from the +x
// axis. A zero `vector` answers the zero vector. Non-finite input answers NaN components.
// When the reference lies on an axis, the eight directions are exact (no trigonometry), so a
// snap to horizontal or vertical gives an exactly zero component.
BNVec2d findProjectionOn45DegreesDirection(const BNVec2d& vector, const BNVec2d& reference,
                                           double angleOffset);

}  // namespace BNAlgorithm
